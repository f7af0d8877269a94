#include "TipShape.h"

#include <QFontMetrics>
#include <QPainter>
#include <QPolygon>

#include <algorithm>

namespace zelctl::tipShape {

namespace {

constexpr int IconSize = 16;
constexpr int IconGap = 6; // between the icon and the title
constexpr int HeaderGap = 6; // between the header and the text
constexpr int BalloonPadding = 9;
constexpr int RectanglePadding = 4;
constexpr int Radius = 7;
constexpr int StemHeight = 16;
constexpr int StemWidth = 16;
// How far left of the pointer a balloon starts, so the stem sits near its left end.
constexpr int StemInset = 18;
// A rectangular tip at the pointer starts below the pointer's own picture.
constexpr int CursorHeight = 20;
constexpr int AnchorGap = 2;

const QColor BorderColour(0x64, 0x64, 0x64);

bool hasIcon(const Content &content)
{
    return !iconPixmap(content.icon).isNull();
}

bool hasHeader(const Content &content)
{
    return !content.title.isEmpty() || hasIcon(content);
}

QFont titleFont(const QFont &font)
{
    QFont bold = font;
    bold.setBold(true);
    return bold;
}

// The row of the icon and the title; an icon's place is kept only for an icon.
int headerHeight(const Content &content, const QFont &font)
{
    const int title = QFontMetrics(titleFont(font)).height();
    return hasIcon(content) ? std::max(IconSize, title) : title;
}

int headerWidth(const Content &content, const QFont &font)
{
    const int title = QFontMetrics(titleFont(font)).horizontalAdvance(content.title);
    return hasIcon(content) ? IconSize + IconGap + title : title;
}

QRect textBounds(const QString &text, const QFont &font)
{
    if (text.isEmpty())
        return {};
    return QFontMetrics(font).boundingRect(
        QRect(0, 0, MaxTextWidth, 1 << 20), Qt::AlignLeft | Qt::AlignTop | Qt::TextWordWrap, text);
}

} // namespace

QPixmap iconPixmap(int icon)
{
    static const char *const names[] = { nullptr, "INFO", "WARNING", "ERROR" };
    if (icon <= 0 || icon >= int(std::size(names)))
        return {};
    return QPixmap(QStringLiteral(":/zelctl/icons/%1.png").arg(QLatin1String(names[icon])));
}

QSize contentSize(const Content &content, const QFont &font)
{
    int width = 0;
    int height = 0;
    if (hasHeader(content)) {
        width = headerWidth(content, font);
        height = headerHeight(content, font);
    }
    const QRect text = textBounds(content.text, font);
    if (!text.isEmpty()) {
        width = std::max(width, text.width());
        height += (height > 0 ? HeaderGap : 0) + text.height();
    }
    return { width, height };
}

Placement place(QSize content, QPoint anchor, const QRect &screen, bool balloon, bool centred)
{
    const int padding = balloon ? BalloonPadding : RectanglePadding;
    const int minWidth = balloon ? 2 * StemInset + StemWidth : 0;
    const QSize body(std::max(content.width() + 2 * padding, minWidth), content.height() + 2 * padding);

    const int gapBelow = balloon ? StemHeight : (centred ? AnchorGap : CursorHeight);
    const int gapAbove = balloon ? StemHeight : AnchorGap;
    int left = centred ? anchor.x() - body.width() / 2 : anchor.x() - (balloon ? StemInset : 0);
    left = std::max(screen.left(), std::min(left, screen.right() + 1 - body.width()));
    int top = anchor.y() + gapBelow;
    const bool below
        = top + body.height() <= screen.bottom() + 1 || anchor.y() - gapAbove - body.height() < screen.top();
    if (!below)
        top = anchor.y() - gapAbove - body.height();
    const QRect bodyRect(QPoint(left, top), body);

    Placement placement;
    placement.stemUp = below;
    QRect whole = bodyRect;
    QPolygon stem;
    if (balloon) {
        // The stem's base sits beside the anchor, toward the body's larger side, clear of
        // the rounded corners; near a screen edge the stem slants to reach the anchor.
        const int edgeY = below ? bodyRect.top() + 1 : bodyRect.bottom();
        const int lowest = bodyRect.left() + Radius;
        const int highest = bodyRect.right() - Radius - StemWidth;
        const bool leftward = anchor.x() + StemWidth > bodyRect.right() - Radius;
        const int baseX = std::clamp(leftward ? anchor.x() - StemWidth : anchor.x(), lowest, highest);
        const int nearX = leftward ? baseX + StemWidth : baseX;
        const int farX = leftward ? baseX : baseX + StemWidth;
        stem << anchor << QPoint(nearX, edgeY) << QPoint(farX, edgeY);
        whole = whole.united(stem.boundingRect());
    }
    placement.geometry = whole;

    const QPoint origin = whole.topLeft();
    QPainterPath outline;
    outline.addRoundedRect(QRectF(bodyRect.translated(-origin)).adjusted(0.5, 0.5, -0.5, -0.5), balloon ? Radius : 0,
        balloon ? Radius : 0);
    if (balloon) {
        QPolygonF closedStem(stem.translated(-origin));
        closedStem << closedStem.first();
        QPainterPath stemPath;
        stemPath.addPolygon(closedStem);
        outline = outline.united(stemPath).simplified();
    }
    placement.outline = outline;
    placement.content = QRect(bodyRect.topLeft() - origin + QPoint(padding, padding), content);
    return placement;
}

void paint(QPainter &painter, const Placement &placement, const Content &content, const QFont &font)
{
    painter.save();
    painter.setRenderHint(QPainter::Antialiasing);
    painter.setPen(QPen(BorderColour, 1));
    painter.setBrush(content.background);
    painter.drawPath(placement.outline);

    QRect area = placement.content;
    if (hasHeader(content)) {
        const int rowHeight = headerHeight(content, font);
        int x = area.left();
        const QPixmap icon = iconPixmap(content.icon);
        if (!icon.isNull()) {
            painter.drawPixmap(QRect(x, area.top() + (rowHeight - IconSize) / 2, IconSize, IconSize), icon);
            x += IconSize + IconGap;
        }
        painter.setFont(titleFont(font));
        painter.setPen(content.foreground);
        painter.drawText(
            QRect(x, area.top(), area.right() - x + 1, rowHeight), Qt::AlignLeft | Qt::AlignVCenter, content.title);
        area.setTop(area.top() + rowHeight + HeaderGap);
    }
    painter.setFont(font);
    painter.setPen(content.foreground);
    painter.drawText(area, Qt::AlignLeft | Qt::AlignTop | Qt::TextWordWrap, content.text);
    painter.restore();
}

} // namespace zelctl::tipShape

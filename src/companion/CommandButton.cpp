#include "CommandButton.h"

#include "KeyCodes.h"
#include "platform/OleColor.h"
#include "platform/SymbolFonts.h"
#include "platform/Twips.h"

#include <QHelpEvent>
#include <QKeyEvent>
#include <QPainter>
#include <QStyleOptionButton>
#include <QToolTip>

#include <algorithm>

namespace zelctl {

using platform::pixelsFromTwips;
using platform::twipsFromPixels;

class CommandButtonPrivate
{
public:
    zelctl::Picture picture;
    QString caption;
    QString tag;
    int index = -1;
    qint32 style = 0;
    qint32 bevelWidth = 0;
};

CommandButton::CommandButton(QWidget *parent)
    : QPushButton(parent)
    , d(std::make_unique<CommandButtonPrivate>())
{
    connect(this, &QAbstractButton::clicked, this, [this] { Q_EMIT Click(d->index); });
}

CommandButton::~CommandButton() = default;

QString CommandButton::Caption() const
{
    return d->caption;
}

void CommandButton::setCaption(const QString &caption)
{
    if (caption == d->caption)
        return;
    d->caption = caption;
    showCaption();
}

QString CommandButton::wholeCaption() const
{
    return platform::symbolFonts::shownText(font(), d->caption);
}

QSize CommandButton::sizeFor(const QString &text) const
{
    // As a push button sizes itself for its text.
    QStyleOptionButton option;
    initStyleOption(&option);
    option.text = text;
    int width = 0;
    int height = 0;
    if (!icon().isNull()) {
        width = iconSize().width() + 4;
        height = iconSize().height();
    }
    // An empty caption still gets the height and, without an icon, the width of four capital
    // X's, as QPushButton measures it.
    const QString measured = text.isEmpty() ? QString(4, u'X') : text;
    const QSize textSize = fontMetrics().size(Qt::TextShowMnemonic, measured);
    if (!text.isEmpty() || width == 0)
        width += textSize.width();
    if (!text.isEmpty() || height == 0)
        height = std::max(height, textSize.height());
    option.rect.setSize(QSize(width, height));
    return style()->sizeFromContents(QStyle::CT_PushButton, &option, QSize(width, height), this);
}

QSize CommandButton::sizeHint() const
{
    // For the whole caption: a caption cut short must not shrink the room a layout gives it.
    ensurePolished();
    return sizeFor(wholeCaption());
}

void CommandButton::showCaption()
{
    const QString whole = wholeCaption();
    // A caption with an access key is kept whole: cutting it could cut the key's mark.
    if (whole.contains(QLatin1Char('&'))) {
        setText(whole);
        return;
    }
    const int textWidth = fontMetrics().horizontalAdvance(whole);
    const int room = width() - (sizeFor(whole).width() - textWidth);
    if (textWidth <= room) {
        setText(whole);
        return;
    }
    // Never cut to nothing.
    setText(fontMetrics().elidedText(
        whole, Qt::ElideRight, std::max(room, fontMetrics().horizontalAdvance(QStringLiteral("M…")))));
}

void CommandButton::setToggle(bool toggle)
{
    setCheckable(toggle);
}

zelctl::Picture CommandButton::Picture() const
{
    return d->picture;
}

void CommandButton::setPicture(const zelctl::Picture &picture)
{
    if (d->picture == picture)
        return;
    d->picture = picture;
    setIcon(picture.isNull() ? QIcon() : QIcon(picture.pixmap()));
    if (!picture.isNull())
        setIconSize(picture.image().size());
    showCaption();
}

QString CommandButton::Tag() const
{
    return d->tag;
}

void CommandButton::setTag(const QString &tag)
{
    d->tag = tag;
}

int CommandButton::Index() const
{
    return d->index;
}

void CommandButton::setIndex(int index)
{
    d->index = index;
}

quint32 CommandButton::ForeColor() const
{
    return platform::fromQColor(palette().color(QPalette::Active, QPalette::ButtonText));
}

void CommandButton::setForeColor(quint32 color)
{
    // A disabled button keeps the style's greyed caption.
    QPalette colours = palette();
    colours.setColor(QPalette::Active, QPalette::ButtonText, platform::toQColor(color));
    colours.setColor(QPalette::Inactive, QPalette::ButtonText, platform::toQColor(color));
    setPalette(colours);
}

qint32 CommandButton::ButtonStyle() const
{
    return d->style;
}

void CommandButton::setButtonStyle(qint32 style)
{
    if (style == d->style)
        return;
    d->style = style;
    setFlat(style == FlatStyle);
    // Without its frame the button still covers what lies under it.
    setAutoFillBackground(style == FlatStyle);
}

qint32 CommandButton::BevelWidth() const
{
    return d->bevelWidth;
}

void CommandButton::setBevelWidth(qint32 pixels)
{
    pixels = std::max(pixels, 0);
    if (pixels == d->bevelWidth)
        return;
    d->bevelWidth = pixels;
    update();
}

bool CommandButton::event(QEvent *event)
{
    // A caption cut short is shown whole, unless the host gave the button a tooltip.
    if (event->type() == QEvent::ToolTip && toolTip().isEmpty() && text() != d->caption
        && !text().contains(QLatin1Char('&'))) {
        QToolTip::showText(static_cast<QHelpEvent *>(event)->globalPos(), d->caption, this);
        return true;
    }
    return QPushButton::event(event);
}

void CommandButton::changeEvent(QEvent *event)
{
    QPushButton::changeEvent(event);
    if (event->type() == QEvent::FontChange || event->type() == QEvent::StyleChange)
        showCaption();
}

void CommandButton::resizeEvent(QResizeEvent *event)
{
    QPushButton::resizeEvent(event);
    showCaption();
}

void CommandButton::paintEvent(QPaintEvent *event)
{
    QPushButton::paintEvent(event);
    const int bevel = std::min(d->bevelWidth, std::min(width(), height()) / 2);
    if (bevel < 1)
        return;
    QPainter painter(this);
    const QColor light = palette().color(QPalette::Light);
    const QColor dark = palette().color(QPalette::Dark);
    for (int i = 0; i < bevel; ++i) {
        const QRect edge = rect().adjusted(i, i, -i - 1, -i - 1);
        painter.setPen(light);
        painter.drawLine(edge.topLeft(), edge.topRight());
        painter.drawLine(edge.topLeft(), edge.bottomLeft());
        painter.setPen(dark);
        painter.drawLine(edge.bottomLeft(), edge.bottomRight());
        painter.drawLine(edge.topRight(), edge.bottomRight());
    }
}

void CommandButton::enterEvent(QEnterEvent *event)
{
    QPushButton::enterEvent(event);
    Q_EMIT MouseHover(true);
}

void CommandButton::leaveEvent(QEvent *event)
{
    QPushButton::leaveEvent(event);
    Q_EMIT MouseHover(false);
}

int CommandButton::Left() const
{
    return twipsFromPixels(x());
}

int CommandButton::Top() const
{
    return twipsFromPixels(y());
}

int CommandButton::Width() const
{
    return twipsFromPixels(width());
}

int CommandButton::Height() const
{
    return twipsFromPixels(height());
}

void CommandButton::setLeft(int twips)
{
    move(pixelsFromTwips(twips), y());
}

void CommandButton::setTop(int twips)
{
    move(x(), pixelsFromTwips(twips));
}

void CommandButton::setWidth(int twips)
{
    resize(pixelsFromTwips(twips), height());
}

void CommandButton::setHeight(int twips)
{
    resize(width(), pixelsFromTwips(twips));
}

void CommandButton::Move(int left, int top)
{
    move(pixelsFromTwips(left), pixelsFromTwips(top));
}

void CommandButton::Move(int left, int top, int width, int height)
{
    setGeometry(pixelsFromTwips(left), pixelsFromTwips(top), pixelsFromTwips(width), pixelsFromTwips(height));
}

void CommandButton::Refresh()
{
    repaint();
}

void CommandButton::mouseDoubleClickEvent(QMouseEvent *event)
{
    // The second press of a double click still presses the button, as a plain push button's does.
    QPushButton::mouseDoubleClickEvent(event);
    if (event->button() == Qt::LeftButton)
        Q_EMIT DblClick(d->index);
}

void CommandButton::keyPressEvent(QKeyEvent *event)
{
    if (const int code = keyCodes::fromQtKey(event->key()); code != 0) {
        int keyCode = code;
        Q_EMIT KeyDown(d->index, keyCode, keyCodes::shiftState(event->modifiers()));
        if (keyCode == 0) {
            event->accept();
            return;
        }
    }
    QPushButton::keyPressEvent(event);
}

} // namespace zelctl

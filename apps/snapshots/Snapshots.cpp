#include "Snapshots.h"

#include "Stage.h"

#include <QApplication>
#include <QFontDatabase>
#include <QPainter>
#include <QStyle>
#include <QStyleFactory>

#include <algorithm>

namespace zelctl::snapshots {

namespace {

constexpr int SheetWidth = 1280;
constexpr int Padding = 12;
constexpr int CaptionGap = 4;

QFont sheetFont(int points, bool bold = false)
{
    QFont font(QStringLiteral("DejaVu Sans"), points);
    font.setBold(bold);
    return font;
}

} // namespace

QString Scene::name() const
{
    return (group + QLatin1Char('-') + state).toLower().replace(QLatin1Char(' '), QLatin1Char('-'));
}

QList<Scene> scenes()
{
    QList<Scene> all;
    addEntryScenes(all);
    addSelectionScenes(all);
    addPictureScenes(all);
    addSkinScenes(all);
    addTipScenes(all);
    return all;
}

void useBundledFonts()
{
    qputenv("FONTCONFIG_FILE", ZELCTL_SNAPSHOT_FONTS_CONF);
}

void setFixedLook()
{
    QApplication::setStyle(QStyleFactory::create(QStringLiteral("Fusion")));
    QApplication::setPalette(QApplication::style()->standardPalette());
    QApplication::setFont(QFont(QStringLiteral("DejaVu Sans"), 9));
    // A caret that does not blink is drawn the same in every picture.
    QApplication::setCursorFlashTime(0);
}

bool savePicture(const QImage &picture, const QString &file)
{
    // Quality 0 is the PNG writer's strongest compression.
    return picture.save(file, "PNG", 0);
}

QImage contactSheet(const QList<Shot> &shots)
{
    const QFontMetrics captionMetrics(sheetFont(8));
    const QFontMetrics titleMetrics(sheetFont(10, true));

    // Where each picture goes: groups start on a new row under their name.
    struct Placed
    {
        const Shot *shot;
        QPoint at;
    };
    QList<Placed> placed;
    QList<QPair<QString, QPoint>> titles;
    int y = Padding;
    for (int i = 0; i < shots.size();) {
        const QString group = shots[i].scene.group;
        titles.append({ group, QPoint(Padding, y + titleMetrics.ascent()) });
        y += titleMetrics.height() + CaptionGap;
        int x = Padding;
        int rowHeight = 0;
        for (; i < shots.size() && shots[i].scene.group == group; ++i) {
            const QSize size = shots[i].picture.size();
            const int width = std::max(size.width(), captionMetrics.horizontalAdvance(shots[i].scene.state));
            if (x > Padding && x + width > SheetWidth - Padding) {
                y += rowHeight + Padding;
                x = Padding;
                rowHeight = 0;
            }
            placed.append({ &shots[i], QPoint(x, y) });
            x += width + Padding;
            rowHeight = std::max(rowHeight, size.height() + CaptionGap + captionMetrics.height());
        }
        y += rowHeight + 2 * Padding;
    }

    QImage sheet(SheetWidth, y, QImage::Format_RGB32);
    sheet.fill(Qt::white);
    QPainter painter(&sheet);
    painter.setPen(Qt::black);
    painter.setFont(sheetFont(10, true));
    for (const auto &[title, at] : titles)
        painter.drawText(at, title);
    painter.setFont(sheetFont(8));
    for (const Placed &p : placed) {
        const QImage &picture = p.shot->picture;
        painter.drawImage(p.at, picture);
        painter.setPen(QColor(0xC0, 0xC0, 0xC0));
        painter.drawRect(QRect(p.at, picture.size()).adjusted(-1, -1, 0, 0));
        painter.setPen(QColor(0x40, 0x40, 0x40));
        painter.drawText(
            p.at + QPoint(0, picture.height() + CaptionGap + captionMetrics.ascent()), p.shot->scene.state);
    }
    return sheet;
}

} // namespace zelctl::snapshots

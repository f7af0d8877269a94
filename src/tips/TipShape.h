#pragma once

#include "zelctl_export.h"

#include <QColor>
#include <QFont>
#include <QPainterPath>
#include <QPixmap>
#include <QRect>
#include <QString>

class QPainter;

// How a tip looks: the balloon or rectangle around the content, where it goes on the
// screen, and the content itself (an optional header of icon and bold title, then the text).
namespace zelctl::tipShape {

struct Content
{
    QString title;
    int icon = 0; // TTI_NONE, TTI_INFO, TTI_WARNING or TTI_ERROR
    QString text; // lines separated by '\n'
    QColor foreground;
    QColor background;
};

// Where a tip goes: its window in screen pixels, and in the window's own coordinates the
// outline to fill and the rectangle of the content.
struct Placement
{
    QRect geometry;
    QPainterPath outline;
    QRect content;
    // The balloon's stem points up to a tool above it (false: down, to a tool below it).
    bool stemUp = true;
};

// Lines longer than this wrap at word boundaries.
inline constexpr int MaxTextWidth = 400;

// The picture of a TTI_ icon, or a null pixmap for TTI_NONE and unknown values.
ZELCTL_EXPORT QPixmap iconPixmap(int icon);

// The size the content needs, without the frame around it.
ZELCTL_EXPORT QSize contentSize(const Content &content, const QFont &font);

// Places a tip whose content has the given size so that it refers to the anchor: the
// balloon's stem tip touches it; a rectangle starts below it. A tip at the pointer lies to
// the lower right of it, a centred one centred under it; both stay on the screen, moving
// above the anchor when there is no room below.
ZELCTL_EXPORT Placement place(QSize content, QPoint anchor, const QRect &screen, bool balloon, bool centred);

// Paints the whole tip (outline, border and content) into a window laid out by place().
ZELCTL_EXPORT void paint(QPainter &painter, const Placement &placement, const Content &content, const QFont &font);

} // namespace zelctl::tipShape

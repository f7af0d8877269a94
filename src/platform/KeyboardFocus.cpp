#include "KeyboardFocus.h"

#include <QKeyEvent>
#include <QPainter>
#include <QWidget>

namespace zelctl::platform {

bool showsFocusMark(const QWidget &control)
{
    return control.hasFocus() && control.window()->testAttribute(Qt::WA_KeyboardFocusChange);
}

void paintFocusMark(QPainter &painter, const QRect &area, bool round)
{
    const QRectF line = QRectF(area).adjusted(1.5, 1.5, -1.5, -1.5);
    if (line.width() <= 0 || line.height() <= 0)
        return;
    painter.save();
    painter.setBrush(Qt::NoBrush);
    painter.setRenderHint(QPainter::Antialiasing, false);
    for (const auto &[colour, style] :
        { std::pair { Qt::white, Qt::SolidLine }, std::pair { Qt::black, Qt::DotLine } }) {
        painter.setPen(QPen(colour, 1, style));
        if (round)
            painter.drawEllipse(line);
        else
            painter.drawRect(line);
    }
    painter.restore();
}

bool pressesButton(const QKeyEvent &event)
{
    const int key = event.key();
    return (key == Qt::Key_Space || key == Qt::Key_Return || key == Qt::Key_Enter) && !event.isAutoRepeat()
        && !(event.modifiers() & (Qt::ControlModifier | Qt::AltModifier));
}

} // namespace zelctl::platform

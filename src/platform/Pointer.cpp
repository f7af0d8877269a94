#include "Pointer.h"

#include <QCursor>
#include <QPointer>
#include <QWidget>

namespace zelctl::platform {

namespace {

QPointer<QWidget> &captureHolder()
{
    static QPointer<QWidget> holder;
    return holder;
}

} // namespace

QPoint cursorPos()
{
    return QCursor::pos();
}

QPoint screenToClient(const QWidget *widget, QPoint screen)
{
    return widget ? widget->mapFromGlobal(screen) : screen;
}

void setCapture(QWidget *widget)
{
    QPointer<QWidget> &holder = captureHolder();
    if (holder == widget)
        return;
    if (holder)
        holder->releaseMouse();
    holder = widget;
    if (widget)
        widget->grabMouse();
}

void releaseCapture()
{
    setCapture(nullptr);
}

QWidget *capturedWidget()
{
    return captureHolder().data();
}

} // namespace zelctl::platform

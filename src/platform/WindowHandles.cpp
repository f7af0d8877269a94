#include "WindowHandles.h"

#include <QHash>
#include <QPointer>
#include <QWidget>

namespace zelctl::platform {

namespace {

struct HandleTable
{
    QHash<HWND, QPointer<QWidget>> widgets;
    QHash<const QWidget *, HWND> handles;
    HWND next = 0x10000;
};

HandleTable &table()
{
    static HandleTable instance;
    return instance;
}

} // namespace

HWND handleOf(QWidget *widget)
{
    if (!widget)
        return 0;
    HandleTable &t = table();
    if (auto it = t.handles.constFind(widget); it != t.handles.cend())
        return it.value();
    const HWND handle = t.next++;
    t.widgets.insert(handle, widget);
    t.handles.insert(widget, handle);
    QObject::connect(widget, &QObject::destroyed, [handle](QObject *gone) {
        HandleTable &t = table();
        t.widgets.remove(handle);
        t.handles.remove(static_cast<const QWidget *>(gone));
    });
    return handle;
}

QWidget *widgetOf(HWND handle)
{
    return table().widgets.value(handle).data();
}

} // namespace zelctl::platform

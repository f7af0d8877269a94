#include "TooltipControl.h"

#include "tips/TooltipWindow.h"

namespace zelctl::tooltipControl {

namespace {

MessageHook &hook()
{
    static MessageHook current;
    return current;
}

TooltipWindow *tooltipWindow(HWND window)
{
    return qobject_cast<TooltipWindow *>(platform::widgetOf(window));
}

} // namespace

HWND CreateTooltipWindow(UINT style, HWND owner)
{
    QWidget *ownerWidget = platform::widgetOf(owner);
    if (!ownerWidget)
        return 0;
    return platform::handleOf(new TooltipWindow(style, ownerWidget));
}

bool DestroyWindow(HWND window)
{
    // Only tooltip windows: the tips never destroy a window of the host.
    TooltipWindow *tip = tooltipWindow(window);
    delete tip;
    return tip != nullptr;
}

LRESULT SendMessageA(HWND window, UINT message, WPARAM wParam, LPARAM lParam)
{
    if (hook())
        hook()(window, message, wParam, lParam);
    TooltipWindow *tip = tooltipWindow(window);
    return tip ? tip->message(message, wParam, lParam) : 0;
}

RECT GetClientRect(HWND window)
{
    const QWidget *widget = platform::widgetOf(window);
    return widget ? RECT { 0, 0, widget->width(), widget->height() } : RECT {};
}

MessageHook setMessageHook(MessageHook replacement)
{
    return std::exchange(hook(), std::move(replacement));
}

} // namespace zelctl::tooltipControl

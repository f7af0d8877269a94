#pragma once

#include "zelctl_export.h"

#include "common/modFuncs.h"
#include "platform/WindowHandles.h"

#include <QtGlobal>

#include <functional>

// The tooltip control the balloon tips drive: a window made by CreateTooltipWindow and
// configured only through the messages below, as the tip class has always driven it. The
// window itself is TooltipWindow.
namespace zelctl::tooltipControl {

using HWND = platform::HWND;
using UINT = quint32;
using WPARAM = quintptr;
using LPARAM = qintptr;
using LRESULT = qintptr;
using RECT = modFuncs::RECT;

// Window class name, kept as the object name of every tooltip window.
inline constexpr const char *TOOLTIPS_CLASSA = "tooltips_class32";

// Window styles.
inline constexpr UINT TTS_ALWAYSTIP = 0x01;
inline constexpr UINT TTS_NOPREFIX = 0x02;
inline constexpr UINT TTS_BALLOON = 0x40;

// Tool flags.
inline constexpr UINT TTF_IDISHWND = 0x01; // uId is a window: the tool is its whole client area
inline constexpr UINT TTF_CENTERTIP = 0x02; // the tip sits centred under the tool, not at the pointer
inline constexpr UINT TTF_SUBCLASS = 0x10; // the tip window watches the tool's pointer input itself
inline constexpr UINT TTF_TRANSPARENT = 0x100; // pointer input passes through the tip

// Delay kinds of TTM_SETDELAYTIME.
inline constexpr WPARAM TTDT_AUTOPOP = 2;
inline constexpr WPARAM TTDT_INITIAL = 3;

// Icons of TTM_SETTITLEA.
inline constexpr WPARAM TTI_NONE = 0;
inline constexpr WPARAM TTI_INFO = 1;
inline constexpr WPARAM TTI_WARNING = 2;
inline constexpr WPARAM TTI_ERROR = 3;

inline constexpr UINT WM_USER = 0x0400;
inline constexpr UINT TTM_ACTIVATE = WM_USER + 1;
inline constexpr UINT TTM_SETDELAYTIME = WM_USER + 3;
inline constexpr UINT TTM_ADDTOOLA = WM_USER + 4;
inline constexpr UINT TTM_UPDATETIPTEXTA = WM_USER + 12;
inline constexpr UINT TTM_SETTIPBKCOLOR = WM_USER + 19;
inline constexpr UINT TTM_SETTIPTEXTCOLOR = WM_USER + 20;
inline constexpr UINT TTM_SETTITLEA = WM_USER + 32;

static_assert(TTM_UPDATETIPTEXTA == 0x040C && TTM_SETTIPTEXTCOLOR == 0x0414 && TTM_SETTITLEA == 0x0420);

// One tool: the window (and area of it) over which the tip shows, and its text. Texts are
// narrow strings in UTF-8.
struct TOOLINFOA
{
    UINT cbSize = 0;
    UINT uFlags = 0;
    HWND hwnd = 0;
    WPARAM uId = 0;
    RECT rect;
    quintptr hinst = 0;
    const char *lpszText = nullptr;
    LPARAM lParam = 0;
};

// The size a tool record declares in cbSize: that of the record with 32-bit pointers. The
// tooltip window refuses records that declare any other size.
inline constexpr UINT TOOLINFOA_SIZE = 44;

// A new tooltip window owned by the owner window (it closes with it), with the given TTS_
// styles; it stays above other windows and never takes the focus. 0 when the owner handle
// names no window.
ZELCTL_EXPORT HWND CreateTooltipWindow(UINT style, HWND owner);

// Destroys a tooltip window; false when the handle names none.
ZELCTL_EXPORT bool DestroyWindow(HWND window);

// Delivers a TTM_ message to a tooltip window and returns its answer: non-zero for success
// (TTM_ADDTOOLA, TTM_SETTITLEA), 0 otherwise or when the handle names no tooltip window.
ZELCTL_EXPORT LRESULT SendMessageA(HWND window, UINT message, WPARAM wParam, LPARAM lParam);

// The client rectangle of a window: (0, 0) to its width and height in pixels; empty when
// the handle names no window.
ZELCTL_EXPORT RECT GetClientRect(HWND window);

// Sees every message sent to a tooltip window before the window handles it, pointers in
// lParam still valid. Used to observe how the tips are driven.
using MessageHook = std::function<void(HWND window, UINT message, WPARAM wParam, LPARAM lParam)>;

// Installs a hook and returns the previous one; an empty hook removes it.
ZELCTL_EXPORT MessageHook setMessageHook(MessageHook hook);

} // namespace zelctl::tooltipControl

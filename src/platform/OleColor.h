#pragma once

#include "zelctl_export.h"

#include <QColor>
#include <QtGlobal>

// Colours as the public interfaces carry them: 0x00BBGGRR, or with the high bit set the
// index of a system colour in the low byte.
namespace zelctl::platform {

using OleColor = quint32;

inline constexpr OleColor SystemColorFlag = 0x80000000u;

// System colour indices used by the controls.
enum SysColor : int {
    COLOR_SCROLLBAR = 0,
    COLOR_BACKGROUND = 1,
    COLOR_ACTIVECAPTION = 2,
    COLOR_INACTIVECAPTION = 3,
    COLOR_MENU = 4,
    COLOR_WINDOW = 5,
    COLOR_WINDOWFRAME = 6,
    COLOR_MENUTEXT = 7,
    COLOR_WINDOWTEXT = 8,
    COLOR_CAPTIONTEXT = 9,
    COLOR_ACTIVEBORDER = 10,
    COLOR_INACTIVEBORDER = 11,
    COLOR_APPWORKSPACE = 12,
    COLOR_HIGHLIGHT = 13,
    COLOR_HIGHLIGHTTEXT = 14,
    COLOR_BTNFACE = 15,
    COLOR_BTNSHADOW = 16,
    COLOR_GRAYTEXT = 17,
    COLOR_BTNTEXT = 18,
    COLOR_INACTIVECAPTIONTEXT = 19,
    COLOR_BTNHIGHLIGHT = 20,
    COLOR_3DDKSHADOW = 21,
    COLOR_3DLIGHT = 22,
    COLOR_INFOTEXT = 23,
    COLOR_INFOBK = 24,
    COLOR_HOTLIGHT = 26,
    COLOR_GRADIENTACTIVECAPTION = 27,
    COLOR_GRADIENTINACTIVECAPTION = 28,
    COLOR_MENUHILIGHT = 29,
    COLOR_MENUBAR = 30,
};

constexpr OleColor systemColor(SysColor index)
{
    return SystemColorFlag | static_cast<OleColor>(index);
}

constexpr OleColor rgb(int red, int green, int blue)
{
    return static_cast<OleColor>((red & 0xFF) | ((green & 0xFF) << 8) | ((blue & 0xFF) << 16));
}

static_assert(rgb(0x12, 0x34, 0x56) == 0x563412u);

// The system colour of an index as 0x00BBGGRR. The values are fixed (the classic desktop
// scheme), so drawing is the same on every machine; unknown indices give black.
ZELCTL_EXPORT OleColor GetSysColor(int index);

// Resolves a system colour to its RGB value; plain colours come back unchanged (high byte cleared).
ZELCTL_EXPORT OleColor translateColor(OleColor color);

ZELCTL_EXPORT QColor toQColor(OleColor color);
ZELCTL_EXPORT OleColor fromQColor(const QColor &color);

} // namespace zelctl::platform

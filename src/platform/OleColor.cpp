#include "OleColor.h"

#include <array>

namespace zelctl::platform {

OleColor GetSysColor(int index)
{
    static constexpr std::array<OleColor, 31> scheme = {
        rgb(200, 200, 200), // scroll bar
        rgb(0, 0, 0), // desktop
        rgb(153, 180, 209), // active caption
        rgb(191, 205, 219), // inactive caption
        rgb(240, 240, 240), // menu
        rgb(255, 255, 255), // window
        rgb(100, 100, 100), // window frame
        rgb(0, 0, 0), // menu text
        rgb(0, 0, 0), // window text
        rgb(0, 0, 0), // caption text
        rgb(180, 180, 180), // active border
        rgb(244, 247, 252), // inactive border
        rgb(171, 171, 171), // application workspace
        rgb(51, 153, 255), // highlight
        rgb(255, 255, 255), // highlight text
        rgb(240, 240, 240), // button face
        rgb(160, 160, 160), // button shadow
        rgb(109, 109, 109), // grey text
        rgb(0, 0, 0), // button text
        rgb(67, 78, 84), // inactive caption text
        rgb(255, 255, 255), // button highlight
        rgb(105, 105, 105), // 3D dark shadow
        rgb(227, 227, 227), // 3D light
        rgb(0, 0, 0), // tooltip text
        rgb(255, 255, 225), // tooltip background
        rgb(0, 0, 0), // unused
        rgb(0, 102, 204), // hot-track
        rgb(185, 209, 234), // active caption gradient
        rgb(215, 228, 242), // inactive caption gradient
        rgb(51, 153, 255), // menu highlight
        rgb(240, 240, 240), // menu bar
    };
    if (index < 0 || index >= static_cast<int>(scheme.size()))
        return 0;
    return scheme[static_cast<size_t>(index)];
}

OleColor translateColor(OleColor color)
{
    if (color & SystemColorFlag)
        return GetSysColor(static_cast<int>(color & 0xFFu));
    return color & 0x00FFFFFFu;
}

QColor toQColor(OleColor color)
{
    const OleColor value = translateColor(color);
    return QColor(value & 0xFF, (value >> 8) & 0xFF, (value >> 16) & 0xFF);
}

OleColor fromQColor(const QColor &color)
{
    return rgb(color.red(), color.green(), color.blue());
}

} // namespace zelctl::platform

// Drawing with no pixel inside the target leaves it as it was, whatever coordinates a host
// passes. Blits, blends, fills and pens meet such rectangles in the raster model's cases.

#include "GdiTestSupport.h"

#include "platform/gdi/Pictures.h"

#include <QImage>

#include <gtest/gtest.h>

#include <climits>
#include <cstring>
#include <functional>

namespace zelctl::gdi::test {

TEST(Clipping, drawingWithNothingInsideTheTargetLeavesItAlone)
{
    constexpr int Side = 8;
    const struct
    {
        const char *name;
        int x, y, width, height;
    } nothingToDraw[] = {
        // Rows inside, columns not: the per-pixel blend once read its first column from an empty list.
        { "wholly left", -10, 2, 4, 4 },
        { "wholly right", Side, 2, 4, 4 },
        { "wholly below", 2, Side, 4, 4 },
        { "zero width", 2, 2, 0, 4 },
        { "negative height reaching up", 2, -1, 4, -4 },
        { "far before the bitmap limit", -70000, 2, 65536, 4 },
        { "most negative", INT_MIN, INT_MIN, INT_MAX, INT_MAX },
        { "most positive", INT_MAX, INT_MAX, INT_MAX, INT_MAX },
        { "inverted huge", INT_MAX, 2, INT_MIN, 4 },
    };
    using Area = decltype(nothingToDraw[0]);
    QImage picture(4, 4, QImage::Format_ARGB32_Premultiplied);
    picture.fill(0x80402010);
    const std::pair<const char *, std::function<void(HDC, const Area &)>> entryPoints[] = {
        { "drawPicture", [&](HDC t, const Area &a) { drawPicture(t, picture, a.x, a.y, a.width, a.height); } },
        { "TextOut", [](HDC t, const Area &a) { TextOut(t, a.x, a.y, QStringLiteral("Wg")); } },
        { "PSet", [&](HDC t, const Area &a) { PSet(t, a.x, a.y, 0); } },
    };
    for (int bpp : { 8, 24, 32 }) {
        TestBitmap target(Side, Side, bpp, bpp != 24, { 0x102030, 0xFFFFFF });
        std::memset(target.bits, 0x5A, size_t(target.stride) * Side);
        const QByteArray before = target.bytes();
        for (const auto &[name, draw] : entryPoints) {
            for (Area area : nothingToDraw) {
                // Text and dots are drawn from their corner: only a corner past the far edges or
                // far before the near ones leaves the target untouched.
                const auto near = [](int v) { return v > -1000 && v < Side; };
                if ((name == std::string_view("TextOut") || name == std::string_view("PSet")) && near(area.x)
                    && near(area.y))
                    continue;
                draw(target.dc, area);
                EXPECT_EQ(target.bytes(), before) << name << ", " << area.name << ", " << bpp << " bits";
            }
        }
    }
}

} // namespace zelctl::gdi::test

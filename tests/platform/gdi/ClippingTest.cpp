// Drawing that lands wholly outside the target, or has no area, must leave the target as
// it was and return, whatever coordinates a host passes. Blits, blends, fills and pens
// meet such rectangles in the raster model's random cases too.

#include "GdiTestSupport.h"

#include "platform/gdi/Pictures.h"

#include <QImage>
#include <QWidget>

#include <gtest/gtest.h>

#include <climits>
#include <cstring>
#include <functional>

namespace zelctl::gdi::test {

namespace {

constexpr int Side = 8;

struct Area
{
    const char *name;
    int x, y, width, height;
};

// Rectangles that cover no pixel of a Side × Side target. Clipped on one axis only (rows
// inside, columns not), the per-pixel blend once read its first column from an empty list.
const Area nothingToDraw[] = {
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

} // namespace

TEST(Clipping, drawingWithNothingInsideTheTargetLeavesItAlone)
{
    TestBitmap source(4, 4, 32);
    source.fill(0x80402010);
    QImage picture(4, 4, QImage::Format_ARGB32_Premultiplied);
    picture.fill(0x80402010);
    const std::pair<const char *, std::function<void(HDC, const Area &)>> entryPoints[] = {
        { "AlphaBlend",
            [&](HDC t, const Area &a) {
                AlphaBlend(
                    t, a.x, a.y, a.width, a.height, source.dc, 0, 0, 4, 4, { AC_SRC_OVER, 0, 255, AC_SRC_ALPHA });
            } },
        { "drawPicture", [&](HDC t, const Area &a) { drawPicture(t, picture, a.x, a.y, a.width, a.height); } },
        { "TextOut", [](HDC t, const Area &a) { TextOut(t, a.x, a.y, QStringLiteral("Wg")); } },
        { "PSet", [&](HDC t, const Area &a) { PSet(t, a.x, a.y, 0); } },
    };
    for (int bpp : { 8, 24, 32 }) {
        TestBitmap target(Side, Side, bpp, bpp != 24, { 0x102030, 0xFFFFFF });
        std::memset(target.bits, 0x5A, size_t(target.stride) * Side);
        const QByteArray before = target.bytes();
        for (const auto &[name, draw] : entryPoints) {
            for (const Area &area : nothingToDraw) {
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

TEST(Clipping, redrawingAnyRectangleOfAWindowIsSafe)
{
    QWidget window;
    window.resize(20, 20);
    const HWND handle = platform::handleOf(&window);
    EXPECT_TRUE(RedrawWindow(handle, nullptr, RDW_INVALIDATE | RDW_UPDATENOW));
    for (const Area &area : nothingToDraw) {
        const RECT r { area.x, area.y, int(qint64(area.x) + area.width), int(qint64(area.y) + area.height) };
        EXPECT_TRUE(RedrawWindow(handle, &r, RDW_INVALIDATE | RDW_UPDATENOW)) << area.name;
    }
    EXPECT_FALSE(RedrawWindow(0, nullptr, RDW_INVALIDATE));
    EXPECT_FALSE(RedrawWindow(handle + 1000, nullptr, RDW_INVALIDATE)) << "no such window";
}

} // namespace zelctl::gdi::test

// Drawing that lands wholly outside the target, or has no area, must leave the target as
// it was and return, whatever coordinates a host passes: every entry point, every depth.

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
    { "wholly above", 2, -10, 4, 4 },
    { "wholly below", 2, Side, 4, 4 },
    { "zero width", 2, 2, 0, 4 },
    { "zero height", 2, 2, 4, 0 },
    { "negative width reaching left", -1, 2, -4, 4 },
    { "negative height reaching up", 2, -1, 4, -4 },
    { "beyond the bitmap limit", 70000, 70000, 4, 4 },
    { "far before the bitmap limit", -70000, 2, 65536, 4 },
    { "most negative", INT_MIN, INT_MIN, INT_MAX, INT_MAX },
    { "most positive", INT_MAX, INT_MAX, INT_MAX, INT_MAX },
    { "inverted huge", INT_MAX, 2, INT_MIN, 4 },
};

using Draw = std::function<void(HDC target, const Area &area)>;

struct EntryPoint
{
    const char *name;
    Draw draw;
};

BLENDFUNCTION blend(quint8 constant, bool perPixel)
{
    return BLENDFUNCTION { AC_SRC_OVER, 0, constant, quint8(perPixel ? AC_SRC_ALPHA : 0) };
}

std::vector<EntryPoint> entryPoints(HDC source)
{
    QImage picture(4, 4, QImage::Format_ARGB32_Premultiplied);
    picture.fill(0x80402010);
    return {
        { "AlphaBlend per pixel",
            [=](HDC t, const Area &a) {
                AlphaBlend(t, a.x, a.y, a.width, a.height, source, 0, 0, 4, 4, blend(255, true));
            } },
        { "AlphaBlend constant",
            [=](HDC t, const Area &a) {
                AlphaBlend(t, a.x, a.y, a.width, a.height, source, 0, 0, 4, 4, blend(90, false));
            } },
        { "BitBlt", [=](HDC t, const Area &a) { BitBlt(t, a.x, a.y, a.width, a.height, source, 0, 0, SRCCOPY); } },
        { "StretchBlt",
            [=](HDC t, const Area &a) { StretchBlt(t, a.x, a.y, a.width, a.height, source, 0, 0, 3, 3, SRCPAINT); } },
        { "StretchBlt halftone",
            [=](HDC t, const Area &a) {
                SetStretchBltMode(t, HALFTONE);
                StretchBlt(t, a.x, a.y, a.width, a.height, source, 0, 0, 3, 3, SRCCOPY);
                SetStretchBltMode(t, COLORONCOLOR);
            } },
        { "FillRect",
            [](HDC t, const Area &a) {
                const RECT r { a.x, a.y, int(qint64(a.x) + a.width), int(qint64(a.y) + a.height) };
                FillRect(t, r, GetStockObject(BLACK_BRUSH));
            } },
        { "Rectangle",
            [](HDC t, const Area &a) {
                Rectangle(t, a.x, a.y, int(qint64(a.x) + a.width), int(qint64(a.y) + a.height));
            } },
        { "TextOut", [](HDC t, const Area &a) { TextOut(t, a.x, a.y, QStringLiteral("Wg")); } },
        { "drawPicture", [=](HDC t, const Area &a) { drawPicture(t, picture, a.x, a.y, a.width, a.height); } },
    };
}

} // namespace

TEST(Clipping, drawingWithNothingInsideTheTargetLeavesItAlone)
{
    TestBitmap source(4, 4, 32);
    source.fill(0x80402010);
    for (int bpp : { 8, 24, 32 }) {
        TestBitmap target(Side, Side, bpp, bpp != 24, { 0x102030, 0xFFFFFF });
        std::memset(target.bits, 0x5A, size_t(target.stride) * Side);
        SelectObject(target.dc, GetStockObject(WHITE_BRUSH));
        const QByteArray before = target.bytes();
        for (const EntryPoint &entry : entryPoints(source.dc)) {
            for (const Area &area : nothingToDraw) {
                // Text runs on from its corner: only a corner past the far edges or far before
                // the near ones leaves the target untouched.
                const auto near = [](int v) { return v > -1000 && v < Side; };
                if (std::string_view(entry.name) == "TextOut" && near(area.x) && near(area.y))
                    continue;
                entry.draw(target.dc, area);
                EXPECT_EQ(target.bytes(), before) << entry.name << ", " << area.name << ", " << bpp << " bits";
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

#include "GdiTestSupport.h"

#include <gtest/gtest.h>

using namespace zelctl::gdi;
using zelctl::gdi::test::TestBitmap;

namespace {

HBITMAP makeBitmap(int width, int height, int bpp)
{
    BITMAPINFO info;
    info.bmiHeader.biWidth = width;
    info.bmiHeader.biHeight = -height;
    info.bmiHeader.biBitCount = quint16(bpp);
    return CreateDIBSection(0, &info, DIB_RGB_COLORS, nullptr);
}

} // namespace

TEST(Handles, staleHandlesFailEveryCall)
{
    const HDC dc = CreateCompatibleDC(0);
    const HBITMAP bitmap = makeBitmap(4, 4, 32);
    const HBRUSH brush = CreateSolidBrush(0x0000FF);
    ASSERT_TRUE(DeleteObject(bitmap));
    ASSERT_TRUE(DeleteObject(brush));
    EXPECT_EQ(SelectObject(dc, bitmap), 0);
    EXPECT_EQ(FillRect(dc, RECT { 0, 0, 1, 1 }, brush), 0);
    EXPECT_FALSE(DeleteObject(bitmap)) << "deleted twice";
    EXPECT_EQ(GetObjectType(bitmap), 0);
    BITMAP description;
    EXPECT_FALSE(GetObject(bitmap, description));

    ASSERT_TRUE(DeleteDC(dc));
    EXPECT_FALSE(DeleteDC(dc));
    EXPECT_FALSE(BitBlt(dc, 0, 0, 1, 1, dc, 0, 0, SRCCOPY));
    EXPECT_EQ(SetTextColor(dc, 0), CLR_INVALID);
    EXPECT_EQ(SetStretchBltMode(dc, HALFTONE), 0);
    EXPECT_EQ(GetPixel(dc, 0, 0), CLR_INVALID);
    EXPECT_EQ(CreateCompatibleDC(dc), 0);
    EXPECT_EQ(CreateCompatibleBitmap(dc, 2, 2), 0);
    EXPECT_EQ(SelectObject(0, brush), 0);
    EXPECT_FALSE(BitBlt(0x7FFFFFFF, 0, 0, 1, 1, -5, 0, 0, SRCCOPY));

    const HDC newer = CreateCompatibleDC(0);
    EXPECT_NE(newer, dc) << "handles are not reused";
    DeleteDC(newer);
}

TEST(Handles, wrongKindsAreRefused)
{
    TestBitmap b(2, 2, 24);
    const HBRUSH brush = CreateSolidBrush(0);
    EXPECT_EQ(SelectObject(b.dc, b.dc), 0) << "a DC is not selectable";
    EXPECT_FALSE(BitBlt(b.bitmap, 0, 0, 1, 1, b.dc, 0, 0, SRCCOPY)) << "a bitmap is not a DC";
    EXPECT_FALSE(BitBlt(b.dc, 0, 0, 1, 1, brush, 0, 0, SRCCOPY));
    EXPECT_EQ(FillRect(b.dc, RECT { 0, 0, 1, 1 }, b.bitmap), 0) << "a bitmap is not a brush";
    EXPECT_FALSE(DeleteObject(b.dc)) << "DCs go with DeleteDC";
    EXPECT_FALSE(DeleteDC(b.bitmap));
    EXPECT_EQ(GetDIBits(b.bitmap, b.bitmap, 0, 1, nullptr, nullptr, DIB_RGB_COLORS), 0);
    BITMAP description;
    EXPECT_FALSE(GetObject(brush, description));
    EXPECT_EQ(GetObjectType(b.dc), OBJ_MEMDC);
    EXPECT_EQ(GetObjectType(b.bitmap), OBJ_BITMAP);
    EXPECT_EQ(GetObjectType(brush), OBJ_BRUSH);
    EXPECT_EQ(GetObjectType(0), 0);
    EXPECT_FALSE(BitBlt(b.dc, 0, 0, 1, 1, b.dc, 0, 0, 0x00660046)) << "raster operations other than the three";
    BLENDFUNCTION unknown;
    unknown.BlendOp = 1;
    EXPECT_FALSE(AlphaBlend(b.dc, 0, 0, 1, 1, b.dc, 0, 0, 1, 1, unknown)) << "blend operations other than over";
    EXPECT_FALSE(AlphaBlend(b.bitmap, 0, 0, 1, 1, b.dc, 0, 0, 1, 1, BLENDFUNCTION {}));
    EXPECT_TRUE(DeleteObject(brush));
}

TEST(Handles, selectedObjectsStayAliveUntilDeselected)
{
    const HDC dc = CreateCompatibleDC(0);
    const HBITMAP stockBitmap = GetCurrentObject(dc, OBJ_BITMAP);
    EXPECT_NE(stockBitmap, 0);
    const HBITMAP bitmap = makeBitmap(3, 3, 24);
    EXPECT_EQ(SelectObject(dc, bitmap), stockBitmap) << "returns the previous bitmap";
    EXPECT_EQ(GetCurrentObject(dc, OBJ_BITMAP), bitmap);
    EXPECT_FALSE(DeleteObject(bitmap)) << "still selected";

    // The same bitmap may be selected into a second DC as well.
    const HDC other = CreateCompatibleDC(dc);
    EXPECT_NE(SelectObject(other, bitmap), 0);
    EXPECT_EQ(SelectObject(dc, stockBitmap), bitmap);
    EXPECT_FALSE(DeleteObject(bitmap)) << "the second DC still holds it";
    EXPECT_TRUE(DeleteDC(other)) << "deleting a DC releases its objects";
    EXPECT_TRUE(DeleteObject(bitmap));

    const HBRUSH brush = CreateSolidBrush(0x00FF00);
    const HBRUSH stockBrush = SelectObject(dc, brush);
    EXPECT_EQ(stockBrush, GetStockObject(WHITE_BRUSH));
    EXPECT_FALSE(DeleteObject(brush));
    SelectObject(dc, stockBrush);
    EXPECT_TRUE(DeleteObject(brush));
    EXPECT_TRUE(DeleteObject(GetStockObject(BLACK_BRUSH))) << "deleting a stock object is harmless";
    EXPECT_EQ(GetObjectType(GetStockObject(BLACK_BRUSH)), OBJ_BRUSH);
    EXPECT_EQ(GetStockObject(99), 0);
    DeleteDC(dc);
}

TEST(Handles, dcStateHasItsDefaultsAndRefusesUnknownModes)
{
    const HDC dc = CreateCompatibleDC(0);
    EXPECT_EQ(GetTextColor(dc), 0x000000u);
    EXPECT_EQ(GetBkColor(dc), 0xFFFFFFu);
    EXPECT_EQ(GetStretchBltMode(dc), COLORONCOLOR);
    EXPECT_EQ(GetROP2(dc), R2_COPYPEN);
    EXPECT_EQ(SetStretchBltMode(dc, HALFTONE), COLORONCOLOR);
    EXPECT_EQ(SetStretchBltMode(dc, 5), 0);
    EXPECT_EQ(GetStretchBltMode(dc), HALFTONE);
    EXPECT_EQ(SetROP2(dc, 6), 0);
    EXPECT_EQ(SetROP2(dc, R2_XORPEN), R2_COPYPEN);
    EXPECT_EQ(SetTextColor(dc, 0x123456), 0x000000u);
    EXPECT_EQ(SetBkColor(dc, 0x654321), 0xFFFFFFu);
    POINT old;
    EXPECT_TRUE(SetBrushOrgEx(dc, 3, 4, &old));
    EXPECT_TRUE(SetBrushOrgEx(dc, 0, 0, &old));
    EXPECT_EQ(old.x, 3);
    EXPECT_EQ(old.y, 4);
    DeleteDC(dc);
}

TEST(Handles, compatibleBitmapsFollowTheSelectedFormat)
{
    TestBitmap indexed(2, 2, 8, false, { 0x000000, 0x112233 });
    const HBITMAP same = CreateCompatibleBitmap(indexed.dc, 5, 4);
    DIBSECTION section;
    ASSERT_TRUE(GetObject(same, section));
    EXPECT_EQ(section.dsBm.bmBitsPixel, 8);
    EXPECT_EQ(section.dsBm.bmWidth, 5);
    EXPECT_EQ(section.dsBmih.biHeight, 4) << "bottom-up like the selected bitmap";
    const HDC dc = CreateCompatibleDC(0);
    SelectObject(dc, same);
    RGBQUAD entry;
    GetDIBColorTable(dc, 1, 1, &entry);
    EXPECT_EQ(entry.rgbRed, 0x11) << "the colour table is copied";
    const HBITMAP screen = CreateCompatibleBitmap(0, 3, 3);
    const HDC blank = CreateCompatibleDC(0);
    const HBITMAP fresh = CreateCompatibleBitmap(blank, 3, 3);
    for (HBITMAP b : { screen, fresh }) {
        ASSERT_TRUE(GetObject(b, section));
        EXPECT_EQ(section.dsBm.bmBitsPixel, 32);
        EXPECT_EQ(section.dsBmih.biHeight, -3);
    }
    EXPECT_EQ(CreateCompatibleBitmap(0, 0, 3), 0);
    EXPECT_EQ(CreateCompatibleBitmap(0, 3, -3), 0);
    SelectObject(dc, GetCurrentObject(blank, OBJ_BITMAP));
    EXPECT_TRUE(DeleteObject(same));
    DeleteDC(blank);
    DeleteObject(screen);
    DeleteObject(fresh);
    DeleteDC(dc);
}

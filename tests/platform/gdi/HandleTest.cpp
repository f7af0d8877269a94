#include "GdiTestSupport.h"

#include <gtest/gtest.h>

using namespace zelctl::gdi;
using zelctl::gdi::test::TestBitmap;

TEST(Handles, staleHandlesAndWrongKindsFailEveryCall)
{
    TestBitmap b(2, 2, 24);
    const HDC dc = CreateCompatibleDC(0);
    const HBITMAP bitmap = CreateCompatibleBitmap(0, 4, 4);
    const HBRUSH brush = CreateSolidBrush(0x0000FF), stale = CreateSolidBrush(0);
    ASSERT_TRUE(DeleteObject(bitmap));
    ASSERT_TRUE(DeleteObject(stale));
    ASSERT_TRUE(DeleteDC(dc));
    EXPECT_EQ(SelectObject(b.dc, bitmap), 0);
    EXPECT_EQ(FillRect(b.dc, RECT { 0, 0, 1, 1 }, stale), 0);
    EXPECT_FALSE(DeleteObject(bitmap)) << "deleted twice";
    EXPECT_FALSE(DeleteDC(dc));
    BITMAP description;
    EXPECT_FALSE(GetObject(bitmap, description));
    EXPECT_FALSE(BitBlt(dc, 0, 0, 1, 1, b.dc, 0, 0, SRCCOPY));
    EXPECT_EQ(SetTextColor(dc, 0), CLR_INVALID);
    EXPECT_EQ(GetPixel(dc, 0, 0), CLR_INVALID);
    EXPECT_EQ(CreateCompatibleDC(dc), 0);
    EXPECT_EQ(CreateCompatibleBitmap(dc, 2, 2), 0);
    const HDC newer = CreateCompatibleDC(0);
    EXPECT_NE(newer, dc) << "handles are not reused";
    DeleteDC(newer);

    for (HGDIOBJ h : { HGDIOBJ(0), HGDIOBJ(bitmap), HGDIOBJ(dc) })
        EXPECT_EQ(GetObjectType(h), 0);
    EXPECT_EQ(GetObjectType(b.dc), OBJ_MEMDC);
    EXPECT_EQ(GetObjectType(b.bitmap), OBJ_BITMAP);
    EXPECT_EQ(GetObjectType(brush), OBJ_BRUSH);
    EXPECT_EQ(SelectObject(b.dc, b.dc), 0) << "a DC is not selectable";
    EXPECT_FALSE(BitBlt(b.bitmap, 0, 0, 1, 1, b.dc, 0, 0, SRCCOPY)) << "a bitmap is not a DC";
    EXPECT_FALSE(BitBlt(b.dc, 0, 0, 1, 1, brush, 0, 0, SRCCOPY));
    EXPECT_EQ(FillRect(b.dc, RECT { 0, 0, 1, 1 }, b.bitmap), 0) << "a bitmap is not a brush";
    EXPECT_FALSE(DeleteObject(b.dc)) << "DCs go with DeleteDC";
    EXPECT_FALSE(DeleteDC(b.bitmap));
    EXPECT_EQ(GetDIBits(b.bitmap, b.bitmap, 0, 1, nullptr, nullptr, DIB_RGB_COLORS), 0);
    EXPECT_FALSE(GetObject(brush, description));
    EXPECT_FALSE(BitBlt(b.dc, 0, 0, 1, 1, b.dc, 0, 0, 0x00660046)) << "raster operations other than the three";
    EXPECT_FALSE(AlphaBlend(b.dc, 0, 0, 1, 1, b.dc, 0, 0, 1, 1, { 1, 0, 255, 0 })) << "blends other than over";
    EXPECT_FALSE(AlphaBlend(b.bitmap, 0, 0, 1, 1, b.dc, 0, 0, 1, 1, BLENDFUNCTION {}));
    EXPECT_EQ(SetStretchBltMode(b.dc, 5), 0);
    EXPECT_EQ(SetROP2(b.dc, 6), 0);
    EXPECT_EQ(GetStockObject(99), 0);
    EXPECT_TRUE(DeleteObject(brush));
}

TEST(Handles, selectedObjectsStayAliveUntilDeselected)
{
    const HDC dc = CreateCompatibleDC(0);
    const HBITMAP stockBitmap = GetCurrentObject(dc, OBJ_BITMAP);
    EXPECT_NE(stockBitmap, 0);
    EXPECT_EQ(GetStretchBltMode(dc), COLORONCOLOR) << "a fresh DC takes the nearest pixel";
    EXPECT_EQ(GetROP2(dc), R2_COPYPEN);
    const HBITMAP bitmap = CreateCompatibleBitmap(0, 3, 3);
    EXPECT_EQ(SelectObject(dc, bitmap), stockBitmap) << "returns the previous bitmap";
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
    const HBITMAP blank = SelectObject(dc, same);
    RGBQUAD entry;
    GetDIBColorTable(dc, 1, 1, &entry);
    EXPECT_EQ(entry.rgbRed, 0x11) << "the colour table is copied";
    SelectObject(dc, blank);
    const HBITMAP screen = CreateCompatibleBitmap(0, 3, 3), fresh = CreateCompatibleBitmap(dc, 3, 3);
    for (HBITMAP b : { screen, fresh }) {
        ASSERT_TRUE(GetObject(b, section));
        EXPECT_EQ(section.dsBm.bmBitsPixel, 32);
        EXPECT_EQ(section.dsBmih.biHeight, -3);
        DeleteObject(b);
    }
    EXPECT_EQ(CreateCompatibleBitmap(0, 0, 3), 0);
    EXPECT_EQ(CreateCompatibleBitmap(0, 3, -3), 0);
    DeleteObject(same);
    DeleteDC(dc);
}

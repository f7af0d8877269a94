#include "GdiTestSupport.h"

#include <gtest/gtest.h>

using namespace zelctl::gdi;
using zelctl::gdi::test::TestBitmap;

TEST(Handles, staleHandlesWrongKindsAndUnknownModesFail)
{
    TestBitmap b(2, 2, 24);
    const HDC dc = CreateCompatibleDC(0);
    const HBITMAP bitmap = CreateCompatibleBitmap(0, 4, 4);
    const HBRUSH brush = CreateSolidBrush(0);
    ASSERT_TRUE(DeleteObject(bitmap));
    ASSERT_TRUE(DeleteObject(brush));
    ASSERT_TRUE(DeleteDC(dc));
    EXPECT_EQ(SelectObject(b.dc, bitmap), 0);
    EXPECT_EQ(FillRect(b.dc, RECT { 0, 0, 1, 1 }, brush), 0);
    EXPECT_FALSE(DeleteObject(bitmap)) << "deleted twice";
    EXPECT_FALSE(BitBlt(dc, 0, 0, 1, 1, b.dc, 0, 0, SRCCOPY));
    const HDC newer = CreateCompatibleDC(0);
    EXPECT_NE(newer, dc) << "handles are not reused";
    DeleteDC(newer);

    EXPECT_EQ(SelectObject(b.dc, b.dc), 0) << "a DC is not selectable";
    EXPECT_FALSE(BitBlt(b.bitmap, 0, 0, 1, 1, b.dc, 0, 0, SRCCOPY)) << "a bitmap is not a DC";
    EXPECT_FALSE(BitBlt(b.dc, 0, 0, 1, 1, b.dc, 0, 0, 0x00660046)) << "raster operations other than the three";
    EXPECT_FALSE(AlphaBlend(b.dc, 0, 0, 1, 1, b.dc, 0, 0, 1, 1, { 1, 0, 255, 0 })) << "blends other than over";
    EXPECT_EQ(SetStretchBltMode(b.dc, 5), 0);
}

#include "GdiTestSupport.h"

#include <gtest/gtest.h>

#include <string>

using namespace zelctl::gdi;
using zelctl::gdi::test::TestBitmap;

// Dots of every width are in the number badge's golden pictures, lines and outlines in the
// raster model; text is measured and centred in the badge's and the menus' pictures.
TEST(Text, drawsUprightInTheTextColourWithinItsMeasuredExtentAndNeedsAColourBitmap)
{
    const HFONT font = CreateFont(QStringLiteral("DejaVu Sans"), 10, true);
    ASSERT_NE(font, 0);
    std::vector<QByteArray> renderings;
    for (bool topDown : { true, false }) {
        TestBitmap b(40, 24, 24, topDown);
        b.fill(0xFFFFFF);
        const HFONT original = SelectObject(b.dc, font);
        SetTextColor(b.dc, 0x0000FF);
        SIZE extent;
        ASSERT_TRUE(GetTextExtentPoint32(b.dc, QStringLiteral("Wg"), extent));
        ASSERT_TRUE(TextOut(b.dc, 3, 2, QStringLiteral("Wg")));
        int inked = 0, outside = 0, pure = 0;
        QByteArray picture;
        for (int y = 0; y < 24; ++y)
            for (int x = 0; x < 40; ++x) {
                const quint32 p = b.value(x, y);
                picture += p == 0xFFFFFF ? '.' : '#';
                inked += p != 0xFFFFFF;
                pure += p == 0xFF0000;
                outside += p != 0xFFFFFF && (x < 3 || y < 2 || x >= 3 + extent.cx || y >= 2 + extent.cy);
            }
        EXPECT_GT(pure, 5) << "solid strokes in the text colour";
        EXPECT_GT(inked, 20);
        EXPECT_EQ(outside, 0) << "top-down " << topDown;
        renderings.push_back(picture);
        SelectObject(b.dc, original);
    }
    EXPECT_EQ(renderings[0], renderings[1]) << "a bottom-up bitmap shows the text upright too";
    TestBitmap indexed(4, 4, 8);
    SIZE s;
    EXPECT_FALSE(TextOut(indexed.dc, 0, 0, QStringLiteral("W"))) << "8-bit bitmaps take no text";
    EXPECT_FALSE(GetTextExtentPoint32(indexed.bitmap, QStringLiteral("W"), s));
    EXPECT_EQ(CreateFont(QStringLiteral("DejaVu Sans"), 0, false), 0);
    DeleteObject(font);
}

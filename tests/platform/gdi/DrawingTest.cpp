#include "GdiTestSupport.h"

#include <gtest/gtest.h>

#include <string>

using namespace zelctl::gdi;
using zelctl::gdi::test::TestBitmap;

namespace {

// The pixels of a 24-bit bitmap as a picture: '#' where the pixel is `ink`, '.' elsewhere.
std::string picture(const TestBitmap &b, int width, quint32 ink)
{
    std::string out;
    for (int y = 0; y < b.height; ++y) {
        for (int x = 0; x < width; ++x)
            out += b.value(x, y) == ink ? '#' : '.';
        out += '\n';
    }
    return out;
}

// Owns a GDI object for the length of a test.
struct Owned
{
    explicit Owned(HGDIOBJ h)
        : handle(h)
    { }
    ~Owned() { DeleteObject(handle); }
    HGDIOBJ handle;
};

} // namespace

TEST(PSet, drawsRoundDotsOfThePenWidth)
{
    TestBitmap b(7, 7, 24);
    const quint32 ink = 0xFFFFFF;
    struct Case
    {
        int width;
        const char *shape;
    };
    const Case cases[] = {
        { 1, ".......\n.......\n.......\n...#...\n.......\n.......\n.......\n" },
        // An even width is centred on the pixel's top-left corner.
        { 2, ".......\n.......\n..##...\n..##...\n.......\n.......\n.......\n" },
        { 5, ".......\n..###..\n.#####.\n.#####.\n.#####.\n..###..\n.......\n" },
    };
    for (const Case &c : cases) {
        b.fill(0);
        Owned pen(CreatePen(PS_SOLID, c.width, 0));
        SelectObject(b.dc, pen.handle);
        ASSERT_TRUE(PSet(b.dc, 3, 3, 0xFFFFFF));
        EXPECT_EQ(picture(b, 7, ink), c.shape) << "width " << c.width;
        SelectObject(b.dc, GetStockObject(BLACK_PEN));
    }
    EXPECT_TRUE(PSet(b.dc, -1, 100, 0xFFFFFF)) << "outside: nothing drawn, no failure";
}

TEST(PSet, xorDotUnderACopyDotLeavesAMixedRing)
{
    // The number badge: an XOR dot of width 7, then a copy dot of width 6, same colour.
    TestBitmap b(9, 9, 32);
    b.fill(0xFFFFFFFF);
    const COLORREF disc = 0x404040;
    Owned wide(CreatePen(PS_SOLID, 7, 0));
    Owned narrow(CreatePen(PS_SOLID, 6, 0));
    SetROP2(b.dc, R2_XORPEN);
    SelectObject(b.dc, wide.handle);
    PSet(b.dc, 4, 4, disc);
    SetROP2(b.dc, R2_COPYPEN);
    SelectObject(b.dc, narrow.handle);
    PSet(b.dc, 4, 4, disc);
    SelectObject(b.dc, GetStockObject(BLACK_PEN));
    EXPECT_EQ(b.argb(4, 1), 0xFF404040u) << "inside both";
    EXPECT_EQ(b.argb(4, 7), 0xFFBFBFBFu) << "ring: white XOR the disc colour, alpha kept";
    EXPECT_EQ(b.argb(0, 0), 0xFFFFFFFFu) << "outside both";
}

TEST(Text, drawsInTheTextColourWithinItsMeasuredExtent)
{
    Owned font(CreateFont(QStringLiteral("DejaVu Sans"), 10, true));
    ASSERT_NE(font.handle, 0);
    std::vector<std::string> renderings;
    for (bool topDown : { true, false }) {
        TestBitmap b(40, 24, 24, topDown);
        b.fill(0xFFFFFF);
        const HFONT original = SelectObject(b.dc, font.handle);
        SetTextColor(b.dc, 0x0000FF);
        SIZE extent;
        ASSERT_TRUE(GetTextExtentPoint32(b.dc, QStringLiteral("Wg"), extent));
        ASSERT_TRUE(TextOut(b.dc, 3, 2, QStringLiteral("Wg")));
        int inked = 0, outside = 0, pure = 0;
        for (int y = 0; y < 24; ++y)
            for (int x = 0; x < 40; ++x) {
                const quint32 p = b.value(x, y);
                if (p == 0xFFFFFF)
                    continue;
                ++inked;
                pure += p == 0xFF0000;
                if (x < 3 || y < 2 || x >= 3 + extent.cx || y >= 2 + extent.cy)
                    ++outside;
            }
        EXPECT_GT(pure, 5) << "solid strokes in the text colour";
        EXPECT_GT(inked, 20);
        EXPECT_EQ(outside, 0) << "top-down " << topDown;
        renderings.push_back(picture(b, 40, 0xFFFFFF));
        SelectObject(b.dc, original);
    }
    EXPECT_EQ(renderings[0], renderings[1]) << "a bottom-up bitmap shows the text upright too";
}

TEST(Text, measuresBySizeAndWeightAndNeedsAColourBitmap)
{
    TestBitmap b(4, 4, 8);
    Owned small(CreateFont(QStringLiteral("DejaVu Sans"), 8, false));
    Owned large(CreateFont(QStringLiteral("DejaVu Sans"), 20, false));
    Owned bold(CreateFont(QStringLiteral("DejaVu Sans"), 8, true));
    SIZE s, l, w;
    const QString text = QStringLiteral("Passo 12");
    const HFONT original = SelectObject(b.dc, small.handle);
    ASSERT_TRUE(GetTextExtentPoint32(b.dc, text, s));
    SelectObject(b.dc, bold.handle);
    ASSERT_TRUE(GetTextExtentPoint32(b.dc, text, w));
    HFONT previous = SelectObject(b.dc, large.handle);
    EXPECT_EQ(previous, bold.handle);
    ASSERT_TRUE(GetTextExtentPoint32(b.dc, text, l));
    EXPECT_GT(w.cx, s.cx);
    EXPECT_GT(l.cx, 2 * s.cx);
    EXPECT_GT(l.cy, 2 * s.cy);
    EXPECT_FALSE(TextOut(b.dc, 0, 0, text)) << "8-bit bitmaps take no text";
    SelectObject(b.dc, original);
    EXPECT_EQ(CreateFont(QStringLiteral("DejaVu Sans"), 0, false), 0);
    EXPECT_FALSE(GetTextExtentPoint32(b.bitmap, text, s));
}

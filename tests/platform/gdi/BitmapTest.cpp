#include "GdiTestSupport.h"

#include <gtest/gtest.h>

#include <cstring>

using namespace zelctl::gdi;
using zelctl::gdi::test::TestBitmap;

namespace {

BITMAPINFO header(int width, int height, int bpp)
{
    BITMAPINFO info;
    info.bmiHeader.biWidth = width;
    info.bmiHeader.biHeight = height;
    info.bmiHeader.biBitCount = quint16(bpp);
    return info;
}

} // namespace

TEST(DibSection, refusesHeadersItCannotHonour)
{
    struct Case
    {
        const char *name;
        BITMAPINFO info;
        quint32 usage = DIB_RGB_COLORS;
    };
    std::vector<Case> cases;
    cases.push_back({ "16 bits", header(4, 4, 16) });
    cases.push_back({ "zero width", header(0, 4, 24) });
    cases.push_back({ "negative width", header(-4, 4, 24) });
    cases.push_back({ "zero height", header(4, 0, 24) });
    cases.push_back({ "too large", header(65536, 65536, 32) });
    cases.push_back({ "palette colours", header(4, 4, 8), 1 });
    Case planes { "two planes", header(4, 4, 24) };
    planes.info.bmiHeader.biPlanes = 2;
    cases.push_back(planes);
    Case compressed { "compressed", header(4, 4, 8) };
    compressed.info.bmiHeader.biCompression = 1;
    cases.push_back(compressed);
    for (const Case &c : cases) {
        void *bits = reinterpret_cast<void *>(1);
        EXPECT_EQ(CreateDIBSection(0, &c.info, c.usage, &bits), 0) << c.name;
        EXPECT_EQ(bits, nullptr) << c.name;
    }
    EXPECT_EQ(CreateDIBSection(0, nullptr, DIB_RGB_COLORS, nullptr), 0);
}

TEST(DibSection, padsRowsTo32BitsStartsZeroedAndDescribesItself)
{
    struct Case
    {
        int width;
        int bpp;
        int stride;
    };
    for (const Case &c : { Case { 1, 1, 4 }, Case { 33, 1, 8 }, Case { 9, 4, 8 }, Case { 5, 8, 8 }, Case { 3, 24, 12 },
             Case { 5, 24, 16 }, Case { 3, 32, 12 } }) {
        BITMAPINFO info = header(c.width, -3, c.bpp);
        info.bmiHeader.biClrUsed = info.bmiHeader.biClrImportant = c.bpp <= 8 ? 1 : 0;
        void *bits = nullptr;
        const HBITMAP bitmap = CreateDIBSection(0, &info, DIB_RGB_COLORS, &bits);
        ASSERT_NE(bitmap, 0);
        DIBSECTION section;
        ASSERT_TRUE(GetObject(bitmap, section));
        EXPECT_EQ(section.dsBm.bmWidthBytes, c.stride) << c.width << "x" << c.bpp;
        EXPECT_EQ(section.dsBm.bmHeight, 3);
        EXPECT_EQ(section.dsBmih.biHeight, -3);
        EXPECT_EQ(section.dsBmih.biSizeImage, quint32(3 * c.stride));
        EXPECT_EQ(section.dsBmih.biClrUsed + section.dsBmih.biClrImportant, 0u) << "the whole table, all of it used";
        EXPECT_EQ(section.dsBm.bmBits, bits);
        const std::vector<uchar> zeros(size_t(3 * c.stride), 0);
        EXPECT_EQ(std::memcmp(bits, zeros.data(), zeros.size()), 0);
        EXPECT_TRUE(DeleteObject(bitmap));
    }
}

TEST(DibColorTable, holdsTwoToTheBitsEntriesAndClipsRequests)
{
    for (int bpp : { 1, 4, 8 }) {
        const int size = 1 << bpp;
        TestBitmap b(4, 1, bpp, true, { 0x102030 }); // one entry given, the rest black
        std::vector<RGBQUAD> read(300);
        EXPECT_EQ(GetDIBColorTable(b.dc, 0, 300, read.data()), quint32(size)) << bpp;
        EXPECT_EQ(read[0].rgbRed, 0x10);
        EXPECT_EQ(read[0].rgbGreen, 0x20);
        EXPECT_EQ(read[0].rgbBlue, 0x30);
        EXPECT_EQ(read[1].rgbRed, 0);

        const std::vector<RGBQUAD> colours(4, rgbQuad(0xABCDEF));
        EXPECT_EQ(SetDIBColorTable(b.dc, quint32(size - 1), 4, colours.data()), 1u) << "clipped at the end";
        EXPECT_EQ(SetDIBColorTable(b.dc, quint32(size), 1, colours.data()), 0u);
        EXPECT_EQ(GetDIBColorTable(b.dc, quint32(size - 1), 1, read.data()), 1u);
        EXPECT_EQ(read[0].rgbRed, 0xAB);
        EXPECT_EQ(GetPixel(b.dc, 0, 0), 0x302010u) << "index 0 shows entry 0 as 0x00BBGGRR";
        EXPECT_EQ(GetPixel(b.dc, 4, 0), CLR_INVALID) << "outside";
    }
    TestBitmap rgb(2, 2, 24);
    RGBQUAD entry;
    EXPECT_EQ(SetDIBColorTable(rgb.dc, 0, 1, &entry), 0u);
    EXPECT_EQ(GetDIBColorTable(rgb.dc, 0, 1, &entry), 0u);
}

TEST(GetDIBits, describesAndConvertsRowsCountedFromTheBottom)
{
    TestBitmap b(2, 3, 8, true, { 0x000000, 0xFF0000, 0x00FF00, 0x0000FF });
    for (int y = 0; y < 3; ++y)
        b.row(y)[0] = b.row(y)[1] = uchar(y + 1); // top row 1 (red), middle 2, bottom 3 (blue)

    BITMAPINFO info;
    EXPECT_EQ(GetDIBits(b.dc, b.bitmap, 0, 3, nullptr, &info, DIB_RGB_COLORS), 3);
    EXPECT_EQ(info.bmiHeader.biBitCount, 8);
    EXPECT_EQ(info.bmiHeader.biWidth, 2);
    EXPECT_EQ(info.bmiColors[1].rgbRed, 0xFF);

    // Two bottom rows as 24 bits, bottom-up: the bottom row (blue) comes first.
    info.bmiHeader = BITMAPINFOHEADER {};
    info.bmiHeader.biWidth = 2;
    info.bmiHeader.biHeight = 2;
    info.bmiHeader.biBitCount = 24;
    std::vector<uchar> rows(24, 0xEE);
    EXPECT_EQ(GetDIBits(b.dc, b.bitmap, 0, 5, rows.data(), &info, DIB_RGB_COLORS), 3) << "clipped to the height";
    std::vector<uchar> two(16, 0xEE);
    EXPECT_EQ(GetDIBits(b.dc, b.bitmap, 0, 2, two.data(), &info, DIB_RGB_COLORS), 2);
    EXPECT_EQ(two[0], 0xFF) << "blue byte of the bottom row";
    EXPECT_EQ(two[2], 0x00);
    EXPECT_EQ(two[8 + 1], 0xFF) << "green byte of the middle row";

    // Top-down output of the top row alone (start 2 from the bottom), at an odd address.
    info.bmiHeader.biHeight = -1;
    info.bmiHeader.biBitCount = 32;
    std::vector<uchar> odd(9, 0);
    EXPECT_EQ(GetDIBits(b.dc, b.bitmap, 2, 1, odd.data() + 1, &info, DIB_RGB_COLORS), 1);
    EXPECT_EQ(odd[1 + 2], 0xFF);
    EXPECT_EQ(odd[1 + 3], 0xFF) << "opaque";

    EXPECT_EQ(GetDIBits(b.dc, b.bitmap, 3, 1, odd.data(), &info, DIB_RGB_COLORS), 0);
    info.bmiHeader.biWidth = 3;
    EXPECT_EQ(GetDIBits(b.dc, b.bitmap, 0, 1, odd.data(), &info, DIB_RGB_COLORS), 0) << "width must match";
}

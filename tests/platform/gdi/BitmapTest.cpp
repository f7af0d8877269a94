#include "GdiTestSupport.h"

#include <gtest/gtest.h>

#include <cstring>

using namespace zelctl::gdi;
using zelctl::gdi::test::TestBitmap;

namespace {

BITMAPINFO header(int width, int height, int bpp, quint16 planes = 1, quint32 compression = 0)
{
    BITMAPINFO info;
    info.bmiHeader.biWidth = width;
    info.bmiHeader.biHeight = height;
    info.bmiHeader.biBitCount = quint16(bpp);
    info.bmiHeader.biPlanes = planes;
    info.bmiHeader.biCompression = compression;
    return info;
}

} // namespace

// Strides and pixel layout of every depth are the raster model's; here, what it takes as given.
TEST(DibSection, refusesHeadersItCannotHonourAndDescribesTheRest)
{
    const std::tuple<const char *, BITMAPINFO, quint32> refused[] = {
        { "16 bits", header(4, 4, 16), DIB_RGB_COLORS },
        { "zero width", header(0, 4, 24), DIB_RGB_COLORS },
        { "negative width", header(-4, 4, 24), DIB_RGB_COLORS },
        { "zero height", header(4, 0, 24), DIB_RGB_COLORS },
        { "too large", header(65536, 65536, 32), DIB_RGB_COLORS },
        { "palette colours", header(4, 4, 8), 1 },
        { "two planes", header(4, 4, 24, 2), DIB_RGB_COLORS },
        { "compressed", header(4, 4, 8, 1, 1), DIB_RGB_COLORS },
    };
    for (const auto &[name, info, usage] : refused) {
        void *bits = reinterpret_cast<void *>(1);
        EXPECT_EQ(CreateDIBSection(0, &info, usage, &bits), 0) << name;
        EXPECT_EQ(bits, nullptr) << name;
    }
    EXPECT_EQ(CreateDIBSection(0, nullptr, DIB_RGB_COLORS, nullptr), 0);

    for (const auto &[width, bpp, stride] : { std::tuple { 33, 1, 8 }, { 5, 24, 16 }, { 3, 32, 12 } }) {
        BITMAPINFO info = header(width, -3, bpp);
        info.bmiHeader.biClrUsed = info.bmiHeader.biClrImportant = bpp <= 8 ? 1 : 0;
        void *bits = nullptr;
        const HBITMAP bitmap = CreateDIBSection(0, &info, DIB_RGB_COLORS, &bits);
        DIBSECTION section;
        ASSERT_TRUE(GetObject(bitmap, section));
        EXPECT_EQ(section.dsBm.bmWidthBytes, stride) << width << "x" << bpp;
        EXPECT_EQ(section.dsBm.bmHeight, 3);
        EXPECT_EQ(section.dsBmih.biHeight, -3);
        EXPECT_EQ(section.dsBmih.biSizeImage, quint32(3 * stride));
        EXPECT_EQ(section.dsBmih.biClrUsed + section.dsBmih.biClrImportant, 0u) << "the whole table, all of it used";
        EXPECT_EQ(section.dsBm.bmBits, bits);
        const std::vector<uchar> zeros(size_t(3 * stride), 0);
        EXPECT_EQ(std::memcmp(bits, zeros.data(), zeros.size()), 0) << "starts zeroed";
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
        EXPECT_EQ(read[0].rgbRed * 65536 + read[0].rgbGreen * 256 + read[0].rgbBlue + read[1].rgbRed, 0x102030);
        const std::vector<RGBQUAD> colours(4, rgbQuad(0xABCDEF));
        EXPECT_EQ(SetDIBColorTable(b.dc, quint32(size - 1), 4, colours.data()), 1u) << "clipped at the end";
        EXPECT_EQ(SetDIBColorTable(b.dc, quint32(size), 1, colours.data()), 0u);
        b.setValue(1, 0, quint32(size - 1));
        EXPECT_EQ(GetPixel(b.dc, 1, 0), 0xEFCDABu) << "as 0x00BBGGRR";
        EXPECT_EQ(GetPixel(b.dc, 0, 0), 0x302010u);
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

    // As 24 bits, bottom-up: the bottom row (blue) comes first.
    info = header(2, 2, 24);
    std::vector<uchar> rows(24, 0xEE);
    EXPECT_EQ(GetDIBits(b.dc, b.bitmap, 0, 5, rows.data(), &info, DIB_RGB_COLORS), 3) << "clipped to the height";
    EXPECT_EQ(rows[0], 0xFF) << "blue byte of the bottom row";
    EXPECT_EQ(rows[2], 0x00);
    EXPECT_EQ(rows[8 + 1], 0xFF) << "green byte of the middle row";

    // Top-down output of the top row alone (start 2 from the bottom), at an odd address.
    info = header(2, -1, 32);
    std::vector<uchar> odd(9, 0);
    EXPECT_EQ(GetDIBits(b.dc, b.bitmap, 2, 1, odd.data() + 1, &info, DIB_RGB_COLORS), 1);
    EXPECT_EQ(odd[1 + 2], 0xFF);
    EXPECT_EQ(odd[1 + 3], 0xFF) << "opaque";

    EXPECT_EQ(GetDIBits(b.dc, b.bitmap, 3, 1, odd.data(), &info, DIB_RGB_COLORS), 0);
    info.bmiHeader.biWidth = 3;
    EXPECT_EQ(GetDIBits(b.dc, b.bitmap, 0, 1, odd.data(), &info, DIB_RGB_COLORS), 0) << "width must match";
}

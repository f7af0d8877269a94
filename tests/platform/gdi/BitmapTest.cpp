#include "platform/gdi/Gdi.h"

#include <gtest/gtest.h>

#include <cstring>
#include <tuple>
#include <vector>

using namespace zelctl::gdi;

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
        EXPECT_EQ(section.dsBm.bmHeight, 3) << width << "x" << bpp;
        EXPECT_EQ(section.dsBmih.biSizeImage, quint32(3 * stride));
        EXPECT_EQ(section.dsBmih.biClrUsed + section.dsBmih.biClrImportant, 0u) << "the whole table, all of it used";
        EXPECT_EQ(section.dsBm.bmBits, bits);
        const std::vector<uchar> zeros(size_t(3 * stride), 0);
        EXPECT_EQ(std::memcmp(bits, zeros.data(), zeros.size()), 0) << "starts zeroed";
        EXPECT_TRUE(DeleteObject(bitmap));
    }
}

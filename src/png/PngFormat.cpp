#include "PngFormat.h"

#include <limits>

namespace zelctl::png {

int Header::streamBitsPerPixel() const
{
    switch (colorType) {
    case Grey:
    case Indexed:
        return bitDepth;
    case Rgb:
        return bitDepth * 3;
    case GreyAlpha:
        return bitDepth * 2;
    case Rgba:
        return bitDepth * 4;
    default:
        return 0;
    }
}

int64_t inflatedSize(const Header &header)
{
    const int bpp = header.streamBitsPerPixel();
    if (header.width < 1 || header.height < 1 || bpp == 0)
        return 0;
    if (!header.interlaced())
        return header.height * (rowBytes(header.width, bpp) + 1);
    int64_t total = 0;
    for (int pass = 0; pass < NonInterlacedPass; ++pass) {
        const int64_t w = passExtent(header.width, columnStart[pass], columnStep[pass]);
        const int64_t h = passExtent(header.height, rowStart[pass], rowStep[pass]);
        if (w > 0 && h > 0)
            total += h * (rowBytes(w, bpp) + 1);
    }
    return total;
}

std::optional<int32_t> sampleColor(const Header &header, const QByteArray &palette, int sample)
{
    if (header.colorType == Indexed) {
        if (sample < 0 || qsizetype(sample) * 3 + 2 >= palette.size())
            return std::nullopt;
        const auto *p = reinterpret_cast<const uint8_t *>(palette.constData()) + sample * 3;
        return int32_t(p[0] | p[1] << 8 | p[2] << 16);
    }
    if (!header.validBitDepth())
        return std::nullopt; // no valid header read yet
    int level = sample & 0xFF;
    if (header.bitDepth < 8) {
        const int maximum = (1 << header.bitDepth) - 1;
        level = (sample & maximum) * (255 / maximum);
    }
    return int32_t(level | level << 8 | level << 16);
}

} // namespace zelctl::png

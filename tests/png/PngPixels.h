#pragma once

#include "png/PngDecoder.h"
#include "png/StdPNG.h"
#include "png/stdPNGdata.h"

#include <array>
#include <cstdint>

namespace zelctl::test {

// A bitmap pixel as B, G, R, A: through the colour table for 8 bits or less (alpha 255),
// as stored for 24 (alpha 255) and 32 bits.
inline std::array<uint8_t, 4> bitmapPixel(const StdPNG &image, int x, int y)
{
    const png::BitmapView bits = image.ImageData().Bits();
    const uint8_t *row = bits.row(y);
    switch (bits.bitCount) {
    case 32:
        return { row[4 * x], row[4 * x + 1], row[4 * x + 2], row[4 * x + 3] };
    case 24:
        return { row[3 * x], row[3 * x + 1], row[3 * x + 2], 255 };
    default: {
        unsigned index = 0;
        if (bits.bitCount == 8)
            index = row[x];
        else if (bits.bitCount == 4)
            index = (row[x / 2] >> (x % 2 ? 0 : 4)) & 0xF;
        else
            index = (row[x / 8] >> (7 - x % 8)) & 1;
        const auto &table = image.ImageData().ColorTable();
        const uint32_t color = index < table.size() ? table[index] : 0;
        return { uint8_t(color), uint8_t(color >> 8), uint8_t(color >> 16), 255 };
    }
    }
}

} // namespace zelctl::test

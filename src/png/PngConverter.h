#pragma once

#include "zelctl_export.h"

#include "PngDecoder.h"

#include <array>
#include <cstdint>
#include <vector>

namespace zelctl::png {

// floor(v / 255) for v up to 255 × 255, without a division.
constexpr unsigned divide255(unsigned v)
{
    return (v + 1 + (v >> 8)) >> 8;
}

// Vector instructions the converter may use; by default the best the processor has.
enum class Simd { None, Ssse3 };
ZELCTL_EXPORT Simd simdLevel();
// Lowers (or restores) the level, so that every path can be tested on one machine.
ZELCTL_EXPORT void setSimdLevel(Simd level);

// Converts the samples of restored rows into bitmap rows: colour tables, premultiplied
// alpha, colour keys and a background to lay partly transparent pixels on.
//
// Images of 8 bits or less a sample (and unkeyed 16-bit grey) go through a table of the
// 256 finished bitmap pixels; colour images through vector kernels 16 pixels at a time,
// where the processor has them. Both give exactly the pixels of the per-pixel rules.
class Converter
{
public:
    Converter(const Header &header, const FileInfo &info, const DecodeOptions &options, int bitCount);

    // Converts `count` samples of a restored row into the bitmap row dst, at pixels x0,
    // x0 + step, x0 + 2 step ...
    void convert(const uint8_t *src, int64_t count, uint8_t *dst, int64_t x0, int step);

    struct Rgba8
    {
        unsigned r, g, b, a;
    };
    using Kernel = void (*)(const uint8_t *src, uint8_t *dst, int64_t blocks, int32_t background);

private:
    Rgba8 sample(const uint8_t *src, int64_t i) const;
    uint32_t finished(Rgba8 c) const;
    void convertEach(const uint8_t *src, int64_t count, uint8_t *dst, int64_t x0, int step) const;
    void convertIndexed(const uint8_t *src, int64_t count, uint8_t *dst, int64_t x0, int step) const;
    void convertThroughTable(const uint8_t *src, int64_t count, uint8_t *dst, int64_t x0, int step) const;
    void convertBlocks(const uint8_t *src, int64_t count, uint8_t *dst, int64_t x0, int step);

    int m_colorType;
    int m_depth;
    int m_outBits;
    int m_sourceBytes; // bytes of a pixel in the stream; 0 below 8 bits
    int32_t m_background;
    std::array<Rgba8, 256> m_palette;
    bool m_keyed = false;
    uint32_t m_key8 = 0;
    std::array<unsigned, 3> m_key16 {};
    std::vector<uint32_t> m_table; // finished pixels by sample, when the image uses one
    Kernel m_kernel = nullptr;
    std::vector<uint8_t> m_scratch; // a row converted at once, before it is spread over a pass
};

} // namespace zelctl::png

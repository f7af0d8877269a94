#include "PngDecoder.h"

#include "PngFilters.h"
#include "PngImageStream.h"
#include "platform/gdi/Surface.h"

#include <algorithm>
#include <cstring>

namespace zelctl::png {

namespace {

// Pixels of the bitmap rows are read and written as the raster layer does.
using gdi::detail::readPixel;
using gdi::detail::writePixel;

// floor(v / 255) for v up to 255 × 255, without a division.
constexpr unsigned divide255(unsigned v)
{
    return (v + 1 + (v >> 8)) >> 8;
}

constexpr bool divide255IsExact()
{
    for (unsigned v = 0; v <= 255 * 255; ++v) {
        if (divide255(v) != v / 255)
            return false;
    }
    return true;
}
static_assert(divide255IsExact());

inline unsigned sampleAt(const uint8_t *row, int64_t i, int depth)
{
    switch (depth) {
    case 8:
        return row[i];
    case 16:
        return unsigned(row[2 * i]) << 8 | row[2 * i + 1];
    case 4:
        return (row[i >> 1] >> (4 - 4 * (i & 1))) & 0xFu;
    case 2:
        return (row[i >> 2] >> (6 - 2 * (i & 3))) & 0x3u;
    default:
        return (row[i >> 3] >> (7 - (i & 7))) & 0x1u;
    }
}

bool isPngFormat(const Header &header)
{
    const int d = header.bitDepth;
    switch (header.colorType) {
    case Grey:
        return d == 1 || d == 2 || d == 4 || d == 8 || d == 16;
    case Indexed:
        return d == 1 || d == 2 || d == 4 || d == 8;
    case Rgb:
    case GreyAlpha:
    case Rgba:
        return d == 8 || d == 16;
    default:
        return false;
    }
}

struct Rgba8
{
    unsigned r, g, b, a;
};

// Converts the samples of one restored row into a bitmap row.
class Converter
{
public:
    Converter(const Header &header, const FileInfo &info, const DecodeOptions &options, int bitCount)
        : m_colorType(header.colorType)
        , m_depth(header.bitDepth)
        , m_outBits(bitCount)
        , m_background(options.displayBackground)
    {
        const auto *palette = reinterpret_cast<const uint8_t *>(info.paletteBytes.constData());
        const int entries = int(std::min<qsizetype>(info.paletteBytes.size() / 3, 256));
        m_palette.fill({ 0, 0, 0, 255 });
        for (int i = 0; i < entries; ++i)
            m_palette[i] = { palette[3 * i], palette[3 * i + 1], palette[3 * i + 2], 255 };
        if (info.transparentColor == -1)
            return;
        const auto *trns = reinterpret_cast<const uint8_t *>(info.transparencyBytes.constData());
        const qsizetype trnsLength = info.transparencyBytes.size();
        if (m_colorType == Indexed) {
            for (int i = 0; i < 256 && i < trnsLength; ++i)
                m_palette[i].a = trns[i];
        } else if (m_colorType == Grey || m_colorType == Rgb) {
            m_keyed = true;
            if (m_depth == 16) {
                // A 16-bit key compares whole samples, not just their first bytes.
                const int samples = m_colorType == Grey ? 1 : 3;
                m_keyed = trnsLength >= 2 * samples;
                for (int s = 0; m_keyed && s < samples; ++s)
                    m_key16[s] = trns[2 * s] << 8 | trns[2 * s + 1];
            } else {
                m_key8 = uint32_t(info.transparentColor);
            }
        }
    }

    void convert(const uint8_t *src, int64_t count, uint8_t *dst, int64_t x0, int step) const
    {
        if (m_outBits <= 8)
            return convertIndexed(src, count, dst, x0, step);
        if (m_background == -1 && step == 1 && !m_keyed && m_colorType == Rgb && m_outBits == 24)
            return m_depth == 8 ? rgbToBgr(src, count, dst + 3 * x0) : rgb16ToBgr(src, count, dst + 3 * x0);
        if (m_background == -1 && step == 1 && m_depth == 8 && m_colorType == Rgba && m_outBits == 32)
            return rgbaToPremultiplied(src, count, dst + 4 * x0);
        switch (m_colorType) {
        case Rgb:
            return convertDirect(dst, count, x0, step, [&](int64_t i) { return rgbPixel(src, i); });
        case Rgba:
            return convertDirect(dst, count, x0, step, [&](int64_t i) {
                const int n = m_depth / 8;
                const uint8_t *p = src + 4 * n * i;
                return Rgba8 { p[0], p[n], p[2 * n], p[3 * n] };
            });
        case GreyAlpha:
            return convertDirect(dst, count, x0, step, [&](int64_t i) {
                const int n = m_depth / 8;
                const uint8_t *p = src + 2 * n * i;
                return Rgba8 { p[0], p[0], p[0], p[n] };
            });
        case Grey:
            return convertDirect(dst, count, x0, step, [&](int64_t i) { return greyPixel(src, i); });
        default:
            return convertDirect(dst, count, x0, step, [&](int64_t i) { return m_palette[sampleAt(src, i, m_depth)]; });
        }
    }

private:
    Rgba8 rgbPixel(const uint8_t *src, int64_t i) const
    {
        if (m_depth == 16) {
            const uint8_t *p = src + 6 * i;
            const bool key = m_keyed && unsigned(p[0] << 8 | p[1]) == m_key16[0]
                && unsigned(p[2] << 8 | p[3]) == m_key16[1] && unsigned(p[4] << 8 | p[5]) == m_key16[2];
            return { p[0], p[2], p[4], key ? 0u : 255u };
        }
        const uint8_t *p = src + 3 * i;
        const bool key = m_keyed && uint32_t(p[0] << 16 | p[1] << 8 | p[2]) == m_key8;
        return { p[0], p[1], p[2], key ? 0u : 255u };
    }

    Rgba8 greyPixel(const uint8_t *src, int64_t i) const
    {
        const unsigned sample = sampleAt(src, i, m_depth);
        const bool key = m_keyed && (m_depth == 16 ? sample == m_key16[0] : sample == m_key8);
        unsigned level = sample;
        if (m_depth == 16)
            level = sample >> 8;
        else if (m_depth < 8)
            level = sample * (255 / ((1u << m_depth) - 1));
        return { level, level, level, key ? 0u : 255u };
    }

    template <typename Fetch> void convertDirect(uint8_t *dst, int64_t count, int64_t x0, int step, Fetch fetch) const
    {
        const int bytes = m_outBits / 8;
        uint8_t *p = dst + bytes * x0;
        const int64_t advance = int64_t(bytes) * step;
        const unsigned bgR = m_background & 0xFF, bgG = (m_background >> 8) & 0xFF, bgB = (m_background >> 16) & 0xFF;
        for (int64_t i = 0; i < count; ++i, p += advance) {
            Rgba8 c = fetch(i);
            if (m_background != -1) {
                // Laid on the background, the pixel becomes opaque.
                const unsigned inverse = 255 - c.a;
                c = { divide255(c.r * c.a + bgR * inverse), divide255(c.g * c.a + bgG * inverse),
                    divide255(c.b * c.a + bgB * inverse), 255 };
            }
            if (bytes == 3) {
                p[0] = uint8_t(c.b);
                p[1] = uint8_t(c.g);
                p[2] = uint8_t(c.r);
            } else if (c.a == 0) {
                std::memset(p, 0, 4);
            } else {
                p[0] = uint8_t(divide255(c.b * c.a));
                p[1] = uint8_t(divide255(c.g * c.a));
                p[2] = uint8_t(divide255(c.r * c.a));
                p[3] = uint8_t(c.a);
            }
        }
    }

    void convertIndexed(const uint8_t *src, int64_t count, uint8_t *dst, int64_t x0, int step) const
    {
        if (step == 1 && x0 == 0 && m_outBits == m_depth) {
            std::memcpy(dst, src, size_t(rowBytes(count, m_depth)));
            return;
        }
        for (int64_t i = 0; i < count; ++i) {
            unsigned value = sampleAt(src, i, m_depth);
            if (m_depth == 16)
                value >>= 8;
            writePixel(dst, x0 + i * step, m_outBits, value);
        }
    }

    static void rgbToBgr(const uint8_t *src, int64_t count, uint8_t *dst)
    {
        for (int64_t i = 0; i < count; ++i, src += 3, dst += 3) {
            dst[0] = src[2];
            dst[1] = src[1];
            dst[2] = src[0];
        }
    }

    static void rgb16ToBgr(const uint8_t *src, int64_t count, uint8_t *dst)
    {
        for (int64_t i = 0; i < count; ++i, src += 6, dst += 3) {
            dst[0] = src[4];
            dst[1] = src[2];
            dst[2] = src[0];
        }
    }

    static void rgbaToPremultiplied(const uint8_t *src, int64_t count, uint8_t *dst)
    {
        for (int64_t i = 0; i < count; ++i, src += 4, dst += 4) {
            const unsigned a = src[3];
            if (a == 255) {
                dst[0] = src[2];
                dst[1] = src[1];
                dst[2] = src[0];
                dst[3] = 255;
            } else {
                dst[0] = uint8_t(divide255(src[2] * a));
                dst[1] = uint8_t(divide255(src[1] * a));
                dst[2] = uint8_t(divide255(src[0] * a));
                dst[3] = uint8_t(a);
            }
        }
    }

    int m_colorType;
    int m_depth;
    int m_outBits;
    int32_t m_background;
    std::array<Rgba8, 256> m_palette;
    bool m_keyed = false;
    uint32_t m_key8 = 0;
    std::array<unsigned, 3> m_key16 {};
};

// Copies each pixel of a pass row over the block it stands for, up to the image's edges.
void fillBlocks(const BitmapView &bitmap, int pass, int32_t y, int64_t count)
{
    const int64_t height = std::min<int64_t>(blockHeight[pass], bitmap.height - y);
    const uint8_t *source = bitmap.row(y);
    for (int64_t i = 0; i < count; ++i) {
        const int64_t x = columnStart[pass] + i * columnStep[pass];
        const int64_t width = std::min<int64_t>(blockWidth[pass], bitmap.width - x);
        const unsigned value = readPixel(source, x, bitmap.bitCount);
        for (int64_t dy = 0; dy < height; ++dy) {
            uint8_t *row = bitmap.row(int32_t(y + dy));
            for (int64_t dx = 0; dx < width; ++dx)
                writePixel(row, x + dx, bitmap.bitCount, value);
        }
    }
}

constexpr int32_t rowsPerBlock = 16;

// Rows are taken from the stream and restored in place a block at a time; the stream keeps
// the last row of the block before readable in front of the next block.
class RowBlocks
{
public:
    RowBlocks(ImageStream &stream, int distance)
        : m_stream(stream)
        , m_distance(distance)
    { }

    // Takes and restores rows [first, first + count) of a pass whose rows are stride bytes
    // (filter byte included); the first row of a pass has no row above.
    bool restore(int64_t first, int count, int64_t stride)
    {
        m_rows = m_stream.next(stride * count, first == 0 ? 0 : stride);
        m_stride = stride;
        if (!m_rows)
            return false;
        for (int k = 0; k < count; ++k) {
            uint8_t *row = m_rows + k * stride;
            const uint8_t *above = first + k == 0 ? nullptr : row - stride + 1;
            if (!unfilterRow(row[0], row + 1, above, stride - 1, m_distance))
                return false;
        }
        return true;
    }

    // Restored bytes of row k (0-based) of the last block.
    const uint8_t *row(int k) const { return m_rows + k * m_stride + 1; }

private:
    ImageStream &m_stream;
    int m_distance;
    uint8_t *m_rows = nullptr;
    int64_t m_stride = 0;
};

bool decodeProgressive(const Header &header, const Converter &converter, const DecodeOptions &options,
    RowBlocks &blocks, const BitmapView &bitmap, const DecodeObserver &observer)
{
    const int bpp = header.streamBitsPerPixel();
    for (int pass = 0; pass < NonInterlacedPass; ++pass) {
        const int64_t width = passExtent(header.width, columnStart[pass], columnStep[pass]);
        const int64_t height = passExtent(header.height, rowStart[pass], rowStep[pass]);
        if (width < 1 || height < 1)
            continue;
        const int64_t stride = rowBytes(width, bpp) + 1;
        for (int64_t first = 0; first < height; first += rowsPerBlock) {
            const int count = int(std::min<int64_t>(rowsPerBlock, height - first));
            if (!blocks.restore(first, count, stride))
                return false;
            for (int k = 0; k < count; ++k) {
                const int32_t y = int32_t(rowStart[pass] + (first + k) * rowStep[pass]);
                converter.convert(blocks.row(k), width, bitmap.row(y), columnStart[pass], columnStep[pass]);
                if (options.pixelated && pass < 6)
                    fillBlocks(bitmap, pass, y, width);
            }
        }
        if (observer.progress && !observer.progress((pass + 1) * 100 / 7))
            return false;
        if (observer.passConverted)
            observer.passConverted(pass + 1);
    }
    return true;
}

// Rows [r - 16, r) go to the bitmap once row r is restored, after the progress of row r;
// the rows after the last full block follow Progress(100).
bool decodeSequential(const Header &header, const Converter &converter, RowBlocks &blocks, const BitmapView &bitmap,
    const DecodeObserver &observer)
{
    const int32_t height = header.height;
    const int64_t stride = rowBytes(header.width, header.streamBitsPerPixel()) + 1;
    for (int32_t first = 0; first < height; first += rowsPerBlock) {
        const int count = std::min(rowsPerBlock, height - first);
        if (!blocks.restore(first, count, stride))
            return false;
        const int percentage = first + rowsPerBlock < height ? int(int64_t(first + rowsPerBlock) * 100 / height) : 100;
        if (observer.progress && !observer.progress(percentage))
            return false;
        for (int k = 0; k < count; ++k)
            converter.convert(blocks.row(k), header.width, bitmap.row(first + k), 0, 1);
        if (observer.rowsConverted)
            observer.rowsConverted(first, count);
    }
    return true;
}

} // namespace

int outputBitCount(const Header &header, const FileInfo &info, const DecodeOptions &options)
{
    if (!isPngFormat(header))
        return 0;
    int bits = 0;
    switch (header.colorType) {
    case Rgba:
    case GreyAlpha:
        bits = options.alphaNotKept ? 24 : 32;
        break;
    case Rgb:
        bits = 24;
        break;
    case Grey:
        bits = header.bitDepth == 1 ? 1 : header.bitDepth <= 4 ? 4 : 8;
        break;
    default:
        bits = header.bitDepth == 2 ? 4 : header.bitDepth;
        break;
    }
    if (info.transparentColor != -1 && !options.alphaNotKept)
        return 32;
    if (options.make32 || (header.interlaced() && options.fadeIn))
        return 32;
    return bits;
}

std::vector<uint32_t> colorTable(const Header &header, FileInfo &info, int bitCount)
{
    std::vector<uint32_t> table;
    if (bitCount > 8)
        return table;
    if (header.colorType == Indexed) {
        const auto *p = reinterpret_cast<const uint8_t *>(info.paletteBytes.constData());
        const qsizetype entries = std::min<qsizetype>(info.paletteBytes.size() / 3, qsizetype(1) << bitCount);
        for (qsizetype i = 0; i < entries; ++i)
            table.push_back(uint32_t(p[3 * i]) << 16 | uint32_t(p[3 * i + 1]) << 8 | p[3 * i + 2]);
        return table;
    }
    if (header.bitDepth == 2)
        info.paletteBytes = QByteArray::fromHex("000000555555aaaaaaffffff");
    const int levels = header.bitDepth >= 8 ? 256 : 1 << header.bitDepth;
    const int step = 255 / (levels - 1);
    for (int i = 0; i < levels; ++i)
        table.push_back(uint32_t(i * step) * 0x010101u);
    return table;
}

bool decodeImage(const Header &header, const FileInfo &info, const DecodeOptions &options, ImageStream &stream,
    const BitmapView &bitmap, const DecodeObserver &observer)
{
    if (!bitmap.bits || bitmap.width != header.width || bitmap.height != header.height
        || bitmap.bitCount != outputBitCount(header, info, options)
        || bitmap.stride < bitmapStride(bitmap.width, bitmap.bitCount))
        return false;
    const Converter converter(header, info, options, bitmap.bitCount);
    RowBlocks blocks(stream, std::max(1, header.streamBitsPerPixel() / 8));
    const bool decoded = header.interlaced() ? decodeProgressive(header, converter, options, blocks, bitmap, observer)
                                             : decodeSequential(header, converter, blocks, bitmap, observer);
    return decoded && stream.finish();
}

void applyConstantOpacity(const BitmapView &bitmap, uint8_t opacity)
{
    if (bitmap.bitCount != 32 || opacity == 255)
        return;
    for (int32_t y = 0; y < bitmap.height; ++y) {
        uint8_t *row = bitmap.row(y);
        for (qsizetype i = 0; i < qsizetype(bitmap.width) * 4; ++i)
            row[i] = uint8_t(divide255(row[i] * unsigned(opacity)));
    }
}

} // namespace zelctl::png

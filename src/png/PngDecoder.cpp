#include "PngDecoder.h"

#include "PngConverter.h"
#include "PngFilters.h"
#include "PngImageStream.h"
#include "platform/gdi/Surface.h"

#include <algorithm>
#include <cstring>

namespace zelctl::png {

namespace {

using gdi::detail::readPixel;
using gdi::detail::writePixel;

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

bool decodeProgressive(const Header &header, Converter &converter, const DecodeOptions &options, RowBlocks &blocks,
    const BitmapView &bitmap, const DecodeObserver &observer)
{
    const int bpp = header.streamBitsPerPixel();
    int reported = 0;
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
        reported = (pass + 1) * 100 / 7;
        if (observer.progress && !observer.progress(reported))
            return false;
        if (observer.passConverted)
            observer.passConverted(pass + 1);
    }
    // An image without pass 7 (one row high) still ends at 100.
    return reported == 100 || !observer.progress || observer.progress(100);
}

// Rows [r - 16, r) go to the bitmap once row r is restored, after the progress of row r;
// the rows after the last full block follow Progress(100).
bool decodeSequential(const Header &header, Converter &converter, RowBlocks &blocks, const BitmapView &bitmap,
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
    Converter converter(header, info, options, bitmap.bitCount);
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

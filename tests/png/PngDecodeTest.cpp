#include "PngPixels.h"
#include "PngTestFiles.h"

#include "png/PngChunkReader.h"
#include "png/PngConverter.h"
#include "png/PngImageStream.h"
#include "support/TestSupport.h"

#include <QDir>
#include <QTemporaryDir>

#include <gtest/gtest.h>

using namespace zelctl;
using namespace zelctl::test;

namespace {

struct Format
{
    int colorType;
    int bitDepth;
};

const Format formats[] = { { 0, 1 }, { 0, 2 }, { 0, 4 }, { 0, 8 }, { 0, 16 }, { 2, 8 }, { 2, 16 }, { 3, 1 }, { 3, 2 },
    { 3, 4 }, { 3, 8 }, { 4, 8 }, { 4, 16 }, { 6, 8 }, { 6, 16 } };

std::string describe(const ImageRecipe &r)
{
    return "type " + std::to_string(r.colorType) + " depth " + std::to_string(r.bitDepth) + " "
        + std::to_string(r.width) + "x" + std::to_string(r.height) + (r.interlaced ? " interlaced" : "")
        + (r.withTransparency ? " tRNS" : "");
}

// Compares every pixel of StdPNG's bitmap with libpng's reading under the bitmap's rules:
// premultiplied and truncated alpha in 32 bits, transparent pixels all zero.
void expectSameFilePixels(const QByteArray &file, const std::string &what, bool make32 = false)
{
    int width = 0;
    int height = 0;
    const std::vector<uint8_t> expected = readWithLibpng(file, width, height);
    StdPNG image;
    image.setTransparentStyle(StdPNG::alphaTransparent);
    ASSERT_TRUE(image.LoadData(file, true, make32)) << what << ": " << image.FailureReason().toStdString();
    ASSERT_EQ(image.Width(), width);
    ASSERT_EQ(image.Height(), height);
    const unsigned opaque = image.BitCount_BMP() == 32 ? 0 : 255;
    for (int y = 0; y < height; ++y) {
        for (int x = 0; x < width; ++x) {
            const uint8_t *rgba = expected.data() + (size_t(y) * size_t(width) + size_t(x)) * 4;
            const unsigned a = std::max<unsigned>(opaque, rgba[3]);
            const std::array<uint8_t, 4> want
                = { uint8_t(rgba[2] * a / 255), uint8_t(rgba[1] * a / 255), uint8_t(rgba[0] * a / 255), uint8_t(a) };
            ASSERT_EQ(bitmapPixel(image, x, y), want) << what << " at " << x << "," << y;
        }
    }
}

// Runs body at every vector level the processor has, from none (the per-pixel rules) up.
template <typename Body> void atEverySimdLevel(Body body)
{
    const png::Simd best = png::simdLevel();
    for (const png::Simd level : { png::Simd::None, png::Simd::Ssse3 }) {
        if (level <= best) {
            png::setSimdLevel(level);
            body();
        }
    }
    png::setSimdLevel(best);
}

std::vector<uint8_t> bitmapBytes(const StdPNG &image)
{
    const png::BitmapView bits = image.ImageData().Bits();
    return std::vector<uint8_t>(bits.bits, bits.bits + image.ImageData().ImageSize());
}

// What the decoder alone makes of a file with the stream inflated at once or streamed.
struct Decoded
{
    bool ok = false;
    std::vector<uint8_t> bits;
    QList<int> progress;
    QList<int> shown; // first rows of the blocks, or passes
    bool operator==(const Decoded &) const = default;
};

Decoded decodeWith(const QByteArray &file, png::ImageStream::Mode mode)
{
    png::Header header;
    png::FileInfo info;
    const png::ReadResult read = png::readChunks(file, true, header, info);
    Decoded result;
    if (!read.ok)
        return result;
    const png::DecodeOptions options;
    const int bitCount = png::outputBitCount(header, info, options);
    const qsizetype stride = png::bitmapStride(header.width, bitCount);
    result.bits.resize(size_t(stride * header.height));
    const png::BitmapView bitmap { result.bits.data(), header.width, header.height, stride, bitCount };
    png::DecodeObserver observer;
    observer.progress = [&](int percentage) {
        result.progress.append(percentage);
        return true;
    };
    observer.rowsConverted = [&](int32_t first, int32_t) { result.shown.append(first); };
    observer.passConverted = [&](int pass) { result.shown.append(pass); };
    png::ImageStream stream(read.imageData, png::inflatedSize(header), mode);
    result.ok = !stream.failed() && png::decodeImage(header, info, options, stream, bitmap, observer);
    return result;
}

} // namespace

TEST(PngDecode, matchesLibpngForEveryFormatSizeAndInterlacing)
{
    const std::pair<int, int> sizes[] = { { 1, 1 }, { 1, 9 }, { 9, 1 }, { 7, 17 }, { 13, 5 }, { 33, 17 }, { 20, 40 } };
    atEverySimdLevel([&] {
        uint32_t seed = 1;
        for (const Format &format : formats) {
            for (const auto &[width, height] : sizes) {
                for (const bool interlaced : { false, true }) {
                    ImageRecipe recipe { width, height, format.colorType, format.bitDepth, interlaced, false, seed++ };
                    expectSameFilePixels(writeWithLibpng(recipe), describe(recipe));
                    if (width == 7 || width == 33) // 32 bits asked for: every format at two sizes
                        expectSameFilePixels(writeWithLibpng(recipe), describe(recipe) + " make32", true);
                    recipe.withTransparency = true;
                    if (format.colorType <= 3)
                        expectSameFilePixels(writeWithLibpng(recipe), describe(recipe));
                }
            }
        }
    });
}

TEST(PngDecode, laysAlphaOnItsBackgroundAlikeAtEveryVectorLevel)
{
    // The vector kernels against the per-pixel rules, for the styles libpng has no
    // counterpart of: a background colour, and alpha dropped.
    for (const Format format : { Format { 2, 8 }, { 2, 16 }, { 4, 8 }, { 4, 16 }, { 6, 8 }, { 6, 16 } }) {
        for (const bool interlaced : { false, true }) {
            const ImageRecipe recipe { 37, 9, format.colorType, format.bitDepth, interlaced, false, 5 };
            for (const qint32 style : { 0x336699, int(StdPNG::alphaNoBkgNoAlpha), int(StdPNG::alphaTransparent) }) {
                for (const bool make32 : { false, true }) {
                    std::vector<std::vector<uint8_t>> results;
                    atEverySimdLevel([&] {
                        StdPNG image;
                        image.setTransparentStyle(style);
                        ASSERT_TRUE(image.LoadData(writeWithLibpng(recipe), true, make32));
                        results.push_back(bitmapBytes(image));
                    });
                    EXPECT_EQ(results.front(), results.back()) << describe(recipe) << " style " << style;
                }
            }
        }
    }
}

TEST(PngDecode, inflatesAtOnceOrStreamedToTheSamePixelsAndEvents)
{
    using Mode = png::ImageStream::Mode;
    uint32_t seed = 3;
    for (const Format &format : formats) {
        for (const bool interlaced : { false, true }) {
            const ImageRecipe recipe { 20, 40, format.colorType, format.bitDepth, interlaced, true, seed++ };
            for (const qsizetype part : { qsizetype(1) << 20, qsizetype(7) }) {
                const QByteArray file = withImageDataSplit(writeWithLibpng(recipe), part);
                const Decoded whole = decodeWith(file, Mode::Whole);
                ASSERT_TRUE(whole.ok) << describe(recipe);
                ASSERT_EQ(decodeWith(file, Mode::Streaming), whole) << describe(recipe) << " parts " << part;
            }
        }
    }

    // StdPNG joins the parts of a file it read itself in place, and copies those of a caller's.
    const QByteArray file = withImageDataSplit(writeWithLibpng({ 40, 30, 6, 16, false, false, 8 }), 100);
    QTemporaryDir folder;
    QFile out(folder.filePath("parts.png"));
    ASSERT_TRUE(out.open(QIODevice::WriteOnly) && out.write(file) == file.size());
    out.close();
    StdPNG fromDisk;
    ASSERT_TRUE(fromDisk.LoadFile(out.fileName()));
    StdPNG fromMemory;
    ASSERT_TRUE(fromMemory.LoadData(file));
    EXPECT_EQ(bitmapBytes(fromDisk), bitmapBytes(fromMemory));
    expectSameFilePixels(file, "parts of 100 bytes");
}

TEST(PngDecode, matchesLibpngOnTheFuzzSeeds)
{
    // Written by a different encoder than libpng, with every filter on random rows. Their
    // random tRNS keys may lie outside the bit depth, where libpng masks the key and StdPNG
    // compares it whole; those files only have to load.
    const QDir folder(testDataPath("png"));
    const QStringList names = folder.entryList({ "*.png" }, QDir::Files);
    ASSERT_GE(names.size(), 60);
    for (const QString &name : names) {
        QFile file(folder.filePath(name));
        ASSERT_TRUE(file.open(QIODevice::ReadOnly));
        const QByteArray bytes = file.readAll();
        if (bytes.contains("tRNS"))
            EXPECT_TRUE(StdPNG().LoadData(bytes)) << name.toStdString();
        else
            expectSameFilePixels(bytes, name.toStdString());
    }
}

TEST(PngDecode, choosesTheBitmapFormatOfEachImage)
{
    // Colour type, bit depth, transparency → bits of the bitmap and entries of its table.
    const int rows[][5] = { { 0, 1, 0, 1, 2 }, { 0, 2, 0, 4, 4 }, { 0, 4, 0, 4, 16 }, { 0, 8, 0, 8, 256 },
        { 0, 16, 0, 8, 256 }, { 3, 1, 0, 1, 2 }, { 3, 2, 0, 4, 4 }, { 3, 4, 0, 4, 16 }, { 3, 8, 0, 8, 256 },
        { 2, 8, 0, 24, 0 }, { 2, 16, 0, 24, 0 }, { 6, 8, 0, 32, 0 }, { 4, 16, 0, 32, 0 }, { 3, 4, 1, 32, 0 },
        { 0, 8, 1, 32, 0 }, { 2, 8, 1, 32, 0 } };
    for (const auto &row : rows) {
        StdPNG image;
        image.setTransparentStyle(StdPNG::alphaTransparent);
        const ImageRecipe recipe { 10, 3, row[0], row[1], false, row[2] == 1, 7 };
        ASSERT_TRUE(image.LoadData(writeWithLibpng(recipe))) << describe(recipe);
        EXPECT_EQ(image.BitCount_BMP(), row[3]) << describe(recipe);
        EXPECT_EQ(image.ImageData().ColorTable().size(), size_t(row[4])) << describe(recipe);
        EXPECT_EQ(image.ScanLineWidth(), ((10 * row[3] + 31) & ~31) / 8) << describe(recipe);
    }
}

TEST(PngDecode, restoresEveryFilterAtEveryPixelSize)
{
    // Rows filtered by hand with every type, for stream pixels of 1 to 8 bytes.
    uint32_t state = 77;
    for (const Format &layout : { Format { 0, 8 }, { 0, 16 }, { 2, 8 }, { 6, 8 }, { 2, 16 }, { 6, 16 }, { 4, 16 } }) {
        const int distance = ImageRecipe { 1, 1, layout.colorType, layout.bitDepth }.bytesPerPixel();
        const int rowLength = 5 * distance;
        QByteArray previous(rowLength, '\0');
        QByteArray rows;
        for (int type = 0; type < 10; ++type) {
            QByteArray row(rowLength, '\0');
            for (char &byte : row)
                byte = char((state = state * 1664525u + 1013904223u) >> 24);
            rows.append(char(type % 5));
            for (int i = 0; i < rowLength; ++i) {
                const int a = i >= distance ? uint8_t(row[i - distance]) : 0;
                const int b = uint8_t(previous[i]);
                const int c = i >= distance ? uint8_t(previous[i - distance]) : 0;
                const int pa = std::abs(b - c), pb = std::abs(a - c), pc = std::abs(a + b - 2 * c);
                const int predictors[] = { 0, a, b, (a + b) / 2, pa <= pb && pa <= pc ? a : pb <= pc ? b : c };
                rows.append(char(uint8_t(row[i]) - predictors[type % 5]));
            }
            previous = row;
        }
        const QByteArray file = signature() + ihdr(5, 10, layout.bitDepth, layout.colorType)
            + chunk("IDAT", deflate(rows)) + chunk("IEND", {});
        expectSameFilePixels(file, "distance " + std::to_string(distance), true);
    }
}

TEST(PngDecode, acceptsOnlyAWholeStreamOfTheHeadersLength)
{
    QByteArray rows;
    for (int y = 0; y < 4; ++y)
        rows += QByteArray(1, '\0') + QByteArray(4, char(y));
    QByteArray badChecksum = deflate(rows);
    badChecksum.back() = char(badChecksum.back() ^ 1);
    const QByteArray streams[] = { deflate(rows), deflate(rows) + "after the end", deflate(rows.left(15)),
        deflate(rows + QByteArray(5, '\0')), badChecksum, deflate(rows).chopped(3), "not deflate" };
    for (size_t i = 0; i < std::size(streams); ++i) {
        const QByteArray &stream = streams[i];
        const bool whole = i < 2; // the first two are whole
        const QByteArray file = signature() + ihdr(4, 4, 8, 0) + chunk("IDAT", stream) + chunk("IEND", {});
        StdPNG image;
        EXPECT_EQ(image.LoadData(file), whole) << stream.toHex().toStdString();
        EXPECT_EQ(image.FailureReason(), whole ? "" : "Failed to decompress image data.");
        // Inflated at once or streamed, in one part or in parts of 3 bytes, alike.
        for (const QByteArray &parts : { file, withImageDataSplit(file, 3) }) {
            EXPECT_EQ(decodeWith(parts, png::ImageStream::Mode::Whole).ok, whole);
            EXPECT_EQ(decodeWith(parts, png::ImageStream::Mode::Streaming).ok, whole);
        }
    }
}

TEST(PngDecode, reportsProgressAfterEachSixteenRowsAndAtTheEnd)
{
    // Sixteen-row blocks; a one-pixel-wide interlaced image has pixels in passes 1, 3, 5 and 7
    // only; a one-row image has no pass 7 (nor 3 and 5) and still ends at 100.
    const std::pair<QByteArray, QList<int>> cases[] = { { greyFile(3, 40), { 0, 40, 80, 100 } },
        { writeWithLibpng({ 1, 8, 0, 8, true, false, 1 }), { 0, 14, 42, 71, 100 } },
        { writeWithLibpng({ 9, 1, 0, 8, true, false, 1 }), { 0, 14, 28, 57, 85, 100 } } };
    for (const auto &[file, expected] : cases) {
        StdPNG image;
        QList<int> values;
        QObject::connect(&image, &StdPNG::Progress, [&](qint32 p) { values.append(p); });
        ASSERT_TRUE(image.LoadData(file));
        EXPECT_EQ(values, expected);
    }
}

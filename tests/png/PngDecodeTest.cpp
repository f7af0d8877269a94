#include "PngPixels.h"
#include "PngTestFiles.h"

#include "png/PngChunkReader.h"
#include "png/PngConverter.h"
#include "png/PngImageStream.h"
#include "png/stdPNGdata.h"
#include "support/TestSupport.h"

#include <QDir>
#include <QTemporaryDir>

#include <gtest/gtest.h>

using namespace zelctl;
using namespace zelctl::test;

namespace {

const std::pair<int, int> formats[] = { { 0, 1 }, { 0, 2 }, { 0, 4 }, { 0, 8 }, { 0, 16 }, { 2, 8 }, { 2, 16 },
    { 3, 1 }, { 3, 2 }, { 3, 4 }, { 3, 8 }, { 4, 8 }, { 4, 16 }, { 6, 8 }, { 6, 16 } };

std::string describe(const ImageRecipe &r)
{
    return "type " + std::to_string(r.colorType) + " depth " + std::to_string(r.bitDepth) + " "
        + std::to_string(r.width) + "x" + std::to_string(r.height) + (r.interlaced ? " interlaced" : "")
        + (r.withTransparency ? " tRNS" : "");
}

QByteArray inParts()
{
    return writeWithLibpng({ 40, 30, 6, 16, false, false, 8, 100 });
}

// The fuzz seeds (another encoder: every format, interlaced or not, every filter at every
// pixel size) and libpng's files of every format, some wide enough for the 16-pixel
// vector blocks, one with its image data in many chunks.
std::vector<std::pair<std::string, QByteArray>> corpus()
{
    std::vector<std::pair<std::string, QByteArray>> files;
    const QDir folder(testDataPath("png"));
    for (const QString &name : folder.entryList({ "*.png" }, QDir::Files)) {
        QFile file(folder.filePath(name));
        EXPECT_TRUE(file.open(QIODevice::ReadOnly));
        files.emplace_back(name.toStdString(), file.readAll());
    }
    EXPECT_GE(files.size(), 60u);
    uint32_t seed = 1;
    for (const auto &[colorType, bitDepth] : formats) {
        for (const auto &[width, height] : { std::pair { 1, 9 }, { 33, 17 }, { 20, 40 } }) {
            for (const bool interlaced : { false, true }) {
                for (const bool keyed : { false, true }) {
                    const ImageRecipe recipe { width, height, colorType, bitDepth, interlaced, keyed, seed++ };
                    if (!keyed || colorType <= 3)
                        files.emplace_back(describe(recipe), writeWithLibpng(recipe));
                }
            }
        }
    }
    files.emplace_back("in parts of 100 bytes", inParts());
    return files;
}

std::vector<uint8_t> bitmapBytes(const StdPNG &image)
{
    const png::BitmapView bits = image.ImageData().Bits();
    return std::vector<uint8_t>(bits.bits, bits.bits + image.ImageData().ImageSize());
}

// StdPNG's bitmap against libpng's reading under the bitmap's rules: premultiplied and
// truncated alpha in 32 bits, transparent pixels all zero. (Qt's reader would do, but it
// ignores the key of 16-bit RGB.)
void expectSameAsLibpng(const StdPNG &image, const QByteArray &file, const std::string &what)
{
    int width = 0;
    int height = 0;
    const std::vector<uint8_t> expected = readWithLibpng(file, width, height);
    const QImage bitmap = bitmapOf(image);
    ASSERT_EQ(bitmap.size(), QSize(width, height)) << what;
    const unsigned opaque = image.BitCount_BMP() == 32 ? 0 : 255;
    for (int y = 0; y < height; ++y) {
        for (int x = 0; x < width; ++x) {
            const uint8_t *p = expected.data() + (size_t(y) * size_t(width) + size_t(x)) * 4;
            const unsigned a = std::max<unsigned>(opaque, p[3]);
            const quint32 want = a << 24 | p[0] * a / 255 << 16 | p[1] * a / 255 << 8 | p[2] * a / 255;
            ASSERT_EQ(argbAt(bitmap, x, y), want) << what << " at " << x << "," << y;
        }
    }
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

TEST(PngDecode, matchesLibpngOnEveryFileAndItselfAtEveryVectorLevel)
{
    const png::Simd best = png::simdLevel();
    for (const auto &[name, file] : corpus()) {
        // The seeds' random tRNS keys may lie outside the bit depth, where libpng masks the
        // key and StdPNG compares it whole: those only have to agree with themselves.
        const bool likeLibpng = !name.starts_with("seed") || !file.contains("tRNS");
        // Alpha kept, laid on a colour, or dropped: the vector kernels against the per-pixel rules.
        for (const qint32 style : { int(StdPNG::alphaTransparent), 0x336699, int(StdPNG::alphaNoBkgNoAlpha) }) {
            for (const bool make32 : { false, true }) {
                SCOPED_TRACE(name + " style " + std::to_string(style) + (make32 ? " make32" : ""));
                std::vector<std::vector<uint8_t>> results;
                for (const png::Simd level : { png::Simd::None, png::Simd::Ssse3 }) {
                    if (level > best)
                        continue;
                    png::setSimdLevel(level);
                    StdPNG image;
                    image.setTransparentStyle(style);
                    EXPECT_TRUE(image.LoadData(file, true, make32)) << image.FailureReason().toStdString();
                    if (style == StdPNG::alphaTransparent && likeLibpng)
                        expectSameAsLibpng(image, file, name);
                    results.push_back(bitmapBytes(image));
                }
                png::setSimdLevel(best);
                EXPECT_EQ(results.front(), results.back());
            }
        }
    }
}

TEST(PngDecode, inflatesAtOnceOrStreamedAlikeAndOnlyAWholeStreamOfTheHeadersLength)
{
    using Mode = png::ImageStream::Mode;
    uint32_t seed = 3;
    for (const auto &[colorType, bitDepth] : formats) {
        for (const bool interlaced : { false, true }) {
            ImageRecipe recipe { 20, 40, colorType, bitDepth, interlaced, true, seed++ };
            for (const int part : { 0, 7 }) {
                recipe.idatBytes = part;
                const QByteArray file = writeWithLibpng(recipe);
                ASSERT_EQ(file.count("IDAT") > 1, part > 0) << describe(recipe);
                const Decoded whole = decodeWith(file, Mode::Whole);
                ASSERT_TRUE(whole.ok) << describe(recipe);
                EXPECT_EQ(decodeWith(file, Mode::Streaming), whole) << describe(recipe) << " parts " << part;
            }
        }
    }

    QByteArray rows;
    for (int y = 0; y < 4; ++y)
        rows += QByteArray(1, '\0') + QByteArray(4, char(y));
    QByteArray badChecksum = deflate(rows);
    badChecksum.back() = char(badChecksum.back() ^ 1);
    const std::pair<QByteArray, bool> streams[] = { { deflate(rows), true }, { deflate(rows) + "after the end", true },
        { deflate(rows.left(15)), false }, { deflate(rows + QByteArray(5, '\0')), false }, { badChecksum, false },
        { deflate(rows).chopped(3), false }, { "not deflate", false } };
    for (const auto &[stream, whole] : streams) {
        SCOPED_TRACE(stream.toHex().toStdString());
        const auto file = [&stream](qsizetype split) {
            return signature() + ihdr(4, 4, 8, 0) + chunk("IDAT", stream.left(split)) + chunk("IDAT", stream.mid(split))
                + chunk("IEND", {});
        };
        StdPNG image;
        EXPECT_EQ(image.LoadData(file(3)) ? "loaded" : image.FailureReason(),
            whole ? "loaded" : "Failed to decompress image data.");
        for (const QByteArray &parts : { file(stream.size()), file(3) }) {
            EXPECT_EQ(decodeWith(parts, Mode::Whole).ok, whole);
            EXPECT_EQ(decodeWith(parts, Mode::Streaming).ok, whole);
        }
    }

    // StdPNG joins the parts of a file it read itself in place, and copies those of a caller's.
    const QByteArray file = inParts();
    QTemporaryDir folder;
    StdPNG fromDisk;
    ASSERT_TRUE(fromDisk.LoadFile(writeFile(folder.filePath("parts.png"), file)));
    StdPNG fromMemory;
    ASSERT_TRUE(fromMemory.LoadData(file));
    EXPECT_EQ(bitmapBytes(fromDisk), bitmapBytes(fromMemory));
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
        SCOPED_TRACE(describe(recipe));
        ASSERT_TRUE(image.LoadData(writeWithLibpng(recipe)));
        EXPECT_EQ(image.BitCount_BMP(), row[3]);
        EXPECT_EQ(image.ImageData().ColorTable().size(), size_t(row[4]));
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

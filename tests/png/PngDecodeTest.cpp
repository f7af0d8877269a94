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

QByteArray inParts()
{
    return writeWithLibpng({ 40, 30, 6, 16, false, false, 8, 7 });
}

// The fuzz seeds (another encoder: every format, interlacing and filter) and libpng's files of
// every format, some wide enough for the vector blocks, one in IDAT chunks of 7 bytes.
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
                    if (!keyed || colorType <= 3)
                        files.emplace_back("libpng file " + std::to_string(files.size()),
                            writeWithLibpng({ width, height, colorType, bitDepth, interlaced, keyed, seed++ }));
                }
            }
        }
    }
    files.emplace_back("in parts of 7 bytes", inParts());
    return files;
}

std::vector<uint8_t> bitmapBytes(const StdPNG &image)
{
    const png::BitmapView bits = image.ImageData().Bits();
    return std::vector<uint8_t>(bits.bits, bits.bits + image.ImageData().ImageSize());
}

// StdPNG's bitmap against libpng's reading (Qt's ignores the key of 16-bit RGB), with alpha
// premultiplied and truncated in 32 bits.
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

// The decoder's own bitmap of a file, its stream inflated at once or streamed; none when it fails.
std::vector<uint8_t> decodeWith(const QByteArray &file, png::ImageStream::Mode mode)
{
    png::Header header;
    png::FileInfo info;
    const png::ReadResult read = png::readChunks(file, true, header, info);
    if (!read.ok)
        return {};
    const png::DecodeOptions options;
    const int bitCount = png::outputBitCount(header, info, options);
    const qsizetype stride = png::bitmapStride(header.width, bitCount);
    std::vector<uint8_t> bits(size_t(stride * header.height));
    const png::BitmapView bitmap { bits.data(), header.width, header.height, stride, bitCount };
    png::ImageStream stream(read.imageData, png::inflatedSize(header), mode);
    if (stream.failed() || !png::decodeImage(header, info, options, stream, bitmap, {}))
        return {};
    return bits;
}

} // namespace

TEST(PngDecode, matchesLibpngOnEveryFileAndItselfAtEveryVectorLevelAtOnceOrStreamed)
{
    const png::Simd best = png::simdLevel();
    for (const auto &[name, file] : corpus()) {
        const std::vector<uint8_t> whole = decodeWith(file, png::ImageStream::Mode::Whole);
        EXPECT_FALSE(whole.empty()) << name;
        EXPECT_EQ(decodeWith(file, png::ImageStream::Mode::Streaming), whole) << name;
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

TEST(PngDecode, inflatesOnlyAWholeStreamOfTheHeadersLength)
{
    using Mode = png::ImageStream::Mode;
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
            EXPECT_NE(decodeWith(parts, Mode::Whole).empty(), whole);
            EXPECT_NE(decodeWith(parts, Mode::Streaming).empty(), whole);
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

TEST(PngDecode, reportsProgressAfterEachSixteenRowsAndAtTheEnd)
{
    // Sixteen-row blocks; a one-row interlaced image has no pass 7 (nor 3 and 5) yet ends at 100.
    const std::pair<QByteArray, QList<int>> cases[] = { { greyFile(3, 40), { 0, 40, 80, 100 } },
        { writeWithLibpng({ 9, 1, 0, 8, true, false, 1 }), { 0, 14, 28, 57, 85, 100 } } };
    for (const auto &[file, expected] : cases) {
        StdPNG image;
        QList<int> values;
        QObject::connect(&image, &StdPNG::Progress, [&](qint32 p) { values.append(p); });
        ASSERT_TRUE(image.LoadData(file));
        EXPECT_EQ(values, expected);
    }
}

#include "PngTestFiles.h"

#include "png/PngChunkReader.h"
#include "png/StdPNG.h"
#include "support/TestSupport.h"

#include <QTemporaryDir>

#include <gtest/gtest.h>

using namespace zelctl;
using namespace zelctl::test;

namespace {

const QByteArray idat = chunk("IDAT", deflate(QByteArray::fromHex("00000000")));
const QByteArray iend = chunk("IEND", {});

// A valid 3 × 1 grey image with extra chunks between the header and the data.
QByteArray smallFile(const QByteArray &extra = {})
{
    return signature() + ihdr(3, 1, 8, 0) + extra + idat + iend;
}

QByteArray withBadCrc(const char *type, const QByteArray &data)
{
    return chunkWithCrc(type, data, 0x12345678);
}

} // namespace

TEST(PngReader, namesEachFailureAndKeepsNothingOfIt)
{
    const auto headed = [](const QByteArray &header) { return signature() + header + idat + iend; };
    const QByteArray palette = QByteArray::fromHex("ff000000ff00");
    const QByteArray indexed = signature() + ihdr(3, 1, 8, 3);
    const QByteArray noData = signature() + ihdr(3, 1, 8, 0) + chunk("abCd", QByteArray(8, 'x')) + iend; // 65 bytes
    QByteArray lying = smallFile(chunk("gAMA", be32(45455)));
    lying.replace(33, 4, be32(0xFFFFFFF0u)); // a length far past the end
    const QString header = "Corrupted Image Header. Cannot continue.";
    const QString tooLarge = "Image is too large to process. Cannot continue.";
    const QString truncated = "Truncated file: a chunk runs past the end or IEND is missing.";
    const QString notPng = "Not a PNG file.";
    // A tRNS with a bad CRC (whatever is validated), too short a key, or in an RGBA image is ignored.
    const QByteArray badKey = smallFile(withBadCrc("tRNS", QByteArray::fromHex("0001")));
    const QByteArray rgba = signature() + ihdr(1, 1, 8, 6) + chunk("tRNS", QByteArray::fromHex("000100020003"))
        + chunk("IDAT", deflate(QByteArray::fromHex("0001020380"))) + iend;
    const struct
    {
        QByteArray file;
        QString result;
        bool validateAllData = true;
    } cases[] = {
        { headed(withBadCrc("IHDR", ihdr(3, 1, 8, 0).mid(8, 13))),
            "Corrupted Image Header (bad CRC). Cannot continue." },
        { headed(ihdr(0, 1, 8, 0)), header },
        { headed(ihdr(3, -5, 8, 0)), header },
        { headed(chunk("IHDR", QByteArray(12, '\1'))), header },
        // A header of the earlier file must not stand in for a missing one.
        { signature() + chunk("tEXt", QByteArray("a\0b", 3)) + idat + iend, header },
        { headed(ihdr(3, 1, 8, 0, 0, 1)), "Invalid Compression Flag in Header. Cannot continue." },
        { headed(ihdr(3, 1, 8, 0, 0, 0, 1)), "Invalid Filter Flag in Header. Cannot continue." },
        { headed(ihdr(3, 1, 3, 0)), "Invalid Bit Depth Flag in Header. Cannot continue." },
        { headed(ihdr(3, 1, 8, 5)), "Invalid Color Type Flag in Header. Cannot continue." },
        { headed(ihdr(3, 1, 8, 0, 2)), "Invalid Interlacing Flag in Header. Cannot continue." },
        // The header check lets RGB at 1 bit through; the decoder refuses it.
        { headed(ihdr(8, 1, 1, 2)), "Invalid combination of color type and bit depth." },
        // Sizes whose byte counts overflow 32-bit arithmetic, and one the data cannot fill.
        { headed(ihdr(67108864, 1, 8, 0)), tooLarge },
        { headed(ihdr(0x7fffffff, 0x7fffffff, 1, 0)), tooLarge },
        { headed(ihdr(20000, 20000, 8, 6)), "Failed to decompress image data." },
        { indexed + withBadCrc("PLTE", palette) + idat + iend, "Invalid Palette (bad CRC). Cannot continue.", false },
        { indexed + chunk("PLTE", palette.left(5)) + idat + iend, "Invalid Palette. Cannot continue." },
        { smallFile(withBadCrc("PLTE", palette)), "8 bits" }, // a grey image ignores its palette
        { signature() + ihdr(3, 1, 8, 0) + withBadCrc("IDAT", idat.mid(8, idat.size() - 12)) + iend,
            "Corrupted Image Data (bad CRC). Cannot continue." },
        { greyFile(4, 4, {}, 5), "Invalid filter type in image data." },
        { noData, "No image data found. Cannot continue." },
        // 56 bytes are too few whatever they hold; 57 go on to the chunk loop.
        { noData.left(56), notPng },
        { noData.left(57), truncated },
        { QByteArray(smallFile()).replace(1, 1, "p"), notPng },
        { lying, truncated },
        // Empty data chunks are skipped; nothing after IEND is read, even with data in IEND.
        { signature() + ihdr(3, 1, 8, 0) + chunk("IDAT", {}) + idat + chunk("IDAT", {}) + iend, "8 bits" },
        { signature() + ihdr(3, 1, 8, 0) + idat + chunk("IEND", "xyz") + withBadCrc("IDAT", "z"), "8 bits" },
        { badKey, "8 bits", false },
        { smallFile(chunk("tRNS", QByteArray(1, '\0'))), "8 bits" },
        { signature() + ihdr(1, 1, 8, 2) + chunk("tRNS", QByteArray::fromHex("0001"))
                + chunk("IDAT", deflate(QByteArray(4, '\0'))) + iend,
            "24 bits" },
        { rgba, "32 bits" },
    };
    for (const auto &c : cases) {
        StdPNG image;
        image.setTransparentStyle(StdPNG::alphaTransparent);
        ASSERT_TRUE(image.LoadData(smallFile()));
        const bool loaded = image.LoadData(c.file, c.validateAllData);
        EXPECT_EQ(loaded ? QStringLiteral("%1 bits").arg(image.BitCount_BMP()) : image.FailureReason(), c.result)
            << c.file.toHex().toStdString();
        EXPECT_EQ(image.BitCount_BMP() != 0 && image.handle() != 0, loaded);
    }
    // Cut at every byte after the signature, the load fails cleanly.
    const QByteArray file = smallFile(chunk("gAMA", be32(45455)));
    for (qsizetype size = 8; size < file.size(); ++size) {
        StdPNG image;
        EXPECT_FALSE(image.LoadData(file.left(size))) << size;
        EXPECT_EQ(image.BitCount_BMP(), 0) << size;
    }
}

TEST(PngReader, joinsTextAndCompressedTextIntoComments)
{
    StdPNG image;
    ASSERT_TRUE(image.LoadData(smallFile()));
    EXPECT_EQ(image.Comments("(none)"), "(none)");

    // A keyword-less, an undeflatable and a bomb (inflating beyond fifty times its size) are skipped.
    const QByteArray bomb = deflate(QByteArray(100000, 'a'));
    ASSERT_LT(bomb.size() * 50, 100000);
    const QByteArray text = chunk("tEXt", QByteArray("Title\0Caf\xe9 line\nnext", 20))
        + chunk("zTXt", QByteArray("Author\0\0", 8) + deflate("Ana\r\nSilva"))
        + chunk("tEXt", QByteArray("\0no keyword", 11)) + chunk("zTXt", QByteArray("Bad\0\0not deflate", 17))
        + chunk("zTXt", QByteArray("Big\0\0", 5) + bomb) + chunk("tEXt", QByteArray("Esc\0a\x1b[2Jb", 10));
    ASSERT_TRUE(image.LoadData(smallFile(text)));
    EXPECT_EQ(
        image.Comments("(none)"), QString::fromUtf8("Title: Café line\r\nnext\r\nAuthor: Ana\r\nSilva\r\nEsc: a [2Jb"));
}

TEST(PngReader, turnsPaletteImagesGreyAndGreyImagesIntoPaletteImages)
{
    const QByteArray palette = QByteArray::fromHex("ff0000 00ff00 0000ff");
    StdPNG image;
    // Given no palette, a palette image turns grey (a ramp of 256 entries), unless it has transparency.
    for (const bool transparent : { false, true }) {
        ASSERT_TRUE(image.LoadData(signature() + ihdr(3, 1, 8, 3) + chunk("PLTE", palette)
            + (transparent ? chunk("tRNS", QByteArray(1, '\0')) : QByteArray()) + idat + iend));
        image.setPalette({});
        EXPECT_EQ(image.ColorType(), transparent ? 3 : 0);
        EXPECT_EQ(image.Palette().size(), transparent ? 9 : 768);
    }
    // A grey image with a palette set becomes a palette image of four entries for two bits.
    ASSERT_TRUE(image.LoadData(signature() + ihdr(3, 1, 2, 0) + chunk("tRNS", QByteArray::fromHex("0002"))
        + chunk("IDAT", deflate(QByteArray(2, '\0'))) + iend));
    image.setPalette(QByteArray::fromHex("010203040506"));
    EXPECT_EQ(image.ColorType(), 3);
    EXPECT_EQ(image.Palette(), QByteArray::fromHex("010203040506000000000000"));
}

TEST(PngReader, loadsFromDiskButNothingThatIsNotABoundedFile)
{
    QTemporaryDir folder;
    StdPNG image;
    EXPECT_TRUE(image.LoadFile(writeFile(folder.filePath("image.png"), smallFile())));
    EXPECT_EQ(image.FailureReason(), "");
    // A FIFO without a writer would block.
    const std::pair<QString, QString> cases[] = { { folder.filePath("missing.png"), "The file cannot be read." },
        { makeFifo(folder.filePath("fifo")), "The file cannot be read." },
        { sizedFile(folder.filePath("large.png"), png::MaxFileBytes + 1),
            "Image is too large to process. Cannot continue." } };
    for (const auto &[path, reason] : cases) {
        EXPECT_FALSE(image.LoadFile(path));
        EXPECT_EQ(image.FailureReason(), reason);
    }
}

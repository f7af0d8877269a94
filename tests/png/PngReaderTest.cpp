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

void expectNoAncillaryData(const StdPNG &image)
{
    EXPECT_DOUBLE_EQ(image.GammaCorrection(), 0.0);
    EXPECT_TRUE(image.Chromaticity().isEmpty());
    EXPECT_TRUE(image.AspectRatio().isEmpty());
    EXPECT_TRUE(image.Offsets().isEmpty());
    EXPECT_EQ(image.StdRGB(), 0);
    EXPECT_FALSE(image.LastModified().isValid());
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
        // The checks run in order: compression before filter, both before the bit depth.
        { headed(ihdr(3, 1, 3, 0, 0, 1, 1)), "Invalid Compression Flag in Header. Cannot continue." },
        { headed(ihdr(3, 1, 3, 0, 0, 0, 1)), "Invalid Filter Flag in Header. Cannot continue." },
        { headed(ihdr(3, 1, 3, 9, 7)), "Invalid Bit Depth Flag in Header. Cannot continue." },
        // The header check lets RGB at 1 bit through; the decoder refuses it.
        { headed(ihdr(8, 1, 1, 2)), "Invalid combination of color type and bit depth." },
        // Sizes whose byte counts overflow 32-bit arithmetic, and one the data cannot fill.
        { headed(ihdr(67108864, 1, 8, 0)), tooLarge },
        { headed(ihdr(30000, 30000, 8, 6)), tooLarge },
        { headed(ihdr(0x7fffffff, 0x7fffffff, 1, 0)), tooLarge },
        { headed(ihdr(20000, 20000, 8, 6)), "Failed to decompress image data." },
        { indexed + withBadCrc("PLTE", palette) + idat + iend, "Invalid Palette (bad CRC). Cannot continue." },
        { indexed + withBadCrc("PLTE", palette) + idat + iend, "Invalid Palette (bad CRC). Cannot continue.", false },
        { indexed + chunk("PLTE", palette.left(5)) + idat + iend, "Invalid Palette. Cannot continue." },
        { smallFile(withBadCrc("PLTE", palette)), "8 bits" }, // a grey image ignores its palette
        { signature() + ihdr(3, 1, 8, 0) + withBadCrc("IDAT", idat.mid(8, idat.size() - 12)) + iend,
            "Corrupted Image Data (bad CRC). Cannot continue." },
        { greyFile(4, 4, {}, 5), "Invalid filter type in image data." },
        { greyFile(4, 4, {}, 4), "8 bits" },
        { noData, "No image data found. Cannot continue." },
        // 56 bytes are too few whatever they hold; 57 go on to the chunk loop.
        { noData.left(56), notPng },
        { noData.left(57), truncated },
        { QByteArray(smallFile()).replace(1, 1, "p"), notPng },
        { QByteArray(smallFile()).replace(6, 1, QByteArray(1, '\0')), notPng },
        { lying, truncated },
        // Empty data chunks are skipped; nothing after IEND is read, even with data in IEND.
        { signature() + ihdr(3, 1, 8, 0) + chunk("IDAT", {}) + idat + chunk("IDAT", {}) + iend, "8 bits" },
        { smallFile() + QByteArray(40, '\xff'), "8 bits" },
        { signature() + ihdr(3, 1, 8, 0) + idat + chunk("IEND", "xyz") + withBadCrc("IDAT", "z"), "8 bits" },
        { badKey, "8 bits" },
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

TEST(PngReader, readsTheAncillaryChunksOfTheRightSizeAndCrc)
{
    QByteArray chrm;
    for (int v : { 31270, 32900, 64000, 33000, 30000, 60000, 15000, 6000 })
        chrm += be32(uint32_t(v));
    const QByteArray extra = chunk("gAMA", be32(45455)) + chunk("cHRM", chrm)
        + chunk("pHYs", be32(2835) + be32(3000) + QByteArray(1, '\1'))
        + chunk("oFFs", be32(uint32_t(-7)) + be32(12) + QByteArray(1, '\0')) + chunk("sRGB", QByteArray(1, '\2'))
        + chunk("tIME", QByteArray::fromHex("07e8020d0e0f10"));
    StdPNG image;
    ASSERT_TRUE(image.LoadData(smallFile(extra)));
    EXPECT_DOUBLE_EQ(image.GammaCorrection(), 0.45455);
    EXPECT_EQ(image.Chromaticity(), (QList<double> { 0.3127, 0.329, 0.64, 0.33, 0.3, 0.6, 0.15, 0.06 }));
    EXPECT_EQ(image.AspectRatio(), (QList<qint32> { 2835, 3000, 1 }));
    EXPECT_EQ(image.Offsets(), (QList<qint32> { -7, 12, 0 }));
    EXPECT_EQ(image.StdRGB(), 3);
    EXPECT_EQ(image.LastModified(), QDateTime(QDate(2024, 2, 13), QTime(14, 15, 16)));

    // The next load forgets all of it, but keeps the header until a new one is read.
    ASSERT_FALSE(image.LoadData(signature() + ihdr(3, 1, 8, 0) + chunk("abCd", QByteArray(8, 'x')) + iend));
    expectNoAncillaryData(image);
    EXPECT_EQ(image.Width(), 3);

    // Wrong sizes, a moment that is not a date, year 0: none of it counts.
    const QByteArray wrongSizes = chunk("gAMA", be32(45455) + "x") + chunk("cHRM", QByteArray(31, '\1'))
        + chunk("pHYs", QByteArray(8, '\1')) + chunk("sRGB", QByteArray(1, '\4')) + chunk("tIME", QByteArray(6, '\1'));
    for (const QByteArray &wrong : { wrongSizes, chunk("tIME", QByteArray::fromHex("07e80d0e0f1011")),
             chunk("tIME", QByteArray::fromHex("00000101000000")) }) {
        ASSERT_TRUE(image.LoadData(smallFile(wrong)));
        expectNoAncillaryData(image);
    }

    // Ancillary CRCs count only when all data is validated; a CRC of 0 is not checked.
    const auto gammaOf = [&image](const QByteArray &gama, bool validate) {
        EXPECT_TRUE(image.LoadData(smallFile(gama), validate));
        return image.GammaCorrection();
    };
    EXPECT_DOUBLE_EQ(gammaOf(withBadCrc("gAMA", be32(45455)), true), 0.0);
    EXPECT_DOUBLE_EQ(gammaOf(withBadCrc("gAMA", be32(45455)), false), 0.45455);
    EXPECT_DOUBLE_EQ(gammaOf(chunkWithCrc("gAMA", be32(45455), 0), true), 0.45455);
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

TEST(PngReader, givesPalettesAndTurnsGreyIntoPaletteAndBack)
{
    StdPNG image;
    ASSERT_TRUE(image.LoadData(signature() + ihdr(3, 1, 4, 0) + chunk("IDAT", deflate(QByteArray(3, '\0'))) + iend));
    QByteArray ramp;
    for (int i = 0; i < 16; ++i)
        ramp.append(3, char(i * 17));
    EXPECT_EQ(image.Palette(), ramp);

    const QByteArray palette = QByteArray::fromHex("ff0000 00ff00 0000ff");
    ASSERT_TRUE(image.LoadData(signature() + ihdr(3, 1, 8, 3) + chunk("PLTE", palette) + idat + iend));
    EXPECT_EQ(image.Palette(), palette);
    image.setPalette({});
    EXPECT_EQ(image.ColorType(), 0);
    EXPECT_EQ(image.Palette().size(), 768);

    // A grey image with a palette set becomes a palette image of four entries for two bits.
    ASSERT_TRUE(image.LoadData(signature() + ihdr(3, 1, 2, 0) + chunk("tRNS", QByteArray::fromHex("0002"))
        + chunk("IDAT", deflate(QByteArray(2, '\0'))) + iend));
    image.setPalette(QByteArray::fromHex("010203040506"));
    EXPECT_EQ(image.ColorType(), 3);
    EXPECT_EQ(image.Palette(), QByteArray::fromHex("010203040506000000000000"));

    // A palette image with transparency keeps its palette when given none.
    ASSERT_TRUE(image.LoadData(
        signature() + ihdr(3, 1, 8, 3) + chunk("PLTE", palette) + chunk("tRNS", QByteArray(1, '\0')) + idat + iend));
    image.setPalette({});
    EXPECT_EQ(image.ColorType(), 3);

    // An RGB image gives no palette, even a suggested one, and takes none.
    ASSERT_TRUE(image.LoadData(
        signature() + ihdr(1, 1, 8, 2) + chunk("PLTE", palette) + chunk("IDAT", deflate(QByteArray(4, '\0'))) + iend));
    EXPECT_TRUE(image.Palette().isEmpty());
    image.setPalette(QByteArray(3, '\1'));
    EXPECT_EQ(image.ColorType(), 2);
    EXPECT_TRUE(image.Palette().isEmpty());
}

TEST(PngReader, loadsFromDiskButNothingThatIsNotABoundedFile)
{
    QTemporaryDir folder;
    StdPNG image;
    EXPECT_TRUE(image.LoadFile(writeFile(folder.filePath("image.png"), smallFile())));
    EXPECT_EQ(image.FailureReason(), "");
    // A FIFO without a writer would block; an endless device would never end.
    const std::pair<QString, QString> cases[] = { { folder.filePath("missing.png"), "The file cannot be read." },
        { folder.path(), "The file cannot be read." },
        { makeFifo(folder.filePath("fifo")), "The file cannot be read." }, { "/dev/zero", "The file cannot be read." },
        { sizedFile(folder.filePath("large.png"), png::MaxFileBytes + 1),
            "Image is too large to process. Cannot continue." } };
    for (const auto &[path, reason] : cases) {
        EXPECT_FALSE(image.LoadFile(path));
        EXPECT_EQ(image.FailureReason(), reason);
    }
}

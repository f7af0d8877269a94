#include "PngTestFiles.h"

#include "png/PngChunkReader.h"
#include "png/StdPNG.h"
#include "support/TestSupport.h"

#include <QDir>
#include <QTemporaryDir>

#include <gtest/gtest.h>

#include <sys/stat.h>

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

QString loadFailure(const QByteArray &file, bool validateAllData = true)
{
    StdPNG image;
    if (image.LoadData(file, validateAllData))
        return QStringLiteral("loaded");
    return image.FailureReason();
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

QByteArray withBadCrc(const char *type, const QByteArray &data)
{
    return chunkWithCrc(type, data, 0x12345678);
}

} // namespace

TEST(PngReader, namesEachHeaderFailure)
{
    const struct
    {
        QByteArray header;
        const char *reason;
    } cases[] = {
        { withBadCrc("IHDR", ihdr(3, 1, 8, 0).mid(8, 13)), "Corrupted Image Header (bad CRC). Cannot continue." },
        { ihdr(0, 1, 8, 0), "Corrupted Image Header. Cannot continue." },
        { ihdr(3, -5, 8, 0), "Corrupted Image Header. Cannot continue." },
        { chunk("IHDR", QByteArray(12, '\1')), "Corrupted Image Header. Cannot continue." },
        { ihdr(3, 1, 8, 0, 0, 1), "Invalid Compression Flag in Header. Cannot continue." },
        { ihdr(3, 1, 8, 0, 0, 0, 1), "Invalid Filter Flag in Header. Cannot continue." },
        { ihdr(3, 1, 3, 0), "Invalid Bit Depth Flag in Header. Cannot continue." },
        { ihdr(3, 1, 8, 5), "Invalid Color Type Flag in Header. Cannot continue." },
        { ihdr(3, 1, 8, 0, 2), "Invalid Interlacing Flag in Header. Cannot continue." },
        // The checks run in order: compression before filter, both before the bit depth.
        { ihdr(3, 1, 3, 0, 0, 1, 1), "Invalid Compression Flag in Header. Cannot continue." },
        { ihdr(3, 1, 3, 0, 0, 0, 1), "Invalid Filter Flag in Header. Cannot continue." },
        { ihdr(3, 1, 3, 9, 7), "Invalid Bit Depth Flag in Header. Cannot continue." },
        // Sizes whose byte counts overflow 32-bit arithmetic.
        { ihdr(67108864, 1, 8, 0), "Image is too large to process. Cannot continue." },
        { ihdr(30000, 30000, 8, 6), "Image is too large to process. Cannot continue." },
        { ihdr(0x7fffffff, 0x7fffffff, 1, 0), "Image is too large to process. Cannot continue." },
    };
    for (const auto &c : cases)
        EXPECT_EQ(loadFailure(signature() + c.header + idat + iend), c.reason) << c.header.toHex().toStdString();
}

TEST(PngReader, allocatesNothingHugeForASizeTheDataCannotFill)
{
    // Within the limits, the size is fine, but the data cannot fill it; nothing huge is allocated.
    StdPNG image;
    EXPECT_FALSE(image.LoadData(signature() + ihdr(20000, 20000, 8, 6) + idat + iend));
    EXPECT_EQ(image.FailureReason(), "Failed to decompress image data.");
    EXPECT_EQ(image.Width(), 20000);
}

TEST(PngReader, namesPaletteAndDataFailures)
{
    const QByteArray palette = QByteArray::fromHex("ff000000ff00");
    const QByteArray indexed = signature() + ihdr(3, 1, 8, 3);
    EXPECT_EQ(loadFailure(indexed + withBadCrc("PLTE", palette) + idat + iend),
        "Invalid Palette (bad CRC). Cannot continue.");
    EXPECT_EQ(loadFailure(indexed + chunk("PLTE", palette.left(5)) + idat + iend), "Invalid Palette. Cannot continue.");
    EXPECT_EQ(loadFailure(indexed + withBadCrc("PLTE", palette) + idat + iend, false),
        "Invalid Palette (bad CRC). Cannot continue.");
    // A grey image ignores its palette, bad or not.
    EXPECT_EQ(loadFailure(smallFile(withBadCrc("PLTE", palette))), "loaded");

    EXPECT_EQ(loadFailure(signature() + ihdr(3, 1, 8, 0) + withBadCrc("IDAT", deflate(QByteArray(4, '\0'))) + iend),
        "Corrupted Image Data (bad CRC). Cannot continue.");
    EXPECT_EQ(loadFailure(signature() + ihdr(3, 1, 8, 0) + chunk("abCd", QByteArray(8, 'x')) + iend),
        "No image data found. Cannot continue.");
}

TEST(PngReader, checksTheLengthAndSignatureFirst)
{
    const QByteArray file = smallFile();
    ASSERT_GE(file.size(), 57);
    EXPECT_EQ(loadFailure(file), "loaded");
    QByteArray wrongSignature = file;
    wrongSignature[1] = 'p';
    EXPECT_EQ(loadFailure(wrongSignature), "Not a PNG file.");
    wrongSignature = file;
    wrongSignature[6] = 0;
    EXPECT_EQ(loadFailure(wrongSignature), "Not a PNG file.");

    // 56 bytes are too few whatever they hold; 57 go on to the chunk loop.
    const QByteArray padded = signature() + ihdr(3, 1, 8, 0) + chunk("abCd", QByteArray(8, 'x')) + iend;
    ASSERT_EQ(padded.size(), 65);
    EXPECT_EQ(loadFailure(padded.left(56)), "Not a PNG file.");
    EXPECT_EQ(loadFailure(padded.left(57)), "Truncated file: a chunk runs past the end or IEND is missing.");
    EXPECT_EQ(loadFailure(padded), "No image data found. Cannot continue.");
}

TEST(PngReader, needsEveryChunkWholeAndAnIend)
{
    const QByteArray file = smallFile(chunk("gAMA", be32(45455)));
    EXPECT_EQ(loadFailure(file), "loaded");
    EXPECT_EQ(loadFailure(file.chopped(12)), "Truncated file: a chunk runs past the end or IEND is missing.");
    // Cut at every byte after the signature: at a chunk boundary or inside a chunk, the
    // load fails cleanly and leaves no bitmap.
    for (qsizetype size = 8; size < file.size(); ++size) {
        StdPNG image;
        EXPECT_FALSE(image.LoadData(file.left(size))) << size;
        EXPECT_EQ(image.BitCount_BMP(), 0) << size;
    }
    // A length field pointing far past the end.
    QByteArray lying = file;
    lying.replace(33, 4, be32(0xFFFFFFF0u));
    EXPECT_EQ(loadFailure(lying), "Truncated file: a chunk runs past the end or IEND is missing.");
}

TEST(PngReader, skipsEmptyDataChunksAndStopsAtIend)
{
    EXPECT_EQ(
        loadFailure(signature() + ihdr(3, 1, 8, 0) + chunk("IDAT", {}) + idat + chunk("IDAT", {}) + iend), "loaded");
    // Anything after IEND is never read.
    EXPECT_EQ(loadFailure(smallFile() + QByteArray(40, '\xff')), "loaded");
    // An IEND with data still ends the loop.
    EXPECT_EQ(
        loadFailure(signature() + ihdr(3, 1, 8, 0) + idat + chunk("IEND", "xyz") + withBadCrc("IDAT", "z")), "loaded");
    // Data split over several IDAT chunks is joined.
    const QByteArray stream = deflate(QByteArray::fromHex("00010203"));
    EXPECT_EQ(loadFailure(
                  signature() + ihdr(3, 1, 8, 0) + chunk("IDAT", stream.left(3)) + chunk("IDAT", stream.mid(3)) + iend),
        "loaded");
}

TEST(PngReader, refusesAFileWithoutHeader)
{
    StdPNG image;
    ASSERT_TRUE(image.LoadData(smallFile()));
    // A header of an earlier file must not stand in for a missing one.
    EXPECT_FALSE(image.LoadData(signature() + chunk("tEXt", QByteArray("a\0b", 3)) + idat + iend));
    EXPECT_EQ(image.FailureReason(), "Corrupted Image Header. Cannot continue.");
}

TEST(PngReader, checksAncillaryCrcsOnlyWhenValidatingAllData)
{
    const auto gammaOf = [](const QByteArray &gama, bool validate) {
        StdPNG image;
        EXPECT_TRUE(image.LoadData(smallFile(gama), validate));
        return image.GammaCorrection();
    };
    EXPECT_DOUBLE_EQ(gammaOf(chunk("gAMA", be32(45455)), true), 0.45455);
    EXPECT_DOUBLE_EQ(gammaOf(withBadCrc("gAMA", be32(45455)), true), 0.0);
    EXPECT_DOUBLE_EQ(gammaOf(withBadCrc("gAMA", be32(45455)), false), 0.45455);
    EXPECT_DOUBLE_EQ(gammaOf(chunkWithCrc("gAMA", be32(45455), 0), true), 0.45455);

    // A bad tRNS is ignored in both modes.
    for (const bool validate : { true, false }) {
        StdPNG image;
        image.setTransparentStyle(StdPNG::alphaTransparent);
        ASSERT_TRUE(image.LoadData(smallFile(withBadCrc("tRNS", QByteArray::fromHex("0001"))), validate));
        EXPECT_EQ(image.BitCount_BMP(), 8);
    }
}

TEST(PngReader, readsTheAncillaryChunks)
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
    EXPECT_EQ(image.Chromaticity(), (QList<double> { 0.3127, 0.329, 0.64, 0.33, 0.3, 0.6, 0.15, 0.06 }));
    EXPECT_EQ(image.AspectRatio(), (QList<qint32> { 2835, 3000, 1 }));
    EXPECT_EQ(image.Offsets(), (QList<qint32> { -7, 12, 0 }));
    EXPECT_EQ(image.StdRGB(), 3);
    EXPECT_EQ(image.LastModified(), QDateTime(QDate(2024, 2, 13), QTime(14, 15, 16)));
    EXPECT_EQ(image.BitCount_PNG(), 8);
    EXPECT_FALSE(image.IsInterlaced());

    // The next load forgets all of it, but keeps the header until a new one is read.
    ASSERT_FALSE(image.LoadData(signature() + ihdr(3, 1, 8, 0) + chunk("abCd", QByteArray(8, 'x')) + iend));
    expectNoAncillaryData(image);
    EXPECT_EQ(image.Width(), 3);
}

TEST(PngReader, ignoresAncillaryChunksOfTheWrongSize)
{
    const QByteArray extra = chunk("gAMA", be32(45455) + "x") + chunk("cHRM", QByteArray(31, '\1'))
        + chunk("pHYs", QByteArray(8, '\1')) + chunk("sRGB", QByteArray(1, '\4')) + chunk("tIME", QByteArray(6, '\1'));
    StdPNG image;
    ASSERT_TRUE(image.LoadData(smallFile(extra)));
    expectNoAncillaryData(image);

    // A moment that is not a date, and year 0, give no date.
    ASSERT_TRUE(image.LoadData(smallFile(chunk("tIME", QByteArray::fromHex("07e80d0e0f1011")))));
    EXPECT_FALSE(image.LastModified().isValid());
    ASSERT_TRUE(image.LoadData(smallFile(chunk("tIME", QByteArray::fromHex("00000101000000")))));
    EXPECT_FALSE(image.LastModified().isValid());
}

TEST(PngReader, joinsTextAndCompressedTextIntoComments)
{
    StdPNG image;
    ASSERT_TRUE(image.LoadData(smallFile()));
    EXPECT_EQ(image.Comments("(none)"), "(none)");

    const QByteArray text = chunk("tEXt", QByteArray("Title\0Caf\xe9 line\nnext", 20))
        + chunk("zTXt", QByteArray("Author\0\0", 8) + deflate("Ana\r\nSilva"))
        + chunk("tEXt", QByteArray("\0no keyword", 11)) + chunk("zTXt", QByteArray("Bad\0\0not deflate", 17))
        + chunk("tEXt", QByteArray("Esc\0a\x1b[2Jb", 10));
    ASSERT_TRUE(image.LoadData(smallFile(text)));
    EXPECT_EQ(
        image.Comments("(none)"), QString::fromUtf8("Title: Café line\r\nnext\r\nAuthor: Ana\r\nSilva\r\nEsc: a [2Jb"));
}

TEST(PngReader, skipsTextThatInflatesBeyondFiftyTimesItsSize)
{
    const QByteArray bomb = deflate(QByteArray(100000, 'a'));
    ASSERT_LT(bomb.size() * 50, 100000);
    StdPNG image;
    ASSERT_TRUE(image.LoadData(smallFile(chunk("zTXt", QByteArray("Big\0\0", 5) + bomb))));
    EXPECT_EQ(image.Comments("-"), "-");
}

TEST(PngReader, ignoresTransparencyWhereItDoesNotApply)
{
    StdPNG image;
    image.setTransparentStyle(StdPNG::alphaTransparent);
    // tRNS in an RGBA image is ignored: nothing changes in how it decodes.
    const QByteArray rgba = signature() + ihdr(1, 1, 8, 6) + chunk("tRNS", QByteArray::fromHex("000100020003"))
        + chunk("IDAT", deflate(QByteArray::fromHex("0001020380"))) + iend;
    ASSERT_TRUE(image.LoadData(rgba));
    EXPECT_EQ(image.BitCount_BMP(), 32);

    // A too-short key counts as no key.
    ASSERT_TRUE(image.LoadData(smallFile(chunk("tRNS", QByteArray(1, '\0')))));
    EXPECT_EQ(image.BitCount_BMP(), 8);
}

TEST(PngReader, givesPalettesAndGreyRamps)
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

    // An RGB image's suggested palette is not given.
    ASSERT_TRUE(image.LoadData(
        signature() + ihdr(1, 1, 8, 2) + chunk("PLTE", palette) + chunk("IDAT", deflate(QByteArray(4, '\0'))) + iend));
    EXPECT_TRUE(image.Palette().isEmpty());
}

TEST(PngReader, turnsGreyIntoPaletteAndBackWhenThePaletteIsSet)
{
    StdPNG image;
    ASSERT_TRUE(image.LoadData(signature() + ihdr(3, 1, 2, 0) + chunk("tRNS", QByteArray::fromHex("0002"))
        + chunk("IDAT", deflate(QByteArray(2, '\0'))) + iend));
    image.setPalette(QByteArray::fromHex("010203040506"));
    EXPECT_EQ(image.ColorType(), 3);
    // Four entries for two bits, padded with zeros.
    EXPECT_EQ(image.Palette(), QByteArray::fromHex("010203040506000000000000"));

    ASSERT_TRUE(image.LoadData(signature() + ihdr(3, 1, 8, 3) + chunk("PLTE", QByteArray(6, '\1')) + idat + iend));
    image.setPalette({});
    EXPECT_EQ(image.ColorType(), 0);
    EXPECT_EQ(image.Palette().size(), 768);

    // A palette image with transparency keeps its palette when given none.
    ASSERT_TRUE(image.LoadData(signature() + ihdr(3, 1, 8, 3) + chunk("PLTE", QByteArray(6, '\1'))
        + chunk("tRNS", QByteArray(1, '\0')) + idat + iend));
    image.setPalette({});
    EXPECT_EQ(image.ColorType(), 3);

    // RGB images have no palette to replace.
    ASSERT_TRUE(image.LoadData(signature() + ihdr(1, 1, 8, 2) + chunk("IDAT", deflate(QByteArray(4, '\0'))) + iend));
    image.setPalette(QByteArray(3, '\1'));
    EXPECT_EQ(image.ColorType(), 2);
    EXPECT_TRUE(image.Palette().isEmpty());
}

TEST(PngReader, loadsFromDiskAndReportsFilesItCannotOpen)
{
    QTemporaryDir folder;
    const QString path = folder.filePath("image.png");
    QFile file(path);
    ASSERT_TRUE(file.open(QIODevice::WriteOnly));
    file.write(smallFile());
    file.close();
    StdPNG image;
    EXPECT_TRUE(image.LoadFile(path));
    EXPECT_EQ(image.FailureReason(), "");
    EXPECT_FALSE(image.LoadFile(folder.filePath("missing.png")));
    EXPECT_EQ(image.FailureReason(), "The file cannot be read.");
    // Nothing that is not a file of a bounded size is read: a directory, a FIFO without a
    // writer (which would block), an endless device, a file past the bound.
    const QString fifo = folder.filePath("fifo");
    ASSERT_EQ(mkfifo(QFile::encodeName(fifo).constData(), 0600), 0);
    for (const QString &notAFile : { folder.path(), fifo, QStringLiteral("/dev/zero") }) {
        EXPECT_FALSE(image.LoadFile(notAFile));
        EXPECT_EQ(image.FailureReason(), "The file cannot be read.");
    }
    QFile huge(folder.filePath("huge.png"));
    ASSERT_TRUE(huge.open(QIODevice::WriteOnly) && huge.write(smallFile()) > 0 && huge.resize(png::MaxFileBytes + 1));
    huge.close();
    EXPECT_FALSE(image.LoadFile(huge.fileName()));
    EXPECT_EQ(image.FailureReason(), "Image is too large to process. Cannot continue.");
}

TEST(PngReader, replaysEveryFileTheFuzzerFound)
{
    const QDir crashers(testDataPath("crashers"));
    const QStringList names = crashers.entryList(QDir::Files);
    ASSERT_FALSE(names.isEmpty());
    for (const QString &name : names) {
        QFile file(crashers.filePath(name));
        ASSERT_TRUE(file.open(QIODevice::ReadOnly));
        const QByteArray bytes = file.readAll();
        StdPNG image;
        image.LoadData(bytes);
        image.Comments();
        image.Palette();
        image.LastModified();
    }
}

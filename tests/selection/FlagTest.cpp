#include "selection/PictureBox.h"
#include "selection/mod_CTL.h"

#include "support/TestSupport.h"

#include <QFile>
#include <QImage>
#include <QtEndian>

#include <gtest/gtest.h>

#include <thread>

using namespace zelctl;
using namespace zelctl::mod_CTL;

namespace {

QImage strip()
{
    return QImage(QStringLiteral(":/zelctl/COUNTRIES.bmp"));
}

class CountryFlag : public ::testing::Test
{
protected:
    void SetUp() override
    {
        FlagStripCache = {};
        NifControlCount = 0;
        FlagScratchSurface = nullptr;
    }
    void TearDown() override { SetUp(); }

    PictureBox surface;
};

bool isGreenish(QRgb c)
{
    return qGreen(c) > qRed(c) + 40 && qGreen(c) > qBlue(c) + 40;
}

bool isReddish(QRgb c)
{
    return qRed(c) > qGreen(c) + 60 && qRed(c) > qBlue(c) + 60;
}

} // namespace

TEST_F(CountryFlag, stripIsA512By128BitmapOf24Bits)
{
    QFile file(QStringLiteral(":/zelctl/COUNTRIES.bmp"));
    ASSERT_TRUE(file.open(QIODevice::ReadOnly));
    const QByteArray header = file.read(30);
    ASSERT_EQ(header.left(2), "BM");
    const auto le32 = [&](int at) { return qFromLittleEndian<qint32>(header.constData() + at); };
    EXPECT_EQ(le32(18), 512);
    EXPECT_EQ(le32(22), 128);
    EXPECT_EQ(qFromLittleEndian<quint16>(header.constData() + 28), 24);
}

TEST_F(CountryFlag, cellsFollowTheCodeOrder)
{
    const QImage cells = strip();
    ASSERT_FALSE(cells.isNull());
    const struct
    {
        const char *code;
        QPoint at;
    } cases[] = { { "PT", { 304, 80 } }, { "AF", { 0, 0 } }, { "ZW", { 224, 112 } }, { "DE", { 48, 0 } },
        { "ES", { 32, 32 } }, { "GB", { 336, 80 } } };
    for (const auto &c : cases) {
        const Picture flag = flagOn(surface, QLatin1String(c.code));
        ASSERT_FALSE(flag.isNull()) << c.code;
        EXPECT_EQ(flag.image().size(), QSize(16, 16)) << c.code;
        EXPECT_EQ(flag.image().convertToFormat(QImage::Format_RGB32),
            cells.copy(QRect(c.at, QSize(16, 16))).convertToFormat(QImage::Format_RGB32))
            << c.code;
    }
}

TEST_F(CountryFlag, cellsHoldTheRealFlags)
{
    // Portugal: green at the hoist, red at the fly; the flag is centred on white.
    const QImage pt = flagOn(surface, QStringLiteral("PT")).image();
    EXPECT_TRUE(isGreenish(pt.pixel(2, 8))) << std::hex << pt.pixel(2, 8);
    EXPECT_TRUE(isReddish(pt.pixel(13, 8))) << std::hex << pt.pixel(13, 8);
    EXPECT_EQ(pt.pixel(8, 0), qRgb(255, 255, 255));
    EXPECT_EQ(pt.pixel(8, 15), qRgb(255, 255, 255));
    // Every listed cell holds a picture, and the cells past the last code stay blank.
    const QImage cells = strip();
    const QImage blank = cells.copy(QRect(239 % 32 * 16, 239 / 32 * 16, 16, 16));
    for (int index = 0; index < FlagCellCount; ++index) {
        const QImage cell = cells.copy(QRect(index % 32 * 16, index / 32 * 16, 16, 16));
        EXPECT_NE(cell, blank) << "cell " << index;
    }
}

TEST_F(CountryFlag, codesNotInTheListHaveNoFlag)
{
    for (const char *code : { "EL", "pt", "", "A", "F;", "PTX", ";Z", "XX" }) {
        EXPECT_EQ(flagCellIndex(QLatin1String(code)), -1) << code;
        EXPECT_TRUE(flagOn(surface, QLatin1String(code)).isNull()) << code;
    }
    EXPECT_EQ(flagCellIndex(QStringLiteral("GR")), 80);
}

TEST_F(CountryFlag, withoutASurfaceTheStripIsStillLoaded)
{
    EXPECT_TRUE(GetCountryFlag(QStringLiteral("PT")).isNull());
    EXPECT_FALSE(FlagStripCache.isNull());
    EXPECT_EQ(FlagStripCache.image().size(), QSize(512, 128));
}

TEST_F(CountryFlag, theFlagIsComposedOnTheSurface)
{
    surface.resize(40, 30);
    surface.setBackColor(platform::rgb(0, 0, 255));
    const Picture flag = flagOn(surface, QStringLiteral("FR"));
    EXPECT_EQ(FlagScratchSurface, nullptr);
    EXPECT_EQ(surface.BackColor(), platform::rgb(255, 255, 255));
    EXPECT_EQ(surface.Image().copy(0, 0, 16, 16), flag.image());
    EXPECT_EQ(surface.Image().pixel(30, 20), qRgb(255, 255, 255));

    // A surface smaller than a flag still yields the whole flag.
    PictureBox tiny;
    tiny.resize(4, 4);
    EXPECT_EQ(flagOn(tiny, QStringLiteral("FR")), flag);
}

TEST_F(CountryFlag, stripIsKeptWhileNifControlsLive)
{
    nifControlCreated();
    nifControlCreated();
    EXPECT_EQ(NifControlCount, 2);
    flagOn(surface, QStringLiteral("PT"));
    ASSERT_FALSE(FlagStripCache.isNull());
    nifControlTerminated();
    EXPECT_FALSE(FlagStripCache.isNull());
    nifControlTerminated();
    EXPECT_EQ(NifControlCount, 0);
    EXPECT_TRUE(FlagStripCache.isNull());

    // The next request loads it again, and without NIF controls it stays.
    EXPECT_FALSE(flagOn(surface, QStringLiteral("ES")).isNull());
    EXPECT_FALSE(FlagStripCache.isNull());
    nifControlCreated();
    nifControlTerminated();
    EXPECT_TRUE(FlagStripCache.isNull());
}

TEST_F(CountryFlag, stateBelongsToItsThread)
{
    nifControlCreated();
    GetCountryFlag(QStringLiteral("PT"));
    qint32 count = -1;
    bool cached = true;
    std::thread([&] {
        count = NifControlCount;
        cached = !FlagStripCache.isNull();
    }).join();
    EXPECT_EQ(count, 0);
    EXPECT_FALSE(cached);
    EXPECT_FALSE(FlagStripCache.isNull());
}

TEST(FlagPictures, everyCountryOfTheFileHasItsPicture)
{
    QFile file(test::sourcePath(QStringLiteral("data/iso3166.txt")));
    ASSERT_TRUE(file.open(QIODevice::ReadOnly));
    int countries = 0;
    for (const QByteArray &line : file.readAll().split('\n')) {
        const QList<QByteArray> fields = line.split('\t');
        if (fields.size() < 4)
            continue;
        ++countries;
        const QString path
            = test::sourcePath(QStringLiteral("data/images/flags_iso/16/%1.png").arg(QString::fromLatin1(fields[1])));
        const QImage picture(path);
        EXPECT_EQ(picture.size(), QSize(16, 16)) << path.toStdString();
    }
    EXPECT_EQ(countries, 249);
    // Greece is listed as EL but drawn with its flag.
    EXPECT_EQ(QImage(test::sourcePath(QStringLiteral("data/images/flags_iso/16/EL.png"))),
        QImage(test::sourcePath(QStringLiteral("data/images/flags_iso/16/GR.png"))));
}

#include "selection/PictureBox.h"
#include "selection/clsGFXSelection.h"
#include "selection/mod_CTL.h"

#include <QImage>

#include <gtest/gtest.h>

using namespace zelctl;
using namespace zelctl::mod_CTL;

namespace {

class CountryFlag : public ::testing::Test
{
protected:
    void SetUp() override
    {
        FlagStripCache = {};
        // Smaller than a flag: the flag is whole all the same.
        surface.resize(4, 4);
    }
    void TearDown() override { SetUp(); }

    PictureBox surface;
};

} // namespace

// How the flags look is in the country dialog's golden picture; this is about which cell is taken.
TEST_F(CountryFlag, cellsFollowTheCodeOrder)
{
    EXPECT_TRUE(GetCountryFlag(QStringLiteral("PT")).isNull()) << "no surface of its own, no flag";
    const QImage cells(QStringLiteral(":/zelctl/COUNTRIES.bmp"));
    const struct
    {
        const char *code;
        QPoint at;
    } cases[] = { { "AF", { 0, 0 } }, { "ZW", { 224, 112 } }, { "GB", { 336, 80 } }, { "GR", { 256, 32 } },
        { "EL", { 256, 32 } } }; // Greece by its ISO and its tax code
    for (const auto &c : cases) {
        const Picture flag = flagOn(surface, QLatin1String(c.code));
        EXPECT_EQ(flag.image().convertToFormat(QImage::Format_RGB32),
            cells.copy(QRect(c.at, QSize(16, 16))).convertToFormat(QImage::Format_RGB32))
            << c.code;
    }
    for (const QString &code : clsGFXSelection().EU_CountryList().split(QLatin1Char(',')))
        EXPECT_FALSE(flagOn(surface, code).isNull()) << code.toStdString();
    for (const char *code : { "pt", "", "A", "F;", "PTX", ";Z", "XX" }) {
        EXPECT_EQ(flagCellIndex(QLatin1String(code)), -1) << code;
        EXPECT_TRUE(flagOn(surface, QLatin1String(code)).isNull()) << code;
    }
}

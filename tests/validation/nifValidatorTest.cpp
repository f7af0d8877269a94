#include "validation/nifValidator.h"

#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <limits>
#include <tuple>

using namespace zelctl::nifValidator;

TEST(CountryTable, mapsTheTwentySevenExactCodesInAlphabeticalOrderAndBack)
{
    const QStringList codes
        = QString("AT,BE,BG,CY,CZ,DE,DK,EE,EL,ES,FI,FR,GB,HU,IE,IT,LT,LU,LV,MT,NL,PL,PT,RO,SE,SI,SK").split(',');
    ASSERT_EQ(codes.size(), CountryCount);
    for (int index = 0; index < CountryCount; ++index) {
        EXPECT_EQ(CountryIndex(codes[index]), index) << codes[index].toStdString();
        EXPECT_EQ(CountryCode(index), codes[index]);
    }
    EXPECT_TRUE(CountryCode(-1).isEmpty());
    EXPECT_TRUE(CountryCode(CountryCount).isEmpty());
    for (const char *code : { "pt", "PT ", " PT", "P", "PRT", "", "GR", "US" })
        EXPECT_EQ(CountryIndex(QString(code)), -1) << code;
}

TEST(CheckTaxNumber, acceptsAnyTextForACountryWithoutARoutineButNoEmptyTextForOneWithIt)
{
    for (int index : { -1, CountryCount, INT_MAX, INT_MIN, 65536 + 22 }) {
        EXPECT_TRUE(CheckTaxNumber(u"", index)) << index;
        EXPECT_TRUE(CheckTaxNumber(u"anything at all", index)) << index;
    }
    EXPECT_TRUE(CheckTaxNumber(u"123456780", CountryIndex(u"pt"))) << "lower case is an unknown country";
    for (int index = 0; index < CountryCount; ++index)
        EXPECT_FALSE(CheckTaxNumber(u"", index)) << CountryCode(index).toString().toStdString();
}

TEST(IsNumericFrom, takesTheLenientReadingOfTheRequestedPart)
{
    // The text, the start and length asked for, and whether that part reads as a number.
    const std::tuple<const char *, int, int, bool> rows[] = { { "123456789", 1, 0, true }, { "", 1, 0, false },
        { "   ", 1, 0, false }, { " 12 ", 1, 0, true }, { "12-", 1, 0, true }, { "-12-", 1, 0, false },
        { "1,5", 1, 0, true }, { "1.5.1", 1, 0, false }, { "1e-5", 1, 0, true }, { "1E", 1, 0, false },
        { "1 2", 1, 0, false }, { "U12345678", 2, 0, true }, { "12345678A", 1, 8, true }, { "12345678A", 1, 9, false },
        { "123", 4, 0, false }, { "123", 0, 0, false }, { "123", 2, 99, true }, { "123", 1, -3, true } };
    for (const auto &[text, start, length, numeric] : rows)
        EXPECT_EQ(IsNumericFrom(QString(text), start, length), numeric)
            << '"' << text << "\" from " << start << " length " << length;
    EXPECT_FALSE(IsNumericFrom(QString::fromUtf8("١٢٣"), 1, 0)) << "only ASCII digits";
}

TEST(Helpers, roundUpGoesToTheNextWholeNumber)
{
    EXPECT_EQ(RoundUp(4.0), 4);
    EXPECT_EQ(RoundUp(4.1), 5);
    EXPECT_EQ(RoundUp(-1.5), -1);
    EXPECT_EQ(RoundUp(156 / 10.0), 16);
    EXPECT_EQ(RoundUp(std::nan("")), 0);
    EXPECT_EQ(RoundUp(1e300), std::numeric_limits<qint32>::max());
    EXPECT_EQ(RoundUp(-1e300), std::numeric_limits<qint32>::min());
}

// Their arithmetic is driven through the numbers that use them (French keys, Slovak and
// Cypriot numbers); here only their answers outside it.
TEST(Helpers, refuseWhatTheyCannotAnswer)
{
    EXPECT_EQ(BigMod(5, 0), -1);
    EXPECT_EQ(BigMod(-5, 11), -1);
    EXPECT_EQ(AlphabetLetter(25), u'Z');
    EXPECT_EQ(AlphabetLetter(26), u'?');
    EXPECT_EQ(AlphabetLetter(-1), u'?');
    EXPECT_EQ(CyprusOddValue(10), -1);
    EXPECT_EQ(CyprusOddValue(-1), -1);
    EXPECT_TRUE(IsLetter(u"a"));
    for (const char16_t *text : { u"É", u"AB", u"", u"1", u"@", u"[" })
        EXPECT_FALSE(IsLetter(text));
}

#include "validation/TaxNumbers.h"

#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <limits>

using namespace zelctl::nifValidator;
using namespace zelctl::test;

TEST(CountryTable, mapsTheTwentySevenCodesInAlphabeticalOrderAndBack)
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
}

TEST(CountryTable, acceptsOnlyTheExactCode)
{
    for (const char *code : { "pt", "PT ", " PT", "P", "PRT", "", "GR", "US" })
        EXPECT_EQ(CountryIndex(QString(code)), -1) << code;
}

TEST(CheckTaxNumber, acceptsAnyTextForACountryWithoutARoutineButNoEmptyTextForOneWithIt)
{
    for (int index : { -1, CountryCount, INT_MAX, INT_MIN, 65536 + 22 }) {
        EXPECT_TRUE(CheckTaxNumber(u"", index)) << index;
        EXPECT_TRUE(CheckTaxNumber(u"anything at all", index)) << index;
    }
    EXPECT_TRUE(isValid(u"pt", "123456780")) << "lower case is an unknown country";
    for (int index = 0; index < CountryCount; ++index)
        EXPECT_FALSE(CheckTaxNumber(u"", index)) << CountryCode(index).toString().toStdString();
}

TEST(Portugal, checksNineDigitsByModEleven)
{
    EXPECT_TRUE(isValid(u"PT", "123456789"));
    EXPECT_FALSE(isValid(u"PT", "123456780"));
    EXPECT_TRUE(isValid(u"PT", "999999990")) << "check 11 reads as 0";
    EXPECT_TRUE(isValid(u"PT", "000000000"));
    for (const QString prefix : { "12345678", "50000000", "30000001", "74251990", "99999999", "00000010" }) {
        int check = 11 - mod(weighted(prefix, { 9, 8, 7, 6, 5, 4, 3, 2 }), 11);
        if (check >= 10)
            check = 0;
        EXPECT_EQ(acceptedDigits(u"PT", prefix), digitText(check)) << prefix.toStdString();
    }
}

TEST(Portugal, takesTheTextVerbatim)
{
    EXPECT_FALSE(isValid(u"PT", "12345678"));
    EXPECT_FALSE(isValid(u"PT", "1234567890"));
    EXPECT_FALSE(isValid(u"PT", "PT123456789")) << "no prefix is stripped";
    EXPECT_TRUE(isValid(u"PT", " 23456787")) << "a blank in front is numeric and reads as 0";
    EXPECT_FALSE(isValid(u"PT", "12345678A"));
    // 12345678 needs check 9; a number whose check is 0 passes with a trailing blank.
    EXPECT_FALSE(isValid(u"PT", "12345678 "));
    EXPECT_TRUE(isValid(u"PT", "99999999 "));
}

TEST(IsNumericFrom, takesTheLenientReadingOfTheRequestedPart)
{
    struct Row
    {
        const char *text;
        int start, length;
        bool numeric;
    };
    const Row rows[] = { { "123456789", 1, 0, true }, { "", 1, 0, false }, { "   ", 1, 0, false },
        { " 12 ", 1, 0, true }, { "12-", 1, 0, true }, { "-12-", 1, 0, false }, { "1,5", 1, 0, true },
        { "1.5.1", 1, 0, false }, { "1e-5", 1, 0, true }, { "1E", 1, 0, false }, { "1 2", 1, 0, false },
        { "U12345678", 2, 0, true }, { "12345678A", 1, 8, true }, { "12345678A", 1, 9, false }, { "123", 4, 0, false },
        { "123", 0, 0, false }, { "123", 2, 99, true }, { "123", 1, -3, true } };
    for (const Row &row : rows)
        EXPECT_EQ(IsNumericFrom(QString(row.text), row.start, row.length), row.numeric)
            << '"' << row.text << "\" from " << row.start << " length " << row.length;
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

#include "validation/nifValidator.h"

#include "support/TestSupport.h"

#include <QFile>
#include <QRegularExpression>

#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <limits>
#include <tuple>

using namespace zelctl::nifValidator;

namespace {

// What a country's rules say of a number: with a '?' the digits that may stand in its place,
// with a '*' the capital letters (each "-" when none may), otherwise "valid" or "invalid".
QString verdict(const QString &country, const QString &pattern)
{
    const int index = CountryIndex(country);
    const auto accepted = [&](QChar wildcard, char first, char last) {
        QString accepted;
        for (char c = first; c <= last; ++c) {
            if (CheckTaxNumber(QString(pattern).replace(wildcard, QChar(c)), index))
                accepted += QChar(c);
        }
        return accepted.isEmpty() ? QStringLiteral("-") : accepted;
    };
    if (pattern.contains(u'?'))
        return accepted(u'?', '0', '9');
    if (pattern.contains(u'*'))
        return accepted(u'*', 'A', 'Z');
    return CheckTaxNumber(pattern, index) ? "valid" : "invalid";
}

} // namespace

TEST(CheckTaxNumber, knownAnswersOfEveryCountry)
{
    QFile file(zelctl::test::testDataPath("tax-numbers.txt"));
    ASSERT_TRUE(file.open(QIODevice::ReadOnly | QIODevice::Text));
    const QRegularExpression row(R"(^(\w\w) ("[^"]*"|\S+) (\S+)$)");
    QStringList countries;
    for (const QString &line : QString::fromUtf8(file.readAll()).split(u'\n', Qt::SkipEmptyParts)) {
        if (line.startsWith(u'#'))
            continue;
        const QRegularExpressionMatch match = row.match(line);
        ASSERT_TRUE(match.hasMatch()) << line.toStdString();
        const QString number = match.captured(2).remove(u'"');
        EXPECT_EQ(verdict(match.captured(1), number).toStdString(), match.captured(3).toStdString())
            << line.toStdString();
        countries << match.captured(1);
    }
    countries.removeDuplicates();
    EXPECT_EQ(countries.size(), CountryCount) << "every country has its known answers";
}

// Which routine each code gets is driven by the known answers of every country.
TEST(CountryTable, mapsExactCodesBothWays)
{
    for (int index = 0; index < CountryCount; ++index)
        EXPECT_EQ(CountryIndex(CountryCode(index)), index) << index;
    EXPECT_TRUE(CountryCode(-1).isEmpty());
    EXPECT_TRUE(CountryCode(CountryCount).isEmpty());
    for (const char *code : { "pt", "PT ", " PT", "P", "PRT", "", "GR", "US" })
        EXPECT_EQ(CountryIndex(QString(code)), -1) << code;
}

TEST(CheckTaxNumber, acceptsAnyTextForACountryWithoutARoutineButNoEmptyTextForOneWithIt)
{
    for (int index : { -1, CountryCount, INT_MIN, 65536 + 22 }) {
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
    const std::tuple<const char *, int, int, bool> rows[]
        = { { "123456789", 1, 0, true }, { "", 1, 0, false }, { "   ", 1, 0, false }, { " 12 ", 1, 0, true },
              { "12-", 1, 0, true }, { "-12-", 1, 0, false }, { "1,5", 1, 0, true }, { "1.5.1", 1, 0, false },
              { "1e-5", 1, 0, true }, { "1E", 1, 0, false }, { "1 2", 1, 0, false }, { "U12345678", 2, 0, true },
              { "12345678A", 1, 8, true }, { "12345678A", 1, 9, false }, { "123", 4, 0, false }, { "123", 0, 0, false },
              { "123", 2, 99, true }, { "123", 1, -3, true }, { "١٢٣", 1, 0, false } }; // only ASCII digits
    for (const auto &[text, start, length, numeric] : rows)
        EXPECT_EQ(IsNumericFrom(QString(text), start, length), numeric)
            << '"' << text << "\" from " << start << " length " << length;
}

TEST(Helpers, roundUpAndRefuseWhatTheyCannotAnswer)
{
    EXPECT_EQ(RoundUp(4.1), 5);
    EXPECT_EQ(RoundUp(-1.5), -1);
    EXPECT_EQ(RoundUp(std::nan("")), 0);
    EXPECT_EQ(RoundUp(1e300), std::numeric_limits<qint32>::max());
    EXPECT_EQ(RoundUp(-1e300), std::numeric_limits<qint32>::min());
    // The helpers' arithmetic is driven through the numbers that use them (French keys,
    // Slovak and Cypriot numbers); here only their answers outside it.
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

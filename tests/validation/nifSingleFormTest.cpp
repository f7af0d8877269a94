#include "validation/TaxNumbers.h"

#include <gtest/gtest.h>

using namespace zelctl::test;

namespace {

int crossSum(int n)
{
    return n / 10 + n % 10;
}

// The check digit "up to the next ten" of a weighted sum.
int tenComplement(int sum)
{
    return mod(-sum, 10);
}

} // namespace

TEST(Austria, checksTheDigitAfterU)
{
    EXPECT_TRUE(isValid(u"AT", "U10223006"));
    EXPECT_FALSE(isValid(u"AT", "u10223006"));
    EXPECT_FALSE(isValid(u"AT", "ATU10223006"));
    EXPECT_FALSE(isValid(u"AT", "U1022300"));
    for (const QString prefix : { "1022300", "1234567", "9999999", "0000000" }) {
        int sum = 4;
        for (int k = 0; k < 7; ++k)
            sum += crossSum((k % 2 ? 2 : 1) * digitOf(prefix, k));
        EXPECT_EQ(acceptedDigits(u"AT", "U" + prefix), digitText(tenComplement(sum))) << prefix.toStdString();
    }
}

TEST(Belgium, checksTheMod97PairOfNumbersStartingWithZero)
{
    for (int n : { 2345678, 2910000, 9999999 }) {
        const int check = 97 - n % 97;
        const QString digits = QString::number(n);
        EXPECT_TRUE(isValid(u"BE", "0" + digits + QString::number(check).rightJustified(2, u'0'))) << n;
        EXPECT_FALSE(isValid(u"BE", "0" + digits + QString::number(check % 97 + 1).rightJustified(2, u'0'))) << n;
    }
    EXPECT_TRUE(isValid(u"BE", "0291000097")) << "a multiple of 97 takes the pair 97";
    for (const QString start : { "10", "00", "01" }) {
        const QString eight = start + "345678";
        const QString number = eight + QString::number(97 - eight.mid(1).toInt() % 97).rightJustified(2, u'0');
        EXPECT_FALSE(isValid(u"BE", number)) << number.toStdString();
    }
    EXPECT_FALSE(isValid(u"BE", "02345678"));
}

TEST(Cyprus, checksTheLetterAndTheFirstDigit)
{
    const int oddValues[] = { 1, 0, 5, 7, 9, 13, 15, 17, 19, 21 };
    const auto withLetter = [&](const QString &eight, int shift = 0) {
        int sum = shift;
        for (int k = 0; k < 8; ++k)
            sum += k % 2 ? digitOf(eight, k) : oddValues[digitOf(eight, k)];
        return eight + QChar(u'A' + sum % 26);
    };
    for (const QString eight : { "10259584", "00000000", "99999999", "51234567", "30000001", "41111111" }) {
        const QString number = withLetter(eight);
        EXPECT_TRUE(isValid(u"CY", number)) << number.toStdString();
        EXPECT_FALSE(isValid(u"CY", number.toLower())) << "the letter is case-sensitive";
        EXPECT_FALSE(isValid(u"CY", withLetter(eight, 1)));
    }
    for (const QString eight : { "20000000", "60000000", "71234567", "89999999" })
        EXPECT_FALSE(isValid(u"CY", withLetter(eight))) << eight.toStdString();
    EXPECT_FALSE(isValid(u"CY", "123456789"));
}

TEST(Germany, checksMod1110)
{
    const auto check = [](const QString &eight) {
        int product = 10;
        for (QChar c : eight) {
            const int sum = (product + c.digitValue()) % 10;
            product = (2 * (sum == 0 ? 10 : sum)) % 11;
        }
        return (11 - product) % 10;
    };
    for (const QString prefix : { "11111111", "13645801", "99999999", "00000001" })
        EXPECT_EQ(acceptedDigits(u"DE", prefix), digitText(check(prefix))) << prefix.toStdString();
    EXPECT_EQ(acceptedDigits(u"DE", "00000000"), "");
}

TEST(Denmark, needsAWeightedSumDivisibleBy11)
{
    for (const QString prefix : { "1318181", "8830150", "2000000", "0318181" }) {
        const int last = mod(-weighted(prefix, { 2, 7, 6, 5, 4, 3, 2 }), 11);
        EXPECT_EQ(acceptedDigits(u"DK", prefix), prefix[0] == u'0' ? QString() : digitText(last))
            << prefix.toStdString();
    }
}

TEST(EstoniaAndHungary, checkUpToTheNextTenAndRejectAZeroSum)
{
    for (const QString prefix : { "10020717", "12345678", "99999999" })
        EXPECT_EQ(
            acceptedDigits(u"EE", prefix), digitText(tenComplement(weighted(prefix, { 3, 7, 1, 3, 7, 1, 3, 7 }))));
    EXPECT_EQ(acceptedDigits(u"EE", "00000000"), "");
    for (const QString prefix : { "1289230", "1234567", "0000001" })
        EXPECT_EQ(acceptedDigits(u"HU", prefix), digitText(tenComplement(weighted(prefix, { 9, 7, 3, 1, 9, 7, 3 }))));
    EXPECT_EQ(acceptedDigits(u"HU", "0000000"), "");
}

TEST(Greece, weighsByPowersOfTwo)
{
    const auto check = [](const QString &eight) {
        return mod(weighted(eight, { 256, 128, 64, 32, 16, 8, 4, 2 }), 11) % 10;
    };
    for (const QString prefix : { "09453166", "12345678", "99999999", "00000001" })
        EXPECT_EQ(acceptedDigits(u"EL", prefix), digitText(check(prefix))) << prefix.toStdString();
    EXPECT_FALSE(isValid(u"EL", "000000000"));
    // A blank in front passes the numeric test, but each character is read as a number.
    EXPECT_FALSE(isValid(u"EL", " 2345678" + digitText(check("02345678"))));
}

TEST(Finland, hasNoCheckDigitForRemainderOne)
{
    const auto sum = [](const QString &seven) { return weighted(seven, { 7, 9, 10, 5, 8, 4, 2 }); };
    for (const QString prefix : { "2077748", "1234567", "9999999" }) {
        const int remainder = mod(sum(prefix), 11);
        EXPECT_EQ(acceptedDigits(u"FI", prefix), remainder == 1 ? QString() : digitText(mod(-remainder, 11)));
    }
    EXPECT_EQ(acceptedDigits(u"FI", firstWith(1000000, 7, sum, 1, 11)), "");
    EXPECT_FALSE(isValid(u"FI", "00000000"));
}

TEST(Italy, checksLuhnAndRefusesOffice999)
{
    const auto check = [](const QString &ten) {
        int sum = 0;
        for (int k = 0; k < 10; ++k)
            sum += k % 2 ? crossSum(2 * digitOf(ten, k)) : digitOf(ten, k);
        return tenComplement(sum);
    };
    for (const QString prefix : { "0000000001", "1234567120", "0762015012", "9999999100", "1234567121" })
        EXPECT_EQ(acceptedDigits(u"IT", prefix), digitText(check(prefix))) << prefix.toStdString();
    EXPECT_EQ(acceptedDigits(u"IT", "1234567999"), "");
    EXPECT_FALSE(isValid(u"IT", "00000000000"));
}

TEST(Luxembourg, checksTheMod89Pair)
{
    for (int n : { 123456, 100000, 999999, 89 }) {
        const QString six = QString::number(n).rightJustified(6, u'0');
        const int pair = n % 89;
        EXPECT_EQ(acceptedDigits(u"LU", six + QString::number(pair / 10)), digitText(pair % 10)) << n;
    }
    EXPECT_FALSE(isValid(u"LU", "00000000"));
}

TEST(Malta, checksTheMod37Pair)
{
    const auto sum = [](const QString &six) { return weighted(six, { 3, 4, 6, 7, 8, 9 }); };
    // The pair's tens digit in front, so that the accepted units digit shows the pair.
    const auto beforeUnits = [&](const QString &six) { return six + QString::number((37 - sum(six) % 37) / 10); };
    const auto units = [&](const QString &six) { return digitText((37 - sum(six) % 37) % 10); };
    for (const QString six : { "116795", "234567", "999999", "100001" })
        EXPECT_EQ(acceptedDigits(u"MT", beforeUnits(six)), units(six)) << six.toStdString();
    const QString multiple = firstWith(100001, 6, sum, 0, 37);
    EXPECT_TRUE(isValid(u"MT", multiple + "37"));
    EXPECT_EQ(acceptedDigits(u"MT", beforeUnits("100000")), "");
    EXPECT_EQ(acceptedDigits(u"MT", beforeUnits("012345")), "");
}

TEST(Netherlands, checksTheDigitBeforeB)
{
    const auto sum = [](const QString &eight) { return weighted(eight, { 9, 8, 7, 6, 5, 4, 3, 2 }); };
    for (const QString prefix : { "12345678", "00461910", "99999999", "00000001" }) {
        const int remainder = mod(sum(prefix), 11);
        EXPECT_EQ(acceptedDigits(u"NL", prefix, "B01"), remainder == 10 ? QString() : digitText(remainder));
        EXPECT_EQ(acceptedDigits(u"NL", prefix, "B99"), acceptedDigits(u"NL", prefix, "B01"));
        EXPECT_EQ(acceptedDigits(u"NL", prefix, "B00"), "");
        EXPECT_EQ(acceptedDigits(u"NL", prefix, "b01"), "");
    }
    EXPECT_EQ(acceptedDigits(u"NL", firstWith(1, 8, sum, 10, 11), "B01"), "");
    EXPECT_FALSE(isValid(u"NL", "000000000B01"));
}

TEST(Poland, hasNoCheckDigitForRemainderTen)
{
    const auto sum = [](const QString &nine) { return weighted(nine, { 6, 5, 7, 2, 3, 4, 5, 6, 7 }); };
    for (const QString prefix : { "123456789", "526000018", "000000001" }) {
        const int remainder = mod(sum(prefix), 11);
        EXPECT_EQ(acceptedDigits(u"PL", prefix), remainder == 10 ? QString() : digitText(remainder));
    }
    EXPECT_EQ(acceptedDigits(u"PL", firstWith(1, 9, sum, 10, 11)), "");
}

TEST(Romania, padsTwoToTenDigitsWithZeros)
{
    const auto check = [](const QString &prefix) {
        const QString nine = prefix.rightJustified(9, u'0');
        return mod(weighted(nine, { 7, 5, 3, 2, 1, 7, 5, 3, 2 }) * 10, 11) % 10;
    };
    for (const QString prefix : { "1", "12", "1234", "1859315", "123456789", "999999999" })
        EXPECT_EQ(acceptedDigits(u"RO", prefix), digitText(check(prefix))) << prefix.toStdString();
    EXPECT_TRUE(isValid(u"RO", "19"));
    EXPECT_TRUE(isValid(u"RO", "019"));
    EXPECT_FALSE(isValid(u"RO", "12")) << "0000000012 needs 9";
    EXPECT_FALSE(isValid(u"RO", "0"));
    EXPECT_FALSE(isValid(u"RO", "12345678901"));
    EXPECT_FALSE(isValid(u"RO", " 19")) << "only digits can be padded";
}

TEST(Sweden, checksLuhnAndTheEnding01)
{
    for (const QString prefix : { "556188840", "123456789", "000000001" }) {
        int sum = 0;
        for (int k = 0; k < 9; ++k)
            sum += k % 2 ? digitOf(prefix, k) : crossSum(2 * digitOf(prefix, k));
        EXPECT_EQ(acceptedDigits(u"SE", prefix, "01"), digitText(tenComplement(sum)));
        EXPECT_EQ(acceptedDigits(u"SE", prefix, "02"), "");
        EXPECT_EQ(acceptedDigits(u"SE", prefix, "10"), "");
    }
}

TEST(Slovenia, hasNoCheckDigitForRemainderZero)
{
    const auto sum = [](const QString &seven) { return weighted(seven, { 8, 7, 6, 5, 4, 3, 2 }); };
    const QString prefixes[] = { "1511030", "1234567", firstWith(1, 7, sum, 1, 11) };
    for (const QString &prefix : prefixes) {
        const int remainder = mod(sum(prefix), 11);
        EXPECT_EQ(acceptedDigits(u"SI", prefix), remainder == 0 ? QString() : digitText((11 - remainder) % 10));
    }
    EXPECT_EQ(acceptedDigits(u"SI", firstWith(1, 7, sum, 0, 11)), "");
}

TEST(Slovakia, needsAMultipleOf11AndAllowedThirdDigit)
{
    for (const QString prefix : { "202274496", "100000000", "123456789", "990000000" }) {
        const int last = mod(-prefix.toLongLong() * 10, 11);
        EXPECT_EQ(acceptedDigits(u"SK", prefix), digitText(last)) << prefix.toStdString();
    }
    for (const QString prefix : { "201000000", "205000000", "206000000", "023456789" })
        EXPECT_EQ(acceptedDigits(u"SK", prefix), "") << prefix.toStdString();
}

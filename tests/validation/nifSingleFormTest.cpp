#include "validation/TaxNumbers.h"

#include <gtest/gtest.h>

using namespace zelctl::test;

namespace {

// The accepted check digit is the remainder, unless the remainder is `none`.
QString remainderOr(int remainder, int none)
{
    return remainder == none ? QString() : digitText(remainder);
}

} // namespace

TEST(SingleForm, eachCountryAcceptsOnlyItsOwnCheckDigit)
{
    const auto fi = [](const QString &p) { return weighted(p, { 7, 9, 10, 5, 8, 4, 2 }); };
    const auto nl = [](const QString &p) { return weighted(p, { 9, 8, 7, 6, 5, 4, 3, 2 }); };
    const auto pl = [](const QString &p) { return weighted(p, { 6, 5, 7, 2, 3, 4, 5, 6, 7 }); };
    const auto si = [](const QString &p) { return weighted(p, { 8, 7, 6, 5, 4, 3, 2 }); };
    const auto luhn = [](const QString &p, int doubled) {
        int sum = 0;
        for (int k = 0; k < p.size(); ++k)
            sum += k % 2 == doubled ? crossSum(2 * digitOf(p, k)) : digitOf(p, k);
        return digitText(tenComplement(sum));
    };
    const auto nlRule = [&](const QString &p) { return remainderOr(mod(nl(p), 11), 10); };
    expectCheckDigits({ { "AT", "U", {}, { "1022300", "1234567", "9999999", "0000000" },
                            [](const QString &p) {
                                int sum = 4;
                                for (int k = 0; k < 7; ++k)
                                    sum += crossSum((k % 2 ? 2 : 1) * digitOf(p, k));
                                return digitText(tenComplement(sum));
                            } },
        { "DE", {}, {}, { "11111111", "13645801", "99999999", "00000001" },
            [](const QString &p) {
                int product = 10;
                for (QChar c : p) {
                    const int sum = (product + c.digitValue()) % 10;
                    product = (2 * (sum == 0 ? 10 : sum)) % 11;
                }
                return digitText((11 - product) % 10);
            } },
        { "DK", {}, {}, { "1318181", "8830150", "2000000" },
            [](const QString &p) {
                return digitText(mod(-weighted(p, { 2, 7, 6, 5, 4, 3, 2 }), 11));
            } },
        { "EE", {}, {}, { "10020717", "12345678", "99999999" },
            [](const QString &p) {
                return digitText(tenComplement(weighted(p, { 3, 7, 1, 3, 7, 1, 3, 7 })));
            } },
        { "HU", {}, {}, { "1289230", "1234567", "0000001" },
            [](const QString &p) {
                return digitText(tenComplement(weighted(p, { 9, 7, 3, 1, 9, 7, 3 })));
            } },
        { "EL", {}, {}, { "09453166", "12345678", "99999999", "00000001" },
            [](const QString &p) {
                return digitText(mod(weighted(p, { 256, 128, 64, 32, 16, 8, 4, 2 }), 11) % 10);
            } },
        { "FI", {}, {}, { "2077748", "1234567", "9999999", firstWith(1000000, 7, fi, 1, 11) },
            [&](const QString &p) {
                const int r = mod(fi(p), 11);
                return r == 1 ? QString() : digitText(mod(-r, 11));
            } },
        { "IT", {}, {}, { "0000000001", "1234567120", "0762015012", "9999999100", "1234567121" },
            [&](const QString &p) { return luhn(p, 1); } },
        { "NL", {}, "B01", { "12345678", "00461910", "99999999", firstWith(1, 8, nl, 10, 11) }, nlRule },
        { "NL", {}, "B99", { "12345678", "00461910" }, nlRule },
        { "PL", {}, {}, { "123456789", "526000018", firstWith(1, 9, pl, 10, 11) },
            [&](const QString &p) { return remainderOr(mod(pl(p), 11), 10); } },
        { "RO", {}, {}, { "1", "12", "1234", "1859315", "123456789", "999999999" },
            [](const QString &p) {
                const QString nine = p.rightJustified(9, u'0');
                return digitText(mod(weighted(nine, { 7, 5, 3, 2, 1, 7, 5, 3, 2 }) * 10, 11) % 10);
            } },
        { "SE", {}, "01", { "556188840", "123456789", "000000001" }, [&](const QString &p) { return luhn(p, 0); } },
        { "SI", {}, {}, { "1511030", "1234567", firstWith(1, 7, si, 1, 11), firstWith(1, 7, si, 0, 11) },
            [&](const QString &p) {
                const int r = mod(si(p), 11);
                return r == 0 ? QString() : digitText((11 - r) % 10);
            } },
        { "SK", {}, {}, { "202274496", "100000000", "123456789", "990000000" },
            [](const QString &p) { return digitText(mod(-p.toLongLong() * 10, 11)); } } });
}

TEST(SingleForm, numbersRefusedWhateverTheCheckDigit)
{
    expectRefused({ { "zeros have a zero product", "DE", "00000000", "" }, { "no leading zero", "DK", "0318181", "" },
        { "a zero sum", "EE", "00000000", "" }, { "a zero sum", "HU", "0000000", "" },
        { "all zeros", "EL", "00000000", "" }, { "all zeros", "FI", "0000000", "" },
        { "office 999", "IT", "1234567999", "" }, { "all zeros", "IT", "0000000000", "" },
        { "all zeros", "NL", "00000000", "B01" }, { "branch B00", "NL", "12345678", "B00" },
        { "lower-case b", "NL", "12345678", "b01" }, { "ending other than 01", "SE", "556188840", "02" },
        { "ending other than 01", "SE", "556188840", "10" }, { "third digit 1", "SK", "201000000", "" },
        { "third digit 5", "SK", "205000000", "" }, { "third digit 6", "SK", "206000000", "" },
        { "no leading zero", "SK", "023456789", "" }, { "all zeros", "LU", "0000000", "" } });
}

TEST(SingleForm, formAndLengthRules)
{
    const QString elCheck = digitText(mod(weighted("02345678", { 256, 128, 64, 32, 16, 8, 4, 2 }), 11) % 10);
    expectForms({ { "U then eight digits", "AT", "U10223006", true }, { "lower-case u", "AT", "u10223006", false },
        { "no country prefix", "AT", "ATU10223006", false }, { "too short", "AT", "U1022300", false },
        { "too short", "BE", "02345678", false }, { "no letter", "CY", "123456789", false },
        { "every character read as a digit", "EL", " 2345678" + elCheck, false },
        { "padded with zeros", "RO", "19", true }, { "zeros in front", "RO", "019", true },
        { "0000000012 needs 9", "RO", "12", false }, { "one digit", "RO", "0", false },
        { "eleven digits", "RO", "12345678901", false }, { "only digits are padded", "RO", " 19", false } });
}

TEST(Belgium, checksTheMod97PairOfNumbersStartingWithZero)
{
    for (int n : { 2345678, 2910000, 9999999 }) {
        const int check = 97 - n % 97;
        const QString digits = "0" + QString::number(n);
        EXPECT_TRUE(isValid(u"BE", digits + QString::number(check).rightJustified(2, u'0'))) << n;
        EXPECT_FALSE(isValid(u"BE", digits + QString::number(check % 97 + 1).rightJustified(2, u'0'))) << n;
    }
    EXPECT_TRUE(isValid(u"BE", "0291000097")) << "a multiple of 97 takes the pair 97";
    for (const QString start : { "10", "00", "01" }) {
        const QString eight = start + "345678";
        const QString number = eight + QString::number(97 - eight.mid(1).toInt() % 97).rightJustified(2, u'0');
        EXPECT_FALSE(isValid(u"BE", number)) << number.toStdString();
    }
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
}

TEST(LuxembourgAndMalta, checkAPairOfDigits)
{
    for (int n : { 123456, 100000, 999999, 89 }) {
        const QString six = QString::number(n).rightJustified(6, u'0');
        EXPECT_EQ(acceptedDigits(u"LU", six + QString::number(n % 89 / 10)), digitText(n % 89 % 10)) << n;
    }

    const auto sum = [](const QString &six) { return weighted(six, { 3, 4, 6, 7, 8, 9 }); };
    // The pair's tens digit in front, so that the accepted units digit shows the pair.
    const auto beforeUnits = [&](const QString &six) { return six + QString::number((37 - sum(six) % 37) / 10); };
    for (const QString six : { "116795", "234567", "999999", "100001" })
        EXPECT_EQ(acceptedDigits(u"MT", beforeUnits(six)), digitText((37 - sum(six) % 37) % 10)) << six.toStdString();
    EXPECT_TRUE(isValid(u"MT", firstWith(100001, 6, sum, 0, 37) + "37"));
    EXPECT_EQ(acceptedDigits(u"MT", beforeUnits("100000")), "");
    EXPECT_EQ(acceptedDigits(u"MT", beforeUnits("012345")), "");
}

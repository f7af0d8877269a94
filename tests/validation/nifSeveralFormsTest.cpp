#include "validation/TaxNumbers.h"

#include <gtest/gtest.h>

using namespace zelctl::nifValidator;
using namespace zelctl::test;

namespace {

const QString allDigits = "0123456789";

// Sum mod 11; when that is 10, the sum under the second weights mod 11, with 10 read as 0.
int elevenWithFallback(const QString &digits, std::initializer_list<int> first, std::initializer_list<int> second)
{
    const int remainder = mod(weighted(digits, first), 11);
    return remainder != 10 ? remainder : mod(weighted(digits, second), 11) % 10;
}

} // namespace

TEST(SeveralForms, checkDigitsOfLegalEntities)
{
    const auto bgSum = [](const QString &eight) { return weighted(eight, { 1, 2, 3, 4, 5, 6, 7, 8 }); };
    const auto czSum = [](const QString &seven) { return weighted(seven, { 8, 7, 6, 5, 4, 3, 2 }); };
    // Lithuanian prefixes end in the 1 that the eighth (or eleventh) digit must be.
    const auto ltSum = [](const QString &seven) { return weighted(seven + "1", { 1, 2, 3, 4, 5, 6, 7, 8 }); };
    const auto ltTemporarySum = [](const QString &ten) {
        return weighted(ten + "1", { 1, 2, 3, 4, 5, 6, 7, 8, 9, 1, 2 });
    };
    const auto lvSum = [](const QString &ten) { return weighted(ten, { 9, 1, 4, 8, 3, 10, 2, 5, 7, 6 }); };
    expectCheckDigits(
        { { "BG", {}, {}, { "17501076", "12345678", firstWith(1, 8, bgSum, 10, 11) },
              [](const QString &p) {
                  return digitText(elevenWithFallback(p, { 1, 2, 3, 4, 5, 6, 7, 8 }, { 3, 4, 5, 6, 7, 8, 9, 10 }));
              } },
            { "CZ", {}, {},
                { "2559539", "4619312", "0000000", firstWith(1, 7, czSum, 0, 11), firstWith(1, 7, czSum, 1, 11) },
                [&](const QString &p) {
                    const int distance = mod(-czSum(p), 11);
                    return digitText(distance == 0 ? 1 : distance % 10);
                } },
            { "LT", {}, {}, { "11933141", "23456781", firstWith(1, 7, ltSum, 10, 11) + "1" },
                [](const QString &p) {
                    return digitText(elevenWithFallback(p, { 1, 2, 3, 4, 5, 6, 7, 8 }, { 3, 4, 5, 6, 7, 8, 9, 1 }));
                } },
            { "LT", {}, {}, { "12345678901", "00000000011", firstWith(1, 10, ltTemporarySum, 10, 11) + "1" },
                [](const QString &p) {
                    return digitText(elevenWithFallback(
                        p, { 1, 2, 3, 4, 5, 6, 7, 8, 9, 1, 2 }, { 3, 4, 5, 6, 7, 8, 9, 1, 2, 3, 4 }));
                } },
            { "LV", {}, {}, { "4000351217", "9999999999", "4000000000", firstWith(4000000000, 10, lvSum, 4, 11) },
                [&](const QString &p) {
                    const int c = 3 - mod(lvSum(p), 11);
                    return c == -1 ? QString() : digitText(c < -1 ? c + 11 : c);
                } } });
    expectRefused({ { "every character is read strictly", "BG", " 2345678", {} },
        { "eight digits starting with 9", "CZ", "9000000", {} }, { "the eighth digit must be 1", "LT", "12345670", {} },
        { "the eleventh digit must be 1", "LT", "12345678902", {} } });
}

TEST(SeveralForms, formAndLengthRules)
{
    expectForms({ { "eight digits", "BG", "12345678", false }, { "eleven digits", "BG", "12345678901", false },
        { "seven digits", "CZ", "1234567", false }, { "eleven digits", "CZ", "12345678901", false },
        { "a personal number", "ES", "12345678Z", true }, { "a foreigner's number", "ES", "X1234567L", true },
        { "chars 2-8 may not be zero", "ES", "00000000T", false }, { "ten characters", "FR", "1212345678", false },
        { "twelve characters", "FR", "121234567890", false },
        { "1E... reads as a number but is a digit and a letter", "FR", "1E123456790", false },
        { "no I in keys", "FR", "IA123456789", false }, { "no I in keys", "FR", "AI123456789", false },
        { "no O in keys", "FR", "OA123456789", false }, { "upper-case keys", "FR", "aA123456789", false },
        { "government departments", "GB", "GD000", true }, { "government departments", "GB", "GD499", true },
        { "health authorities", "GB", "HA500", true }, { "health authorities", "GB", "HA999", true },
        { "departments end at 499", "GB", "GD500", false }, { "authorities start at 500", "GB", "HA499", false },
        { "upper-case letters", "GB", "gd123", false }, { "GD or HA only", "GB", "XY123", false },
        { "three digits", "GB", "GD12", false }, { "a letter first", "IE", "A234567W", false },
        { "a letter last", "IE", "12345671", false }, { "ten digits", "LT", "1234567811", false } });
}

TEST(Bulgaria, personsCarryARealBirthDate)
{
    const Verdict rows[] = { { "750316", true }, { "752316", true }, { "754316", true }, { "751316", false },
        { "753316", false }, { "750230", false }, { "750300", false }, { "000229", false }, { "004229", true },
        { "962229", true }, { "002229", false }, { "001231", true } };
    for (const Verdict &row : rows) {
        const QString nine = row.digits + QString("123");
        const QString number = nine + digitText(mod(weighted(nine, { 2, 4, 8, 5, 10, 9, 7, 3, 6 }), 11) % 10);
        EXPECT_EQ(CheckBGPerson(number), row.accepted) << row.digits;
    }
}

TEST(Bulgaria, tenDigitsTryPersonThenForeignerThenOther)
{
    for (const QString nine : { "751316123", "752316926", "004229000", "999999999" }) {
        const bool realDate = nine != "751316123" && nine != "999999999";
        const int person = mod(weighted(nine, { 2, 4, 8, 5, 10, 9, 7, 3, 6 }), 11) % 10;
        const int foreigner = mod(weighted(nine, { 21, 19, 17, 13, 11, 9, 7, 3, 1 }), 10);
        const int other = mod(weighted(nine, { 4, 3, 2, 7, 6, 5, 4, 3, 2 }), 11);
        EXPECT_EQ(acceptedDigits(u"BG", nine), digitSet({ realDate ? person : -1, foreigner, other }))
            << nine.toStdString();
    }
}

TEST(CzechRepublic, specialNumbersStartWith6)
{
    const auto sum = [](const QString &seven) { return weighted(seven, { 8, 7, 6, 5, 4, 3, 2 }); };
    for (int distance = 0; distance <= 10; ++distance) {
        const QString seven = firstWith(1, 7, sum, mod(-distance, 11), 11);
        const int expected = distance <= 1 ? 8 : distance == 10 ? 9 : 9 - distance;
        EXPECT_EQ(acceptedDigits(u"CZ", "6" + seven), digitText(expected)) << distance;
    }
}

TEST(CzechRepublic, personsBornBefore1954HaveNineDigitsAndNoCheckDigit)
{
    const Verdict rows[] = { { "531231", true }, { "540101", false }, { "000229", false }, { "040229", true },
        { "045229", true }, { "531301", false }, { "536301", false }, { "530100", false } };
    for (const Verdict &row : rows)
        EXPECT_EQ(acceptedDigits(u"CZ", row.digits + QString("12")), row.accepted ? allDigits : "") << row.digits;
}

TEST(CzechRepublic, personsBornFrom1954HaveTenDigitsDivisibleBy11)
{
    const Verdict rows[]
        = { { "540101123", true }, { "856231123", true }, { "960229123", true }, { "995231123", false },
              { "970229123", false }, { "530101123", false }, { "851301123", false }, { "991231000", true } };
    for (const Verdict &row : rows) {
        const int last = mod(-QString(row.digits).toLongLong() * 10, 11);
        EXPECT_EQ(acceptedDigits(u"CZ", row.digits), row.accepted ? digitText(last) : "") << row.digits;
    }
}

TEST(Spain, personalNumbersEndInTheLetterOfTheirNumber)
{
    const QString letters = "TRWAGMYFPDXBNJZSQVHLCKE";
    for (int n : { 12345678, 1, 99999999, 23, 45 }) {
        const QString eight = QString::number(n).rightJustified(8, u'0');
        const QChar letter = letters[n % 23];
        EXPECT_TRUE(isValid(u"ES", eight + letter)) << n;
        EXPECT_FALSE(isValid(u"ES", eight + letter.toLower()));
        EXPECT_FALSE(isValid(u"ES", eight + letters[(n + 1) % 23]));
    }
    for (const char *first : { "X", "K", "L", "M" })
        EXPECT_TRUE(isValid(u"ES", first + QString("7654321") + letters[7654321 % 23])) << first;
    for (const char *first : { "Y", "Z", "x" })
        EXPECT_FALSE(isValid(u"ES", first + QString("7654321") + letters[7654321 % 23])) << first;
}

TEST(Spain, entitiesEndInACheckDigitOrLetter)
{
    const auto sum = [](const QString &seven) {
        int total = 0;
        for (int k = 0; k < 7; ++k) {
            const int d = digitOf(seven, k);
            total += k % 2 ? d : (2 * d) / 10 + (2 * d) % 10;
        }
        return total;
    };
    for (const QString seven : { "5881850", "1234567", "0000001", "9999999" }) {
        const int remainder = sum(seven) % 10;
        EXPECT_EQ(acceptedDigits(u"ES", "A" + seven), digitText(mod(-remainder, 10))) << seven.toStdString();
        EXPECT_EQ(acceptedDigits(u"ES", "N" + seven), "") << "a check digit only after A to H";
        const QChar letter = QChar(u'A' + 9 - remainder);
        for (const char *first : { "A", "H", "N", "P", "Q", "S" }) {
            EXPECT_TRUE(isValid(u"ES", first + seven + letter)) << first << seven.toStdString();
            EXPECT_FALSE(isValid(u"ES", first + seven + QChar(u'A' + (10 - remainder) % 10)));
        }
    }
    EXPECT_EQ(acceptedDigits(u"ES", "A0000000"), "");
}

TEST(France, numericKeysAreTheSirenMod97)
{
    for (long long siren : { 123456789LL, 404833048LL, 1LL, 999999999LL }) {
        const int key = mod(12 + 3 * (siren % 97), 97);
        const QString digits = QString::number(siren).rightJustified(9, u'0');
        EXPECT_TRUE(isValid(u"FR", QString::number(key).rightJustified(2, u'0') + digits)) << siren;
        EXPECT_FALSE(isValid(u"FR", QString::number((key + 1) % 100).rightJustified(2, u'0') + digits)) << siren;
    }
}

TEST(France, letterKeysFollowTheirOwnRule)
{
    const QString alphabet = "0123456789ABCDEFGHJKLMNPQRSTUVWXYZ";
    for (const QString siren : { "123456789", "404833048", "000000000" }) {
        int accepted = 0;
        int refusedForZeros = 0;
        for (int k1 = 0; k1 < alphabet.size(); ++k1) {
            for (int k2 = 0; k2 < alphabet.size(); ++k2) {
                const QString number = alphabet[k1] + QString(alphabet[k2]) + siren;
                if (k1 < 10) {
                    if (k2 >= 10) {
                        EXPECT_FALSE(isValid(u"FR", number)) << "a digit and a letter";
                    }
                    continue;
                }
                const int s = 34 * k1 + k2 - 100;
                const bool rule = (siren.toLongLong() + s / 11 + 1) % 11 == s % 11;
                // After a digit the numeric part is that digit and the SIREN.
                const bool zeros = siren == "000000000" && (k2 == 0 || k2 >= 10);
                EXPECT_EQ(isValid(u"FR", number), rule && !zeros) << number.toStdString();
                accepted += rule && !zeros;
                refusedForZeros += rule && zeros;
            }
        }
        EXPECT_GT(accepted, 0);
        EXPECT_EQ(refusedForZeros > 0, siren == "000000000");
    }
}

TEST(UnitedKingdom, ninOrTwelveDigitsCheckedBy97)
{
    const auto sum = [](const QString &seven) { return weighted(seven, { 8, 7, 6, 5, 4, 3, 2 }); };
    const auto pair
        = [&](const QString &seven) { return QString::number(mod(-sum(seven), 97)).rightJustified(2, u'0'); };
    for (const QString seven : { "9876543", "1234567", "0021234", "0001234" }) {
        EXPECT_TRUE(isValid(u"GB", seven + pair(seven))) << seven.toStdString();
        EXPECT_TRUE(isValid(u"GB", seven + pair(seven) + "001"));
        EXPECT_FALSE(isValid(u"GB", seven + pair(seven) + "000"));
        EXPECT_FALSE(isValid(u"GB", seven + pair(seven) + "1"));
    }
    const QString multiple = firstWith(1000000, 7, sum, 0, 97);
    EXPECT_TRUE(isValid(u"GB", multiple + "00"));
    EXPECT_FALSE(isValid(u"GB", multiple + "97")) << "pairs above 96 are refused";
    const QString three = "0031234";
    EXPECT_FALSE(isValid(u"GB", three + pair(three))) << "only 000, 001 and 002 may lead with 0";
    EXPECT_FALSE(isValid(u"GB", "000000000"));
}

TEST(Ireland, currentAndOldForms)
{
    const QString letters = "WABCDEFGHIJKLMNOPQRSTUV";
    const auto letter = [&](const QString &seven) { return letters[weighted(seven, { 8, 7, 6, 5, 4, 3, 2 }) % 23]; };
    for (const QString seven : { "1234567", "6433435", "0000001", "9999999" }) {
        EXPECT_TRUE(isValid(u"IE", seven + letter(seven))) << seven.toStdString();
        EXPECT_FALSE(isValid(u"IE", seven + letter(seven).toLower()));
        EXPECT_FALSE(isValid(u"IE", seven + letters[(letters.indexOf(letter(seven)) + 1) % 23]));
    }
    // The old form: first digit, a "+", "*" or letter, five digits and the letter of 0, the
    // five digits and the first digit.
    for (const char *first : { "7", "8", "9", "6", "0" }) {
        const QString converted = "0" + QString("12345") + first;
        for (const char *second : { "+", "*", "A", "z" })
            EXPECT_EQ(isValid(u"IE", first + QString(second) + "12345" + letter(converted)), first[0] >= '7')
                << first << second;
        EXPECT_FALSE(isValid(u"IE", first + QString("-12345") + letter(converted)));
    }
}

TEST(Latvia, personalCodesCarryARealBirthDate)
{
    const Verdict rows[] = { { "311299", true }, { "300299", false }, { "290215", false }, { "290216", true },
        { "290200", true }, { "010100", true }, { "000100", false }, { "011399", false } };
    for (const Verdict &row : rows)
        EXPECT_EQ(acceptedDigits(u"LV", row.digits + QString("1234")), row.accepted ? allDigits : "") << row.digits;
}

// The member states that accept numbers of more than one form: several lengths, a letter
// prefix or suffix, a birth date inside a personal number, or a second computation when
// the first one yields a remainder of 10.

#include "validation/nifValidator.h"

#include "validation/nifDigits.h"

#include <array>

namespace zelctl::nifValidator {

using namespace detail;

namespace {

bool isNumeric(QStringView text)
{
    return IsNumericFrom(text, 1, 0);
}

// Sum mod 11, and when that is 10 the sum with the second weights mod 11, where 10 reads as 0.
template <std::size_t N>
int remainderWithFallback(QStringView text, const std::array<int, N> &weights, const std::array<int, N> &fallback)
{
    const int remainder = weightedSum(text, weights) % 11;
    if (remainder != 10)
        return remainder;
    const int second = weightedSum(text, fallback) % 11;
    return second == 10 ? 0 : second;
}

// The distance from sum up to the next multiple of 11, 0 when it is one.
int upToEleven(int sum)
{
    return RoundUp(sum / 11.0) * 11 - sum;
}

// Two digits at position as one number.
int pairAt(QStringView text, qsizetype position)
{
    return 10 * digitAt(text, position) + digitAt(text, position + 1);
}

} // namespace

// Bulgaria ---------------------------------------------------------------------------------

bool CheckBG(QStringView text)
{
    if (!isNumeric(text))
        return false;
    if (text.size() == 9)
        return CheckBGLegal(text);
    if (text.size() == 10)
        return CheckBGPerson(text) || CheckBGForeigner(text) || CheckBGOther(text);
    return false;
}

// Every Bulgarian form takes each character as a number of its own, so all must be digits.

bool CheckBGLegal(QStringView text)
{
    if (text.size() != 9 || !allDigits(text))
        return false;
    const int check
        = remainderWithFallback(text, std::array { 1, 2, 3, 4, 5, 6, 7, 8 }, std::array { 3, 4, 5, 6, 7, 8, 9, 10 });
    return digitAt(text, 9) == check;
}

bool CheckBGPerson(QStringView text)
{
    if (text.size() != 10 || !allDigits(text))
        return false;
    const int yy = pairAt(text, 1);
    int month = pairAt(text, 3);
    int year = 1900 + yy;
    if (month >= 21 && month <= 32) {
        year = 1800 + yy;
        month -= 20;
    } else if (month >= 41 && month <= 52) {
        year = 2000 + yy;
        month -= 40;
    } else if (month < 1 || month > 12) {
        return false;
    }
    if (!isRealDate(year, month, pairAt(text, 5)))
        return false;
    const int remainder = weightedSum(text, std::array { 2, 4, 8, 5, 10, 9, 7, 3, 6 }) % 11;
    return digitAt(text, 10) == (remainder == 10 ? 0 : remainder);
}

bool CheckBGForeigner(QStringView text)
{
    if (text.size() != 10 || !allDigits(text))
        return false;
    return digitAt(text, 10) == weightedSum(text, std::array { 21, 19, 17, 13, 11, 9, 7, 3, 1 }) % 10;
}

bool CheckBGOther(QStringView text)
{
    if (text.size() != 10 || !allDigits(text))
        return false;
    return digitAt(text, 10) == weightedSum(text, std::array { 4, 3, 2, 7, 6, 5, 4, 3, 2 }) % 11;
}

// Czech Republic ---------------------------------------------------------------------------

bool CheckCZ(QStringView text)
{
    if (!isNumeric(text))
        return false;
    switch (text.size()) {
    case 8:
        return text[0] != u'9' && CheckCZLegal(text);
    case 9:
        return text[0] == u'6' ? CheckCZSpecial(text) : CheckCZPerson9(text);
    case 10:
        return CheckCZPerson10(text);
    default:
        return false;
    }
}

bool CheckCZLegal(QStringView text)
{
    if (text.size() != 8)
        return false;
    int check = upToEleven(weightedSum(text, std::array { 8, 7, 6, 5, 4, 3, 2 }));
    if (check == 0)
        check = 1;
    else if (check == 10)
        check = 0;
    return digitAt(text, 8) == check;
}

bool CheckCZSpecial(QStringView text)
{
    if (text.size() != 9)
        return false;
    const int distance = upToEleven(weightedSum(text, std::array { 8, 7, 6, 5, 4, 3, 2 }, 2));
    int expected = 9;
    if (distance <= 1)
        expected = 8;
    else if (distance <= 9)
        expected = 9 - distance;
    return digitAt(text, 9) == expected;
}

bool CheckCZPerson9(QStringView text)
{
    if (text.size() != 9)
        return false;
    const int yy = pairAt(text, 1);
    if (yy >= 54)
        return false;
    int month = pairAt(text, 3);
    if (month > 50)
        month -= 50;
    // The short form was issued before 1954, so its two-digit year is of the 1900s.
    return isRealDate(1900 + yy, month, pairAt(text, 5));
}

bool CheckCZPerson10(QStringView text)
{
    if (text.size() != 10)
        return false;
    const int yy = pairAt(text, 1);
    if (yy < 54)
        return false;
    int month = pairAt(text, 3);
    const int day = pairAt(text, 5);
    // The sum of the two-digit groups is the whole number mod 11, since 100 = 1 mod 11.
    const int remainder = (yy + month + day + pairAt(text, 7) + pairAt(text, 9)) % 11;
    if (month > 50)
        month -= 50;
    return isRealDate(1900 + yy, month, day) && remainder == 0;
}

// Spain ------------------------------------------------------------------------------------

bool CheckES(QStringView text)
{
    if (text.size() != 9)
        return false;
    const QChar first = text[0];
    const QStringView middle = chars(text, 2, 8);
    const auto middleNumber = strictNumber(middle);
    if (!isNumeric(middle) || !middleNumber || *middleNumber == 0)
        return false;
    const bool lastIsDigit = isNumeric(chars(text, 9, 9));
    const QStringView allowedFirst
        = lastIsDigit ? QStringView(u"ABCDEFGH") : QStringView(u"ABCDEFGHKLMNPQSX0123456789");
    if (indexIn(allowedFirst, first) < 0)
        return false;
    if (lastIsDigit)
        return CheckESCifDigit(chars(text, 2, 9));
    if (isAsciiDigit(first)) {
        const auto number = strictNumber(chars(text, 1, 8));
        return number && CheckESDniLetter(*number, text);
    }
    if (indexIn(u"KLMX", first) >= 0)
        return CheckESDniLetter(*middleNumber, text);
    return CheckESCifLetter(chars(text, 2, 9));
}

namespace {

// The Luhn-style sum of the seven digits of an entity number.
int spanishEntitySum(QStringView t)
{
    int sum = 0;
    for (int i : { 1, 3, 5, 7 })
        sum += luhnDouble(digitAt(t, i));
    for (int i : { 2, 4, 6 })
        sum += digitAt(t, i);
    return sum;
}

} // namespace

bool CheckESCifDigit(QStringView t)
{
    if (t.size() != 8)
        return false;
    const int remainder = spanishEntitySum(t) % 10;
    return digitAt(t, 8) == (remainder > 0 ? 10 - remainder : 0);
}

bool CheckESDniLetter(qint64 n, QStringView text)
{
    if (n < 0 || text.isEmpty())
        return false;
    constexpr QStringView letters = u"TRWAGMYFPDXBNJZSQVHLCKE";
    return text.back() == letters[n % 23];
}

bool CheckESCifLetter(QStringView t)
{
    if (t.size() != 8)
        return false;
    const int remainder = spanishEntitySum(t) % 10;
    return indexIn(u"ABCDEFGHIJ", t[7]) + 1 == 10 - remainder;
}

// France -----------------------------------------------------------------------------------

bool CheckFR(QStringView text)
{
    if (text.size() != 11)
        return false;
    constexpr QStringView keyAlphabet = u"0123456789ABCDEFGHJKLMNPQRSTUVWXYZ";
    QStringView numericPart = text;
    if (!isNumeric(text)) {
        if (IsNumericFrom(text, 1, 1))
            return false;
        const int numericFrom = IsNumericFrom(text, 2, 1) ? 2 : 3;
        if (!IsNumericFrom(text, numericFrom, 0))
            return false;
        numericPart = text.mid(numericFrom - 1);
    }
    if (allZeros(numericPart))
        return false;
    if (indexIn(keyAlphabet, text[0]) < 0 || indexIn(keyAlphabet, text[1]) < 0)
        return false;
    const auto siren = strictNumber(chars(text, 3, 11));
    if (!siren)
        return false;
    if (IsNumericFrom(text, 1, 2)) {
        const auto key = strictNumber(chars(text, 1, 2));
        return key && BigMod(*siren * 100 + 12, 97) == *key;
    }
    // The letter form needs a letter first; a digit and a letter is no key at all.
    if (isAsciiDigit(text[0]))
        return false;
    const int s = 34 * int(indexIn(keyAlphabet, text[0])) + int(indexIn(keyAlphabet, text[1])) - 100;
    const int p = s / 11 + 1;
    return (*siren + p) % 11 == s % 11;
}

// United Kingdom ---------------------------------------------------------------------------

bool CheckGB(QStringView text)
{
    if (text.size() == 5) {
        const QStringView kind = chars(text, 1, 2);
        const qint64 number = leadingNumber(chars(text, 3, 5));
        if (same(kind, u"GD"))
            return number <= 499;
        if (same(kind, u"HA"))
            return number >= 500 && number <= 999;
        return false;
    }
    if (!isNumeric(text) || (text.size() != 9 && text.size() != 12))
        return false;
    if (text[0] == u'0') {
        const QStringView group = chars(text, 1, 3);
        if (!same(group, u"000") && !same(group, u"001") && !same(group, u"002"))
            return false;
    }
    if (allZeros(text))
        return false;
    if (text.size() == 12 && leadingNumber(chars(text, 10, 12)) < 1)
        return false;
    const qint64 check = leadingNumber(chars(text, 8, 9));
    if (check > 96)
        return false;
    return (weightedSum(text, std::array { 8, 7, 6, 5, 4, 3, 2 }) + check) % 97 == 0;
}

// Ireland ----------------------------------------------------------------------------------

bool CheckIE(QStringView text)
{
    if (text.size() != 8)
        return false;
    if (!IsNumericFrom(text, 1, 1) || !isNumeric(chars(text, 3, 7)) || !IsLetter(chars(text, 8, 8)))
        return false;
    if (IsNumericFrom(text, 2, 1))
        return CheckIEChar(text);
    const QChar second = text[1];
    if (second != u'+' && second != u'*' && !IsLetter(chars(text, 2, 2)))
        return false;
    // The old form: its first digit, 7 to 9, moves behind the five digits and a 0 leads.
    if (text[0] < u'7')
        return false;
    std::array<char16_t, 8> current { u'0' };
    for (qsizetype i = 2; i < 7; ++i)
        current[i - 1] = text[i].unicode();
    current[6] = text[0].unicode();
    current[7] = text[7].unicode();
    return CheckIEChar(QStringView(current.data(), qsizetype(current.size())));
}

bool CheckIEChar(QStringView t)
{
    if (t.size() != 8 || allZeros(t))
        return false;
    const int sum = weightedSum(t, std::array { 8, 7, 6, 5, 4, 3, 2 });
    return indexIn(u"WABCDEFGHIJKLMNOPQRSTUV", t[7]) == sum % 23;
}

// Lithuania --------------------------------------------------------------------------------

bool CheckLT(QStringView text)
{
    if (!isNumeric(text))
        return false;
    if (text.size() == 9)
        return CheckLTLegal(text);
    if (text.size() == 12)
        return CheckLTTemporary(text);
    return false;
}

bool CheckLTLegal(QStringView text)
{
    if (text.size() != 9 || digitAt(text, 8) != 1)
        return false;
    const int check
        = remainderWithFallback(text, std::array { 1, 2, 3, 4, 5, 6, 7, 8 }, std::array { 3, 4, 5, 6, 7, 8, 9, 1 });
    return digitAt(text, 9) == check;
}

bool CheckLTTemporary(QStringView text)
{
    if (text.size() != 12 || digitAt(text, 11) != 1)
        return false;
    const int check = remainderWithFallback(
        text, std::array { 1, 2, 3, 4, 5, 6, 7, 8, 9, 1, 2 }, std::array { 3, 4, 5, 6, 7, 8, 9, 1, 2, 3, 4 });
    return digitAt(text, 12) == check;
}

// Latvia -----------------------------------------------------------------------------------

bool CheckLV(QStringView text)
{
    if (text.size() != 11 || !isNumeric(text))
        return false;
    return digitAt(text, 1) > 3 ? CheckLVLegal(text) : CheckLVPerson(text);
}

bool CheckLVLegal(QStringView text)
{
    if (text.size() != 11)
        return false;
    int check = 3 - weightedSum(text, std::array { 9, 1, 4, 8, 3, 10, 2, 5, 7, 6 }) % 11;
    if (check == -1)
        return false;
    if (check < -1)
        check += 11;
    return digitAt(text, 11) == check;
}

bool CheckLVPerson(QStringView text)
{
    if (text.size() != 11)
        return false;
    const int yy = pairAt(text, 5);
    // Personal codes carry no check digit that the rules test; the birth date must exist.
    return isRealDate(yy < 16 ? 2000 + yy : 1900 + yy, pairAt(text, 3), pairAt(text, 1));
}

} // namespace zelctl::nifValidator

// The member states whose tax numbers have a single form: a fixed length, a weighted sum
// and one check digit or pair of digits.

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

// The distance from sum up to the next multiple of 10, 0 when it is one.
int upToTen(int sum)
{
    return RoundUp(sum / 10.0) * 10 - sum;
}

} // namespace

bool CheckAT(QStringView text)
{
    if (text.size() != 9 || text[0] != u'U' || !IsNumericFrom(text, 2, 0))
        return false;
    int sum = 4;
    for (int i : { 3, 5, 7 })
        sum += luhnDouble(digitAt(text, i));
    for (int i : { 2, 4, 6, 8 })
        sum += digitAt(text, i);
    const int check = sum % 10 == 0 ? 0 : 10 - sum % 10;
    return digitAt(text, 9) == check;
}

bool CheckBE(QStringView text)
{
    if (text.size() != 10 || !isNumeric(text))
        return false;
    if (text[0] != u'0' || digitAt(text, 2) < 2)
        return false;
    const auto number = strictNumber(chars(text, 2, 8));
    const auto check = strictNumber(chars(text, 9, 10));
    return number && check && 97 - *number % 97 == *check;
}

bool CheckCY(QStringView text)
{
    if (text.size() != 9 || !IsNumericFrom(text, 1, 8) || !IsLetter(chars(text, 9, 9)))
        return false;
    const int first = digitAt(text, 1);
    if (first == 2 || (first >= 6 && first <= 8))
        return false;
    int sum = 0;
    for (int i : { 1, 3, 5, 7 })
        sum += CyprusOddValue(digitAt(text, i)) + digitAt(text, i + 1);
    return AlphabetLetter(sum % 26) == text[8].unicode();
}

bool CheckDE(QStringView text)
{
    if (text.size() != 9 || !isNumeric(text) || allZeros(chars(text, 1, 8)))
        return false;
    int product = 10;
    for (int i = 1; i <= 8; ++i) {
        int sum = (product + digitAt(text, i)) % 10;
        if (sum == 0)
            sum = 10;
        product = (2 * sum) % 11;
    }
    const int check = 11 - product == 10 ? 0 : 11 - product;
    return digitAt(text, 9) == check;
}

bool CheckDK(QStringView text)
{
    if (text.size() != 8 || !isNumeric(text) || digitAt(text, 1) == 0)
        return false;
    return weightedSum(text, std::array { 2, 7, 6, 5, 4, 3, 2, 1 }) % 11 == 0;
}

bool CheckEE(QStringView text)
{
    if (text.size() != 9 || !isNumeric(text))
        return false;
    const int sum = weightedSum(text, std::array { 3, 7, 1, 3, 7, 1, 3, 7 });
    return sum != 0 && digitAt(text, 9) == upToTen(sum);
}

bool CheckEL(QStringView text)
{
    if (text.size() != 9 || !isNumeric(text) || allZeros(text))
        return false;
    // Each of the first eight characters is taken as a number of its own, so each must be a digit.
    if (!allDigits(chars(text, 1, 8)))
        return false;
    const int sum = weightedSum(text, std::array { 256, 128, 64, 32, 16, 8, 4, 2 });
    const int check = sum % 11 == 10 ? 0 : sum % 11;
    return digitAt(text, 9) == check;
}

bool CheckFI(QStringView text)
{
    if (text.size() != 8 || !isNumeric(text) || allZeros(text))
        return false;
    const int remainder = weightedSum(text, std::array { 7, 9, 10, 5, 8, 4, 2 }) % 11;
    if (remainder == 1)
        return false;
    const int check = remainder == 0 ? 0 : 11 - remainder;
    return digitAt(text, 8) == check;
}

bool CheckHU(QStringView text)
{
    if (text.size() != 8 || !isNumeric(text))
        return false;
    const int sum = weightedSum(text, std::array { 9, 7, 3, 1, 9, 7, 3 });
    return sum != 0 && digitAt(text, 8) == upToTen(sum);
}

bool CheckIT(QStringView text)
{
    if (text.size() != 11 || !isNumeric(text) || allZeros(text))
        return false;
    // Office 999 is reserved; every other office code, even one not yet issued, passes.
    if (leadingNumber(chars(text, 8, 10)) == 999)
        return false;
    int sum = 0;
    for (int i = 1; i <= 9; i += 2)
        sum += digitAt(text, i) + luhnDouble(digitAt(text, i + 1));
    const int check = sum % 10 == 0 ? 0 : 10 - sum % 10;
    const auto last = strictNumber(chars(text, 11, 11));
    return last && *last == check;
}

bool CheckLU(QStringView text)
{
    if (text.size() != 8 || !isNumeric(text) || allZeros(text))
        return false;
    const auto number = strictNumber(chars(text, 1, 6));
    return number && *number % 89 == leadingNumber(chars(text, 7, 8));
}

bool CheckMT(QStringView text)
{
    if (text.size() != 8 || !isNumeric(text) || text[0] == u'0' || same(chars(text, 1, 6), u"100000"))
        return false;
    const int check = 37 - weightedSum(text, std::array { 3, 4, 6, 7, 8, 9 }) % 37;
    return 10 * digitAt(text, 7) + digitAt(text, 8) == check;
}

bool CheckNL(QStringView text)
{
    if (text.size() != 12 || text[9] != u'B')
        return false;
    if (!IsNumericFrom(text, 11, 0) || leadingNumber(chars(text, 11, 12)) < 1)
        return false;
    if (!IsNumericFrom(text, 1, 9) || allZeros(chars(text, 1, 9)))
        return false;
    const int remainder = weightedSum(text, std::array { 9, 8, 7, 6, 5, 4, 3, 2 }) % 11;
    return remainder != 10 && digitAt(text, 9) == remainder;
}

bool CheckPL(QStringView text)
{
    if (text.size() != 10 || !isNumeric(text))
        return false;
    const int remainder = weightedSum(text, std::array { 6, 5, 7, 2, 3, 4, 5, 6, 7 }) % 11;
    return remainder != 10 && digitAt(text, 10) == remainder;
}

bool CheckRO(QStringView text)
{
    if (text.size() < 2 || text.size() > 10 || !isNumeric(text))
        return false;
    // Shorter numbers are checked as 10 digits with leading zeros; that padding only
    // exists for a text made of digits.
    if (!allDigits(text))
        return false;
    std::array<char16_t, 10> padded;
    padded.fill(u'0');
    const qsizetype offset = padded.size() - text.size();
    for (qsizetype i = 0; i < text.size(); ++i)
        padded[offset + i] = text[i].unicode();
    const QStringView p(padded.data(), qsizetype(padded.size()));
    const int sum = weightedSum(p, std::array { 7, 5, 3, 2, 1, 7, 5, 3, 2 });
    const int check = sum * 10 % 11 == 10 ? 0 : sum * 10 % 11;
    return digitAt(p, 10) == check;
}

bool CheckSE(QStringView text)
{
    if (text.size() != 12 || !isNumeric(text) || !same(chars(text, 11, 12), u"01"))
        return false;
    int sum = 0;
    for (int i = 1; i <= 9; i += 2)
        sum += luhnDouble(digitAt(text, i));
    for (int i = 2; i <= 8; i += 2)
        sum += digitAt(text, i);
    const int check = sum % 10 == 0 ? 0 : 10 - sum % 10;
    return digitAt(text, 10) == check;
}

bool CheckSI(QStringView text)
{
    if (text.size() != 8 || !isNumeric(text))
        return false;
    int check = 11 - weightedSum(text, std::array { 8, 7, 6, 5, 4, 3, 2 }) % 11;
    if (check == 11)
        return false;
    if (check == 10)
        check = 0;
    return digitAt(text, 8) == check;
}

bool CheckSK(QStringView text)
{
    if (text.size() != 10 || !isNumeric(text) || digitAt(text, 1) == 0)
        return false;
    if (indexIn(u"156", text[2]) >= 0)
        return false;
    const auto number = strictNumber(text);
    return number && BigMod(*number, 11) == 0;
}

} // namespace zelctl::nifValidator

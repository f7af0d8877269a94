#include "validation/nifValidator.h"

#include "validation/nifDigits.h"

#include <array>
#include <cmath>
#include <limits>

namespace zelctl::nifValidator {

using namespace detail;

namespace {

struct Country
{
    QStringView code;
    bool (*check)(QStringView text);
};

// In index order, which is alphabetical by code; the NIF control lists the EU countries in
// the same order.
constexpr std::array<Country, CountryCount> countries = { {
    { u"AT", CheckAT },
    { u"BE", CheckBE },
    { u"BG", CheckBG },
    { u"CY", CheckCY },
    { u"CZ", CheckCZ },
    { u"DE", CheckDE },
    { u"DK", CheckDK },
    { u"EE", CheckEE },
    { u"EL", CheckEL },
    { u"ES", CheckES },
    { u"FI", CheckFI },
    { u"FR", CheckFR },
    { u"GB", CheckGB },
    { u"HU", CheckHU },
    { u"IE", CheckIE },
    { u"IT", CheckIT },
    { u"LT", CheckLT },
    { u"LU", CheckLU },
    { u"LV", CheckLV },
    { u"MT", CheckMT },
    { u"NL", CheckNL },
    { u"PL", CheckPL },
    { u"PT", CheckPT },
    { u"RO", CheckRO },
    { u"SE", CheckSE },
    { u"SI", CheckSI },
    { u"SK", CheckSK },
} };

constexpr bool isBlank(QChar c)
{
    return c == u' ' || c == u'\t';
}

constexpr bool isSign(QChar c)
{
    return c == u'+' || c == u'-';
}

// The lenient reading of a typed number: [blanks] [sign [blanks]] mantissa [exponent]
// [blanks] [sign [blanks]], with at most one sign, a mantissa of digits around at most one
// decimal separator, and an exponent of "E" or "e", an optional sign and digits.
bool isLenientNumber(QStringView text)
{
    // Nearly every number typed is plain digits.
    if (allDigits(text))
        return true;
    const qsizetype end = text.size();
    qsizetype i = 0;
    const auto skipBlanks = [&] {
        while (i < end && isBlank(text[i]))
            ++i;
    };
    const auto skipDigits = [&] {
        const qsizetype from = i;
        while (i < end && isAsciiDigit(text[i]))
            ++i;
        return i - from;
    };

    skipBlanks();
    const bool leadingSign = i < end && isSign(text[i]);
    if (leadingSign) {
        ++i;
        skipBlanks();
    }
    qsizetype mantissaDigits = skipDigits();
    if (i < end && (text[i] == u'.' || text[i] == u',')) {
        ++i;
        mantissaDigits += skipDigits();
    }
    if (mantissaDigits == 0)
        return false;
    if (i < end && (text[i] == u'E' || text[i] == u'e')) {
        ++i;
        if (i < end && isSign(text[i]))
            ++i;
        if (skipDigits() == 0)
            return false;
    }
    skipBlanks();
    if (!leadingSign && i < end && isSign(text[i])) {
        ++i;
        skipBlanks();
    }
    return i == end;
}

} // namespace

int CountryIndex(QStringView code)
{
    for (int index = 0; index < CountryCount; ++index) {
        if (same(countries[index].code, code))
            return index;
    }
    return -1;
}

QStringView CountryCode(int countryIndex)
{
    if (countryIndex < 0 || countryIndex >= CountryCount)
        return {};
    return countries[countryIndex].code;
}

bool CheckTaxNumber(QStringView text, int countryIndex)
{
    if (countryIndex < 0 || countryIndex >= CountryCount)
        return true;
    return countries[countryIndex].check(text);
}

bool IsNumericFrom(QStringView text, int start, int length)
{
    if (start < 1 || text.size() < start)
        return false;
    const QStringView part = length > 0 ? text.mid(start - 1, length) : text.mid(start - 1);
    return isLenientNumber(part);
}

qint32 RoundUp(double x)
{
    if (std::isnan(x))
        return 0;
    const double up = std::ceil(x);
    if (up <= double(std::numeric_limits<qint32>::min()))
        return std::numeric_limits<qint32>::min();
    if (up >= double(std::numeric_limits<qint32>::max()))
        return std::numeric_limits<qint32>::max();
    return qint32(up);
}

qint32 BigMod(qint64 a, qint32 b)
{
    if (a < 0 || b <= 0)
        return -1;
    return qint32(a % b);
}

bool IsLetter(QStringView ch)
{
    if (ch.size() != 1)
        return false;
    const char16_t upper = ch[0].toUpper().unicode();
    return upper >= u'A' && upper <= u'Z';
}

char16_t AlphabetLetter(int i)
{
    return i >= 0 && i <= 25 ? char16_t(u'A' + i) : u'?';
}

int CyprusOddValue(int d)
{
    static constexpr std::array<int, 10> values = { 1, 0, 5, 7, 9, 13, 15, 17, 19, 21 };
    return d >= 0 && d <= 9 ? values[d] : -1;
}

bool CheckPT(QStringView text)
{
    if (text.size() != 9 || !IsNumericFrom(text, 1, 0))
        return false;
    const int sum = weightedSum(text, std::array { 9, 8, 7, 6, 5, 4, 3, 2 });
    int check = 11 - sum % 11;
    if (check >= 10)
        check = 0;
    return digitAt(text, 9) == check;
}

} // namespace zelctl::nifValidator

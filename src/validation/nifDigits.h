#pragma once

#include <QDate>
#include <QStringView>

#include <array>
#include <cstddef>
#include <optional>

// Readers of the typed text that the country routines share. Positions are 1-based, the
// way the national rules number them; a position outside the text reads as nothing, so a
// routine can never read past the end.
namespace zelctl::nifValidator::detail {

constexpr bool isAsciiDigit(QChar c)
{
    return c.unicode() >= u'0' && c.unicode() <= u'9';
}

// 0..9 for a digit at position, 0 for any other character or a position outside the text.
inline int digitAt(QStringView text, qsizetype position)
{
    if (position < 1 || position > text.size())
        return 0;
    const QChar c = text[position - 1];
    return isAsciiDigit(c) ? c.unicode() - u'0' : 0;
}

// Characters first..last, 1-based and inclusive.
inline QStringView chars(QStringView text, qsizetype first, qsizetype last)
{
    return text.mid(first - 1, last - first + 1);
}

inline bool allDigits(QStringView run)
{
    for (QChar c : run) {
        if (!isAsciiDigit(c))
            return false;
    }
    return !run.isEmpty();
}

// The run as one whole number, when it is 1 to 18 ASCII digits and nothing else.
inline std::optional<qint64> strictNumber(QStringView run)
{
    if (!allDigits(run) || run.size() > 18)
        return std::nullopt;
    qint64 value = 0;
    for (QChar c : run)
        value = value * 10 + (c.unicode() - u'0');
    return value;
}

// The number the leading digits of the run spell (at most 18 are read); 0 when it does not
// start with a digit.
inline qint64 leadingNumber(QStringView run)
{
    qint64 value = 0;
    for (qsizetype i = 0; i < run.size() && i < 18 && isAsciiDigit(run[i]); ++i)
        value = value * 10 + (run[i].unicode() - u'0');
    return value;
}

// The 0-based place of c in a short table, or -1. A plain loop: the tables are a few
// characters long, too short for the library's vectorised search to pay off.
inline qsizetype indexIn(QStringView table, QChar c)
{
    for (qsizetype i = 0; i < table.size(); ++i) {
        if (table[i] == c)
            return i;
    }
    return -1;
}

// Exact, case-sensitive comparison of two short texts.
inline bool same(QStringView a, QStringView b)
{
    if (a.size() != b.size())
        return false;
    for (qsizetype i = 0; i < a.size(); ++i) {
        if (a[i] != b[i])
            return false;
    }
    return true;
}

// Whether the text is "0" repeated as often as it is long.
inline bool allZeros(QStringView text)
{
    for (QChar c : text) {
        if (c != u'0')
            return false;
    }
    return true;
}

// Sum of weights[k] times the digit value at position firstPosition + k.
template <std::size_t N>
int weightedSum(QStringView text, const std::array<int, N> &weights, qsizetype firstPosition = 1)
{
    int sum = 0;
    for (std::size_t k = 0; k < N; ++k)
        sum += weights[k] * digitAt(text, firstPosition + qsizetype(k));
    return sum;
}

// A digit doubled as the Luhn family of checks does it: 2d, less 9 when that has two digits.
constexpr int luhnDouble(int digit)
{
    const int doubled = 2 * digit;
    return doubled >= 10 ? doubled - 9 : doubled;
}

// Whether the calendar date exists (proleptic Gregorian, leap years included).
inline bool isRealDate(int year, int month, int day)
{
    return QDate::isValid(year, month, day);
}

} // namespace zelctl::nifValidator::detail

#include "NibCheckDigits.h"

#include <array>
#include <cstdint>

namespace zelctl {

namespace {

constexpr std::array<int16_t, 19> weights = { 73, 17, 89, 38, 62, 45, 53, 15, 50, 5, 49, 34, 81, 76, 27, 90, 9, 30, 3 };

// The largest weighted sum fits a 32-bit sum with room to spare.
static_assert(9 * 90 * 19 < INT32_MAX);

} // namespace

QString CalculateNibCheckDigits(QStringView nib)
{
    if (nib.size() < qsizetype(weights.size()))
        return {};
    int32_t sum = 0;
    for (size_t p = 0; p < weights.size(); ++p) {
        const char16_t c = nib[qsizetype(p)].unicode();
        const int value = c >= u'0' && c <= u'9' ? c - u'0' : 0;
        sum += weights[p] * value;
    }
    const int digits = 98 - sum % 97;
    return QString::number(digits).rightJustified(2, QLatin1Char('0'));
}

} // namespace zelctl

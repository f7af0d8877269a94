#include "PngFilters.h"

#include <cstdlib>
#include <cstring>

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

namespace zelctl::png {

namespace {

enum FilterType : uint8_t { None = 0, Sub = 1, Up = 2, Average = 3, Paeth = 4 };

inline uint8_t paethPredictor(int a, int b, int c)
{
    const int pa = std::abs(b - c);
    const int pb = std::abs(a - c);
    const int pc = std::abs(a + b - 2 * c);
    if (pa <= pb && pa <= pc)
        return uint8_t(a);
    return uint8_t(pb <= pc ? b : c);
}

void unfilterSub(uint8_t *row, qsizetype length, int distance)
{
    if (distance == 1 && length > 0) {
        uint8_t a = row[0];
        for (qsizetype i = 1; i < length; ++i)
            row[i] = a = uint8_t(row[i] + a);
        return;
    }
    for (qsizetype i = distance; i < length; ++i)
        row[i] = uint8_t(row[i] + row[i - distance]);
}

void unfilterUp(uint8_t *row, const uint8_t *previous, qsizetype length)
{
    qsizetype i = 0;
#if defined(__SSE2__)
    for (; i + 16 <= length; i += 16) {
        const __m128i x = _mm_loadu_si128(reinterpret_cast<const __m128i *>(row + i));
        const __m128i b = _mm_loadu_si128(reinterpret_cast<const __m128i *>(previous + i));
        _mm_storeu_si128(reinterpret_cast<__m128i *>(row + i), _mm_add_epi8(x, b));
    }
#endif
    for (; i < length; ++i)
        row[i] = uint8_t(row[i] + previous[i]);
}

void unfilterAverage(uint8_t *row, const uint8_t *previous, qsizetype length, int distance)
{
    if (!previous) {
        for (qsizetype i = distance; i < length; ++i)
            row[i] = uint8_t(row[i] + (row[i - distance] >> 1));
        return;
    }
    if (distance == 1 && length > 0) {
        uint8_t a = uint8_t(row[0] + (previous[0] >> 1));
        row[0] = a;
        for (qsizetype i = 1; i < length; ++i)
            row[i] = a = uint8_t(row[i] + ((a + previous[i]) >> 1));
        return;
    }
    const qsizetype head = std::min<qsizetype>(distance, length);
    for (qsizetype i = 0; i < head; ++i)
        row[i] = uint8_t(row[i] + (previous[i] >> 1));
    for (qsizetype i = distance; i < length; ++i)
        row[i] = uint8_t(row[i] + ((row[i - distance] + previous[i]) >> 1));
}

#if defined(__SSE2__)
// Pixels of 3, 4, 6 or 8 bytes are restored one whole pixel at a time in 16-bit lanes: each
// pixel depends on the one before it, but its bytes do not depend on each other.
// Loads go through integer registers: assembling odd sizes in memory would stall on every pixel.
template <int Distance> __m128i loadBytes(const uint8_t *p)
{
    if constexpr (Distance == 3) {
        return _mm_cvtsi32_si128(int(p[0] | p[1] << 8 | p[2] << 16));
    } else if constexpr (Distance == 4) {
        uint32_t value;
        std::memcpy(&value, p, 4);
        return _mm_cvtsi32_si128(int(value));
    } else if constexpr (Distance == 6) {
        uint32_t low;
        uint16_t high;
        std::memcpy(&low, p, 4);
        std::memcpy(&high, p + 4, 2);
        return _mm_cvtsi64_si128(int64_t(low | uint64_t(high) << 32));
    } else {
        return _mm_loadl_epi64(reinterpret_cast<const __m128i *>(p));
    }
}

template <int Distance> void storeBytes(uint8_t *p, __m128i bytes)
{
    if constexpr (Distance <= 4) {
        const uint32_t value = uint32_t(_mm_cvtsi128_si32(bytes));
        std::memcpy(p, &value, Distance);
    } else {
        const uint64_t value = uint64_t(_mm_cvtsi128_si64(bytes));
        std::memcpy(p, &value, Distance);
    }
}

template <int Distance> __m128i loadPixel(const uint8_t *p)
{
    return _mm_unpacklo_epi8(loadBytes<Distance>(p), _mm_setzero_si128());
}

template <int Distance> void storePixel(uint8_t *p, __m128i wide)
{
    storeBytes<Distance>(p, _mm_packus_epi16(wide, wide));
}

inline __m128i absolute16(__m128i x)
{
    return _mm_max_epi16(x, _mm_sub_epi16(_mm_setzero_si128(), x));
}

inline __m128i select(__m128i mask, __m128i yes, __m128i no)
{
    return _mm_or_si128(_mm_and_si128(mask, yes), _mm_andnot_si128(mask, no));
}

// Sums wrap at 256 as the filters require: the low byte of each 16-bit lane is kept.
inline __m128i wrap(__m128i x)
{
    return _mm_and_si128(x, _mm_set1_epi16(0xFF));
}

template <int Distance> void unfilterSubPixels(uint8_t *row, qsizetype length)
{
    __m128i a = loadPixel<Distance>(row);
    for (qsizetype i = Distance; i < length; i += Distance) {
        a = wrap(_mm_add_epi16(loadPixel<Distance>(row + i), a));
        storePixel<Distance>(row + i, a);
    }
}

// With n = ~a carried from pixel to pixel, floor((a + b) / 2) is ~avg(n, ~b) (avg rounds
// up) and the next n is avg(n, ~b) - x: two instructions from one pixel to the next.
template <int Distance> void unfilterAveragePixels(uint8_t *row, const uint8_t *previous, qsizetype length)
{
    const __m128i ones = _mm_set1_epi8(-1);
    __m128i notA = ones;
    for (qsizetype i = 0; i < length; i += Distance) {
        const __m128i notB = _mm_xor_si128(loadBytes<Distance>(previous + i), ones);
        notA = _mm_sub_epi8(_mm_avg_epu8(notA, notB), loadBytes<Distance>(row + i));
        storeBytes<Distance>(row + i, _mm_xor_si128(notA, ones));
    }
}

template <int Distance> void unfilterPaethPixels(uint8_t *row, const uint8_t *previous, qsizetype length)
{
    __m128i a = _mm_setzero_si128();
    __m128i c = _mm_setzero_si128();
    for (qsizetype i = 0; i < length; i += Distance) {
        const __m128i b = loadPixel<Distance>(previous + i);
        const __m128i towardsB = _mm_sub_epi16(b, c);
        const __m128i towardsA = _mm_sub_epi16(a, c);
        const __m128i pa = absolute16(towardsB);
        const __m128i pb = absolute16(towardsA);
        const __m128i pc = absolute16(_mm_add_epi16(towardsB, towardsA));
        const __m128i smallest = _mm_min_epi16(_mm_min_epi16(pa, pb), pc);
        __m128i predictor = select(_mm_cmpeq_epi16(smallest, pb), b, c);
        predictor = select(_mm_cmpeq_epi16(smallest, pa), a, predictor);
        a = wrap(_mm_add_epi16(loadPixel<Distance>(row + i), predictor));
        storePixel<Distance>(row + i, a);
        c = b;
    }
}

// True when the row was restored here.
bool unfilterPixels(uint8_t filterType, uint8_t *row, const uint8_t *previous, qsizetype length, int distance)
{
    if (length % distance != 0)
        return false;
#define ZELCTL_PNG_DISPATCH(D)                                                                                         \
    case D:                                                                                                            \
        if (filterType == Sub)                                                                                         \
            unfilterSubPixels<D>(row, length);                                                                         \
        else if (filterType == Average)                                                                                \
            unfilterAveragePixels<D>(row, previous, length);                                                           \
        else                                                                                                           \
            unfilterPaethPixels<D>(row, previous, length);                                                             \
        return true;
    switch (distance) {
        ZELCTL_PNG_DISPATCH(3)
        ZELCTL_PNG_DISPATCH(4)
        ZELCTL_PNG_DISPATCH(6)
        ZELCTL_PNG_DISPATCH(8)
    default:
        return false;
    }
#undef ZELCTL_PNG_DISPATCH
}
#endif

// With one byte a pixel, the left and upper-left neighbours travel in registers: reading
// them back from the row just written would wait on every byte.
void unfilterPaethBytes(uint8_t *row, const uint8_t *previous, qsizetype length)
{
    if (length < 1)
        return;
    uint8_t a = uint8_t(row[0] + previous[0]);
    row[0] = a;
    uint8_t c = previous[0];
    for (qsizetype i = 1; i < length; ++i) {
        const uint8_t b = previous[i];
        a = uint8_t(row[i] + paethPredictor(a, b, c));
        row[i] = a;
        c = b;
    }
}

void unfilterPaeth(uint8_t *row, const uint8_t *previous, qsizetype length, int distance)
{
    if (!previous) {
        unfilterSub(row, length, distance); // with nothing above, the predictor is the left byte
        return;
    }
    if (distance == 1)
        return unfilterPaethBytes(row, previous, length);
    const qsizetype head = std::min<qsizetype>(distance, length);
    for (qsizetype i = 0; i < head; ++i)
        row[i] = uint8_t(row[i] + previous[i]);
    for (qsizetype i = distance; i < length; ++i)
        row[i] = uint8_t(row[i] + paethPredictor(row[i - distance], previous[i], previous[i - distance]));
}

} // namespace

bool unfilterRow(uint8_t filterType, uint8_t *row, const uint8_t *previous, qsizetype length, int distance)
{
#if defined(__SSE2__)
    const bool wholePixels = filterType == Sub || (previous && (filterType == Average || filterType == Paeth));
    if (wholePixels && unfilterPixels(filterType, row, previous, length, distance))
        return true;
#endif
    switch (filterType) {
    case None:
        return true;
    case Sub:
        unfilterSub(row, length, distance);
        return true;
    case Up:
        if (previous)
            unfilterUp(row, previous, length);
        return true;
    case Average:
        unfilterAverage(row, previous, length, distance);
        return true;
    case Paeth:
        unfilterPaeth(row, previous, length, distance);
        return true;
    default:
        return false;
    }
}

} // namespace zelctl::png

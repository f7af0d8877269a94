#include "PngFilters.h"

#include <cstdlib>

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
    for (qsizetype i = distance; i < length; ++i)
        row[i] = uint8_t(row[i] + row[i - distance]);
}

void unfilterUp(uint8_t *row, const uint8_t *previous, qsizetype length)
{
    for (qsizetype i = 0; i < length; ++i)
        row[i] = uint8_t(row[i] + previous[i]);
}

void unfilterAverage(uint8_t *row, const uint8_t *previous, qsizetype length, int distance)
{
    if (!previous) {
        for (qsizetype i = distance; i < length; ++i)
            row[i] = uint8_t(row[i] + (row[i - distance] >> 1));
        return;
    }
    const qsizetype head = std::min<qsizetype>(distance, length);
    for (qsizetype i = 0; i < head; ++i)
        row[i] = uint8_t(row[i] + (previous[i] >> 1));
    for (qsizetype i = distance; i < length; ++i)
        row[i] = uint8_t(row[i] + ((row[i - distance] + previous[i]) >> 1));
}

// Each pixel depends on the one before it, so the work runs pixel by pixel with the
// distance known at compile time for the common layouts.
template <int Distance> void unfilterPaethFixed(uint8_t *row, const uint8_t *previous, qsizetype length)
{
    const qsizetype head = std::min<qsizetype>(Distance, length);
    for (qsizetype i = 0; i < head; ++i)
        row[i] = uint8_t(row[i] + previous[i]);
    for (qsizetype i = Distance; i + Distance <= length; i += Distance) {
        for (int k = 0; k < Distance; ++k)
            row[i + k] = uint8_t(row[i + k] + paethPredictor(row[i + k - Distance], previous[i + k], previous[i + k - Distance]));
    }
}

void unfilterPaeth(uint8_t *row, const uint8_t *previous, qsizetype length, int distance)
{
    if (!previous) {
        unfilterSub(row, length, distance); // with nothing above, the predictor is the left byte
        return;
    }
    if (length % distance == 0) {
        switch (distance) {
        case 1:
            return unfilterPaethFixed<1>(row, previous, length);
        case 3:
            return unfilterPaethFixed<3>(row, previous, length);
        case 4:
            return unfilterPaethFixed<4>(row, previous, length);
        default:
            break;
        }
    }
    const qsizetype head = std::min<qsizetype>(distance, length);
    for (qsizetype i = 0; i < head; ++i)
        row[i] = uint8_t(row[i] + previous[i]);
    for (qsizetype i = distance; i < length; ++i)
        row[i] = uint8_t(row[i] + paethPredictor(row[i - distance], previous[i], previous[i - distance]));
}

} // namespace

bool unfilterRow(uint8_t filterType, uint8_t *row, const uint8_t *previous, qsizetype length, int distance)
{
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

#pragma once

#include "zelctl_export.h"

#include <QtGlobal>

#include <array>
#include <cstring>

// A view of bitmap memory for the pixel routines. Pixel values are what a pixel holds: the
// index for 1, 4 and 8 bits, 0x00RRGGBB for 24 bits, 0xAARRGGBB for 32 bits (the bytes
// B, G, R, A in memory). Colours (ARGB) are 0xAARRGGBB.
namespace zelctl::gdi::detail {

using ColorTable = std::array<quint32, 256>; // 0x00RRGGBB per entry

struct Surface
{
    uchar *bits = nullptr;
    int width = 0;
    int height = 0;
    qsizetype stride = 0;
    int bpp = 0;
    bool topDown = true;
    const ColorTable *table = nullptr; // for bpp <= 8

    // Row y counted from the top.
    uchar *row(int y) const { return bits + (topDown ? y : height - 1 - y) * stride; }
    bool indexed() const { return bpp <= 8; }
    int tableSize() const { return indexed() ? 1 << bpp : 0; }
};

inline qsizetype strideFor(int width, int bpp)
{
    return ((qsizetype(width) * bpp + 31) & ~qsizetype(31)) / 8;
}

inline quint32 readPixel(const uchar *row, int x, int bpp)
{
    switch (bpp) {
    case 1:
        return (row[x >> 3] >> (7 - (x & 7))) & 1u;
    case 4:
        return (row[x >> 1] >> ((x & 1) ? 0 : 4)) & 0xFu;
    case 8:
        return row[x];
    case 24: {
        const uchar *p = row + 3 * qsizetype(x);
        return quint32(p[0]) | quint32(p[1]) << 8 | quint32(p[2]) << 16;
    }
    default: {
        quint32 value;
        std::memcpy(&value, row + 4 * qsizetype(x), 4);
        return value;
    }
    }
}

inline void writePixel(uchar *row, int x, int bpp, quint32 value)
{
    switch (bpp) {
    case 1: {
        const uchar bit = uchar(0x80u >> (x & 7));
        row[x >> 3] = (value & 1u) ? (row[x >> 3] | bit) : (row[x >> 3] & ~bit);
        break;
    }
    case 4: {
        uchar &byte = row[x >> 1];
        byte = (x & 1) ? uchar((byte & 0xF0) | (value & 0xF)) : uchar((byte & 0x0F) | ((value & 0xF) << 4));
        break;
    }
    case 8:
        row[x] = uchar(value);
        break;
    case 24: {
        uchar *p = row + 3 * qsizetype(x);
        p[0] = uchar(value);
        p[1] = uchar(value >> 8);
        p[2] = uchar(value >> 16);
        break;
    }
    default:
        std::memcpy(row + 4 * qsizetype(x), &value, 4);
        break;
    }
}

// 0x00BBGGRR <-> 0x00RRGGBB.
constexpr quint32 swapRedBlue(quint32 c)
{
    return ((c & 0xFFu) << 16) | (c & 0xFF00u) | ((c >> 16) & 0xFFu);
}

// Index of the table entry nearest to an RGB colour (first of equals), by squared distance.
int nearestIndex(const Surface &surface, quint32 rgb);

// The colour (ARGB) a pixel value stands for; alpha 255 unless the surface has 32 bits.
quint32 colorOfValue(const Surface &surface, quint32 value);
// The pixel value that shows an ARGB colour best; alpha kept for 32 bits.
quint32 valueOfColor(const Surface &surface, quint32 argb);

// Converts colours to pixel values of a table-based surface, remembering recent answers,
// because the nearest search costs a scan of the table.
class NearestCache
{
public:
    explicit NearestCache(const Surface &surface)
        : m_surface(surface)
    {
        m_keys.fill(0xFFFFFFFFu);
    }
    quint32 operator()(quint32 argb)
    {
        const quint32 rgb = argb & 0xFFFFFFu;
        const quint32 slot = (rgb * 2654435761u) >> 24;
        if (m_keys[slot] != rgb) {
            m_keys[slot] = rgb;
            m_values[slot] = quint8(nearestIndex(m_surface, rgb));
        }
        return m_values[slot];
    }

private:
    const Surface &m_surface;
    std::array<quint32, 256> m_keys;
    std::array<quint8, 256> m_values {};
};

} // namespace zelctl::gdi::detail

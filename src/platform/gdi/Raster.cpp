#include "Raster.h"

#include <algorithm>
#include <cstring>
#include <functional>
#include <optional>
#include <system_error>
#include <thread>
#include <vector>

namespace zelctl::gdi::detail {

int nearestIndex(const Surface &surface, quint32 rgb)
{
    const int r = int(rgb >> 16) & 0xFF, g = int(rgb >> 8) & 0xFF, b = int(rgb) & 0xFF;
    int best = 0;
    int bestDistance = 1 << 30;
    for (int i = 0; i < surface.tableSize(); ++i) {
        const quint32 entry = (*surface.table)[size_t(i)];
        const int dr = int(entry >> 16 & 0xFF) - r, dg = int(entry >> 8 & 0xFF) - g, db = int(entry & 0xFF) - b;
        const int distance = dr * dr + dg * dg + db * db;
        if (distance < bestDistance) {
            bestDistance = distance;
            best = i;
            if (distance == 0)
                break;
        }
    }
    return best;
}

quint32 colorOfValue(const Surface &surface, quint32 value)
{
    switch (surface.bpp) {
    case 32:
        return value;
    case 24:
        return value | 0xFF000000u;
    default:
        return ((*surface.table)[value & 0xFFu] & 0xFFFFFFu) | 0xFF000000u;
    }
}

quint32 valueOfColor(const Surface &surface, quint32 argb)
{
    switch (surface.bpp) {
    case 32:
        return argb;
    case 24:
        return argb & 0xFFFFFFu;
    default:
        return quint32(nearestIndex(surface, argb & 0xFFFFFFu));
    }
}

namespace {

// The compiler's vector types: SSE2 or AVX2 on x86-64, NEON on ARM.
using U8x8 = quint8 __attribute__((vector_size(8)));
using U8x32 = quint8 __attribute__((vector_size(32)));
using U16x8 = quint16 __attribute__((vector_size(16)));
using U16x16 = quint16 __attribute__((vector_size(32)));
using U32x8 = quint32 __attribute__((vector_size(32)));
using I32x8 = qint32 __attribute__((vector_size(32)));
using F32x8 = float __attribute__((vector_size(32)));

// ---- Geometry --------------------------------------------------------------------------

// One axis of a blit with positive extents; flip when the picture is mirrored on it.
struct Axis
{
    qint64 dst = 0;
    qint64 dstExtent = 0;
    qint64 src = 0;
    qint64 srcExtent = 0;
    bool flip = false;
};

Axis makeAxis(int dst, int dstExtent, int src, int srcExtent)
{
    Axis axis { dst, dstExtent, src, srcExtent, (dstExtent < 0) != (srcExtent < 0) };
    if (axis.dstExtent < 0) {
        axis.dst += axis.dstExtent + 1;
        axis.dstExtent = -axis.dstExtent;
    }
    if (axis.srcExtent < 0) {
        axis.src += axis.srcExtent + 1;
        axis.srcExtent = -axis.srcExtent;
    }
    return axis;
}

// The target coordinates that are drawn (inside the target and sampling inside the
// source) and, for each, the source coordinate of its centre.
struct AxisMap
{
    int first = 0;
    std::vector<int> src;

    // Whether the source coordinates run on one by one (no scaling, no mirroring).
    bool isSpan() const
    {
        for (size_t i = 1; i < src.size(); ++i)
            if (src[i] != src[i - 1] + 1)
                return false;
        return true;
    }
};

AxisMap mapAxis(const Axis &axis, int dstLimit, int srcLimit)
{
    AxisMap map;
    const qint64 begin = std::max<qint64>(0, -axis.dst);
    const qint64 end = std::min<qint64>(axis.dstExtent, dstLimit - axis.dst);
    if (begin >= end)
        return map;
    // The centre of target pixel i samples source pixel k = ((2i + 1) · srcExtent) div
    // (2 · dstExtent), stepped here without a division per pixel.
    const qint64 denominator = 2 * axis.dstExtent;
    const qint64 step = 2 * axis.srcExtent;
    const qint64 start = (2 * begin + 1) * axis.srcExtent;
    qint64 k = start / denominator, remainder = start % denominator;
    const qint64 stepWhole = step / denominator, stepRemainder = step % denominator;
    for (qint64 i = begin; i < end; ++i) {
        const qint64 s = axis.flip ? axis.src + axis.srcExtent - 1 - k : axis.src + k;
        k += stepWhole;
        remainder += stepRemainder;
        if (remainder >= denominator) {
            remainder -= denominator;
            ++k;
        }
        if (s < 0 || s >= srcLimit) {
            if (!map.src.empty())
                break; // the samples move one way, so nothing further is inside
            continue;
        }
        if (map.src.empty())
            map.first = int(axis.dst + i);
        map.src.push_back(int(s));
    }
    return map;
}

// Area weights of one axis: for each drawn target coordinate, the source pixels its
// footprint covers and how much of it each covers, scaled to a sum of 1 << bits. Columns
// use 8 bits, so that a weighted channel fits 16 bits; rows use 14.
constexpr int ColumnWeightBits = 8;
constexpr int RowWeightBits = 14;

struct Taps
{
    std::vector<int> first;
    std::vector<int> count;
    std::vector<int> offset;
    std::vector<quint32> weights;
    int minSrc = 0;
    int maxSrc = 0;
    int maxCount = 0;
};

Taps areaTaps(const Axis &axis, const AxisMap &map, int srcLimit, int bits)
{
    Taps taps;
    taps.minSrc = srcLimit;
    taps.maxSrc = -1;
    std::vector<qint64> raw;
    for (size_t k = 0; k < map.src.size(); ++k) {
        const qint64 i = map.first + qint64(k) - axis.dst;
        const qint64 li = axis.flip ? axis.dstExtent - 1 - i : i;
        const qint64 lo = li * axis.srcExtent, hi = (li + 1) * axis.srcExtent;
        qint64 j0 = lo / axis.dstExtent, j1 = (hi - 1) / axis.dstExtent;
        j0 = std::max(j0, -axis.src);
        j1 = std::min(j1, srcLimit - 1 - axis.src);
        raw.clear();
        qint64 total = 0;
        for (qint64 j = j0; j <= j1; ++j) {
            const qint64 w = std::min((j + 1) * axis.dstExtent, hi) - std::max(j * axis.dstExtent, lo);
            raw.push_back(w);
            total += w;
        }
        taps.first.push_back(int(axis.src + j0));
        taps.count.push_back(int(raw.size()));
        taps.offset.push_back(int(taps.weights.size()));
        quint32 sum = 0;
        size_t largest = 0;
        for (size_t t = 0; t < raw.size(); ++t) {
            const quint32 w = quint32((raw[t] * (1 << bits) + total / 2) / total);
            taps.weights.push_back(w);
            sum += w;
            if (raw[t] > raw[largest])
                largest = t;
        }
        taps.weights[size_t(taps.offset.back()) + largest] += (1u << bits) - sum;
        taps.minSrc = std::min(taps.minSrc, int(axis.src + j0));
        taps.maxSrc = std::max(taps.maxSrc, int(axis.src + j1));
        taps.maxCount = std::max(taps.maxCount, int(raw.size()));
    }
    return taps;
}

// ---- Reading ---------------------------------------------------------------------------

void gatherValues(const Surface &src, const uchar *row, const int *xs, int n, quint32 *out)
{
    switch (src.bpp) {
    case 32: {
        const quint32 *p = reinterpret_cast<const quint32 *>(row);
        for (int i = 0; i < n; ++i)
            out[i] = p[xs[i]];
        break;
    }
    case 24:
        for (int i = 0; i < n; ++i) {
            const uchar *p = row + 3 * qsizetype(xs[i]);
            out[i] = quint32(p[0]) | quint32(p[1]) << 8 | quint32(p[2]) << 16;
        }
        break;
    case 8:
        for (int i = 0; i < n; ++i)
            out[i] = row[xs[i]];
        break;
    default:
        for (int i = 0; i < n; ++i)
            out[i] = readPixel(row, xs[i], src.bpp);
        break;
    }
}

// Colours (ARGB) of source pixels; alpha 255 unless the source has 32 bits.
void gatherColors(const Surface &src, const uchar *row, const int *xs, int n, quint32 *out)
{
    gatherValues(src, row, xs, n, out);
    if (src.bpp == 32)
        return;
    if (src.bpp == 24) {
        for (int i = 0; i < n; ++i)
            out[i] |= 0xFF000000u;
        return;
    }
    const ColorTable &table = *src.table;
    for (int i = 0; i < n; ++i)
        out[i] = (table[out[i]] & 0xFFFFFFu) | 0xFF000000u;
}

// ---- Converting source values to target values ------------------------------------------

class Translator
{
public:
    Translator(const Surface &dst, const Surface &src)
        : m_nearest(dst)
    {
        if (src.indexed()) {
            const bool sameTable = dst.bpp == src.bpp
                && std::equal(src.table->begin(), src.table->begin() + src.tableSize(), dst.table->begin(),
                    [](quint32 a, quint32 b) { return ((a ^ b) & 0xFFFFFFu) == 0; });
            if (sameTable) {
                m_kind = Kind::Identity;
                return;
            }
            m_kind = Kind::Lookup;
            for (int i = 0; i < src.tableSize(); ++i)
                m_lookup[size_t(i)] = valueOfColor(dst, ((*src.table)[size_t(i)] & 0xFFFFFFu) | 0xFF000000u);
            return;
        }
        if (dst.indexed())
            m_kind = Kind::Nearest;
        else if (dst.bpp == 32 && src.bpp == 24)
            m_kind = Kind::AddAlpha;
        else if (dst.bpp == 24 && src.bpp == 32)
            m_kind = Kind::DropAlpha;
        else
            m_kind = Kind::Identity;
    }

    bool identity() const { return m_kind == Kind::Identity; }
    const std::array<quint32, 256> &lookup() const { return m_lookup; }
    bool isLookup() const { return m_kind == Kind::Lookup; }

    void apply(quint32 *values, int n)
    {
        switch (m_kind) {
        case Kind::Identity:
            break;
        case Kind::Lookup:
            for (int i = 0; i < n; ++i)
                values[i] = m_lookup[values[i]];
            break;
        case Kind::AddAlpha:
            for (int i = 0; i < n; ++i)
                values[i] |= 0xFF000000u;
            break;
        case Kind::DropAlpha:
            for (int i = 0; i < n; ++i)
                values[i] &= 0xFFFFFFu;
            break;
        case Kind::Nearest:
            for (int i = 0; i < n; ++i)
                values[i] = m_nearest(values[i]);
            break;
        }
    }

private:
    enum class Kind { Identity, Lookup, AddAlpha, DropAlpha, Nearest };
    Kind m_kind = Kind::Identity;
    std::array<quint32, 256> m_lookup {};
    NearestCache m_nearest;
};

// ---- Writing ---------------------------------------------------------------------------

// Copies or combines bytes: AND and OR act on bytes whatever the pixel format.
void combineBytes(uchar *dst, const uchar *src, size_t n, Rop rop)
{
    if (rop == Rop::Copy) {
        std::memmove(dst, src, n);
        return;
    }
    size_t i = 0;
    for (; i + 32 <= n; i += 32) {
        U8x32 a, b;
        std::memcpy(&a, dst + i, sizeof a);
        std::memcpy(&b, src + i, sizeof b);
        a = rop == Rop::And ? (a & b) : (a | b);
        std::memcpy(dst + i, &a, sizeof a);
    }
    for (; i < n; ++i)
        dst[i] = rop == Rop::And ? (dst[i] & src[i]) : (dst[i] | src[i]);
}

quint32 combineValue(quint32 dst, quint32 src, Rop rop)
{
    switch (rop) {
    case Rop::Copy:
        return src;
    case Rop::And:
        return dst & src;
    case Rop::Or:
        return dst | src;
    }
    return src;
}

void storeValues(const Surface &dst, uchar *row, int x0, int n, const quint32 *values, Rop rop)
{
    switch (dst.bpp) {
    case 32:
        combineBytes(row + 4 * qsizetype(x0), reinterpret_cast<const uchar *>(values), size_t(n) * 4, rop);
        break;
    case 24: {
        uchar *p = row + 3 * qsizetype(x0);
        for (int i = 0; i < n; ++i, p += 3) {
            const quint32 v = combineValue(quint32(p[0]) | quint32(p[1]) << 8 | quint32(p[2]) << 16, values[i], rop);
            p[0] = uchar(v);
            p[1] = uchar(v >> 8);
            p[2] = uchar(v >> 16);
        }
        break;
    }
    case 8:
        for (int i = 0; i < n; ++i)
            row[x0 + i] = uchar(combineValue(row[x0 + i], values[i], rop));
        break;
    default:
        for (int i = 0; i < n; ++i)
            writePixel(row, x0 + i, dst.bpp, combineValue(readPixel(row, x0 + i, dst.bpp), values[i], rop));
        break;
    }
}

// ---- Overlapping source and target -------------------------------------------------------

// A copy of the part of a surface a blit reads, so that a blit within one bitmap (such as
// mirroring in place) reads the pixels as they were before it started.
struct Snapshot
{
    std::vector<quint32> storage;
    Surface surface;
    int offsetX = 0;
    int offsetY = 0;
};

void takeSnapshot(Snapshot &shot, const Surface &src, int x0, int x1, int y0, int y1)
{
    const qsizetype byteBegin = qsizetype(x0) * src.bpp / 8;
    const qsizetype byteEnd = (qsizetype(x1) * src.bpp + 7) / 8;
    shot.offsetX = int(byteBegin * 8 / src.bpp);
    shot.offsetY = y0;
    shot.surface = src;
    shot.surface.width = x1 - shot.offsetX;
    shot.surface.height = y1 - y0;
    shot.surface.topDown = true;
    shot.surface.stride = (byteEnd - byteBegin + 3) & ~qsizetype(3);
    shot.storage.assign(size_t(shot.surface.stride / 4 * shot.surface.height), 0);
    shot.surface.bits = reinterpret_cast<uchar *>(shot.storage.data());
    for (int y = y0; y < y1; ++y)
        std::memcpy(shot.surface.row(y - y0), src.row(y) + byteBegin, size_t(byteEnd - byteBegin));
}

bool sameMemory(const Surface &a, const Surface &b)
{
    return a.bits == b.bits;
}

// Replaces the source by a snapshot when it shares memory with the target.
const Surface &detachSource(const Surface &dst, const Surface &src, Axis &x, Axis &y, Snapshot &shot)
{
    if (!sameMemory(dst, src))
        return src;
    const int x0 = int(std::clamp<qint64>(x.src, 0, src.width));
    const int x1 = int(std::clamp<qint64>(x.src + x.srcExtent, 0, src.width));
    const int y0 = int(std::clamp<qint64>(y.src, 0, src.height));
    const int y1 = int(std::clamp<qint64>(y.src + y.srcExtent, 0, src.height));
    if (x0 >= x1 || y0 >= y1)
        return src;
    takeSnapshot(shot, src, x0, x1, y0, y1);
    x.src -= shot.offsetX;
    y.src -= shot.offsetY;
    return shot.surface;
}

// ---- Bands ------------------------------------------------------------------------------

// Large jobs are split into bands of target rows worked on by several threads, as QPainter
// does; small ones stay on the calling thread, where starting threads would cost more than
// they save.
void forEachBand(size_t rows, qint64 pixels, const std::function<void(size_t, size_t)> &work)
{
    constexpr qint64 ThreadedPixels = 1 << 18;
    const size_t cores = std::thread::hardware_concurrency();
    const size_t bands = pixels < ThreadedPixels || cores < 2 ? 1 : std::min({ cores, size_t(4), rows });
    std::vector<std::thread> helpers;
    for (size_t band = 1; band < bands; ++band) {
        const size_t begin = rows * band / bands, end = rows * (band + 1) / bands;
        try {
            helpers.emplace_back(work, begin, end);
        } catch (const std::system_error &) {
            work(begin, end); // no thread to be had: do it here
        }
    }
    work(0, rows / bands);
    for (std::thread &helper : helpers)
        helper.join();
}

// ---- Nearest-pixel blits ---------------------------------------------------------------

bool sameFormat(const Surface &dst, const Surface &src, const Translator &translate)
{
    return dst.bpp == src.bpp && dst.bpp >= 8 && translate.identity();
}

void nearestBlit(const Surface &dst, const Surface &src, const AxisMap &xs, const AxisMap &ys, Rop rop)
{
    const int n = int(xs.src.size());
    const bool span = xs.isSpan();
    const int bytesPerPixel = dst.bpp / 8;
    forEachBand(ys.src.size(), qint64(n) * qint64(ys.src.size()), [&](size_t begin, size_t end) {
        Translator translate(dst, src);
        std::vector<quint32> values(static_cast<size_t>(n));
        for (size_t k = begin; k < end; ++k) {
            uchar *to = dst.row(ys.first + int(k));
            const uchar *from = src.row(ys.src[k]);
            // Enlarging repeats source rows: a copied row is the same as the row above it.
            if (k > begin && ys.src[k] == ys.src[k - 1] && rop == Rop::Copy && bytesPerPixel > 0) {
                const qsizetype offset = qsizetype(xs.first) * bytesPerPixel;
                std::memcpy(to + offset, dst.row(ys.first + int(k) - 1) + offset, size_t(n) * size_t(bytesPerPixel));
                continue;
            }
            if (!span && dst.bpp == 32 && src.bpp == 32 && rop == Rop::Copy) {
                gatherValues(src, from, xs.src.data(), n, reinterpret_cast<quint32 *>(to) + xs.first);
                continue;
            }
            if (span && sameFormat(dst, src, translate)) {
                const int bytes = dst.bpp / 8;
                uchar *d = to + qsizetype(xs.first) * bytes;
                const uchar *s = from + qsizetype(xs.src[0]) * bytes;
                combineBytes(d, s, size_t(n) * size_t(bytes), rop);
                continue;
            }
            if (span && src.bpp == 8 && translate.isLookup() && rop == Rop::Copy && dst.bpp >= 24) {
                const auto &lookup = translate.lookup();
                const uchar *s = from + xs.src[0];
                if (dst.bpp == 32) {
                    quint32 *d = reinterpret_cast<quint32 *>(to) + xs.first;
                    for (int i = 0; i < n; ++i)
                        d[i] = lookup[s[i]];
                } else {
                    // Four bytes a pixel, the fourth overwritten by the next pixel; the last
                    // pixel writes its three only.
                    uchar *d = to + 3 * qsizetype(xs.first);
                    for (int i = 0; i + 1 < n; ++i)
                        std::memcpy(d + 3 * i, &lookup[s[i]], 4);
                    std::memcpy(d + 3 * (n - 1), &lookup[s[n - 1]], 3);
                }
                continue;
            }
            gatherValues(src, from, xs.src.data(), n, values.data());
            translate.apply(values.data(), n);
            storeValues(dst, to, xs.first, n, values.data(), rop);
        }
    });
}

// ---- Area-averaging blits --------------------------------------------------------------

// A colour's four channels spread to 16 bits each (B in the low lane), so that one 64-bit
// multiplication weighs all four.
inline quint64 spread(quint32 color)
{
    quint64 x = color;
    x = (x | (x << 16)) & 0x0000FFFF0000FFFFu;
    return (x | (x << 8)) & 0x00FF00FF00FF00FFu;
}

// Horizontally filtered source rows: per target column the four channels of the weighted
// mean in 8.8 fixed point (B, G, R, A as 16-bit lanes). The two most recent rows are kept
// because neighbouring target rows share their boundary rows.
class FilteredRows
{
public:
    FilteredRows(const Surface &src, const Taps &columns)
        : m_src(src)
        , m_columns(columns)
        , m_colors(size_t(columns.maxSrc - columns.minSrc + 1))
        , m_spread(m_colors.size())
        , m_xs(m_colors.size())
    {
        for (size_t i = 0; i < m_xs.size(); ++i)
            m_xs[i] = columns.minSrc + int(i);
        for (auto &slot : m_slots)
            slot.means.resize(columns.first.size());
    }

    // Four 16-bit channels per target column; the row `keep` stays in the cache.
    const quint16 *row(int y, int keep = -1)
    {
        for (auto &slot : m_slots)
            if (slot.row == y)
                return reinterpret_cast<const quint16 *>(slot.means.data());
        if (m_slots[size_t(m_next)].row == keep)
            m_next ^= 1;
        Slot &slot = m_slots[size_t(m_next)];
        m_next ^= 1;
        slot.row = y;
        const quint32 *colors = reinterpret_cast<const quint32 *>(m_src.row(y)) + m_columns.minSrc;
        if (m_src.bpp != 32) {
            gatherColors(m_src, m_src.row(y), m_xs.data(), int(m_xs.size()), m_colors.data());
            colors = m_colors.data();
        }
        for (size_t i = 0; i < m_spread.size(); ++i)
            m_spread[i] = spread(colors[i]);
        const quint32 *weights = m_columns.weights.data();
        const quint64 *spreadColors = m_spread.data() - m_columns.minSrc;
        if (m_columns.maxCount <= 2) {
            // Enlarging or mild shrinking: one or two taps; a lone tap is paired with itself
            // at weight 0.
            for (size_t k = 0; k < m_columns.first.size(); ++k) {
                const quint32 *w = weights + m_columns.offset[k];
                const quint64 *c = spreadColors + m_columns.first[k];
                const bool two = m_columns.count[k] == 2;
                slot.means[k] = c[0] * w[0] + c[two ? 1 : 0] * (two ? w[1] : 0);
            }
        } else {
            for (size_t k = 0; k < m_columns.first.size(); ++k) {
                const quint32 *w = weights + m_columns.offset[k];
                const quint64 *c = spreadColors + m_columns.first[k];
                quint64 sum = 0;
                for (int t = 0; t < m_columns.count[k]; ++t)
                    sum += c[t] * w[t];
                slot.means[k] = sum;
            }
        }
        return reinterpret_cast<const quint16 *>(slot.means.data());
    }

private:
    struct Slot
    {
        int row = -1;
        std::vector<quint64> means;
    };
    const Surface &m_src;
    const Taps &m_columns;
    std::vector<quint32> m_colors;
    std::vector<quint64> m_spread;
    std::vector<int> m_xs;
    std::array<Slot, 2> m_slots;
    int m_next = 0;
};

constexpr int RowShift = RowWeightBits + 8;
constexpr quint32 RowHalf = 1u << (RowShift - 1);

// One target row from one or two filtered rows and their weights: 8.8 means times weights
// summing to 1 << 14 stay below 1 << 30. The channels come out as bytes in B, G, R, A
// order, which is the memory order of 32-bit pixels.
[[gnu::always_inline]] inline void weighRows(
    const quint16 *first, const quint16 *second, const quint32 *weights, size_t channels, quint32 *argb)
{
    uchar *out = reinterpret_cast<uchar *>(argb);
    const quint32 w0 = weights[0], w1 = second ? weights[1] : 0;
    if (!second)
        second = first;
    size_t i = 0;
    for (; i + 8 <= channels; i += 8) {
        U16x8 a, b;
        std::memcpy(&a, first + i, sizeof a);
        std::memcpy(&b, second + i, sizeof b);
        const U32x8 sum
            = (__builtin_convertvector(a, U32x8) * w0 + __builtin_convertvector(b, U32x8) * w1 + RowHalf) >> RowShift;
        // Each lane holds one byte now; gather the low bytes.
        const U8x32 lanes = (U8x32)sum;
        const U8x8 bytes = __builtin_shufflevector(lanes, lanes, 0, 4, 8, 12, 16, 20, 24, 28);
        std::memcpy(out + i, &bytes, sizeof bytes);
    }
    for (; i < channels; ++i)
        out[i] = uchar((quint32(first[i]) * w0 + quint32(second[i]) * w1 + RowHalf) >> RowShift);
}

void weighRowsBaseline(
    const quint16 *first, const quint16 *second, const quint32 *weights, size_t channels, quint32 *argb)
{
    weighRows(first, second, weights, channels, argb);
}

#if defined(__x86_64__)
[[gnu::target("avx2")]] void weighRowsAvx2(
    const quint16 *first, const quint16 *second, const quint32 *weights, size_t channels, quint32 *argb)
{
    weighRows(first, second, weights, channels, argb);
}
#endif

void areaBlit(const Surface &dst, const Surface &src, const Axis &xAxis, const Axis &yAxis, const AxisMap &xs,
    const AxisMap &ys, Rop rop)
{
    const Taps columns = areaTaps(xAxis, xs, src.width, ColumnWeightBits);
    const Taps rows = areaTaps(yAxis, ys, src.height, RowWeightBits);
    const int n = int(xs.src.size());
#if defined(__x86_64__)
    static const bool avx2 = __builtin_cpu_supports("avx2");
    const auto weigh = avx2 ? weighRowsAvx2 : weighRowsBaseline;
#else
    const auto weigh = weighRowsBaseline;
#endif
    forEachBand(ys.src.size(), qint64(n) * qint64(ys.src.size()), [&](size_t begin, size_t end) {
        FilteredRows filtered(src, columns);
        std::vector<quint32> sums(size_t(n) * 4);
        std::vector<quint32> values(static_cast<size_t>(n));
        std::optional<NearestCache> nearest;
        if (dst.indexed())
            nearest.emplace(dst);
        for (size_t k = begin; k < end; ++k) {
            const int first = rows.first[k], count = rows.count[k];
            const quint32 *w = rows.weights.data() + rows.offset[k];
            // A copy into 32 bits goes straight into the target row.
            const bool direct = dst.bpp == 32 && rop == Rop::Copy;
            quint32 *out = direct ? reinterpret_cast<quint32 *>(dst.row(ys.first + int(k))) + xs.first : values.data();
            if (count <= 2) {
                const quint16 *top = filtered.row(first);
                weigh(top, count == 2 ? filtered.row(first + 1, first) : nullptr, w, sums.size(), out);
            } else {
                // Shrinking by more than two rows: summed one row at a time.
                for (int t = 0; t < count; ++t) {
                    const quint16 *line = filtered.row(first + t);
                    for (size_t i = 0; i < sums.size(); ++i)
                        sums[i] = (t == 0 ? RowHalf : sums[i]) + w[t] * line[i];
                }
                uchar *bytes = reinterpret_cast<uchar *>(out);
                for (size_t i = 0; i < sums.size(); ++i)
                    bytes[i] = uchar(sums[i] >> RowShift);
            }
            if (direct)
                continue;
            if (nearest)
                for (quint32 &v : values)
                    v = (*nearest)(v);
            else if (dst.bpp == 24)
                for (quint32 &v : values)
                    v &= 0xFFFFFFu;
            storeValues(dst, dst.row(ys.first + int(k)), xs.first, n, values.data(), rop);
        }
    });
}

// ---- Alpha blending --------------------------------------------------------------------

// Each byte of x times a / 255, rounded (two channels at a time).
inline quint32 byteMul(quint32 x, quint32 a)
{
    quint32 rb = (x & 0xFF00FFu) * a + 0x800080u;
    rb = ((rb + ((rb >> 8) & 0xFF00FFu)) >> 8) & 0xFF00FFu;
    quint32 ag = ((x >> 8) & 0xFF00FFu) * a + 0x800080u;
    ag = (ag + ((ag >> 8) & 0xFF00FFu)) & 0xFF00FF00u;
    return rb | ag;
}

// Bytewise a + b, saturating at 255 (only pixels that are not properly premultiplied get
// there).
inline quint32 addSaturate(quint32 a, quint32 b)
{
    quint32 rb = (a & 0xFF00FFu) + (b & 0xFF00FFu);
    quint32 ag = ((a >> 8) & 0xFF00FFu) + ((b >> 8) & 0xFF00FFu);
    rb |= 0x1000100u - ((rb >> 8) & 0x10001u);
    ag |= 0x1000100u - ((ag >> 8) & 0x10001u);
    return (rb & 0xFF00FFu) | (ag & 0xFF00FFu) << 8;
}

// One pixel of source-over at full constant alpha: s + d · (1 − sa), rounded once.
inline quint32 over(quint32 s, quint32 d)
{
    const quint32 a = s >> 24;
    if (a == 255)
        return s;
    return addSaturate(s, byteMul(d, 255 - a));
}

// Source-over with a constant alpha below 255, each channel computed in one step so that
// it is rounded only once: s·c/255 + d·(255² − sa·c)/255². Single precision is off by less
// than 10^-4 of a level here. The vector version does the same operations in the same
// order, so both give the same bytes.
inline quint32 overWithConstant(quint32 s, quint32 d, quint32 constant)
{
    const float sourceWeight = float(constant) * (1.0f / 255);
    const float targetWeight = float(255 * 255 - (s >> 24) * constant) * (1.0f / (255 * 255));
    quint32 result = 0;
    for (int shift = 0; shift < 32; shift += 8) {
        const quint32 value
            = quint32(float((s >> shift) & 0xFF) * sourceWeight + float((d >> shift) & 0xFF) * targetWeight + 0.5f);
        result |= std::min(value, 255u) << shift; // only pixels not properly premultiplied pass 255
    }
    return result;
}

[[gnu::always_inline]] inline void overWithConstant8(const quint32 *s, quint32 *d, quint32 constant)
{
    U32x8 source, target;
    std::memcpy(&source, s, sizeof source);
    std::memcpy(&target, d, sizeof target);
    const float sourceWeight = float(constant) * (1.0f / 255);
    const F32x8 targetWeight
        = (float(255 * 255) - __builtin_convertvector((I32x8)(source >> 24), F32x8) * float(constant))
        * (1.0f / (255 * 255));
    I32x8 result = {};
#pragma GCC unroll 4
    for (int shift = 0; shift < 32; shift += 8) {
        const F32x8 value = __builtin_convertvector((I32x8)((source >> shift) & 0xFF), F32x8) * sourceWeight
            + __builtin_convertvector((I32x8)((target >> shift) & 0xFF), F32x8) * targetWeight + 0.5f;
        const I32x8 channel = __builtin_convertvector(value, I32x8);
        result |= (channel < 255 ? channel : 255) << shift;
    }
    std::memcpy(d, &result, sizeof result);
}

// Eight pixels of over(): the same arithmetic, so the same bytes.
[[gnu::always_inline]] inline void over8(const quint32 *s, quint32 *d)
{
    U32x8 source, target;
    std::memcpy(&source, s, sizeof source);
    std::memcpy(&target, d, sizeof target);
    // 255 − alpha of each pixel in both 16-bit lanes of the pixel.
    const U8x32 inverse = ~(U8x32)source, zero = {};
    const U16x16 factor = (U16x16)__builtin_shufflevector(inverse, zero, 3, 32, 3, 32, 7, 32, 7, 32, 11, 32, 11, 32, 15,
        32, 15, 32, 19, 32, 19, 32, 23, 32, 23, 32, 27, 32, 27, 32, 31, 32, 31, 32);
    U16x16 rb = (U16x16)(target & 0x00FF00FFu) * factor + 0x80;
    U16x16 ag = (U16x16)((target >> 8) & 0x00FF00FFu) * factor + 0x80;
    rb = (rb + (rb >> 8)) >> 8;
    ag = (ag + (ag >> 8)) & 0xFF00;
    const U8x32 scaled = (U8x32)((U32x8)rb | (U32x8)ag);
    // s + min(scaled, 255 − s) is the sum stopped at 255.
    const U8x32 result = (U8x32)source + (scaled < inverse ? scaled : inverse);
    std::memcpy(d, &result, sizeof result);
}

[[gnu::always_inline]] inline void blendRowBody(quint32 *d, const quint32 *s, int n, quint32 constant)
{
    // Single pixels up to a 32-byte boundary of the target: stores that split cache lines
    // cost more than the blending.
    int i = 0;
    for (; i < n && reinterpret_cast<quintptr>(d + i) % 32 != 0; ++i)
        d[i] = constant == 255 ? (s[i] >> 24 != 0 ? over(s[i], d[i]) : d[i]) : overWithConstant(s[i], d[i], constant);
    if (constant != 255) {
        for (; i + 8 <= n; i += 8)
            overWithConstant8(s + i, d + i, constant);
        for (; i < n; ++i)
            d[i] = overWithConstant(s[i], d[i], constant);
        return;
    }
    for (; i + 8 <= n; i += 8) {
        // Opaque and fully transparent runs are common in icons and flags, and cheap: the
        // eight alpha bytes are looked at as one word.
        U8x32 bytes;
        std::memcpy(&bytes, s + i, sizeof bytes);
        const U8x8 alphas = __builtin_shufflevector(bytes, bytes, 3, 7, 11, 15, 19, 23, 27, 31);
        quint64 alpha;
        std::memcpy(&alpha, &alphas, sizeof alpha);
        if (alpha == ~quint64(0))
            std::memcpy(d + i, s + i, 8 * sizeof(quint32));
        else if (alpha != 0)
            over8(s + i, d + i);
    }
    for (; i < n; ++i)
        if (s[i] >> 24 != 0)
            d[i] = over(s[i], d[i]);
}

void blendRowBaseline(quint32 *d, const quint32 *s, int n, quint32 constant)
{
    blendRowBody(d, s, n, constant);
}

#if defined(__x86_64__)
[[gnu::target("avx2")]] void blendRowAvx2(quint32 *d, const quint32 *s, int n, quint32 constant)
{
    blendRowBody(d, s, n, constant);
}
#endif

void blendRow(quint32 *d, const quint32 *s, int n, quint32 constant)
{
#if defined(__x86_64__)
    static const bool avx2 = __builtin_cpu_supports("avx2");
    if (avx2)
        return blendRowAvx2(d, s, n, constant);
#endif
    blendRowBaseline(d, s, n, constant);
}

void blendInto(const Surface &dst, uchar *row, int x0, int n, quint32 *colors, quint32 constant,
    std::optional<NearestCache> &nearest)
{
    if (dst.bpp == 32) {
        blendRow(reinterpret_cast<quint32 *>(row) + x0, colors, n, constant);
        return;
    }
    for (int i = 0; i < n; ++i) {
        const quint32 d = colorOfValue(dst, readPixel(row, x0 + i, dst.bpp));
        const quint32 result = constant == 255 ? over(colors[i], d) : overWithConstant(colors[i], d, constant);
        writePixel(row, x0 + i, dst.bpp, nearest ? (*nearest)(result) : result & 0xFFFFFFu);
    }
}

} // namespace

// Coordinates and extents beyond ±2^27 are refused, as they are on the original platform:
// no bitmap comes near them, and the sampling arithmetic stays far from overflow.
bool withinLimits(const Extent &a, const Extent &b)
{
    constexpr int Limit = 1 << 27;
    for (int v : { a.x, a.y, a.width, a.height, b.x, b.y, b.width, b.height })
        if (v < -Limit || v > Limit)
            return false;
    return true;
}

bool stretchBlit(const Surface &dst, Extent to, const Surface &src, Extent from, Rop rop, Sampling sampling)
{
    if (!withinLimits(to, from))
        return false;
    if (to.width == 0 || to.height == 0)
        return true;
    if (from.width == 0 || from.height == 0)
        return false;
    Axis x = makeAxis(to.x, to.width, from.x, from.width);
    Axis y = makeAxis(to.y, to.height, from.y, from.height);
    Snapshot shot;
    const Surface &source = detachSource(dst, src, x, y, shot);
    const AxisMap xs = mapAxis(x, dst.width, source.width);
    const AxisMap ys = mapAxis(y, dst.height, source.height);
    if (xs.src.empty() || ys.src.empty())
        return true;
    const bool scaled = x.dstExtent != x.srcExtent || y.dstExtent != y.srcExtent;
    if (sampling == Sampling::Area && scaled)
        areaBlit(dst, source, x, y, xs, ys, rop);
    else
        nearestBlit(dst, source, xs, ys, rop);
    return true;
}

bool alphaBlend(const Surface &dst, Extent to, const Surface &src, Extent from, quint8 constantAlpha, bool perPixel)
{
    if (!withinLimits(to, from) || to.width < 0 || to.height < 0 || from.width < 0 || from.height < 0)
        return false;
    if (from.x < 0 || from.y < 0 || qint64(from.x) + from.width > src.width
        || qint64(from.y) + from.height > src.height)
        return false;
    if (to.width == 0 || to.height == 0 || constantAlpha == 0)
        return true;
    if (from.width == 0 || from.height == 0)
        return false;
    Axis x = makeAxis(to.x, to.width, from.x, from.width);
    Axis y = makeAxis(to.y, to.height, from.y, from.height);
    Snapshot shot;
    const Surface &source = detachSource(dst, src, x, y, shot);
    const AxisMap xs = mapAxis(x, dst.width, source.width);
    const AxisMap ys = mapAxis(y, dst.height, source.height);
    if (xs.src.empty() || ys.src.empty())
        return true; // wholly clipped
    const int n = int(xs.src.size());
    const bool opaqueSource = !perPixel || source.bpp != 32;
    const bool span = xs.isSpan();
    forEachBand(ys.src.size(), qint64(n) * qint64(ys.src.size()), [&](size_t begin, size_t end) {
        std::vector<quint32> colors(static_cast<size_t>(n));
        std::optional<NearestCache> nearest;
        if (dst.indexed())
            nearest.emplace(dst);
        for (size_t k = begin; k < end; ++k) {
            uchar *row = dst.row(ys.first + int(k));
            const uchar *from = source.row(ys.src[k]);
            if (span && !opaqueSource && dst.bpp == 32) {
                blendRow(reinterpret_cast<quint32 *>(row) + xs.first,
                    reinterpret_cast<const quint32 *>(from) + xs.src[0], n, constantAlpha);
                continue;
            }
            gatherColors(source, from, xs.src.data(), n, colors.data());
            if (opaqueSource)
                for (quint32 &c : colors)
                    c |= 0xFF000000u;
            blendInto(dst, row, xs.first, n, colors.data(), constantAlpha, nearest);
        }
    });
    return true;
}

void fillRect(const Surface &dst, int left, int top, int right, int bottom, quint32 value)
{
    const int x0 = std::clamp(left, 0, dst.width), x1 = std::clamp(right, 0, dst.width);
    const int y0 = std::clamp(top, 0, dst.height), y1 = std::clamp(bottom, 0, dst.height);
    if (x0 >= x1 || y0 >= y1)
        return;
    std::vector<quint32> values(size_t(x1 - x0), value);
    for (int y = y0; y < y1; ++y)
        storeValues(dst, dst.row(y), x0, x1 - x0, values.data(), Rop::Copy);
}

} // namespace zelctl::gdi::detail

#include "Raster.h"

#include <algorithm>
#include <cstring>
#include <optional>
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

    bool isSpan(int step) const
    {
        for (size_t i = 1; i < src.size(); ++i)
            if (src[i] != src[i - 1] + step)
                return false;
        return true;
    }
};

qint64 centreSample(const Axis &axis, qint64 i)
{
    const qint64 k = ((2 * i + 1) * axis.srcExtent) / (2 * axis.dstExtent);
    return axis.flip ? axis.src + axis.srcExtent - 1 - k : axis.src + k;
}

AxisMap mapAxis(const Axis &axis, int dstLimit, int srcLimit)
{
    AxisMap map;
    const qint64 begin = std::max<qint64>(0, -axis.dst);
    const qint64 end = std::min<qint64>(axis.dstExtent, dstLimit - axis.dst);
    for (qint64 i = begin; i < end; ++i) {
        const qint64 s = centreSample(axis, i);
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
// footprint covers and how much of it each covers, scaled to a sum of 1 << 14.
constexpr int WeightBits = 14;

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

Taps areaTaps(const Axis &axis, const AxisMap &map, int srcLimit)
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
            const quint32 w = quint32((raw[t] * (1 << WeightBits) + total / 2) / total);
            taps.weights.push_back(w);
            sum += w;
            if (raw[t] > raw[largest])
                largest = t;
        }
        taps.weights[size_t(taps.offset.back()) + largest] += (1u << WeightBits) - sum;
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

template <typename T> void combine(T *dst, const T *src, qsizetype n, Rop rop)
{
    switch (rop) {
    case Rop::Copy:
        std::memmove(dst, src, size_t(n) * sizeof(T));
        break;
    case Rop::And:
        for (qsizetype i = 0; i < n; ++i)
            dst[i] &= src[i];
        break;
    case Rop::Or:
        for (qsizetype i = 0; i < n; ++i)
            dst[i] |= src[i];
        break;
    }
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
        combine(reinterpret_cast<quint32 *>(row) + x0, values, n, rop);
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

// ---- Nearest-pixel blits ---------------------------------------------------------------

bool sameFormat(const Surface &dst, const Surface &src, const Translator &translate)
{
    return dst.bpp == src.bpp && dst.bpp >= 8 && translate.identity();
}

void nearestBlit(const Surface &dst, const Surface &src, const AxisMap &xs, const AxisMap &ys, Rop rop)
{
    Translator translate(dst, src);
    const int n = int(xs.src.size());
    const bool span = xs.isSpan(1);
    std::vector<quint32> values(static_cast<size_t>(n));
    for (size_t k = 0; k < ys.src.size(); ++k) {
        uchar *to = dst.row(ys.first + int(k));
        const uchar *from = src.row(ys.src[k]);
        if (span && sameFormat(dst, src, translate)) {
            const int bytes = dst.bpp / 8;
            uchar *d = to + qsizetype(xs.first) * bytes;
            const uchar *s = from + qsizetype(xs.src[0]) * bytes;
            if (bytes == 4)
                combine(reinterpret_cast<quint32 *>(d), reinterpret_cast<const quint32 *>(s), n, rop);
            else
                combine(d, s, qsizetype(n) * bytes, rop);
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
                uchar *d = to + 3 * qsizetype(xs.first);
                for (int i = 0; i < n; ++i, d += 3) {
                    const quint32 v = lookup[s[i]];
                    d[0] = uchar(v);
                    d[1] = uchar(v >> 8);
                    d[2] = uchar(v >> 16);
                }
            }
            continue;
        }
        gatherValues(src, from, xs.src.data(), n, values.data());
        translate.apply(values.data(), n);
        storeValues(dst, to, xs.first, n, values.data(), rop);
    }
}

// ---- Area-averaging blits --------------------------------------------------------------

// Horizontally filtered source rows, four channel sums per target column; the two most
// recent rows are kept because neighbouring target rows share their boundary rows.
class FilteredRows
{
public:
    FilteredRows(const Surface &src, const Taps &columns)
        : m_src(src)
        , m_columns(columns)
        , m_colors(size_t(columns.maxSrc - columns.minSrc + 1))
        , m_xs(m_colors.size())
    {
        for (size_t i = 0; i < m_xs.size(); ++i)
            m_xs[i] = columns.minSrc + int(i);
        for (auto &slot : m_slots)
            slot.sums.resize(columns.first.size() * 4);
    }

    const std::vector<quint32> &row(int y)
    {
        for (auto &slot : m_slots)
            if (slot.row == y)
                return slot.sums;
        Slot &slot = m_slots[m_next];
        m_next ^= 1;
        slot.row = y;
        gatherColors(m_src, m_src.row(y), m_xs.data(), int(m_xs.size()), m_colors.data());
        for (size_t k = 0; k < m_columns.first.size(); ++k) {
            quint32 b = 0, g = 0, r = 0, a = 0;
            const quint32 *w = m_columns.weights.data() + m_columns.offset[k];
            const quint32 *c = m_colors.data() + (m_columns.first[k] - m_columns.minSrc);
            for (int t = 0; t < m_columns.count[k]; ++t) {
                b += w[t] * (c[t] & 0xFF);
                g += w[t] * (c[t] >> 8 & 0xFF);
                r += w[t] * (c[t] >> 16 & 0xFF);
                a += w[t] * (c[t] >> 24);
            }
            quint32 *out = slot.sums.data() + 4 * k;
            out[0] = b;
            out[1] = g;
            out[2] = r;
            out[3] = a;
        }
        return slot.sums;
    }

private:
    struct Slot
    {
        int row = -1;
        std::vector<quint32> sums;
    };
    const Surface &m_src;
    const Taps &m_columns;
    std::vector<quint32> m_colors;
    std::vector<int> m_xs;
    std::array<Slot, 2> m_slots;
    int m_next = 0;
};

void areaBlit(const Surface &dst, const Surface &src, const Axis &xAxis, const Axis &yAxis, const AxisMap &xs,
    const AxisMap &ys, Rop rop)
{
    const Taps columns = areaTaps(xAxis, xs, src.width);
    const Taps rows = areaTaps(yAxis, ys, src.height);
    FilteredRows filtered(src, columns);
    const int n = int(xs.src.size());
    std::vector<quint64> sums(static_cast<size_t>(n) * 4);
    std::vector<quint32> values(static_cast<size_t>(n));
    std::optional<NearestCache> nearest;
    if (dst.indexed())
        nearest.emplace(dst);
    for (size_t k = 0; k < ys.src.size(); ++k) {
        std::fill(sums.begin(), sums.end(), 0);
        const quint32 *w = rows.weights.data() + rows.offset[k];
        for (int t = 0; t < rows.count[k]; ++t) {
            const std::vector<quint32> &line = filtered.row(rows.first[k] + t);
            for (size_t i = 0; i < sums.size(); ++i)
                sums[i] += quint64(w[t]) * line[i];
        }
        constexpr int shift = 2 * WeightBits;
        constexpr quint64 half = quint64(1) << (shift - 1);
        for (int i = 0; i < n; ++i) {
            const quint64 *s = sums.data() + 4 * i;
            const quint32 argb = quint32((s[0] + half) >> shift) | quint32((s[1] + half) >> shift) << 8
                | quint32((s[2] + half) >> shift) << 16 | quint32((s[3] + half) >> shift) << 24;
            values[size_t(i)] = nearest ? (*nearest)(argb) : dst.bpp == 24 ? argb & 0xFFFFFFu : argb;
        }
        storeValues(dst, dst.row(ys.first + int(k)), xs.first, n, values.data(), rop);
    }
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

// One pixel of source-over with a constant alpha below 255, each channel computed in one
// step so that it is rounded only once: (s·c·255 + d·(255² − sa·c)) / 255².
inline quint32 overWithConstant(quint32 s, quint32 d, quint32 constant)
{
    const quint32 sourceWeight = constant * 255;
    const quint32 targetWeight = 255 * 255 - (s >> 24) * constant;
    quint32 result = 0;
    for (int shift = 0; shift < 32; shift += 8) {
        const quint32 value
            = (((s >> shift) & 0xFF) * sourceWeight + ((d >> shift) & 0xFF) * targetWeight + 255 * 255 / 2)
            / (255 * 255);
        result |= std::min<quint32>(value, 255) << shift;
    }
    return result;
}

void blendRow(quint32 *d, const quint32 *s, int n, quint32 constant)
{
    if (constant == 255) {
        // Fully transparent pixels are common in icons and flags, and cost nothing.
        for (int i = 0; i < n; ++i)
            if (s[i] != 0)
                d[i] = over(s[i], d[i]);
        return;
    }
    for (int i = 0; i < n; ++i)
        d[i] = overWithConstant(s[i], d[i], constant);
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

bool stretchBlit(const Surface &dst, Extent to, const Surface &src, Extent from, Rop rop, Sampling sampling)
{
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
    if (to.width < 0 || to.height < 0 || from.width < 0 || from.height < 0)
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
    const int n = int(xs.src.size());
    const bool opaqueSource = !perPixel || source.bpp != 32;
    const bool span = xs.isSpan(1);
    std::vector<quint32> colors(static_cast<size_t>(n));
    std::optional<NearestCache> nearest;
    if (dst.indexed())
        nearest.emplace(dst);
    for (size_t k = 0; k < ys.src.size(); ++k) {
        uchar *row = dst.row(ys.first + int(k));
        const uchar *from = source.row(ys.src[k]);
        if (span && !opaqueSource && dst.bpp == 32) {
            blendRow(reinterpret_cast<quint32 *>(row) + xs.first, reinterpret_cast<const quint32 *>(from) + xs.src[0],
                n, constantAlpha);
            continue;
        }
        gatherColors(source, from, xs.src.data(), n, colors.data());
        if (opaqueSource)
            for (quint32 &c : colors)
                c |= 0xFF000000u;
        blendInto(dst, row, xs.first, n, colors.data(), constantAlpha, nearest);
    }
    return true;
}

void fillRect(const Surface &dst, const QRect &rect, quint32 value)
{
    if (rect.isEmpty())
        return; // QRect's intersection would turn an inverted rectangle round
    const QRect area = rect & QRect(0, 0, dst.width, dst.height);
    if (area.isEmpty())
        return;
    std::vector<quint32> values(size_t(area.width()), value);
    for (int y = area.top(); y <= area.bottom(); ++y)
        storeValues(dst, dst.row(y), area.left(), area.width(), values.data(), Rop::Copy);
}

} // namespace zelctl::gdi::detail

// Blits, blends, fills and pens against a per-pixel model over seeded random cases: all depths,
// tables with twin entries, rectangles across and beyond the edges, mirrored, empty, huge, one
// bitmap as source and target. What the model leaves alone, padding included, must stay.

#include "GdiTestSupport.h"

#include <gtest/gtest.h>

#include <array>
#include <climits>
#include <cmath>
#include <memory>
#include <random>
#include <tuple>

using namespace zelctl::gdi;
using namespace zelctl::gdi::test;
using zelctl::platform::COLOR_WINDOW;
using zelctl::platform::systemColor;

namespace {

using Rng = std::mt19937;

int pick(Rng &rng, int low, int high)
{
    return std::uniform_int_distribution<int>(low, high)(rng);
}

// Mostly low to high (or 0); now and then beyond a bitmap or the limits of blits and pens.
int position(Rng &rng, int low, int high, bool mayBeEmpty = false)
{
    static const int far[]
        = { INT_MIN, -(1 << 27) - 1, -(1 << 27), -(1 << 20) - 1, -65536, 65536, 1 << 20, 1 << 27, INT_MAX };
    if (pick(rng, 0, 40) == 0)
        return far[pick(rng, 0, 8)];
    return mayBeEmpty && pick(rng, 0, 12) == 0 ? 0 : pick(rng, low, high);
}

// An origin and extent: now and then empty, or mirrored (counting back from the origin).
std::pair<int, int> span(Rng &rng, int size, int mirrorOdds = 4)
{
    const int start = position(rng, -1, size - 1), length = position(rng, 1, size + 2, true);
    const bool mirrored = pick(rng, 1, mirrorOdds) == 1 && std::abs(qint64(start)) + std::abs(qint64(length)) < 1 << 20;
    return mirrored ? std::pair { start + length - 1, -length } : std::pair { start, length };
}

// Random depth, size, orientation, table (now and then that of `like`) and bytes.
std::unique_ptr<TestBitmap> randomBitmap(Rng &rng, int maxWidth, const TestBitmap *like = nullptr)
{
    const int bpp = std::array { 1, 4, 8, 24, 32 }[size_t(pick(rng, 0, 4))];
    std::vector<quint32> entries(size_t(bpp <= 8 ? pick(rng, 0, 1 << bpp) : 0));
    for (size_t i = 0; i < entries.size(); ++i)
        entries[i] = i > 0 && pick(rng, 0, 5) == 0 ? entries[i - 1] : rng() & 0xFFFFFF;
    if (like && like->bpp == bpp && pick(rng, 0, 1) == 0)
        entries = like->table;
    auto b = std::make_unique<TestBitmap>(pick(rng, 1, maxWidth), pick(rng, 1, 5), bpp, pick(rng, 0, 1), entries);
    for (int i = 0; i < b->stride * b->height; ++i)
        static_cast<uchar *>(b->bits)[i] = uchar(rng());
    return b;
}

// A pixel of the model: a value, or a colour (B, G, R, A) to show within a tolerance.
struct Want
{
    quint32 value = 0;
    bool approximate = false;
    std::array<double, 4> bgra {};
};
using Picture = std::vector<Want>;

Picture pictureOf(const TestBitmap &b)
{
    Picture picture;
    for (int y = 0; y < b.height; ++y)
        for (int x = 0; x < b.width; ++x)
            picture.push_back({ b.value(x, y) });
    return picture;
}

// Channel by channel; for a table, the nearest entry to some colour that close.
bool near(const TestBitmap &b, quint32 got, const std::array<double, 4> &want, double tolerance)
{
    if (b.bpp > 8) {
        for (int ch = 0; ch < b.bpp / 8; ++ch)
            if (std::abs(double(got >> 8 * ch & 0xFF) - want[size_t(ch)]) > tolerance)
                return false;
        return true;
    }
    const auto low = [&](size_t ch) { return std::max(0, int(std::ceil(want[ch] - tolerance))); };
    const auto high = [&](size_t ch) { return std::min(255, int(std::floor(want[ch] + tolerance))); };
    for (int blue = low(0); blue <= high(0); ++blue)
        for (int green = low(1); green <= high(1); ++green)
            for (int red = low(2); red <= high(2); ++red)
                if (b.valueOf(quint32(red << 16 | green << 8 | blue)) == got)
                    return true;
    return false;
}

// Where the bitmap first differs from the model, "" where it does not.
std::string mismatch(TestBitmap &b, const Picture &want, const QByteArray &before, double tolerance)
{
    for (int y = 0; y < b.height; ++y)
        for (int x = 0; x < b.width; ++x) {
            const Want &w = want[size_t(y * b.width + x)];
            const quint32 got = b.value(x, y);
            if (w.approximate ? near(b, got, w.bgra, tolerance) : got == w.value)
                continue;
            return "pixel " + std::to_string(x) + "," + std::to_string(y) + " is " + std::to_string(got) + " not "
                + (w.approximate ? "near B,G,R,A " + testing::PrintToString(w.bgra) : std::to_string(w.value));
        }
    const auto withoutPixels = [&b](const QByteArray &bytes) {
        std::memcpy(b.bits, bytes.constData(), size_t(bytes.size()));
        b.fill(0);
        return b.bytes();
    };
    const QByteArray after = b.bytes();
    return withoutPixels(before) == withoutPixels(after) ? "" : "bytes beside the pixels changed";
}

// One axis of a blit with positive extents; flip when the picture is mirrored on it.
struct Axis
{
    Axis(int to, int toExtent, int from, int fromExtent)
        : dst(toExtent < 0 ? qint64(to) + toExtent + 1 : to)
        , dstExtent(std::abs(qint64(toExtent)))
        , src(fromExtent < 0 ? qint64(from) + fromExtent + 1 : from)
        , srcExtent(std::abs(qint64(fromExtent)))
        , flip((toExtent < 0) != (fromExtent < 0))
    { }
    // The source pixel under the centre of target pixel t, LLONG_MIN outside the target.
    qint64 sample(qint64 t) const
    {
        const qint64 i = t - dst, k = (2 * i + 1) * srcExtent / (2 * dstExtent);
        return i < 0 || i >= dstExtent ? LLONG_MIN : flip ? src + srcExtent - 1 - k : src + k;
    }
    // Target pixel t's footprint on the source: first and last pixel, and its cover of s.
    qint64 logical(qint64 t) const { return flip ? dstExtent - 1 - (t - dst) : t - dst; }
    qint64 first(qint64 t) const { return src + logical(t) * srcExtent / dstExtent; }
    qint64 last(qint64 t) const { return src + ((logical(t) + 1) * srcExtent - 1) / dstExtent; }
    double cover(qint64 t, qint64 s) const
    {
        const qint64 l = logical(t), j = s - src;
        return double(std::min((j + 1) * dstExtent, (l + 1) * srcExtent) - std::max(j * dstExtent, l * srcExtent));
    }
    qint64 dst, dstExtent, src, srcExtent;
    bool flip;
};

struct Blit
{
    int x, y, w, h, sx, sy, sw, sh;
};

std::ostream &operator<<(std::ostream &out, const Blit &a)
{
    return out << "(" << a.x << "," << a.y << " " << a.w << "x" << a.h << ") from (" << a.sx << "," << a.sy << " "
               << a.sw << "x" << a.sh << ")";
}

// Coordinates beyond 2^27 fail a blit, beyond 2^20 a pen.
bool within(std::initializer_list<int> values, int limit)
{
    return std::all_of(values.begin(), values.end(), [limit](int v) { return std::abs(qint64(v)) <= limit; });
}

bool withinLimits(const Blit &a)
{
    return within({ a.x, a.y, a.w, a.h, a.sx, a.sy, a.sw, a.sh }, 1 << 27);
}

// Each target pixel a blit draws, with the source pixel under its centre.
template <typename Draw> void forEachSample(const TestBitmap &dst, const TestBitmap &src, const Blit &a, Draw draw)
{
    const Axis ax(a.x, a.w, a.sx, a.sw), ay(a.y, a.h, a.sy, a.sh);
    for (int ty = 0; ty < dst.height; ++ty)
        for (int tx = 0; tx < dst.width; ++tx) {
            const qint64 sx = ax.sample(tx), sy = ay.sample(ty);
            if (sx >= 0 && sx < src.width && sy >= 0 && sy < src.height)
                draw(ax, ay, tx, ty, int(sx), int(sy));
        }
}

// What StretchBlt leaves in dst; false when it must fail.
bool modelStretch(
    Picture &want, const TestBitmap &dst, const TestBitmap &src, const Blit &a, quint32 rop, bool halftone)
{
    if (!withinLimits(a) || a.w == 0 || a.h == 0)
        return withinLimits(a);
    if (a.sw == 0 || a.sh == 0)
        return false;
    const bool sameTable = dst.bpp == src.bpp && dst.bpp <= 8 && dst.table == src.table;
    const bool area = halftone && (std::abs(a.w) != std::abs(a.sw) || std::abs(a.h) != std::abs(a.sh));
    forEachSample(dst, src, a, [&](const Axis &ax, const Axis &ay, int tx, int ty, int sx, int sy) {
        Want &w = want[size_t(ty * dst.width + tx)];
        if (!area) {
            const quint32 s = src.value(sx, sy), v = sameTable ? s : dst.valueOf(src.colorOf(s));
            w.value = rop == SRCAND ? w.value & v : rop == SRCPAINT ? w.value | v : v;
            return;
        }
        // The mean colour of the source under the target pixel, by area.
        w = { 0, true, {} };
        double total = 0;
        for (qint64 y = std::max<qint64>(ay.first(ty), 0); y <= std::min<qint64>(ay.last(ty), src.height - 1); ++y)
            for (qint64 x = std::max<qint64>(ax.first(tx), 0); x <= std::min<qint64>(ax.last(tx), src.width - 1); ++x) {
                const double cover = ax.cover(tx, x) * ay.cover(ty, y);
                const quint32 color = src.colorOf(src.value(int(x), int(y)));
                total += cover;
                for (size_t ch = 0; ch < 4; ++ch)
                    w.bgra[ch] += cover * (color >> 8 * ch & 0xFF);
            }
        for (double &channel : w.bgra)
            channel /= total;
    });
    return true;
}

// What AlphaBlend leaves in dst: src·k + dst·(1 − srcA·k), no channel above 255.
bool modelBlend(Picture &want, const TestBitmap &dst, const TestBitmap &src, const Blit &a, BLENDFUNCTION f)
{
    if (!withinLimits(a) || a.w < 0 || a.h < 0 || a.sw < 0 || a.sh < 0 || a.sx < 0 || a.sy < 0
        || qint64(a.sx) + a.sw > src.width || qint64(a.sy) + a.sh > src.height)
        return false;
    if (a.w == 0 || a.h == 0 || f.SourceConstantAlpha == 0)
        return true;
    if (a.sw == 0 || a.sh == 0)
        return false;
    const double k = f.SourceConstantAlpha / 255.0;
    forEachSample(dst, src, a, [&](const Axis &, const Axis &, int tx, int ty, int sx, int sy) {
        Want &w = want[size_t(ty * dst.width + tx)];
        const quint32 s = src.colorOf(src.value(sx, sy)) | (f.AlphaFormat == AC_SRC_ALPHA ? 0 : 0xFF000000u);
        const quint32 d = dst.colorOf(w.value);
        w.approximate = true;
        for (size_t ch = 0; ch < 4; ++ch)
            w.bgra[ch] = std::min(255.0, (s >> 8 * ch & 0xFF) * k + (d >> 8 * ch & 0xFF) * (1 - (s >> 24) / 255.0 * k));
    });
    return true;
}

// Runs a call against its model, worked out first; "" when they agree.
template <typename Model, typename Call> std::string check(TestBitmap &dst, Model model, Call call, double tolerance)
{
    Picture want = pictureOf(dst);
    const bool ok = model(want);
    const QByteArray before = dst.bytes();
    if (call() != ok)
        return ok ? "failed" : "did not fail";
    return mismatch(dst, want, before, tolerance);
}

} // namespace

TEST(Raster, blitsMatchThePixelModel)
{
    Rng rng(1);
    for (int n = 0; n < 3000; ++n) {
        const auto dst = randomBitmap(rng, 12);
        const auto other = randomBitmap(rng, 12, dst.get());
        const TestBitmap &src = n % 6 == 0 ? *dst : *other;
        const bool bitBlt = n % 4 == 1, halftone = n % 3 == 0;
        // Averaged colours are approximate, so they are only copied here.
        const quint32 rop = halftone ? SRCCOPY : std::array { SRCCOPY, SRCAND, SRCPAINT }[size_t(pick(rng, 0, 2))];
        Blit a;
        std::tie(a.x, a.w) = span(rng, dst->width);
        std::tie(a.y, a.h) = span(rng, dst->height);
        std::tie(a.sx, a.sw) = span(rng, src.width);
        std::tie(a.sy, a.sh) = span(rng, src.height);
        if (bitBlt)
            a.sw = a.w, a.sh = a.h;
        SetStretchBltMode(dst->dc, halftone ? HALFTONE : pick(rng, BLACKONWHITE, COLORONCOLOR));
        // Averages are within 1 of the mean; columns are weighed in 1/256, so that shrinking
        // by more than four columns to one may add a level or two.
        const double tolerance = std::abs(qint64(a.sw)) > 4 * std::abs(qint64(a.w)) ? 2.5 : 1;
        ASSERT_EQ(check(
                      *dst, [&](Picture &want) { return modelStretch(want, *dst, src, a, rop, halftone); },
                      [&] {
                          return bitBlt ? BitBlt(dst->dc, a.x, a.y, a.w, a.h, src.dc, a.sx, a.sy, rop)
                                        : StretchBlt(dst->dc, a.x, a.y, a.w, a.h, src.dc, a.sx, a.sy, a.sw, a.sh, rop);
                      },
                      tolerance),
            "")
            << "case " << n << ": " << a << " rop " << (rop >> 16) << (halftone ? " halftone" : "");
    }
}

TEST(Raster, alphaBlendingMatchesThePixelModel)
{
    Rng rng(2);
    for (int n = 0; n < 1000; ++n) {
        const auto dst = randomBitmap(rng, 40);
        const auto other = randomBitmap(rng, 40, dst.get());
        TestBitmap &src = n % 6 == 0 ? *dst : *other;
        // Fully transparent pixels carry no colour; the others may be badly premultiplied.
        if (src.bpp == 32)
            for (int y = 0; y < src.height; ++y)
                for (int x = 0; x < src.width; ++x)
                    if (src.value(x, y) >> 24 == 0)
                        src.setValue(x, y, 0);
        const int sx = pick(rng, 0, src.width - 1), sy = pick(rng, 0, src.height - 1);
        Blit a { 0, 0, 0, 0, sx, sy, pick(rng, 1, src.width - sx), pick(rng, 1, src.height - sy) };
        std::tie(a.x, a.w) = span(rng, dst->width, 12);
        std::tie(a.y, a.h) = span(rng, dst->height, 12);
        if (n % 5 == 0)
            a.w = a.sw, a.h = a.sh;
        // Sources beyond the bitmap and empty ones are refused.
        if (n % 10 == 1)
            a.sw = src.width - sx + 1;
        if (n % 10 == 3)
            a.sy = -1;
        if (n % 10 == 7)
            a.sh = 0;
        BLENDFUNCTION f;
        f.SourceConstantAlpha = quint8(n % 3 == 0 ? 255 : pick(rng, 0, 255));
        f.AlphaFormat = pick(rng, 0, 1) ? AC_SRC_ALPHA : 0;
        SetStretchBltMode(
            dst->dc, pick(rng, BLACKONWHITE, HALFTONE)); // blending takes the nearest pixel whatever it says
        // Rounded once: within half a level.
        ASSERT_EQ(
            check(
                *dst, [&](Picture &want) { return modelBlend(want, *dst, src, a, f); },
                [&] { return AlphaBlend(dst->dc, a.x, a.y, a.w, a.h, src.dc, a.sx, a.sy, a.sw, a.sh, f); }, 0.501),
            "")
            << "case " << n << ": " << a << " alpha " << int(f.SourceConstantAlpha)
            << (f.AlphaFormat ? " per pixel" : "");
    }
}

// Large jobs are shared among threads, in bands of rows.
TEST(Raster, largeBlitsAndBlendsMatchTheModelToo)
{
    Rng rng(4);
    TestBitmap src(300, 200, 32), dst(900, 600, 32), blended(900, 600, 32);
    for (int i = 0; i < src.stride * src.height; ++i)
        static_cast<uchar *>(src.bits)[i] = uchar(rng());
    SetStretchBltMode(dst.dc, HALFTONE);
    const Blit a { 0, 0, 900, 600, 0, 0, 300, 200 };
    ASSERT_EQ(check(
                  dst, [&](Picture &want) { return modelStretch(want, dst, src, a, SRCCOPY, true); },
                  [&] { return StretchBlt(dst.dc, 0, 0, 900, 600, src.dc, 0, 0, 300, 200, SRCCOPY); }, 1.0),
        "");
    const BLENDFUNCTION half { AC_SRC_OVER, 0, 128, 0 };
    const Blit whole { 0, 0, 900, 600, 0, 0, 900, 600 };
    ASSERT_EQ(check(
                  blended, [&](Picture &want) { return modelBlend(want, blended, dst, whole, half); },
                  [&] { return AlphaBlend(blended.dc, 0, 0, 900, 600, dst.dc, 0, 0, 900, 600, half); }, 0.501),
        "");
}

TEST(Raster, fillsOutlinesAndLinesMatchThePixelModel)
{
    Rng rng(3);
    for (int n = 0; n < 600; ++n) {
        const auto b = randomBitmap(rng, 12);
        std::array<int, 6> c;
        for (size_t i = 0; i < c.size(); ++i)
            c[i] = position(rng, -3, i % 2 ? b->height : b->width);
        if (n % 3 == 0 && pick(rng, 0, 3) != 0) // mostly the right way round
            std::tie(c[0], c[1], c[2], c[3])
                = std::tuple { std::min(c[0], c[2]), std::min(c[1], c[3]), std::max(c[0], c[2]), std::max(c[1], c[3]) };
        Picture want = pictureOf(*b);
        const QByteArray before = b->bytes();
        // Now and then the brush has the window's system colour, white.
        const COLORREF ink = rng() & 0xFFFFFF, paint = n % 8 ? rng() & 0xFFFFFF : systemColor(COLOR_WINDOW);
        const COLORREF painted = n % 8 ? paint : 0xFFFFFF;
        const HPEN pen = pick(rng, 0, 3) ? CreatePen(PS_SOLID, 1, ink) : GetStockObject(NULL_PEN);
        const HBRUSH brush = pick(rng, 0, 3) ? CreateSolidBrush(paint) : GetStockObject(NULL_BRUSH);
        const bool xorPen = pick(rng, 0, 1);
        SelectObject(b->dc, pen);
        SelectObject(b->dc, brush);
        SetROP2(b->dc, xorPen ? R2_XORPEN : R2_COPYPEN);
        const auto mark = [&](qint64 x, qint64 y, COLORREF color, bool xorMode) {
            if (x < 0 || y < 0 || x >= b->width || y >= b->height)
                return;
            const quint32 v = b->valueOf(0xFF000000u | (color & 0xFF) << 16 | (color & 0xFF00) | color >> 16);
            Want &w = want[size_t(y * b->width + x)];
            w.value = xorMode ? w.value ^ (b->bpp == 32 ? v & 0xFFFFFF : v) : v; // XOR keeps the alpha
        };
        const auto area = [&](qint64 left, qint64 top, qint64 right, qint64 bottom, auto draw) {
            for (qint64 y = std::max<qint64>(top, 0); y < std::min<qint64>(bottom, b->height); ++y)
                for (qint64 x = std::max<qint64>(left, 0); x < std::min<qint64>(right, b->width); ++x)
                    draw(x, y);
        };
        SCOPED_TRACE(testing::Message() << "case " << n << ", " << b->bpp << " bits: " << testing::PrintToString(c));
        if (n % 3 == 0) {
            if (brush != GetStockObject(NULL_BRUSH))
                area(c[0], c[1], c[2], c[3], [&](qint64 x, qint64 y) { mark(x, y, painted, false); });
            ASSERT_NE(FillRect(b->dc, RECT { c[0], c[1], c[2], c[3] }, brush), 0);
        } else if (n % 3 == 1) {
            // Corners in any order; the outline has the pen, the inside within it the brush.
            const bool ok = within({ c[0], c[1], c[2], c[3] }, 1 << 20);
            const qint64 l = std::min(c[0], c[2]), r = std::max(c[0], c[2]), t = std::min(c[1], c[3]),
                         bottom = std::max(c[1], c[3]), inset = pen != GetStockObject(NULL_PEN);
            if (ok && brush != GetStockObject(NULL_BRUSH))
                area(l + inset, t + inset, r - inset, bottom - inset,
                    [&](qint64 x, qint64 y) { mark(x, y, painted, false); });
            if (ok && inset)
                area(l, t, r, bottom, [&](qint64 x, qint64 y) {
                    if (x == l || x == r - 1 || y == t || y == bottom - 1)
                        mark(x, y, ink, xorPen);
                });
            ASSERT_EQ(Rectangle(b->dc, c[0], c[1], c[2], c[3]), ok);
        } else {
            // Two joined lines, each without its end point: one pixel a step along the longer
            // axis, across it the pixel nearest the true line (a tie away from the start).
            MoveToEx(b->dc, c[0], c[1]);
            for (int end : { 2, 4 }) {
                const bool ok = within({ c[size_t(end)], c[size_t(end) + 1], c[0], c[1] }, 1 << 20);
                const qint64 dx = qint64(c[size_t(end)]) - c[0], dy = qint64(c[size_t(end) + 1]) - c[1];
                const qint64 steps = std::max(std::abs(dx), std::abs(dy));
                for (qint64 t = 0; ok && pen != GetStockObject(NULL_PEN) && t < steps; ++t) {
                    const auto across
                        = [&](qint64 d) { return (2 * t * std::abs(d) + steps) / (2 * steps) * (d < 0 ? -1 : 1); };
                    mark(c[0] + across(dx), c[1] + across(dy), ink, xorPen);
                }
                ASSERT_EQ(LineTo(b->dc, c[size_t(end)], c[size_t(end) + 1]), ok);
                if (ok)
                    c[0] = c[size_t(end)], c[1] = c[size_t(end) + 1];
            }
        }
        ASSERT_EQ(mismatch(*b, want, before, 0), "");
        SelectObject(b->dc, GetStockObject(BLACK_PEN));
        SelectObject(b->dc, GetStockObject(WHITE_BRUSH));
        DeleteObject(pen);
        DeleteObject(brush);
    }
}

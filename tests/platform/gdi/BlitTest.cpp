#include "GdiTestSupport.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <iterator>
#include <memory>

using namespace zelctl::gdi;
using namespace zelctl::gdi::test;

namespace {

// Grey of one level, 0x00LLLLLL.
constexpr quint32 grey(quint32 level)
{
    return level * 0x010101u;
}

} // namespace

TEST(BitBlt, copiesAndCombinesPixelValues)
{
    TestBitmap src(3, 1, 24);
    TestBitmap dst(3, 1, 24);
    setRow(src, 0, { 0x3C3C3C, 0x3C3C3C, 0x0F0F0F });
    setRow(dst, 0, { 0xF0F0F0, 0xF0F0F0, 0xF0F0F0 });
    ASSERT_TRUE(BitBlt(dst.dc, 0, 0, 1, 1, src.dc, 0, 0, SRCAND));
    ASSERT_TRUE(BitBlt(dst.dc, 1, 0, 1, 1, src.dc, 1, 0, SRCPAINT));
    ASSERT_TRUE(BitBlt(dst.dc, 2, 0, 1, 1, src.dc, 2, 0, SRCCOPY));
    EXPECT_EQ(rowOf(dst, 0, 3), (Values { 0x303030, 0xFCFCFC, 0x0F0F0F }));

    // 32 bits: the operations act on all four bytes, alpha included.
    TestBitmap a(1, 1, 32);
    TestBitmap b(1, 1, 32);
    a.setArgb(0, 0, 0x80FFFF0F);
    b.setArgb(0, 0, 0xFF00FFF0);
    ASSERT_TRUE(BitBlt(b.dc, 0, 0, 1, 1, a.dc, 0, 0, SRCAND));
    EXPECT_EQ(b.argb(0, 0), 0x8000FF00u);
    ASSERT_TRUE(BitBlt(b.dc, 0, 0, 1, 1, a.dc, 0, 0, SRCPAINT));
    EXPECT_EQ(b.argb(0, 0), 0x80FFFF0Fu);
}

TEST(BitBlt, convertsBetweenDepths)
{
    // 8 bits through the table into 24 and 32 bits (opaque).
    TestBitmap indexed(3, 1, 8, false, { 0x000000, 0x102030, 0xFFFFFF });
    indexed.row(0)[0] = 1, indexed.row(0)[1] = 2, indexed.row(0)[2] = 200; // 200: beyond the given entries
    TestBitmap rgb(3, 1, 24);
    TestBitmap argb(3, 1, 32);
    ASSERT_TRUE(BitBlt(rgb.dc, 0, 0, 3, 1, indexed.dc, 0, 0, SRCCOPY));
    ASSERT_TRUE(BitBlt(argb.dc, 0, 0, 3, 1, indexed.dc, 0, 0, SRCCOPY));
    EXPECT_EQ(rowOf(rgb, 0, 3), (Values { 0x102030, 0xFFFFFF, 0x000000 }));
    EXPECT_EQ(argb.argb(0, 0), 0xFF102030u);

    // 32 to 24 drops alpha; 24 to 32 makes it opaque.
    argb.setArgb(1, 0, 0x40ABCDEF);
    ASSERT_TRUE(BitBlt(rgb.dc, 0, 0, 3, 1, argb.dc, 0, 0, SRCCOPY));
    EXPECT_EQ(rgb.rgb(1, 0), 0xABCDEFu);
    ASSERT_TRUE(BitBlt(argb.dc, 2, 0, 1, 1, rgb.dc, 1, 0, SRCCOPY));
    EXPECT_EQ(argb.argb(2, 0), 0xFFABCDEFu);

    // Colours into a table take the nearest entry.
    TestBitmap palette(3, 1, 8, true, { 0x000000, 0xFF0000, 0x00FF00 });
    setRow(rgb, 0, { 0xF01010, 0x10E010, 0x202020 });
    ASSERT_TRUE(BitBlt(palette.dc, 0, 0, 3, 1, rgb.dc, 0, 0, SRCCOPY));
    EXPECT_EQ(Values(palette.row(0), palette.row(0) + 3), (Values { 1, 2, 0 }));

    // 1-bit and 4-bit sources, packed from the high bits.
    TestBitmap mono(3, 1, 1, true, { 0x000000, 0xFFFFFF });
    mono.row(0)[0] = 0xA0; // 1 0 1
    ASSERT_TRUE(BitBlt(rgb.dc, 0, 0, 3, 1, mono.dc, 0, 0, SRCCOPY));
    EXPECT_EQ(rowOf(rgb, 0, 3), (Values { 0xFFFFFF, 0x000000, 0xFFFFFF }));
    TestBitmap nibbles(3, 1, 4, true, { 0, 0x0000FF, 0x00FF00, 0xFF0000 });
    nibbles.row(0)[0] = 0x32, nibbles.row(0)[1] = 0x10;
    ASSERT_TRUE(BitBlt(rgb.dc, 0, 0, 3, 1, nibbles.dc, 0, 0, SRCCOPY));
    EXPECT_EQ(rowOf(rgb, 0, 3), (Values { 0xFF0000, 0x00FF00, 0x0000FF }));

    // Colours into a 1-bit mask: near black is 0, near white is 1.
    setRow(rgb, 0, { 0x202020, 0xE0E0E0, 0x000000 });
    ASSERT_TRUE(BitBlt(mono.dc, 0, 0, 3, 1, rgb.dc, 0, 0, SRCCOPY));
    EXPECT_EQ(mono.row(0)[0] & 0xE0, 0x40);
}

TEST(BitBlt, tablesMapByColourUnlessTheyAreTheSame)
{
    TestBitmap src(2, 1, 4, true, { 0x000000, 0xFF0000 });
    src.row(0)[0] = 0x10; // indices 1, 0
    TestBitmap swapped(2, 1, 8, true, { 0xFF0000, 0x000000 });
    ASSERT_TRUE(BitBlt(swapped.dc, 0, 0, 2, 1, src.dc, 0, 0, SRCCOPY));
    EXPECT_EQ(Values(swapped.row(0), swapped.row(0) + 2), (Values { 0, 1 })) << "red is entry 0 of the target";

    // Equal tables copy indices, even between duplicate entries.
    TestBitmap twins(2, 1, 8, true, { 0x00FF00, 0x00FF00, 0x0000FF, 0x0000FF });
    TestBitmap twinsToo(2, 1, 8, true, { 0x00FF00, 0x00FF00, 0x0000FF, 0x0000FF });
    twins.row(0)[0] = 1, twins.row(0)[1] = 3;
    ASSERT_TRUE(BitBlt(twinsToo.dc, 0, 0, 2, 1, twins.dc, 0, 0, SRCCOPY));
    EXPECT_EQ(Values(twinsToo.row(0), twinsToo.row(0) + 2), (Values { 1, 3 }));

    // Raster operations combine indices.
    twinsToo.row(0)[0] = 0x0C;
    twins.row(0)[0] = 0x03;
    ASSERT_TRUE(BitBlt(twinsToo.dc, 0, 0, 1, 1, twins.dc, 0, 0, SRCPAINT));
    EXPECT_EQ(twinsToo.row(0)[0], 0x0F);
}

TEST(BitBlt, drawsASpriteThroughAMaskWithAndThenOr)
{
    // The two-step transparent draw: the frame's indices with the transparent one white
    // and the others black are ANDed (clearing where the frame is opaque), then the
    // frame's own colours with the transparent entry black are ORed.
    TestBitmap frame(3, 1, 8, true, { 0x000000, 0xFF0000, 0x0000FF });
    frame.row(0)[0] = 0, frame.row(0)[1] = 1, frame.row(0)[2] = 2; // index 0 is transparent
    TestBitmap canvas(3, 1, 24);
    setRow(canvas, 0, { 0x00FF00, 0x00FF00, 0x00FF00 });

    const RGBQUAD mask[3] = { rgbQuad(0xFFFFFF), rgbQuad(0), rgbQuad(0) };
    RGBQUAD saved[3];
    GetDIBColorTable(frame.dc, 0, 3, saved);
    SetDIBColorTable(frame.dc, 0, 3, mask);
    ASSERT_TRUE(BitBlt(canvas.dc, 0, 0, 3, 1, frame.dc, 0, 0, SRCAND));
    SetDIBColorTable(frame.dc, 0, 3, saved);
    ASSERT_TRUE(BitBlt(canvas.dc, 0, 0, 3, 1, frame.dc, 0, 0, SRCPAINT));
    EXPECT_EQ(rowOf(canvas, 0, 3), (Values { 0x00FF00, 0xFF0000, 0x0000FF }));

    // The same with a 1-bit mask bitmap, black and white.
    TestBitmap maskBits(3, 1, 1, true, { 0x000000, 0xFFFFFF });
    maskBits.row(0)[0] = 0x80; // white over the transparent pixel
    setRow(canvas, 0, { 0x123456, 0x123456, 0x123456 });
    ASSERT_TRUE(BitBlt(canvas.dc, 0, 0, 3, 1, maskBits.dc, 0, 0, SRCAND));
    EXPECT_EQ(rowOf(canvas, 0, 3), (Values { 0x123456, 0, 0 }));
}

TEST(BitBlt, clipsAtEveryEdge)
{
    // src(x, y) = 10 * y + x + 1; each case copies 4 × 4 and shows the target's rows.
    TestBitmap src(4, 4, 24);
    for (int y = 0; y < 4; ++y)
        for (int x = 0; x < 4; ++x)
            src.setRgb(x, y, quint32(10 * y + x + 1));
    TestBitmap dst(4, 4, 24, false);
    const struct
    {
        int dx, dy, sx, sy;
        Values rows[4];
    } cases[] = {
        { -1, -2, 0, 0, { { 22, 23, 24, 0 }, { 32, 33, 34, 0 }, { 0, 0, 0, 0 }, { 0, 0, 0, 0 } } },
        { 2, 3, 0, 0, { { 0, 0, 0, 0 }, { 0, 0, 0, 0 }, { 0, 0, 0, 0 }, { 0, 0, 1, 2 } } },
        { 0, 0, -2, -1, { { 0, 0, 0, 0 }, { 0, 0, 1, 2 }, { 0, 0, 11, 12 }, { 0, 0, 21, 22 } } },
        { 0, 0, 3, 2, { { 24, 0, 0, 0 }, { 34, 0, 0, 0 }, { 0, 0, 0, 0 }, { 0, 0, 0, 0 } } },
    };
    for (const auto &c : cases) {
        dst.fill(0, 4, 24);
        ASSERT_TRUE(BitBlt(dst.dc, c.dx, c.dy, 4, 4, src.dc, c.sx, c.sy, SRCCOPY));
        for (int y = 0; y < 4; ++y)
            EXPECT_EQ(rowOf(dst, y, 4), c.rows[y]) << c.dx << "," << c.dy << " from " << c.sx << "," << c.sy;
    }

    // Entirely outside, and empty: nothing happens, which is not a failure.
    dst.fill(7, 4, 24);
    EXPECT_TRUE(BitBlt(dst.dc, 10, 0, 4, 4, src.dc, 0, 0, SRCCOPY));
    EXPECT_TRUE(BitBlt(dst.dc, 0, 0, 4, 4, src.dc, -10, 0, SRCCOPY));
    EXPECT_TRUE(BitBlt(dst.dc, 0, 0, 0, 4, src.dc, 0, 0, SRCCOPY));
    EXPECT_FALSE(StretchBlt(dst.dc, 0, 0, 2, 2, src.dc, 0, 0, 0, 2, SRCCOPY)) << "nothing to sample";
    EXPECT_FALSE(BitBlt(dst.dc, -2147483647, 0, 2147483647, 4, src.dc, 0, 0, SRCCOPY)) << "absurd coordinates";
    EXPECT_EQ(rowOf(dst, 0, 4), (Values { 7, 7, 7, 7 }));
}

// Mirroring and nearest-pixel scaling in general are checked against the sampling rule at
// many scales below; these are the cases that rule does not reach.
TEST(StretchBlt, mirrorsInPlaceCombinesAndClipsAfterScaling)
{
    TestBitmap src(3, 2, 24);
    setRow(src, 0, { 1, 2, 3 });
    setRow(src, 1, { 4, 5, 6 });
    TestBitmap dst(6, 2, 24);
    ASSERT_TRUE(StretchBlt(dst.dc, 2, 0, -3, 2, src.dc, 2, 0, -3, 2, SRCCOPY));
    EXPECT_EQ(rowOf(dst, 0, 3), (Values { 1, 2, 3 })) << "two mirrors cancel";
    ASSERT_TRUE(StretchBlt(dst.dc, 0, 1, 3, -2, src.dc, 0, 0, 3, 2, SRCCOPY));
    EXPECT_EQ(rowOf(dst, 0, 3), (Values { 4, 5, 6 }));
    setRow(dst, 0, { 8, 8, 8, 8, 8, 8 });
    ASSERT_TRUE(StretchBlt(dst.dc, 5, 0, -6, 1, src.dc, 0, 0, 3, 1, SRCPAINT));
    EXPECT_EQ(rowOf(dst, 0, 6), (Values { 11, 11, 10, 10, 9, 9 }));
    ASSERT_TRUE(StretchBlt(dst.dc, -2, 0, 12, 1, src.dc, 0, 0, 3, 1, SRCCOPY));
    EXPECT_EQ(rowOf(dst, 0, 6), (Values { 1, 1, 2, 2, 2, 2 })) << "clipped after scaling";
    SetStretchBltMode(dst.dc, BLACKONWHITE);
    ASSERT_TRUE(StretchBlt(dst.dc, 0, 0, 2, 1, src.dc, 0, 0, 3, 1, SRCCOPY));
    EXPECT_EQ(rowOf(dst, 0, 2), (Values { 1, 3 })) << "sampled as COLORONCOLOR";

    // In place, as frames are flipped within their own rectangle of a strip.
    ASSERT_TRUE(StretchBlt(src.dc, 2, 0, -3, 1, src.dc, 0, 0, 3, 1, SRCCOPY));
    EXPECT_EQ(rowOf(src, 0, 3), (Values { 3, 2, 1 }));
    ASSERT_TRUE(StretchBlt(src.dc, 0, 1, 3, -2, src.dc, 0, 0, 3, 2, SRCCOPY));
    EXPECT_EQ(rowOf(src, 0, 3), (Values { 4, 5, 6 }));
    EXPECT_EQ(rowOf(src, 1, 3), (Values { 3, 2, 1 }));

    // Packed pixels, in place, at an odd offset.
    TestBitmap nibbles(5, 1, 4, true);
    nibbles.row(0)[0] = 0x12, nibbles.row(0)[1] = 0x34, nibbles.row(0)[2] = 0x50;
    ASSERT_TRUE(StretchBlt(nibbles.dc, 3, 0, -3, 1, nibbles.dc, 1, 0, 3, 1, SRCCOPY));
    EXPECT_EQ(Values(nibbles.row(0), nibbles.row(0) + 3), (Values { 0x14, 0x32, 0x50 }));
}

TEST(StretchBlt, halftoneRoundsAndAveragesOtherDepths)
{
    TestBitmap src(2, 2, 24);
    setRow(src, 0, { grey(200), grey(50) });
    TestBitmap dst(1, 1, 24);
    ASSERT_EQ(SetStretchBltMode(dst.dc, HALFTONE), COLORONCOLOR);
    ASSERT_TRUE(StretchBlt(dst.dc, 0, 0, 1, 1, src.dc, 0, 0, 2, 2, SRCCOPY));
    EXPECT_EQ(dst.rgb(0, 0), grey(63)) << "(200+50+0+0)/4 = 62.5 rounds up";

    // An indexed source is averaged in colour; an indexed target takes the nearest entry.
    TestBitmap indexed(2, 1, 8, true, { 0x000000, 0xFFFFFF, 0x808080 });
    indexed.row(0)[0] = 0, indexed.row(0)[1] = 1;
    ASSERT_TRUE(StretchBlt(dst.dc, 0, 0, 1, 1, indexed.dc, 0, 0, 2, 1, SRCCOPY));
    EXPECT_EQ(dst.rgb(0, 0), grey(128));
    TestBitmap target(1, 1, 8, true, { 0x000000, 0xFFFFFF, 0x808080 });
    SetStretchBltMode(target.dc, HALFTONE);
    ASSERT_TRUE(StretchBlt(target.dc, 0, 0, 1, 1, indexed.dc, 0, 0, 2, 1, SRCCOPY));
    EXPECT_EQ(target.row(0)[0], 2);

    // 32 bits: alpha is averaged too.
    TestBitmap alpha(2, 1, 32);
    setRow(alpha, 0, { 0xFF804020, 0x01000000 });
    TestBitmap alphaTarget(1, 1, 32);
    SetStretchBltMode(alphaTarget.dc, HALFTONE);
    ASSERT_TRUE(StretchBlt(alphaTarget.dc, 0, 0, 1, 1, alpha.dc, 0, 0, 2, 1, SRCCOPY));
    EXPECT_EQ(alphaTarget.argb(0, 0), 0x80402010u);
}

TEST(StretchBlt, halftoneClipsItsFootprintToTheSource)
{
    TestBitmap src(2, 1, 24);
    setRow(src, 0, { grey(40), grey(80) });
    TestBitmap dst(2, 1, 24);
    SetStretchBltMode(dst.dc, HALFTONE);
    // The second target pixel averages source pixels 2 and 3, which do not exist, so it
    // is not drawn; the first averages 0 and 1.
    dst.fill(grey(9), 2, 24);
    ASSERT_TRUE(StretchBlt(dst.dc, 0, 0, 2, 1, src.dc, 0, 0, 4, 1, SRCCOPY));
    EXPECT_EQ(rowOf(dst, 0, 2), (Values { grey(60), grey(9) }));
    // Half of the footprint outside: the part inside counts alone.
    ASSERT_TRUE(StretchBlt(dst.dc, 0, 0, 1, 1, src.dc, -1, 0, 2, 1, SRCCOPY));
    EXPECT_EQ(dst.rgb(0, 0), grey(40));
}

TEST(StretchBlt, matchesTheSamplingRulesAtManyScales)
{
    // A 19 × 11 source of varied colours, scaled to several sizes, mirrored or not; each
    // target pixel is checked against the rule worked out here in floating point.
    constexpr int sw = 19, sh = 11;
    TestBitmap src(sw, sh, 32);
    for (int y = 0; y < sh; ++y)
        for (int x = 0; x < sw; ++x)
            src.setArgb(x, y, 0xFF000000u | quint32(x * 13) << 16 | quint32(y * 23) << 8 | quint32((x * y * 7) & 0xFF));
    struct Scale
    {
        int width;
        int height;
    };
    for (const Scale &scale :
        { Scale { 7, 4 }, Scale { 40, 23 }, Scale { 57, 5 }, Scale { 6, 33 }, Scale { 19, 11 } }) {
        for (bool mirrored : { false, true }) {
            for (int mode : { COLORONCOLOR, HALFTONE }) {
                TestBitmap dst(scale.width, scale.height, 32);
                SetStretchBltMode(dst.dc, mode);
                const int x = mirrored ? scale.width - 1 : 0;
                const int w = mirrored ? -scale.width : scale.width;
                ASSERT_TRUE(StretchBlt(dst.dc, x, 0, w, scale.height, src.dc, 0, 0, sw, sh, SRCCOPY));
                for (int ty = 0; ty < scale.height; ++ty) {
                    for (int tx = 0; tx < scale.width; ++tx) {
                        const int lx = mirrored ? scale.width - 1 - tx : tx;
                        const quint32 got = dst.argb(tx, ty);
                        for (int shift : { 0, 8, 16 }) {
                            double want;
                            if (mode == COLORONCOLOR) {
                                const int sx = (2 * lx + 1) * sw / (2 * scale.width);
                                const int sy = (2 * ty + 1) * sh / (2 * scale.height);
                                want = (src.argb(sx, sy) >> shift) & 0xFF;
                            } else {
                                // Coverage-weighted mean over the footprint.
                                const double x0 = double(lx) * sw / scale.width, x1 = double(lx + 1) * sw / scale.width;
                                const double y0 = double(ty) * sh / scale.height,
                                             y1 = double(ty + 1) * sh / scale.height;
                                double sum = 0;
                                for (int sy = int(y0); sy < sh && sy < y1; ++sy)
                                    for (int sx = int(x0); sx < sw && sx < x1; ++sx) {
                                        const double cover = (std::min<double>(sx + 1, x1) - std::max<double>(sx, x0))
                                            * (std::min<double>(sy + 1, y1) - std::max<double>(sy, y0));
                                        sum += cover * ((src.argb(sx, sy) >> shift) & 0xFF);
                                    }
                                want = sum / ((x1 - x0) * (y1 - y0));
                            }
                            ASSERT_LE(std::abs(double((got >> shift) & 0xFF) - want), mode == HALFTONE ? 1.0 : 0.0)
                                << scale.width << "x" << scale.height << (mirrored ? " mirrored" : "") << " mode "
                                << mode << " at " << tx << "," << ty;
                        }
                        ASSERT_EQ(got >> 24, 0xFFu);
                    }
                }
            }
        }
    }
}

TEST(StretchBlt, largeBlitsSplitIntoBandsGiveTheSamePixels)
{
    // Big enough to be shared among threads; every row is checked against the sampling
    // rule, so a band that started or ended on the wrong row would show.
    constexpr int sw = 300, sh = 200, tw = 900, th = 600;
    TestBitmap src(sw, sh, 32);
    for (int y = 0; y < sh; ++y)
        for (int x = 0; x < sw; ++x)
            src.setArgb(x, y, 0xFF000000u | quint32(x & 0xFF) << 16 | quint32(y & 0xFF) << 8 | quint32((x + y) & 0xFF));
    TestBitmap dst(tw, th, 32);
    ASSERT_TRUE(StretchBlt(dst.dc, 0, 0, tw, th, src.dc, 0, 0, sw, sh, SRCCOPY));
    for (int y = 0; y < th; ++y)
        for (int x = 0; x < tw; x += 37)
            ASSERT_EQ(dst.argb(x, y), src.argb(x / 3, y / 3)) << x << "," << y;

    TestBitmap blended(tw, th, 32);
    blended.fill(0xFF000000u, tw, 32);
    BLENDFUNCTION half;
    half.SourceConstantAlpha = 128;
    ASSERT_TRUE(AlphaBlend(blended.dc, 0, 0, tw, th, dst.dc, 0, 0, tw, th, half));
    for (int y = 0; y < th; ++y)
        for (int x = 0; x < tw; x += 41) {
            const quint32 s = dst.argb(x, y), d = blended.argb(x, y);
            for (int shift : { 0, 8, 16 })
                ASSERT_NEAR(double(d >> shift & 0xFF), (s >> shift & 0xFF) * 128 / 255.0, 1.0) << x << "," << y;
        }

    SetStretchBltMode(dst.dc, HALFTONE);
    TestBitmap flat(sw, sh, 24);
    flat.fill(0x405060, sw, 24);
    ASSERT_TRUE(StretchBlt(dst.dc, 0, 0, tw, th, flat.dc, 0, 0, sw, sh, SRCCOPY));
    for (int y = 0; y < th; ++y)
        ASSERT_EQ(dst.argb((y * 7) % tw, y), 0xFF405060u) << y;
}

TEST(StretchBlt, survivesArbitraryArguments)
{
    // Awkward coordinates and extents on every depth: no call may touch memory outside its
    // bitmaps (the sanitizers watch) or the padding at the end of each row.
    const int values[] = { -2147483647 - 1, -134217728, -65536, -7, -1, 0, 1, 3, 9, 65536, 134217728, 2147483647 };
    std::vector<std::unique_ptr<TestBitmap>> bitmaps;
    for (int bpp : { 1, 4, 8, 24, 32 })
        bitmaps.push_back(
            std::make_unique<TestBitmap>(5, 3, bpp, bpp % 8 == 0, std::initializer_list<quint32> { 0, 0xFFFFFF }));
    SetStretchBltMode(bitmaps[3]->dc, HALFTONE);
    const int usedBytes[] = { 1, 3, 5, 15, 20 };
    for (size_t b = 0; b < bitmaps.size(); ++b)
        for (int y = 0; y < 3; ++y)
            std::fill(bitmaps[b]->row(y) + usedBytes[b], bitmaps[b]->row(y) + bitmaps[b]->stride, uchar(0xA5));
    unsigned seed = 1;
    auto pick = [&] {
        seed = seed * 1103515245u + 12345u;
        return values[(seed >> 16) % std::size(values)];
    };
    BLENDFUNCTION over;
    over.AlphaFormat = AC_SRC_ALPHA;
    for (int i = 0; i < 4000; ++i) {
        const TestBitmap &dst = *bitmaps[size_t(i) % bitmaps.size()];
        const TestBitmap &src = *bitmaps[size_t(i / 5) % bitmaps.size()];
        const int a = pick(), b = pick(), c = pick(), d = pick(), e = pick(), f = pick(), g = pick(), h = pick();
        StretchBlt(dst.dc, a % 8, b % 8, c, d, src.dc, e % 8, f % 8, g, h, i % 3 == 0 ? SRCAND : SRCCOPY);
        StretchBlt(dst.dc, a, b, c % 16, d % 16, src.dc, e, f, g % 16, h % 16, SRCPAINT);
        AlphaBlend(dst.dc, a % 8, b % 8, c % 16, d % 16, src.dc, e % 4, f % 4, g % 6, h % 4, over);
    }
    for (size_t b = 0; b < bitmaps.size(); ++b)
        for (int y = 0; y < 3; ++y)
            for (int i = usedBytes[b]; i < bitmaps[b]->stride; ++i)
                ASSERT_EQ(bitmaps[b]->row(y)[i], 0xA5) << "row padding of the " << b << "th bitmap";
}

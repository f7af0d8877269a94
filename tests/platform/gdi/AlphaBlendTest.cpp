#include "GdiTestSupport.h"

#include <gtest/gtest.h>

#include <cmath>

using namespace zelctl::gdi;
using namespace zelctl::gdi::test;

namespace {

BLENDFUNCTION blend(quint8 constant, bool perPixel)
{
    BLENDFUNCTION f;
    f.SourceConstantAlpha = constant;
    f.AlphaFormat = perPixel ? AC_SRC_ALPHA : 0;
    return f;
}

quint32 channel(quint32 pixel, int shift)
{
    return (pixel >> shift) & 0xFF;
}

// dst = src·k + dst·(1 − srcA·k), k = constant / 255, per channel.
double exact(quint32 s, quint32 sa, quint32 d, quint32 constant)
{
    const double k = constant / 255.0;
    return s * k + d * (1.0 - sa / 255.0 * k);
}

} // namespace

TEST(AlphaBlend, followsTheSourceOverFormulaWithinOne)
{
    // Every combination of a few levels in one row: source alpha, a premultiplied colour
    // not above it, the target colour; then each constant alpha (0 draws nothing, 255
    // without per-pixel alpha is a plain copy).
    const quint32 levels[] = { 0, 1, 64, 127, 128, 200, 254, 255 };
    std::vector<quint32> sources, targets;
    for (quint32 sa : levels)
        for (quint32 s : levels)
            for (quint32 d : levels)
                if (s <= sa) {
                    sources.push_back(sa << 24 | s << 16 | (sa - s) << 8 | s / 2);
                    targets.push_back(d << 24 | d << 16 | (255 - d) << 8 | d);
                }
    const int n = int(sources.size());
    TestBitmap src(n, 1, 32);
    for (int i = 0; i < n; ++i)
        src.setArgb(i, 0, sources[size_t(i)]);
    for (quint32 constant : { 0u, 1u, 77u, 128u, 254u, 255u }) {
        for (bool perPixel : { true, false }) {
            TestBitmap dst(n, 1, 32);
            for (int i = 0; i < n; ++i)
                dst.setArgb(i, 0, targets[size_t(i)]);
            ASSERT_TRUE(AlphaBlend(dst.dc, 0, 0, n, 1, src.dc, 0, 0, n, 1, blend(quint8(constant), perPixel)));
            for (int i = 0; i < n; ++i) {
                const quint32 s = sources[size_t(i)], d = targets[size_t(i)], out = dst.argb(i, 0);
                const quint32 sa = perPixel ? s >> 24 : 255;
                for (int shift : { 0, 8, 16, 24 }) {
                    const quint32 sc = shift == 24 ? sa : channel(s, shift);
                    const double want = exact(sc, sa, channel(d, shift), constant);
                    ASSERT_LE(std::abs(double(channel(out, shift)) - want), 1.0)
                        << "pixel " << i << " channel " << shift / 8 << " constant " << constant << " perPixel "
                        << perPixel;
                }
            }
        }
    }
}

TEST(AlphaBlend, stopsChannelsOfBadlyPremultipliedPixelsAt255)
{
    // Red 255 under alpha 16 is not premultiplied; over white it must not wrap round.
    // Nine pixels: eight go through the vector path, the last through the scalar one.
    TestBitmap src(9, 1, 32);
    TestBitmap dst(9, 1, 32);
    src.fill(0x10FF0000, 9, 32);
    dst.fill(0xFFFFFFFF, 9, 32);
    ASSERT_TRUE(AlphaBlend(dst.dc, 0, 0, 9, 1, src.dc, 0, 0, 9, 1, blend(255, true)));
    for (int x = 0; x < 9; ++x)
        EXPECT_EQ(dst.argb(x, 0), 0xFFFFEFEFu) << x;
    dst.fill(0xFFFFFFFF, 9, 32);
    ASSERT_TRUE(AlphaBlend(dst.dc, 0, 0, 9, 1, src.dc, 0, 0, 9, 1, blend(254, true)));
    for (int x = 0; x < 9; ++x)
        EXPECT_EQ(dst.argb(x, 0) >> 16 & 0xFF, 0xFFu) << x;
}

TEST(AlphaBlend, blendsIntoOtherDepthsAndFromOpaqueSources)
{
    // 24-bit target with a premultiplied half-transparent white: 128 + 0.5 · 0.
    TestBitmap src(1, 1, 32);
    src.setArgb(0, 0, 0x80808080);
    TestBitmap rgb(1, 1, 24);
    ASSERT_TRUE(AlphaBlend(rgb.dc, 0, 0, 1, 1, src.dc, 0, 0, 1, 1, blend(255, true)));
    EXPECT_NEAR(double(rgb.rgb(0, 0) & 0xFF), 128.0, 1.0);

    // An indexed source is opaque: constant alpha 128 of white over black.
    TestBitmap indexed(1, 1, 8, true, { 0xFFFFFF });
    TestBitmap target(1, 1, 32);
    target.setArgb(0, 0, 0xFF000000);
    ASSERT_TRUE(AlphaBlend(target.dc, 0, 0, 1, 1, indexed.dc, 0, 0, 1, 1, blend(128, true)));
    EXPECT_NEAR(double(target.argb(0, 0) & 0xFF), 128.0, 1.0);
    EXPECT_EQ(target.argb(0, 0) >> 24, 0xFFu);

    // An indexed target takes the nearest entry of the result.
    TestBitmap palette(1, 1, 8, true, { 0x000000, 0xFFFFFF, 0x7F7F7F });
    ASSERT_TRUE(AlphaBlend(palette.dc, 0, 0, 1, 1, indexed.dc, 0, 0, 1, 1, blend(128, false)));
    EXPECT_EQ(palette.row(0)[0], 2);
}

TEST(AlphaBlend, stretchesByNearestPixelAndClipsTheTarget)
{
    TestBitmap src(2, 1, 32);
    setRow(src, 0, { 0xFF0000FF, 0xFF00FF00 });
    TestBitmap dst(4, 2, 32);
    SetStretchBltMode(dst.dc, HALFTONE); // ignored: blending always takes the nearest pixel
    ASSERT_TRUE(AlphaBlend(dst.dc, 0, 0, 4, 2, src.dc, 0, 0, 2, 1, blend(255, true)));
    for (int y : { 0, 1 })
        EXPECT_EQ(rowOf(dst, y, 4), (Values { 0xFF0000FF, 0xFF0000FF, 0xFF00FF00, 0xFF00FF00 })) << y;

    dst.fill(0, 4, 32);
    ASSERT_TRUE(AlphaBlend(dst.dc, 3, -1, 2, 2, src.dc, 0, 0, 2, 1, blend(255, true)));
    EXPECT_EQ(rowOf(dst, 0, 4), (Values { 0, 0, 0, 0xFF0000FF }));
    EXPECT_EQ(dst.argb(3, 1), 0u);
}

TEST(AlphaBlend, refusesWhatItCannotDo)
{
    TestBitmap src(2, 2, 32);
    TestBitmap dst(2, 2, 32);
    const BLENDFUNCTION over = blend(255, true);
    EXPECT_FALSE(AlphaBlend(dst.dc, 1, 0, -2, 2, src.dc, 0, 0, 2, 2, over)) << "no mirroring";
    EXPECT_FALSE(AlphaBlend(dst.dc, 0, 0, 2, 2, src.dc, 0, 1, 2, -2, over));
    EXPECT_FALSE(AlphaBlend(dst.dc, 0, 0, 2, 2, src.dc, 1, 0, 2, 2, over)) << "source beyond its bitmap";
    EXPECT_FALSE(AlphaBlend(dst.dc, 0, 0, 2, 2, src.dc, -1, 0, 2, 2, over));
    BLENDFUNCTION unknown = over;
    unknown.BlendOp = 1;
    EXPECT_FALSE(AlphaBlend(dst.dc, 0, 0, 2, 2, src.dc, 0, 0, 2, 2, unknown));
    EXPECT_FALSE(AlphaBlend(dst.bitmap, 0, 0, 2, 2, src.dc, 0, 0, 2, 2, over));
}

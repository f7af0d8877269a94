#include "PngPixels.h"
#include "PngTestFiles.h"

#include "platform/WindowHandles.h"
#include "platform/gdi/GdiTestSupport.h"

#include <QPaintEvent>
#include <QTest>
#include <QWidget>

#include <gtest/gtest.h>

#include <climits>

using namespace zelctl;
using namespace zelctl::test;
using gdi::test::TestBitmap;

namespace {

const QByteArray iend = chunk("IEND", {});

// An RGB image whose pixel (x, y) is (10 x, 10 y, 7).
QByteArray rgbFile(int width, int height)
{
    QByteArray rows;
    for (int y = 0; y < height; ++y) {
        rows.append('\0');
        for (int x = 0; x < width; ++x)
            rows.append(char(10 * x)).append(char(10 * y)).append('\7');
    }
    return signature() + ihdr(width, height, 8, 2) + chunk("IDAT", deflate(rows)) + iend;
}

// Three RGBA pixels: transparent red, half-transparent green (alpha 0x80), opaque blue.
QByteArray rgbaFile(const QByteArray &extra = {})
{
    const QByteArray rows = QByteArray::fromHex("00"
                                                "ff000000"
                                                "00ff0080"
                                                "0000ffff");
    return signature() + ihdr(3, 1, 8, 6) + extra + chunk("IDAT", deflate(rows)) + iend;
}

quint32 argbAt(const StdPNG &image, int x, int y)
{
    const auto p = bitmapPixel(image, x, y);
    return quint32(p[3]) << 24 | quint32(p[2]) << 16 | quint32(p[1]) << 8 | p[0];
}

// Answers the progressive-display event with a target, its window (if any) and a position.
void drawProgressivelyInto(StdPNG &image, const TestBitmap *target, QWidget *window = nullptr, QPoint at = {})
{
    QObject::connect(&image, &StdPNG::ProgessiveDisplay,
        [=](qint32, qint32, qint32 &dc, qint32 &hwnd, qint32, bool, qint32 &x, qint32 &y, bool, bool) {
            dc = target ? target->dc : 0;
            hwnd = window ? platform::handleOf(window) : 0;
            x = at.x();
            y = at.y();
        });
}

// Records the rectangles the window is repainted in.
class RecordingWindow : public QWidget
{
public:
    RecordingWindow()
    {
        resize(200, 200);
        show();
        EXPECT_TRUE(QTest::qWaitForWindowExposed(this));
    }
    QList<QRect> painted;

protected:
    void paintEvent(QPaintEvent *event) override { painted.append(event->rect()); }
};

} // namespace

TEST(PngPaint, copiesAtItsOwnSizeAndStretches)
{
    StdPNG image;
    ASSERT_TRUE(image.LoadData(rgbFile(12, 12)));
    ASSERT_EQ(image.BitCount_BMP(), 24);
    TestBitmap target(40, 40, 32);

    image.Paint(target.dc, 2, 3);
    EXPECT_EQ(target.argb(2, 3) & 0xFFFFFF, 0x000007u);
    EXPECT_EQ(target.argb(2 + 11, 3 + 11) & 0xFFFFFF, 0x6E6E07u);
    EXPECT_EQ(target.argb(2 + 12, 3) & 0xFFFFFF, 0u);

    // Twice the size: each pixel covers two by two.
    image.Paint(target.dc, 0, 0, 24, 24);
    EXPECT_EQ(target.argb(2, 4) & 0xFFFFFF, 0x0A1407u);
    EXPECT_EQ(target.argb(23, 23) & 0xFFFFFF, 0x6E6E07u);

    // The top-left 10 × 10 part stretched over 20 × 20.
    TestBitmap part(40, 40, 32);
    image.Paint(part.dc, 0, 0, 20, 20, 0, 0, 0, 10, 10);
    EXPECT_EQ(part.argb(19, 19) & 0xFFFFFF, 0x5A5A07u);
    EXPECT_EQ(part.argb(20, 20), 0u);
}

TEST(PngPaint, blendsThirtyTwoBitImagesWithTheirAlphaAndAConstantOpacity)
{
    StdPNG image;
    image.setTransparentStyle(StdPNG::alphaTransparent);
    ASSERT_TRUE(image.LoadData(rgbaFile()));
    ASSERT_EQ(image.BitCount_BMP(), 32);
    EXPECT_EQ(argbAt(image, 0, 0), 0u);
    EXPECT_EQ(argbAt(image, 1, 0), 0x80008000u);

    TestBitmap target(3, 1, 32);
    target.fill(0xFFFFFFFFu, 3, 32);
    image.Paint(target.dc, 0, 0);
    EXPECT_EQ(target.argb(0, 0) & 0xFFFFFF, 0xFFFFFFu); // transparent: the target shows
    EXPECT_NEAR(int(target.argb(1, 0) >> 16 & 0xFF), 0x7F, 1); // half green over white
    EXPECT_EQ(target.argb(1, 0) >> 8 & 0xFF, 0xFFu);
    EXPECT_EQ(target.argb(2, 0) & 0xFFFFFF, 0x0000FFu);

    target.fill(0xFF000000u, 3, 32);
    image.Paint(target.dc, 0, 0, 0, 0, 0, 0, 0, 0, 0, 128);
    EXPECT_NEAR(int(target.argb(2, 0) & 0xFF), 128, 1);
}

TEST(PngPaint, drawsNothingWithoutWhatItNeeds)
{
    StdPNG image;
    TestBitmap target(4, 4, 32);
    image.Paint(target.dc, 0, 0); // no bitmap yet
    ASSERT_TRUE(image.LoadData(rgbFile(4, 4)));
    image.Paint(0, 0, 0);
    image.Paint(target.dc, 0, 0, -1, 4);
    image.Paint(target.dc, 0, 0, 4, -1);
    EXPECT_EQ(target.argb(3, 3), 0u);
    // Nor while a load of the same object runs.
    QObject::connect(&image, &StdPNG::Progress, [&](qint32) { image.Paint(target.dc, 0, 0); });
    ASSERT_TRUE(image.LoadData(rgbFile(4, 4)));
    EXPECT_EQ(target.argb(3, 3), 0u);
}

TEST(PngPaint, drawsNothingWhollyBesideTheTarget)
{
    static constexpr quint32 untouched = 0xFF123456u;
    const auto expectUntouched = [](const TestBitmap &target, const std::string &what) {
        for (int y = 0; y < 10; ++y) {
            for (int x = 0; x < 10; ++x)
                ASSERT_EQ(target.argb(x, y), untouched) << what << " at " << x << "," << y;
        }
    };
    // Left, right, above and below the 10 × 10 target, and at the ends of the coordinates.
    const QPoint places[] = { { -40, 2 }, { 10, 2 }, { 2, -40 }, { 2, 10 }, { INT_MIN, 0 }, { INT_MAX, 0 },
        { 0, INT_MIN }, { 0, INT_MAX } };
    struct Bitmap
    {
        QByteArray file;
        bool make32;
        int bitCount;
    };
    const Bitmap bitmaps[] = { { greyFile(4, 4), false, 8 }, { rgbFile(4, 4), false, 24 }, { rgbFile(4, 4), true, 32 },
        { rgbaFile(), false, 32 }, { writeWithLibpng({ 12, 12, 6, 8, true, false, 4 }), false, 32 } };
    TestBitmap target(10, 10, 32);
    RecordingWindow window;
    for (const Bitmap &bitmap : bitmaps) {
        for (const QPoint place : places) {
            const std::string what = std::to_string(bitmap.bitCount) + " bits at " + std::to_string(place.x()) + ","
                + std::to_string(place.y());
            target.fill(untouched, 10, 32);
            StdPNG image;
            image.setTransparentStyle(StdPNG::alphaTransparent);
            ASSERT_TRUE(image.LoadData(bitmap.file, true, bitmap.make32));
            ASSERT_EQ(image.BitCount_BMP(), bitmap.bitCount);
            image.Paint(target.dc, place.x(), place.y());
            image.Paint(target.dc, place.x(), place.y(), 30, 30);
            expectUntouched(target, what);

            // The progressive display, started beside its target, shows nothing either.
            StdPNG shown;
            shown.setTransparentStyle(StdPNG::alphaTransparent);
            drawProgressivelyInto(shown, &target, &window, place);
            ASSERT_TRUE(shown.LoadData(bitmap.file, true, bitmap.make32)) << what;
            expectUntouched(target, "progressive, " + what);
        }
    }
}

TEST(PngPaint, worksWithoutItsOwnDcThroughTheCallersDc)
{
    StdPNG image;
    ASSERT_TRUE(image.LoadData(rgbFile(4, 4)));
    EXPECT_NE(image.hdc(), 0);
    const qint32 bitmap = image.handle();
    ASSERT_NE(bitmap, 0);

    image.setHasOwnDC(false);
    EXPECT_EQ(image.hdc(), 0);
    EXPECT_EQ(image.handle(), bitmap);
    EXPECT_FALSE(image.HasOwnDC());

    TestBitmap target(4, 4, 32);
    image.Paint(target.dc, 0, 0);
    EXPECT_EQ(target.argb(3, 3), 0u);

    // The caller's DC gets the bitmap for the call and its own bitmap back afterwards.
    const gdi::HDC borrowed = gdi::CreateCompatibleDC(0);
    const gdi::HGDIOBJ before = gdi::GetCurrentObject(borrowed, gdi::OBJ_BITMAP);
    image.Paint(target.dc, 0, 0, 0, 0, borrowed);
    EXPECT_EQ(target.argb(3, 3) & 0xFFFFFF, 0x1E1E07u);
    EXPECT_EQ(gdi::GetCurrentObject(borrowed, gdi::OBJ_BITMAP), before);
    gdi::DeleteDC(borrowed);

    // A load made without an own DC ends without one; turning it on again makes one.
    ASSERT_TRUE(image.LoadData(rgbFile(4, 4)));
    EXPECT_EQ(image.hdc(), 0);
    image.setHasOwnDC(true);
    EXPECT_NE(image.hdc(), 0);
}

TEST(PngTransparency, keepsOrDropsAlphaByStyle)
{
    StdPNG image;
    image.setTransparentStyle(StdPNG::alphaNoBkgNoAlpha);
    ASSERT_TRUE(image.LoadData(rgbaFile()));
    EXPECT_EQ(image.BitCount_BMP(), 24);
    EXPECT_EQ(argbAt(image, 0, 0), 0xFFFF0000u); // colour kept as it is
    TestBitmap target(3, 1, 32);
    image.Paint(target.dc, 0, 0);
    EXPECT_EQ(target.argb(0, 0) & 0xFFFFFF, 0xFF0000u);

    // On its bKGD colour, or white without one; the result is opaque.
    image.setTransparentStyle(StdPNG::alphaPNGwindowBkg);
    ASSERT_TRUE(image.LoadData(rgbaFile(chunk("bKGD", QByteArray::fromHex("000000000040")))));
    EXPECT_EQ(argbAt(image, 0, 0), 0xFF000040u);
    EXPECT_EQ(argbAt(image, 1, 0), 0xFF00801Fu);
    ASSERT_TRUE(image.LoadData(rgbaFile()));
    EXPECT_EQ(argbAt(image, 0, 0), 0xFFFFFFFFu);

    // alphaTransColorBkg drops the alpha of alpha images.
    image.setTransparentStyle(StdPNG::alphaTransColorBkg);
    ASSERT_TRUE(image.LoadData(rgbaFile()));
    EXPECT_EQ(image.BitCount_BMP(), 24);

    // A colour, the default black, and a system colour.
    image.setTransparentStyle(0x00FF00);
    ASSERT_TRUE(image.LoadData(rgbaFile()));
    EXPECT_EQ(argbAt(image, 0, 0), 0xFF00FF00u);
    image.setTransparentStyle(0);
    ASSERT_TRUE(image.LoadData(rgbaFile()));
    EXPECT_EQ(argbAt(image, 0, 0), 0xFF000000u);
    image.setTransparentStyle(qint32(platform::systemColor(platform::COLOR_INFOBK)));
    ASSERT_TRUE(image.LoadData(rgbaFile()));
    const quint32 info = platform::GetSysColor(platform::COLOR_INFOBK);
    EXPECT_EQ(argbAt(image, 0, 0), 0xFF000000u | (info & 0xFF) << 16 | (info & 0xFF00) | (info >> 16 & 0xFF));
}

TEST(PngTransparency, laysKeyedImagesOnTheirKeyColour)
{
    // RGB with key (1, 2, 3): pixel 0 matches the key.
    const QByteArray rgb = signature() + ihdr(2, 1, 8, 2) + chunk("tRNS", QByteArray::fromHex("000100020003"))
        + chunk("IDAT", deflate(QByteArray::fromHex("00010203aabbcc"))) + iend;
    StdPNG image;
    image.setTransparentStyle(StdPNG::alphaTransColorBkg);
    ASSERT_TRUE(image.LoadData(rgb));
    EXPECT_EQ(argbAt(image, 0, 0), 0xFF010203u);
    EXPECT_EQ(argbAt(image, 1, 0), 0xFFAABBCCu);

    image.setTransparentStyle(StdPNG::alphaTransparent);
    ASSERT_TRUE(image.LoadData(rgb));
    EXPECT_EQ(argbAt(image, 0, 0), 0u);
    EXPECT_EQ(argbAt(image, 1, 0), 0xFFAABBCCu);

    // A palette image with transparency keeps its palette bitmap under alphaTransColorBkg.
    const QByteArray indexed = signature() + ihdr(2, 1, 8, 3) + chunk("PLTE", QByteArray::fromHex("102030405060"))
        + chunk("tRNS", QByteArray(1, '\0')) + chunk("IDAT", deflate(QByteArray::fromHex("000001"))) + iend;
    image.setTransparentStyle(StdPNG::alphaTransColorBkg);
    ASSERT_TRUE(image.LoadData(indexed));
    EXPECT_EQ(image.BitCount_BMP(), 8);
    EXPECT_EQ(argbAt(image, 0, 0), 0xFF102030u);
}

TEST(PngTransparency, bakesTheOpacityIntoAnImageOnABackground)
{
    StdPNG image;
    image.setTransparentStyle(0x0000FF); // red
    ASSERT_TRUE(image.LoadData(rgbaFile(), true, false, 128));
    EXPECT_EQ(argbAt(image, 0, 0), 0x80800000u);
    EXPECT_EQ(argbAt(image, 2, 0), 0x80000080u);
}

TEST(PngEvents, describeTheImageToTheProgressiveHandler)
{
    StdPNG image;
    int calls = 0;
    QObject::connect(&image, &StdPNG::ProgessiveDisplay,
        [&](qint32 width, qint32 height, qint32 &, qint32 &, qint32 background, bool alpha, qint32 &, qint32 &,
            bool interlaced, bool progression) {
            ++calls;
            EXPECT_EQ(width, 3);
            EXPECT_EQ(height, 1);
            EXPECT_EQ(background, 0x400000);
            EXPECT_TRUE(alpha);
            EXPECT_FALSE(interlaced);
            EXPECT_FALSE(progression);
            // Properties stay readable for an alpha image, and a second load is refused.
            EXPECT_EQ(image.Width(), 3);
            EXPECT_FALSE(image.LoadData(rgbaFile()));
        });
    ASSERT_TRUE(image.LoadData(rgbaFile(chunk("bKGD", QByteArray::fromHex("000000000040")))));
    EXPECT_EQ(calls, 1);

    image.setProgressiveDisplay(StdPNG::pngPixelated);
    EXPECT_EQ(image.ProgressiveDisplay(), StdPNG::pngAuto);
    image.setProgressiveDisplay(StdPNG::pngNeverProgressive);
    ASSERT_TRUE(image.LoadData(rgbaFile()));
    EXPECT_EQ(calls, 1);
}

TEST(PngEvents, hideThePropertiesOfAnOpaqueImageWhileItDecodes)
{
    StdPNG image;
    QList<qint32> widths;
    QObject::connect(&image, &StdPNG::ProgessiveDisplay,
        [&](qint32, qint32, qint32 &, qint32 &, qint32, bool, qint32 &, qint32 &, bool interlaced, bool progression) {
            widths.append(image.Width());
            EXPECT_TRUE(interlaced && progression);
        });
    QObject::connect(&image, &StdPNG::Progress, [&](qint32) { widths.append(image.Width()); });
    ASSERT_TRUE(image.LoadData(writeWithLibpng({ 5, 5, 2, 8, true, false, 9 })));
    // Progress(0) and the event see the header; the passes that follow do not.
    EXPECT_EQ(widths.mid(0, 3), (QList<qint32> { 5, 5, 0 }));
    EXPECT_EQ(widths.last(), 0);
    EXPECT_EQ(image.Width(), 5);
}

TEST(PngEvents, paintOnceAtTheEndForATargetWithoutWindowAndNothingWithoutATarget)
{
    for (const bool withTarget : { true, false }) {
        StdPNG image;
        TestBitmap target(20, 20, 32);
        drawProgressivelyInto(image, withTarget ? &target : nullptr, nullptr, QPoint(2, 3));
        ASSERT_TRUE(image.LoadData(rgbFile(12, 12)));
        EXPECT_EQ(target.argb(2 + 11, 3 + 11) & 0xFFFFFF, withTarget ? 0x6E6E07u : 0u);
    }
}

TEST(PngEvents, scanTheImageInBlocksOfSixteenRows)
{
    StdPNG image;
    RecordingWindow window;
    TestBitmap target(60, 60, 32);
    drawProgressivelyInto(image, &target, &window, QPoint(1, 2));
    // When row 32 is restored, rows 16-31 are converted next; rows 0-15 are already shown.
    QObject::connect(&image, &StdPNG::Progress, [&](qint32 percentage) {
        if (percentage == 32 * 100 / 40) {
            EXPECT_EQ(target.argb(1, 2 + 15) & 0xFFFFFF, 0x009607u);
            EXPECT_EQ(target.argb(1, 2 + 16), 0u);
        }
    });
    window.painted.clear();
    ASSERT_TRUE(image.LoadData(rgbFile(3, 40)));
    EXPECT_EQ(window.painted, (QList<QRect> { QRect(1, 2, 3, 16), QRect(1, 18, 3, 16), QRect(1, 34, 3, 8) }));
    EXPECT_EQ(target.argb(3, 2 + 39) & 0xFFFFFF, 0x148607u);
}

TEST(PngEvents, showInterlacedPassesPixelatedOrFadingToTheSameImage)
{
    const QByteArray file = writeWithLibpng({ 19, 13, 2, 8, true, false, 21 });
    StdPNG plain;
    ASSERT_TRUE(plain.LoadData(file, true, true));

    for (const quint8 mode : { quint8(StdPNG::pngAuto), quint8(StdPNG::pngFadeIn) }) {
        StdPNG image;
        image.setProgressiveDisplay(mode);
        RecordingWindow window;
        TestBitmap target(19, 13, 32);
        drawProgressivelyInto(image, &target, &window);
        window.painted.clear();
        ASSERT_TRUE(image.LoadData(file, true, true));
        EXPECT_EQ(window.painted.size(), 7) << int(mode);
        // Blocks of early passes never overwrite pixels that are already final.
        for (int y = 0; y < 13; ++y) {
            for (int x = 0; x < 19; ++x) {
                ASSERT_EQ(argbAt(image, x, y), argbAt(plain, x, y)) << int(mode) << " at " << x << "," << y;
                ASSERT_EQ(target.argb(x, y) | 0xFF000000u, argbAt(plain, x, y)) << int(mode) << " at " << x << "," << y;
            }
        }
    }
}

TEST(PngEvents, stopWhenAHandlerDeletesTheImage)
{
    for (const int when : { 0, 40 }) {
        auto *image = new StdPNG;
        QObject::connect(image, &StdPNG::Progress, [&](qint32 percentage) {
            if (percentage == when)
                delete image;
        });
        EXPECT_FALSE(image->LoadData(rgbFile(3, 40))) << when;
    }
}

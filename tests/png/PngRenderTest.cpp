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

// Three RGBA pixels: transparent red, half-transparent green (alpha 0x80), opaque blue.
QByteArray rgbaFile(const QByteArray &extra = {})
{
    const QByteArray rows = QByteArray::fromHex("00"
                                                "ff000000"
                                                "00ff0080"
                                                "0000ffff");
    return signature() + ihdr(3, 1, 8, 6) + extra + chunk("IDAT", deflate(rows)) + iend;
}

// Answers the progressive-display event with a target, its window and a position, refusing a
// second load meanwhile; keeps what it described (size, background, alpha, interlacing, progression).
void drawProgressivelyInto(StdPNG &image, const TestBitmap *target, QWidget *window = nullptr, QPoint at = {},
    QList<qint32> *described = nullptr)
{
    QObject::connect(&image, &StdPNG::ProgessiveDisplay,
        [=, &image](qint32 width, qint32 height, qint32 &dc, qint32 &hwnd, qint32 background, bool alpha, qint32 &x,
            qint32 &y, bool interlaced, bool progression) {
            EXPECT_FALSE(image.LoadData(greyFile(1, 1))) << "a second load is refused";
            if (described)
                *described = { width, height, background, alpha, interlaced, progression };
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
    std::function<void()> onPaint = [] {};

protected:
    void paintEvent(QPaintEvent *event) override
    {
        painted.append(event->rect());
        onPaint();
    }
};

} // namespace

TEST(PngPaint, drawsNothingWithoutWhatItNeedsOrWhollyBesideTheTarget)
{
    TestBitmap target(10, 10, 32);
    target.fill(0xFF123456u);
    const QByteArray untouched = target.bytes();
    const auto expectUntouched = [&](const std::string &what) { ASSERT_EQ(target.bytes(), untouched) << what; };
    // No bitmap yet, no DC, a negative size, a paint from a load of the same object.
    StdPNG image;
    image.Paint(target.dc, 0, 0);
    ASSERT_TRUE(image.LoadData(greyFile(4, 4)));
    image.Paint(0, 0, 0);
    image.Paint(target.dc, 0, 0, -1, 4);
    QObject::connect(&image, &StdPNG::Progress, [&](qint32) { image.Paint(target.dc, 0, 0); });
    ASSERT_TRUE(image.LoadData(greyFile(4, 4)));
    expectUntouched("without what it needs");

    // Left, right, above and below the 10 × 10 target, and at the ends of the coordinates.
    const QPoint places[] = { { -40, 2 }, { 10, 2 }, { 2, -40 }, { 2, 10 }, { INT_MIN, 0 }, { INT_MAX, 0 },
        { 0, INT_MIN }, { 0, INT_MAX } };
    // Bitmaps of 8, 24 and 32 bits (made so, with alpha, interlaced with alpha).
    const QByteArray rgb = writeWithLibpng({ 4, 4, 2, 8, false, false, 3 });
    const std::pair<QByteArray, bool> bitmaps[] = { { greyFile(4, 4), false }, { rgb, false }, { rgb, true },
        { rgbaFile(), false }, { writeWithLibpng({ 12, 12, 6, 8, true, false, 4 }), false } };
    RecordingWindow window;
    for (const auto &[file, make32] : bitmaps) {
        for (const QPoint place : places) {
            const std::string what = file.toHex().left(80).toStdString() + " at " + std::to_string(place.x()) + ","
                + std::to_string(place.y());
            StdPNG image;
            image.setTransparentStyle(StdPNG::alphaTransparent);
            ASSERT_TRUE(image.LoadData(file, true, make32));
            image.Paint(target.dc, place.x(), place.y());
            image.Paint(target.dc, place.x(), place.y(), 30, 30);
            expectUntouched(what);

            // The progressive display, started beside its target, shows nothing either.
            StdPNG shown;
            shown.setTransparentStyle(StdPNG::alphaTransparent);
            drawProgressivelyInto(shown, &target, &window, place);
            ASSERT_TRUE(shown.LoadData(file, true, make32)) << what;
            expectUntouched("progressive, " + what);
        }
    }
}

TEST(PngPaint, worksWithoutItsOwnDcThroughTheCallersDc)
{
    StdPNG image;
    ASSERT_TRUE(image.LoadData(greyFile(4, 4)));
    EXPECT_NE(image.hdc(), 0);
    const qint32 bitmap = image.handle();
    ASSERT_NE(bitmap, 0);

    image.setHasOwnDC(false);
    EXPECT_EQ(image.hdc(), 0);
    EXPECT_EQ(image.handle(), bitmap);

    TestBitmap target(4, 4, 32);
    image.Paint(target.dc, 0, 0);
    EXPECT_EQ(target.value(3, 3), 0u);

    // The caller's DC gets the bitmap for the call and its own bitmap back afterwards.
    const gdi::HDC borrowed = gdi::CreateCompatibleDC(0);
    const gdi::HGDIOBJ before = gdi::GetCurrentObject(borrowed, gdi::OBJ_BITMAP);
    image.Paint(target.dc, 0, 0, 0, 0, borrowed);
    EXPECT_EQ(target.value(3, 3) & 0xFFFFFF, 0x060606u);
    EXPECT_EQ(gdi::GetCurrentObject(borrowed, gdi::OBJ_BITMAP), before);
    gdi::DeleteDC(borrowed);
}

TEST(PngTransparency, laysAlphaAndKeyedImagesOnTheirBackgroundByStyle)
{
    // What the styles' golden pictures do not show: RGB keyed by pixel 0, a palette with entry 0 clear.
    const QByteArray keyed = signature() + ihdr(2, 1, 8, 2) + chunk("tRNS", QByteArray::fromHex("000100020003"))
        + chunk("IDAT", deflate(QByteArray::fromHex("00010203aabbcc"))) + iend;
    const QByteArray indexed = signature() + ihdr(2, 1, 8, 3) + chunk("PLTE", QByteArray::fromHex("102030405060"))
        + chunk("tRNS", QByteArray(1, '\0')) + chunk("IDAT", deflate(QByteArray::fromHex("000001"))) + iend;
    const struct
    {
        QByteArray file;
        qint32 style;
        int bitCount;
        QList<quint32> pixels;
        quint8 opacity = 255;
    } cases[] = {
        { rgbaFile(chunk("bKGD", QByteArray::fromHex("000000000040"))), StdPNG::alphaPNGwindowBkg, 32,
            { 0xFF000040u, 0xFF00801Fu, 0xFF0000FFu } },
        { rgbaFile(), 0x0000FF, 32, { 0x80800000u, 0x803F4000u, 0x80000080u }, 128 }, // the opacity baked in
        { keyed, StdPNG::alphaTransColorBkg, 32, { 0xFF010203u, 0xFFAABBCCu } },
        { indexed, StdPNG::alphaTransColorBkg, 8, { 0xFF102030u, 0xFF405060u } }, // keeps its palette
    };
    for (const auto &c : cases) {
        StdPNG image;
        image.setTransparentStyle(c.style);
        ASSERT_TRUE(image.LoadData(c.file, true, false, c.opacity));
        EXPECT_EQ(image.BitCount_BMP(), c.bitCount) << c.style;
        const QImage bitmap = bitmapOf(image);
        QList<quint32> pixels;
        for (int x = 0; x < c.pixels.size(); ++x)
            pixels.append(argbAt(bitmap, x, 0));
        EXPECT_EQ(pixels, c.pixels) << c.style;
    }
}

TEST(PngEvents, showSixteenRowBlocksInAWindowOrTheImageOnceAtTheEnd)
{
    RecordingWindow window;
    for (const int targets : { 2, 1, 0 }) { // a DC in a window, a DC alone, nothing
        SCOPED_TRACE(targets);
        StdPNG image;
        TestBitmap target(60, 60, 32);
        QList<qint32> described;
        drawProgressivelyInto(
            image, targets ? &target : nullptr, targets == 2 ? &window : nullptr, QPoint(1, 2), &described);
        // When row 32 is restored, rows 16-31 are converted next; rows 0-15 are already shown.
        QList<quint32> midway;
        QObject::connect(&image, &StdPNG::Progress, [&](qint32 percentage) {
            if (percentage == 32 * 100 / 40)
                midway = { target.value(1, 2 + 15) & 0xFFFFFF, target.value(1, 2 + 16) };
        });
        window.painted.clear();
        ASSERT_TRUE(image.LoadData(greyFile(3, 40)));
        EXPECT_EQ(midway, (targets == 2 ? QList<quint32> { 0x0F0F0Fu, 0 } : QList<quint32> { 0, 0 }));
        EXPECT_EQ(window.painted,
            (targets == 2 ? QList<QRect> { QRect(1, 2, 3, 16), QRect(1, 18, 3, 16), QRect(1, 34, 3, 8) }
                          : QList<QRect> {}));
        EXPECT_EQ(target.value(3, 2 + 39) & 0xFFFFFF, targets ? 0x292929u : 0u);
        EXPECT_EQ(described, (QList<qint32> { 3, 40, -1, 0, 0, 0 }));
    }
}

TEST(PngEvents, showInterlacedPassesPixelatedOrFadingInToTheSameImage)
{
    const QByteArray file = writeWithLibpng({ 19, 13, 2, 8, true, false, 21 });
    StdPNG plain;
    ASSERT_TRUE(plain.LoadData(file, true, true));
    const QImage final = bitmapOf(plain);
    const quint32 first = argbAt(final, 0, 0);
    ASSERT_NE(argbAt(final, 7, 7), first);
    // Pass 1 knows pixel (0, 0) only: pixelated, it fills its 8 × 8 block; fading in, it
    // shows at a seventh of its strength on the black target, and (7, 7) stays black.
    const auto seventh = [](quint32 c) {
        return 0xFF000000u | (c >> 16 & 0xFF) * 36 / 255 << 16 | (c >> 8 & 0xFF) * 36 / 255 << 8
            | (c & 0xFF) * 36 / 255;
    };
    const std::pair<quint8, QList<quint32>> modes[]
        = { { StdPNG::pngAuto, { first, first } }, { StdPNG::pngFadeIn, { seventh(first), 0xFF000000u } } };
    for (const auto &[mode, afterFirstPass] : modes) {
        SCOPED_TRACE(int(mode));
        StdPNG image;
        image.setProgressiveDisplay(mode);
        RecordingWindow window;
        TestBitmap target(19, 13, 32);
        QList<qint32> described;
        drawProgressivelyInto(image, &target, &window, {}, &described);
        QList<QList<quint32>> displays; // pixels (0, 0) and (7, 7) at each display
        window.painted.clear();
        window.onPaint = [&] {
            displays.append({ target.value(0, 0) | 0xFF000000u, target.value(7, 7) | 0xFF000000u });
        };
        ASSERT_TRUE(image.LoadData(file, true, true));
        ASSERT_EQ(window.painted.size(), 7);
        EXPECT_EQ(described, (QList<qint32> { 19, 13, -1, 0, 1, 1 }));
        for (int i : { 0, 1 }) {
            for (int shift : { 0, 8, 16 }) // blending may round up
                EXPECT_NEAR(int(displays.first()[i] >> shift & 0xFF), int(afterFirstPass[i] >> shift & 0xFF), 1) << i;
        }
        // Blocks of early passes never overwrite pixels that are already final.
        EXPECT_EQ(bitmapOf(image), final);
        for (int y = 0; y < 13; ++y) {
            for (int x = 0; x < 19; ++x)
                ASSERT_EQ(target.value(x, y) | 0xFF000000u, argbAt(final, x, y)) << x << "," << y;
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
        EXPECT_FALSE(image->LoadData(greyFile(3, 40))) << when;
    }
}

#include "GifFiles.h"

#include "gif/GifLimits.h"
#include "gif/ucAniGIF.h"
#include "platform/Twips.h"
#include "png/StdPNG.h"
#include "support/TestSupport.h"

#include <QDir>
#include <QHash>
#include <QPointer>
#include <QSignalSpy>
#include <QTemporaryDir>
#include <QTest>

#include <gtest/gtest.h>

#include <limits>

using namespace zelctl;
using test::GifFrame;
using test::gifOf;

namespace {

constexpr quint32 Red = 0xFF0000, Green = 0x00FF00, Blue = 0x0000FF, Grey = 0x808080;
constexpr quint32 Yellow = 0xFFFF00; // the control's background in these tests
const QList<quint32> palette = { Red, Green, Blue, Grey };

// Frames over a 6 × 4 canvas with index 3 transparent:
//   1 (0,0) 6×4, left half red, disposal 1     3 (2,0) 3×3 blue, disposal 3
//   2 (1,1) 3×2 green, disposal 2              4 (5,3) 1×1 green, opaque, disposal 0
QByteArray layeredGif()
{
    return gifOf(6, 4, palette,
        { { 0, 0, 6, 4, QByteArray("\0\0\0\3\3\3\0\0\0\3\3\3\0\0\0\3\3\3\0\0\0\3\3\3", 24), 1, 10, 3 },
            { 1, 1, 3, 2, QByteArray("\1\3\1\1\1\3", 6), 2, 10, 3 },
            { 2, 0, 3, 3, QByteArray("\2\3\2\3\2\3\2\2\3", 9), 3, 10, 3 }, { 5, 3, 1, 1, "\1" } });
}

// Frames of 2 × 2 pixels in the palette's colours.
QByteArray solidFrames(int count, int loops = 0)
{
    QList<GifFrame> frames;
    for (int i = 0; i < count; ++i)
        frames.append({ 0, 0, 2, 2, QByteArray(4, char(i)) });
    return gifOf(2, 2, palette, frames, loops);
}

// The rows of a picture, '|' between them, one letter a pixel.
std::string shownPixels(const QImage &image)
{
    static const QHash<quint32, QChar> letters
        = { { Red, 'R' }, { Green, 'G' }, { Blue, 'B' }, { Yellow, '.' }, { 0x222222, 'd' } };
    QStringList rows;
    for (int y = 0; y < image.height(); ++y) {
        QString row;
        for (int x = 0; x < image.width(); ++x)
            row += letters.value(image.pixel(x, y) & 0xFFFFFF, '?');
        rows << row;
    }
    return rows.join('|').toStdString();
}

class AniGif : public ::testing::Test
{
protected:
    void SetUp() override
    {
        Ambient ambient;
        ambient.BackColor = 0x0000FFFF; // yellow as OLE_COLOR
        gif.setAmbient(ambient);
        gif.InitNew();
        gif.setDelayAnimation(ucAniGIF::gfdDoNotAnimate);
        gif.setStretch(ucAniGIF::gfsActualSize);
        gif.show();
        ASSERT_TRUE(QTest::qWaitForWindowExposed(&gif));
    }

    std::string picture()
    {
        gif.repaint();
        return shownPixels(gif.surface().image());
    }

    ucAniGIF gif;
};

} // namespace

TEST_F(AniGif, composesFramesWithDisposalTransparencyAndMirroring)
{
    ASSERT_TRUE(gif.LoadAnimatedGIF_Array(layeredGif()));
    EXPECT_EQ(gif.FrameCount(), 4);
    EXPECT_EQ(gif.size(), QSize(6, 4));
    QSignalSpy changed(&gif, &ucAniGIF::FrameChanged);

    const std::string first = "RRR...|RRR...|RRR...|RRR...";
    EXPECT_EQ(picture(), first);
    gif.setAction(ucAniGIF::gfaForward);
    EXPECT_EQ(picture(), "RRR...|RGRG..|RGG...|RRR...");
    EXPECT_EQ(picture(), "RRR...|RGRG..|RGG...|RRR...") << "painting the same frame again changes nothing";
    gif.setAction(ucAniGIF::gfaForward);
    EXPECT_EQ(picture(), "RRB.B.|R..B..|R.BB..|RRR...") << "disposal 2 cleared frame 2";
    // Mirrored, the picture and the frame positions turn.
    gif.setMirrored(ucAniGIF::gfmHorizontal);
    EXPECT_EQ(picture(), ".B.BRR|..B..R|..BB.R|...RRR");
    gif.setMirrored(ucAniGIF::gfmVertical);
    EXPECT_EQ(picture(), "RRR...|R.BB..|R..B..|RRB.B.");
    gif.setMirrored(ucAniGIF::gfmNone);
    gif.setAction(ucAniGIF::gfaForward);
    EXPECT_EQ(picture(), "RRR...|R.....|R.....|RRR..G") << "disposal 3 put frame 2's clearing back";
    gif.setAction(ucAniGIF::gfaForward);
    EXPECT_EQ(picture(), first) << "after the last frame the picture starts again";
    EXPECT_EQ(gif.Action(), ucAniGIF::gfaPause);
    ASSERT_FALSE(changed.isEmpty());
    EXPECT_EQ(changed.last().first().toInt(), 1);
}

TEST_F(AniGif, stretchModesSizeAndScaleThePicture)
{
    ASSERT_TRUE(gif.LoadAnimatedGIF_Array(layeredGif()));
    EXPECT_EQ(gif.ActualWidth(), platform::twipsFromPixels(6));
    gif.setStretch(ucAniGIF::gfsStretch);
    gif.resize(12, 2);
    EXPECT_EQ(gif.size(), QSize(12, 2)) << "stretch keeps the control's size";
    EXPECT_EQ(picture(), "RRRRRR......|RRRRRR......");

    const std::tuple<int, QSize, QSize> fits[] = { { ucAniGIF::gfsScaleAlways, { 12, 12 }, { 12, 8 } },
        { ucAniGIF::gfsShrinkScaleToFit, { 12, 12 }, { 6, 4 } }, { ucAniGIF::gfsShrinkScaleToFit, { 3, 8 }, { 3, 2 } },
        { ucAniGIF::gfsClip, { 20, 3 }, { 6, 3 } } }; // the smaller ratio; no growth; one ratio below 1; never larger
    for (const auto &[stretch, before, after] : fits) {
        gif.setStretch(ucAniGIF::gfsStretch);
        gif.resize(before);
        gif.setStretch(stretch);
        EXPECT_EQ(gif.size(), after) << stretch;
    }
    EXPECT_EQ(picture(), "RRR...|RRR...|RRR...");

    gif.setStretch(ucAniGIF::gfsActualSize);
    gif.setOffsetX(2);
    gif.setOffsetY(-1);
    EXPECT_EQ(picture(), "..RRR.|..RRR.|..RRR.|......");
    // Any Long is an offset; a picture wholly beside the control is simply not seen.
    for (const auto &[x, y] : { std::pair { std::numeric_limits<qint32>::min(), 0 },
             { std::numeric_limits<qint32>::max(), std::numeric_limits<qint32>::min() }, { 6, 0 } }) {
        gif.setOffsetX(x);
        gif.setOffsetY(y);
        EXPECT_EQ(picture(), "......|......|......|......") << x << ", " << y;
    }
}

TEST_F(AniGif, timerRules)
{
    // Set directly or by name (where a value past a short must not wrap), clamped.
    gif.setMinFrameDelay(5);
    EXPECT_EQ(gif.MinFrameDelay(), 10);
    ASSERT_TRUE(gif.setProperty("MinFrameDelay", 70000));
    EXPECT_EQ(gif.MinFrameDelay(), 32700);
    gif.setMinFrameDelay(10);

    EXPECT_EQ(gif.LoopsRemaining(), -1) << "no GIF";
    gif.setDelayAnimation(ucAniGIF::gfdDelayStartup); // it starts by itself after the first frame
    ASSERT_TRUE(gif.LoadAnimatedGIF_Array(solidFrames(3, 0)));
    EXPECT_EQ(gif.LoopsRemaining(), 0) << "endless";
    gif.setLoops(-2);
    EXPECT_EQ(gif.Loops(), 2);

    QList<int> frames;
    QObject::connect(&gif, &ucAniGIF::FrameChanged, [&](qint32 index) { frames.append(index); });
    QSignalSpy ended(&gif, &ucAniGIF::LoopsEnded);
    ASSERT_TRUE(QTest::qWaitFor([&] { return ended.count() == 1; }));
    EXPECT_EQ(frames, QList<int>({ 2, 3, 1, 2, 3, 1 }));
    QTest::qWait(40);
    EXPECT_EQ(frames.size(), 6) << "no timer runs after the end";
    EXPECT_EQ(gif.LoopsRemaining(), 2) << "the count was reset";
    EXPECT_EQ(gif.Action(), ucAniGIF::gfaStop);

    gif.setAction(ucAniGIF::gfaReset);
    EXPECT_EQ(gif.Action(), ucAniGIF::gfaPlay);
    gif.hide();
    EXPECT_EQ(gif.Action(), ucAniGIF::gfaPause) << "a hidden control does not animate";
    const qsizetype shown = frames.size();
    QTest::qWait(60);
    EXPECT_EQ(frames.size(), shown) << "nor does its clock tick";
    gif.show();
    EXPECT_EQ(gif.Action(), ucAniGIF::gfaPlay);
}

TEST_F(AniGif, paletteOperations)
{
    QList<qint32> entries;
    EXPECT_FALSE(gif.GetPalette(0, entries)) << "no GIF";
    const QByteArray gifBytes = gifOf(2, 1, palette,
        { { 0, 0, 1, 1, QByteArray(1, '\0') }, { 1, 0, 1, 1, "\1", 0, 10, -1, { 0x111111, 0x222222 } } });
    ASSERT_TRUE(gif.LoadAnimatedGIF_Array(gifBytes));
    ASSERT_TRUE(gif.GetPalette(0, entries));
    EXPECT_EQ(entries, QList<qint32>({ qint32(Red), qint32(Green), qint32(Blue), qint32(Grey) }));
    EXPECT_FALSE(gif.GetPalette(1, entries)) << "frame 1 uses the global table";
    ASSERT_TRUE(gif.GetPalette(2, entries));
    EXPECT_EQ(entries, QList<qint32>({ 0x111111, 0x222222 }));
    EXPECT_FALSE(gif.GetPalette(3, entries));

    gif.setAction(ucAniGIF::gfaForward); // both frames on the canvas
    EXPECT_EQ(picture(), "Rd");
    ASSERT_TRUE(gif.CacheColorTables());
    ASSERT_TRUE(gif.SetPalette(0, { qint32(Blue) }));
    ASSERT_TRUE(gif.SetPalette(2, { 0x111111, qint32(Green), 0x333333 }));
    EXPECT_EQ(picture(), "BG") << "new colours show at once";
    ASSERT_TRUE(gif.GetPalette(2, entries));
    EXPECT_EQ(entries.size(), 2) << "entries past the table's size are ignored";
    EXPECT_FALSE(gif.SetPalette(1, { 0 }));

    ASSERT_TRUE(gif.RestoreColorTables(true));
    EXPECT_EQ(picture(), "Rd");
}

TEST_F(AniGif, animatedGifPictureHoldsTheFramesAsTheFileHadThem)
{
    EXPECT_TRUE(gif.AnimatedGIF().isNull());
    // Disposals, delays and transparency; a local table of two colours (the smallest code size).
    QByteArray bits;
    for (int i = 0; i < 64; ++i)
        bits.append(char(i * i % 7 % 2));
    const QByteArray local = gifOf(8, 9, palette,
        { { 0, 0, 8, 9, QByteArray(72, '\2'), 1, 70 }, { 0, 1, 8, 8, bits, 2, 300, 1, { 0x111111, 0x222222 } } });
    for (const QByteArray &source : { layeredGif(), local }) {
        ASSERT_TRUE(gif.LoadAnimatedGIF_Array(source));
        gif.setMirrored(ucAniGIF::gfmHorAndVer);
        const Picture picture = gif.AnimatedGIF();
        ASSERT_FALSE(picture.isNull());
        EXPECT_EQ(picture.image().size(), gif.size());
        const QByteArray written = QByteArray::fromBase64(picture.image().text("GIF").toLatin1());
        EXPECT_EQ(test::framesOf(written), test::framesOf(source)) << "not mirrored";
    }

    // At design time the picture loads back with all its frames; while running it is ignored.
    ucAniGIF other;
    Ambient design;
    design.UserMode = false;
    other.setAmbient(design);
    other.setAnimatedGIF(gif.AnimatedGIF());
    EXPECT_EQ(other.FrameCount(), 2);
    other.setAnimatedGIF(Picture());
    EXPECT_EQ(other.FrameCount(), 0);
    gif.setAnimatedGIF(Picture());
    EXPECT_EQ(gif.FrameCount(), 2);
}

TEST_F(AniGif, persistsItsPropertiesAndTheGif)
{
    const QByteArray looping = solidFrames(2, 3);
    ASSERT_TRUE(gif.LoadAnimatedGIF_Array(looping));
    EXPECT_EQ(gif.Loops(), 3);
    gif.setLoops(0);
    ucAniGIF loaded;
    loaded.Load(gif.Save());
    EXPECT_EQ(loaded.FrameCount(), 2);
    EXPECT_EQ(loaded.Loops(), 0) << "an endless count survives the file's own count";

    PropertyBag old;
    old.WriteProperty("GIF", looping);
    old.WriteProperty("DelayLoad", -1);
    ucAniGIF fromOld;
    fromOld.Load(old);
    EXPECT_EQ(fromOld.Loops(), 3) << "without a saved count, the file's";
    EXPECT_EQ(fromOld.MinFrameDelay(), 50);
}

TEST_F(AniGif, badInputLoadsNothing)
{
    QTemporaryDir dir;
    const QByteArray good = layeredGif();
    // A load that fails releases the GIF shown, so FrameCount tells the host it failed.
    for (const QString &path : { dir.filePath("missing.gif"), test::writeFile(dir.filePath("empty.gif"), {}),
             dir.path(), test::makeFifo(dir.filePath("fifo.gif")), QStringLiteral("/dev/zero"),
             test::sizedFile(dir.filePath("large.gif"), gifLimits::MaxFileBytes + 1) }) {
        ASSERT_TRUE(gif.LoadAnimatedGIF_Array(good));
        EXPECT_FALSE(gif.LoadAnimatedGIF_File(path)) << path.toStdString();
        EXPECT_EQ(gif.FrameCount(), 0) << path.toStdString();
        EXPECT_EQ(gif.LoopsRemaining(), -1);
    }
    EXPECT_EQ(picture(), "......|......|......|......");
    ASSERT_TRUE(gif.LoadAnimatedGIF_Array(good));
    EXPECT_FALSE(gif.LoadAnimatedGIF_Array(QByteArray("GIF89a")));
    EXPECT_EQ(gif.FrameCount(), 0) << "bytes without a frame empty the control";

    EXPECT_TRUE(gif.LoadAnimatedGIF_File(test::writeFile(dir.filePath("cut.gif"), good.left(good.size() - 20))));
    EXPECT_EQ(gif.FrameCount(), 3) << "the last frame was cut";

    // A 65535 × 65535 frame with two bytes of data needs more memory than allowed: left out.
    const QByteArray huge("\x2C\0\0\0\0\xFF\xFF\xFF\xFF\0\x02\x02\x4C\x01\0;", 16);
    EXPECT_TRUE(gif.LoadAnimatedGIF_Array(
        gifOf(10, 10, palette, { { 0, 0, 10, 10, QByteArray(100, '\1') } }).chopped(1) + huge));
    EXPECT_EQ(gif.FrameCount(), 1);
    EXPECT_FALSE(gif.LoadAnimatedGIF_Array(gifOf(10, 10, palette, {}).chopped(1) + huge));
}

// Every input the fuzzers ever found trouble with, and the bundled GIFs, loaded as a PNG and
// as a GIF drawn frame by frame, as the fuzz targets do: each must end cleanly.
TEST(CrasherReplay, everyKnownInputLoadsAndDrawsCleanly)
{
    QStringList files;
    for (const QString &folder : { test::testDataPath("crashers"), test::sourcePath("data/gif") }) {
        for (const QFileInfo &entry : QDir(folder).entryInfoList(QDir::Files))
            files << entry.filePath();
    }
    ASSERT_FALSE(files.isEmpty());
    for (const QString &path : files) {
        SCOPED_TRACE(path.toStdString());
        QFile file(path);
        ASSERT_TRUE(file.open(QIODevice::ReadOnly));
        const QByteArray bytes = file.readAll();
        StdPNG png;
        png.LoadData(bytes);
        png.Comments();
        png.Palette();
        png.LastModified();
        ucAniGIF gif;
        gif.setDelayAnimation(ucAniGIF::gfdDoNotAnimate);
        gif.setStretch(ucAniGIF::gfsStretch);
        gif.resize(37, 23);
        if (!gif.LoadAnimatedGIF_Array(bytes)) {
            EXPECT_EQ(gif.FrameCount(), 0);
            continue;
        }
        gif.setMirrored(int(bytes.size() % 4));
        QImage target(gif.size(), QImage::Format_ARGB32);
        for (int i = 0; i <= std::min(gif.FrameCount(), 64); ++i) {
            gif.render(&target);
            gif.setAction(ucAniGIF::gfaForward);
        }
        EXPECT_GE(gif.LoopsRemaining(), 0);
    }
}

TEST_F(AniGif, forwardsMouseEventsInTwips)
{
    ASSERT_TRUE(gif.LoadAnimatedGIF_Array(layeredGif()));
    QList<QList<float>> downs;
    QObject::connect(&gif, &ucAniGIF::MouseDown, [&](qint16 button, qint16 shift, float x, float y) {
        downs.append({ float(button), float(shift), x, y });
    });
    QSignalSpy clicks(&gif, &ucAniGIF::Click);
    QTest::mouseClick(&gif, Qt::LeftButton, Qt::ShiftModifier, QPoint(2, 3));
    ASSERT_EQ(downs.size(), 1);
    EXPECT_EQ(downs[0], QList<float>({ 1, 1, 30, 45 }));
    EXPECT_EQ(clicks.count(), 1);
    QTest::mouseClick(&gif, Qt::LeftButton, {}, QPoint(1, 1));
    QTest::mouseDClick(&gif, Qt::LeftButton, {}, QPoint(1, 1));
    QTest::mouseRelease(&gif, Qt::LeftButton, {}, QPoint(1, 1));
    EXPECT_EQ(clicks.count(), 2) << "a double click is one click";
}

TEST(AniGifLifetime, theHostMayDeleteItInMouseUpClickOrRemoteLoadComplete)
{
    QTemporaryDir dir;
    const QString file = test::writeFile(dir.filePath("layered.gif"), layeredGif());
    for (const std::string event : { "MouseUp", "Click", "RemoteLoadComplete" }) {
        QWidget form;
        auto *gif = new ucAniGIF(&form);
        gif->InitNew();
        gif->resize(20, 20);
        form.show();
        ASSERT_TRUE(QTest::qWaitForWindowExposed(&form));
        QPointer<ucAniGIF> alive(gif);
        const auto remove = [&alive] { delete alive.data(); };
        if (event == "MouseUp")
            QObject::connect(gif, &ucAniGIF::MouseUp, remove);
        if (event == "Click")
            QObject::connect(gif, &ucAniGIF::Click, remove);
        if (event == "RemoteLoadComplete") {
            QObject::connect(gif, &ucAniGIF::RemoteLoadComplete, remove);
            gif->LoadAnimatedGIF_Remote(file);
        } else {
            QTest::mouseClick(gif, Qt::LeftButton, {}, QPoint(2, 2));
        }
        ASSERT_TRUE(QTest::qWaitFor([&] { return alive.isNull(); })) << event;
    }
}

#include "gif/ucAniGIF.h"

#include "support/TestSupport.h"

#include <QDir>
#include <QImage>

#include <gtest/gtest.h>

using namespace zelctl;

// Every input the fuzzer ever found trouble with, and the bundled GIF, loaded and drawn
// frame by frame as the fuzz target does: each must end cleanly.
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

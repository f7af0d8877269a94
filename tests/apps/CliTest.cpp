// The zelctl tool run as a script runs it, on input no one meant it to read.

#include "ProgramRun.h"

#include "gif/ucAniGIF.h"
#include "support/TestSupport.h"

#include <QProcess>
#include <QTemporaryDir>
#include <QTest>

#include <gtest/gtest.h>

using namespace zelctl;
using namespace zelctl::test;

namespace {

struct Answer
{
    int exitCode = -1;
    QByteArray out;
    QByteArray err;
};

// nif --batch with the bytes on standard input, through a pipe or from a file.
Answer nifBatch(const QByteArray &input, bool fromFile)
{
    QTemporaryDir dir;
    QProcess process;
    if (fromFile) {
        QFile file(dir.filePath("input"));
        EXPECT_TRUE(file.open(QIODevice::WriteOnly));
        file.write(input);
        file.close();
        process.setStandardInputFile(file.fileName());
    }
    process.start(ZELCTL_CLI_FILE, { "nif", "--batch" });
    EXPECT_TRUE(process.waitForStarted());
    if (!fromFile) {
        process.write(input);
        process.closeWriteChannel();
    }
    EXPECT_TRUE(QTest::qWaitFor([&] { return process.state() == QProcess::NotRunning; }, 30000));
    return { process.exitStatus() == QProcess::NormalExit ? process.exitCode() : -1, process.readAllStandardOutput(),
        process.readAllStandardError() };
}

QByteArray fileBytes(const QString &path)
{
    QFile file(path);
    EXPECT_TRUE(file.open(QIODevice::ReadOnly)) << path.toStdString();
    return file.readAll();
}

} // namespace

// A NUL is a character of its line, which it makes malformed; every line gets its answer,
// from a pipe as from a file.
TEST(NifBatch, answersEveryLineAndTakesANulForACharacter)
{
    const QByteArray input = fileBytes(testDataPath("nif/nul-lines.txt"));
    for (const bool fromFile : { false, true }) {
        SCOPED_TRACE(fromFile ? "from a file" : "from a pipe");
        const Answer answer = nifBatch(input, fromFile);
        EXPECT_EQ(answer.exitCode, 1);
        EXPECT_EQ(answer.out, "PT\t501964843\tvalid\nPT\t123456788\tinvalid\n");
        EXPECT_EQ(answer.err,
            "zelctl nif: line 1: holds a NUL byte\n"
            "zelctl nif: line 2: holds a NUL byte\n");
    }
}

TEST(NifBatch, capsTheLineLengthAndGoesOn)
{
    const QByteArray input = "PT\t" + QByteArray(5000, '5') + "\nPT\t501964843";
    const Answer answer = nifBatch(input, false);
    EXPECT_EQ(answer.exitCode, 1);
    EXPECT_EQ(answer.out, "PT\t501964843\tvalid\n") << "the last line needs no line feed";
    EXPECT_EQ(answer.err, "zelctl nif: line 1: longer than 1024 bytes\n");
    EXPECT_EQ(nifBatch("PT\t501964843\r\nES\tX1234567L\n", true).exitCode, 0);
}

// gif-info reads with the control's limits and lists exactly the frames the control loads.
TEST(GifInfo, listsTheFramesTheControlLoads)
{
    const QString strip = testDataPath("gif/strip-limit.gif");
    ucAniGIF gif;
    gif.setDelayAnimation(ucAniGIF::gfdDoNotAnimate);
    ASSERT_TRUE(gif.LoadAnimatedGIF_File(strip));
    EXPECT_EQ(gif.FrameCount(), 16) << "the 17th frame would take the strip beyond its limit";

    QProcess process;
    process.start(ZELCTL_CLI_FILE, { "gif-info", strip });
    ASSERT_TRUE(process.waitForFinished(60000));
    const QByteArray out = process.readAllStandardOutput();
    EXPECT_EQ(process.exitCode(), 0);
    EXPECT_TRUE(out.startsWith("loops: 0\nframes: 16\n")) << out.left(200).toStdString();
    EXPECT_EQ(out.count('\n'), 2 + 16);
    EXPECT_TRUE(out.contains("frame 16: left 0 top 0 width 4096 height 4096 delay 0 disposal 0 transparent -1"));
}

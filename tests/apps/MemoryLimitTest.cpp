// The worst inputs found for each command of the tool and for the gallery's form option:
// under a memory limit, each ends with its one-line error (or its answer), never by
// running out of memory or waiting for ever.

#include "ProgramRun.h"

#include "support/TestSupport.h"

#include <QTemporaryDir>

#include <gtest/gtest.h>

using namespace zelctl::test;

TEST(MemoryLimit, everyCommandStaysWithinTheDecodersCapsOnItsWorstInputs)
{
    QTemporaryDir dir;
    const QString pam = dir.filePath("out.pam");
    const struct
    {
        QString label;
        ProgramRun run;
        int exitCode;
        const char *says;
    } cases[] = {
        { "gif-info /dev/zero", runCli({ "gif-info", "/dev/zero" }), 1, "is not a regular file" },
        { "png-info /dev/zero", runCli({ "png-info", "/dev/zero" }), 1, "is not a regular file" },
        { "png-decode /dev/zero", runCli({ "png-decode", "/dev/zero", pam }), 1, "is not a regular file" },
        { "gif-info on an endless pipe",
            runShell(R"(cat /dev/zero 2>/dev/null | exec "$0" gif-info --hash /dev/stdin)"), 1,
            "is larger than 268435456 bytes" },
        { "png-info on an endless pipe", runShell(R"(cat /dev/zero 2>/dev/null | exec "$0" png-info /dev/stdin)"), 1,
            "is larger than 268435456 bytes" },
        { "png-decode on an endless pipe",
            runShell(QStringLiteral(R"(cat /dev/zero 2>/dev/null | exec "$0" png-decode /dev/stdin %1)").arg(pam)), 1,
            "is larger than 268435456 bytes" },
        { "gif-info, a 65535 × 65535 frame in 35 bytes",
            runCli({ "gif-info", "--hash", testDataPath("gif/huge-frame.gif") }), 1,
            "holds no GIF frame that can be shown" },
        { "gif-info, 1,000 frames of 16384 × 16384",
            runCli({ "gif-info", "--hash", testDataPath("gif/thousand-huge-frames.gif") }), 1,
            "holds no GIF frame that can be shown" },
        { "nif --batch, a line of 100 MB of NULs", runShell(R"(head -c 100000000 /dev/zero | exec "$0" nif --batch)"),
            1, "line 1: longer than 1024 bytes" },
        { "gallery --form /dev/zero", runProgram(ZELCTL_GALLERY_FILE, { "--form", "/dev/zero" }), 1,
            "não é um ficheiro comum" },
    };
    for (const auto &c : cases) {
        SCOPED_TRACE(c.label.toStdString());
        EXPECT_EQ(c.run.exitCode, c.exitCode);
        EXPECT_TRUE(c.run.err.contains(c.says)) << c.run.err.left(2000).toStdString();
        EXPECT_EQ(c.run.err.count('\n'), 1) << "one line of error: " << c.run.err.left(2000).toStdString();
        EXPECT_LT(c.run.peakBytes, MemoryLimit);
    }

    // The largest strip a GIF may fill (16 frames of 4096 × 4096), hashed whole.
    const ProgramRun strip = runCli({ "gif-info", "--hash", testDataPath("gif/strip-limit.gif") });
    EXPECT_EQ(strip.exitCode, 0) << strip.err.toStdString();
    EXPECT_EQ(strip.out.count(" damaged hash "), 16);
    EXPECT_LT(strip.peakBytes, MemoryLimit);
}

#include "PngPixels.h"
#include "PngTestFiles.h"

#include <QProcess>
#include <QTemporaryDir>

#include <gtest/gtest.h>

using namespace zelctl;
using namespace zelctl::test;

namespace {

// Runs the command line tool, a program with a core (not a GUI) application.
struct CliRun
{
    int exitCode = -1;
    QByteArray out;
    QByteArray err;
};

CliRun runCli(const QStringList &arguments)
{
    QProcess process;
    process.start(QStringLiteral(ZELCTL_CLI_FILE), arguments);
    CliRun run;
    if (!process.waitForFinished(60000) || process.exitStatus() != QProcess::NormalExit)
        return run;
    run.exitCode = process.exitCode();
    run.out = process.readAllStandardOutput();
    run.err = process.readAllStandardError();
    return run;
}

QString written(const QTemporaryDir &folder, const QString &name, const QByteArray &bytes)
{
    QFile file(folder.filePath(name));
    EXPECT_TRUE(file.open(QIODevice::WriteOnly) && file.write(bytes) == bytes.size());
    return file.fileName();
}

} // namespace

TEST(PngCommand, describesAPngWithoutAGuiApplication)
{
    QTemporaryDir folder;
    const QString png = written(folder, "grey.png", greyFile(5, 3, chunk("gAMA", be32(45455))));
    const CliRun run = runCli({ "png-info", png });
    ASSERT_EQ(run.exitCode, 0) << run.err.toStdString();
    EXPECT_TRUE(run.out.startsWith("Width: 5\nHeight: 3\nColorType: 0\n")) << run.out.toStdString();
    EXPECT_TRUE(run.out.contains("GammaCorrection: 0.45455\n")) << run.out.toStdString();

    const CliRun refused = runCli({ "png-info", written(folder, "bad.png", greyFile(5, 3).replace("IHDR", "IHDr")) });
    EXPECT_EQ(refused.exitCode, 1);
    EXPECT_TRUE(refused.out.isEmpty());
}

TEST(PngCommand, writesEveryBitmapAsRgbaRows)
{
    // Table bitmaps of 1, 4 and 8 bits, 24 bits, and 32 bits as stored (premultiplied).
    struct Case
    {
        ImageRecipe recipe;
        QStringList options;
    };
    const Case cases[] = {
        { { 21, 5, 3, 1, false, false, 1 }, {} },
        { { 21, 5, 0, 2, true, false, 2 }, {} },
        { { 21, 5, 0, 16, false, false, 3 }, {} },
        { { 21, 5, 2, 8, false, false, 4 }, {} },
        { { 21, 5, 6, 16, true, false, 5 }, { "--transparent-style", "-1" } },
        { { 21, 5, 3, 4, false, true, 6 }, { "--transparent-style", "-1", "--alpha", "200" } },
        { { 21, 5, 2, 8, false, false, 7 }, { "--make32" } },
    };
    QTemporaryDir folder;
    for (const Case &c : cases) {
        const QByteArray file = writeWithLibpng(c.recipe);
        const QString out = folder.filePath("out.pam");
        QStringList arguments = c.options;
        arguments.prepend("png-decode");
        arguments << written(folder, "in.png", file) << out;
        const CliRun run = runCli(arguments);
        ASSERT_EQ(run.exitCode, 0) << run.err.toStdString();

        StdPNG image;
        image.setTransparentStyle(c.options.contains("-1") ? StdPNG::alphaTransparent : 0);
        ASSERT_TRUE(image.LoadData(file, true, c.options.contains("--make32"), c.options.contains("200") ? 200 : 255));
        QByteArray expected = "P7\nWIDTH 21\nHEIGHT 5\nDEPTH 4\nMAXVAL 255\nTUPLTYPE RGB_ALPHA\nENDHDR\n";
        for (int y = 0; y < 5; ++y) {
            for (int x = 0; x < 21; ++x) {
                const auto bgra = bitmapPixel(image, x, y);
                expected.append(char(bgra[2])).append(char(bgra[1])).append(char(bgra[0])).append(char(bgra[3]));
            }
        }
        QFile pam(out);
        ASSERT_TRUE(pam.open(QIODevice::ReadOnly));
        EXPECT_EQ(pam.readAll(), expected) << image.BitCount_BMP() << " bits";
    }
}

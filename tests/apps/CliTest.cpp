// The zelctl tool run as a script runs it: every command on good input and on each kind of
// bad input, lookup against the fake VAT service.

#include "ProgramRun.h"

#include "companion/LookupTestSupport.h"
#include "png/PngPixels.h"
#include "png/PngTestFiles.h"
#include "support/TestSupport.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <optional>

using namespace zelctl;
using namespace zelctl::test;

namespace {

class Cli : public LookupFixture
{
protected:
    QString written(const QString &name, const QByteArray &bytes) { return writeFile(folder.filePath(name), bytes); }
};

// A number nobody else in this program looks up, so the user's cache holds only what these
// runs stored.
const QString Holder = QStringLiteral("PT505678900");

} // namespace

TEST_F(Cli, everyCommandAnswersWithItsExitCodeAndAtMostOneLineOfError)
{
    const QString png = written("grey.png", greyFile(5, 3, chunk("gAMA", be32(45455))));
    const QString gif = testDataPath("gif/strip-limit.gif");
    const QString garbage = written("garbage", "GIF89a, says the garbage");
    const QString missing = folder.filePath("missing");
    const QString pam = folder.filePath("out.pam");
    const QByteArray noFile = ": No such file or directory";
    struct Case
    {
        QStringList args;
        int exitCode;
        QByteArray out; // what standard output begins with; nothing at all when empty
        QByteArray err; // what the one line on standard error holds; none when empty
        QByteArray input = {};
        std::optional<FakeHttpServer::Reply> reply = {};
    };
    const Case cases[] = {
        { {}, 2, "", "usage:" },
        { { "frobnicate" }, 2, "", "zelctl: unknown command 'frobnicate'" },
        { { "classes" }, 0, "cNIF\t{", "" },
        { { "classes", "cNIF" }, 2, "", "zelctl classes: takes no arguments" },

        { { "nif", "PT", "501964843" }, 0, "valid\n", "" },
        { { "nif", "PT", "123456788" }, 1, "invalid\n", "" },
        { { "nif", "PT" }, 2, "", "zelctl nif: expected CC NUMBER or --batch" },
        { { "nif", "--batch", "PT" }, 2, "", "zelctl nif: expected CC NUMBER or --batch" },
        { { "nif", "--batch" }, 0, "PT\t501964843\tvalid\nES\tX1234567L\tvalid\n", "",
            "PT\t501964843\r\nES\tX1234567L\n" },
        // A NUL is a character of its line, which it makes malformed.
        { { "nif", "--batch" }, 1, "PT\t123456788\tinvalid\n", "zelctl nif: line 2: holds a NUL byte",
            "PT\t123456788\nPT\t5019" + QByteArray(1, '\0') + "64843\n" },
        // The last line needs no line feed.
        { { "nif", "--batch" }, 1, "PT\t501964843\tvalid\n", "zelctl nif: line 1: longer than 1024 bytes",
            "PT\t" + QByteArray(5000, '5') + "\nPT\t501964843" },
        { { "nif", "--batch" }, 1, "", "zelctl nif: line 1: expected CC<TAB>NUMBER", "PT 501964843\n" },

        { { "nib", "003501230000000000124" }, 0, "24\nvalid\n", "" },
        { { "nib", "003501230000000000142" }, 1, "24\ninvalid\n", "" },
        { { "nib", "0035012300000000001" }, 0, "24\n", "" },
        { { "nib" }, 2, "", "usage: zelctl nib NUMBER" },
        { { "nib", "12345" }, 2, "", "zelctl nib: a NIB has 19 to 21 characters, not 5" },

        { { "png-info", png }, 0, "Width: 5\nHeight: 3\nColorType: 0\n", "" },
        { { "png-info" }, 2, "", "usage: zelctl png-info FILE" },
        { { "png-info", missing }, 1, "", "zelctl png-info: " + missing.toUtf8() + noFile },
        { { "png-info", garbage }, 1, "", "zelctl png-info: " + garbage.toUtf8() + ": " },
        { { "png-decode", png, pam }, 0, "", "" },
        { { "png-decode", png }, 2, "", "usage: zelctl png-decode" },
        { { "png-decode", "--bogus", png, pam }, 2, "", "zelctl png-decode: bad option '--bogus'" },
        { { "png-decode", "--alpha", "256", png, pam }, 2, "", "zelctl png-decode: bad option '256'" },
        { { "png-decode", missing, pam }, 1, "", "zelctl png-decode: " + missing.toUtf8() + noFile },
        { { "png-decode", garbage, pam }, 1, "", "zelctl png-decode: " + garbage.toUtf8() + ": " },
        { { "png-decode", png, missing + "/out.pam" }, 1, "", "zelctl png-decode: cannot write" },

        // Exactly the 16 frames the control loads: a 17th would take its strip beyond its limit.
        { { "gif-info", gif }, 0, "loops: 0\nframes: 16\nframe 1: left 0 top 0 width 4096 height 4096 delay 0", "" },
        { { "gif-info" }, 2, "", "usage: zelctl gif-info [--hash] FILE" },
        { { "gif-info", "--fast", gif }, 2, "", "usage: zelctl gif-info [--hash] FILE" },
        { { "gif-info", "--hash", missing }, 1, "", "zelctl gif-info: " + missing.toUtf8() + noFile },
        { { "gif-info", garbage }, 1, "", "zelctl gif-info: " + garbage.toUtf8() + " holds no GIF frame" },

        { { "lookup", Holder }, 2, "",
            "zelctl lookup: PT505678900: Serviço do Estado-membro indisponível (MS_UNAVAILABLE)", {},
            FakeHttpServer::userError("MS_UNAVAILABLE") },
        // A bare number is Portuguese; the address is split into its fields.
        { { "lookup", Holder.mid(2) }, 0,
            "ID: PT505678900\nNAME: ANA DIAS\nSOURCE: Serviço de IVA da Comissão Europeia\n", "", {},
            FakeHttpServer::holder("ANA DIAS", R"(RUA A 1\n4700-320 BRAGA)") },
        { { "lookup", "--offline", Holder }, 0,
            "ID: PT505678900\nNAME: ANA DIAS\nSOURCE: Cache local (Serviço de IVA da Comissão Europeia)\n", "" },
        { { "lookup", Holder, "--refresh" }, 0, "ID: PT505678900\nNAME: ANA DIAS\nSOURCE: Serviço de IVA", "" },
        { { "lookup", "--offline", "PT999999990" }, 1, "",
            "zelctl lookup: PT999999990: Sem dados locais sobre este número (consultas remotas desligadas)" },
        { { "lookup", "--offline", DirectoryHolder }, 0, "ID: PT210345675\n", "" },
        { { "lookup" }, 2, "", "zelctl lookup: expected NUMBER [--offline] [--refresh]" },
        { { "lookup", Holder, "--fast" }, 2, "", "zelctl lookup: expected NUMBER [--offline] [--refresh]" },
        { { "lookup", "PT12;DROP" }, 2, "", "zelctl lookup: PT12;DROP: " },
    };
    for (const Case &c : cases) {
        SCOPED_TRACE(("zelctl " + c.args.join(' ')).toStdString());
        if (c.reply)
            service.answerWith(*c.reply);
        const ProgramRun run = runCli(c.args, c.input);
        EXPECT_EQ(run.exitCode, c.exitCode) << run.err.toStdString();
        if (c.out.isEmpty())
            EXPECT_EQ(run.out, "");
        else
            EXPECT_TRUE(run.out.startsWith(c.out)) << run.out.left(300).toStdString();
        const qsizetype lineEnd = run.err.indexOf('\n');
        if (c.err.isEmpty()) {
            EXPECT_EQ(run.err, "");
        } else {
            EXPECT_TRUE(run.err.first(std::max<qsizetype>(lineEnd, 0)).contains(c.err)) << run.err.toStdString();
            for (const QByteArray &line : run.err.sliced(lineEnd + 1).split('\n'))
                EXPECT_TRUE(line.isEmpty() || line.startsWith("usage:") || line.startsWith("  zelctl "))
                    << "one line, then at most the usage: " << run.err.toStdString();
        }
    }
    EXPECT_EQ(service.requests().size(), 3) << "--offline asked nothing, --refresh asked again";
}

// Table bitmaps of 1, 4 and 8 bits, 24 bits, and 32 bits as stored (premultiplied), each
// written as the bitmap holds it.
TEST_F(Cli, pngDecodeWritesEveryBitmapAsRgbaRows)
{
    const struct
    {
        ImageRecipe recipe;
        QStringList options;
    } cases[] = {
        { { 21, 5, 3, 1, false, false, 1 }, {} },
        { { 21, 5, 0, 2, true, false, 2 }, {} },
        { { 21, 5, 0, 16, false, false, 3 }, {} },
        { { 21, 5, 2, 8, false, false, 4 }, {} },
        { { 21, 5, 6, 16, true, false, 5 }, { "--transparent-style", "-1" } },
        { { 21, 5, 3, 4, false, true, 6 }, { "--transparent-style", "-1", "--alpha", "200" } },
        { { 21, 5, 2, 8, false, false, 7 }, { "--make32" } },
    };
    const QString pam = folder.filePath("out.pam");
    for (const auto &c : cases) {
        const QByteArray file = writeWithLibpng(c.recipe);
        const ProgramRun run
            = runCli(QStringList { "png-decode" } + c.options + QStringList { written("in.png", file), pam });
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
        QFile output(pam);
        ASSERT_TRUE(output.open(QIODevice::ReadOnly));
        EXPECT_EQ(output.readAll(), expected) << image.BitCount_BMP() << " bits";
    }
}

// Every control and dialog in its main states, drawn as the snapshots program draws them,
// against the pictures in tests/data/golden that a person has looked at. A picture that
// differs is written beside its golden one as NAME.actual.png, with NAME.diff.png showing
// where; scripts/update-goldens draws them all again.

#include "PictureDiff.h"
#include "Snapshots.h"

#include <QDir>
#include <QFile>

#include <gtest/gtest.h>

using zelctl::snapshots::Scene;

namespace zelctl::snapshots {
void PrintTo(const Scene &scene, std::ostream *out)
{
    *out << scene.name().toStdString();
}
} // namespace zelctl::snapshots

namespace {

// Fonts are looked up once, when the test main makes the application: the bundled ones
// must be chosen before.
const bool bundledFonts = (zelctl::snapshots::useBundledFonts(), true);

// Per colour channel: more than rounding, less than any change a person would notice.
constexpr int Tolerance = 8;

class Golden : public ::testing::TestWithParam<Scene>
{
protected:
    static void SetUpTestSuite() { zelctl::snapshots::setFixedLook(); }
};

QString goldenPath(const QString &name, const char *suffix = "")
{
    return QDir(QStringLiteral(ZELCTL_GOLDEN_DIR)).filePath(name + QLatin1String(suffix) + QStringLiteral(".png"));
}

} // namespace

TEST_P(Golden, looksAsItDid)
{
    ASSERT_TRUE(bundledFonts);
    const Scene &scene = GetParam();
    const QImage actual = scene.render();
    ASSERT_FALSE(actual.isNull()) << "drew nothing";

    const QString actualFile = goldenPath(scene.name(), ".actual");
    const QString diffFile = goldenPath(scene.name(), ".diff");
    const QImage golden(goldenPath(scene.name()));
    const zelctl::test::PictureDifference difference = golden.isNull()
        ? zelctl::test::PictureDifference { false, 0, 0, {} }
        : zelctl::test::comparePictures(actual, golden, Tolerance);
    if (difference.matches()) {
        QFile::remove(actualFile);
        QFile::remove(diffFile);
        return;
    }
    zelctl::snapshots::savePicture(actual, actualFile);
    if (!difference.picture.isNull())
        zelctl::snapshots::savePicture(difference.picture, diffFile);
    if (golden.isNull())
        FAIL() << "no golden picture " << goldenPath(scene.name()).toStdString()
               << "; drawn: " << actualFile.toStdString() << " (scripts/update-goldens draws them all)";
    if (!difference.sameSize)
        FAIL() << "the picture is " << actual.width() << "x" << actual.height() << ", the golden one " << golden.width()
               << "x" << golden.height() << "\n  drawn: " << actualFile.toStdString()
               << "\n  both: " << diffFile.toStdString();
    FAIL() << difference.pixels << " pixels differ (by up to " << difference.largest << ")"
           << "\n  golden: " << goldenPath(scene.name()).toStdString() << "\n  drawn: " << actualFile.toStdString()
           << "\n  where: " << diffFile.toStdString();
}

INSTANTIATE_TEST_SUITE_P(Controls, Golden, ::testing::ValuesIn(zelctl::snapshots::scenes()),
    [](const ::testing::TestParamInfo<Scene> &info) {
        QString name = info.param.name();
        name.replace(QLatin1Char('-'), QLatin1Char('_'));
        return name.toStdString();
    });

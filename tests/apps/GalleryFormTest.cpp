// The gallery as a host: the form it writes comes back byte for byte, and it refuses to
// read or replace what is not a form file.

#include "ProgramRun.h"

#include "support/TestSupport.h"

#include <QFileInfo>
#include <QTemporaryDir>

#include <gtest/gtest.h>

using namespace zelctl::test;

namespace {

QByteArray bytesOf(const QString &path)
{
    QFile file(path);
    return file.open(QIODevice::ReadOnly) ? file.readAll() : QByteArray();
}

} // namespace

// Several controls of one class have no name (the information buttons, the sub-menu
// items): each keeps its own properties.
TEST(GalleryForm, saveLoadSaveGivesTheSameBytes)
{
    QTemporaryDir dir;
    const QString first = dir.filePath("first.json");
    const QString second = dir.filePath("second.json");
    ASSERT_EQ(runProgram(ZELCTL_GALLERY_FILE, { "--save-form", first }).exitCode, 0);
    const ProgramRun again = runProgram(ZELCTL_GALLERY_FILE, { "--form", first, "--save-form", second });
    ASSERT_EQ(again.exitCode, 0) << again.err.toStdString();
    const QByteArray saved = bytesOf(first);
    EXPECT_GT(saved.count("\"InfoButton\""), 1);
    EXPECT_EQ(bytesOf(second), saved);
}

TEST(GalleryForm, neverReplacesAFifoWithAForm)
{
    QTemporaryDir dir;
    const QString fifo = makeFifo(dir.filePath("form.json"));
    const ProgramRun run = runProgram(ZELCTL_GALLERY_FILE, { "--save-form", fifo });
    EXPECT_EQ(run.exitCode, 1);
    EXPECT_TRUE(QString::fromUtf8(run.err).contains(QStringLiteral("gallery: %1 não é um ficheiro comum").arg(fifo)))
        << run.err.toStdString();
    EXPECT_TRUE(QFileInfo(fifo).exists() && !QFileInfo(fifo).isFile());
}

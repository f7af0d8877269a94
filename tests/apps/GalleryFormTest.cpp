// The gallery as a host: the form it writes comes back byte for byte, and it refuses to
// read or replace what is not a form file.

#include "support/TestSupport.h"

#include <QFileInfo>
#include <QProcess>
#include <QTemporaryDir>

#include <gtest/gtest.h>

#include <sys/stat.h>

namespace {

struct GalleryRun
{
    int exitCode = -1;
    QString err;
};

GalleryRun gallery(const QStringList &args)
{
    QProcess process;
    process.start(ZELCTL_GALLERY_FILE, args);
    EXPECT_TRUE(process.waitForFinished(120000));
    return { process.exitStatus() == QProcess::NormalExit ? process.exitCode() : -1,
        QString::fromUtf8(process.readAllStandardError()) };
}

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
    ASSERT_EQ(gallery({ "--save-form", first }).exitCode, 0);
    const GalleryRun again = gallery({ "--form", first, "--save-form", second });
    ASSERT_EQ(again.exitCode, 0) << again.err.toStdString();
    const QByteArray saved = bytesOf(first);
    EXPECT_GT(saved.count("\"InfoButton\""), 1);
    EXPECT_EQ(bytesOf(second), saved);
}

TEST(GalleryForm, neverReplacesAFifoWithAForm)
{
    QTemporaryDir dir;
    const QString fifo = dir.filePath("form.json");
    ASSERT_EQ(::mkfifo(QFile::encodeName(fifo).constData(), 0600), 0);
    const GalleryRun run = gallery({ "--save-form", fifo });
    EXPECT_EQ(run.exitCode, 1);
    EXPECT_TRUE(run.err.contains(QStringLiteral("gallery: %1 não é um ficheiro comum").arg(fifo)))
        << run.err.toStdString();
    EXPECT_TRUE(QFileInfo(fifo).exists() && !QFileInfo(fifo).isFile());
}

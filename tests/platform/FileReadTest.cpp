#include "platform/FileRead.h"
#include "platform/Settings.h"
#include "support/TestSupport.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QTemporaryDir>

#include <gtest/gtest.h>

using namespace zelctl::platform;

using zelctl::test::makeFifo;
using zelctl::test::writeFile;

TEST(FileRead, readsRegularFilesWithinTheBoundAndRefusesTheRestAtOnce)
{
    QTemporaryDir dir;
    const QString fifo = makeFifo(dir.filePath("fifo"));
    const QString link = dir.filePath("link");
    ASSERT_TRUE(QFile::link(fifo, link));

    const struct
    {
        QString path;
        FileRead::Status status;
        QByteArray bytes;
    } cases[] = {
        { writeFile(dir.filePath("ten"), "0123456789"), FileRead::Ok, "0123456789" },
        { writeFile(dir.filePath("empty"), ""), FileRead::Ok, "" },
        { writeFile(dir.filePath("eleven"), "0123456789A"), FileRead::TooLarge, "" },
        { dir.filePath("missing"), FileRead::Unreadable, "" },
        { dir.path(), FileRead::NotRegularFile, "" },
        { fifo, FileRead::NotRegularFile, "" },
        { link, FileRead::NotRegularFile, "" },
        { "/dev/zero", FileRead::NotRegularFile, "" },
    };
    for (const auto &c : cases) {
        const FileRead read = readFile(c.path, 10);
        EXPECT_EQ(read.status, c.status) << c.path.toStdString();
        EXPECT_EQ(read.bytes, c.bytes) << c.path.toStdString();
        EXPECT_EQ(read.ok(), read.message(10).isEmpty());
        // What a save must not replace; a missing file may be made.
        EXPECT_EQ(isSpecialFile(c.path), c.status == FileRead::NotRegularFile) << c.path.toStdString();
    }
    // Files under /proc report no size, yet have content; and no more than the bound is read.
    const FileRead status = readFile("/proc/self/status", 1 << 20);
    ASSERT_TRUE(status.ok());
    EXPECT_TRUE(status.bytes.startsWith("Name:"));
    EXPECT_EQ(readFile("/proc/self/status", 10).status, FileRead::TooLarge);
}

// A settings file that is a link: to a regular file it is written through, keeping the
// link; to a FIFO it is neither read (which would wait for a writer) nor replaced.
TEST(Settings, aLinkedStoreIsWrittenThroughOrLeftAlone)
{
    QTemporaryDir dir;
    const QString store = settingsFile("zEL-linked");
    ASSERT_TRUE(QDir().mkpath(QFileInfo(store).absolutePath()));
    const QString target = writeFile(dir.filePath("kept.ini"), "[Setup]\nOther=1\n");
    ASSERT_TRUE(QFile::link(target, store));
    SaveSetting("zEL-linked", "Setup", "RootPath", "/opt/zel/");
    EXPECT_TRUE(QFileInfo(store).isSymLink());
    EXPECT_EQ(GetSetting("zEL-linked", "Setup", "RootPath"), QStringLiteral("/opt/zel/"));
    QFile written(target);
    ASSERT_TRUE(written.open(QIODevice::ReadOnly));
    const QByteArray text = written.readAll();
    EXPECT_TRUE(text.contains("RootPath=/opt/zel/") && text.contains("Other=1")) << text.toStdString();

    ASSERT_TRUE(QFile::remove(store));
    const QString fifo = makeFifo(dir.filePath("fifo.ini"));
    ASSERT_TRUE(QFile::link(fifo, store));
    EXPECT_EQ(GetSetting("zEL-linked", "Setup", "RootPath", "none"), QStringLiteral("none"));
    SaveSetting("zEL-linked", "Setup", "RootPath", "/opt/zel/");
    DeleteSetting("zEL-linked", "Setup", "RootPath");
    EXPECT_TRUE(QFileInfo(store).isSymLink());
    EXPECT_TRUE(isSpecialFile(fifo)) << "the FIFO was not replaced";
    QFile::remove(store);
}

#include "common/modFuncs.h"

#include "platform/Settings.h"
#include "platform/WindowHandles.h"
#include "support/TestSupport.h"

#include <QDir>
#include <QFile>
#include <QTemporaryDir>
#include <QWidget>

#include <gtest/gtest.h>

#include <thread>

#include <sys/stat.h>

using namespace zelctl;
using namespace zelctl::modFuncs;

namespace {

// The root folder is cached per thread, so each case asks from a thread of its own.
QString rootPathOnFreshThread()
{
    QString root;
    std::thread([&] { root = GetRootPath(); }).join();
    return root;
}

class RootPath : public ::testing::Test
{
protected:
    void SetUp() override { saved = platform::GetSetting("zEL", "Setup", "RootPath"); }
    void TearDown() override { platform::SaveSetting("zEL", "Setup", "RootPath", saved); }
    QString saved;
};

} // namespace

TEST_F(RootPath, withNoStoredValueTheCurrentFolderBecomesTheRootAndIsStored)
{
    platform::DeleteSetting("ZEL", "Setup", "RootPath");
    const QString expected = QDir::currentPath() + "/";
    EXPECT_EQ(rootPathOnFreshThread(), expected);
    EXPECT_EQ(platform::GetSetting("zel", "Setup", "RootPath"), expected) << "stored, in the case-folded store";
}

TEST_F(RootPath, aStoredValueGetsATrailingSlashButIsNotRewritten)
{
    platform::SaveSetting("zEL", "Setup", "RootPath", "/opt/zel");
    EXPECT_EQ(rootPathOnFreshThread(), "/opt/zel/");
    EXPECT_EQ(platform::GetSetting("zEL", "Setup", "RootPath"), "/opt/zel");
}

TEST_F(RootPath, isKeptOnceComputed)
{
    platform::SaveSetting("zEL", "Setup", "RootPath", "/first/");
    QString first, second;
    std::thread([&] {
        first = GetRootPath();
        platform::SaveSetting("zEL", "Setup", "RootPath", "/second/");
        second = GetDataPath();
    }).join();
    EXPECT_EQ(first, "/first/");
    EXPECT_EQ(second, "/first/data/");
}

TEST(ReadWholeFile, decodesWindows1252)
{
    QTemporaryDir dir;
    QFile file(dir.filePath("pt.txt"));
    ASSERT_TRUE(file.open(QIODevice::WriteOnly));
    file.write("Jo\xe3o\t\x80\x93\x9f\r\n");
    file.close();
    EXPECT_EQ(ReadWholeFile(file.fileName()), QString::fromUtf8("João\t€“Ÿ\r\n"));
    EXPECT_EQ(SafeFileLength(file.fileName()), 10);
}

TEST(ReadWholeFile, missingOrEmptyFileShowsTheMessageUnlessQuiet)
{
    QTemporaryDir dir;
    const QString missing = dir.filePath("iso3166.txt");
    {
        test::MessageBoxRecorder boxes;
        EXPECT_EQ(ReadWholeFile(missing, true), "");
        EXPECT_TRUE(boxes.shown().isEmpty());
    }
    test::MessageBoxRecorder boxes;
    EXPECT_EQ(ReadWholeFile(missing), "");
    ASSERT_EQ(boxes.shown().size(), 1);
    const platform::MessageBoxRequest &shown = boxes.shown().first();
    EXPECT_EQ(shown.icon, platform::MsgIcon::Warning);
    EXPECT_EQ(shown.title, "Ficheiro com acesso negado ou inexistente");
    EXPECT_EQ(shown.text,
        QString::fromUtf8("Não foi possível aceder ao ficheiro:\n") + missing
            + QString::fromUtf8("\n\nPor favor verifique se existe uma nova versão desta aplicação"));

    QFile empty(dir.filePath("empty.txt"));
    ASSERT_TRUE(empty.open(QIODevice::WriteOnly));
    empty.close();
    EXPECT_EQ(ReadWholeFile(empty.fileName()), "");
    EXPECT_EQ(boxes.shown().size(), 2) << "an empty file is treated as a missing one";
    EXPECT_EQ(SafeFileLength(dir.path()), 0) << "a folder has no length";

    // A FIFO would make the reader wait for a writer; a huge file would fill the memory.
    const QString fifo = dir.filePath("fifo.txt");
    ASSERT_EQ(::mkfifo(QFile::encodeName(fifo).constData(), 0600), 0);
    QFile huge(dir.filePath("huge.txt"));
    ASSERT_TRUE(huge.open(QIODevice::WriteOnly) && huge.resize(MaxDataFileBytes + 1));
    huge.close();
    for (const QString &path : { fifo, huge.fileName(), QStringLiteral("/dev/zero") })
        EXPECT_EQ(ReadWholeFile(path), "") << path.toStdString();
    EXPECT_EQ(boxes.shown().size(), 5);
}

TEST(TextLines, splitAtLineFeedsWithOrWithoutCarriageReturns)
{
    const struct
    {
        const char *text;
        QStringList lines;
    } cases[] = {
        { "724\tES\r\n300\tEL\r\n", { "724\tES", "300\tEL", "" } },
        { "724\tES\n300\tEL", { "724\tES", "300\tEL" } },
        { "a\r\nb\nc\r", { "a", "b", "c" } },
        { "a\rb", { "a\rb" } },
        { "", { "" } },
    };
    for (const auto &c : cases) {
        const QString text = QString::fromLatin1(c.text);
        QStringList lines;
        for (const QStringView line : textLines(text))
            lines << line.toString();
        EXPECT_EQ(lines, c.lines) << c.text;
    }
}

TEST(FormatShortName, shortensAndCapitalises)
{
    struct Case
    {
        const char *name;
        const char *expected;
    };
    const Case cases[] = {
        { "ANA MARIA LUZ", "Ana M. Luz" }, // "ANA LUZ" has 7 characters: middle initial kept
        { "rui pedro a sousa", "Rui P. Sousa" }, // 9 characters
        { "JOAO PEDRO DA SILVA", "Joao Silva" }, // "JOAO SILVA" has 10
        { "maria  da   conceicao   ferreira", "Maria Ferreira" },
        { "ana luz", "Ana Luz" },
        { "RUI     SOUSA", "Rui Sousa" }, // a run of blanks is one, whatever its length
        { "  ana  ", " Ana " }, // fewer than three words: not trimmed
        { "", "" },
    };
    for (const Case &c : cases)
        EXPECT_EQ(FormatShortName(QString::fromUtf8(c.name)), QString::fromUtf8(c.expected)) << c.name;
}

TEST(WindowOperations, objectWindowRectComesFromTheHwndProperty)
{
    QWidget window;
    window.setGeometry(40, 50, 200, 100);
    window.show();
    window.setProperty("hWnd", platform::handleOf(&window));
    const RECT rect = GetObjectWindowRect(&window);
    EXPECT_EQ(rect.right - rect.left, window.frameGeometry().width());
    EXPECT_EQ(rect.bottom - rect.top, window.frameGeometry().height());
    EXPECT_EQ(rect.left, window.frameGeometry().left());

    QObject noWindow;
    EXPECT_EQ(GetObjectWindowRect(&noWindow), RECT {});
    EXPECT_EQ(GetObjectWindowRect(nullptr), RECT {});

    MakeWindowTopmost(platform::handleOf(&window));
    EXPECT_TRUE(window.windowFlags() & Qt::WindowStaysOnTopHint);
    MakeWindowTopmost(0);
}

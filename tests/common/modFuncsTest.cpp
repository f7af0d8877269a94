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

using namespace zelctl;
using namespace zelctl::modFuncs;

namespace {

class RootPath : public ::testing::Test
{
protected:
    void SetUp() override { saved = platform::GetSetting("zEL", "Setup", "RootPath"); }
    void TearDown() override { platform::SaveSetting("zEL", "Setup", "RootPath", saved); }
    QString saved;
};

} // namespace

// With no stored value the current folder becomes the root and is stored (in the
// case-folded store); a stored one gets a trailing slash but is not rewritten; once computed
// it is kept.
TEST_F(RootPath, comesFromTheSettingsOrTheCurrentFolderAndIsKept)
{
    platform::DeleteSetting("ZEL", "Setup", "RootPath");
    const QString current = QDir::currentPath() + "/";
    QString root; // cached per thread: each case asks from a thread of its own
    std::thread([&] { root = GetRootPath(); }).join();
    EXPECT_EQ(root, current);
    EXPECT_EQ(platform::GetSetting("zel", "Setup", "RootPath"), current);

    platform::SaveSetting("zEL", "Setup", "RootPath", "/opt/zel");
    QString first, stored, second;
    std::thread([&] {
        first = GetRootPath();
        stored = platform::GetSetting("zEL", "Setup", "RootPath");
        platform::SaveSetting("zEL", "Setup", "RootPath", "/second/");
        second = GetDataPath();
    }).join();
    EXPECT_EQ(first, "/opt/zel/");
    EXPECT_EQ(stored, "/opt/zel") << "not rewritten";
    EXPECT_EQ(second, "/opt/zel/data/");
}

TEST(ReadWholeFile, decodesWindows1252)
{
    QTemporaryDir dir;
    const QString file = test::writeFile(dir.filePath("pt.txt"), "Jo\xe3o\t\x80\x93\x9f\r\n");
    EXPECT_EQ(ReadWholeFile(file), QString::fromUtf8("João\t€“Ÿ\r\n"));
    EXPECT_EQ(SafeFileLength(file), 10);
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

    EXPECT_EQ(ReadWholeFile(test::writeFile(dir.filePath("empty.txt"), "")), "");
    EXPECT_EQ(boxes.shown().size(), 2) << "an empty file is treated as a missing one";
    EXPECT_EQ(SafeFileLength(dir.path()), 0) << "a folder has no length";

    // A FIFO would make the reader wait for a writer; a huge file would fill the memory.
    for (const QString &path : { test::makeFifo(dir.filePath("fifo.txt")),
             test::sizedFile(dir.filePath("huge.txt"), MaxDataFileBytes + 1), QStringLiteral("/dev/zero") })
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
    QWidget child(&window); // a control: its own rectangle, in screen coordinates
    child.setGeometry(5, 6, 20, 10);
    child.setProperty("hWnd", platform::handleOf(&child));
    const QPoint origin = child.mapToGlobal(QPoint());
    EXPECT_EQ(GetObjectWindowRect(&child), (RECT { origin.x(), origin.y(), origin.x() + 20, origin.y() + 10 }));

    QObject noWindow;
    EXPECT_EQ(GetObjectWindowRect(&noWindow), RECT {});
    EXPECT_EQ(GetObjectWindowRect(nullptr), RECT {});

    MakeWindowTopmost(platform::handleOf(&window));
    EXPECT_TRUE(window.windowFlags() & Qt::WindowStaysOnTopHint);
    MakeWindowTopmost(0);
}

#include "common/modFuncs.h"

#include "platform/Settings.h"
#include "platform/WindowHandles.h"
#include "support/TestSupport.h"

#include <QDir>
#include <QTemporaryDir>
#include <QWidget>

#include <gtest/gtest.h>

#include <thread>

using namespace zelctl;
using namespace zelctl::modFuncs;

// With no stored value the current folder becomes the root and is stored (in the
// case-folded store); a stored one gets a trailing slash but is not rewritten; once computed
// it is kept.
TEST(RootPath, comesFromTheSettingsOrTheCurrentFolderAndIsKept)
{
    const QString saved = platform::GetSetting("zEL", "Setup", "RootPath");
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
    platform::SaveSetting("zEL", "Setup", "RootPath", saved);
}

// Windows-1252 text; a missing, empty, endless or huge file reads as empty, with the message
// unless quiet.
TEST(ReadWholeFile, decodesWindows1252AndRefusesWhatIsNotAReadableFile)
{
    QTemporaryDir dir;
    const QString file = test::writeFile(dir.filePath("pt.txt"), "Jo\xe3o\t\x80\x93\x9f\r\n");
    EXPECT_EQ(ReadWholeFile(file), QString::fromUtf8("João\t€“Ÿ\r\n"));
    EXPECT_EQ(SafeFileLength(file), 10);
    EXPECT_EQ(SafeFileLength(dir.path()), 0) << "a folder has no length";

    test::MessageBoxRecorder boxes;
    const QString missing = dir.filePath("iso3166.txt");
    EXPECT_EQ(ReadWholeFile(missing, true), "");
    EXPECT_TRUE(boxes.shown().isEmpty());
    for (const QString &path :
        { missing, test::writeFile(dir.filePath("empty.txt"), ""), test::makeFifo(dir.filePath("fifo.txt")),
            test::sizedFile(dir.filePath("huge.txt"), MaxDataFileBytes + 1), QStringLiteral("/dev/zero") })
        EXPECT_EQ(ReadWholeFile(path), "") << path.toStdString();
    ASSERT_EQ(boxes.shown().size(), 5);
    EXPECT_TRUE(boxes.shown().first().text.contains(missing));
}

TEST(TextLines, splitAtLineFeedsWithOrWithoutCarriageReturns)
{
    const std::pair<const char *, QStringList> cases[] = {
        { "a\r\nb\nc\r", { "a", "b", "c" } },
        { "a\rb\r\n", { "a\rb", "" } },
    };
    for (const auto &[text, expected] : cases) {
        const QString whole = QString::fromLatin1(text);
        QStringList lines;
        for (const QStringView line : textLines(whole))
            lines << line.toString();
        EXPECT_EQ(lines, expected) << text;
    }
}

TEST(FormatShortName, shortensAndCapitalises)
{
    const std::pair<const char *, const char *> cases[] = {
        { "ANA MARIA LUZ", "Ana M. Luz" }, // "ANA LUZ" has 7 characters: middle initial kept
        { "rui pedro a sousa", "Rui P. Sousa" }, // 9 characters
        { "JOAO PEDRO DA SILVA", "Joao Silva" }, // "JOAO SILVA" has 10
        { "RUI     SOUSA", "Rui Sousa" }, // a run of blanks is one, whatever its length
        { "  ana  ", " Ana " }, // fewer than three words: not trimmed
        { "", "" },
    };
    for (const auto &[name, expected] : cases)
        EXPECT_EQ(FormatShortName(QString::fromUtf8(name)), QString::fromUtf8(expected)) << name;
}

TEST(WindowOperations, objectWindowRectComesFromTheHwndProperty)
{
    QWidget window;
    window.setGeometry(40, 50, 200, 100);
    window.show();
    window.setProperty("hWnd", platform::handleOf(&window));
    const QRect frame = window.frameGeometry();
    EXPECT_EQ(
        GetObjectWindowRect(&window), (RECT { frame.left(), frame.top(), frame.right() + 1, frame.bottom() + 1 }));
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

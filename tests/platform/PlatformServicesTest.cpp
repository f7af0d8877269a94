#include "platform/OleColor.h"
#include "platform/Settings.h"
#include "platform/Shell.h"

#include <QFile>
#include <QStandardPaths>

#include <gtest/gtest.h>

using namespace zelctl::platform;

TEST(Settings, liveInThePrivateConfigFolderAndFoldTheApplicationName)
{
    const QString home = qEnvironmentVariable("XDG_CONFIG_HOME");
    ASSERT_FALSE(home.isEmpty());
    EXPECT_TRUE(settingsFile("ZEL").startsWith(home)) << "tests never touch the user's settings";
    EXPECT_EQ(settingsFile("ZEL"), settingsFile("zEL"));

    SaveSetting("ZEL", "Config", "allowautonif", "0");
    EXPECT_EQ(GetSetting("zel", "Config", "allowautonif", "1"), "0");
    EXPECT_TRUE(QFile::exists(settingsFile("ZeL")));
    DeleteSetting("zEL", "Config", "allowautonif");
    EXPECT_EQ(GetSetting("ZEL", "Config", "allowautonif", "1"), "1");
}

TEST(OleColor, resolvesSystemColoursAndConvertsToQColor)
{
    EXPECT_EQ(translateColor(0x12563412u), 0x00563412u) << "only the colour bytes count";
    for (const auto &[index, colour] : { std::pair { COLOR_WINDOW, rgb(255, 255, 255) },
             { COLOR_BTNFACE, rgb(240, 240, 240) }, { COLOR_GRAYTEXT, rgb(109, 109, 109) } }) {
        EXPECT_EQ(translateColor(systemColor(index)), colour) << index;
    }
    EXPECT_EQ(GetSysColor(-1), 0u);
    EXPECT_EQ(GetSysColor(31), 0u);
    EXPECT_EQ(toQColor(rgb(10, 20, 30)), QColor(10, 20, 30));
    EXPECT_EQ(toQColor(systemColor(COLOR_GRAYTEXT)), QColor(109, 109, 109));
    EXPECT_EQ(fromQColor(QColor(10, 20, 30)), rgb(10, 20, 30));
}

// The hook's answer is the caller's, and the hook handed back on restoring is the one that
// was installed.
TEST(Shell, hookSeesTheActionAndCanBeRestored)
{
    QStringList opened;
    ShellOpenHook previous = setShellOpenHook([&](const QString &action) {
        opened << action;
        return action.startsWith("https:");
    });
    EXPECT_TRUE(shellOpen("https://example.invalid/ajuda"));
    EXPECT_FALSE(shellOpen("nada"));
    ShellOpenHook ours = setShellOpenHook(std::move(previous));
    ASSERT_TRUE(ours);
    ours("de volta");
    EXPECT_EQ(opened, QStringList({ "https://example.invalid/ajuda", "nada", "de volta" }));
}

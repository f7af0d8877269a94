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
    EXPECT_EQ(translateColor(0x00563412u), 0x00563412u);
    EXPECT_EQ(translateColor(systemColor(COLOR_WINDOW)), rgb(255, 255, 255));
    EXPECT_EQ(translateColor(systemColor(COLOR_BTNFACE)), GetSysColor(COLOR_BTNFACE));
    EXPECT_EQ(GetSysColor(-1), 0u);
    EXPECT_EQ(GetSysColor(200), 0u);
    EXPECT_EQ(toQColor(rgb(10, 20, 30)), QColor(10, 20, 30));
    EXPECT_EQ(fromQColor(QColor(10, 20, 30)), rgb(10, 20, 30));
}

TEST(Shell, hookSeesTheActionAndCanBeRestored)
{
    QStringList opened;
    ShellOpenHook previous = setShellOpenHook([&](const QString &action) {
        opened << action;
        return true;
    });
    EXPECT_TRUE(shellOpen("https://example.invalid/ajuda"));
    setShellOpenHook(std::move(previous));
    EXPECT_EQ(opened, QStringList({ "https://example.invalid/ajuda" }));
}

#include "common/modFuncs.h"
#include "platform/MessageBox.h"
#include "platform/OleColor.h"
#include "platform/Settings.h"
#include "support/TestSupport.h"

#include <QApplication>
#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QPointer>
#include <QTest>
#include <QTimer>

#include <gtest/gtest.h>

#include <thread>

using namespace zelctl::platform;
using zelctl::test::writeFile;

namespace {

QByteArray contents(const QString &path)
{
    QFile file(path);
    return file.open(QIODevice::ReadOnly) ? file.readAll() : QByteArray();
}

// Each thread keeps its own root path, so a new one reads the setting afresh.
QString rootPathInANewThread()
{
    QString root;
    std::thread([&root] { root = zelctl::modFuncs::GetRootPath(); }).join();
    return root;
}

} // namespace

TEST(Settings, aHandEditedValueIsReadWholeAndNeverWrittenOver)
{
    const QString path = settingsFile("zEL");
    const QByteArray original = contents(path);
    const QByteArray edited = "[Setup]\nRootPath=/opt/zel,2024\nSkinPreviewPath = /srv/skins;old \n";
    writeFile(path, edited);

    EXPECT_EQ(GetSetting("zEL", "Setup", "RootPath"), "/opt/zel,2024");
    EXPECT_EQ(GetSetting("zEL", "Setup", "SkinPreviewPath"), "/srv/skins;old");
    EXPECT_EQ(rootPathInANewThread(), "/opt/zel,2024/");
    EXPECT_EQ(contents(path), edited) << "the user's setting stays as written";

    EXPECT_TRUE(SaveSetting("zEL", "Setup", "Mixed", "a,b;c"));
    EXPECT_EQ(GetSetting("zEL", "Setup", "Mixed"), "a,b;c") << "what the library writes reads back the same";
    writeFile(path, original);
}

TEST(Settings, aStoreThatCannotBeReadIsNeverWrittenOver)
{
    const QString path = settingsFile("zEL");
    QFile original(path);
    ASSERT_TRUE(original.rename(path + ".kept"));

    // A folder where the file should be, and a person's typos, which the reader passes over or
    // reads round: the session still has a root, and the store stays as it was.
    const struct
    {
        QByteArray typed; // none: a folder
        QString root;
    } stores[] = {
        { {}, QDir::currentPath() + '/' },
        { "[Setup\nRootPath=/opt/zel\nSkinPreviewPath=/srv/skins\n", "/opt/zel/" },
    };
    for (const auto &store : stores) {
        ASSERT_TRUE(store.typed.isNull() ? QDir().mkpath(path + "/kept") : !writeFile(path, store.typed).isEmpty());
        EXPECT_EQ(rootPathInANewThread().toStdString(), store.root.toStdString());
        EXPECT_FALSE(SaveSetting("zEL", "Setup", "SkinPreviewPath", "/tmp/"));
        EXPECT_FALSE(DeleteSetting("zEL", "Setup", "SkinPreviewPath"));
        EXPECT_EQ(contents(path), store.typed);
        EXPECT_EQ(QFileInfo(path + "/kept").isDir(), store.typed.isNull());
        QDir(path).removeRecursively();
    }
    QFile::remove(path);
    original.rename(path);
}

TEST(MessageBox, closingTheWindowItBelongsToWhileItIsOpenAnswersAsEscape)
{
    const MessageBoxPresenter recorder = setMessageBoxPresenter({});
    for (const auto &[buttons, answer] : { std::pair { MsgButtons::OkCancel, MsgResult::Cancel },
             std::pair { MsgButtons::YesNo, MsgResult::No }, std::pair { MsgButtons::Ok, MsgResult::Ok } }) {
        const QPointer<QWidget> window = new QWidget;
        ASSERT_TRUE(zelctl::test::showActive(window));
        QTimer::singleShot(0, window, [&] { delete window.data(); });
        EXPECT_EQ(messageBox(MsgIcon::Question, "Sair", "Sair sem guardar?", buttons), answer);
        EXPECT_TRUE(window.isNull());
    }
    setMessageBoxPresenter(recorder);
}

TEST(OleColor, resolvesSystemColours)
{
    EXPECT_EQ(translateColor(0x12563412u), 0x00563412u) << "only the colour bytes count";
    for (const auto &[index, colour] :
        { std::pair { int(COLOR_WINDOW), rgb(255, 255, 255) }, { int(COLOR_BTNFACE), rgb(240, 240, 240) },
            { int(COLOR_GRAYTEXT), rgb(109, 109, 109) }, { -1, 0u }, { 31, 0u } })
        EXPECT_EQ(GetSysColor(index), colour) << index;
    EXPECT_EQ(translateColor(systemColor(COLOR_GRAYTEXT)), rgb(109, 109, 109));
}

// Test main of every area: a QApplication on the offscreen platform, settings and data in
// private XDG folders (never the user's), the source tree as the application's root folder,
// and no message box or modal form that a test did not ask for.

#include "platform/MessageBox.h"
#include "platform/ModalPresenter.h"
#include "platform/Settings.h"

#include <QApplication>
#include <QDialog>
#include <QTemporaryDir>

#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>

int main(int argc, char **argv)
{
    QTemporaryDir home;
    if (!home.isValid())
        return 1;
    qputenv("XDG_CONFIG_HOME", QFile::encodeName(home.filePath("config")));
    qputenv("XDG_DATA_HOME", QFile::encodeName(home.filePath("data")));
    qputenv("XDG_CACHE_HOME", QFile::encodeName(home.filePath("cache")));
    if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");

    // The x11 programs need a real server for grabs and focus; without one Qt would abort
    // with a message that does not say how to get one.
    if (qgetenv("QT_QPA_PLATFORM") == "xcb" && qEnvironmentVariableIsEmpty("DISPLAY")) {
        std::fprintf(stderr, "this test program needs an X server: run it through scripts/test, which starts Xvfb\n");
        return 1;
    }
    QApplication app(argc, argv);
    zelctl::platform::SaveSetting("zEL", "Setup", "RootPath", ZELCTL_SOURCE_DIR "/");
    zelctl::platform::setMessageBoxPresenter([](const zelctl::platform::MessageBoxRequest &request) {
        ADD_FAILURE() << "unexpected message box: " << request.title.toStdString();
        return zelctl::platform::MsgResult::Ok;
    });
    zelctl::platform::setModalPresenter([](QDialog &dialog) {
        ADD_FAILURE() << "unexpected modal form: " << dialog.windowTitle().toStdString();
        return int(QDialog::Rejected);
    });

    ::testing::InitGoogleTest(&argc, argv);
    return RUN_ALL_TESTS();
}

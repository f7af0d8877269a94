// Test main of every area: a QApplication on the offscreen platform, settings and data in
// private XDG folders (never the user's), the source tree as the application's root folder,
// and no message box or modal form that a test did not ask for.

#include "platform/MessageBox.h"
#include "platform/ModalPresenter.h"
#include "platform/Settings.h"
#include "support/TestSupport.h"

#include <QApplication>
#include <QDialog>
#include <QTemporaryDir>

#include <gtest/gtest.h>

int main(int argc, char **argv)
{
    QTemporaryDir home;
    if (!zelctl::test::usePrivateEnvironment(home))
        return 1;
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

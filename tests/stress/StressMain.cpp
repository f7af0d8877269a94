// Main of the stress host: private settings and data folders and the source tree as root,
// as in every test program, but with the library's real menus, modal forms and message
// boxes (the watcher dismisses them), and an application that tells the host when Qt is
// delivering an event after which it still works on the widget.

#include "StressHost.h"

#include "platform/Settings.h"
#include "platform/Shell.h"

#include <QApplication>
#include <QTemporaryDir>

#include <gtest/gtest.h>

#include <cstdio>

namespace {

class StressApplication : public QApplication
{
public:
    using QApplication::QApplication;

    bool notify(QObject *receiver, QEvent *event) override
    {
        const bool unsafe = receiver->isWidgetType() && !zelctl::stress::UnsafeEvents::isSafe(receiver, event);
        if (unsafe)
            zelctl::stress::UnsafeEvents::enter();
        const bool handled = QApplication::notify(receiver, event);
        if (unsafe)
            zelctl::stress::UnsafeEvents::leave();
        return handled;
    }
};

} // namespace

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
    if (qgetenv("QT_QPA_PLATFORM") == "xcb" && qEnvironmentVariableIsEmpty("DISPLAY")) {
        std::fprintf(
            stderr, "the stress host on xcb needs an X server: run it through scripts/test or scripts/stress\n");
        return 1;
    }
    StressApplication app(argc, argv);
    zelctl::platform::SaveSetting("zEL", "Setup", "RootPath", ZELCTL_SOURCE_DIR "/");
    // Documents and addresses are not opened for real.
    zelctl::platform::setShellOpenHook([](const QString &) { return true; });
    zelctl::stress::Journal::installReporters(std::chrono::seconds(120));

    ::testing::InitGoogleTest(&argc, argv);
    return RUN_ALL_TESTS();
}

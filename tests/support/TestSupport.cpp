#include "TestSupport.h"

#include <QApplication>
#include <QFile>
#include <QTest>

#include <gtest/gtest.h>

#include <cstdio>

#include <sys/stat.h>

namespace zelctl::test {

bool usePrivateEnvironment(const QTemporaryDir &home)
{
    if (!home.isValid())
        return false;
    for (const char *folder : { "config", "data", "cache" }) {
        const QByteArray variable = "XDG_" + QByteArray(folder).toUpper() + "_HOME";
        qputenv(variable.constData(), QFile::encodeName(home.filePath(folder)));
    }
    if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");
    // Qt would abort with a message that does not say how to get a server.
    if (qgetenv("QT_QPA_PLATFORM") == "xcb" && qEnvironmentVariableIsEmpty("DISPLAY")) {
        std::fprintf(stderr, "this test program needs an X server: run it through scripts/test, which starts Xvfb\n");
        return false;
    }
    return true;
}

bool showActive(QWidget *window)
{
    window->show();
    window->activateWindow();
    // Offscreen, no window system hands out the activation.
    if (QGuiApplication::platformName() == QLatin1String("offscreen"))
        QApplication::setActiveWindow(window);
    return QTest::qWaitForWindowActive(window);
}

QString sourcePath(const QString &relative)
{
    return QStringLiteral(ZELCTL_SOURCE_DIR "/") + relative;
}

QString testDataPath(const QString &relative)
{
    return QStringLiteral(ZELCTL_TEST_DATA_DIR "/") + relative;
}

QString writeFile(const QString &path, const QByteArray &bytes)
{
    QFile file(path);
    EXPECT_TRUE(file.open(QIODevice::WriteOnly) && file.write(bytes) == bytes.size()) << path.toStdString();
    return path;
}

QString sizedFile(const QString &path, qint64 size)
{
    QFile file(path);
    EXPECT_TRUE(file.open(QIODevice::WriteOnly) && file.resize(size)) << path.toStdString();
    return path;
}

QString makeFifo(const QString &path)
{
    EXPECT_EQ(::mkfifo(QFile::encodeName(path).constData(), 0600), 0) << path.toStdString();
    return path;
}

MessageBoxRecorder::MessageBoxRecorder(platform::MsgResult answer)
    : m_previous(platform::setMessageBoxPresenter([this, answer](const platform::MessageBoxRequest &request) {
        m_shown.append(request);
        return answer;
    }))
{ }

MessageBoxRecorder::~MessageBoxRecorder()
{
    platform::setMessageBoxPresenter(std::move(m_previous));
}

ModalDriver::ModalDriver(std::function<int(QDialog &)> drive)
    : m_previous(platform::setModalPresenter([this, drive = std::move(drive)](QDialog &dialog) {
        ++m_count;
        return drive(dialog);
    }))
{ }

ModalDriver::~ModalDriver()
{
    platform::setModalPresenter(std::move(m_previous));
}

} // namespace zelctl::test

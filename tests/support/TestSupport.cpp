#include "TestSupport.h"

#include <QFile>

#include <gtest/gtest.h>

#include <sys/stat.h>

namespace zelctl::test {

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

#include "TestSupport.h"

namespace zelctl::test {

QString sourcePath(const QString &relative)
{
    return QStringLiteral(ZELCTL_SOURCE_DIR "/") + relative;
}

QString testDataPath(const QString &relative)
{
    return QStringLiteral(ZELCTL_TEST_DATA_DIR "/") + relative;
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

#pragma once

#include "platform/MessageBox.h"
#include "platform/ModalPresenter.h"

#include <QList>
#include <QString>
#include <QTemporaryDir>
#include <QWidget>

#include <functional>
#include <ostream>

// Readable texts in the tests' messages.
inline void PrintTo(const QString &text, std::ostream *out)
{
    *out << '"' << text.toStdString() << '"';
}

namespace zelctl::test {

// Before the application: settings, data and cache under `home`, never the user's, and the
// offscreen platform unless another is asked for; false, saying why, on xcb without a server.
bool usePrivateEnvironment(const QTemporaryDir &home);

// Shows the window and makes it the active one, as a user's click does; false if it is not.
bool showActive(QWidget *window);

// Path of a file under the source tree or under tests/data.
QString sourcePath(const QString &relative);
QString testDataPath(const QString &relative);

// Files a test makes, by path; each returns the path and fails the test when it cannot.
// writeFile: with these bytes; sizedFile: of this many (zero, sparse) bytes; makeFifo: a
// FIFO, whose reader would wait for a writer.
QString writeFile(const QString &path, const QByteArray &bytes);
QString sizedFile(const QString &path, qint64 size);
QString makeFifo(const QString &path);

// Records every message box shown while it lives and answers each with `answer`.
class MessageBoxRecorder
{
public:
    explicit MessageBoxRecorder(platform::MsgResult answer = platform::MsgResult::Ok);
    ~MessageBoxRecorder();
    MessageBoxRecorder(const MessageBoxRecorder &) = delete;
    MessageBoxRecorder &operator=(const MessageBoxRecorder &) = delete;

    const QList<platform::MessageBoxRequest> &shown() const { return m_shown; }

private:
    QList<platform::MessageBoxRequest> m_shown;
    platform::MessageBoxPresenter m_previous;
};

// Drives the library's modal forms while it lives: `drive` gets each form instead of the
// user and returns its result (QDialog::Accepted or QDialog::Rejected).
class ModalDriver
{
public:
    explicit ModalDriver(std::function<int(QDialog &)> drive);
    ~ModalDriver();
    ModalDriver(const ModalDriver &) = delete;
    ModalDriver &operator=(const ModalDriver &) = delete;

    int shownCount() const { return m_count; }

private:
    int m_count = 0;
    platform::ModalPresenter m_previous;
};

} // namespace zelctl::test

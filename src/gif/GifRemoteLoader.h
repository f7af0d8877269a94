#pragma once

#include <QByteArray>
#include <QObject>
#include <QPointer>

class QNetworkAccessManager;
class QNetworkReply;

namespace zelctl {

// Reads a GIF from a local path, a file:// address or an http(s):// address on the event
// loop, so the user-interface thread never waits. One read at a time: starting another
// abandons the one in progress.
class GifRemoteLoader : public QObject
{
    Q_OBJECT

public:
    explicit GifRemoteLoader(QObject *parent = nullptr);
    ~GifRemoteLoader() override;

    // False when the read cannot start (an unknown kind of address); then no signal follows.
    bool start(const QString &path);
    void cancel();

Q_SIGNALS:
    void finished(const QByteArray &bytes);
    // The read failed, or the data grew beyond what a GIF may hold here.
    void failed();

private:
    void done();

    QNetworkAccessManager *m_network = nullptr;
    QPointer<QNetworkReply> m_reply;
};

} // namespace zelctl

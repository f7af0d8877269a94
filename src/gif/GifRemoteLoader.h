#pragma once

#include "zelctl_export.h"

#include <QByteArray>
#include <QObject>
#include <QPointer>
#include <QTimer>
#include <QUrl>

class QNetworkAccessManager;
class QNetworkDiskCache;
class QNetworkReply;

namespace zelctl {

// Reads a GIF from a local path, a file:// address or an http(s):// address on the event
// loop, so the user-interface thread never waits: a local file is read from a zero timer
// (a FIFO or device is refused), an address through the network with a transfer timeout,
// a limit on redirects and no more bytes than maxBytes. Every address read whole is kept in
// a disk cache in the user's cache folder; when the network fails, the kept copy is given
// instead. One read at a time: starting another abandons the one in progress.
class ZELCTL_EXPORT GifRemoteLoader : public QObject
{
    Q_OBJECT

public:
    // Redirects followed before a read fails.
    static constexpr int MaxRedirects = 5;
    // Seconds without a byte before a transfer is abandoned, unless the setting "giftimeout"
    // (application "ZEL", section "Config") gives another whole number of seconds.
    static constexpr int DefaultTimeoutSeconds = 30;

    explicit GifRemoteLoader(QObject *parent = nullptr);
    ~GifRemoteLoader() override;

    // False when the read cannot start (an unknown kind of address); then no signal follows.
    bool start(const QString &path);
    void cancel();

    // The most bytes a read may give (a GIF's own limit unless set); a body announced or
    // grown larger is abandoned as soon as that is known.
    void setMaxBytes(qint64 bytes) { m_maxBytes = bytes; }

Q_SIGNALS:
    void finished(const QByteArray &bytes);
    // The read failed and no kept copy could stand in, or the data grew beyond maxBytes.
    void failed();

private:
    void readLocal();
    void received();
    void done();
    bool refuseLength(qint64 length);
    QNetworkDiskCache *cache();

    QNetworkAccessManager *m_network = nullptr;
    QNetworkDiskCache *m_cache = nullptr;
    QPointer<QNetworkReply> m_reply;
    QUrl m_url;
    QByteArray m_body;
    bool m_tooLarge = false;
    QTimer m_local;
    QString m_localPath;
    qint64 m_maxBytes;
};

} // namespace zelctl

#include "GifRemoteLoader.h"

#include "gif/GifLimits.h"
#include "platform/FileRead.h"
#include "platform/Settings.h"

#include <QFileInfo>
#include <QNetworkAccessManager>
#include <QNetworkDiskCache>
#include <QNetworkReply>
#include <QNetworkRequest>
#include <QStandardPaths>

#include <algorithm>
#include <memory>

namespace zelctl {

namespace {

// Room for a few animations; the oldest are dropped first.
constexpr qint64 CacheBytes = qint64(64) << 20;

int timeoutSeconds()
{
    bool ok = false;
    const int seconds
        = platform::GetSetting(QStringLiteral("ZEL"), QStringLiteral("Config"), QStringLiteral("giftimeout"))
              .trimmed()
              .toInt(&ok);
    return ok && seconds > 0 ? seconds : GifRemoteLoader::DefaultTimeoutSeconds;
}

} // namespace

GifRemoteLoader::GifRemoteLoader(QObject *parent)
    : QObject(parent)
    , m_maxBytes(gifLimits::MaxFileBytes)
{
    m_local.setSingleShot(true);
    connect(&m_local, &QTimer::timeout, this, &GifRemoteLoader::readLocal);
}

GifRemoteLoader::~GifRemoteLoader()
{
    cancel();
}

bool GifRemoteLoader::start(const QString &path)
{
    cancel();
    QUrl url(path);
    const QString scheme = url.scheme().toLower();
    // A one-letter scheme is a drive letter, and no scheme at all a local path.
    if (scheme.size() <= 1 || scheme == "file") {
        m_localPath = scheme == "file" ? url.toLocalFile() : QFileInfo(path).absoluteFilePath();
        m_local.start(0);
        return true;
    }
    if ((scheme != "http" && scheme != "https") || !url.isValid())
        return false;

    if (!m_network)
        m_network = new QNetworkAccessManager(this);
    QNetworkRequest request(url);
    request.setAttribute(QNetworkRequest::CacheLoadControlAttribute, QNetworkRequest::AlwaysNetwork);
    request.setMaximumRedirectsAllowed(MaxRedirects);
    request.setTransferTimeout(timeoutSeconds() * 1000);
    QNetworkReply *reply = m_network->get(request);
    if (!reply)
        return false;
    m_reply = reply;
    m_url = url;
    m_tooLarge = false;
    // The body is taken as it arrives, so the reply's own buffer stays small.
    reply->setReadBufferSize(qint64(1) << 20);
    connect(reply, &QNetworkReply::metaDataChanged, this, [this, reply] {
        if (reply == m_reply)
            refuseLength(reply->header(QNetworkRequest::ContentLengthHeader).toLongLong());
    });
    connect(reply, &QNetworkReply::readyRead, this, &GifRemoteLoader::received);
    connect(reply, &QNetworkReply::finished, this, &GifRemoteLoader::done);
    return true;
}

void GifRemoteLoader::cancel()
{
    m_local.stop();
    m_body.clear();
    if (QNetworkReply *reply = m_reply.data()) {
        m_reply = nullptr;
        reply->disconnect(this);
        reply->abort();
        reply->deleteLater();
    }
}

void GifRemoteLoader::readLocal()
{
    platform::FileRead file = platform::readFile(m_localPath, m_maxBytes);
    if (file.ok())
        Q_EMIT finished(file.bytes);
    else
        Q_EMIT failed();
}

bool GifRemoteLoader::refuseLength(qint64 length)
{
    if (length <= m_maxBytes)
        return false;
    m_tooLarge = true;
    m_body.clear();
    // The reply finishes with an error at once; done() tells the control.
    m_reply->abort();
    return true;
}

void GifRemoteLoader::received()
{
    QNetworkReply *reply = m_reply.data();
    if (!reply || sender() != reply || m_tooLarge)
        return;
    const qint64 available = reply->bytesAvailable();
    if (refuseLength(m_body.size() + available))
        return;
    if (m_body.size() + available > m_body.capacity()) {
        // Grow by doubling, but never past the limit: an endless body costs no more than a GIF may.
        const qint64 announced = reply->header(QNetworkRequest::ContentLengthHeader).toLongLong();
        const qint64 wanted = std::max({ 2 * m_body.capacity(), m_body.size() + available, announced });
        m_body.reserve(qsizetype(std::min(wanted, m_maxBytes)));
    }
    m_body += reply->read(available);
}

void GifRemoteLoader::done()
{
    QNetworkReply *reply = m_reply.data();
    if (!reply || sender() != reply)
        return;
    m_reply = nullptr;
    reply->deleteLater();
    received();
    const QNetworkReply::NetworkError error = reply->error();
    QByteArray body = std::exchange(m_body, {});
    if (m_tooLarge) {
        Q_EMIT failed();
        return;
    }
    if (error == QNetworkReply::NoError) {
        QNetworkCacheMetaData meta;
        meta.setUrl(m_url);
        meta.setSaveToDisk(true);
        meta.setLastModified(QDateTime::currentDateTimeUtc());
        if (QIODevice *device = cache()->prepare(meta)) {
            device->write(body);
            cache()->insert(device);
        }
        Q_EMIT finished(body);
        return;
    }
    // Errors below 200 are the network's own (no connection, no host, a timeout): a copy
    // kept from an earlier read stands in. A server's answer, such as 404, is final.
    if (error < QNetworkReply::ContentAccessDenied) {
        const std::unique_ptr<QIODevice> kept(cache()->data(m_url));
        if (kept) {
            body = kept->read(m_maxBytes + 1);
            if (!body.isEmpty() && body.size() <= m_maxBytes) {
                Q_EMIT finished(body);
                return;
            }
        }
    }
    Q_EMIT failed();
}

QNetworkDiskCache *GifRemoteLoader::cache()
{
    if (!m_cache) {
        m_cache = new QNetworkDiskCache(this);
        m_cache->setCacheDirectory(
            QStandardPaths::writableLocation(QStandardPaths::GenericCacheLocation) + QStringLiteral("/zelctl/gif"));
        m_cache->setMaximumCacheSize(CacheBytes);
    }
    return m_cache;
}

} // namespace zelctl

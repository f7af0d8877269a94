#include "GifRemoteLoader.h"

#include "gif/GifLimits.h"

#include <QFileInfo>
#include <QNetworkAccessManager>
#include <QNetworkReply>
#include <QNetworkRequest>
#include <QUrl>

namespace zelctl {

GifRemoteLoader::GifRemoteLoader(QObject *parent)
    : QObject(parent)
{ }

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
    if (scheme.size() <= 1)
        url = QUrl::fromLocalFile(QFileInfo(path).absoluteFilePath());
    else if (scheme != "file" && scheme != "http" && scheme != "https")
        return false;
    if (!url.isValid())
        return false;

    if (!m_network)
        m_network = new QNetworkAccessManager(this);
    QNetworkRequest request(url);
    // A copy kept from an earlier read serves when the network fails.
    request.setAttribute(QNetworkRequest::CacheLoadControlAttribute, QNetworkRequest::PreferNetwork);
    QNetworkReply *reply = m_network->get(request);
    if (!reply)
        return false;
    m_reply = reply;
    connect(reply, &QNetworkReply::downloadProgress, this, [reply](qint64 received, qint64 total) {
        if (received > gifLimits::MaxFileBytes || total > gifLimits::MaxFileBytes)
            reply->abort();
    });
    connect(reply, &QNetworkReply::finished, this, &GifRemoteLoader::done);
    return true;
}

void GifRemoteLoader::cancel()
{
    if (QNetworkReply *reply = m_reply.data()) {
        m_reply = nullptr;
        reply->disconnect(this);
        reply->abort();
        reply->deleteLater();
    }
}

void GifRemoteLoader::done()
{
    QNetworkReply *reply = m_reply.data();
    if (!reply || sender() != reply)
        return;
    m_reply = nullptr;
    reply->deleteLater();
    if (reply->error() != QNetworkReply::NoError) {
        Q_EMIT failed();
        return;
    }
    const QByteArray bytes = reply->read(gifLimits::MaxFileBytes + 1);
    if (bytes.size() > gifLimits::MaxFileBytes) {
        Q_EMIT failed();
        return;
    }
    Q_EMIT finished(bytes);
}

} // namespace zelctl

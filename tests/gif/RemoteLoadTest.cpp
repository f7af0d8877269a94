#include "GifFiles.h"

#include "gif/ucAniGIF.h"
#include "platform/Twips.h"

#include <QMap>
#include <QSignalSpy>
#include <QTcpServer>
#include <QTcpSocket>
#include <QTemporaryDir>
#include <QTest>

#include <gtest/gtest.h>

using namespace zelctl;
using zelctl::test::GifBuilder;

namespace {

// A minimal HTTP server on 127.0.0.1 that answers each path with a fixed body, or 404.
class TinyHttpServer : public QObject
{
public:
    explicit TinyHttpServer(QMap<QString, QByteArray> bodies)
        : m_bodies(std::move(bodies))
    {
        connect(&m_server, &QTcpServer::newConnection, this, [this] {
            while (QTcpSocket *socket = m_server.nextPendingConnection()) {
                connect(socket, &QTcpSocket::readyRead, socket, [this, socket] { answer(socket); });
                connect(socket, &QTcpSocket::disconnected, socket, &QObject::deleteLater);
            }
        });
    }

    bool listen() { return m_server.listen(QHostAddress::LocalHost); }
    QString url(const QString &path) const
    {
        return QStringLiteral("http://127.0.0.1:%1%2").arg(m_server.serverPort()).arg(path);
    }

private:
    void answer(QTcpSocket *socket)
    {
        QByteArray &request = m_requests[socket];
        request += socket->readAll();
        if (!request.contains("\r\n\r\n"))
            return;
        const QString path = QString::fromLatin1(request.split(' ').value(1));
        QByteArray response;
        if (m_bodies.contains(path)) {
            const QByteArray &body = m_bodies[path];
            response = "HTTP/1.1 200 OK\r\nContent-Type: image/gif\r\nConnection: close\r\nContent-Length: "
                + QByteArray::number(body.size()) + "\r\n\r\n" + body;
        } else {
            response = "HTTP/1.1 404 Not Found\r\nConnection: close\r\nContent-Length: 0\r\n\r\n";
        }
        m_requests.remove(socket);
        socket->write(response);
        socket->disconnectFromHost();
    }

    QTcpServer m_server;
    QMap<QString, QByteArray> m_bodies;
    QMap<QTcpSocket *, QByteArray> m_requests;
};

const QByteArray twoFrames = GifBuilder(7, 5, { 0xFF0000, 0x00FF00 }).solid(0, 0, 7, 5, 0).solid(1, 1, 2, 2, 1).bytes();

} // namespace

TEST(RemoteLoad, readsAGifOverHttpWithoutBlocking)
{
    TinyHttpServer server(
        { { "/anim.gif", twoFrames }, { "/short.gif", "GIF89a\7\0\5\0" }, { "/text", "no GIF here at all" } });
    ASSERT_TRUE(server.listen());
    ucAniGIF gif;
    gif.setStretch(ucAniGIF::gfsClip);
    QSignalSpy failed(&gif, &ucAniGIF::RemoteLoadFailure);
    QList<std::pair<int, int>> announced;
    bool cancel = false;
    QObject::connect(&gif, &ucAniGIF::RemoteLoadComplete, [&](qint32 width, qint32 height, bool &Cancel) {
        announced.append({ width, height });
        Cancel = cancel;
    });

    gif.LoadAnimatedGIF_Remote(server.url("/anim.gif"));
    EXPECT_EQ(gif.FrameCount(), 0) << "the call returns before the data arrives";
    QTRY_COMPARE(gif.FrameCount(), 2);
    ASSERT_EQ(announced.size(), 1);
    EXPECT_EQ(announced[0], std::make_pair(platform::twipsFromPixels(7), platform::twipsFromPixels(5)));

    cancel = true;
    ASSERT_TRUE(gif.LoadAnimatedGIF_Array(GifBuilder(2, 2, { 0, 0xFFFFFF }).solid(0, 0, 2, 2, 1).bytes()));
    gif.LoadAnimatedGIF_Remote(server.url("/anim.gif"));
    QTRY_COMPARE(announced.size(), 2);
    EXPECT_EQ(gif.FrameCount(), 1) << "a cancelled load keeps the GIF shown";

    for (const char *path : { "/short.gif", "/text", "/missing.gif" }) {
        const int before = int(failed.count());
        gif.LoadAnimatedGIF_Remote(server.url(path));
        QTRY_COMPARE(failed.count(), before + 1);
        EXPECT_EQ(gif.FrameCount(), 1) << path << " changed nothing";
    }
    EXPECT_EQ(announced.size(), 2);
}

TEST(RemoteLoad, readsLocalPathsAndFileAddresses)
{
    QTemporaryDir dir;
    QFile file(dir.filePath("local.gif"));
    ASSERT_TRUE(file.open(QIODevice::WriteOnly));
    file.write(twoFrames);
    file.close();

    ucAniGIF gif;
    QSignalSpy complete(&gif, &ucAniGIF::RemoteLoadComplete);
    QSignalSpy failed(&gif, &ucAniGIF::RemoteLoadFailure);
    gif.LoadAnimatedGIF_Remote(file.fileName());
    QTRY_COMPARE(gif.FrameCount(), 2);
    ASSERT_TRUE(gif.LoadAnimatedGIF_Array(QByteArray()) == false);
    gif.LoadAnimatedGIF_Remote(QUrl::fromLocalFile(file.fileName()).toString());
    QTRY_COMPARE(gif.FrameCount(), 2);
    EXPECT_EQ(complete.count(), 2);

    gif.LoadAnimatedGIF_Remote(dir.filePath("absent.gif"));
    QTRY_COMPARE(failed.count(), 1);
    gif.LoadAnimatedGIF_Remote("ftp://127.0.0.1/x.gif");
    EXPECT_EQ(failed.count(), 2) << "an address that cannot be read fails at once";
    gif.LoadAnimatedGIF_Remote("");
    QTest::qWait(20);
    EXPECT_EQ(failed.count(), 2) << "an empty path does nothing";
}

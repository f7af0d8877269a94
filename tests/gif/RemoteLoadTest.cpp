#include "GifFiles.h"

#include "gif/GifRemoteLoader.h"
#include "gif/ucAniGIF.h"
#include "platform/Settings.h"
#include "platform/Twips.h"
#include "support/TestSupport.h"

#include <QMap>
#include <QSignalSpy>
#include <QTcpServer>
#include <QTcpSocket>
#include <QTemporaryDir>
#include <QTest>

#include <gtest/gtest.h>

#include <functional>

using namespace zelctl;
using zelctl::test::GifBuilder;

namespace {

// An HTTP server on 127.0.0.1: a handler per path answers once the request is complete.
class TinyHttpServer : public QObject
{
public:
    using Handler = std::function<void(QTcpSocket *)>;

    explicit TinyHttpServer(QMap<QString, Handler> handlers)
        : m_handlers(std::move(handlers))
    {
        connect(&m_server, &QTcpServer::newConnection, this, [this] {
            while (QTcpSocket *socket = m_server.nextPendingConnection()) {
                connect(socket, &QTcpSocket::readyRead, socket, [this, socket] { answer(socket); });
                connect(socket, &QTcpSocket::disconnected, socket, &QObject::deleteLater);
            }
        });
    }

    bool listen()
    {
        const bool listening = m_server.listen(QHostAddress::LocalHost);
        m_port = m_server.serverPort();
        return listening;
    }
    void close() { m_server.close(); }
    QString url(const QString &path) const { return QStringLiteral("http://127.0.0.1:%1%2").arg(m_port).arg(path); }
    int requests() const { return m_count; }

    // A whole body with its length, then the connection closes.
    static Handler body(const QByteArray &bytes)
    {
        return [bytes](QTcpSocket *socket) {
            socket->write("HTTP/1.1 200 OK\r\nContent-Type: image/gif\r\nConnection: close\r\nContent-Length: "
                + QByteArray::number(bytes.size()) + "\r\n\r\n" + bytes);
            socket->disconnectFromHost();
        };
    }

private:
    void answer(QTcpSocket *socket)
    {
        QByteArray &request = m_requests[socket];
        request += socket->readAll();
        if (!request.contains("\r\n\r\n"))
            return;
        const QString path = QString::fromLatin1(request.split(' ').value(1));
        m_requests.remove(socket);
        ++m_count;
        m_handlers.value(path, [](QTcpSocket *s) {
            s->write("HTTP/1.1 404 Not Found\r\nConnection: close\r\nContent-Length: 0\r\n\r\n");
            s->disconnectFromHost();
        })(socket);
    }

    QTcpServer m_server;
    quint16 m_port = 0;
    QMap<QString, Handler> m_handlers;
    QMap<QTcpSocket *, QByteArray> m_requests;
    int m_count = 0;
};

const QByteArray twoFrames = GifBuilder(7, 5, { 0xFF0000, 0x00FF00 }).solid(0, 0, 7, 5, 0).solid(1, 1, 2, 2, 1).bytes();

// The transfer timeout for the tests that wait for it, back to the default afterwards.
class TimeoutSetting
{
public:
    explicit TimeoutSetting(const QString &seconds) { platform::SaveSetting("ZEL", "Config", "giftimeout", seconds); }
    ~TimeoutSetting() { platform::DeleteSetting("ZEL", "Config", "giftimeout"); }
};

} // namespace

TEST(RemoteLoad, readsAGifOverHttpWithoutBlocking)
{
    TinyHttpServer server(
        { { "/anim.gif", TinyHttpServer::body(twoFrames) }, { "/short.gif", TinyHttpServer::body("GIF89a\7\0\5\0") },
            { "/text", TinyHttpServer::body("no GIF here at all") } });
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
    ASSERT_TRUE(QTest::qWaitFor([&] { return gif.FrameCount() == 2; }));
    ASSERT_EQ(announced.size(), 1);
    EXPECT_EQ(announced[0], std::make_pair(platform::twipsFromPixels(7), platform::twipsFromPixels(5)));

    cancel = true;
    ASSERT_TRUE(gif.LoadAnimatedGIF_Array(GifBuilder(2, 2, { 0, 0xFFFFFF }).solid(0, 0, 2, 2, 1).bytes()));
    gif.LoadAnimatedGIF_Remote(server.url("/anim.gif"));
    ASSERT_TRUE(QTest::qWaitFor([&] { return announced.size() == 2; }));
    EXPECT_EQ(gif.FrameCount(), 1) << "a cancelled load keeps the GIF shown";

    for (const char *path : { "/short.gif", "/text", "/missing.gif" }) {
        const qsizetype before = failed.count();
        gif.LoadAnimatedGIF_Remote(server.url(path));
        ASSERT_TRUE(QTest::qWaitFor([&] { return failed.count() == before + 1; })) << path;
        EXPECT_EQ(gif.FrameCount(), 1) << path << " changed nothing";
    }
    EXPECT_EQ(announced.size(), 2);

    // A kept copy stands in when the network fails, but only for its own address.
    server.close();
    cancel = false;
    gif.LoadAnimatedGIF_Remote(server.url("/anim.gif"));
    ASSERT_TRUE(QTest::qWaitFor([&] { return announced.size() == 3; }));
    EXPECT_EQ(gif.FrameCount(), 2);
    gif.LoadAnimatedGIF_Remote(server.url("/other.gif"));
    ASSERT_TRUE(QTest::qWaitFor([&] { return failed.count() == 4; }));
}

TEST(RemoteLoad, readsLocalPathsAndFileAddressesButNoFifo)
{
    QTemporaryDir dir;
    const QString file = test::writeFile(dir.filePath("local.gif"), twoFrames);
    const QString fifo = test::makeFifo(dir.filePath("fifo.gif"));

    ucAniGIF gif;
    QSignalSpy complete(&gif, &ucAniGIF::RemoteLoadComplete);
    QSignalSpy failed(&gif, &ucAniGIF::RemoteLoadFailure);
    gif.LoadAnimatedGIF_Remote(file);
    EXPECT_EQ(gif.FrameCount(), 0) << "a local file is read later too";
    ASSERT_TRUE(QTest::qWaitFor([&] { return gif.FrameCount() == 2; }));
    ASSERT_FALSE(gif.LoadAnimatedGIF_Array(QByteArray()));
    gif.LoadAnimatedGIF_Remote(QUrl::fromLocalFile(file).toString());
    ASSERT_TRUE(QTest::qWaitFor([&] { return gif.FrameCount() == 2; }));
    EXPECT_EQ(complete.count(), 2);

    // A FIFO without a writer would block the reading thread for ever.
    for (const QString &path : { dir.filePath("absent.gif"), fifo, QUrl::fromLocalFile(fifo).toString() }) {
        const qsizetype before = failed.count();
        gif.LoadAnimatedGIF_Remote(path);
        ASSERT_TRUE(QTest::qWaitFor([&] { return failed.count() == before + 1; })) << path.toStdString();
    }
    gif.LoadAnimatedGIF_Remote("ftp://127.0.0.1/x.gif");
    EXPECT_EQ(failed.count(), 4) << "an address that cannot be read fails at once";
    gif.LoadAnimatedGIF_Remote("");
    QTest::qWait(20);
    EXPECT_EQ(failed.count(), 4) << "an empty path does nothing";
    EXPECT_EQ(complete.count(), 2);
}

// Transfers that would never end, or end far beyond what a GIF may hold, fail.
TEST(RemoteLoad, endsStalledHugeEndlessAndCircularTransfers)
{
    qint64 endlessSent = 0;
    TinyHttpServer server({
        // Announces 100 bytes and sends 20.
        { "/stalled.gif",
            [](QTcpSocket *socket) {
                socket->write("HTTP/1.1 200 OK\r\nContent-Length: 100\r\n\r\n" + twoFrames.left(20));
            } },
        // Announces 2 GB and sends one chunk.
        { "/huge.gif",
            [](QTcpSocket *socket) {
                socket->write("HTTP/1.1 200 OK\r\nContent-Length: 2147483648\r\n\r\n" + twoFrames);
            } },
        // A body without a length that never ends: a new chunk whenever the last is out.
        { "/endless.gif",
            [&](QTcpSocket *socket) {
                const QByteArray chunk = twoFrames + QByteArray(64 * 1024, 'x');
                socket->write("HTTP/1.1 200 OK\r\nConnection: close\r\n\r\n" + chunk);
                QObject::connect(socket, &QTcpSocket::bytesWritten, socket, [socket, chunk, &endlessSent](qint64 n) {
                    endlessSent += n;
                    if (socket->bytesToWrite() == 0 && socket->state() == QAbstractSocket::ConnectedState)
                        socket->write(chunk);
                });
            } },
        { "/loop.gif",
            [](QTcpSocket *socket) {
                socket->write("HTTP/1.1 302 Found\r\nLocation: /loop.gif\r\nContent-Length: 0\r\n\r\n");
                socket->disconnectFromHost();
            } },
    });
    ASSERT_TRUE(server.listen());

    {
        const TimeoutSetting timeout("1");
        ucAniGIF gif;
        QSignalSpy failed(&gif, &ucAniGIF::RemoteLoadFailure);
        gif.LoadAnimatedGIF_Remote(server.url("/stalled.gif"));
        ASSERT_TRUE(QTest::qWaitFor([&] { return failed.count() == 1; }, 10000)) << "the transfer timeout ends it";
    }

    ucAniGIF gif;
    QSignalSpy failed(&gif, &ucAniGIF::RemoteLoadFailure);
    QSignalSpy complete(&gif, &ucAniGIF::RemoteLoadComplete);
    gif.LoadAnimatedGIF_Remote(server.url("/huge.gif"));
    ASSERT_TRUE(QTest::qWaitFor([&] { return failed.count() == 1; }, 10000))
        << "refused once the length is known, long before the 30 s timeout";

    const int before = server.requests();
    gif.LoadAnimatedGIF_Remote(server.url("/loop.gif"));
    ASSERT_TRUE(QTest::qWaitFor([&] { return failed.count() == 2; }));
    EXPECT_LE(server.requests() - before, GifRemoteLoader::MaxRedirects + 1);
    EXPECT_TRUE(complete.isEmpty());

    // The control's own limit is 256 MiB; a loader with a smaller one shows the same rule
    // without sending that much.
    GifRemoteLoader loader;
    loader.setMaxBytes(1 << 20);
    QSignalSpy loaderFailed(&loader, &GifRemoteLoader::failed);
    ASSERT_TRUE(loader.start(server.url("/endless.gif")));
    ASSERT_TRUE(QTest::qWaitFor([&] { return loaderFailed.count() == 1; }, 10000));
    EXPECT_LT(endlessSent, 16 << 20) << "abandoned once past the limit";
}

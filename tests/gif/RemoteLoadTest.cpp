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
        if (!socket->peek(socket->bytesAvailable()).contains("\r\n\r\n"))
            return;
        const QString path = QString::fromLatin1(socket->readAll().split(' ').value(1));
        ++m_count;
        m_handlers.value(path, [](QTcpSocket *s) {
            s->write("HTTP/1.1 404 Not Found\r\nConnection: close\r\nContent-Length: 0\r\n\r\n");
            s->disconnectFromHost();
        })(socket);
    }

    QTcpServer m_server;
    quint16 m_port = 0;
    QMap<QString, Handler> m_handlers;
    int m_count = 0;
};

const QByteArray twoFrames = GifBuilder(7, 5, { 0xFF0000, 0x00FF00 }).solid(0, 0, 7, 5, 0).solid(1, 1, 2, 2, 1).bytes();
const QByteArray oneFrame = GifBuilder(2, 2, { 0, 0xFFFFFF }).solid(0, 0, 2, 2, 1).bytes();

// A control showing a one-frame GIF and a server of the ways a transfer can go.
class RemoteLoad : public ::testing::Test
{
protected:
    void SetUp() override
    {
        ASSERT_TRUE(server.listen());
        QObject::connect(&gif, &ucAniGIF::RemoteLoadComplete, [this](qint32 width, qint32 height, bool &Cancel) {
            announced.append({ width, height });
            Cancel = cancel;
        });
    }

    // The frames shown once the load of `source` has ended, or -1 when it failed.
    int load(const QString &source)
    {
        EXPECT_TRUE(gif.LoadAnimatedGIF_Array(oneFrame));
        const qsizetype failures = failed.count();
        const qsizetype completions = announced.size();
        gif.LoadAnimatedGIF_Remote(source);
        EXPECT_EQ(gif.FrameCount(), 1) << "the call returns before the data arrives";
        if (!QTest::qWaitFor([&] { return failed.count() > failures || announced.size() > completions; }, 10000))
            return 0;
        return failed.count() > failures ? -1 : gif.FrameCount();
    }

    qint64 endlessSent = 0;
    TinyHttpServer server { {
        { "/anim.gif", TinyHttpServer::body(twoFrames) },
        { "/short.gif", TinyHttpServer::body("GIF89a\7\0\5\0") },
        { "/text", TinyHttpServer::body("no GIF here at all") },
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
            [this](QTcpSocket *socket) {
                const QByteArray chunk = twoFrames + QByteArray(64 * 1024, 'x');
                socket->write("HTTP/1.1 200 OK\r\nConnection: close\r\n\r\n" + chunk);
                QObject::connect(socket, &QTcpSocket::bytesWritten, socket, [socket, chunk, this](qint64 n) {
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
    } };
    ucAniGIF gif;
    QSignalSpy failed { &gif, &ucAniGIF::RemoteLoadFailure };
    QList<std::pair<int, int>> announced;
    bool cancel = false;
};

} // namespace

TEST_F(RemoteLoad, showsWhatArrivesWholeAndKeepsTheShownGifOnEveryFailure)
{
    QTemporaryDir dir;
    const QString file = test::writeFile(dir.filePath("local.gif"), twoFrames);
    const QString fifo = test::makeFifo(dir.filePath("fifo.gif"));
    // A FIFO without a writer would block the reading thread for ever; a huge length is
    // refused once known, long before the 30 s timeout; redirects in a circle end.
    const std::pair<QString, int> cases[] = { { server.url("/anim.gif"), 2 }, { file, 2 },
        { QUrl::fromLocalFile(file).toString(), 2 }, { server.url("/short.gif"), -1 }, { server.url("/text"), -1 },
        { server.url("/missing.gif"), -1 }, { server.url("/huge.gif"), -1 }, { server.url("/loop.gif"), -1 },
        { dir.filePath("absent.gif"), -1 }, { fifo, -1 }, { QUrl::fromLocalFile(fifo).toString(), -1 } };
    for (const auto &[source, frames] : cases) {
        const int requests = server.requests();
        EXPECT_EQ(load(source), frames) << source.toStdString();
        EXPECT_LE(server.requests() - requests, GifRemoteLoader::MaxRedirects + 1);
    }
    ASSERT_EQ(announced.size(), 3);
    EXPECT_EQ(announced[0], std::make_pair(platform::twipsFromPixels(7), platform::twipsFromPixels(5)));

    cancel = true;
    EXPECT_EQ(load(server.url("/anim.gif")), 1) << "a cancelled load keeps the GIF shown";
    cancel = false;
    const qsizetype failures = failed.count();
    gif.LoadAnimatedGIF_Remote("ftp://127.0.0.1/x.gif");
    EXPECT_EQ(failed.count(), failures + 1) << "an address that cannot be read fails at once";
    gif.LoadAnimatedGIF_Remote("");
    QTest::qWait(20);
    EXPECT_EQ(failed.count(), failures + 1) << "an empty path does nothing";

    // A kept copy stands in when the network fails, but only for its own address.
    server.close();
    EXPECT_EQ(load(server.url("/anim.gif")), 2);
    EXPECT_EQ(load(server.url("/other.gif")), -1);
}

TEST_F(RemoteLoad, endsStalledAndEndlessTransfers)
{
    platform::SaveSetting("ZEL", "Config", "giftimeout", "1");
    EXPECT_EQ(load(server.url("/stalled.gif")), -1) << "the transfer timeout ends it";
    platform::DeleteSetting("ZEL", "Config", "giftimeout");
    // The control's own limit is 256 MiB; a loader with a smaller one shows the same rule
    // without sending that much.
    GifRemoteLoader loader;
    loader.setMaxBytes(1 << 20);
    QSignalSpy loaderFailed(&loader, &GifRemoteLoader::failed);
    ASSERT_TRUE(loader.start(server.url("/endless.gif")));
    ASSERT_TRUE(QTest::qWaitFor([&] { return loaderFailed.count() == 1; }, 10000));
    EXPECT_LT(endlessSent, 16 << 20) << "abandoned once past the limit";
}

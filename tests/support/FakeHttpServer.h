#pragma once

#include <QList>
#include <QTcpServer>
#include <QTcpSocket>
#include <QTimer>
#include <QUrl>

#include <memory>

namespace zelctl::test {

// An HTTP server on 127.0.0.1, in the test process, that answers every request with the reply
// it was given (as the VAT information service or a GIF's host would), or misbehaves as told.
class FakeHttpServer : public QObject
{
public:
    enum class Manner { Whole, Trickle /* a body byte every 50 ms */, Silent /* never a byte */ };
    struct Reply
    {
        int status = 200;
        QByteArray body {};
        Manner manner = Manner::Whole;
        QByteArray location {};
        qint64 length = -1; // the Content-Length announced: -1 the body's, -2 none
    };
    struct Request
    {
        QByteArray method, path, body;
    };

    FakeHttpServer()
    {
        m_server.listen(QHostAddress::LocalHost);
        connect(&m_server, &QTcpServer::newConnection, this, [this] {
            while (QTcpSocket *socket = m_server.nextPendingConnection())
                serve(socket);
        });
    }
    QUrl baseAddress() const { return QUrl(QStringLiteral("http://127.0.0.1:%1/rest-api").arg(m_server.serverPort())); }
    void answerWith(const Reply &reply) { m_reply = reply; }
    const QList<Request> &requests() const { return m_requests; }
    // Connections the client closed before the answer was whole.
    int abandoned() const { return m_abandoned; }

    static Reply holder(const QByteArray &name, const QByteArray &address)
    {
        return { 200,
            R"({"countryCode":"PT","vatNumber":"x","requestDate":"2025-03-01T10:15:00.000Z","valid":true,"name":")"
                + name + R"(","address":")" + address + R"(","requestIdentifier":"WAPIAAAAW"})" };
    }
    static Reply userError(const QByteArray &code)
    {
        return { 200, R"({"isValid":false,"requestDate":"2025-03-01T10:15:00.000Z","userError":")" + code + R"("})" };
    }

private:
    void serve(QTcpSocket *socket)
    {
        const auto received = std::make_shared<QByteArray>();
        const auto answered = std::make_shared<bool>(false);
        connect(socket, &QTcpSocket::disconnected, socket, [this, socket, answered] {
            m_abandoned += !*answered;
            socket->deleteLater();
        });
        connect(socket, &QTcpSocket::readyRead, socket, [this, socket, received, answered] {
            *received += socket->readAll();
            const qsizetype headerEnd = received->indexOf("\r\n\r\n");
            const qsizetype lengthAt = received->toLower().indexOf("content-length:");
            const qsizetype length = lengthAt < 0 ? 0 : received->mid(lengthAt + 15, 12).split('\r')[0].toLongLong();
            if (headerEnd < 0 || received->size() < headerEnd + 4 + length)
                return;
            const QList<QByteArray> line = received->left(received->indexOf('\r')).split(' ');
            m_requests.append({ line.value(0), line.value(1), received->mid(headerEnd + 4, length) });
            const Reply reply = m_reply;
            if (reply.manner == Manner::Silent)
                return;
            const qint64 announced = reply.length == -1 ? reply.body.size() : reply.length;
            socket->write("HTTP/1.1 " + QByteArray::number(reply.status) + " Answer\r\nConnection: close\r\n"
                + (announced < 0 ? QByteArray() : "Content-Length: " + QByteArray::number(announced) + "\r\n")
                + (reply.location.isEmpty() ? QByteArray() : "Location: " + reply.location + "\r\n") + "\r\n");
            const qsizetype step = reply.manner == Manner::Whole ? reply.body.size() : 1;
            auto *drip = new QTimer(socket);
            connect(drip, &QTimer::timeout, socket, [=, body = reply.body, sent = qsizetype(0)]() mutable {
                socket->write(body.mid(sent, step));
                sent += step;
                if (sent >= body.size()) {
                    drip->stop();
                    *answered = true;
                    socket->disconnectFromHost();
                }
            });
            drip->start(reply.manner == Manner::Whole ? 0 : 50);
        });
    }

    QTcpServer m_server;
    Reply m_reply;
    QList<Request> m_requests;
    int m_abandoned = 0;
};

} // namespace zelctl::test

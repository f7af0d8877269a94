#include "FakeVatService.h"

#include <QTcpSocket>
#include <QTimer>

#include <memory>

namespace zelctl::test {

namespace {

struct Connection
{
    QByteArray received;
    bool answered = false;
};

} // namespace

FakeVatService::FakeVatService()
{
    m_server.listen(QHostAddress::LocalHost);
    connect(&m_server, &QTcpServer::newConnection, this, [this] {
        while (QTcpSocket *socket = m_server.nextPendingConnection())
            serve(socket);
    });
}

QUrl FakeVatService::baseAddress() const
{
    return QUrl(QStringLiteral("http://127.0.0.1:%1/rest-api").arg(m_server.serverPort()));
}

FakeVatService::Reply FakeVatService::holder(const QByteArray &name, const QByteArray &address)
{
    return { 200,
        R"({"countryCode":"PT","vatNumber":"x","requestDate":"2025-03-01T10:15:00.000Z","valid":true,"name":")" + name
            + R"(","address":")" + address + R"(","requestIdentifier":"WAPIAAAAW"})" };
}

FakeVatService::Reply FakeVatService::userError(const QByteArray &code)
{
    return { 200, R"({"isValid":false,"requestDate":"2025-03-01T10:15:00.000Z","userError":")" + code + R"("})" };
}

void FakeVatService::serve(QTcpSocket *socket)
{
    auto connection = std::make_shared<Connection>();
    connect(socket, &QTcpSocket::disconnected, socket, [this, socket, connection] {
        m_abandoned += !connection->answered;
        socket->deleteLater();
    });
    connect(socket, &QTcpSocket::readyRead, socket, [this, socket, connection] {
        QByteArray &received = connection->received;
        received += socket->readAll();
        const qsizetype headerEnd = received.indexOf("\r\n\r\n");
        const qsizetype lengthAt = received.toLower().indexOf("content-length:");
        const qsizetype length = lengthAt < 0 ? 0 : received.mid(lengthAt + 15, 12).split('\r').first().toLongLong();
        if (headerEnd < 0 || received.size() < headerEnd + 4 + length)
            return;
        const QList<QByteArray> requestLine = received.left(received.indexOf('\r')).split(' ');
        m_requests.append({ requestLine.value(0), requestLine.value(1), received.mid(headerEnd + 4, length) });

        const Reply reply = m_reply;
        if (reply.manner == Manner::Silent)
            return;
        socket->write("HTTP/1.1 " + QByteArray::number(reply.status) + " Answer\r\nConnection: close\r\n"
            + "Content-Type: application/json\r\nContent-Length: " + QByteArray::number(reply.body.size())
            + (reply.location.isEmpty() ? "" : "\r\nLocation: " + reply.location) + "\r\n\r\n");
        const auto send = [socket, connection](const QByteArray &bytes, bool last) {
            socket->write(bytes);
            if (last) {
                connection->answered = true;
                socket->disconnectFromHost();
            }
        };
        if (reply.manner == Manner::Whole)
            return send(reply.body, true);
        auto *drip = new QTimer(socket);
        connect(drip, &QTimer::timeout, socket, [send, body = reply.body, sent = qsizetype(0)]() mutable {
            ++sent;
            send(body.mid(sent - 1, 1), sent == body.size());
        });
        drip->start(50);
    });
}

} // namespace zelctl::test

#pragma once

#include <QList>
#include <QTcpServer>
#include <QUrl>

namespace zelctl::test {

// An HTTP server on 127.0.0.1, in the test process, that answers every request as the VAT
// information service would, or misbehaves as told, then closes the connection.
class FakeVatService : public QObject
{
public:
    enum class Manner { Whole, Trickle /* a body byte every 50 ms */, Silent /* never a byte */ };
    struct Reply
    {
        int status = 200;
        QByteArray body {};
        Manner manner = Manner::Whole;
        QByteArray location {};
    };
    struct Request
    {
        QByteArray method, path, body;
    };

    FakeVatService();
    QUrl baseAddress() const; // http://127.0.0.1:<port>/rest-api
    void answerWith(const Reply &reply) { m_reply = reply; }
    const QList<Request> &requests() const { return m_requests; }
    // Connections the client closed before the answer was whole.
    int abandoned() const { return m_abandoned; }

    static Reply holder(const QByteArray &name, const QByteArray &address);
    static Reply userError(const QByteArray &code);

private:
    void serve(class QTcpSocket *socket);

    QTcpServer m_server;
    Reply m_reply;
    QList<Request> m_requests;
    int m_abandoned = 0;
};

} // namespace zelctl::test

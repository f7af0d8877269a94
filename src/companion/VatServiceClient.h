#pragma once

#include "NifAnswer.h"
#include "zelctl_export.h"

#include <QObject>
#include <QTimer>
#include <QUrl>

#include <chrono>

class QNetworkAccessManager;
class QNetworkReply;

namespace zelctl::companion {

// Asks the European Commission's VAT information service about one tax number at a time:
// POST {base}/check-vat-number with {"countryCode": "PT", "vatNumber": "..."}. Every request
// ends in exactly one `answered`, later, on this object's thread: the holder, "not
// registered", or a failure saying why (the service's error code, an HTTP error, a timeout,
// too many redirects, a body over MaxBodyBytes, unreadable JSON). Redirects are followed to
// the same host only, so a number never goes anywhere but the configured address.
class ZELCTL_EXPORT VatServiceClient : public QObject
{
    Q_OBJECT

public:
    static constexpr qint64 MaxBodyBytes = 64 * 1024;
    static constexpr int MaxRedirects = 3;

    explicit VatServiceClient(QObject *parent = nullptr);
    ~VatServiceClient() override;

    // Starts asking about `taxNumber` (country code and number, e.g. "PT123456789"). A
    // request still running is dropped without an answer.
    void ask(const QUrl &base, const QString &taxNumber, std::chrono::milliseconds timeout);

Q_SIGNALS:
    void answered(const companion::NifAnswer &answer);

private:
    // Moves what arrived into the body; false when the body would grow past MaxBodyBytes.
    bool takeBody();
    void replyFinished();
    void finish(const NifAnswer &answer);
    void drop();

    QNetworkAccessManager *m_network = nullptr;
    QNetworkReply *m_reply = nullptr;
    QTimer m_deadline;
    QString m_taxNumber;
    QByteArray m_body;
};

// The record that the service's answer (its HTTP status and body) gives for `taxNumber`.
ZELCTL_EXPORT NifAnswer readServiceAnswer(const QString &taxNumber, int httpStatus, const QByteArray &body);

struct PostalAddress
{
    QString street;
    QString postcode;
    QString locality;
};

// Splits an address as the service writes it (lines, the last with the postcode and the
// locality) for a country code; without a postcode everything is street.
ZELCTL_EXPORT PostalAddress splitPostalAddress(const QString &address, const QString &country);

} // namespace zelctl::companion

#include "VatServiceClient.h"

#include <QDateTime>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QNetworkAccessManager>
#include <QNetworkReply>
#include <QRegularExpression>

namespace zelctl::companion {

namespace {

const QString ServiceSource = QStringLiteral("Serviço de IVA da Comissão Europeia");

// The service writes "---" where a member state does not disclose a value.
QString disclosed(const QJsonValue &value)
{
    const QString text = value.toString().trimmed();
    return text == QLatin1String("---") ? QString() : text;
}

QString errorStatus(const QString &code)
{
    if (code == QLatin1String("INVALID_INPUT"))
        return QStringLiteral("Número recusado pelo serviço (%1)").arg(code);
    if (code == QLatin1String("SERVICE_UNAVAILABLE"))
        return QStringLiteral("Serviço indisponível (%1)").arg(code);
    if (code == QLatin1String("MS_UNAVAILABLE"))
        return QStringLiteral("Serviço do Estado-membro indisponível (%1)").arg(code);
    if (code == QLatin1String("TIMEOUT"))
        return QStringLiteral("O Estado-membro não respondeu a tempo (%1)").arg(code);
    if (code.contains(QLatin1String("MAX_CONCURRENT_REQ")))
        return QStringLiteral("Serviço sobrecarregado, tente mais tarde (%1)").arg(code);
    if (code.endsWith(QLatin1String("_BLOCKED")))
        return QStringLiteral("Consulta bloqueada pelo serviço (%1)").arg(code);
    return QStringLiteral("Erro do serviço (%1)").arg(code);
}

NifAnswer failure(const QString &status)
{
    return { NifAnswer::Outcome::Failed, {}, status };
}

NifAnswer tooLarge()
{
    return failure(QStringLiteral("Resposta do serviço demasiado grande"));
}

// The error code of an answer: "userError" of the single-number answer, or the first
// "errorWrappers" entry of a rejected request. "VALID" and "INVALID" are no errors.
QString errorCode(const QJsonObject &answer)
{
    QString code = answer.value(QLatin1String("userError")).toString();
    if (code.isEmpty())
        code = answer.value(QLatin1String("errorWrappers")).toArray().first().toObject().value("error").toString();
    return code == QLatin1String("VALID") || code == QLatin1String("INVALID") ? QString() : code;
}

// "2024-03-01T10:15:00.000Z" (or a bare date) as yyyy-MM-dd; today when it does not parse.
QString requestDay(const QString &requestDate)
{
    QDate day = QDateTime::fromString(requestDate, Qt::ISODateWithMs).date();
    if (!day.isValid())
        day = QDate::fromString(requestDate.left(10), Qt::ISODate);
    if (!day.isValid())
        day = QDate::currentDate();
    return day.toString(Qt::ISODate);
}

} // namespace

VatServiceClient::VatServiceClient(QObject *parent)
    : QObject(parent)
{
    m_deadline.setSingleShot(true);
    connect(&m_deadline, &QTimer::timeout, this, [this] {
        finish(failure(QStringLiteral("O serviço não respondeu em %1 s").arg(m_deadline.interval() / 1000.0)));
    });
}

VatServiceClient::~VatServiceClient()
{
    drop();
}

void VatServiceClient::ask(const QUrl &base, const QString &taxNumber, std::chrono::milliseconds timeout)
{
    drop();
    if (!m_network)
        m_network = new QNetworkAccessManager(this);
    QUrl url = base;
    QString path = url.path();
    while (path.endsWith(u'/'))
        path.chop(1);
    url.setPath(path + QStringLiteral("/check-vat-number"));

    QNetworkRequest request(url);
    request.setHeader(QNetworkRequest::ContentTypeHeader, QByteArrayLiteral("application/json"));
    request.setRawHeader("Accept", "application/json");
    request.setAttribute(QNetworkRequest::RedirectPolicyAttribute, QNetworkRequest::SameOriginRedirectPolicy);
    request.setMaximumRedirectsAllowed(MaxRedirects);
    const QJsonObject question { { QStringLiteral("countryCode"), taxNumber.left(2) },
        { QStringLiteral("vatNumber"), taxNumber.mid(2) } };

    m_taxNumber = taxNumber;
    m_body.clear();
    m_reply = m_network->post(request, QJsonDocument(question).toJson(QJsonDocument::Compact));
    connect(m_reply, &QNetworkReply::readyRead, this, [this] {
        if (!takeBody())
            finish(tooLarge());
    });
    connect(m_reply, &QNetworkReply::finished, this, &VatServiceClient::replyFinished);
    m_deadline.start(timeout);
}

bool VatServiceClient::takeBody()
{
    if (m_body.size() + m_reply->bytesAvailable() > MaxBodyBytes)
        return false;
    m_body += m_reply->readAll();
    return true;
}

void VatServiceClient::replyFinished()
{
    if (!takeBody())
        return finish(tooLarge());
    const QNetworkReply::NetworkError error = m_reply->error();
    if (error == QNetworkReply::TooManyRedirectsError || error == QNetworkReply::InsecureRedirectError)
        return finish(failure(QStringLiteral("O serviço redireccionou o pedido demasiadas vezes ou para outro "
                                             "endereço")));
    const QVariant httpStatus = m_reply->attribute(QNetworkRequest::HttpStatusCodeAttribute);
    if (!httpStatus.isValid())
        return finish(failure(QStringLiteral("Sem ligação ao serviço: %1").arg(m_reply->errorString())));
    finish(readServiceAnswer(m_taxNumber, httpStatus.toInt(), m_body));
}

void VatServiceClient::finish(const NifAnswer &answer)
{
    drop();
    Q_EMIT answered(answer);
}

void VatServiceClient::drop()
{
    m_deadline.stop();
    if (QNetworkReply *reply = std::exchange(m_reply, nullptr)) {
        // Aborting emits finished at once; nobody must hear it.
        reply->disconnect(this);
        reply->abort();
        reply->deleteLater();
    }
}

NifAnswer readServiceAnswer(const QString &taxNumber, int httpStatus, const QByteArray &body)
{
    QJsonParseError parseError;
    const QJsonDocument document = QJsonDocument::fromJson(body, &parseError);
    const QJsonObject answer = document.object();
    // The service's own error code says more than the HTTP status it came with.
    if (const QString code = errorCode(answer); !code.isEmpty())
        return failure(errorStatus(code));
    if (httpStatus < 200 || httpStatus > 299)
        return failure(QStringLiteral("O serviço respondeu com o erro HTTP %1").arg(httpStatus));
    const QJsonValue validity
        = answer.contains(QLatin1String("valid")) ? answer.value("valid") : answer.value("isValid");
    if (parseError.error != QJsonParseError::NoError || !document.isObject() || !validity.isBool())
        return failure(QStringLiteral("Resposta do serviço ilegível"));
    if (!validity.toBool())
        return { NifAnswer::Outcome::NotFound, {}, QStringLiteral("Não registado no serviço de IVA") };

    const PostalAddress postal
        = splitPostalAddress(disclosed(answer.value(QLatin1String("address"))), taxNumber.left(2));
    NifFields fields {
        { QStringLiteral("ID"), taxNumber },
        { QStringLiteral("NAME"), disclosed(answer.value(QLatin1String("name"))) },
        { QStringLiteral("MORADA"), postal.street },
        { QStringLiteral("CODIGOPOSTAL"), postal.postcode },
        { QStringLiteral("LOCALIDADE"), postal.locality },
        { QStringLiteral("SOURCE"), ServiceSource },
        { QStringLiteral("UPDATED"), requestDay(answer.value(QLatin1String("requestDate")).toString()) },
        { QStringLiteral("STATUS"), QStringLiteral("Válido") },
    };
    const QString request = answer.value(QLatin1String("requestIdentifier")).toString();
    if (!request.isEmpty())
        fields.insert(QStringLiteral("IDPEDIDO"), request);
    return { NifAnswer::Outcome::Found, fields, {} };
}

PostalAddress splitPostalAddress(const QString &address, const QString &country)
{
    // Portuguese postcodes are distinctive enough to be found anywhere on a line (some
    // answers put the street and the town on one); elsewhere the postcode starts its line:
    // "10115 Berlin", "1234 AB Amsterdam", "00-950 Warszawa", "110 00 Praha", "L-1234 ...".
    static const QRegularExpression portuguese(QStringLiteral("(?:^|\\s)(\\d{4}-\\d{3})\\s+(\\S.*)$"));
    static const QRegularExpression dutch(QStringLiteral("^(\\d{4} ?[A-Z]{2})\\s+(\\S.*)$"));
    static const QRegularExpression general(QStringLiteral("^((?:[A-Z]{1,2}-)?\\d{2,5}(?:[- ]\\d{2,3})?)\\s+(\\S.*)$"));
    const QRegularExpression &pattern = country == QLatin1String("PT") ? portuguese
        : country == QLatin1String("NL")                               ? dutch
                                                                       : general;

    QStringList lines;
    for (const QString &line : address.split(u'\n')) {
        if (!line.trimmed().isEmpty())
            lines << line.simplified();
    }
    PostalAddress postal;
    for (qsizetype i = lines.size() - 1; i >= 0; --i) {
        const QRegularExpressionMatch match = pattern.match(lines.at(i));
        if (!match.hasMatch())
            continue;
        postal.postcode = match.captured(1);
        postal.locality = match.captured(2);
        const QString before = lines.at(i).left(match.capturedStart(1)).trimmed();
        lines.remove(i);
        if (!before.isEmpty())
            lines.insert(i, before);
        break;
    }
    postal.street = lines.join(QStringLiteral(", "));
    return postal;
}

} // namespace zelctl::companion

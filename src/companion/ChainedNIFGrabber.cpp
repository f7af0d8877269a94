#include "ChainedNIFGrabber.h"

#include "DirectoryNIFGrabber.h"
#include "VatServiceClient.h"

#include "common/modFuncs.h"
#include "platform/FileRead.h"

#include <QHostAddress>
#include <QJsonDocument>
#include <QJsonObject>
#include <QPointer>
#include <QRegularExpression>
#include <QTimer>

namespace zelctl::companion {

namespace {

const QString IdKey = QStringLiteral("ID");
const QString SourceKey = QStringLiteral("SOURCE");
const QString StatusKey = QStringLiteral("STATUS");

NifAnswer failure(const QString &status)
{
    return { NifAnswer::Outcome::Failed, {}, status };
}

// An answer given from the cache names where it came from first.
NifAnswer storedAnswer(const NifCache::Entry &entry, const QString &status)
{
    NifAnswer answer { NifAnswer::Outcome::Found, entry.fields, {} };
    answer.fields.insert(SourceKey, QStringLiteral("Cache local (%1)").arg(entry.fields.value(SourceKey)));
    answer.fields.insert(StatusKey, status);
    return answer;
}

} // namespace

ChainedNIFGrabber::ChainedNIFGrabber(QObject *parent)
    : NIFGrabber(parent)
{ }

ChainedNIFGrabber::ChainedNIFGrabber(const LookupSettings &settings, QObject *parent)
    : NIFGrabber(parent)
    , m_fixedSettings(settings)
{ }

ChainedNIFGrabber::~ChainedNIFGrabber() = default;

QString ChainedNIFGrabber::HolderName() const
{
    return GetField(QStringLiteral("NAME"));
}

QString ChainedNIFGrabber::GetField(const QString &key) const
{
    return m_fields.value(key.toUpper());
}

void ChainedNIFGrabber::SetField(const QString &key, const QString &value)
{
    m_fields.insert(key.toUpper(), value);
}

void ChainedNIFGrabber::Fetch(const QString &taxNumber, const QVariant &option)
{
    Q_UNUSED(option)
    if (m_busy)
        return;
    m_busy = true;
    m_requested = taxNumber;
    m_settings = m_fixedSettings ? *m_fixedSettings : LookupSettings::fromUserSettings();
    m_step = 0;
    m_stale.reset();
    m_setback.reset();
    m_serviceSaidNo = false;
    QTimer::singleShot(0, this, [this] {
        const QPointer<ChainedNIFGrabber> alive(this);
        Q_EMIT Starting();
        if (alive)
            lookUp();
    });
}

QString ChainedNIFGrabber::number() const
{
    return m_requested.trimmed().toUpper();
}

void ChainedNIFGrabber::lookUp()
{
    static const QRegularExpression wellFormed(QStringLiteral("^[A-Z]{2}[0-9A-Z+*]{2,14}$"));
    if (!wellFormed.match(number()).hasMatch())
        return conclude(failure(QStringLiteral("Número de contribuinte mal formado")));
    while (m_step < m_settings.order.size()) {
        switch (m_settings.order.at(m_step++)) {
        case LookupSource::Cache:
            if (const std::optional<NifAnswer> answer = fromCache())
                return conclude(*answer);
            break;
        case LookupSource::Directory:
            if (const std::optional<NifAnswer> answer = fromDirectory()) {
                remember(*answer);
                return conclude(*answer);
            }
            break;
        case LookupSource::Service:
            if (askService())
                return; // goes on in serviceAnswered
            break;
        }
    }
    concludeWithoutAnswer();
}

std::optional<NifAnswer> ChainedNIFGrabber::fromCache()
{
    std::optional<NifCache::Entry> entry = cache().find(number());
    if (!entry)
        return std::nullopt;
    const qint64 maxAge = qint64(m_settings.cacheDays) * 24 * 60 * 60;
    const bool fresh = !m_settings.refresh && entry->storedAt.secsTo(QDateTime::currentDateTimeUtc()) < maxAge;
    if (!entry->found) {
        // A fresh "not registered" stands for the service's answer; other sources may
        // still know the holder.
        if (fresh) {
            m_serviceSaidNo = true;
            m_setback = NifAnswer { NifAnswer::Outcome::NotFound, {}, entry->fields.value(StatusKey) };
        }
        return std::nullopt;
    }
    if (fresh)
        return storedAnswer(*entry, entry->fields.value(StatusKey));
    m_stale = std::move(entry);
    return std::nullopt;
}

std::optional<NifAnswer> ChainedNIFGrabber::fromDirectory() const
{
    // The file is read at every lookup, so edits count without restarting the host.
    const platform::FileRead file = platform::readFile(
        m_settings.directoryFile.isEmpty() ? DirectoryNIFGrabber::defaultDirectoryFile() : m_settings.directoryFile,
        modFuncs::MaxDataFileBytes);
    if (!file.ok())
        return std::nullopt;
    const QJsonObject holder = QJsonDocument::fromJson(file.bytes).object().value(number()).toObject();
    if (holder.isEmpty())
        return std::nullopt;
    NifAnswer answer { NifAnswer::Outcome::Found, {}, {} };
    for (auto it = holder.begin(); it != holder.end(); ++it)
        answer.fields.insert(it.key().toUpper(), it.value().toVariant().toString());
    if (answer.fields.value(SourceKey).isEmpty())
        answer.fields.insert(SourceKey, QStringLiteral("Diretório local"));
    return answer;
}

bool ChainedNIFGrabber::askService()
{
    if (m_serviceSaidNo || !m_settings.remoteAllowed)
        return false;
    // Numbers travel encrypted; plain HTTP serves only a service on this machine.
    const QUrl &base = m_settings.serviceAddress;
    const bool local = base.host() == QLatin1String("localhost") || QHostAddress(base.host()).isLoopback();
    if (!base.isValid()
        || !(base.scheme() == QLatin1String("https") || (base.scheme() == QLatin1String("http") && local))) {
        m_setback = failure(QStringLiteral("Endereço do serviço inválido: %1").arg(base.toString()));
        return false;
    }
    if (!m_service) {
        m_service = new VatServiceClient(this);
        connect(m_service, &VatServiceClient::answered, this, &ChainedNIFGrabber::serviceAnswered);
    }
    m_service->ask(base, number(), m_settings.timeout);
    return true;
}

void ChainedNIFGrabber::serviceAnswered(const NifAnswer &answer)
{
    if (answer.outcome != NifAnswer::Outcome::Failed)
        remember(answer);
    if (answer.outcome == NifAnswer::Outcome::Found)
        return conclude(answer);
    m_serviceSaidNo = answer.outcome == NifAnswer::Outcome::NotFound;
    m_setback = answer;
    lookUp();
}

void ChainedNIFGrabber::concludeWithoutAnswer()
{
    if (m_stale && !m_serviceSaidNo) {
        const QString why = m_setback  ? m_setback->status
            : m_settings.remoteAllowed ? QStringLiteral("nenhuma outra fonte respondeu")
                                       : QStringLiteral("consultas remotas desligadas");
        return conclude(storedAnswer(*m_stale,
            QStringLiteral("Desatualizado, guardado em %1: %2")
                .arg(m_stale->storedAt.toLocalTime().date().toString(Qt::ISODate), why)));
    }
    if (m_setback)
        return conclude(*m_setback);
    conclude({ NifAnswer::Outcome::NotFound, {},
        m_settings.remoteAllowed
            ? QStringLiteral("Sem dados sobre este número")
            : QStringLiteral("Sem dados locais sobre este número (consultas remotas desligadas)") });
}

void ChainedNIFGrabber::conclude(const NifAnswer &answer)
{
    m_outcome = answer.outcome;
    const bool found = answer.outcome == NifAnswer::Outcome::Found;
    if (found) {
        m_fields = answer.fields;
    } else {
        // What an earlier fetch found about this same number stays; another number's data go.
        if (m_fields.value(IdKey) != m_requested)
            m_fields.clear();
        m_fields.insert(StatusKey, answer.status);
    }
    m_fields.insert(IdKey, m_requested);

    // A listener may delete this fetcher (closing the form of its control) from any event.
    const QPointer<ChainedNIFGrabber> alive(this);
    if (found)
        Q_EMIT ReceivedInformation(m_requested);
    if (!alive)
        return;
    m_busy = false;
    Q_EMIT Finished();
}

NifCache &ChainedNIFGrabber::cache()
{
    // Holding the cache keeps it open, shared with the other fetchers of this thread.
    m_cache = NifCache::open(m_settings.cacheFile);
    return *m_cache;
}

void ChainedNIFGrabber::remember(const NifAnswer &answer)
{
    if (!m_settings.order.contains(LookupSource::Cache))
        return;
    NifCache::Entry entry;
    entry.found = answer.outcome == NifAnswer::Outcome::Found;
    entry.fields = entry.found ? answer.fields : NifFields { { StatusKey, answer.status } };
    entry.fields.remove(IdKey);
    entry.storedAt = QDateTime::currentDateTimeUtc();
    cache().store(number(), entry);
}

} // namespace zelctl::companion

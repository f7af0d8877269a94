#include "NifCache.h"

#include <QDeadlineTimer>
#include <QDir>
#include <QFileInfo>
#include <QHash>
#include <QJsonDocument>
#include <QJsonObject>
#include <QSqlDatabase>
#include <QSqlError>
#include <QSqlQuery>
#include <QStandardPaths>
#include <QThread>

#include <atomic>

namespace zelctl::companion {

namespace {

// Long enough to outlast another process's write, short enough not to freeze a form when
// a writer hangs: the lookup then goes on without the cache.
constexpr int BusyTimeoutMs = 5000;

// SQLite's primary result codes: another connection holds the file, or it is not a sound
// database.
constexpr int SqliteBusy = 5;
constexpr int SqliteLocked = 6;
constexpr int SqliteCorrupt = 11;
constexpr int SqliteNotADatabase = 26;

bool isBusy(const QSqlError &error)
{
    const int code = error.nativeErrorCode().toInt() & 0xff;
    return code == SqliteBusy || code == SqliteLocked;
}

bool isDamage(const QSqlError &error)
{
    const int code = error.nativeErrorCode().toInt() & 0xff;
    return code == SqliteCorrupt || code == SqliteNotADatabase;
}

QString connectionName()
{
    static std::atomic<int> counter = 0;
    return QStringLiteral("zelctl-nifcache-%1").arg(++counter);
}

} // namespace

std::shared_ptr<NifCache> NifCache::open(const QString &file)
{
    const QString path = QFileInfo(file.isEmpty() ? defaultFile() : file).absoluteFilePath();
    // A database connection serves only the thread that made it.
    thread_local QHash<QString, std::weak_ptr<NifCache>> openCaches;
    std::weak_ptr<NifCache> &slot = openCaches[path];
    if (std::shared_ptr<NifCache> cache = slot.lock())
        return cache;
    std::shared_ptr<NifCache> cache(new NifCache(path));
    slot = cache;
    return cache;
}

QString NifCache::defaultFile()
{
    return QStandardPaths::writableLocation(QStandardPaths::GenericDataLocation)
        + QStringLiteral("/zelctl/nifcache.sqlite");
}

NifCache::NifCache(const QString &file)
    : m_file(file)
    , m_connection(connectionName())
{
    QDir().mkpath(QFileInfo(file).absolutePath());
    Opening opening = openDatabase();
    if (opening == Opening::Damaged) {
        closeDatabase();
        setAside();
        opening = openDatabase();
    }
    m_usable = opening == Opening::Ok;
    if (!m_usable)
        closeDatabase();
}

NifCache::~NifCache()
{
    closeDatabase();
}

NifCache::Opening NifCache::openDatabase()
{
    QSqlDatabase database = QSqlDatabase::addDatabase(QStringLiteral("QSQLITE"), m_connection);
    if (!database.isValid())
        return Opening::Unavailable;
    database.setDatabaseName(m_file);
    database.setConnectOptions(QStringLiteral("QSQLITE_BUSY_TIMEOUT=%1").arg(BusyTimeoutMs));
    if (!database.open())
        return isDamage(database.lastError()) ? Opening::Damaged : Opening::Unavailable;

    QSqlQuery query(database);
    // Where two processes would each wait for the other (both turning a new file to WAL at
    // once) SQLite answers busy at once instead of waiting: try again until the busy timeout.
    const auto run = [&query](const QString &statement) {
        const QDeadlineTimer deadline(BusyTimeoutMs);
        while (!query.exec(statement)) {
            if (!isBusy(query.lastError()) || deadline.hasExpired())
                return false;
            QThread::msleep(10);
        }
        return true;
    };
    const auto failed = [&query] { return isDamage(query.lastError()) ? Opening::Damaged : Opening::Unavailable; };
    if (!run(QStringLiteral("PRAGMA journal_mode=WAL")) || !run(QStringLiteral("PRAGMA synchronous=NORMAL")))
        return failed();
    // A truncated file often opens and fails only on the page it lost: check them all now,
    // while the cache is small and nothing depends on it yet.
    if (!run(QStringLiteral("PRAGMA quick_check")))
        return failed();
    if (!query.next() || query.value(0).toString() != QLatin1String("ok"))
        return Opening::Damaged;
    query.finish();
    if (!run(QStringLiteral("CREATE TABLE IF NOT EXISTS holders (number TEXT PRIMARY KEY NOT NULL, "
                            "found INTEGER NOT NULL, fields TEXT NOT NULL, stored_at INTEGER NOT NULL)")))
        return failed();
    return Opening::Ok;
}

void NifCache::closeDatabase()
{
    {
        QSqlDatabase database = QSqlDatabase::database(m_connection, false);
        if (database.isValid())
            database.close();
    }
    QSqlDatabase::removeDatabase(m_connection);
}

void NifCache::setAside()
{
    const QString stamped = m_file + QStringLiteral(".damaged-")
        + QDateTime::currentDateTime().toString(QStringLiteral("yyyyMMdd-HHmmss"));
    QString target = stamped;
    for (int n = 2; QFileInfo::exists(target); ++n)
        target = stamped + QStringLiteral("~%1").arg(n);
    if (QFile::rename(m_file, target))
        m_setAside = target;
    else
        QFile::remove(m_file);
    // The journal and its index belong to the damaged file.
    for (const QString &suffix : { QStringLiteral("-wal"), QStringLiteral("-shm") }) {
        if (m_setAside.isEmpty() || !QFile::rename(m_file + suffix, m_setAside + suffix))
            QFile::remove(m_file + suffix);
    }
}

std::optional<NifCache::Entry> NifCache::find(const QString &taxNumber) const
{
    if (!m_usable)
        return std::nullopt;
    QSqlQuery query(QSqlDatabase::database(m_connection, false));
    query.prepare(QStringLiteral("SELECT found, fields, stored_at FROM holders WHERE number = ?"));
    query.addBindValue(taxNumber);
    if (!query.exec() || !query.next())
        return std::nullopt;
    const QJsonDocument fields = QJsonDocument::fromJson(query.value(1).toByteArray());
    if (!fields.isObject())
        return std::nullopt;
    Entry entry;
    entry.found = query.value(0).toInt() != 0;
    const QJsonObject object = fields.object();
    for (auto it = object.begin(); it != object.end(); ++it)
        entry.fields.insert(it.key().toUpper(), it.value().toString());
    entry.storedAt = QDateTime::fromSecsSinceEpoch(query.value(2).toLongLong(), Qt::UTC);
    return entry;
}

bool NifCache::store(const QString &taxNumber, const Entry &entry)
{
    if (!m_usable)
        return false;
    QJsonObject fields;
    for (auto it = entry.fields.begin(); it != entry.fields.end(); ++it)
        fields.insert(it.key(), it.value());
    QSqlQuery query(QSqlDatabase::database(m_connection, false));
    query.prepare(QStringLiteral("INSERT OR REPLACE INTO holders (number, found, fields, stored_at) "
                                 "VALUES (?, ?, ?, ?)"));
    query.addBindValue(taxNumber);
    query.addBindValue(entry.found ? 1 : 0);
    query.addBindValue(QString::fromUtf8(QJsonDocument(fields).toJson(QJsonDocument::Compact)));
    query.addBindValue(entry.storedAt.toSecsSinceEpoch());
    return query.exec();
}

} // namespace zelctl::companion

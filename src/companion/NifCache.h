#pragma once

#include "NifAnswer.h"
#include "zelctl_export.h"

#include <QDateTime>
#include <QString>

#include <memory>
#include <optional>

namespace zelctl::companion {

// The answers of earlier NIF lookups, each with the time it was stored, in an SQLite
// database. Every fetcher of a thread that names the same file shares one connection; other
// processes may write the same file at once (write-ahead journal, waits for a lock instead
// of failing). A file that is not a sound database is moved aside as "<file>.damaged-<time>"
// and a new one is made; when none can be made the cache answers nothing and stores nothing.
class ZELCTL_EXPORT NifCache
{
public:
    struct Entry
    {
        // Found: `fields` is the holder's record; otherwise the service said the number is
        // not registered, and `fields` holds only its STATUS.
        bool found = false;
        NifFields fields;
        QDateTime storedAt;
    };

    // The cache kept in `file` (empty: defaultFile()), opened on first use on this thread
    // and closed when its last user lets go.
    static std::shared_ptr<NifCache> open(const QString &file = QString());
    // "nifcache.sqlite" in the library's folder of the user's data ("~/.local/share/zelctl").
    static QString defaultFile();

    ~NifCache();
    NifCache(const NifCache &) = delete;
    NifCache &operator=(const NifCache &) = delete;

    bool isUsable() const { return m_usable; }
    // Where a damaged file was moved when this cache opened; empty when none was.
    QString setAsideFile() const { return m_setAside; }

    std::optional<Entry> find(const QString &taxNumber) const;
    // Stores or replaces the entry of a number; false when the database refused it.
    bool store(const QString &taxNumber, const Entry &entry);

private:
    explicit NifCache(const QString &file);

    enum class Opening { Ok, Damaged, Unavailable };
    Opening openDatabase();
    void closeDatabase();
    void setAside();

    QString m_file;
    QString m_connection;
    QString m_setAside;
    bool m_usable = false;
};

} // namespace zelctl::companion

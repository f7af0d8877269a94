#pragma once

#include "zelctl_export.h"

#include <QHash>
#include <QJsonArray>
#include <QList>
#include <QString>
#include <QVariant>

namespace zelctl {

// The persisted properties of one control, in the order they were written, as the
// container keeps them in its form. Values are booleans, numbers, texts or byte arrays.
// Names are found by hash, so a bag read from a hostile form costs time in proportion to
// its size.
class ZELCTL_EXPORT PropertyBag
{
public:
    // Names one bag holds at most; writes of further names are dropped. No control persists
    // more than a few dozen.
    static constexpr qsizetype MaxEntries = 1024;

    // The value stored under the name, or defaultValue when the name is absent.
    QVariant ReadProperty(const QString &name, const QVariant &defaultValue = QVariant()) const;

    // Stores the value under the name, replacing an earlier value. When a default is given
    // and the value equals it, nothing is stored (and an earlier value is dropped), so a
    // form keeps only what differs from the defaults.
    void WriteProperty(const QString &name, const QVariant &value, const QVariant &defaultValue = QVariant());

    bool contains(const QString &name) const;
    QStringList names() const;
    bool isEmpty() const { return m_entries.isEmpty(); }

    // As a JSON array of {"name", "value"} objects, which keeps the order. Byte arrays are
    // written as {"base64": "..."}.
    QJsonArray toJson() const;
    // Entries that are not objects with a text name are skipped, and so are those beyond
    // MaxEntries names.
    static PropertyBag fromJson(const QJsonArray &json);

    bool operator==(const PropertyBag &other) const = default;

private:
    QList<std::pair<QString, QVariant>> m_entries;
    // Where each name is in m_entries.
    QHash<QString, qsizetype> m_index;
};

} // namespace zelctl

#pragma once

#include "zelctl_export.h"

#include <QList>
#include <QString>
#include <QVariant>

namespace zelctl::companion {

// A declaration's fields ("casado", "dependentes" ...), in insertion order.
class ZELCTL_EXPORT FieldCollection
{
public:
    struct Item
    {
        QString id;
        QVariant value;
    };

    // The value of the first field with this id; "" when there is none.
    QVariant Lookup(const QString &id) const;
    // Appends a field (ids may repeat; Lookup finds the first).
    void Add(const QString &id, const QVariant &value);
    // Replaces the value of the first field with this id, or appends it.
    void Set(const QString &id, const QVariant &value);

    const QList<Item> &items() const { return m_items; }
    qsizetype Count() const { return m_items.size(); }

private:
    QList<Item> m_items;
};

} // namespace zelctl::companion

#include "FieldCollection.h"

#include <algorithm>

namespace zelctl::companion {

QVariant FieldCollection::Lookup(const QString &id) const
{
    const auto it = std::find_if(m_items.cbegin(), m_items.cend(), [&](const Item &item) { return item.id == id; });
    return it == m_items.cend() ? QVariant(QString()) : it->value;
}

void FieldCollection::Add(const QString &id, const QVariant &value)
{
    m_items.append({ id, value });
}

void FieldCollection::Set(const QString &id, const QVariant &value)
{
    const auto it = std::find_if(m_items.begin(), m_items.end(), [&](const Item &item) { return item.id == id; });
    if (it == m_items.end())
        Add(id, value);
    else
        it->value = value;
}

} // namespace zelctl::companion

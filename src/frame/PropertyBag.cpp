#include "PropertyBag.h"

#include <QJsonObject>

#include <climits>
#include <cmath>

namespace zelctl {

namespace {

QJsonValue toJsonValue(const QVariant &value)
{
    if (value.typeId() == QMetaType::QByteArray)
        return QJsonObject { { "base64", QString::fromLatin1(value.toByteArray().toBase64()) } };
    return QJsonValue::fromVariant(value);
}

QVariant fromJsonValue(const QJsonValue &value)
{
    if (value.isObject()) {
        const QJsonValue encoded = value.toObject().value("base64");
        return encoded.isString() ? QVariant(QByteArray::fromBase64(encoded.toString().toLatin1())) : QVariant();
    }
    if (value.isDouble()) {
        // Whole numbers come back as integers, so they compare equal to the values written.
        const double number = value.toDouble();
        double whole = 0;
        if (std::modf(number, &whole) == 0.0 && std::abs(number) <= 9007199254740992.0)
            return number >= INT_MIN && number <= INT_MAX ? QVariant(int(number)) : QVariant(qint64(number));
        return number;
    }
    return value.toVariant();
}

} // namespace

QVariant PropertyBag::ReadProperty(const QString &name, const QVariant &defaultValue) const
{
    const auto it = m_index.constFind(name);
    return it == m_index.cend() ? defaultValue : m_entries[*it].second;
}

void PropertyBag::WriteProperty(const QString &name, const QVariant &value, const QVariant &defaultValue)
{
    const auto it = m_index.find(name);
    if (defaultValue.isValid() && value == defaultValue) {
        if (it != m_index.end()) {
            const qsizetype at = *it;
            m_index.erase(it);
            m_entries.removeAt(at);
            for (qsizetype &position : m_index) {
                if (position > at)
                    --position;
            }
        }
        return;
    }
    if (it != m_index.end()) {
        m_entries[*it].second = value;
    } else if (m_entries.size() < MaxEntries) {
        m_index.insert(name, m_entries.size());
        m_entries.append({ name, value });
    }
}

bool PropertyBag::contains(const QString &name) const
{
    return m_index.contains(name);
}

QStringList PropertyBag::names() const
{
    QStringList result;
    result.reserve(m_entries.size());
    for (const auto &[name, value] : m_entries)
        result.append(name);
    return result;
}

QJsonArray PropertyBag::toJson() const
{
    QJsonArray json;
    for (const auto &[name, value] : m_entries)
        json.append(QJsonObject { { "name", name }, { "value", toJsonValue(value) } });
    return json;
}

PropertyBag PropertyBag::fromJson(const QJsonArray &json)
{
    PropertyBag bag;
    for (const QJsonValue &entry : json) {
        const QJsonValue name = entry.toObject().value("name");
        if (name.isString())
            bag.WriteProperty(name.toString(), fromJsonValue(entry.toObject().value("value")));
    }
    return bag;
}

} // namespace zelctl

#include "PropertyReaders.h"

#include <cmath>
#include <limits>
#include <optional>

namespace zelctl {

namespace {

using platform::OleColor;

// A whole number that fits the 32 bits of a colour, signed (a Long) or not.
std::optional<OleColor> colourOfNumber(qint64 number)
{
    if (number < std::numeric_limits<qint32>::min() || number > qint64(std::numeric_limits<quint32>::max()))
        return std::nullopt;
    return OleColor(quint32(number));
}

std::optional<OleColor> colourOfText(const QString &value)
{
    const QString text = value.trimmed();
    bool ok = false;
    if (text.startsWith(u"&H", Qt::CaseInsensitive)) {
        // The literal's closing "&" is optional, as the language's own reader takes it.
        const QStringView digits = QStringView(text).sliced(2).chopped(text.endsWith(u'&') ? 1 : 0);
        if (digits.isEmpty() || digits.size() > 8)
            return std::nullopt;
        const quint32 colour = digits.toUInt(&ok, 16);
        return ok ? std::optional<OleColor>(colour) : std::nullopt;
    }
    const qint64 number = text.toLongLong(&ok, 10);
    return ok ? colourOfNumber(number) : std::nullopt;
}

std::optional<OleColor> colourOf(const QVariant &value)
{
    switch (value.typeId()) {
    case QMetaType::Int:
    case QMetaType::UInt:
    case QMetaType::Long:
    case QMetaType::ULong:
    case QMetaType::LongLong:
    case QMetaType::Short:
    case QMetaType::UShort:
        return colourOfNumber(value.toLongLong());
    case QMetaType::ULongLong:
        return value.toULongLong() <= std::numeric_limits<quint32>::max()
            ? std::optional<OleColor>(OleColor(value.toULongLong()))
            : std::nullopt;
    case QMetaType::Double: {
        // Compared before the conversion: 1e300 or NaN has no 64-bit value.
        const double number = value.toDouble();
        if (!(number >= -2147483648.0 && number <= 4294967295.0) || number != std::trunc(number))
            return std::nullopt;
        return colourOfNumber(qint64(number));
    }
    case QMetaType::QString:
        return colourOfText(value.toString());
    default:
        return std::nullopt;
    }
}

// A whole number, or nothing for a value that is not a finite number.
std::optional<double> numberOf(const QVariant &value)
{
    bool ok = false;
    double number = 0;
    switch (value.typeId()) {
    case QMetaType::Int:
    case QMetaType::UInt:
    case QMetaType::Long:
    case QMetaType::ULong:
    case QMetaType::LongLong:
    case QMetaType::ULongLong:
    case QMetaType::Short:
    case QMetaType::UShort:
    case QMetaType::Double:
    case QMetaType::Float:
        number = value.toDouble(&ok);
        break;
    case QMetaType::QString:
        number = value.toString().trimmed().toDouble(&ok);
        break;
    default:
        return std::nullopt;
    }
    if (!ok || !std::isfinite(number))
        return std::nullopt;
    return std::nearbyint(number);
}

} // namespace

qint32 readLong(
    const PropertyBag &bag, const QString &name, qint32 fallback, qint32 minimum, qint32 maximum, OutOfRange rule)
{
    const std::optional<double> number = numberOf(bag.ReadProperty(name));
    if (!number)
        return fallback;
    if (*number < minimum)
        return rule == OutOfRange::Clamp ? minimum : fallback;
    if (*number > maximum)
        return rule == OutOfRange::Clamp ? maximum : fallback;
    return qint32(*number);
}

platform::OleColor readColor(const PropertyBag &bag, const QString &name, platform::OleColor fallback)
{
    return colourOf(bag.ReadProperty(name)).value_or(fallback);
}

bool readBoolean(const PropertyBag &bag, const QString &name, bool fallback)
{
    const QVariant value = bag.ReadProperty(name);
    switch (value.typeId()) {
    case QMetaType::Bool:
        return value.toBool();
    case QMetaType::Int:
    case QMetaType::UInt:
    case QMetaType::LongLong:
    case QMetaType::ULongLong:
    case QMetaType::Double:
        return value.toDouble() != 0;
    case QMetaType::QString: {
        const QString text = value.toString().trimmed();
        if (text.compare(u"true", Qt::CaseInsensitive) == 0 || text == u"-1" || text == u"1")
            return true;
        if (text.compare(u"false", Qt::CaseInsensitive) == 0 || text == u"0")
            return false;
        return fallback;
    }
    default:
        return fallback;
    }
}

} // namespace zelctl

#pragma once

#include "zelctl_export.h"

#include "frame/PropertyBag.h"
#include "platform/OleColor.h"

#include <limits>

// Typed reads of a property bag. A form file may hold a value in any of the forms that a
// user, an older form file or another host wrote; these readers accept each of them and
// fall back to the default for anything they cannot read, so a control loads every form.
namespace zelctl {

// A colour (OLE_COLOR): a number, or a text in decimal ("65280"; a negative one is a
// system colour kept as a signed Long) or a hexadecimal colour literal ("&H00FF00&",
// "&HFF00&", "&H8000000F&"). An absent name, or a value that is none of these, gives
// `fallback`.
ZELCTL_EXPORT platform::OleColor readColor(const PropertyBag &bag, const QString &name, platform::OleColor fallback);

// A Boolean: true or false, a number (0 is false) or the texts "True"/"False", "-1"/"0"
// and "1" in any case. Anything else gives `fallback`.
ZELCTL_EXPORT bool readBoolean(const PropertyBag &bag, const QString &name, bool fallback);

// What a whole number outside a property's range becomes.
enum class OutOfRange {
    // The nearest end of the range, for a property whose setter clamps.
    Clamp,
    // `fallback`, for a property whose setter ignores such values.
    Refuse,
};

// A whole number within minimum..maximum (a Long's range unless given): a number, or a
// decimal text. A fraction is rounded to the nearest whole number (halves to even, as the
// language's own conversion does); a value out of range is handled by `rule`, so 1e300 or
// 2^63 never reaches the control's arithmetic. Anything else, or an absent name, gives
// `fallback`.
ZELCTL_EXPORT qint32 readLong(const PropertyBag &bag, const QString &name, qint32 fallback,
    qint32 minimum = std::numeric_limits<qint32>::min(), qint32 maximum = std::numeric_limits<qint32>::max(),
    OutOfRange rule = OutOfRange::Refuse);

} // namespace zelctl

#pragma once

#include "zelctl_export.h"

#include "frame/PropertyBag.h"
#include "platform/OleColor.h"

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

} // namespace zelctl

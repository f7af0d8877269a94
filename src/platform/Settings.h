#pragma once

#include "zelctl_export.h"

#include <QString>

// Per-user application settings (application, section, key), kept as one INI file per
// application under the XDG config folder. The application name is folded to lower case,
// so "zEL" and "ZEL" share one store, as they did where these keys were case-insensitive.
// A store that is a symbolic link is written through to the file it points at; one that is,
// or leads to, a FIFO or a device is neither read nor written (reads give the default).
namespace zelctl::platform {

// A value is read whole, also when a person wrote it by hand with a comma or a semicolon
// in it; an absent key gives defaultValue.
ZELCTL_EXPORT QString GetSetting(
    const QString &application, const QString &section, const QString &key, const QString &defaultValue = QString());
// False, and nothing written, when the store could not be read or written: a user's file
// that this library did not understand is never written over.
ZELCTL_EXPORT bool SaveSetting(
    const QString &application, const QString &section, const QString &key, const QString &value);
ZELCTL_EXPORT bool DeleteSetting(const QString &application, const QString &section, const QString &key);

// The INI file that holds an application's settings.
ZELCTL_EXPORT QString settingsFile(const QString &application);

} // namespace zelctl::platform

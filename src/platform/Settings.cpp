#include "Settings.h"

#include "platform/FileRead.h"

#include <QSettings>
#include <QStandardPaths>

namespace zelctl::platform {

namespace {

QString settingsKey(const QString &section, const QString &key)
{
    return section + QLatin1Char('/') + key;
}

} // namespace

QString settingsFile(const QString &application)
{
    return QStandardPaths::writableLocation(QStandardPaths::GenericConfigLocation) + QStringLiteral("/zelctl/")
        + application.toLower() + QStringLiteral(".ini");
}

QString GetSetting(const QString &application, const QString &section, const QString &key, const QString &defaultValue)
{
    // A store that is, or links to, a FIFO or a device is neither read (opening a FIFO waits
    // for a writer) nor written (the new file would be renamed over it).
    if (isSpecialFile(settingsFile(application)))
        return defaultValue;
    const QSettings store(settingsFile(application), QSettings::IniFormat);
    return store.value(settingsKey(section, key), defaultValue).toString();
}

void SaveSetting(const QString &application, const QString &section, const QString &key, const QString &value)
{
    if (isSpecialFile(settingsFile(application)))
        return;
    QSettings store(settingsFile(application), QSettings::IniFormat);
    store.setValue(settingsKey(section, key), value);
}

void DeleteSetting(const QString &application, const QString &section, const QString &key)
{
    if (isSpecialFile(settingsFile(application)))
        return;
    QSettings store(settingsFile(application), QSettings::IniFormat);
    store.remove(settingsKey(section, key));
}

} // namespace zelctl::platform

#include "Settings.h"

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
    const QSettings store(settingsFile(application), QSettings::IniFormat);
    return store.value(settingsKey(section, key), defaultValue).toString();
}

void SaveSetting(const QString &application, const QString &section, const QString &key, const QString &value)
{
    QSettings store(settingsFile(application), QSettings::IniFormat);
    store.setValue(settingsKey(section, key), value);
}

void DeleteSetting(const QString &application, const QString &section, const QString &key)
{
    QSettings store(settingsFile(application), QSettings::IniFormat);
    store.remove(settingsKey(section, key));
}

} // namespace zelctl::platform

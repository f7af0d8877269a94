#include "Settings.h"

#include "platform/FileRead.h"

#include <QFile>
#include <QSettings>
#include <QStandardPaths>

namespace zelctl::platform {

namespace {

QString settingsKey(const QString &section, const QString &key)
{
    return section + QLatin1Char('/') + key;
}

// The text after "key=" in the section, as a person typed it, when it is not quoted. Only
// such a value can hold a comma or a semicolon that QSettings did not write itself.
QString handWrittenValue(const QString &file, const QString &section, const QString &key)
{
    QFile in(file);
    if (!in.open(QIODevice::ReadOnly | QIODevice::Text))
        return {};
    bool inSection = false;
    while (!in.atEnd()) {
        const QString line = QString::fromUtf8(in.readLine()).trimmed();
        if (line.startsWith(QLatin1Char('[')) && line.endsWith(QLatin1Char(']'))) {
            inSection = line.mid(1, line.size() - 2).trimmed().compare(section, Qt::CaseInsensitive) == 0;
            continue;
        }
        const qsizetype equals = line.indexOf(QLatin1Char('='));
        if (inSection && equals > 0 && line.first(equals).trimmed().compare(key, Qt::CaseInsensitive) == 0) {
            const QString value = line.sliced(equals + 1).trimmed();
            return value.startsWith(QLatin1Char('"')) ? QString() : value;
        }
    }
    return {};
}

// Whether every line of the file is one the reader takes in: blank, a comment, a section
// or "key=value". QSettings passes over other lines (a setting typed without its "=")
// without a word and would leave them out of the file it writes back.
bool everyLineUnderstood(const QString &file)
{
    QFile in(file);
    if (!in.exists())
        return true;
    if (!in.open(QIODevice::ReadOnly | QIODevice::Text))
        return false;
    while (!in.atEnd()) {
        const QString line = QString::fromUtf8(in.readLine()).trimmed();
        const bool understood = line.isEmpty() || line.startsWith(QLatin1Char(';')) || line.startsWith(QLatin1Char('#'))
            || (line.startsWith(QLatin1Char('[')) && line.endsWith(QLatin1Char(']')))
            || line.indexOf(QLatin1Char('=')) > 0;
        if (!understood)
            return false;
    }
    return true;
}

// A store that exists but could not be read whole is not written: writing would replace
// the user's whole file with what little was understood of it.
bool writable(const QSettings &store)
{
    return store.status() == QSettings::NoError && everyLineUnderstood(store.fileName());
}

} // namespace

QString settingsFile(const QString &application)
{
    return QStandardPaths::writableLocation(QStandardPaths::GenericConfigLocation) + QStringLiteral("/zelctl/")
        + application.toLower() + QStringLiteral(".ini");
}

QString GetSetting(const QString &application, const QString &section, const QString &key, const QString &defaultValue)
{
    const QString file = settingsFile(application);
    // A store that is, or links to, a FIFO or a device is neither read (opening a FIFO waits
    // for a writer) nor written (the new file would be renamed over it).
    if (isSpecialFile(file))
        return defaultValue;
    const QSettings store(file, QSettings::IniFormat);
    const QVariant value = store.value(settingsKey(section, key));
    if (!value.isValid())
        return defaultValue;
    // An unquoted comma makes QSettings read a list and a semicolon ends its value; a
    // hand-edited setting such as "RootPath=/opt/zel,2024" is meant whole.
    const QString typed = handWrittenValue(file, section, key);
    if (typed.contains(QLatin1Char(',')) || typed.contains(QLatin1Char(';')))
        return typed;
    return value.toString();
}

bool SaveSetting(const QString &application, const QString &section, const QString &key, const QString &value)
{
    if (isSpecialFile(settingsFile(application)))
        return false;
    QSettings store(settingsFile(application), QSettings::IniFormat);
    if (!writable(store))
        return false;
    store.setValue(settingsKey(section, key), value);
    store.sync();
    return store.status() == QSettings::NoError;
}

bool DeleteSetting(const QString &application, const QString &section, const QString &key)
{
    if (isSpecialFile(settingsFile(application)))
        return false;
    QSettings store(settingsFile(application), QSettings::IniFormat);
    if (!writable(store))
        return false;
    store.remove(settingsKey(section, key));
    store.sync();
    return store.status() == QSettings::NoError;
}

} // namespace zelctl::platform

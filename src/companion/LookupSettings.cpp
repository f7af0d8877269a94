#include "LookupSettings.h"

#include "platform/Settings.h"

namespace zelctl::companion {

namespace {

const QString Application = QStringLiteral("ZEL");
const QString Section = QStringLiteral("Config");

QString setting(const char *key)
{
    return platform::GetSetting(Application, Section, QString::fromLatin1(key));
}

// The setting as a number within [low, high], or `fallback` when it is absent, not a
// number or out of range.
double numberSetting(const char *key, double low, double high, double fallback)
{
    bool ok = false;
    const double value = setting(key).toDouble(&ok);
    return ok && value >= low && value <= high ? value : fallback;
}

} // namespace

QUrl LookupSettings::defaultServiceAddress()
{
    return QUrl(QStringLiteral("https://ec.europa.eu/taxation_customs/vies/rest-api"));
}

LookupSettings LookupSettings::fromUserSettings()
{
    LookupSettings settings;
    settings.remoteAllowed = remoteLookupsAllowed();
    const QString address = setting("nifserviceurl");
    if (!address.isEmpty())
        settings.serviceAddress = QUrl(address);
    settings.timeout = std::chrono::milliseconds(qRound(1000 * numberSetting("nifservicetimeout", 0.1, 300, 15)));
    settings.cacheDays = int(numberSetting("nifcachedays", 0, 36500, 30));
    const QList<LookupSource> order = parseSourceOrder(setting("nifsources"));
    if (!order.isEmpty())
        settings.order = order;
    return settings;
}

QList<LookupSource> parseSourceOrder(const QString &text)
{
    QList<LookupSource> order;
    for (const QString &part : text.split(u',')) {
        const QString name = part.trimmed().toLower();
        LookupSource source;
        if (name == QLatin1String("cache"))
            source = LookupSource::Cache;
        else if (name == QLatin1String("directory"))
            source = LookupSource::Directory;
        else if (name == QLatin1String("service"))
            source = LookupSource::Service;
        else
            continue;
        if (!order.contains(source))
            order.append(source);
    }
    return order;
}

bool remoteLookupsAllowed()
{
    return setting("allowremotenif") == QLatin1String("1");
}

void setRemoteLookupsAllowed(bool allowed)
{
    platform::SaveSetting(
        Application, Section, QStringLiteral("allowremotenif"), allowed ? QStringLiteral("1") : QStringLiteral("0"));
}

} // namespace zelctl::companion

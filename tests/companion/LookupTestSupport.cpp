#include "LookupTestSupport.h"

#include "platform/Settings.h"
#include "support/TestSupport.h"

#include <QFile>
#include <QTest>

namespace zelctl::test {

void LookupFixture::SetUp()
{
    // Nothing a test does may reach a real address.
    ASSERT_EQ(service.baseAddress().host(), "127.0.0.1");
    saveSetting("allowremotenif", "1");
    saveSetting("nifserviceurl", service.baseAddress().toString());
    saveSetting("nifservicetimeout", TimeoutSeconds);
    ASSERT_EQ(companion::LookupSettings::fromUserSettings().serviceAddress.host(), "127.0.0.1");
}

void LookupFixture::TearDown()
{
    for (const char *key : { "allowremotenif", "nifserviceurl", "nifservicetimeout", "nifsources" })
        platform::DeleteSetting("ZEL", "Config", key);
}

void LookupFixture::saveSetting(const char *key, const QString &value)
{
    platform::SaveSetting("ZEL", "Config", key, value);
}

companion::LookupSettings LookupFixture::settings() const
{
    companion::LookupSettings settings = companion::LookupSettings::fromUserSettings();
    settings.cacheFile = folder.filePath("nifcache.sqlite");
    settings.directoryFile = sourcePath("data/contribuintes.json");
    return settings;
}

QStringList fetch(companion::NIFGrabber &grabber, const QString &number, const QString &meanwhile)
{
    QStringList events;
    QObject context;
    QObject::connect(&grabber, &companion::NIFGrabber::Starting, &context, [&] { events << "Starting"; });
    QObject::connect(&grabber, &companion::NIFGrabber::ReceivedInformation, &context,
        [&](const QString &id) { events << "ReceivedInformation:" + id; });
    QObject::connect(&grabber, &companion::NIFGrabber::Finished, &context, [&] { events << "Finished"; });
    grabber.Fetch(number);
    EXPECT_TRUE(grabber.IsBusy() && events.isEmpty()) << "Fetch returns before anything is answered";
    if (!meanwhile.isEmpty())
        grabber.Fetch(meanwhile);
    EXPECT_TRUE(QTest::qWaitFor([&] { return !grabber.IsBusy(); }, 10000));
    return events;
}

} // namespace zelctl::test

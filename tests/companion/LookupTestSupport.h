#pragma once

#include "support/FakeHttpServer.h"

#include "companion/ChainedNIFGrabber.h"
#include "platform/Settings.h"
#include "support/TestSupport.h"

#include <QStringList>
#include <QTemporaryDir>
#include <QTest>

#include <gtest/gtest.h>

namespace zelctl::test {

// Valid Portuguese numbers; the directory file knows the first.
inline const QString DirectoryHolder = QStringLiteral("PT210345675");
inline const QString UnknownHolder = QStringLiteral("PT123456789");
inline const QString TimedOut = QStringLiteral("O serviço não respondeu em 1.5 s");

// The user's lookup settings pointed at a fake service on 127.0.0.1, remote lookups allowed.
class LookupFixture : public ::testing::Test
{
protected:
    void SetUp() override
    {
        saveSetting("allowremotenif", "1");
        saveSetting("nifserviceurl", service.baseAddress().toString());
        saveSetting("nifservicetimeout", "1.5"); // enough for the local server on a loaded machine
        // Nothing a test does may reach a real address.
        ASSERT_EQ(companion::LookupSettings::fromUserSettings().serviceAddress.host(), "127.0.0.1");
    }
    void TearDown() override
    {
        for (const char *key : { "allowremotenif", "nifserviceurl", "nifservicetimeout", "nifsources" })
            platform::DeleteSetting("ZEL", "Config", key);
    }
    static void saveSetting(const char *key, const QString &value)
    {
        platform::SaveSetting("ZEL", "Config", key, value);
    }

    // The user's settings for a fetcher the test makes, with a cache file of its own.
    companion::LookupSettings settings() const
    {
        companion::LookupSettings settings = companion::LookupSettings::fromUserSettings();
        settings.cacheFile = folder.filePath("nifcache.sqlite");
        settings.directoryFile = sourcePath("data/contribuintes.json");
        return settings;
    }

    FakeHttpServer service;
    QTemporaryDir folder;
};

// Runs one fetch to its end (with a second one asked for meanwhile, if given) and gives
// its events: "Starting", "ReceivedInformation:<id>", "Finished".
inline QStringList fetch(companion::NIFGrabber &grabber, const QString &number, const QString &meanwhile = {})
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

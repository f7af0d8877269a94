#pragma once

#include "FakeVatService.h"

#include "companion/ChainedNIFGrabber.h"

#include <QStringList>
#include <QTemporaryDir>

#include <gtest/gtest.h>

namespace zelctl::test {

// Valid Portuguese numbers; the directory file knows the first.
inline const QString DirectoryHolder = QStringLiteral("PT210345675");
inline const QString UnknownHolder = QStringLiteral("PT123456789");
// Long enough for an answer of the local server on a loaded machine.
inline const QString TimeoutSeconds = QStringLiteral("1.5");
inline const QString TimedOut = QStringLiteral("O serviço não respondeu em 1.5 s");

// Runs one fetch to its end (with a second one asked for meanwhile, if given) and gives
// its events: "Starting", "ReceivedInformation:<id>", "Finished".
QStringList fetch(companion::NIFGrabber &grabber, const QString &number, const QString &meanwhile = {});

// Points the user's lookup settings at a fake service on 127.0.0.1, with remote lookups
// allowed and a short timeout, and takes them back afterwards.
class LookupFixture : public ::testing::Test
{
protected:
    void SetUp() override;
    void TearDown() override;
    void saveSetting(const char *key, const QString &value);

    // The user's settings for a fetcher the test makes, with a cache file of its own.
    companion::LookupSettings settings() const;
    FakeVatService service;
    QTemporaryDir folder;
};

} // namespace zelctl::test

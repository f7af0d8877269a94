#pragma once

#include "zelctl_export.h"

#include <QList>
#include <QString>
#include <QUrl>

#include <chrono>

namespace zelctl::companion {

// The places a NIF lookup may ask, beside the host's declaration (which a NIF control
// always reads first, before it asks its fetcher).
enum class LookupSource {
    Cache, // answers stored earlier on this machine
    Directory, // the directory file of known holders in the data folder
    Service, // the European Commission's VAT information service, over the network
};

// How the NIF fetcher looks numbers up. The user's choices are kept under application
// "ZEL", section "Config", beside "allowautonif":
//   "allowremotenif"     "1" lets numbers leave the machine for the service; default "0"
//   "nifserviceurl"      the service's base address; default the public service
//   "nifservicetimeout"  seconds a service request may take; default 15
//   "nifcachedays"       days a stored answer counts as fresh; default 30
//   "nifsources"         the order of sources, "cache,directory,service" by default
struct ZELCTL_EXPORT LookupSettings
{
    QList<LookupSource> order { LookupSource::Cache, LookupSource::Directory, LookupSource::Service };
    bool remoteAllowed = false;
    QUrl serviceAddress = defaultServiceAddress();
    std::chrono::milliseconds timeout { 15000 };
    int cacheDays = 30;
    // Skip fresh stored answers and ask again (stored answers still stand in when the
    // other sources fail).
    bool refresh = false;
    // Empty: the database in the user's data folder.
    QString cacheFile;
    // Empty: the directory file in the data folder.
    QString directoryFile;

    static QUrl defaultServiceAddress();
    // The user's settings; a value that does not parse counts as its default.
    static LookupSettings fromUserSettings();
};

// "cache,directory,service" in any order; unknown or repeated names are skipped, and
// "declaration" is accepted and skipped because the control reads the declaration first.
ZELCTL_EXPORT QList<LookupSource> parseSourceOrder(const QString &text);

ZELCTL_EXPORT bool remoteLookupsAllowed();
ZELCTL_EXPORT void setRemoteLookupsAllowed(bool allowed);

} // namespace zelctl::companion

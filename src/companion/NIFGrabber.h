#pragma once

#include "zelctl_export.h"

#include <QObject>
#include <QString>
#include <QVariant>

#include <functional>

namespace zelctl::companion {

// Looks up the data of a tax number's holder. A NIF control owns one. Fetch() returns at
// once; the answer comes later through the signals, on the caller's thread, always in the
// order Starting, ReceivedInformation (when something was found), Finished.
class ZELCTL_EXPORT NIFGrabber : public QObject
{
    Q_OBJECT

public:
    using QObject::QObject;

    // True while a fetch runs; a caller starts no other fetch then.
    virtual bool IsBusy() const = 0;
    // The holder's name found by the last fetch.
    virtual QString HolderName() const = 0;
    // A field of the last fetch ("ID", "NAME", "CONCELHO" ...); "" for a key it does not hold.
    virtual QString GetField(const QString &key) const = 0;
    virtual void SetField(const QString &key, const QString &value) = 0;
    // Starts fetching the data of a tax number: country code and number, e.g. "PT123456789".
    virtual void Fetch(const QString &taxNumber, const QVariant &option = QVariant()) = 0;

Q_SIGNALS:
    void Starting();
    // The data of `id` (country code and number) are now answered by GetField and HolderName.
    void ReceivedInformation(const QString &id);
    void Finished();
};

// Makes the fetcher of a new NIF control. The default is a ChainedNIFGrabber on the user's
// lookup settings; a host may install its own.
using NIFGrabberFactory = std::function<NIFGrabber *(QObject *parent)>;

ZELCTL_EXPORT NIFGrabber *createNIFGrabber(QObject *parent);
// Installs a factory and returns the previous one; an empty factory restores the default.
ZELCTL_EXPORT NIFGrabberFactory setNIFGrabberFactory(NIFGrabberFactory factory);

} // namespace zelctl::companion

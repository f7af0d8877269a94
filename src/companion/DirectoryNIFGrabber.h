#pragma once

#include "NIFGrabber.h"

#include <QHash>
#include <QJsonObject>

namespace zelctl::companion {

// Fetcher that answers from a directory file of known holders: a JSON object mapping a
// tax number ("PT123456789") to an object of fields ({"NAME": ..., "CONCELHO": ...}).
// Answers arrive from the event loop after `latency` milliseconds; field keys are
// compared without regard to case.
class ZELCTL_EXPORT DirectoryNIFGrabber : public NIFGrabber
{
    Q_OBJECT

public:
    explicit DirectoryNIFGrabber(const QString &directoryFile, QObject *parent = nullptr);

    // The directory file in the data folder: "contribuintes.json".
    static QString defaultDirectoryFile();

    bool IsBusy() const override { return m_busy; }
    QString HolderName() const override;
    QString GetField(const QString &key) const override;
    void SetField(const QString &key, const QString &value) override;
    void Fetch(const QString &taxNumber, const QVariant &option = QVariant()) override;

    void setLatency(int milliseconds) { m_latency = milliseconds; }

private:
    void answer(const QString &taxNumber);

    QString m_directoryFile;
    QHash<QString, QString> m_fields;
    int m_latency = 0;
    bool m_busy = false;
};

} // namespace zelctl::companion

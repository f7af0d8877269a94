#pragma once

#include "LookupSettings.h"
#include "NIFGrabber.h"
#include "NifAnswer.h"
#include "NifCache.h"

#include <memory>
#include <optional>

namespace zelctl::companion {

class VatServiceClient;

// The fetcher of new NIF controls. It asks its sources in the order of the lookup settings
// (stored answers, the directory file, the EU's VAT service) until one names the holder, and
// stores every answer it gets from the directory or the service. A stored answer older than
// the settings allow is asked again, and still answers (STATUS says it is out of date) when
// the other sources fail. The service is asked only while the user allows remote lookups.
//
// When nothing is found or every source fails, only Finished follows Starting; the fields
// then keep the data the last fetch gave for the same number, with STATUS saying why.
// Field keys are compared without regard to case.
class ZELCTL_EXPORT ChainedNIFGrabber : public NIFGrabber
{
    Q_OBJECT

public:
    // Reads the user's lookup settings at every fetch, so a changed setting counts at once.
    explicit ChainedNIFGrabber(QObject *parent = nullptr);
    // Always looks up with these settings.
    explicit ChainedNIFGrabber(const LookupSettings &settings, QObject *parent = nullptr);
    ~ChainedNIFGrabber() override;

    bool IsBusy() const override { return m_busy; }
    QString HolderName() const override;
    QString GetField(const QString &key) const override;
    void SetField(const QString &key, const QString &value) override;
    void Fetch(const QString &taxNumber, const QVariant &option = QVariant()) override;

    // How the last fetch ended.
    NifAnswer::Outcome LastOutcome() const { return m_outcome; }
    // Every field of the last fetch, under upper-case keys.
    NifFields Fields() const { return m_fields; }

private:
    QString number() const;
    void lookUp();
    std::optional<NifAnswer> fromCache();
    std::optional<NifAnswer> fromDirectory() const;
    bool askService();
    void serviceAnswered(const NifAnswer &answer);
    void concludeWithoutAnswer();
    void conclude(const NifAnswer &answer);
    NifCache &cache();
    void remember(const NifAnswer &answer);

    std::optional<LookupSettings> m_fixedSettings;
    LookupSettings m_settings;
    std::shared_ptr<NifCache> m_cache;
    VatServiceClient *m_service = nullptr;

    // The fetch under way: the number as the caller wrote it, the next source to ask, a
    // stored answer too old to give unless nothing better comes, and the last failure.
    QString m_requested;
    qsizetype m_step = 0;
    std::optional<NifCache::Entry> m_stale;
    std::optional<NifAnswer> m_setback;
    // The service (or a fresh stored answer of it) said the number is not registered.
    bool m_serviceSaidNo = false;
    bool m_busy = false;

    NifFields m_fields;
    NifAnswer::Outcome m_outcome = NifAnswer::Outcome::NotFound;
};

} // namespace zelctl::companion

#pragma once

#include "zelctl_export.h"

#include "frame/Enums.h"

#include <QDialog>

#include <memory>

namespace zelctl {

// "Escolha o país": the modal list of countries with their flags, names and codes, from
// which the user picks one. The caller sets the filter mode (and the custom list), calls
// RelistCountries, shows the form with platform::showModal, reads the chosen two-letter code
// from Tag ("" when none was chosen) and unloads the form.
class ZELCTL_EXPORT frmSelectCountry : public QDialog
{
    Q_OBJECT
    Q_PROPERTY(zelctl::GSEL_CountryFilterList filterMode READ filterMode WRITE setFilterMode)
    Q_PROPERTY(QString customList READ customList WRITE setCustomList)
    Q_PROPERTY(QString Tag READ Tag WRITE setTag)

public:
    explicit frmSelectCountry(QWidget *parent = nullptr);
    ~frmSelectCountry() override;

    // Which countries RelistCountries lists; GSEL_All on a new form.
    GSEL_CountryFilterList filterMode() const;
    void setFilterMode(GSEL_CountryFilterList mode);

    // The codes listed in GSEL_Custom mode, separated by commas ("ES,FR").
    QString customList() const;
    void setCustomList(const QString &codes);

    // After closing: the chosen two-letter code, or "".
    QString Tag() const;
    void setTag(const QString &tag);

    // Where the countries are read from; "iso3166.txt" in the data folder unless set.
    QString countryFile() const;
    void setCountryFile(const QString &path);

    // Fills the list for the filter mode: Portugal first (except in GSEL_Custom mode), then
    // the countries of the country file that the mode takes, in file order. A file that
    // cannot be read is reported to the user.
    Q_INVOKABLE void RelistCountries();

    // Empties the list and its flags and hides the form.
    Q_INVOKABLE void Unload();

    // Escape and the window's close box cancel, as "&Cancelar" does.
    void reject() override;

protected:
    void resizeEvent(QResizeEvent *event) override;

private:
    void AddCountry(const QString &code, const QString &name, qint64 number);
    void acceptSelected();
    void cancel();

    std::unique_ptr<class frmSelectCountryPrivate> const d;
};

} // namespace zelctl

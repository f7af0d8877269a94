#pragma once

#include "zelctl_export.h"

#include "GFXTypes.h"

#include "frame/Enums.h"

#include <QObject>
#include <QString>
#include <QVariant>

#include <memory>

namespace zelctl {

class frmSelector;

// Opens selection dialogs for the host: a list of items shown as buttons in a modal dialog
// placed near an optional parent object, of which the user chooses one; and a country
// dialog built on it. While a dialog is open its events report the user's steps.
class ZELCTL_EXPORT clsGFXSelection : public QObject
{
    Q_OBJECT

public:
    explicit clsGFXSelection(QObject *parent = nullptr);
    ~clsGFXSelection() override;

    // Shows one button per item, with its image (a PNG, drawn with its transparency), and
    // returns the user's choice: OK (or Enter) gives Accepted with the pressed item (none
    // when nothing was pressed), a double click or Enter on an item chooses it and accepts,
    // Cancel, Escape or the close box give Canceled. s.Title is also the window's title. The
    // item marked Default starts with the focus. With no items no dialog is shown and every
    // field of the result is empty.
    Q_INVOKABLE zelctl::GFXResult SelectFrom(const zelctl::GFXSelection &s, const QList<zelctl::GFXItem> &Items);

    // How the items would be shown: always as buttons.
    Q_INVOKABLE zelctl::GFXViewTypes RecomendedView(
        const zelctl::GFXSelection &s, const QList<zelctl::GFXItem> &Items) const;

    // The two-letter code of the country the user chooses, or "". GSEL_OnlyPT answers "PT"
    // without a dialog; the other modes offer the countries of the country file that CFilter
    // names (GSEL_Custom: codes separated by commas), each with its flag. CFilter is written
    // back: "PT," for GSEL_OnlyPT, "*" for GSEL_All, EU_CountryList() for GSEL_OnlyEU. When
    // fewer than two countries match, no dialog is shown and the answer is "".
    Q_INVOKABLE QString SelectCountry(
        const zelctl::GFXSelection &xListSettings, zelctl::GSEL_CountryFilterList GS, QString &CFilter);

    // The member states' codes, Portugal first: "PT,DE,AT,...".
    Q_INVOKABLE QString EU_CountryList() const;

    // Lists this library carries no data for: each answers "".
    Q_INVOKABLE QString QuickSelectFrom(const QString &optsTAB) const;
    Q_INVOKABLE QString SelectCAErev3() const;
    Q_INVOKABLE QString SelectCTA() const;
    Q_INVOKABLE QString SelectDistrito() const;
    Q_INVOKABLE QString SelectLocalidade(const QString &filterbyDistrito = QString()) const;
    Q_INVOKABLE QString SelectFreguesia(const QString &filterbyLocalidade = QString()) const;

    // Where SelectCountry reads the countries; "iso3166.txt" in the data folder unless set.
    QString countryFile() const;
    void setCountryFile(const QString &path);

Q_SIGNALS:
    // Before the dialog shows.
    void Opening();
    // The pressed item changed: the released one, the newly pressed one, then the change.
    void ItemUnchecked(zelctl::GFXItem &Item);
    void ItemChecked(zelctl::GFXItem &Item);
    void ItemChanged(zelctl::GFXItem &newItem);
    // Before the dialog closes, with the items pressed now; setting CancelClose keeps it open.
    void Closing(qint32 &selectionCount, QList<zelctl::GFXItem> &SelectedItems, bool &CancelClose);
    // After the dialog has closed.
    void Closed();

private:
    friend class frmSelector;
    // What the form reports: "OK", "CANCEL", "Click", "DoubleClick", "KeyDown", "Resize".
    void OnSelectorEvent(QObject *source, const QString &eventName, const QVariant &value);

    std::unique_ptr<class clsGFXSelectionPrivate> const d;
};

} // namespace zelctl

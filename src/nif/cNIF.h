#pragma once

#include "zelctl_export.h"

#include "frame/Enums.h"
#include "frame/UserControl.h"
#include "platform/OleColor.h"

#include <memory>

namespace zelctl {

// Entry of a tax identification number (NIF) with its country: the country's flag, the
// number box and a status mark. Every change of the number is checked with the country's
// rules and coloured by the result (green when valid, white on red when not). For a valid
// number the holder's name and data are looked up, first in the host's declaration (set
// through IRSClass) and then through the control's information fetcher; the answer shows
// in the box's balloon tip.
//
// Typing or pasting a member state's code in front of a number ("ES12345678Z") switches
// the country and keeps only the number. For Portugal the box holds at most 9 characters.
// Focus given to the control lands in the number box.
//
// Persisted as "Countries", "CustomCountryList", "Required", "BackColor", "Country" and
// "DisablePopupMenu"; a saved "CountryID" is read as well. A host may delete the control
// (or close its form) from any of its events.
class ZELCTL_EXPORT cNIF : public UserControl
{
    Q_OBJECT
    // Which countries the country list offers; setting it refreshes the control. Values
    // outside the enumeration are ignored.
    Q_PROPERTY(zelctl::GSEL_CountryFilterList Countries READ Countries WRITE setCountries)
    // The codes offered under GSEL_Custom, separated by commas ("ES,FR").
    Q_PROPERTY(QString CustomCountryList READ CustomCountryList WRITE setCustomCountryList)
    // Background of the control (OLE_COLOR); white on a new control.
    Q_PROPERTY(quint32 BackColor READ BackColor WRITE setBackColor)
    // Two-letter country code, kept in upper case; an empty code selects "PT". Codes
    // without a check routine (other than the 27 member states) accept every number.
    Q_PROPERTY(QString CountryID READ CountryID WRITE setCountryID)
    // Kept for the host; the control itself does not depend on it.
    Q_PROPERTY(bool Required READ Required WRITE setRequired)
    // Country code followed by the number ("PT123456789"). Setting a bare number (starting
    // with a digit) keeps the country and puts the whole text in the box.
    Q_PROPERTY(QString Value READ Value WRITE setValue)
    // Whether the number box takes input; a disabled box is grey. Like a control inside a
    // disabled parent, a disabled or locked box lets the user change nothing: the flag
    // opens no country list and the menu offers no Paste.
    Q_PROPERTY(bool Enabled READ Enabled WRITE setEnabled)
    // The holder's name: the one last known for this number, or else the record's "nome".
    // A new number drops the previous holder's name.
    Q_PROPERTY(QString Nome READ Nome WRITE setNome)
    // The host's declaration (a companion::Declaration), where the holder's record is kept
    // under the number. Borrowed: the control never deletes it and forgets it when it goes.
    // Another declaration starts the control's own records afresh.
    Q_PROPERTY(QObject *IRSClass READ IRSClass WRITE setIRSClass)
    // Whether the context menu is kept from showing.
    Q_PROPERTY(bool DisablePopupMenu READ DisablePopupMenu WRITE setDisablePopupMenu)
    // Read-only box; locking greys the text until the next refresh.
    Q_PROPERTY(bool Locked READ Locked WRITE setLocked)

public:
    explicit cNIF(QWidget *parent = nullptr);
    ~cNIF() override;

    // Name of the current country from the country file ("Portugal" for PT). With fulldesc,
    // followed by its ISO 3166 codes and, for member states, " - País da União Europeia".
    // Empty when the code is not in the file or the file cannot be read.
    Q_INVOKABLE QString CountryName(bool fulldesc = false) const;

    GSEL_CountryFilterList Countries() const;
    void setCountries(GSEL_CountryFilterList filter);

    QString CustomCountryList() const;
    void setCustomCountryList(const QString &codes);

    platform::OleColor BackColor() const;
    void setBackColor(platform::OleColor color);

    QString CountryID() const;
    void setCountryID(const QString &code);

    bool Required() const;
    void setRequired(bool required);

    // True when the box holds nothing but blanks.
    Q_INVOKABLE bool IsEmpty() const;
    // The country's check on the box's text, unchanged; raises Validated.
    Q_INVOKABLE bool IsValid();
    // Always true.
    Q_INVOKABLE bool IsAccepted() const;
    // Valid, accepted and not empty.
    Q_INVOKABLE bool IsOK();
    // Checks the number again, recolours the box and the status mark, asks for the
    // holder's data of a valid number and refreshes the tip.
    Q_INVOKABLE void RefreshMe();
    // Lets the user choose the country in the country dialog (only Portugal under
    // GSEL_OnlyPT, without a dialog).
    Q_INVOKABLE void ShowCountryList();

    QString Value() const;
    void setValue(const QString &value);

    bool Enabled() const;
    void setEnabled(bool enabled);

    // A value of the holder's record ("nome", "servico", "estadocivil" ...): the one kept in
    // the declaration, else the control's own record of this number (every value set
    // through setInformation and every fetched one), else the fetcher's answer for this
    // number; "" when none has it.
    Q_INVOKABLE QString Information(const QString &varID);
    // Stores a value of the record of this number, in the control's own record and the
    // declaration, raising UpdatedInformation (for a non-empty value) and, for "nome",
    // NameUpdated, when it changed something. The id "AUTO" stores without events. Only for
    // a valid number; another number's record is never touched.
    Q_INVOKABLE void setInformation(const QString &varID, const QString &value);
    // Looks the holder up: a name already recorded for this number (then DataFinished
    // follows at once), else a fetch, unless a fetch runs or the "allowautonif" setting of
    // application "ZEL", section "Config", is "0". A fetched value never empties one the
    // record holds.
    Q_INVOKABLE void GetNIFInformation();

    QString Nome();
    void setNome(const QString &name);

    // The holder's name when known, else Value.
    Q_INVOKABLE QString Description();

    QObject *IRSClass() const;
    void setIRSClass(QObject *declaration);

    bool DisablePopupMenu() const;
    void setDisablePopupMenu(bool disabled);

    bool Locked() const;
    void setLocked(bool locked);

    // Shows the context menu at the pointer, unless DisablePopupMenu is set.
    Q_INVOKABLE void PopupContextMenu();

Q_SIGNALS:
    // The number changed (not raised for the change that drops a typed country code).
    void Changed();
    // IsValid has just run.
    void Validated();
    // A refresh found a valid number.
    void NIFIndicated();
    // A value of the record changed.
    void UpdatedInformation(const QString &varID);
    // The holder's name changed.
    void NameUpdated(const QString &nv);
    // The box became empty, or a refresh found it blank while it still held a name.
    void Cleared();
    // The lookup of the holder's data has ended.
    void DataFinished();

protected:
    void InitProperties() override;
    void ReadProperties(const PropertyBag &bag) override;
    void WriteProperties(PropertyBag &bag) override;
    void Terminate() override;
    QSize sizeHint() const override;
    void resizeEvent(QResizeEvent *event) override;
    bool eventFilter(QObject *watched, QEvent *event) override;

private:
    class Private;
    std::unique_ptr<Private> const d;
};

} // namespace zelctl

#pragma once

#include "zelctl_export.h"

#include "frame/Picture.h"
#include "frame/UserControl.h"

#include <memory>

namespace zelctl {

// Chooses the subject of the declaration that the host's next input refers to: a row of
// toggle buttons, one per kind in the order of "ABDSFCH" (taxpayers A and B, dependant,
// ascendant, deceased, "Agregado", undivided estate). The pressed button is wide and shows
// the subject's name or title; the others show their icon only. Choosing a dependant, an
// ascendant or an estate of a declaration with several of them pops up a list of them.
//
// A subject identifier is the kind letter, followed for dependants, ascendants and estates
// by their 1-based index ("D2"). The control's height follows its buttons.
class ZELCTL_EXPORT cSujeitoSelector : public UserControl
{
    Q_OBJECT
    // The kinds offered, always kept in the order of "ABDSFCH": "*" offers all, "" gives
    // "ABD", other characters are ignored, and C is offered only with B. Persisted as
    // "Possible" (default "ABD").
    Q_PROPERTY(QString Possible READ Possible WRITE setPossible)
    // The letter of the chosen kind, or "" when none is chosen. Writing presses the button
    // of the first letter ("" presses A; a letter outside "ABDSFCH" releases every button)
    // and forgets the chosen index.
    Q_PROPERTY(QString SujeitoValueType READ SujeitoValueType WRITE setSujeitoValueType)
    // The chosen subject's identifier ("A", "D2"), or "" when none is chosen. Writing "" with
    // CanSelectNone releases every button; otherwise "" chooses A.
    Q_PROPERTY(QString SelectedSujeito READ SelectedSujeito WRITE setSelectedSujeito)
    // The index within a dependant, ascendant or estate; 0 for none. Writing is ignored for
    // the other kinds.
    Q_PROPERTY(qint16 SelectedSujeitoIndex READ SelectedSujeitoIndex WRITE setSelectedSujeitoIndex)
    // The chosen subject's tax number, as the declaration gives it; writing is ignored.
    Q_PROPERTY(QString SelectedNIF READ SelectedNIF WRITE setSelectedNIF)
    // The host's declaration (a companion::Declaration), borrowed: the control asks it for the
    // subjects' names, numbers and counts. Any other object counts as none.
    Q_PROPERTY(QObject *IRSClass READ IRSClass WRITE setIRSClass)
    // Whether a second click on the pressed button empties the choice. Persisted as
    // "CanSelectNone" (default false).
    Q_PROPERTY(bool CanSelectNone READ CanSelectNone WRITE setCanSelectNone)

public:
    explicit cSujeitoSelector(QWidget *parent = nullptr);
    ~cSujeitoSelector() override;

    QString Possible() const;
    void setPossible(const QString &value);
    // As above, and an empty value is replaced by "ABD" in the caller's own variable too.
    Q_INVOKABLE void setPossible(QString &value);

    QString SujeitoValueType() const;
    void setSujeitoValueType(const QString &value);

    QString SelectedSujeito() const;
    void setSelectedSujeito(const QString &value);

    qint16 SelectedSujeitoIndex() const;
    void setSelectedSujeitoIndex(qint16 index);

    // The tax number of the subject specificsujeito, or of the chosen subject when it is
    // empty; "" without a declaration.
    Q_INVOKABLE QString SelectedNIF(const QString &specificsujeito = QString()) const;
    void setSelectedNIF(const QString &value);

    QObject *IRSClass() const;
    void setIRSClass(QObject *declaration);

    bool CanSelectNone() const;
    void setCanSelectNone(bool canSelectNone);

    // Lays the buttons out again: titles, widths, visibility and positions.
    Q_INVOKABLE void RefreshButtonCaption();

    // The picture of the button of the kind whose letter starts SujeitoID (in either case);
    // a null picture, or no change, for any other value.
    Q_INVOKABLE zelctl::Picture ImageFile(const QVariant &SujeitoID) const;
    Q_INVOKABLE void setImageFile(const QVariant &SujeitoID, const zelctl::Picture &picture);

    QSize sizeHint() const override;

Q_SIGNALS:
    // The user clicked a kind button (not the second click that empties the choice).
    void Clicked();
    // The choice changed: after each click, after a list item was chosen, and after a second
    // click emptied the choice.
    void Changed();
    // Part of the control's event interface for hosts that bind to it; never raised.
    void Initialize();

protected:
    void ReadProperties(const PropertyBag &bag) override;
    void WriteProperties(PropertyBag &bag) override;
    void Terminate() override;
    void resizeEvent(QResizeEvent *event) override;

private:
    class Private;
    std::unique_ptr<Private> const d;
};

} // namespace zelctl

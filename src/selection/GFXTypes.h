#pragma once

#include <QList>
#include <QMetaType>
#include <QObject>
#include <QPointer>
#include <QString>
#include <QVariant>

// The records and enumerations of the selection dialogs, as clsGFXSelection takes and gives
// them. All are plain values: copying one copies everything but the borrowed parent object.
namespace zelctl {

// Where a selection dialog goes relative to its parent object.
enum GFXPositioning : qint32 {
    // Centred on the parent's top-left corner, as GFXPositionCenterObject.
    GFXPositionDefault = 0,
    GFXPositionCenterObject = 1,
    GFXPositionObjectBelow = 2,
    GFXPositionObjectAbove = 3,
    GFXPositionObjectLeft = 4,
    GFXPositionObjectRight = 5,
};

// How the items are presented; every dialog shows them as buttons.
enum GFXViewTypes : qint32 {
    GFXViewDefaultRecomended = 0,
    GFXViewButtons = 1,
};

// One selectable item, shown as a button.
struct GFXItem
{
    QString Title; // the button's caption
    QString Tooltip;
    QVariant Image; // path of a PNG file shown on the button; none when it converts to ""
    bool Disabled = false;
    bool Selected = false; // pressed when the dialog opens
    bool Default = false; // Enter presses it
    bool Bold = false; // carried for the host
    QString TAGs; // carried for the host
    QString Settings; // carried for the host
    QVariant Value; // the item's value: the country code in the country dialog

    bool operator==(const GFXItem &other) const = default;
};

// The dialog's settings.
struct GFXSelection
{
    QString ID; // carried for the host
    QString Title; // the title line; hidden when ""
    QString Subtitle; // the line under the title; hidden when ""
    QString Tooltip; // carried for the host
    QString HelpURL; // carried for the host
    QVariant Image; // carried for the host
    bool DisableCancel = false; // hides "&Cancelar"
    bool MultipleSelect = false; // carried for the host
    bool NoSingleClick = false; // carried for the host
    bool Pageable = false; // carried for the host
    QString Settings; // carried for the host
    bool DiscardUserProperties = false; // carried for the host
    // Optional, borrowed: an object with an "hWnd" (and a "BackColor") that the dialog is
    // placed against, as WindowPositionRelation says.
    QPointer<QObject> ParentObj;
    GFXPositioning WindowPositionRelation = GFXPositionDefault;
};

// The answer of a selection dialog.
struct GFXResult
{
    bool Canceled = false;
    bool Accepted = false;
    qint32 NumberOfSelectedItems = 0;
    QList<GFXItem> SelectedItems;
    GFXItem SelectedItem;
    QString Settings;
    GFXViewTypes ViewType = GFXViewDefaultRecomended;

    bool operator==(const GFXResult &other) const = default;
};

} // namespace zelctl

Q_DECLARE_METATYPE(zelctl::GFXItem)
Q_DECLARE_METATYPE(zelctl::GFXSelection)
Q_DECLARE_METATYPE(zelctl::GFXResult)

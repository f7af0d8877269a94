#pragma once

#include <QKeySequence>
#include <QObject>

class QAction;
class QKeyEvent;
class QLineEdit;
class QMenu;

namespace zelctl {

class cNIF;

// The context menu of a NIF control ("popup") and the editing commands behind its entries.
// The clipboard commands work on the whole number: Copy takes the whole text whatever is
// selected, and Paste reads a country code in front of the number. A box the user may not
// change (locked or disabled) offers only the commands that leave its text alone.
class NifPopupMenu : public QObject
{
    Q_OBJECT

public:
    NifPopupMenu(cNIF &control, QLineEdit &box);

    QMenu &menu() const { return *m_popup; }
    QAction *entry(const char *name) const;

    // Shows the menu at the pointer, with "&Colar" as its default entry.
    void popup();
    // Runs the entry whose shortcut the key is, or whose standard key it is on this desktop
    // (Shift+Insert pastes as Ctrl+V does); true when the key was one of them.
    bool handleShortcut(const QKeyEvent &event);

    void Undo();
    void Cut();
    void Copy();
    void Paste();
    // Paste of a given text, as every paste gesture (middle click, drop) does it.
    void PasteText(QString text);
    void Delete();
    void SelectAll();

private:
    QAction *add(const char *name, const QString &caption,
        QKeySequence::StandardKey standard = QKeySequence::UnknownKey, const QKeySequence &shortcut = {});
    bool editable() const;
    void separator(const char *name);
    void updateEntries();
    void replaceText(const QString &text);

    cNIF &m_control;
    QLineEdit &m_box;
    QMenu *m_popup;
};

} // namespace zelctl

#pragma once

#include "zelctl_export.h"

#include <QObject>

#include <memory>

class QWidget;

namespace zelctl {

class CommandButton;

// A control array of command buttons on one form: the elements share one name (their
// objectName), each has its own Index, and their events arrive here with that index. The
// elements made with the form ("designed") stay for the form's life; more are loaded and
// unloaded at run time.
class ZELCTL_EXPORT CommandButtonArray : public QObject
{
    Q_OBJECT

public:
    // Creates the designed elements 0 to designed - 1 on `form`, all shown.
    CommandButtonArray(const QString &name, QWidget *form, int designed = 1);
    ~CommandButtonArray() override;

    QString name() const;

    // The element of that index, or nullptr when none is loaded.
    CommandButton *operator()(int index) const;

    // Loads a new element: a copy of element 0 (caption, tooltip, picture, tag, toggle,
    // enabled state, font, position and size), hidden until shown. nullptr when the index
    // is negative or already loaded.
    CommandButton *Load(int index);
    // Unloads a run-time element; false for a designed element or an index not loaded.
    bool Unload(int index);

    // Lowest and highest loaded index (0 and -1 when nothing is loaded) and the count.
    int LBound() const;
    int UBound() const;
    int Count() const;

Q_SIGNALS:
    void Click(int Index);
    void DblClick(int Index);
    // Setting KeyCode to 0 keeps the key from the button.
    void KeyDown(int Index, int &KeyCode, int Shift);

private:
    CommandButton *create(int index);

    std::unique_ptr<class CommandButtonArrayPrivate> const d;
};

} // namespace zelctl

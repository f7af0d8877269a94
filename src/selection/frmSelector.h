#pragma once

#include "zelctl_export.h"

#include "common/modFuncs.h"

#include <QDialog>
#include <QString>
#include <QVariant>

#include <memory>

namespace zelctl {

class clsGFXSelection;
class CommandButtonArray;

// The modal selection dialog that clsGFXSelection fills and shows: a title and a subtitle,
// a grid of item buttons (btnSelector), and "&OK" and "&Cancelar" (btn_Handle) at the bottom
// right. What the user does is reported to the owner, which decides whether the dialog
// closes: it sets Tag and the close request, and the form then hides itself.
//
// Every item stays within reach: items that do not fit the grid scroll, and a long list
// gets a filter box (txtFilter) above the grid that keeps the items whose title holds the
// typed text, whatever its case and accents; typing on an item types there. OK is the
// default button, Enter on an item is reported as a key down (the owner chooses the item
// and accepts, as for a double click), and Escape cancels.
class ZELCTL_EXPORT frmSelector : public QDialog
{
    Q_OBJECT
    Q_PROPERTY(QString Tag READ Tag WRITE setTag)

public:
    explicit frmSelector(QWidget *parent = nullptr);
    ~frmSelector() override;

    // Receives the form's events; borrowed.
    void setOwner(clsGFXSelection *owner);

    // "DISABLE_EVENTS" while the opening animation runs (no layout, no events), "OK" or
    // "CANCEL" once the user closed the dialog, "" otherwise.
    QString Tag() const;
    void setTag(const QString &tag);

    // Set by the owner when the dialog is to close; the form hides itself once the event
    // that led to it has been handled.
    bool closeRequested() const;
    void setCloseRequest(bool close);

    // The item buttons and the OK (0) and Cancel (1) buttons.
    CommandButtonArray &btnSelector() const;
    CommandButtonArray &btn_Handle() const;

    // Lists with more items than this get the filter box.
    static constexpr int FilterThreshold = 20;

    // Lays the labels, the filter box, the item buttons and OK and Cancel out for the form's
    // inner size; does nothing while Tag is "DISABLE_EVENTS".
    Q_INVOKABLE void ReArrange();

    // Grows the form's inner area from one screen rectangle (pixels) to another in eight
    // steps, kept above other windows, and leaves it exactly on `to` with a white background.
    void ZoomForm(const modFuncs::RECT &from, const modFuncs::RECT &to);

    // The pause between the animation's steps in milliseconds (15 unless set); 0 runs the
    // animation without waiting.
    static int zoomStepInterval();
    static void setZoomStepInterval(int milliseconds);

    // Escape and the window's close box cancel, as "&Cancelar" does.
    void reject() override;

protected:
    bool eventFilter(QObject *watched, QEvent *event) override;
    void keyPressEvent(QKeyEvent *event) override;
    void resizeEvent(QResizeEvent *event) override;

private:
    void send(QObject *source, const QString &name, const QVariant &value = {});
    void applyFilter(const QString &text);

    std::unique_ptr<class frmSelectorPrivate> const d;
};

} // namespace zelctl

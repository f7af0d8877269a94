#pragma once

#include "Snapshots.h"

#include <QDialog>
#include <QWidget>

#include <functional>

// What the scene files share: a form to put a control on, and a way to catch a modal form.
namespace zelctl::snapshots {

// A form of the fixed look that holds the controls of one picture, shown (offscreen) when the
// controls are first acted on. The pointer is moved off it and any capture given back when
// it goes.
class Stage
{
public:
    explicit Stage(QSize size = QSize(320, 120));
    ~Stage();
    Stage(const Stage &) = delete;
    Stage &operator=(const Stage &) = delete;

    QWidget *form() { return &m_form; }

    // Shows the form with the controls put on it so far (acting on them shows it too).
    void show();

    // Lets pending events (layout, timers at 0, repaints) run.
    static void settle();

    // The pointer moved onto (a point of) a control, as a user's would be.
    void hover(QWidget *control, QPoint at);
    void hover(QWidget *control);
    // A left button held down on the control, not released.
    void press(QWidget *control);

    // The area of the form round the control, `margin` pixels wider each way.
    QImage shoot(const QWidget *control, int margin = 6);
    QImage shoot(const QRect &area);

private:
    QWidget m_form;
    bool m_pressed = false;
};

// Runs `open`, which shows one modal form of the library, lets `drive` act on the form as a
// user would, and returns the form's picture; the form is then cancelled.
QImage shootModal(const std::function<void()> &open, const std::function<void(QDialog &)> &drive = {});

// Adds the scenes of each area.
void addEntryScenes(QList<Scene> &scenes);
void addSelectionScenes(QList<Scene> &scenes);
void addPictureScenes(QList<Scene> &scenes);
void addSkinScenes(QList<Scene> &scenes);
void addTipScenes(QList<Scene> &scenes);

} // namespace zelctl::snapshots

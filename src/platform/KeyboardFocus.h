#pragma once

#include "zelctl_export.h"

class QKeyEvent;
class QPainter;
class QRect;
class QWidget;

// What a control that draws itself needs to be worked from the keyboard.
namespace zelctl::platform {

// Whether a control shows the mark of the keyboard focus: while it has the focus, once the
// user has moved the focus in its window with the keyboard (as Qt's own styles do, so a form
// opened with the mouse shows no mark until a key moves the focus).
ZELCTL_EXPORT bool showsFocusMark(const QWidget &control);

// The mark of the keyboard focus: a dotted line, black over white so it shows on any colour of
// a skin, round the inside of `area` (an ellipse when `round`). The control paints it last.
ZELCTL_EXPORT void paintFocusMark(QPainter &painter, const QRect &area, bool round = false);

// Space, Enter or Return, not repeated: the keys that press a button.
ZELCTL_EXPORT bool pressesButton(const QKeyEvent &event);

} // namespace zelctl::platform

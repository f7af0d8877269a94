#pragma once

#include "zelctl_export.h"

#include <Qt>

// Key events as the controls' KeyDown events report them: the virtual key code of the key
// (65 for A, 13 for Enter, 112 for F1 ...) and the shift state (1 Shift, 2 Ctrl, 4 Alt).
namespace zelctl::keyCodes {

inline constexpr int ShiftMask = 1;
inline constexpr int CtrlMask = 2;
inline constexpr int AltMask = 4;

// The virtual key code of a Qt key, or 0 for a key that has none.
ZELCTL_EXPORT int fromQtKey(int qtKey);

ZELCTL_EXPORT int shiftState(Qt::KeyboardModifiers modifiers);

} // namespace zelctl::keyCodes

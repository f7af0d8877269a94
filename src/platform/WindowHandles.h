#pragma once

#include "zelctl_export.h"

#include <QtGlobal>

class QWidget;

namespace zelctl::platform {

// Integer window handle, as the public interfaces pass windows (`hWnd`).
using HWND = qint32;

// Returns the handle of a widget, giving it one on first use. Handles are never reused
// within a process, so a stale handle can never name another window. 0 for nullptr.
ZELCTL_EXPORT HWND handleOf(QWidget *widget);

// The widget a handle names, or nullptr when the handle is 0, unknown or its widget is gone.
ZELCTL_EXPORT QWidget *widgetOf(HWND handle);

} // namespace zelctl::platform

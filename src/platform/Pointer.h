#pragma once

#include "zelctl_export.h"

#include <QPoint>

class QWidget;

// Pointer position and capture, as the skinned controls track hovering.
namespace zelctl::platform {

// The pointer's position in screen pixels.
ZELCTL_EXPORT QPoint cursorPos();

// A screen position in the widget's client coordinates.
ZELCTL_EXPORT QPoint screenToClient(const QWidget *widget, QPoint screen);

// Sends all pointer input to the widget until releaseCapture(); one widget holds it at a time.
ZELCTL_EXPORT void setCapture(QWidget *widget);
ZELCTL_EXPORT void releaseCapture();

// The widget holding the capture, or nullptr.
ZELCTL_EXPORT QWidget *capturedWidget();

} // namespace zelctl::platform

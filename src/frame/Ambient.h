#pragma once

#include "platform/OleColor.h"

#include <QFont>
#include <QString>

namespace zelctl {

// What the container tells its controls about itself.
struct Ambient
{
    // True while the host runs; false in a form designer (design time).
    bool UserMode = true;
    // True when the container shows the control without letting the user work with it.
    bool UIDead = false;
    // The name the container knows the control by.
    QString DisplayName;
    platform::OleColor BackColor = platform::systemColor(platform::COLOR_BTNFACE);
    QFont Font;

    bool operator==(const Ambient &other) const = default;
};

} // namespace zelctl

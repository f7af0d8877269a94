#pragma once

#include "zelctl_export.h"

#include <QString>
#include <QStringView>

namespace zelctl {

// The two check digits of a Portuguese bank account number (NIB), from its first 19
// characters: the weighted sum of their digit values (0 for a character that is not a
// digit) modulo 97, subtracted from 98, as "02" to "98". "" when fewer than 19 characters.
ZELCTL_EXPORT QString CalculateNibCheckDigits(QStringView nib);

} // namespace zelctl

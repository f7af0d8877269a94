#pragma once

#include "zelctl_export.h"

#include <QObject>

namespace zelctl {

Q_NAMESPACE_EXPORT(ZELCTL_EXPORT)

// Which countries a NIF control and the country dialog offer.
enum GSEL_CountryFilterList : int {
    GSEL_OnlyPT = 0,
    GSEL_OnlyEU = 1,
    GSEL_All = 2,
    GSEL_Custom = 3,
};
Q_ENUM_NS(GSEL_CountryFilterList)

} // namespace zelctl

#pragma once

#include "zelctl_export.h"

#include <QFont>
#include <QString>

// Captions written for a symbol font that this system does not have. Forms made for the
// original platform set some captions in "Wingdings", whose code points draw symbols (its
// "ç" and "è" are arrows); without the font they would show as plain letters. Such text is
// drawn as the Unicode symbols its code points stand for instead.
namespace zelctl::platform::symbolFonts {

// Whether text set in `font` must be mapped: its family is a symbol font with a table here
// (case does not matter) and no installed font has that family.
ZELCTL_EXPORT bool mapsText(const QFont &font);

// The text to draw for `text` set in `font`: mapped when mapsText(font), else unchanged.
ZELCTL_EXPORT QString shownText(const QFont &font, const QString &text);

// Text in the Wingdings code page as Unicode. A symbol that Unicode holds only in its newer
// pictograph and arrow blocks, which the usual desktop fonts lack, becomes the nearest older
// symbol (the heavy arrows become U+2B05 "⬅" and U+27A1 "➡"). Characters outside the code
// page stay as they are.
ZELCTL_EXPORT QString fromWingdings(const QString &text);

} // namespace zelctl::platform::symbolFonts

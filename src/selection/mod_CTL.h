#pragma once

#include "zelctl_export.h"

#include "frame/Picture.h"

#include <QString>
#include <QtGlobal>

namespace zelctl {
class PictureBox;
}

// Country flag pictures for the NIF control and the country dialog, cut from the "COUNTRIES"
// strip carried as a resource. The state is per user-interface thread.
namespace zelctl::mod_CTL {

// The loaded strip; null until the first flag is asked for, and again after the last NIF
// control has gone.
ZELCTL_EXPORT extern thread_local zelctl::Picture FlagStripCache;

// The surface the next flag is composed on. The caller sets it to a picture box of its own
// just before GetCountryFlag and clears it just after (flagOn does both).
ZELCTL_EXPORT extern thread_local PictureBox *FlagScratchSurface;

// Live NIF controls; the strip is kept while there is one.
ZELCTL_EXPORT extern thread_local qint32 NifControlCount;

// Number of cells in the strip and their size in pixels.
inline constexpr int FlagCellCount = 239;
inline constexpr int FlagSize = 16;

// The strip cell of a two-letter ISO 3166 code ("PT", upper case; Greece is "GR", and its
// tax code "EL" finds the same cell), or -1 for any other text.
ZELCTL_EXPORT int flagCellIndex(const QString &code);

// The 16 x 16 flag of the code, composed on FlagScratchSurface and taken from its backing
// image; null when the code has no cell, the strip cannot be loaded or no surface is set.
// The strip is loaded on first use even without a surface.
ZELCTL_EXPORT zelctl::Picture GetCountryFlag(const QString &code);

// GetCountryFlag with `surface` as FlagScratchSurface for the call.
ZELCTL_EXPORT zelctl::Picture flagOn(PictureBox &surface, const QString &code);

// Kept by the NIF control: one more live control, and one fewer, which releases the strip
// when none is left.
ZELCTL_EXPORT void nifControlCreated();
ZELCTL_EXPORT void nifControlTerminated();

} // namespace zelctl::mod_CTL

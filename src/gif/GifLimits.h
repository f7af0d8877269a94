#pragma once

#include <QtGlobal>

// What a GIF may cost the control. A file, however hostile, is refused beyond the first
// limit, and its frames are kept only while the frame strip and the canvas stay within the
// other two, as if the file ended at the first frame that does not fit.
namespace zelctl::gifLimits {

// Bytes of a GIF file or download.
inline constexpr qint64 MaxFileBytes = qint64(256) << 20;
// Pixels of the frame strip (one byte each): all frames side by side.
inline constexpr qint64 MaxStripPixels = qint64(256) << 20;
// Pixels of the composed picture (canvas of 3 bytes and mask of 1 bit each).
inline constexpr qint64 MaxCanvasPixels = qint64(32) << 20;

// Width and height of one bitmap, as the raster layer allows them.
inline constexpr int MaxBitmapSide = 1 << 16;

} // namespace zelctl::gifLimits

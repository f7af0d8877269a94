#pragma once

#include "platform/gdi/Surface.h"

// The pixel routines behind BitBlt, StretchBlt, AlphaBlend and the fills. They work on
// surfaces only, so they need neither handles nor a QGuiApplication.
namespace zelctl::gdi::detail {

enum class Rop { Copy, And, Or };
enum class Sampling { Nearest, Area };

// A rectangle as the caller gave it: a negative extent counts back from its origin pixel.
struct Extent
{
    int x = 0;
    int y = 0;
    int width = 0;
    int height = 0;
};

// Copies or combines src into dst, scaling and mirroring (see StretchBlt). False for a
// zero source extent with a non-zero target one.
bool stretchBlit(const Surface &dst, Extent to, const Surface &src, Extent from, Rop rop, Sampling sampling);

// Source-over with constant alpha and, when perPixel is set and src has 32 bits, the
// premultiplied alpha of each pixel. False for negative extents and a source rectangle
// outside src.
bool alphaBlend(const Surface &dst, Extent to, const Surface &src, Extent from, quint8 constantAlpha, bool perPixel);

// Sets every pixel of [left, right) × [top, bottom), clipped to dst, to a pixel value. Any
// coordinates will do: an inverted rectangle or one wholly outside dst fills nothing.
void fillRect(const Surface &dst, int left, int top, int right, int bottom, quint32 value);

} // namespace zelctl::gdi::detail

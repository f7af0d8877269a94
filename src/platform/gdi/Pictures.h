#pragma once

#include "zelctl_export.h"

#include "platform/gdi/Gdi.h"

#include <QImage>
#include <QRegion>

// Between the raster layer and Qt images: pictures loaded by Qt's readers become bitmaps,
// bitmaps become pictures, and a surface's colour key becomes a window shape.
namespace zelctl::gdi {

// A top-down bitmap holding the image: 32 bits with premultiplied alpha when the image has
// an alpha channel, else 24 bits. 0 for a null or too large image.
ZELCTL_EXPORT HBITMAP createBitmapFromImage(const QImage &image);

// A copy of a bitmap's pixels: ARGB32_Premultiplied for 32 bits, RGB32 for the others
// (through the colour table). Null for anything that is not a bitmap.
ZELCTL_EXPORT QImage imageFromBitmap(HBITMAP bitmap);

// Draws a picture into [x, x + width) × [y, y + height), scaling it; pixels that are
// transparent in the picture leave the target unchanged. SRCCOPY lays the picture over the
// target (partly transparent pixels blend; scaling takes the nearest pixel), SRCAND and
// SRCPAINT combine its opaque pixels with the target (scaling with the DC's stretch mode).
ZELCTL_EXPORT bool drawPicture(
    HDC hdc, const QImage &picture, int x, int y, int width, int height, quint32 rop = SRCCOPY);

// The pixels of the bitmap selected in hdc that differ from `transparent`, as a region
// (for QWidget::setMask and for hit testing). Empty when hdc is not a DC.
ZELCTL_EXPORT QRegion opaqueRegion(HDC hdc, COLORREF transparent);

} // namespace zelctl::gdi

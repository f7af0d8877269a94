#pragma once

#include "platform/gdi/Pictures.h"
#include "png/StdPNG.h"

#include <QImage>

#include <array>
#include <cstdint>

namespace zelctl::test {

// The image's bitmap as the GDI layer reads it: through the colour table below 24 bits.
inline QImage bitmapOf(const StdPNG &image)
{
    return gdi::imageFromBitmap(gdi::HBITMAP(image.handle()));
}

// Pixel (x, y) as 0xAARRGGBB: premultiplied in a 32-bit bitmap, opaque in others.
inline quint32 argbAt(const QImage &bitmap, int x, int y)
{
    const quint32 word = reinterpret_cast<const quint32 *>(bitmap.constScanLine(y))[x];
    return bitmap.hasAlphaChannel() ? word : word | 0xFF000000u;
}

inline std::array<uint8_t, 4> bitmapPixel(const StdPNG &image, int x, int y)
{
    const quint32 argb = argbAt(bitmapOf(image), x, y);
    return { uint8_t(argb), uint8_t(argb >> 8), uint8_t(argb >> 16), uint8_t(argb >> 24) };
}

} // namespace zelctl::test

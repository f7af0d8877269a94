#pragma once

#include "zelctl_export.h"

#include "platform/gdi/Gdi.h"

#include <QRect>

namespace zelctl {

// A top-down device-independent bitmap selected into its own memory DC, both released
// with the object.
class ZELCTL_EXPORT MemoryBitmap
{
public:
    MemoryBitmap() = default;
    ~MemoryBitmap() { reset(); }
    MemoryBitmap(const MemoryBitmap &) = delete;
    MemoryBitmap &operator=(const MemoryBitmap &) = delete;

    // A bitmap of 1, 8 or 24 bits, all pixels 0; table entries (0x00RRGGBB) for 1 and 8
    // bits. False (and empty) when the raster layer refuses the size.
    bool create(int width, int height, int bitCount, std::initializer_list<quint32> table = {});
    void reset();

    bool isNull() const { return m_dc == 0; }
    gdi::HDC dc() const { return m_dc; }
    uchar *bits() const { return m_bits; }
    qsizetype stride() const { return m_stride; }
    int width() const { return m_width; }
    int height() const { return m_height; }
    uchar *row(int y) const { return m_bits + y * m_stride; }

private:
    gdi::HDC m_dc = 0;
    gdi::HBITMAP m_bitmap = 0;
    gdi::HGDIOBJ m_previous = 0;
    uchar *m_bits = nullptr;
    qsizetype m_stride = 0;
    int m_width = 0;
    int m_height = 0;
};

} // namespace zelctl

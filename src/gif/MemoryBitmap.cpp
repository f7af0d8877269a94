#include "MemoryBitmap.h"

namespace zelctl {

bool MemoryBitmap::create(int width, int height, int bitCount, std::initializer_list<quint32> table)
{
    reset();
    gdi::BITMAPINFO info;
    info.bmiHeader.biWidth = width;
    info.bmiHeader.biHeight = -height;
    info.bmiHeader.biBitCount = quint16(bitCount);
    int k = 0;
    for (quint32 colour : table)
        info.bmiColors[size_t(k++)] = gdi::rgbQuad(colour);
    void *bits = nullptr;
    m_bitmap = gdi::CreateDIBSection(0, &info, gdi::DIB_RGB_COLORS, &bits);
    if (!m_bitmap)
        return false;
    m_dc = gdi::CreateCompatibleDC(0);
    if (!m_dc) {
        reset();
        return false;
    }
    m_previous = gdi::SelectObject(m_dc, m_bitmap);
    m_bits = static_cast<uchar *>(bits);
    m_stride = ((qsizetype(width) * bitCount + 31) & ~qsizetype(31)) / 8;
    m_width = width;
    m_height = height;
    return true;
}

void MemoryBitmap::reset()
{
    if (m_dc) {
        gdi::SelectObject(m_dc, m_previous);
        gdi::DeleteDC(m_dc);
    }
    if (m_bitmap)
        gdi::DeleteObject(m_bitmap);
    m_dc = 0;
    m_bitmap = 0;
    m_previous = 0;
    m_bits = nullptr;
    m_stride = m_width = m_height = 0;
}

} // namespace zelctl

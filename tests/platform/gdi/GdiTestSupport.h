#pragma once

#include "platform/gdi/Gdi.h"

#include <initializer_list>
#include <vector>

namespace zelctl::gdi::test {

// A memory DC with its own DIB section selected, released at the end of the scope.
class TestBitmap
{
public:
    // topDown: first row in memory is the top one. table: 0x00RRGGBB entries.
    TestBitmap(int width, int height, int bpp, bool topDown = true, std::initializer_list<quint32> table = {})
    {
        BITMAPINFO info;
        info.bmiHeader.biWidth = width;
        info.bmiHeader.biHeight = topDown ? -height : height;
        info.bmiHeader.biBitCount = quint16(bpp);
        info.bmiHeader.biClrUsed = quint32(table.size());
        size_t i = 0;
        for (quint32 entry : table)
            info.bmiColors[i++] = rgbQuad(entry);
        bitmap = CreateDIBSection(0, &info, DIB_RGB_COLORS, &bits);
        dc = CreateCompatibleDC(0);
        previous = SelectObject(dc, bitmap);
        BITMAP description;
        GetObject(bitmap, description);
        stride = description.bmWidthBytes;
        this->height = height;
        this->topDown = topDown;
        this->bpp = bpp;
    }
    ~TestBitmap()
    {
        SelectObject(dc, previous);
        DeleteObject(bitmap);
        DeleteDC(dc);
    }
    TestBitmap(const TestBitmap &) = delete;
    TestBitmap &operator=(const TestBitmap &) = delete;

    // Row y counted from the top.
    uchar *row(int y) const { return static_cast<uchar *>(bits) + (topDown ? y : height - 1 - y) * stride; }
    // 32-bit pixel (0xAARRGGBB) and 24-bit pixel (0x00RRGGBB) access.
    quint32 argb(int x, int y) const { return reinterpret_cast<const quint32 *>(row(y))[x]; }
    void setArgb(int x, int y, quint32 value) { reinterpret_cast<quint32 *>(row(y))[x] = value; }
    quint32 rgb(int x, int y) const
    {
        const uchar *p = row(y) + 3 * x;
        return quint32(p[0]) | quint32(p[1]) << 8 | quint32(p[2]) << 16;
    }
    void setRgb(int x, int y, quint32 value)
    {
        uchar *p = row(y) + 3 * x;
        p[0] = uchar(value);
        p[1] = uchar(value >> 8);
        p[2] = uchar(value >> 16);
    }
    // Fills all pixels of a 24- or 32-bit bitmap with one value.
    void fill(quint32 value, int width, int bpp)
    {
        for (int y = 0; y < height; ++y)
            for (int x = 0; x < width; ++x)
                bpp == 32 ? setArgb(x, y, value) : setRgb(x, y, value);
    }

    HDC dc = 0;
    HBITMAP bitmap = 0;
    HGDIOBJ previous = 0;
    void *bits = nullptr;
    int stride = 0;
    int height = 0;
    bool topDown = true;
    int bpp = 0;
};

using Values = std::vector<quint32>;

// The first `width` pixels of a row of a 24- or 32-bit bitmap, left to right.
inline Values rowOf(const TestBitmap &b, int y, int width)
{
    Values values;
    for (int x = 0; x < width; ++x)
        values.push_back(b.bpp == 32 ? b.argb(x, y) : b.rgb(x, y));
    return values;
}

inline void setRow(TestBitmap &b, int y, std::initializer_list<quint32> values)
{
    int x = 0;
    for (quint32 v : values)
        b.bpp == 32 ? b.setArgb(x++, y, v) : b.setRgb(x++, y, v);
}

} // namespace zelctl::gdi::test

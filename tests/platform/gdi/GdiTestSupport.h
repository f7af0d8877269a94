#pragma once

#include "platform/gdi/Gdi.h"

#include <QByteArray>

#include <cstring>
#include <vector>

namespace zelctl::gdi::test {

// A memory DC with a DIB section of its own selected, released at the end of the scope.
// Pixels are read and written here bit by bit, apart from the library's code.
class TestBitmap
{
public:
    // entries: the first colours (0x00RRGGBB) of the table of 1 to 8 bits; the rest are black.
    TestBitmap(int width, int height, int bpp, bool topDown = true, std::vector<quint32> entries = {})
        : table(entries)
        , width(width)
        , height(height)
        , bpp(bpp)
        , stride((width * bpp + 31) / 32 * 4)
        , topDown(topDown)
    {
        BITMAPINFO info;
        info.bmiHeader.biWidth = width;
        info.bmiHeader.biHeight = topDown ? -height : height;
        info.bmiHeader.biBitCount = quint16(bpp);
        info.bmiHeader.biClrUsed = quint32(entries.size());
        for (size_t i = 0; i < entries.size(); ++i)
            info.bmiColors[i] = rgbQuad(entries[i]);
        table.resize(bpp <= 8 ? size_t(1) << bpp : 0, 0);
        bitmap = CreateDIBSection(0, &info, DIB_RGB_COLORS, &bits);
        dc = CreateCompatibleDC(0);
        previous = SelectObject(dc, bitmap);
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
    uchar *row(int y) const { return static_cast<uchar *>(bits) + qsizetype(topDown ? y : height - 1 - y) * stride; }
    // A pixel as stored: a table index, 0x00RRGGBB or 0xAARRGGBB.
    quint32 value(int x, int y) const
    {
        if (bpp < 8)
            return row(y)[x * bpp / 8] >> (8 - bpp - x * bpp % 8) & ((1u << bpp) - 1);
        quint32 v = 0;
        std::memcpy(&v, row(y) + x * (bpp / 8), size_t(bpp / 8));
        return v;
    }
    void setValue(int x, int y, quint32 v)
    {
        if (bpp >= 8) {
            std::memcpy(row(y) + x * (bpp / 8), &v, size_t(bpp / 8));
            return;
        }
        const int shift = 8 - bpp - x * bpp % 8;
        uchar &byte = row(y)[x * bpp / 8];
        byte = uchar((byte & ~(((1u << bpp) - 1) << shift)) | (v & ((1u << bpp) - 1)) << shift);
    }
    void fill(quint32 v)
    {
        for (int y = 0; y < height; ++y)
            for (int x = 0; x < width; ++x)
                setValue(x, y, v);
    }
    QByteArray bytes() const { return QByteArray(static_cast<const char *>(bits), stride * height); }

    // The colour (0xAARRGGBB) a value shows, and the value (of a table: nearest) for a colour.
    quint32 colorOf(quint32 v) const { return bpp == 32 ? v : 0xFF000000u | (bpp == 24 ? v : table[v]); }
    quint32 valueOf(quint32 argb) const
    {
        if (bpp > 8)
            return bpp == 32 ? argb : argb & 0xFFFFFFu;
        const auto distance = [argb](quint32 entry) {
            int sum = 0;
            for (int shift : { 0, 8, 16 })
                sum += (int(entry >> shift & 0xFF) - int(argb >> shift & 0xFF))
                    * (int(entry >> shift & 0xFF) - int(argb >> shift & 0xFF));
            return sum;
        };
        quint32 best = 0;
        for (quint32 i = 1; i < table.size(); ++i)
            if (distance(table[i]) < distance(table[best]))
                best = i;
        return best;
    }

    std::vector<quint32> table;
    int width, height, bpp, stride;
    bool topDown;
    HDC dc = 0;
    HBITMAP bitmap = 0;
    HGDIOBJ previous = 0;
    void *bits = nullptr;
};

} // namespace zelctl::gdi::test

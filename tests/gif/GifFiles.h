#pragma once

#include "gif/GifEncoder.h"

#include <QByteArray>
#include <QList>
#include <QStringList>

#include <gif_lib.h>

#include <cstring>

namespace zelctl::test {

// Writes GIFs block by block, so each test file reads as the bytes it holds.
class GifBuilder
{
public:
    // Header and logical screen; a global table when colours are given (2^n of them).
    explicit GifBuilder(int width, int height, const QList<quint32> &global = {}, QByteArray signature = "GIF89a")
        : m_bytes(signature)
    {
        word(width);
        word(height);
        m_bytes.append(char(global.isEmpty() ? 0 : 0x80 | (bitsFor(global.size()) - 1)));
        m_bytes.append(2, '\0'); // background colour index, aspect ratio
        table(global);
    }

    GifBuilder &netscape(int loops, const char *name = "NETSCAPE2.0")
    {
        m_bytes.append("\x21\xFF\x0B", 3).append(name, 11).append("\x03\x01", 2);
        word(loops);
        m_bytes.append('\0');
        return *this;
    }

    // Graphic control extension; transparent -1 for none.
    GifBuilder &control(int disposal, int delayHundredths, int transparent = -1)
    {
        m_bytes.append("\x21\xF9\x04", 3);
        m_bytes.append(char(disposal << 2 | (transparent >= 0 ? 1 : 0)));
        word(delayHundredths);
        m_bytes.append(char(transparent >= 0 ? transparent : 0)).append('\0');
        return *this;
    }

    GifBuilder &raw(const QByteArray &bytes)
    {
        m_bytes.append(bytes);
        return *this;
    }

    // Image descriptor, optional local table and LZW data of the indices (row by row).
    GifBuilder &image(
        int left, int top, int width, int height, const QByteArray &indices, const QList<quint32> &local = {})
    {
        m_bytes.append(char(0x2C));
        word(left);
        word(top);
        word(width);
        word(height);
        m_bytes.append(char(local.isEmpty() ? 0 : 0x80 | (bitsFor(local.size()) - 1)));
        table(local);
        int highest = 0;
        for (char index : indices)
            highest = std::max(highest, int(quint8(index)));
        m_bytes.append(gifEncoder::compress(indices, std::max(2, bitsFor(highest + 1))));
        return *this;
    }

    // A solid frame of one index.
    GifBuilder &solid(int left, int top, int width, int height, int index, const QList<quint32> &local = {})
    {
        return image(left, top, width, height, QByteArray(width * height, char(index)), local);
    }

    QByteArray bytes() const { return m_bytes + '\x3B'; }
    QByteArray withoutTrailer() const { return m_bytes; }

private:
    static int bitsFor(qsizetype count)
    {
        int bits = 1;
        while ((qsizetype(1) << bits) < count)
            ++bits;
        return bits;
    }
    void word(int value) { m_bytes.append(char(value & 0xFF)).append(char(value >> 8 & 0xFF)); }
    void table(const QList<quint32> &colors)
    {
        for (quint32 c : colors)
            m_bytes.append(char(c >> 16)).append(char(c >> 8)).append(char(c));
    }

    QByteArray m_bytes;
};

// Each frame of a GIF as giflib, which has nothing in common with our code, reads it:
// place, size, disposal, delay, transparent index, colour table and indices.
inline QStringList decodeWithGiflib(const QByteArray &gif)
{
    struct Source
    {
        const QByteArray *bytes;
        qsizetype pos = 0;
    } source { &gif };
    auto read = [](GifFileType *file, GifByteType *out, int n) {
        auto *s = static_cast<Source *>(file->UserData);
        const int count = int(std::min<qsizetype>(n, s->bytes->size() - s->pos));
        std::memcpy(out, s->bytes->constData() + s->pos, size_t(count));
        s->pos += count;
        return count;
    };
    int error = 0;
    GifFileType *file = DGifOpen(&source, read, &error);
    QStringList frames;
    if (file && DGifSlurp(file) == GIF_OK) {
        for (int i = 0; i < file->ImageCount; ++i) {
            const GifImageDesc &d = file->SavedImages[i].ImageDesc;
            GraphicsControlBlock gcb {};
            DGifSavedExtensionToGCB(file, i, &gcb);
            const ColorMapObject *map = d.ColorMap ? d.ColorMap : file->SColorMap;
            const QByteArray colours(reinterpret_cast<const char *>(map->Colors), map->ColorCount * 3);
            const QByteArray indices(
                reinterpret_cast<const char *>(file->SavedImages[i].RasterBits), d.Width * d.Height);
            frames << QString::asprintf("%d,%d %dx%d disposal %d delay %d transparent %d colours %s indices %s", d.Left,
                d.Top, d.Width, d.Height, gcb.DisposalMode, gcb.DelayTime, gcb.TransparentColor,
                colours.toHex().constData(), indices.toHex().constData());
        }
    }
    DGifCloseFile(file, &error);
    return frames;
}

} // namespace zelctl::test

#pragma once

#include "gif/GifEncoder.h"
#include "gif/GifFrameDecoder.h"

#include <QByteArray>
#include <QList>
#include <QStringList>

#include <gtest/gtest.h>

#include <algorithm>

namespace zelctl::test {

// A frame of gifOf: place, indices row by row, disposal, delay (ms), transparent index (-1
// none) and a local colour table (none when empty).
struct GifFrame
{
    int left, top, width, height;
    QByteArray indices;
    int disposal = 0, delay = 10, transparent = -1;
    QList<quint32> local = {};
};

inline gifScanner::ColorTable colourTable(const QList<quint32> &colours)
{
    gifScanner::ColorTable table;
    std::copy(colours.begin(), colours.end(), table.entries.begin());
    table.count = int(colours.size());
    return table;
}

// A valid GIF, as the library's encoder writes it (the hostile ones are made by hand).
inline QByteArray gifOf(
    int width, int height, const QList<quint32> &global, const QList<GifFrame> &frames, int loops = 0)
{
    gifEncoder::Animation gif { width, height, loops, { colourTable(global) }, {} };
    for (const GifFrame &f : frames) {
        const int table = f.local.isEmpty() ? 0 : int(gif.colorTables.size());
        if (table)
            gif.colorTables.append(colourTable(f.local));
        gif.frames.append({ { .Left = f.left,
                                .Top = f.top,
                                .Width = f.width,
                                .Height = f.height,
                                .Delay = f.delay,
                                .ColorTable = table,
                                .TransparentIndex = quint8(std::max(f.transparent, 0)),
                                .HasTransparency = f.transparent >= 0,
                                .Disposal = quint8(f.disposal) },
            f.indices });
    }
    return gifEncoder::encode(gif);
}

// Each frame of a GIF as the scanner and the frame decoder (giflib's LZW) read it: place,
// size, disposal, delay, transparent index, colour table and indices.
inline QStringList framesOf(const QByteArray &gif)
{
    const gifScanner::GifLayout layout = gifScanner::scan(gif);
    QStringList frames;
    for (qsizetype i = 0; i < layout.Frames.size(); ++i) {
        const gifScanner::FrameRecord &f = layout.Frames[i];
        QByteArray indices(qsizetype(f.Width) * f.Height, '\0');
        EXPECT_TRUE(
            gifFrameDecoder::decode(gif, layout.BlockList[i], f, reinterpret_cast<uchar *>(indices.data()), f.Width));
        const gifScanner::ColorTable table = layout.ColorTables.value(f.ColorTable);
        const QByteArray colours(reinterpret_cast<const char *>(table.entries.data()), table.count * 4);
        frames << QString::asprintf("%d,%d %dx%d disposal %d delay %d transparent %d colours %s indices %s", f.Left,
            f.Top, f.Width, f.Height, f.Disposal, f.Delay, f.HasTransparency ? f.TransparentIndex : -1,
            colours.toHex().constData(), indices.toHex().constData());
    }
    return frames;
}

} // namespace zelctl::test

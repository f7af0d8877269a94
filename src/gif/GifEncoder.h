#pragma once

#include "zelctl_export.h"

#include "gif/GifScanner.h"

#include <QByteArray>
#include <QList>

// Writes frames of palette indices as a GIF89a stream, with the classic hashed LZW encoder.
namespace zelctl::gifEncoder {

struct Frame
{
    // Position, size, delay (ms), disposal, transparency and colour table (0 = global).
    gifScanner::FrameRecord record;
    // Width × Height indices, row by row.
    QByteArray indices;
};

struct Animation
{
    qint32 width = 0;
    qint32 height = 0;
    // Written as a NETSCAPE2.0 extension when there is more than one frame; 0 = endless.
    qint32 loopCount = 0;
    // Column 0 the global table (count 0 for none), then the local tables.
    QList<gifScanner::ColorTable> colorTables;
    QList<Frame> frames;
};

// The LZW data of indices as data sub-blocks of at most 254 bytes with their zero
// terminator, preceded by the minimum code size byte (2..8). Indices must be below
// 2^minCodeSize.
ZELCTL_EXPORT QByteArray compress(QByteArrayView indices, int minCodeSize);

// The whole GIF. Sizes are clamped to what a GIF can hold (65535); a frame whose index data
// is shorter than its area is padded with index 0.
ZELCTL_EXPORT QByteArray encode(const Animation &animation);

} // namespace zelctl::gifEncoder

#pragma once

#include "zelctl_export.h"

#include <QByteArrayView>
#include <QList>

#include <array>

// The block scanner of the animated GIF control: it walks the GIF's blocks and lists the
// frames, where each image block lies, the colour tables and the loop count, without
// decoding any pixels.
namespace zelctl::gifScanner {

// One image of the GIF, in file order.
struct FrameRecord
{
    qint32 Left = 0;
    qint32 Top = 0;
    qint32 Width = 0;
    qint32 Height = 0;
    // Display time in milliseconds (the file's hundredths × 10); 0 without an extension.
    qint32 Delay = 0;
    // 0 = the global table, n = the n-th local table in file order.
    qint32 ColorTable = 0;
    // While scanning, the 0-based offset of the frame's graphic control extension (or of
    // its image descriptor when it has none); once the frames are extracted, the frame's x
    // offset in the frame strip.
    qint32 Position = 0;
    quint8 TransparentIndex = 0;
    quint8 HasTransparency = 0;
    // 0..3; a disposal of 3 on the first frame of the file is read as 0.
    quint8 Disposal = 0;
    quint8 spare = 0;
};
static_assert(sizeof(FrameRecord) == 32);

// Where an image block lies: from its 0x2C separator to its data's zero terminator.
struct BlockEntry
{
    qint32 Length = 0;
    qint32 Start = 0; // 0-based
};

// A colour table: entries as 0x00RRGGBB, and how many the file gave (0 = no table).
struct ColorTable
{
    std::array<quint32, 256> entries {};
    int count = 0;
};

struct GifLayout
{
    QList<FrameRecord> Frames;
    QList<BlockEntry> BlockList; // one per frame
    // Column 0 is the global table (count 0 when the file has none), then the local
    // tables in file order.
    QList<ColorTable> ColorTables;
    qint32 CanvasWidth = 0;
    qint32 CanvasHeight = 0;
    qint32 LoopCount = 0;

    bool hasGlobalTable() const { return !ColorTables.isEmpty() && ColorTables.first().count > 0; }
};

// Scans a whole GIF. A file that does not start with "GIF87a" or "GIF89a" (any letter
// case), or that has a frame without a colour table of its own or a global one, gives no
// frames. A file cut short keeps the frames whose blocks were complete.
ZELCTL_EXPORT GifLayout scan(QByteArrayView bytes);

} // namespace zelctl::gifScanner

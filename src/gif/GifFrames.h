#pragma once

#include "zelctl_export.h"

#include "gif/GifScanner.h"
#include "gif/MemoryBitmap.h"

#include <QByteArray>
#include <QRect>

#include <memory>
#include <vector>

namespace zelctl {

// A loaded GIF as the control keeps it: the frame list and colour tables of the scan, and
// every frame's palette indices side by side in the frame strip, an 8-bit bitmap; the
// colours come from the tables only when a frame is drawn, so palette changes are cheap.
// The strip is cut into pages where the frames would outgrow one bitmap.
class ZELCTL_EXPORT GifFrames
{
public:
    GifFrames();
    ~GifFrames();

    // Scans the GIF and makes room for its frames; no frame is decoded yet. Frames that
    // would take the strip or the canvas beyond the memory limits are left out, as if the
    // file ended before them. False, and nothing loaded, when no frame can be shown.
    bool load(const QByteArray &bytes);
    void clear();

    bool isEmpty() const { return m_layout.Frames.isEmpty(); }
    int count() const { return int(m_layout.Frames.size()); }
    // Frames are 1-based here, as the control counts them.
    const gifScanner::FrameRecord &frame(int index) const { return m_layout.Frames[index - 1]; }
    const QByteArray &bytes() const { return m_bytes; }
    int canvasWidth() const { return m_layout.CanvasWidth; }
    int canvasHeight() const { return m_layout.CanvasHeight; }
    int loopCount() const { return m_layout.LoopCount; }
    QList<qint32> delays() const;

    // Decodes frames up to and including `last` (1-based) that are not decoded yet. False
    // when the data of one of them was damaged (it keeps what could be decoded).
    bool decodeUpTo(int last);

    // Where a frame lies on the canvas, mirrored with the picture.
    QRect frameRect(int index) const;

    // Row y (0 = top) of a frame's palette indices in the strip, as shown (mirrored);
    // nullptr for a frame without pixels.
    const uchar *frameRow(int index, int y) const;

    // Turns the strip's frames over, each within its own rectangle (bit 1 left to right,
    // bit 2 top to bottom).
    void setMirror(int mirror);

    // Colour table t (0 global, n the n-th local one).
    const gifScanner::ColorTable &table(int t) const { return m_layout.ColorTables[t]; }
    // Replaces entries from the first on, up to the table's own count.
    void setTableEntries(int t, const QList<qint32> &entries);
    bool cacheTables();
    bool restoreTables(bool releaseCache);

    // The frames written again as a GIF, with their indices as they were in the file.
    QByteArray encode();

private:
    struct Page;
    struct Placement
    {
        int page = -1;
        int x = 0;
    };

    bool decodeFrame(int index);
    void flip(int index, int mirror);

    QByteArray m_bytes;
    gifScanner::GifLayout m_layout;
    std::vector<Placement> m_place;
    std::vector<std::unique_ptr<Page>> m_pages;
    int m_decoded = 0;
    int m_mirror = 0;
    bool m_hasCache = false;
    QList<gifScanner::ColorTable> m_cachedTables;
};

} // namespace zelctl

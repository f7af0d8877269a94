#pragma once

#include "zelctl_export.h"

#include "gif/MemoryBitmap.h"

#include <QByteArray>
#include <QRect>

namespace zelctl {

class GifFrames;

// The composed picture of an animated GIF: a 24-bit canvas where frames are drawn one over
// the other with their disposal methods, and a 1-bit mask, white where nothing opaque has
// been drawn. It remembers which frame it shows, so painting the same frame again changes
// nothing, and a jump to another frame composes again from the first.
class ZELCTL_EXPORT GifCanvas
{
public:
    // False when the raster layer refuses the size.
    bool create(int width, int height);
    void reset();
    bool isNull() const { return m_canvas.isNull(); }

    // Makes the canvas show frame `index` (1-based) of frames.
    void show(GifFrames &frames, int index);
    // The frames changed (colours, mirroring): the next show composes again.
    void invalidate() { m_shown = 0; }

    // Draws the picture onto dst at `to` (scaled with dst's stretch mode when the sizes
    // differ): transparent parts leave dst as it was.
    void paint(gdi::HDC dst, const QRect &to) const;

private:
    void clear();
    void compose(GifFrames &frames, int index);
    void dispose(GifFrames &frames, int index);
    // Draws unscaled straight into a 32-bit target; false for any other target.
    bool paintDirect(gdi::HDC dst, const QPoint &at) const;

    MemoryBitmap m_canvas;
    MemoryBitmap m_mask;
    // Frame now on the canvas; its disposal is applied before the next frame is drawn.
    int m_shown = 0;
    // What a frame of disposal 3 covered, to be put back.
    QRect m_savedRect;
    QByteArray m_savedCanvas;
    QByteArray m_savedMask;
};

} // namespace zelctl

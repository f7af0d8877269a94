#pragma once

#include <QtGlobal>

namespace zelctl {

class stdPNGdata;

namespace png {

// True when the rectangle has pixels on the bitmap selected into dc: drawing wholly beside
// it (or into a DC without one) has nothing to do.
bool reachesTarget(qint32 dc, qint64 x, qint64 y, qint64 width, qint64 height);

// Shows an image on a caller's DC while it decodes, and repaints the caller's window as it
// goes. 32-bit images are laid over the target's own pixels (or over a background colour),
// which are kept aside, so rows and passes can be blended again as they arrive.
class ProgressiveDisplay
{
public:
    // background: 0x00BBGGRR to lay the image on, or -1 for the target's pixels.
    ProgressiveDisplay(qint32 targetDC, qint32 window, qint32 x, qint32 y, qint32 background);
    ~ProgressiveDisplay();
    ProgressiveDisplay(const ProgressiveDisplay &) = delete;
    ProgressiveDisplay &operator=(const ProgressiveDisplay &) = delete;

    // Prepares the work surfaces for the image's bitmap; false when the target cannot show
    // it (no bitmap selected, or the image lies outside it).
    bool start(const stdPNGdata &image);
    // Rows [first, first + count) of the image are final.
    void showRows(const stdPNGdata &image, qint32 first, qint32 count);
    // Pass 1-7 of an interlaced image is in the bitmap; fading, the image shows with the
    // opacity of the passes done.
    void showPass(const stdPNGdata &image, int pass, bool fade);
    // Draws the whole image once with a constant opacity and repaints the window.
    static void paintWhole(const stdPNGdata &image, qint32 targetDC, qint32 window, qint32 x, qint32 y, quint8 opacity);

private:
    void show(const stdPNGdata &image, qint32 top, qint32 rows, quint8 opacity);

    qint32 m_target;
    qint32 m_window;
    qint32 m_x;
    qint32 m_y;
    qint32 m_background;
    qint32 m_width = 0;
    qint32 m_height = 0;
    qint32 m_workDC = 0;
    qint32 m_work = 0;
    qint32 m_workPrevious = 0;
    qint32 m_savedDC = 0;
    qint32 m_saved = 0;
    qint32 m_savedPrevious = 0;
};

} // namespace png
} // namespace zelctl

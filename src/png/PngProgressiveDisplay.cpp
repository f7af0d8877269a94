#include "PngProgressiveDisplay.h"

#include "PngDecoder.h"
#include "platform/gdi/Gdi.h"
#include "stdPNGdata.h"

#include <algorithm>

namespace zelctl::png {

namespace {

void redraw(qint32 window, qint32 left, qint32 top, qint32 width, qint32 height)
{
    const gdi::RECT rect { left, top, left + width, top + height };
    gdi::RedrawWindow(window, &rect, gdi::RDW_INVALIDATE | gdi::RDW_UPDATENOW);
}

void blend(qint32 target, qint32 x, qint32 y, qint32 width, qint32 height, qint32 source, qint32 sourceX,
    qint32 sourceY, quint8 opacity)
{
    gdi::BLENDFUNCTION function;
    function.SourceConstantAlpha = opacity;
    function.AlphaFormat = gdi::AC_SRC_ALPHA;
    gdi::AlphaBlend(target, x, y, width, height, source, sourceX, sourceY, width, height, function);
}

} // namespace

bool reachesTarget(qint32 dc, qint64 x, qint64 y, qint64 width, qint64 height)
{
    gdi::BITMAP target;
    if (!gdi::GetObject(gdi::GetCurrentObject(dc, gdi::OBJ_BITMAP), target))
        return false;
    return width > 0 && height > 0 && x < target.bmWidth && y < target.bmHeight && x + width > 0 && y + height > 0;
}

ProgressiveDisplay::ProgressiveDisplay(qint32 targetDC, qint32 window, qint32 x, qint32 y, qint32 background)
    : m_target(targetDC)
    , m_window(window)
    , m_x(x)
    , m_y(y)
    , m_background(background)
{ }

ProgressiveDisplay::~ProgressiveDisplay()
{
    if (m_workDC) {
        gdi::SelectObject(m_workDC, m_workPrevious);
        gdi::DeleteDC(m_workDC);
        gdi::DeleteObject(m_work);
    }
    if (m_savedDC) {
        gdi::SelectObject(m_savedDC, m_savedPrevious);
        gdi::DeleteDC(m_savedDC);
        gdi::DeleteObject(m_saved);
    }
}

bool ProgressiveDisplay::start(const stdPNGdata &image)
{
    gdi::BITMAP target;
    if (!image.OwnDC() || !gdi::GetObject(gdi::GetCurrentObject(m_target, gdi::OBJ_BITMAP), target))
        return false;
    // The image starts on the target, or the display does not start: the load paints it at the end.
    if (m_x < 0 || m_y < 0 || m_x >= target.bmWidth || m_y >= target.bmHeight)
        return false;
    const BitmapView bits = image.Bits();
    m_width = std::min(bits.width, target.bmWidth - m_x);
    m_height = std::min(bits.height, target.bmHeight - m_y);
    if (bits.bitCount != 32)
        return true; // opaque rows are copied straight to the target

    // The saved surface holds what the image is laid on; the work surface the composition.
    m_savedDC = gdi::CreateCompatibleDC(m_target);
    m_saved = gdi::CreateCompatibleBitmap(m_target, m_width, m_height);
    m_workDC = gdi::CreateCompatibleDC(m_target);
    m_work = gdi::CreateCompatibleBitmap(m_target, m_width, m_height);
    if (!m_savedDC || !m_saved || !m_workDC || !m_work)
        return false;
    m_savedPrevious = gdi::SelectObject(m_savedDC, m_saved);
    m_workPrevious = gdi::SelectObject(m_workDC, m_work);
    if (m_background == -1) {
        gdi::BitBlt(m_savedDC, 0, 0, m_width, m_height, m_target, m_x, m_y, gdi::SRCCOPY);
    } else {
        const gdi::HBRUSH brush = gdi::CreateSolidBrush(gdi::COLORREF(m_background));
        gdi::FillRect(m_savedDC, gdi::RECT { 0, 0, m_width, m_height }, brush);
        gdi::DeleteObject(brush);
    }
    gdi::BitBlt(m_workDC, 0, 0, m_width, m_height, m_savedDC, 0, 0, gdi::SRCCOPY);
    return true;
}

void ProgressiveDisplay::show(const stdPNGdata &image, qint32 top, qint32 rows, quint8 opacity)
{
    rows = std::min(rows, m_height - top);
    if (rows < 1)
        return;
    if (m_workDC) {
        gdi::BitBlt(m_workDC, 0, top, m_width, rows, m_savedDC, 0, top, gdi::SRCCOPY);
        blend(m_workDC, 0, top, m_width, rows, image.OwnDC(), 0, top, opacity);
        gdi::BitBlt(m_target, m_x, m_y + top, m_width, rows, m_workDC, 0, top, gdi::SRCCOPY);
    } else {
        gdi::BitBlt(m_target, m_x, m_y + top, m_width, rows, image.OwnDC(), 0, top, gdi::SRCCOPY);
    }
    redraw(m_window, m_x, m_y + top, m_width, rows);
}

void ProgressiveDisplay::showRows(const stdPNGdata &image, qint32 first, qint32 count)
{
    show(image, first, count, 255);
}

void ProgressiveDisplay::showPass(const stdPNGdata &image, int pass, bool fade)
{
    show(image, 0, m_height, fade ? quint8(pass * 255 / 7) : 255);
}

void ProgressiveDisplay::paintWhole(
    const stdPNGdata &image, qint32 targetDC, qint32 window, qint32 x, qint32 y, quint8 opacity)
{
    const BitmapView bits = image.Bits();
    if (!targetDC || !image.OwnDC() || !reachesTarget(targetDC, x, y, bits.width, bits.height))
        return;
    if (bits.bitCount == 32)
        blend(targetDC, x, y, bits.width, bits.height, image.OwnDC(), 0, 0, opacity);
    else
        gdi::BitBlt(targetDC, x, y, bits.width, bits.height, image.OwnDC(), 0, 0, gdi::SRCCOPY);
    redraw(window, x, y, bits.width, bits.height);
}

} // namespace zelctl::png

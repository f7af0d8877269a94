#include "GifCanvas.h"

#include "gif/GifFrames.h"

#include <cstring>

namespace zelctl {

namespace {

constexpr quint32 Black = 0x000000;
constexpr quint32 White = 0xFFFFFF;

// Bytes [first, last] of a 1-bit row that hold the pixels of [left, right).
std::pair<int, int> maskBytes(const QRect &rect)
{
    return { rect.left() / 8, rect.right() / 8 };
}

} // namespace

bool GifCanvas::create(int width, int height)
{
    reset();
    if (!m_canvas.create(width, height, 24) || !m_mask.create(width, height, 1, { Black, White })) {
        reset();
        return false;
    }
    return true;
}

void GifCanvas::reset()
{
    m_canvas.reset();
    m_mask.reset();
    m_shown = 0;
    m_savedRect = QRect();
    m_savedCanvas.clear();
    m_savedMask.clear();
}

void GifCanvas::clear()
{
    std::memset(m_canvas.bits(), 0, size_t(m_canvas.stride() * m_canvas.height()));
    std::memset(m_mask.bits(), 0xFF, size_t(m_mask.stride() * m_mask.height()));
    m_savedRect = QRect();
}

void GifCanvas::show(GifFrames &frames, int index)
{
    if (isNull() || index < 1 || index > frames.count() || index == m_shown)
        return;
    frames.decodeUpTo(index);
    if (m_shown == 0 || index != m_shown + 1) {
        clear();
        compose(frames, 1);
        for (int k = 2; k <= index; ++k) {
            dispose(frames, k - 1);
            compose(frames, k);
        }
    } else {
        dispose(frames, m_shown);
        compose(frames, index);
    }
    m_shown = index;
}

void GifCanvas::compose(GifFrames &frames, int index)
{
    const gifScanner::FrameRecord &frame = frames.frame(index);
    const QRect rect = frames.frameRect(index).intersected(QRect(0, 0, m_canvas.width(), m_canvas.height()));
    if (rect.isEmpty())
        return;
    if (frame.Disposal == 3) {
        m_savedRect = rect;
        m_savedCanvas.resize(qsizetype(rect.width()) * 3 * rect.height());
        const auto [first, last] = maskBytes(rect);
        m_savedMask.resize(qsizetype(last - first + 1) * rect.height());
        for (int y = 0; y < rect.height(); ++y) {
            std::memcpy(m_savedCanvas.data() + qsizetype(y) * rect.width() * 3,
                        m_canvas.row(rect.top() + y) + qsizetype(rect.left()) * 3, size_t(rect.width()) * 3);
            std::memcpy(m_savedMask.data() + qsizetype(y) * (last - first + 1), m_mask.row(rect.top() + y) + first,
                        size_t(last - first + 1));
        }
    }
    if (frame.HasTransparency) {
        frames.draw(index, m_canvas.dc(), rect, GifFrames::Pass::MaskAnd);
        frames.draw(index, m_canvas.dc(), rect, GifFrames::Pass::ColoursOr);
        frames.draw(index, m_mask.dc(), rect, GifFrames::Pass::MaskAnd);
    } else {
        frames.draw(index, m_canvas.dc(), rect, GifFrames::Pass::Copy);
        const gdi::RECT area { rect.left(), rect.top(), rect.right() + 1, rect.bottom() + 1 };
        gdi::FillRect(m_mask.dc(), area, gdi::GetStockObject(gdi::BLACK_BRUSH));
    }
}

void GifCanvas::dispose(GifFrames &frames, int index)
{
    const gifScanner::FrameRecord &frame = frames.frame(index);
    const QRect rect = frames.frameRect(index).intersected(QRect(0, 0, m_canvas.width(), m_canvas.height()));
    if (rect.isEmpty())
        return;
    if (frame.Disposal == 2) {
        const gdi::RECT area { rect.left(), rect.top(), rect.right() + 1, rect.bottom() + 1 };
        gdi::FillRect(m_canvas.dc(), area, gdi::GetStockObject(gdi::BLACK_BRUSH));
        gdi::FillRect(m_mask.dc(), area, gdi::GetStockObject(gdi::WHITE_BRUSH));
    } else if (frame.Disposal == 3 && rect == m_savedRect) {
        const auto [first, last] = maskBytes(rect);
        for (int y = 0; y < rect.height(); ++y) {
            std::memcpy(m_canvas.row(rect.top() + y) + qsizetype(rect.left()) * 3,
                        m_savedCanvas.constData() + qsizetype(y) * rect.width() * 3, size_t(rect.width()) * 3);
            std::memcpy(m_mask.row(rect.top() + y) + first,
                        m_savedMask.constData() + qsizetype(y) * (last - first + 1), size_t(last - first + 1));
        }
    }
}

void GifCanvas::paint(gdi::HDC dst, const QRect &to) const
{
    if (isNull() || to.isEmpty())
        return;
    const int w = m_canvas.width(), h = m_canvas.height();
    if (to.width() == w && to.height() == h) {
        gdi::BitBlt(dst, to.x(), to.y(), w, h, m_mask.dc(), 0, 0, gdi::SRCAND);
        gdi::BitBlt(dst, to.x(), to.y(), w, h, m_canvas.dc(), 0, 0, gdi::SRCPAINT);
    } else {
        gdi::StretchBlt(dst, to.x(), to.y(), to.width(), to.height(), m_mask.dc(), 0, 0, w, h, gdi::SRCAND);
        gdi::StretchBlt(dst, to.x(), to.y(), to.width(), to.height(), m_canvas.dc(), 0, 0, w, h, gdi::SRCPAINT);
    }
}

} // namespace zelctl

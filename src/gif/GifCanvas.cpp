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
    const QRect rect = frames.frameRect(index);
    if (rect.isEmpty() || !frames.frameRow(index, 0))
        return;
    const auto [first, last] = maskBytes(rect);
    const qsizetype maskSpan = last - first + 1;
    if (frame.Disposal == 3) {
        m_savedRect = rect;
        m_savedCanvas.resize(qsizetype(rect.width()) * 3 * rect.height());
        m_savedMask.resize(maskSpan * rect.height());
        for (int y = 0; y < rect.height(); ++y) {
            std::memcpy(m_savedCanvas.data() + qsizetype(y) * rect.width() * 3,
                m_canvas.row(rect.top() + y) + qsizetype(rect.left()) * 3, size_t(rect.width()) * 3);
            std::memcpy(m_savedMask.data() + y * maskSpan, m_mask.row(rect.top() + y) + first, size_t(maskSpan));
        }
    }
    // The frame's opaque pixels take their colour from its table and clear their mask bit;
    // transparent ones leave the canvas as it was.
    const std::array<quint32, 256> &colours = frames.table(frame.ColorTable).entries;
    const int transparent = frame.HasTransparency ? frame.TransparentIndex : -1;
    for (int y = 0; y < rect.height(); ++y) {
        const uchar *source = frames.frameRow(index, y);
        uchar *canvas = m_canvas.row(rect.top() + y) + qsizetype(rect.left()) * 3;
        uchar *mask = m_mask.row(rect.top() + y) + (rect.left() >> 3);
        uchar bit = uchar(0x80u >> (rect.left() & 7));
        for (int x = 0; x < rect.width(); ++x, canvas += 3) {
            const int value = source[x];
            if (value != transparent) {
                const quint32 rgb = colours[size_t(value)];
                canvas[0] = uchar(rgb);
                canvas[1] = uchar(rgb >> 8);
                canvas[2] = uchar(rgb >> 16);
                *mask &= uchar(~bit);
            }
            bit >>= 1;
            if (!bit) {
                bit = 0x80;
                ++mask;
            }
        }
    }
}

void GifCanvas::dispose(GifFrames &frames, int index)
{
    const gifScanner::FrameRecord &frame = frames.frame(index);
    const QRect rect = frames.frameRect(index);
    if (rect.isEmpty())
        return;
    const auto [first, last] = maskBytes(rect);
    const qsizetype maskSpan = last - first + 1;
    if (frame.Disposal == 2) {
        for (int y = rect.top(); y <= rect.bottom(); ++y) {
            std::memset(m_canvas.row(y) + qsizetype(rect.left()) * 3, 0, size_t(rect.width()) * 3);
            uchar *mask = m_mask.row(y);
            for (int x = rect.left(); x <= rect.right(); ++x)
                mask[x >> 3] |= uchar(0x80u >> (x & 7));
        }
    } else if (frame.Disposal == 3 && rect == m_savedRect) {
        for (int y = 0; y < rect.height(); ++y) {
            std::memcpy(m_canvas.row(rect.top() + y) + qsizetype(rect.left()) * 3,
                m_savedCanvas.constData() + qsizetype(y) * rect.width() * 3, size_t(rect.width()) * 3);
            std::memcpy(m_mask.row(rect.top() + y) + first, m_savedMask.constData() + y * maskSpan, size_t(maskSpan));
        }
    }
}

void GifCanvas::paint(gdi::HDC dst, const QRect &to) const
{
    if (isNull() || to.isEmpty())
        return;
    const int w = m_canvas.width(), h = m_canvas.height();
    if (to.size() == QSize(w, h) && paintDirect(dst, to.topLeft()))
        return;
    // Through the mask in two steps: AND clears where the picture is opaque, OR puts its
    // colours there (the canvas is black wherever the mask is white).
    gdi::StretchBlt(dst, to.x(), to.y(), to.width(), to.height(), m_mask.dc(), 0, 0, w, h, gdi::SRCAND);
    gdi::StretchBlt(dst, to.x(), to.y(), to.width(), to.height(), m_canvas.dc(), 0, 0, w, h, gdi::SRCPAINT);
}

bool GifCanvas::paintDirect(gdi::HDC dst, const QPoint &at) const
{
    gdi::DIBSECTION target;
    if (!gdi::GetObject(gdi::GetCurrentObject(dst, gdi::OBJ_BITMAP), target) || target.dsBm.bmBitsPixel != 32
        || !target.dsBm.bmBits)
        return false;
    // The same pixels as the two blits give, without their per-pixel conversions: the
    // unscaled picture is what every frame of an animation draws.
    const QRect visible = QRect(at, QSize(m_canvas.width(), m_canvas.height()))
                              .intersected(QRect(0, 0, target.dsBm.bmWidth, target.dsBm.bmHeight));
    const bool topDown = target.dsBmih.biHeight < 0;
    auto *bits = static_cast<uchar *>(target.dsBm.bmBits);
    for (int ty = visible.top(); ty <= visible.bottom(); ++ty) {
        const int row = topDown ? ty : target.dsBm.bmHeight - 1 - ty;
        auto *out = reinterpret_cast<quint32 *>(bits + qsizetype(row) * target.dsBm.bmWidthBytes);
        const uchar *canvas = m_canvas.row(ty - at.y());
        const uchar *mask = m_mask.row(ty - at.y());
        int x = visible.left() - at.x();
        const uchar *source = canvas + 3 * qsizetype(x);
        for (int tx = visible.left(); tx <= visible.right(); ++tx, ++x, source += 3) {
            // Whole mask bytes of transparent pixels are skipped at once.
            if ((x & 7) == 0 && mask[x >> 3] == 0xFF && tx + 7 <= visible.right()) {
                tx += 7;
                x += 7;
                source += 21;
                continue;
            }
            if (!(mask[x >> 3] & (0x80u >> (x & 7))))
                out[tx] = 0xFF000000u | quint32(source[2]) << 16 | quint32(source[1]) << 8 | source[0];
        }
    }
    return true;
}

} // namespace zelctl

#include "GifFrames.h"

#include "gif/GifEncoder.h"
#include "gif/GifFrameDecoder.h"
#include "gif/GifLimits.h"

#include <algorithm>

namespace zelctl {

struct GifFrames::Page
{
    MemoryBitmap bitmap;
};

GifFrames::GifFrames() = default;
GifFrames::~GifFrames() = default;

void GifFrames::clear()
{
    m_bytes.clear();
    m_layout = gifScanner::GifLayout {};
    m_place.clear();
    m_pages.clear();
    m_decoded = 0;
    m_mirror = 0;
    m_hasCache = false;
    m_cachedTables.clear();
}

bool GifFrames::load(const QByteArray &bytes)
{
    clear();
    if (bytes.size() > gifLimits::MaxFileBytes)
        return false;
    m_layout = gifScanner::scan(bytes);

    // Lay the frames out on pages, keeping only those that fit within the limits.
    QList<int> pageWidths { 0 }, pageHeights { 0 };
    qint64 closedPixels = 0;
    int canvasWidth = 0, canvasHeight = 0;
    qsizetype kept = 0;
    for (; kept < m_layout.Frames.size(); ++kept) {
        const gifScanner::FrameRecord &f = m_layout.Frames[kept];
        const int cw = std::max(canvasWidth, f.Left + f.Width), ch = std::max(canvasHeight, f.Top + f.Height);
        if (cw > gifLimits::MaxBitmapSide || ch > gifLimits::MaxBitmapSide
            || qint64(cw) * ch > gifLimits::MaxCanvasPixels)
            break;
        Placement place;
        if (f.Width > 0 && f.Height > 0) {
            if (pageWidths.last() + f.Width > gifLimits::MaxBitmapSide) {
                closedPixels += qint64(pageWidths.last()) * pageHeights.last();
                pageWidths.append(0);
                pageHeights.append(0);
            }
            const qint64 pixels
                = closedPixels + qint64(pageWidths.last() + f.Width) * std::max(pageHeights.last(), f.Height);
            if (pixels > gifLimits::MaxStripPixels)
                break;
            place = { int(pageWidths.size() - 1), pageWidths.last() };
            pageWidths.last() += f.Width;
            pageHeights.last() = std::max(pageHeights.last(), f.Height);
        }
        m_place.push_back(place);
        canvasWidth = cw;
        canvasHeight = ch;
    }
    m_layout.Frames.resize(kept);
    m_layout.BlockList.resize(kept);
    m_layout.CanvasWidth = canvasWidth;
    m_layout.CanvasHeight = canvasHeight;
    if (kept == 0 || canvasWidth == 0 || canvasHeight == 0) {
        clear();
        return false;
    }

    for (qsizetype p = 0; p < pageWidths.size(); ++p) {
        if (pageWidths[p] == 0)
            continue;
        auto page = std::make_unique<Page>();
        if (!page->bitmap.create(pageWidths[p], pageHeights[p], 8)) {
            clear();
            return false;
        }
        m_pages.resize(size_t(p) + 1);
        m_pages[size_t(p)] = std::move(page);
    }
    for (qsizetype i = 0; i < m_layout.Frames.size(); ++i)
        m_layout.Frames[i].Position = m_place[size_t(i)].x;
    m_bytes = bytes;
    return true;
}

QList<qint32> GifFrames::delays() const
{
    QList<qint32> result;
    for (const gifScanner::FrameRecord &f : m_layout.Frames)
        result.append(f.Delay);
    return result;
}

bool GifFrames::decodeUpTo(int last)
{
    last = std::min(last, count());
    bool whole = true;
    while (m_decoded < last)
        whole = decodeFrame(++m_decoded) && whole;
    return whole;
}

bool GifFrames::decodeFrame(int index)
{
    const Placement &place = m_place[size_t(index - 1)];
    if (place.page < 0)
        return true;
    MemoryBitmap &bitmap = m_pages[size_t(place.page)]->bitmap;
    // A frame that fails to decode keeps what it got; the rest stays index 0.
    const bool decoded = gifFrameDecoder::decode(
        m_bytes, m_layout.BlockList[index - 1], frame(index), bitmap.bits() + place.x, bitmap.stride());
    if (m_mirror)
        flip(index, m_mirror);
    return decoded;
}

QRect GifFrames::frameRect(int index) const
{
    const gifScanner::FrameRecord &f = frame(index);
    QRect rect(f.Left, f.Top, f.Width, f.Height);
    if (m_mirror & 1)
        rect.moveLeft(canvasWidth() - f.Left - f.Width);
    if (m_mirror & 2)
        rect.moveTop(canvasHeight() - f.Top - f.Height);
    return rect;
}

const uchar *GifFrames::frameRow(int index, int y) const
{
    const Placement &place = m_place[size_t(index - 1)];
    if (place.page < 0)
        return nullptr;
    return m_pages[size_t(place.page)]->bitmap.row(y) + place.x;
}

void GifFrames::flip(int index, int mirror)
{
    const Placement &place = m_place[size_t(index - 1)];
    if (place.page < 0)
        return;
    const MemoryBitmap &bitmap = m_pages[size_t(place.page)]->bitmap;
    const gifScanner::FrameRecord &f = frame(index);
    if (mirror & 1) {
        for (int y = 0; y < f.Height; ++y) {
            uchar *row = bitmap.row(y) + place.x;
            std::reverse(row, row + f.Width);
        }
    }
    if (mirror & 2) {
        for (int y = 0; y < f.Height / 2; ++y)
            std::swap_ranges(
                bitmap.row(y) + place.x, bitmap.row(y) + place.x + f.Width, bitmap.row(f.Height - 1 - y) + place.x);
    }
}

void GifFrames::setMirror(int mirror)
{
    mirror &= 3;
    const int change = m_mirror ^ mirror;
    if (!change)
        return;
    for (int i = 1; i <= m_decoded; ++i)
        flip(i, change);
    m_mirror = mirror;
}

void GifFrames::setTableEntries(int t, const QList<qint32> &entries)
{
    gifScanner::ColorTable &target = m_layout.ColorTables[t];
    const int n = std::min<int>(target.count, int(entries.size()));
    for (int k = 0; k < n; ++k)
        target.entries[size_t(k)] = quint32(entries[k]) & 0xFFFFFF;
}

bool GifFrames::cacheTables()
{
    if (m_hasCache)
        return false;
    m_cachedTables = m_layout.ColorTables;
    m_hasCache = true;
    return true;
}

bool GifFrames::restoreTables(bool releaseCache)
{
    if (!m_hasCache)
        return false;
    m_layout.ColorTables = m_cachedTables;
    if (releaseCache) {
        m_hasCache = false;
        m_cachedTables.clear();
    }
    return true;
}

QByteArray GifFrames::encode()
{
    decodeUpTo(count());
    gifEncoder::Animation animation;
    animation.width = canvasWidth();
    animation.height = canvasHeight();
    animation.loopCount = loopCount();
    animation.colorTables = m_layout.ColorTables;
    for (int i = 1; i <= count(); ++i) {
        gifEncoder::Frame out;
        out.record = frame(i);
        const Placement &place = m_place[size_t(i - 1)];
        if (place.page >= 0) {
            const MemoryBitmap &bitmap = m_pages[size_t(place.page)]->bitmap;
            const int w = out.record.Width, h = out.record.Height;
            out.indices.resize(qsizetype(w) * h);
            for (int y = 0; y < h; ++y) {
                // Undo the mirroring: the picture is written as the file had it.
                const int from = (m_mirror & 2) ? h - 1 - y : y;
                char *row = out.indices.data() + qsizetype(y) * w;
                std::copy_n(bitmap.row(from) + place.x, w, row);
                if (m_mirror & 1)
                    std::reverse(row, row + w);
            }
        }
        animation.frames.append(out);
    }
    return gifEncoder::encode(animation);
}

} // namespace zelctl

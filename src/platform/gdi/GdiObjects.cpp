#include "GdiObjects.h"

#include <limits>

namespace zelctl::gdi::detail {

namespace {

// Larger bitmaps are refused: no control needs them, and the limits keep every
// coordinate computation far from overflow.
constexpr qint64 MaxDimension = 1 << 16;
constexpr qint64 MaxBytes = qint64(1) << 30;

} // namespace

std::shared_ptr<Bitmap> makeBitmap(const BITMAPINFOHEADER &header, const RGBQUAD *colors, int colorCount)
{
    const int bpp = header.biBitCount;
    if (header.biSize < 40 || header.biPlanes != 1 || header.biCompression != BI_RGB)
        return nullptr;
    if (bpp != 1 && bpp != 4 && bpp != 8 && bpp != 24 && bpp != 32)
        return nullptr;
    const qint64 width = header.biWidth;
    const qint64 height = header.biHeight < 0 ? -qint64(header.biHeight) : qint64(header.biHeight);
    if (width < 1 || height < 1 || width > MaxDimension || height > MaxDimension)
        return nullptr;
    const qint64 stride = strideFor(int(width), bpp);
    if (stride * height > MaxBytes)
        return nullptr;

    auto bitmap = std::make_shared<Bitmap>();
    bitmap->storage.reset(new (PixelAlignment, std::nothrow) quint32[size_t(stride / 4 * height)]());
    if (!bitmap->storage)
        return nullptr;
    bitmap->header = header;
    bitmap->header.biSize = 40;
    bitmap->header.biSizeImage = quint32(stride * height);
    bitmap->header.biClrUsed = 0;
    bitmap->header.biClrImportant = 0;
    if (bpp <= 8) {
        const int entries = std::min(colorCount, 1 << bpp);
        for (int i = 0; i < entries; ++i)
            bitmap->table[size_t(i)]
                = quint32(colors[i].rgbRed) << 16 | quint32(colors[i].rgbGreen) << 8 | colors[i].rgbBlue;
    }
    Surface &surface = bitmap->surface;
    surface.bits = reinterpret_cast<uchar *>(bitmap->storage.get());
    surface.width = int(width);
    surface.height = int(height);
    surface.stride = stride;
    surface.bpp = bpp;
    surface.topDown = header.biHeight < 0;
    surface.table = &bitmap->table;
    return bitmap;
}

HandleTable &HandleTable::instance()
{
    // Never destroyed: objects held in other statics may still be deleted during exit.
    static HandleTable *const table = new HandleTable;
    return *table;
}

HandleTable::HandleTable()
{
    m_stock[WHITE_BRUSH] = addStock(std::make_shared<Brush>(0xFFFFFF, false));
    m_stock[BLACK_BRUSH] = addStock(std::make_shared<Brush>(0x000000, false));
    m_stock[NULL_BRUSH] = addStock(std::make_shared<Brush>(0x000000, true));
    m_stock[WHITE_PEN] = addStock(std::make_shared<Pen>(PS_SOLID, 1, 0xFFFFFF));
    m_stock[BLACK_PEN] = addStock(std::make_shared<Pen>(PS_SOLID, 1, 0x000000));
    m_stock[NULL_PEN] = addStock(std::make_shared<Pen>(PS_NULL, 1, 0x000000));

    BITMAPINFOHEADER mono;
    mono.biWidth = 1;
    mono.biHeight = 1;
    mono.biBitCount = 1;
    const RGBQUAD blackWhite[2] = { rgbQuad(0x000000), rgbQuad(0xFFFFFF) };
    m_defaultBitmap = addStock(makeBitmap(mono, blackWhite, 2));
    m_defaultFont = addStock(std::make_shared<Font>(QStringLiteral("Sans Serif"), 8.0, false));
}

HGDIOBJ HandleTable::addStock(std::shared_ptr<Object> object)
{
    object->stock = true;
    return add(std::move(object));
}

HGDIOBJ HandleTable::add(std::shared_ptr<Object> object)
{
    if (!object)
        return 0;
    std::lock_guard lock(m_mutex);
    // Handles are not reused, so a stale handle never names a newer object; after the
    // (theoretical) wrap-around, numbers still in use are skipped.
    while (m_next <= 0 || m_objects.count(m_next))
        m_next = m_next == std::numeric_limits<HGDIOBJ>::max() ? 0x1000 : m_next + 1;
    const HGDIOBJ handle = m_next++;
    m_objects.emplace(handle, std::move(object));
    return handle;
}

std::shared_ptr<Object> HandleTable::find(HGDIOBJ handle) const
{
    std::lock_guard lock(m_mutex);
    auto it = m_objects.find(handle);
    return it == m_objects.end() ? nullptr : it->second;
}

bool HandleTable::remove(HGDIOBJ handle, bool isDc)
{
    std::lock_guard lock(m_mutex);
    auto it = m_objects.find(handle);
    if (it == m_objects.end() || (it->second->type == OBJ_MEMDC) != isDc)
        return false;
    if (it->second->stock)
        return true;
    if (it->second->selections > 0)
        return false;
    m_objects.erase(it);
    return true;
}

HGDIOBJ HandleTable::stock(int index) const
{
    auto it = m_stock.find(index);
    return it == m_stock.end() ? 0 : it->second;
}

} // namespace zelctl::gdi::detail

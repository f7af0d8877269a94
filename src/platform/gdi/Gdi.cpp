#include "Gdi.h"

#include "GdiObjects.h"
#include "Raster.h"
#include "Shapes.h"

#include <cstring>

namespace zelctl::gdi {

using namespace detail;

namespace {

HandleTable &table()
{
    return HandleTable::instance();
}

std::shared_ptr<Dc> findDc(HDC hdc)
{
    return table().find<Dc>(hdc, OBJ_MEMDC);
}

std::shared_ptr<Bitmap> findBitmap(HBITMAP bitmap)
{
    return table().find<Bitmap>(bitmap, OBJ_BITMAP);
}

// The pixel value that shows a colour in a surface; 32-bit pixels are opaque.
quint32 valueOf(const Surface &surface, COLORREF color)
{
    return valueOfColor(surface, swapRedBlue(platform::translateColor(color)) | 0xFF000000u);
}

template <typename T> HGDIOBJ swapSelection(Selected<T> &slot, HGDIOBJ handle, std::shared_ptr<T> object)
{
    const HGDIOBJ previous = slot.handle;
    if (slot.object)
        --slot.object->selections;
    ++object->selections;
    slot.handle = handle;
    slot.object = std::move(object);
    return previous;
}

template <typename T> void releaseSelection(Selected<T> &slot)
{
    if (slot.object)
        --slot.object->selections;
    slot.object.reset();
    slot.handle = 0;
}

// Coordinates beyond this are refused by the pens, so that no shape can make them walk
// billions of pixels.
constexpr int MaxPenCoordinate = 1 << 20;

bool penCoordinatesOk(std::initializer_list<int> values)
{
    for (int v : values)
        if (v < -MaxPenCoordinate || v > MaxPenCoordinate)
            return false;
    return true;
}

PenMode penMode(const Dc &dc)
{
    return dc.rop2 == R2_XORPEN ? PenMode::Xor : PenMode::Copy;
}

void stroke(const Dc &dc, const Coverage &coverage, COLORREF color)
{
    const Surface &surface = dc.bitmap.object->surface;
    coverage.apply(surface, valueOf(surface, color), penMode(dc));
}

} // namespace

// --- Device contexts -------------------------------------------------------------------

HDC CreateCompatibleDC(HDC hdc)
{
    if (hdc != 0 && !findDc(hdc))
        return 0;
    auto dc = std::make_shared<Dc>();
    HandleTable &objects = table();
    swapSelection(dc->bitmap, objects.defaultBitmap(), findBitmap(objects.defaultBitmap()));
    swapSelection(dc->brush, objects.stock(WHITE_BRUSH), objects.find<Brush>(objects.stock(WHITE_BRUSH), OBJ_BRUSH));
    swapSelection(dc->pen, objects.stock(BLACK_PEN), objects.find<Pen>(objects.stock(BLACK_PEN), OBJ_PEN));
    swapSelection(dc->font, objects.defaultFont(), objects.find<Font>(objects.defaultFont(), OBJ_FONT));
    return objects.add(std::move(dc));
}

bool DeleteDC(HDC hdc)
{
    std::shared_ptr<Dc> dc = findDc(hdc);
    if (!dc || !table().remove(hdc, true))
        return false;
    releaseSelection(dc->bitmap);
    releaseSelection(dc->brush);
    releaseSelection(dc->pen);
    releaseSelection(dc->font);
    return true;
}

HGDIOBJ SelectObject(HDC hdc, HGDIOBJ handle)
{
    std::shared_ptr<Dc> dc = findDc(hdc);
    std::shared_ptr<Object> object = table().find(handle);
    if (!dc || !object)
        return 0;
    switch (object->type) {
    case OBJ_BITMAP:
        return swapSelection(dc->bitmap, handle, std::static_pointer_cast<Bitmap>(object));
    case OBJ_BRUSH:
        return swapSelection(dc->brush, handle, std::static_pointer_cast<Brush>(object));
    case OBJ_PEN:
        return swapSelection(dc->pen, handle, std::static_pointer_cast<Pen>(object));
    case OBJ_FONT:
        return swapSelection(dc->font, handle, std::static_pointer_cast<Font>(object));
    default:
        return 0;
    }
}

HGDIOBJ GetCurrentObject(HDC hdc, int type)
{
    std::shared_ptr<Dc> dc = findDc(hdc);
    if (!dc)
        return 0;
    switch (type) {
    case OBJ_BITMAP:
        return dc->bitmap.handle;
    case OBJ_BRUSH:
        return dc->brush.handle;
    case OBJ_PEN:
        return dc->pen.handle;
    case OBJ_FONT:
        return dc->font.handle;
    default:
        return 0;
    }
}

COLORREF SetTextColor(HDC hdc, COLORREF color)
{
    std::shared_ptr<Dc> dc = findDc(hdc);
    return dc ? std::exchange(dc->textColor, color) : CLR_INVALID;
}

COLORREF GetTextColor(HDC hdc)
{
    std::shared_ptr<Dc> dc = findDc(hdc);
    return dc ? dc->textColor : CLR_INVALID;
}

COLORREF SetBkColor(HDC hdc, COLORREF color)
{
    std::shared_ptr<Dc> dc = findDc(hdc);
    return dc ? std::exchange(dc->bkColor, color) : CLR_INVALID;
}

COLORREF GetBkColor(HDC hdc)
{
    std::shared_ptr<Dc> dc = findDc(hdc);
    return dc ? dc->bkColor : CLR_INVALID;
}

int SetStretchBltMode(HDC hdc, int mode)
{
    std::shared_ptr<Dc> dc = findDc(hdc);
    if (!dc || mode < BLACKONWHITE || mode > HALFTONE)
        return 0;
    return std::exchange(dc->stretchMode, mode);
}

int GetStretchBltMode(HDC hdc)
{
    std::shared_ptr<Dc> dc = findDc(hdc);
    return dc ? dc->stretchMode : 0;
}

bool SetBrushOrgEx(HDC hdc, int x, int y, POINT *previous)
{
    std::shared_ptr<Dc> dc = findDc(hdc);
    if (!dc)
        return false;
    if (previous)
        *previous = dc->brushOrigin;
    dc->brushOrigin = POINT { x, y };
    return true;
}

int SetROP2(HDC hdc, int mode)
{
    std::shared_ptr<Dc> dc = findDc(hdc);
    if (!dc || (mode != R2_COPYPEN && mode != R2_XORPEN))
        return 0;
    return std::exchange(dc->rop2, mode);
}

int GetROP2(HDC hdc)
{
    std::shared_ptr<Dc> dc = findDc(hdc);
    return dc ? dc->rop2 : 0;
}

// --- Bitmaps ---------------------------------------------------------------------------

HBITMAP CreateDIBSection(HDC, const BITMAPINFO *info, quint32 usage, void **bits)
{
    if (bits)
        *bits = nullptr;
    if (!info || usage != DIB_RGB_COLORS)
        return 0;
    const quint32 used = info->bmiHeader.biClrUsed;
    const int colorCount = used == 0 || used > 256 ? 256 : int(used);
    std::shared_ptr<Bitmap> bitmap = makeBitmap(info->bmiHeader, info->bmiColors.data(), colorCount);
    if (!bitmap)
        return 0;
    void *memory = bitmap->storage.get();
    const HBITMAP handle = table().add(std::move(bitmap));
    if (handle && bits)
        *bits = memory;
    return handle;
}

HBITMAP CreateCompatibleBitmap(HDC hdc, int width, int height)
{
    BITMAPINFO info;
    info.bmiHeader.biWidth = width;
    info.bmiHeader.biHeight = -height;
    info.bmiHeader.biBitCount = 32;
    if (hdc != 0) {
        std::shared_ptr<Dc> dc = findDc(hdc);
        if (!dc)
            return 0;
        const Bitmap &current = *dc->bitmap.object;
        if (!current.stock) {
            info.bmiHeader.biBitCount = current.header.biBitCount;
            info.bmiHeader.biHeight = current.surface.topDown ? -height : height;
            for (int i = 0; i < current.surface.tableSize(); ++i)
                info.bmiColors[size_t(i)] = rgbQuad(current.table[size_t(i)]);
        }
    }
    if (height <= 0)
        return 0;
    return CreateDIBSection(hdc, &info, DIB_RGB_COLORS, nullptr);
}

quint32 SetDIBColorTable(HDC hdc, quint32 start, quint32 count, const RGBQUAD *colors)
{
    std::shared_ptr<Dc> dc = findDc(hdc);
    if (!dc || !colors)
        return 0;
    Bitmap &bitmap = *dc->bitmap.object;
    const quint32 size = quint32(bitmap.surface.tableSize());
    if (start >= size)
        return 0;
    const quint32 n = std::min(count, size - start);
    for (quint32 i = 0; i < n; ++i)
        bitmap.table[start + i]
            = quint32(colors[i].rgbRed) << 16 | quint32(colors[i].rgbGreen) << 8 | colors[i].rgbBlue;
    return n;
}

quint32 GetDIBColorTable(HDC hdc, quint32 start, quint32 count, RGBQUAD *colors)
{
    std::shared_ptr<Dc> dc = findDc(hdc);
    if (!dc || !colors)
        return 0;
    const Bitmap &bitmap = *dc->bitmap.object;
    const quint32 size = quint32(bitmap.surface.tableSize());
    if (start >= size)
        return 0;
    const quint32 n = std::min(count, size - start);
    for (quint32 i = 0; i < n; ++i)
        colors[i] = rgbQuad(bitmap.table[start + i]);
    return n;
}

int GetDIBits(HDC hdc, HBITMAP handle, quint32 start, quint32 lines, void *bits, BITMAPINFO *info, quint32 usage)
{
    std::shared_ptr<Bitmap> bitmap = findBitmap(handle);
    if (!findDc(hdc) || !bitmap || !info || usage != DIB_RGB_COLORS)
        return 0;
    const Surface &source = bitmap->surface;
    if (!bits) {
        info->bmiHeader = bitmap->header;
        for (int i = 0; i < source.tableSize(); ++i)
            info->bmiColors[size_t(i)] = rgbQuad(bitmap->table[size_t(i)]);
        return source.height;
    }
    BITMAPINFOHEADER &wanted = info->bmiHeader;
    const int bpp = wanted.biBitCount;
    if (wanted.biWidth != source.width || (bpp != 1 && bpp != 4 && bpp != 8 && bpp != 24 && bpp != 32))
        return 0;
    if (start >= quint32(source.height))
        return 0;
    const int rows = int(std::min<quint32>(lines, quint32(source.height) - start));

    ColorTable targetTable {};
    if (bpp <= 8) {
        // The same depth gets the bitmap's own table; another depth is matched to the
        // caller's table.
        if (bpp == source.bpp)
            for (int i = 0; i < source.tableSize(); ++i)
                info->bmiColors[size_t(i)] = rgbQuad(bitmap->table[size_t(i)]);
        for (int i = 0; i < (1 << bpp); ++i) {
            const RGBQUAD &c = info->bmiColors[size_t(i)];
            targetTable[size_t(i)] = quint32(c.rgbRed) << 16 | quint32(c.rgbGreen) << 8 | c.rgbBlue;
        }
    }
    Surface target;
    target.width = source.width;
    target.height = rows;
    target.bpp = bpp;
    target.stride = strideFor(source.width, bpp);
    target.topDown = wanted.biHeight < 0;
    target.table = &targetTable;
    // The pixel routines read 32-bit pixels as words, so unaligned memory goes through a copy.
    const size_t bytes = size_t(target.stride) * size_t(rows);
    std::unique_ptr<quint32[]> aligned;
    const bool isAligned = reinterpret_cast<quintptr>(bits) % alignof(quint32) == 0;
    if (isAligned) {
        target.bits = static_cast<uchar *>(bits);
    } else {
        aligned.reset(new quint32[bytes / 4]());
        target.bits = reinterpret_cast<uchar *>(aligned.get());
    }
    // Rows count from the bottom: row `start` is the bottom row of what is copied.
    const int top = source.height - int(start) - rows;
    stretchBlit(target, Extent { 0, 0, source.width, rows }, source, Extent { 0, top, source.width, rows }, Rop::Copy,
        Sampling::Nearest);
    if (!isAligned)
        std::memcpy(bits, aligned.get(), bytes);
    return rows;
}

// --- Objects ---------------------------------------------------------------------------

HBRUSH CreateSolidBrush(COLORREF color)
{
    return table().add(std::make_shared<Brush>(color, false));
}

HPEN CreatePen(int style, int width, COLORREF color)
{
    if (style != PS_SOLID && style != PS_NULL)
        return 0;
    return table().add(std::make_shared<Pen>(style, std::max(width, 1), color));
}

HGDIOBJ GetStockObject(int object)
{
    return table().stock(object);
}

bool DeleteObject(HGDIOBJ object)
{
    return table().remove(object, false);
}

int GetObjectType(HGDIOBJ handle)
{
    std::shared_ptr<Object> object = table().find(handle);
    return object ? object->type : 0;
}

bool GetObject(HGDIOBJ handle, BITMAP &description)
{
    std::shared_ptr<Bitmap> bitmap = findBitmap(handle);
    if (!bitmap)
        return false;
    const Surface &surface = bitmap->surface;
    description.bmType = 0;
    description.bmWidth = surface.width;
    description.bmHeight = surface.height;
    description.bmWidthBytes = qint32(surface.stride);
    description.bmPlanes = 1;
    description.bmBitsPixel = quint16(surface.bpp);
    description.bmBits = surface.bits;
    return true;
}

bool GetObject(HGDIOBJ handle, DIBSECTION &section)
{
    std::shared_ptr<Bitmap> bitmap = findBitmap(handle);
    if (!bitmap || !GetObject(handle, section.dsBm))
        return false;
    section.dsBmih = bitmap->header;
    return true;
}

// --- Blits -----------------------------------------------------------------------------

namespace {

bool ropOf(quint32 code, Rop &rop)
{
    switch (code) {
    case SRCCOPY:
        rop = Rop::Copy;
        return true;
    case SRCAND:
        rop = Rop::And;
        return true;
    case SRCPAINT:
        rop = Rop::Or;
        return true;
    default:
        return false;
    }
}

} // namespace

bool BitBlt(HDC dst, int x, int y, int width, int height, HDC src, int srcX, int srcY, quint32 rop)
{
    return StretchBlt(dst, x, y, width, height, src, srcX, srcY, width, height, rop);
}

bool StretchBlt(
    HDC dst, int x, int y, int width, int height, HDC src, int srcX, int srcY, int srcWidth, int srcHeight, quint32 rop)
{
    std::shared_ptr<Dc> target = findDc(dst);
    std::shared_ptr<Dc> source = findDc(src);
    Rop op;
    if (!target || !source || !ropOf(rop, op))
        return false;
    const Sampling sampling = target->stretchMode == HALFTONE ? Sampling::Area : Sampling::Nearest;
    return stretchBlit(target->bitmap.object->surface, Extent { x, y, width, height }, source->bitmap.object->surface,
        Extent { srcX, srcY, srcWidth, srcHeight }, op, sampling);
}

bool AlphaBlend(HDC dst, int x, int y, int width, int height, HDC src, int srcX, int srcY, int srcWidth, int srcHeight,
    BLENDFUNCTION blend)
{
    std::shared_ptr<Dc> target = findDc(dst);
    std::shared_ptr<Dc> source = findDc(src);
    if (!target || !source || blend.BlendOp != AC_SRC_OVER || blend.BlendFlags != 0
        || (blend.AlphaFormat & ~AC_SRC_ALPHA) != 0)
        return false;
    return alphaBlend(target->bitmap.object->surface, Extent { x, y, width, height }, source->bitmap.object->surface,
        Extent { srcX, srcY, srcWidth, srcHeight }, blend.SourceConstantAlpha, blend.AlphaFormat == AC_SRC_ALPHA);
}

// --- Drawing ---------------------------------------------------------------------------

int FillRect(HDC hdc, const RECT &rect, HBRUSH handle)
{
    std::shared_ptr<Dc> dc = findDc(hdc);
    std::shared_ptr<Brush> brush = table().find<Brush>(handle, OBJ_BRUSH);
    if (!dc || !brush)
        return 0;
    if (!brush->null) {
        const Surface &surface = dc->bitmap.object->surface;
        fillRect(surface, rect.left, rect.top, rect.right, rect.bottom, valueOf(surface, brush->color));
    }
    return 1;
}

bool Rectangle(HDC hdc, int left, int top, int right, int bottom)
{
    std::shared_ptr<Dc> dc = findDc(hdc);
    if (!dc || !penCoordinatesOk({ left, top, right, bottom }))
        return false;
    if (left > right)
        std::swap(left, right);
    if (top > bottom)
        std::swap(top, bottom);
    const Surface &surface = dc->bitmap.object->surface;
    const Pen &pen = *dc->pen.object;
    const Brush &brush = *dc->brush.object;
    const bool outlined = pen.style != PS_NULL;
    if (!brush.null) {
        const int inset = outlined ? 1 : 0;
        fillRect(surface, left + inset, top + inset, right - inset, bottom - inset, valueOf(surface, brush.color));
    }
    if (outlined && right > left && bottom > top) {
        Coverage outline(QRect(0, 0, surface.width, surface.height));
        outline.addLine(left, top, right - 1, top, pen.width);
        outline.addLine(right - 1, top, right - 1, bottom - 1, pen.width);
        outline.addLine(right - 1, bottom - 1, left, bottom - 1, pen.width);
        outline.addLine(left, bottom - 1, left, top, pen.width);
        // The edges of a one-pixel rectangle have no length; its outline is that pixel.
        if (right - left == 1 && bottom - top == 1)
            outline.addLine(left, top, right, top, pen.width);
        stroke(*dc, outline, pen.color);
    }
    return true;
}

bool MoveToEx(HDC hdc, int x, int y, POINT *previous)
{
    std::shared_ptr<Dc> dc = findDc(hdc);
    if (!dc)
        return false;
    if (previous)
        *previous = dc->position;
    dc->position = POINT { x, y };
    return true;
}

bool LineTo(HDC hdc, int x, int y)
{
    std::shared_ptr<Dc> dc = findDc(hdc);
    if (!dc || !penCoordinatesOk({ x, y, dc->position.x, dc->position.y }))
        return false;
    const Pen &pen = *dc->pen.object;
    if (pen.style != PS_NULL) {
        const Surface &surface = dc->bitmap.object->surface;
        Coverage line(QRect(0, 0, surface.width, surface.height));
        line.addLine(dc->position.x, dc->position.y, x, y, pen.width);
        stroke(*dc, line, pen.color);
    }
    dc->position = POINT { x, y };
    return true;
}

bool PSet(HDC hdc, int x, int y, COLORREF color)
{
    std::shared_ptr<Dc> dc = findDc(hdc);
    if (!dc || !penCoordinatesOk({ x, y }))
        return false;
    const Surface &surface = dc->bitmap.object->surface;
    Coverage dot(QRect(0, 0, surface.width, surface.height));
    dot.addDot(x, y, dc->pen.object->width);
    stroke(*dc, dot, color);
    return true;
}

COLORREF GetPixel(HDC hdc, int x, int y)
{
    std::shared_ptr<Dc> dc = findDc(hdc);
    if (!dc)
        return CLR_INVALID;
    const Surface &surface = dc->bitmap.object->surface;
    if (x < 0 || y < 0 || x >= surface.width || y >= surface.height)
        return CLR_INVALID;
    return swapRedBlue(colorOfValue(surface, readPixel(surface.row(y), x, surface.bpp)) & 0xFFFFFFu);
}

} // namespace zelctl::gdi

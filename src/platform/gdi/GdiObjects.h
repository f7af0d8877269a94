#pragma once

#include "platform/gdi/Gdi.h"
#include "platform/gdi/Surface.h"

#include <QString>

#include <atomic>
#include <memory>
#include <mutex>
#include <new>
#include <unordered_map>

// The objects behind the handles and the table that maps handles to them.
namespace zelctl::gdi::detail {

struct Object
{
    explicit Object(int objectType)
        : type(objectType)
    { }
    virtual ~Object() = default;
    Object(const Object &) = delete;
    Object &operator=(const Object &) = delete;

    const int type;
    bool stock = false;
    // DCs holding the object; a selected object cannot be deleted.
    std::atomic<int> selections = 0;
};

// Pixel memory aligned to a cache line, so that vector loops over rows whose width is a
// multiple of 16 pixels never split a line.
inline constexpr std::align_val_t PixelAlignment { 64 };

struct AlignedDelete
{
    void operator()(quint32 *p) const { ::operator delete[](p, PixelAlignment); }
};

struct Bitmap : Object
{
    Bitmap()
        : Object(OBJ_BITMAP)
    { }
    std::unique_ptr<quint32[], AlignedDelete> storage;
    BITMAPINFOHEADER header;
    ColorTable table {};
    Surface surface;
};

struct Brush : Object
{
    Brush(COLORREF brushColor, bool isNull)
        : Object(OBJ_BRUSH)
        , color(brushColor)
        , null(isNull)
    { }
    const COLORREF color;
    const bool null;
};

struct Pen : Object
{
    Pen(int penStyle, int penWidth, COLORREF penColor)
        : Object(OBJ_PEN)
        , style(penStyle)
        , width(penWidth)
        , color(penColor)
    { }
    const int style;
    const int width;
    const COLORREF color;
};

struct Font : Object
{
    Font(QString fontFace, double fontPoints, bool fontBold)
        : Object(OBJ_FONT)
        , face(std::move(fontFace))
        , points(fontPoints)
        , bold(fontBold)
    { }
    const QString face;
    const double points;
    const bool bold;
};

// A selected object: its handle and, while selected, a reference that keeps it alive.
template <typename T> struct Selected
{
    HGDIOBJ handle = 0;
    std::shared_ptr<T> object;
};

struct Dc : Object
{
    Dc()
        : Object(OBJ_MEMDC)
    { }
    Selected<Bitmap> bitmap;
    Selected<Brush> brush;
    Selected<Pen> pen;
    Selected<Font> font;
    COLORREF textColor = 0x000000;
    COLORREF bkColor = 0xFFFFFF;
    int stretchMode = COLORONCOLOR;
    POINT brushOrigin;
    int rop2 = R2_COPYPEN;
    POINT position;
};

class HandleTable
{
public:
    static HandleTable &instance();

    HGDIOBJ add(std::shared_ptr<Object> object);
    // The object of a handle when it is of the given type, else null.
    std::shared_ptr<Object> find(HGDIOBJ handle) const;
    template <typename T> std::shared_ptr<T> find(HGDIOBJ handle, int type) const
    {
        std::shared_ptr<Object> object = find(handle);
        if (!object || object->type != type)
            return nullptr;
        return std::static_pointer_cast<T>(object);
    }
    // Removes a handle unless its object is stock or selected; false when it cannot.
    bool remove(HGDIOBJ handle, bool isDc);
    HGDIOBJ stock(int index) const;
    HBITMAP defaultBitmap() const { return m_defaultBitmap; }
    HFONT defaultFont() const { return m_defaultFont; }

private:
    HandleTable();
    HGDIOBJ addStock(std::shared_ptr<Object> object);

    mutable std::mutex m_mutex;
    std::unordered_map<HGDIOBJ, std::shared_ptr<Object>> m_objects;
    HGDIOBJ m_next = 0x1000;
    std::unordered_map<int, HGDIOBJ> m_stock;
    HBITMAP m_defaultBitmap = 0;
    HFONT m_defaultFont = 0;
};

// A bitmap with zeroed pixels; null when the header is not usable.
std::shared_ptr<Bitmap> makeBitmap(const BITMAPINFOHEADER &header, const RGBQUAD *colors, int colorCount);

} // namespace zelctl::gdi::detail

#include "PersistentSurface.h"

#include "Pictures.h"

namespace zelctl::gdi {

class PersistentSurfacePrivate
{
public:
    explicit PersistentSurfacePrivate(QWidget *widget)
        : owner(widget)
        , dc(CreateCompatibleDC(0))
        , original(GetCurrentObject(dc, OBJ_BITMAP))
    { }

    // Bitmaps need at least one pixel each way; an empty widget gets 1 × 1.
    static QSize bitmapSize(const QSize &size) { return size.expandedTo(QSize(1, 1)); }

    // Gives the bitmap the owner's size.
    void follow();

    QImage view() const
    {
        BITMAP description;
        if (!GetObject(bitmap, description))
            return QImage();
        return QImage(static_cast<const uchar *>(description.bmBits), description.bmWidth, description.bmHeight,
            description.bmWidthBytes, QImage::Format_RGB32);
    }

    QWidget *owner;
    HDC dc;
    HBITMAP original;
    HBITMAP bitmap = 0;
    QSize size;
};

PersistentSurface::PersistentSurface(QWidget *owner)
    : d(std::make_unique<PersistentSurfacePrivate>(owner))
{
    d->follow();
}

PersistentSurface::~PersistentSurface()
{
    SelectObject(d->dc, d->original);
    DeleteObject(d->bitmap);
    DeleteDC(d->dc);
}

HDC PersistentSurface::hdc() const
{
    d->follow();
    return d->dc;
}

HBITMAP PersistentSurface::bitmap() const
{
    d->follow();
    return d->bitmap;
}

QSize PersistentSurface::size() const
{
    d->follow();
    return d->size;
}

void PersistentSurface::clear(COLORREF color)
{
    d->follow();
    SetBkColor(d->dc, color);
    const HBRUSH brush = CreateSolidBrush(color);
    FillRect(d->dc, RECT { 0, 0, d->size.width(), d->size.height() }, brush);
    DeleteObject(brush);
}

void PersistentSurface::setMaskColor(COLORREF color)
{
    d->follow();
    QRegion region = opaqueRegion(d->dc, color);
    // An empty mask would mean "no mask" to Qt; a surface that is all transparent gets a
    // mask that shows nothing instead.
    if (region.isEmpty())
        region = QRegion(-1, -1, 1, 1);
    d->owner->setMask(region);
}

void PersistentSurface::clearMask()
{
    d->owner->clearMask();
}

QImage PersistentSurface::image() const
{
    d->follow();
    return d->view().copy(QRect(QPoint(0, 0), d->size));
}

void PersistentSurface::paint(QPainter &painter, const QRect &area) const
{
    d->follow();
    painter.drawImage(area, d->view(), area);
}

void PersistentSurfacePrivate::follow()
{
    const QSize wanted = bitmapSize(owner->size());
    if (bitmap && wanted == size)
        return;
    BITMAPINFO info;
    info.bmiHeader.biWidth = wanted.width();
    info.bmiHeader.biHeight = -wanted.height();
    info.bmiHeader.biBitCount = 32;
    const HBITMAP fresh = CreateDIBSection(dc, &info, DIB_RGB_COLORS, nullptr);
    if (!fresh)
        return; // too large: keep the surface we have
    const HDC scratch = CreateCompatibleDC(dc);
    const HBITMAP scratchOriginal = SelectObject(scratch, fresh);
    const HBRUSH background = CreateSolidBrush(GetBkColor(dc));
    FillRect(scratch, RECT { 0, 0, wanted.width(), wanted.height() }, background);
    DeleteObject(background);
    if (bitmap)
        BitBlt(scratch, 0, 0, size.width(), size.height(), dc, 0, 0, SRCCOPY);
    SelectObject(scratch, scratchOriginal);
    DeleteDC(scratch);

    SelectObject(dc, fresh);
    DeleteObject(bitmap);
    bitmap = fresh;
    size = wanted;
}

} // namespace zelctl::gdi

#include "stdPNGdata.h"

#include "PngDecoder.h"
#include "platform/gdi/Gdi.h"

namespace zelctl {

ZELCTL_REGISTER_CLASS(stdPNGdata)

class stdPNGdata::Private
{
public:
    gdi::HBITMAP bitmap = 0;
    gdi::HDC ownDC = 0;
    gdi::HGDIOBJ ownDCBitmap = 0; // what the own DC held before the bitmap
    png::BitmapView view;
    std::vector<uint32_t> colors;
};

stdPNGdata::stdPNGdata(QObject *parent)
    : QObject(parent)
    , d(std::make_unique<Private>())
{ }

stdPNGdata::~stdPNGdata()
{
    ReleaseBitmap();
}

bool stdPNGdata::CreateBitmap(int32_t width, int32_t height, int bitCount, const std::vector<uint32_t> &colors)
{
    ReleaseBitmap();
    if (width < 1 || height < 1 || colors.size() > 256)
        return false;
    const qsizetype stride = png::bitmapStride(width, bitCount);
    gdi::BITMAPINFO info;
    info.bmiHeader.biWidth = width;
    info.bmiHeader.biHeight = -height;
    info.bmiHeader.biBitCount = quint16(bitCount);
    info.bmiHeader.biSizeImage = quint32(int64_t(stride) * height);
    info.bmiHeader.biClrUsed = quint32(colors.size());
    for (size_t i = 0; i < colors.size(); ++i)
        info.bmiColors[i] = gdi::rgbQuad(colors[i]);
    void *bits = nullptr;
    d->bitmap = gdi::CreateDIBSection(0, &info, gdi::DIB_RGB_COLORS, &bits);
    if (!d->bitmap || !bits) {
        ReleaseBitmap();
        return false;
    }
    d->view = { static_cast<uint8_t *>(bits), width, height, stride, bitCount };
    d->colors = colors;
    SetOwnDC(true);
    return true;
}

void stdPNGdata::ReleaseBitmap()
{
    SetOwnDC(false);
    if (d->bitmap)
        gdi::DeleteObject(d->bitmap);
    d->bitmap = 0;
    d->view = {};
    d->colors.clear();
}

void stdPNGdata::SetOwnDC(bool own)
{
    if (own && !d->ownDC && d->bitmap) {
        d->ownDC = gdi::CreateCompatibleDC(0);
        d->ownDCBitmap = gdi::SelectObject(d->ownDC, d->bitmap);
    } else if (!own && d->ownDC) {
        gdi::SelectObject(d->ownDC, d->ownDCBitmap);
        gdi::DeleteDC(d->ownDC);
        d->ownDC = 0;
        d->ownDCBitmap = 0;
    }
}

bool stdPNGdata::HasBitmap() const
{
    return d->bitmap != 0;
}

qint32 stdPNGdata::BitmapHandle() const
{
    return d->bitmap;
}

qint32 stdPNGdata::OwnDC() const
{
    return d->ownDC;
}

png::BitmapView stdPNGdata::Bits() const
{
    return d->view;
}

int stdPNGdata::BitCount() const
{
    return d->view.bitCount;
}

int64_t stdPNGdata::ImageSize() const
{
    return int64_t(d->view.stride) * d->view.height;
}

const std::vector<uint32_t> &stdPNGdata::ColorTable() const
{
    return d->colors;
}

} // namespace zelctl

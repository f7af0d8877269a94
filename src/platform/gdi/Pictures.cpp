#include "Pictures.h"

#include "GdiObjects.h"
#include "Raster.h"

#include <cstring>
#include <vector>

namespace zelctl::gdi {

using namespace detail;

namespace {

// A surface with memory of its own, for pictures on their way into a blit.
struct OwnedSurface
{
    OwnedSurface(int width, int height, int bpp)
        : storage(size_t(strideFor(width, bpp) / 4) * size_t(height))
    {
        surface.bits = reinterpret_cast<uchar *>(storage.data());
        surface.width = width;
        surface.height = height;
        surface.stride = strideFor(width, bpp);
        surface.bpp = bpp;
    }
    std::vector<quint32> storage;
    Surface surface;
};

std::shared_ptr<Dc> findDc(HDC hdc)
{
    return HandleTable::instance().find<Dc>(hdc, OBJ_MEMDC);
}

} // namespace

HBITMAP createBitmapFromImage(const QImage &image)
{
    if (image.isNull())
        return 0;
    const bool alpha = image.hasAlphaChannel();
    const QImage converted = image.convertToFormat(alpha ? QImage::Format_ARGB32_Premultiplied : QImage::Format_BGR888);
    if (converted.isNull())
        return 0;
    BITMAPINFO info;
    info.bmiHeader.biWidth = converted.width();
    info.bmiHeader.biHeight = -converted.height();
    info.bmiHeader.biBitCount = alpha ? 32 : 24;
    void *bits = nullptr;
    const HBITMAP bitmap = CreateDIBSection(0, &info, DIB_RGB_COLORS, &bits);
    if (!bitmap)
        return 0;
    const qsizetype stride = strideFor(converted.width(), info.bmiHeader.biBitCount);
    const size_t rowBytes = size_t(converted.width()) * (alpha ? 4 : 3);
    for (int y = 0; y < converted.height(); ++y)
        std::memcpy(static_cast<uchar *>(bits) + y * stride, converted.constScanLine(y), rowBytes);
    return bitmap;
}

QImage imageFromBitmap(HBITMAP handle)
{
    std::shared_ptr<Bitmap> bitmap = HandleTable::instance().find<Bitmap>(handle, OBJ_BITMAP);
    if (!bitmap)
        return QImage();
    const Surface &source = bitmap->surface;
    QImage image(
        source.width, source.height, source.bpp == 32 ? QImage::Format_ARGB32_Premultiplied : QImage::Format_RGB32);
    if (image.isNull())
        return image;
    Surface target;
    target.bits = image.bits();
    target.width = image.width();
    target.height = image.height();
    target.stride = image.bytesPerLine();
    target.bpp = 32;
    stretchBlit(target, Extent { 0, 0, source.width, source.height }, source,
        Extent { 0, 0, source.width, source.height }, Rop::Copy, Sampling::Nearest);
    return image;
}

bool drawPicture(HDC hdc, const QImage &picture, int x, int y, int width, int height, quint32 rop)
{
    std::shared_ptr<Dc> dc = findDc(hdc);
    if (!dc || picture.isNull() || (rop != SRCCOPY && rop != SRCAND && rop != SRCPAINT))
        return false;
    const Surface &target = dc->bitmap.object->surface;
    const QImage source = picture.convertToFormat(QImage::Format_ARGB32_Premultiplied);
    if (source.isNull())
        return false;
    const Extent to { x, y, width, height };
    const Extent from { 0, 0, source.width(), source.height() };
    OwnedSurface pixels(source.width(), source.height(), 32);
    if (rop == SRCCOPY) {
        for (int row = 0; row < source.height(); ++row)
            std::memcpy(pixels.surface.row(row), source.constScanLine(row), size_t(source.width()) * 4);
        return alphaBlend(target, to, pixels.surface, from, 255, true);
    }
    // AND with white and OR with black change nothing, so transparent pixels become those.
    const quint32 neutral = rop == SRCAND ? 0xFFFFFFFFu : 0xFF000000u;
    for (int row = 0; row < source.height(); ++row) {
        const QRgb *in = reinterpret_cast<const QRgb *>(source.constScanLine(row));
        quint32 *out = reinterpret_cast<quint32 *>(pixels.surface.row(row));
        for (int i = 0; i < source.width(); ++i)
            out[i] = qAlpha(in[i]) < 128 ? neutral : (qUnpremultiply(in[i]) | 0xFF000000u);
    }
    const Sampling sampling = dc->stretchMode == HALFTONE ? Sampling::Area : Sampling::Nearest;
    return stretchBlit(target, to, pixels.surface, from, rop == SRCAND ? Rop::And : Rop::Or, sampling);
}

QRegion opaqueRegion(HDC hdc, COLORREF transparent)
{
    std::shared_ptr<Dc> dc = findDc(hdc);
    if (!dc)
        return QRegion();
    const Surface &surface = dc->bitmap.object->surface;
    const quint32 key = swapRedBlue(platform::translateColor(transparent));
    // Each row's runs of opaque pixels; rows with the same runs as the row above extend
    // that band, which keeps the region small for the usual shapes.
    std::vector<QRect> rects;
    std::vector<std::pair<int, int>> runs, bandRuns;
    size_t bandStart = 0;
    for (int y = 0; y < surface.height; ++y) {
        runs.clear();
        const uchar *row = surface.row(y);
        int x = 0;
        while (x < surface.width) {
            while (x < surface.width && (colorOfValue(surface, readPixel(row, x, surface.bpp)) & 0xFFFFFFu) == key)
                ++x;
            const int start = x;
            while (x < surface.width && (colorOfValue(surface, readPixel(row, x, surface.bpp)) & 0xFFFFFFu) != key)
                ++x;
            if (x > start)
                runs.emplace_back(start, x - start);
        }
        if (y > 0 && runs == bandRuns && !runs.empty()) {
            for (size_t i = bandStart; i < rects.size(); ++i)
                rects[i].setHeight(rects[i].height() + 1);
            continue;
        }
        bandStart = rects.size();
        bandRuns = runs;
        for (const auto &[start, length] : runs)
            rects.emplace_back(start, y, length, 1);
    }
    QRegion region;
    region.setRects(rects.data(), int(rects.size()));
    return region;
}

} // namespace zelctl::gdi

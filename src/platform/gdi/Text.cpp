#include "Gdi.h"

#include "GdiObjects.h"

#include "platform/SymbolFonts.h"

#include <QFontMetricsF>
#include <QGuiApplication>
#include <QImage>
#include <QPainter>
#include <QWidget>

#include <algorithm>
#include <cmath>
#include <cstring>

namespace zelctl::gdi {

using namespace detail;

namespace {

// Point sizes are meant for a 96 dots-per-inch screen.
constexpr int DotsPerMeter = 3780;

constexpr int MaxTextReach = 1 << 20;

// Fonts need the application's font database.
bool fontsAvailable()
{
    return qobject_cast<QGuiApplication *>(QCoreApplication::instance()) != nullptr;
}

QFont qFont(const Font &font)
{
    QFont result(font.face);
    result.setPointSizeF(font.points > 0 ? font.points : 8.0);
    result.setBold(font.bold);
    return result;
}

QImage metricsDevice()
{
    QImage device(1, 1, QImage::Format_RGB32);
    device.setDotsPerMeterX(DotsPerMeter);
    device.setDotsPerMeterY(DotsPerMeter);
    return device;
}

} // namespace

HFONT CreateFont(const QString &faceName, double points, bool bold)
{
    if (!(points > 0) || points > 1000)
        return 0;
    return HandleTable::instance().add(std::make_shared<Font>(faceName, points, bold));
}

bool TextOut(HDC hdc, int x, int y, const QString &text)
{
    std::shared_ptr<Dc> dc = HandleTable::instance().find<Dc>(hdc, OBJ_MEMDC);
    if (!dc || !fontsAvailable())
        return false;
    const Surface &surface = dc->bitmap.object->surface;
    if (surface.bpp != 24 && surface.bpp != 32)
        return false;
    // Text that starts past the bitmap, or so far before it that no string reaches in, is
    // wholly clipped; QPainter's fixed-point coordinates would overflow out there anyway.
    if (x >= surface.width || y >= surface.height || x < -MaxTextReach || y < -MaxTextReach)
        return true;
    // QPainter draws straight into a top-down bitmap's memory. A bottom-up bitmap is drawn
    // on a top-down copy, because glyphs drawn through a flipping transform come out
    // rasterised differently.
    const QImage::Format format = surface.bpp == 32 ? QImage::Format_RGB32 : QImage::Format_BGR888;
    QImage image = surface.topDown ? QImage(surface.bits, surface.width, surface.height, surface.stride, format)
                                   : QImage(surface.width, surface.height, format);
    const size_t rowBytes = size_t(surface.width) * size_t(surface.bpp / 8);
    if (!surface.topDown)
        for (int row = 0; row < surface.height; ++row)
            std::memcpy(image.scanLine(row), surface.row(row), rowBytes);
    image.setDotsPerMeterX(DotsPerMeter);
    image.setDotsPerMeterY(DotsPerMeter);
    {
        QPainter painter(&image);
        const QFont font = qFont(*dc->font.object);
        painter.setFont(font);
        painter.setPen(platform::toQColor(dc->textColor));
        const QFontMetricsF metrics(font, &image);
        painter.drawText(QPointF(x, y + metrics.ascent()), platform::symbolFonts::shownText(font, text));
    }
    if (!surface.topDown)
        for (int row = 0; row < surface.height; ++row)
            std::memcpy(surface.row(row), image.constScanLine(row), rowBytes);
    return true;
}

bool GetTextExtentPoint32(HDC hdc, const QString &text, SIZE &size)
{
    std::shared_ptr<Dc> dc = HandleTable::instance().find<Dc>(hdc, OBJ_MEMDC);
    if (!dc || !fontsAvailable())
        return false;
    const QImage device = metricsDevice();
    const QFont font = qFont(*dc->font.object);
    const QFontMetricsF metrics(font, &device);
    size.cx = qint32(std::ceil(metrics.horizontalAdvance(platform::symbolFonts::shownText(font, text))));
    size.cy = qint32(std::ceil(metrics.height()));
    return true;
}

bool RedrawWindow(HWND window, const RECT *rect, quint32 flags)
{
    QWidget *widget = platform::widgetOf(window);
    if (!widget)
        return false;
    QRect area = widget->rect();
    if (rect) {
        // Clamped first, so that no coordinate a host passes can overflow the arithmetic.
        const auto clampX = [&](qint32 v) { return std::clamp(v, 0, widget->width()); };
        const auto clampY = [&](qint32 v) { return std::clamp(v, 0, widget->height()); };
        const int left = clampX(rect->left), right = clampX(rect->right);
        const int top = clampY(rect->top), bottom = clampY(rect->bottom);
        if (left >= right || top >= bottom)
            return true;
        area = QRect(left, top, right - left, bottom - top);
    }
    if (flags & RDW_UPDATENOW)
        widget->repaint(area);
    else if (flags & RDW_INVALIDATE)
        widget->update(area);
    return true;
}

} // namespace zelctl::gdi

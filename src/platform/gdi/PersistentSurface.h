#pragma once

#include "zelctl_export.h"

#include "platform/gdi/Gdi.h"

#include <QImage>
#include <QPaintEvent>
#include <QPainter>
#include <QWidget>

#include <memory>

namespace zelctl::gdi {

// The off-screen image a control draws into and that is shown on every paint: a memory DC
// with a 32-bit top-down bitmap of the widget's size. The bitmap follows the widget's size
// whenever the surface is used (hidden widgets get no resize events); the pixels that still
// fit are kept and the rest filled with the DC's background colour. The DC handle stays the
// same for the surface's whole life.
class ZELCTL_EXPORT PersistentSurface
{
public:
    explicit PersistentSurface(QWidget *owner);
    ~PersistentSurface();
    PersistentSurface(const PersistentSurface &) = delete;
    PersistentSurface &operator=(const PersistentSurface &) = delete;

    HDC hdc() const;
    HBITMAP bitmap() const;
    QSize size() const;

    // Fills the surface with color, which also becomes the DC's background colour.
    void clear(COLORREF color);
    // Makes the pixels equal to color transparent on screen and to the pointer (the owner's
    // mask), as drawn now; a later drawing needs a new call.
    void setMaskColor(COLORREF color);
    void clearMask();

    // A copy of the pixels, for a Picture.
    QImage image() const;
    // Shows the surface; called from the owner's paintEvent.
    void paint(QPainter &painter, const QRect &area) const;

private:
    std::unique_ptr<class PersistentSurfacePrivate> const d;
};

// A widget base that shows a persistent surface: SurfaceHost<QWidget>, or any widget
// class such as a control's base, e.g. SurfaceHost<UserControl>.
template <typename Base> class SurfaceHost : public Base
{
public:
    using Base::Base;

    PersistentSurface &surface() { return m_surface; }

protected:
    void paintEvent(QPaintEvent *event) override
    {
        QPainter painter(this);
        m_surface.paint(painter, event->rect());
    }

private:
    PersistentSurface m_surface { this };
};

using SurfaceWidget = SurfaceHost<QWidget>;

} // namespace zelctl::gdi

#include "skSubMenu.h"

#include "skinCommon.h"

#include "frame/PropertyReaders.h"
#include "platform/Accessibility.h"
#include "platform/KeyboardFocus.h"
#include "platform/Pointer.h"
#include "platform/Twips.h"

#include <QMouseEvent>
#include <QPainter>

#include <algorithm>
#include <cmath>
#include <optional>

namespace zelctl {

namespace {

// The widest a control can be, in twips. A margin beyond it means nothing, and would
// overflow the sums that lay the caption out.
constexpr qint32 MaxMargin = QWIDGETSIZE_MAX * platform::TwipsPerPixel;

constexpr platform::OleColor DefaultForeColor = 0xFFFFFF;
constexpr platform::OleColor DefaultBackColor = 0xC3AB00;
constexpr platform::OleColor DefaultHoverForeColor = 0xFFFFFF;
constexpr platform::OleColor DefaultHoverBackColor = 0xE1D57F;
constexpr platform::OleColor DefaultActiveForeColor = 0xFFFFFF;
constexpr platform::OleColor NewActiveBackColor = 0x7FD5E1;
// A saved item without the value reads this one, not the colour of a new item.
constexpr platform::OleColor ReadActiveBackColor = 0xE1D57F;
constexpr platform::OleColor DefaultTransparencyColor = 0xFFFFFF;
constexpr platform::OleColor HoverSliceBackground = 0xC0C0C0;
constexpr platform::OleColor SliceBackground = 0xFFFFFF;

} // namespace

class skSubMenuPrivate
{
public:
    explicit skSubMenuPrivate(skSubMenu *q)
        : echo(q)
    { }

    platform::OleColor foreColor = DefaultForeColor;
    platform::OleColor backColor = DefaultBackColor;
    platform::OleColor hoverForeColor = DefaultHoverForeColor;
    platform::OleColor hoverBackColor = DefaultHoverBackColor;
    platform::OleColor activeForeColor = DefaultActiveForeColor;
    platform::OleColor activeBackColor = NewActiveBackColor;
    platform::OleColor transparencyColor = DefaultTransparencyColor;
    QString caption;
    qint32 margin = 0;
    bool active = false;
    bool hovering = false;
    skinCommon::ImageFileSlots slices;
    std::optional<skinCommon::HoverTracker> hover;
    platform::AccessibleEcho echo;
};

skSubMenu::skSubMenu(QWidget *parent)
    : SurfaceHost(parent)
    , d(std::make_unique<skSubMenuPrivate>(this))
{
    setMouseTracking(true);
    setFocusPolicy(Qt::TabFocus);
    d->hover.emplace(this, d->hovering,
        skinCommon::HoverTracker::Handlers {
            [this] { Q_EMIT MouseIn(); }, [this] { Q_EMIT MouseOut(); }, [this] { Redraw(); } });
}

skSubMenu::~skSubMenu() = default;

qint32 skSubMenu::Margin() const
{
    return d->margin;
}

void skSubMenu::setMargin(qint32 twips)
{
    d->margin = std::clamp(twips, -MaxMargin, MaxMargin);
}

platform::OleColor skSubMenu::TransparencyColor() const
{
    return d->transparencyColor;
}

void skSubMenu::setTransparencyColor(platform::OleColor color)
{
    d->transparencyColor = color;
}

platform::OleColor skSubMenu::ForeColor() const
{
    return d->foreColor;
}

void skSubMenu::setForeColor(platform::OleColor color)
{
    d->foreColor = color;
}

platform::OleColor skSubMenu::BackColor() const
{
    return d->backColor;
}

void skSubMenu::setBackColor(platform::OleColor color)
{
    d->backColor = color;
}

platform::OleColor skSubMenu::HoverForeColor() const
{
    return d->hoverForeColor;
}

void skSubMenu::setHoverForeColor(platform::OleColor color)
{
    d->hoverForeColor = color;
}

platform::OleColor skSubMenu::HoverBackColor() const
{
    return d->hoverBackColor;
}

void skSubMenu::setHoverBackColor(platform::OleColor color)
{
    d->hoverBackColor = color;
}

platform::OleColor skSubMenu::ActiveForeColor() const
{
    return d->activeForeColor;
}

void skSubMenu::setActiveForeColor(platform::OleColor color)
{
    d->activeForeColor = color;
}

platform::OleColor skSubMenu::ActiveBackColor() const
{
    return d->activeBackColor;
}

void skSubMenu::setActiveBackColor(platform::OleColor color)
{
    d->activeBackColor = color;
}

bool skSubMenu::Active() const
{
    return d->active;
}

void skSubMenu::setActive(bool active)
{
    if (active == d->active)
        return;
    d->active = active;
    Redraw();
}

bool skSubMenu::hovering() const
{
    return d->hovering;
}

QString skSubMenu::Caption() const
{
    return d->caption;
}

void skSubMenu::setCaption(const QString &caption)
{
    d->caption = caption;
    PropertyChanged(QStringLiteral("Caption"));
    Redraw();
}

QString skSubMenu::ImageFile(const QVariant &nIndex) const
{
    return d->slices.path(nIndex);
}

void skSubMenu::setImageFile(const QVariant &nIndex, const QString &path)
{
    d->slices.set(nIndex, path);
}

void skSubMenu::Redraw()
{
    if (ambient().UIDead)
        return;
    int captionWidth = 0;
    {
        const skinCommon::SelectedFont measure(surface().hdc(), font());
        captionWidth = measure.extent(d->caption).cx;
    }
    // Room for the notch and the point, each as wide as half the height, round the caption.
    const int needed = 2 * height() + captionWidth;
    if (width() < needed) {
        resize(needed, height());
        return;
    }
    const int textX = d->slices.hasPicture(0) ? drawSlices(captionWidth) : drawArrowBox();

    const gdi::HDC dc = surface().hdc();
    const skinCommon::SelectedFont captionFont(dc, font());
    const int textHeight = captionFont.extent(d->caption).cy;
    const platform::OleColor text = d->hovering ? d->hoverForeColor : d->active ? d->activeForeColor : d->foreColor;
    gdi::SetTextColor(dc, text);
    gdi::TextOut(dc, textX, (height() - textHeight) / 2, d->caption);
    update();
    d->echo.refresh();
}

int skSubMenu::drawArrowBox()
{
    using skinCommon::pixels;
    const platform::OleColor fill = d->active ? d->activeBackColor : d->hovering ? d->hoverBackColor : d->backColor;
    // The geometry is worked out in twips, one pixel per step.
    const int w = skinCommon::twips(width());
    const int h = skinCommon::twips(height());
    const int h2 = int(std::lrint(h / 2.0));

    surface().clear(d->transparencyColor);
    const gdi::HDC dc = surface().hdc();
    skinCommon::fillBox(dc, 0, 0, pixels(w - h2), height(), fill);
    int i = 0;
    for (; i <= h2; i += platform::TwipsPerPixel) {
        skinCommon::line(dc, pixels(i), pixels(i), pixels(i), pixels(h - i), d->transparencyColor);
        skinCommon::line(dc, pixels(w - h2 + i), pixels(i), pixels(w - h2 + i), pixels(h - i), fill);
    }
    if (d->transparencyColor == NoTransparency)
        surface().clearMask();
    else
        surface().setMaskColor(d->transparencyColor);
    return pixels(i + h2 + d->margin);
}

int skSubMenu::drawSlices(int captionWidth)
{
    const QImage &left = d->slices.picture(0);
    const QImage &middle = d->slices.picture(1);
    const QImage &right = d->slices.picture(2);
    surface().clear(d->hovering ? HoverSliceBackground : SliceBackground);
    if (!middle.isNull()) {
        resize(left.width() + captionWidth + middle.width() + 2 * skinCommon::pixels(d->margin), middle.height());
        gdi::drawPicture(surface().hdc(), middle, 0, 0, width(), middle.height(), gdi::SRCAND);
    }
    const gdi::HDC dc = surface().hdc();
    gdi::drawPicture(dc, left, 0, 0, left.width(), left.height(), gdi::SRCAND);
    if (!right.isNull())
        gdi::drawPicture(dc, right, width() - right.width(), 0, right.width(), right.height(), gdi::SRCAND);
    surface().clearMask();
    return left.width() + skinCommon::pixels(d->margin);
}

void skSubMenu::InitProperties()
{
    d->foreColor = DefaultForeColor;
    d->backColor = DefaultBackColor;
    d->hoverForeColor = DefaultHoverForeColor;
    d->hoverBackColor = DefaultHoverBackColor;
    d->activeForeColor = DefaultActiveForeColor;
    d->activeBackColor = NewActiveBackColor;
    d->transparencyColor = DefaultTransparencyColor;
    QFont captionFont(QStringLiteral("Arial"), 11);
    captionFont.setBold(true);
    setFont(captionFont);
}

void skSubMenu::ReadProperties(const PropertyBag &bag)
{
    const auto color = [&bag](const char *name, platform::OleColor fallback) {
        return readColor(bag, QLatin1String(name), fallback);
    };
    const platform::OleColor foreColor = color("ForeColor", DefaultForeColor);
    const platform::OleColor backColor = color("BackColor", DefaultBackColor);
    d->hoverForeColor = color("HoverForeColor", DefaultHoverForeColor);
    d->hoverBackColor = color("HoverBackColor", DefaultHoverBackColor);
    d->activeForeColor = color("ActiveForeColor", DefaultActiveForeColor);
    d->activeBackColor = color("ActiveBackColor", ReadActiveBackColor);
    d->caption = bag.ReadProperty(QStringLiteral("Caption"), ambient().DisplayName).toString();
    d->margin = readLong(bag, QStringLiteral("Margin"), 0, -MaxMargin, MaxMargin, OutOfRange::Clamp);
    d->transparencyColor = color("TransparentBack", DefaultTransparencyColor);
    setForeColor(foreColor);
    setBackColor(backColor);
}

void skSubMenu::WriteProperties(PropertyBag &bag)
{
    bag.WriteProperty(QStringLiteral("ForeColor"), d->foreColor);
    bag.WriteProperty(QStringLiteral("BackColor"), d->backColor);
    bag.WriteProperty(QStringLiteral("HoverForeColor"), d->hoverForeColor);
    bag.WriteProperty(QStringLiteral("HoverBackColor"), d->hoverBackColor);
    bag.WriteProperty(QStringLiteral("ActiveForeColor"), d->activeForeColor);
    bag.WriteProperty(QStringLiteral("ActiveBackColor"), d->activeBackColor);
    bag.WriteProperty(QStringLiteral("Caption"), d->caption);
    bag.WriteProperty(QStringLiteral("Margin"), d->margin);
    bag.WriteProperty(QStringLiteral("TransparentBack"), d->transparencyColor);
}

void skSubMenu::Terminate()
{
    d->slices.releasePictures();
}

void skSubMenu::changeEvent(QEvent *event)
{
    SurfaceHost::changeEvent(event);
    if (event->type() == QEvent::FontChange)
        Redraw();
}

void skSubMenu::resizeEvent(QResizeEvent *event)
{
    SurfaceHost::resizeEvent(event);
    Q_EMIT Resize();
}

void skSubMenu::showEvent(QShowEvent *event)
{
    SurfaceHost::showEvent(event);
    Redraw();
}

void skSubMenu::hideEvent(QHideEvent *event)
{
    SurfaceHost::hideEvent(event);
    clearHover();
}

void skSubMenu::focusOutEvent(QFocusEvent *event)
{
    SurfaceHost::focusOutEvent(event);
    clearHover();
}

void skSubMenu::mouseMoveEvent(QMouseEvent *event)
{
    if (skinCommon::raiseMouse(this, &skSubMenu::MouseMove, event))
        d->hover->moved(event);
}

void skSubMenu::leaveEvent(QEvent *event)
{
    SurfaceHost::leaveEvent(event);
    d->hover->windowLeft();
}

void skSubMenu::mousePressEvent(QMouseEvent *event)
{
    d->hover->pressed(event);
    skinCommon::raiseMouse(this, &skSubMenu::MouseDown, event);
}

void skSubMenu::mouseDoubleClickEvent(QMouseEvent *)
{
    // The second press of a double click starts no second click.
}

void skSubMenu::mouseReleaseEvent(QMouseEvent *event)
{
    if (!skinCommon::raiseMouse(this, &skSubMenu::MouseUp, event))
        return;
    d->active = false;
    d->hovering = false;
    Redraw();
    if (d->hover->releasedForClick(event))
        click();
    else if (platform::capturedWidget() == this && event->buttons() == Qt::NoButton)
        platform::releaseCapture();
}

void skSubMenu::keyPressEvent(QKeyEvent *event)
{
    if (platform::pressesButton(*event))
        click();
    else
        SurfaceHost::keyPressEvent(event);
}

void skSubMenu::paintEvent(QPaintEvent *event)
{
    SurfaceHost::paintEvent(event);
    if (platform::showsFocusMark(*this)) {
        QPainter painter(this);
        platform::paintFocusMark(painter, rect().adjusted(0, 0, -height() / 2, 0));
    }
}

void skSubMenu::clearHover()
{
    if (!std::exchange(d->hovering, false))
        return;
    if (platform::capturedWidget() == this)
        platform::releaseCapture();
    Redraw();
}

void skSubMenu::click()
{
    const QPointer<skSubMenu> alive(this);
    Q_EMIT Clicked();
    if (!alive)
        return;
    d->active = false;
    d->hovering = false;
    Redraw();
    Q_EMIT MouseOut();
}

ZELCTL_REGISTER_CLASS(skSubMenu)

} // namespace zelctl

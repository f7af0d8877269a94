#include "skNumber.h"

#include "skinCommon.h"

#include "frame/PropertyReaders.h"
#include "platform/Accessibility.h"
#include "platform/KeyboardFocus.h"

#include <QMouseEvent>
#include <QPainter>

#include <cmath>
#include <optional>

namespace zelctl {

namespace {

constexpr platform::OleColor DefaultBackColor = 0xFFFFFF;
constexpr platform::OleColor DefaultBackground = 0x404040;
constexpr platform::OleColor DefaultForeground = 0xFFFFFF;
constexpr platform::OleColor DefaultBackgroundActive = 0x5652B8;
constexpr platform::OleColor DefaultForegroundActive = 0xFFFFFF;
constexpr qint32 DefaultBackStyle = skNumber::Transparent;

// Sets one point as a dot of the given diameter, in copy or XOR pen mode.
void dot(gdi::HDC dc, int x, int y, int diameter, platform::OleColor color, int penMode)
{
    const gdi::HPEN pen = gdi::CreatePen(gdi::PS_SOLID, diameter, color);
    const gdi::HGDIOBJ previous = gdi::SelectObject(dc, pen);
    gdi::SetROP2(dc, penMode);
    gdi::PSet(dc, x, y, color);
    gdi::SetROP2(dc, gdi::R2_COPYPEN);
    gdi::SelectObject(dc, previous);
    gdi::DeleteObject(pen);
}

} // namespace

class skNumberPrivate
{
public:
    explicit skNumberPrivate(skNumber *q)
        : echo(q)
    { }

    platform::OleColor backColor = DefaultBackColor;
    platform::OleColor background = DefaultBackground;
    platform::OleColor foreground = DefaultForeground;
    platform::OleColor backgroundActive = DefaultBackgroundActive;
    platform::OleColor foregroundActive = DefaultForegroundActive;
    bool active = false;
    qint32 backStyle = DefaultBackStyle;
    QString caption;
    QString skinId;
    std::optional<skinCommon::HoverTracker> hover;
    platform::AccessibleEcho echo;
};

skNumber::skNumber(QWidget *parent)
    : SurfaceHost(parent)
    , d(std::make_unique<skNumberPrivate>(this))
{
    setMouseTracking(true);
    setFocusPolicy(Qt::TabFocus);
    // The pointer resting on the badge is what makes it active; leaving gives the capture
    // back even with a button held.
    d->hover.emplace(this, d->active,
        skinCommon::HoverTracker::Handlers {
            [this] { Q_EMIT MouseIn(); }, [this] { Q_EMIT MouseOut(); }, [this] { redraw(); } },
        skinCommon::HoverTracker::HeldLeave::ReleaseCapture);
}

skNumber::~skNumber() = default;

QString skNumber::Caption() const
{
    return d->caption;
}

void skNumber::setCaption(const QString &caption)
{
    d->caption = caption;
    PropertyChanged(QStringLiteral("Caption"));
    redraw();
}

platform::OleColor skNumber::BackColor() const
{
    return d->backColor;
}

void skNumber::setBackColor(platform::OleColor color)
{
    d->backColor = color;
    redraw();
}

platform::OleColor skNumber::Background() const
{
    return d->background;
}

void skNumber::setBackground(platform::OleColor color)
{
    d->background = color;
    redraw();
}

platform::OleColor skNumber::BackgroundActive() const
{
    return d->backgroundActive;
}

void skNumber::setBackgroundActive(platform::OleColor color)
{
    d->backgroundActive = color;
    redraw();
}

platform::OleColor skNumber::Foreground() const
{
    return d->foreground;
}

void skNumber::setForeground(platform::OleColor color)
{
    d->foreground = color;
    redraw();
}

platform::OleColor skNumber::ForegroundActive() const
{
    return d->foregroundActive;
}

void skNumber::setForegroundActive(platform::OleColor color)
{
    d->foregroundActive = color;
    redraw();
}

bool skNumber::Active() const
{
    return d->active;
}

void skNumber::setActive(bool active)
{
    if (active == d->active)
        return;
    d->active = active;
    redraw();
}

qint32 skNumber::BackStyle() const
{
    return d->backStyle;
}

void skNumber::setBackStyle(qint32 style)
{
    style = style == Opaque ? Opaque : Transparent;
    if (style == d->backStyle)
        return;
    d->backStyle = style;
    PropertyChanged(QStringLiteral("BackStyle"));
    redraw();
}

QString skNumber::SkinID() const
{
    return d->skinId;
}

void skNumber::setSkinID(const QString &skinId)
{
    if (skinId == d->skinId)
        return;
    d->skinId = skinId;
    PropertyChanged(QStringLiteral("SkinID"));
    Q_EMIT RequestSkinRepait();
}

void skNumber::InitProperties()
{
    d->background = DefaultBackground;
    d->foreground = DefaultForeground;
    d->backgroundActive = DefaultBackgroundActive;
    d->foregroundActive = DefaultForegroundActive;
    redraw();
}

void skNumber::ReadProperties(const PropertyBag &bag)
{
    const auto color = [&bag](const char *name, platform::OleColor fallback) {
        return readColor(bag, QLatin1String(name), fallback);
    };
    d->caption = bag.ReadProperty(QStringLiteral("Caption"), QStringLiteral("1")).toString();
    d->background = color("Background", DefaultBackground);
    d->foreground = color("Foreground", DefaultForeground);
    d->backgroundActive = color("BackgroundActive", DefaultBackgroundActive);
    d->foregroundActive = color("ForegroundActive", DefaultForegroundActive);
    d->active = readBoolean(bag, QStringLiteral("Active"), false);
    d->skinId = bag.ReadProperty(QStringLiteral("SkinID"), QString()).toString();
    d->backStyle
        = bag.ReadProperty(QStringLiteral("BackStyle"), DefaultBackStyle).toInt() == Opaque ? Opaque : Transparent;
    setBackColor(color("BackColor", DefaultBackColor));
}

void skNumber::WriteProperties(PropertyBag &bag)
{
    bag.WriteProperty(QStringLiteral("Caption"), d->caption, QString());
    bag.WriteProperty(QStringLiteral("BackColor"), d->backColor, DefaultBackColor);
    bag.WriteProperty(QStringLiteral("Background"), d->background, DefaultBackground);
    bag.WriteProperty(QStringLiteral("Foreground"), d->foreground, DefaultForeground);
    bag.WriteProperty(QStringLiteral("BackgroundActive"), d->backgroundActive, DefaultBackgroundActive);
    bag.WriteProperty(QStringLiteral("ForegroundActive"), d->foregroundActive, DefaultForegroundActive);
    bag.WriteProperty(QStringLiteral("Active"), d->active);
    bag.WriteProperty(QStringLiteral("SkinID"), d->skinId, QString());
    bag.WriteProperty(QStringLiteral("BackStyle"), d->backStyle, DefaultBackStyle);
}

void skNumber::redraw()
{
    const gdi::HDC dc = surface().hdc();
    surface().clear(d->backColor);
    const int w = width();
    const int h = height();
    const platform::OleColor disc = d->active ? d->backgroundActive : d->background;
    const platform::OleColor text = d->active ? d->foregroundActive : d->foreground;

    // The caption grows with the badge, down to a smallest readable size.
    QFont captionFont = font();
    captionFont.setPointSize(w <= 16 ? 6 : w / 2);
    setFont(captionFont);

    // The XOR pass leaves a one-pixel ring of mixed colour round the solid disc.
    dot(dc, w / 2, h / 2, w - 1, disc, gdi::R2_XORPEN);
    dot(dc, w / 2, h / 2, w - 2, disc, gdi::R2_COPYPEN);
    // The see-through part is what lies round the disc: taken before the caption is
    // printed, so a caption in the background's colour stays part of the badge.
    if (d->backStyle == Transparent)
        surface().setMaskColor(d->backColor);
    else
        surface().clearMask();

    if (!d->caption.isEmpty()) {
        const skinCommon::SelectedFont selected(dc, captionFont);
        const gdi::SIZE extent = selected.extent(d->caption);
        gdi::SetTextColor(dc, text);
        gdi::TextOut(dc, int(std::floor((w - extent.cx) / 2.0)), int(std::floor((h - extent.cy) / 2.0)), d->caption);
    }
    update();
    d->echo.refresh();
}

void skNumber::resizeEvent(QResizeEvent *event)
{
    SurfaceHost::resizeEvent(event);
    if (width() != height())
        resize(width(), width());
    else
        redraw();
}

void skNumber::mouseMoveEvent(QMouseEvent *event)
{
    d->hover->moved(event);
}

void skNumber::leaveEvent(QEvent *event)
{
    SurfaceHost::leaveEvent(event);
    d->hover->windowLeft();
}

void skNumber::mousePressEvent(QMouseEvent *event)
{
    d->hover->pressed(event);
    skinCommon::raiseMouse(this, &skNumber::MouseDown, event);
}

void skNumber::mouseReleaseEvent(QMouseEvent *event)
{
    if (skinCommon::raiseMouse(this, &skNumber::MouseUp, event) && d->hover->releasedForClick(event))
        Q_EMIT Clicked();
}

void skNumber::mouseDoubleClickEvent(QMouseEvent *event)
{
    if (event->button() == Qt::LeftButton)
        Q_EMIT DoubleClicked();
}

void skNumber::keyPressEvent(QKeyEvent *event)
{
    if (platform::pressesButton(*event))
        Q_EMIT Clicked();
    else
        SurfaceHost::keyPressEvent(event);
}

void skNumber::paintEvent(QPaintEvent *event)
{
    SurfaceHost::paintEvent(event);
    if (platform::showsFocusMark(*this)) {
        QPainter painter(this);
        platform::paintFocusMark(painter, rect().adjusted(1, 1, -1, -1), true);
    }
}

ZELCTL_REGISTER_CLASS(skNumber)

} // namespace zelctl

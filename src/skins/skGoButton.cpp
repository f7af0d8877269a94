#include "skGoButton.h"

#include "skinCommon.h"

#include "platform/Accessibility.h"
#include "platform/KeyboardFocus.h"
#include "platform/Pointer.h"
#include "tips/clsBalloonTip.h"

#include <QMouseEvent>
#include <QPainter>

#include <array>
#include <optional>

namespace zelctl {

namespace {

constexpr int SlotCount = 6;
constexpr int NormalSlot = 0;
constexpr int HoverSlot = 1;
constexpr int PressedSlot = 2;
constexpr platform::OleColor MaskColor = 0x000000;
constexpr platform::OleColor DisabledGrey = 0x787878;

} // namespace

class skGoButtonPrivate
{
public:
    explicit skGoButtonPrivate(skGoButton *q)
        : echo(q)
    { }

    bool hovering = false;
    bool clicking = false;
    std::array<QString, SlotCount> paths;
    std::array<QImage, SlotCount> pictures;
    QString skinId;
    bool active = false;
    std::unique_ptr<clsBalloonTip> tip;
    std::optional<skinCommon::HoverTracker> hover;
    platform::AccessibleEcho echo;
};

skGoButton::skGoButton(QWidget *parent)
    : SurfaceHost(parent)
    , d(std::make_unique<skGoButtonPrivate>(this))
{
    setMouseTracking(true);
    setFocusPolicy(Qt::TabFocus);
    d->hover.emplace(this, d->hovering,
        skinCommon::HoverTracker::Handlers {
            [this] { Q_EMIT MouseIn(); }, [this] { Q_EMIT MouseOut(); }, [this] { Repaint(); } });
}

skGoButton::~skGoButton() = default;

bool skGoButton::Hovering() const
{
    return d->hovering;
}

void skGoButton::setHovering(bool hovering)
{
    d->hovering = hovering;
}

bool skGoButton::Clicking() const
{
    return d->clicking;
}

void skGoButton::setClicking(bool clicking)
{
    d->clicking = clicking;
}

QString skGoButton::ImageSource(qint32 imgID) const
{
    if (imgID < 0 || imgID >= SlotCount)
        return QString();
    return d->paths[size_t(imgID)];
}

qint32 skGoButton::setImageSource(qint32 imgID, const QString &path)
{
    if (imgID < 0 || imgID >= SlotCount)
        return skinCommon::ErrSubscriptOutOfRange;
    const auto slot = size_t(imgID);
    d->paths[slot] = path;
    if (path.isEmpty()) {
        d->pictures[slot] = QImage();
        return skinCommon::ErrNone;
    }
    return skinCommon::loadPicture(path, d->pictures[slot]);
}

QString skGoButton::SkinID() const
{
    return d->skinId;
}

void skGoButton::setSkinID(const QString &skinId)
{
    if (skinId == d->skinId)
        return;
    d->skinId = skinId;
    PropertyChanged(QStringLiteral("SkinID"));
    Q_EMIT RequestSkinRepait();
}

QString skGoButton::Tooltip() const
{
    return d->tip ? d->tip->TipText() : QString();
}

void skGoButton::setTooltip(const QString &text)
{
    if (text.isEmpty()) {
        d->tip.reset();
    } else {
        auto tip = std::make_unique<clsBalloonTip>();
        tip->setMvarParentControlhwnd(hWnd());
        tip->setTipText(text);
        tip->setTitle(QStringLiteral("Navegação"));
        tip->setStyle(clsBalloonTip::TTBalloon);
        tip->Create();
        d->tip = std::move(tip);
    }
    d->echo.refresh();
    PropertyChanged(QStringLiteral("Tooltip"));
}

bool skGoButton::Active() const
{
    return d->active;
}

void skGoButton::setActive(bool active)
{
    if (active == d->active)
        return;
    d->active = active;
    Repaint();
}

bool skGoButton::Enabled() const
{
    return !testAttribute(Qt::WA_ForceDisabled);
}

void skGoButton::setEnabled(bool enabled)
{
    if (enabled == Enabled())
        return;
    QWidget::setEnabled(enabled);
    // No change event when a disabled container keeps the button disabled anyway.
    Repaint();
}

void skGoButton::Repaint()
{
    const gdi::HDC dc = surface().hdc();
    const int side = width();
    surface().clear(MaskColor);
    const size_t slot = d->active ? PressedSlot : d->hovering ? HoverSlot : NormalSlot;
    if (!d->pictures[slot].isNull())
        gdi::drawPicture(dc, d->pictures[slot], 0, 0, side, side);
    surface().setMaskColor(MaskColor);
    if (!isEnabled()) {
        // The normal picture ANDed on a mid grey: a darkened, greyish copy of itself.
        skinCommon::fillBox(dc, 0, 0, side, side, DisabledGrey);
        if (!d->pictures[NormalSlot].isNull())
            gdi::drawPicture(dc, d->pictures[NormalSlot], 0, 0, side, side, gdi::SRCAND);
    }
    update();
    d->echo.refresh();
}

void skGoButton::ReadProperties(const PropertyBag &bag)
{
    d->skinId = bag.ReadProperty(QStringLiteral("SkinID"), QString()).toString();
    setTooltip(bag.ReadProperty(QStringLiteral("Tooltip"), QString()).toString());
    if (designMode())
        loadDesignPreview();
}

void skGoButton::WriteProperties(PropertyBag &bag)
{
    bag.WriteProperty(QStringLiteral("SkinID"), d->skinId, QString());
    bag.WriteProperty(QStringLiteral("Tooltip"), Tooltip(), QString());
}

void skGoButton::Terminate()
{
    d->tip.reset();
}

void skGoButton::AmbientChanged(const QString &name)
{
    // A container turning into a form designer shows the preview pictures at once.
    if (name == QLatin1String("UserMode") && designMode()) {
        loadDesignPreview();
        Repaint();
    }
}

void skGoButton::changeEvent(QEvent *event)
{
    SurfaceHost::changeEvent(event);
    // The container disabling the form greys the button too.
    if (event->type() == QEvent::EnabledChange)
        Repaint();
}

void skGoButton::resizeEvent(QResizeEvent *event)
{
    SurfaceHost::resizeEvent(event);
    const int side = std::min(width(), height());
    if (width() != side || height() != side)
        resize(side, side);
    else
        Repaint();
    Q_EMIT Resize();
}

void skGoButton::mouseMoveEvent(QMouseEvent *event)
{
    if (skinCommon::raiseMouse(this, &skGoButton::MouseMove, event))
        d->hover->moved(event);
}

void skGoButton::leaveEvent(QEvent *event)
{
    SurfaceHost::leaveEvent(event);
    d->hover->windowLeft();
}

void skGoButton::mousePressEvent(QMouseEvent *event)
{
    if (!skinCommon::raiseMouse(this, &skGoButton::MouseDown, event))
        return;
    d->hover->pressed(event);
    if (event->button() == Qt::LeftButton) {
        if (!d->active) {
            setActive(true);
            Repaint();
        }
    }
}

void skGoButton::mouseDoubleClickEvent(QMouseEvent *)
{
    // The second press of a double click starts no click of its own: the first press already
    // made one, and the button raises no double click.
}

void skGoButton::mouseReleaseEvent(QMouseEvent *event)
{
    if (!skinCommon::raiseMouse(this, &skGoButton::MouseUp, event) || event->button() != Qt::LeftButton)
        return;
    if (d->active) {
        setActive(false);
        Repaint();
    }
    if (d->hover->releasedForClick(event))
        click();
    else if (!d->hovering && platform::capturedWidget() == this)
        platform::releaseCapture();
}

void skGoButton::keyPressEvent(QKeyEvent *event)
{
    if (platform::pressesButton(*event))
        click();
    else
        SurfaceHost::keyPressEvent(event);
}

void skGoButton::paintEvent(QPaintEvent *event)
{
    SurfaceHost::paintEvent(event);
    if (platform::showsFocusMark(*this)) {
        QPainter painter(this);
        platform::paintFocusMark(painter, rect().adjusted(2, 2, -2, -2), true);
    }
}

void skGoButton::loadDesignPreview()
{
    const QString folder = skinCommon::previewFolder();
    const char *const names[] = { "btn_go_normal.gif", "btn_go_hover.gif", "btn_go_click.gif" };
    for (size_t slot = 0; slot < std::size(names); ++slot)
        skinCommon::loadPicture(folder + QLatin1String(names[slot]), d->pictures[slot]);
}

void skGoButton::click()
{
    bool changed = false;
    if (d->active) {
        d->active = false;
        changed = true;
    }
    if (d->hovering) {
        d->hovering = false;
        platform::releaseCapture();
        changed = true;
    }
    if (changed)
        Repaint();
    const QPointer<skGoButton> alive(this);
    Q_EMIT Click();
    if (alive)
        Q_EMIT MouseOut();
}

ZELCTL_REGISTER_CLASS(skGoButton)

} // namespace zelctl

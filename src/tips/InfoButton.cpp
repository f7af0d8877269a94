#include "InfoButton.h"

#include "common/modFuncs.h"
#include "frame/PropertyReaders.h"
#include "platform/Accessibility.h"
#include "platform/KeyboardFocus.h"
#include "platform/Shell.h"

#include <QFileInfo>
#include <QKeyEvent>
#include <QMouseEvent>
#include <QPainter>

namespace zelctl {

namespace {

constexpr int SizePixels = 16; // 240 twips

const char *iconName(InfoButton::IB_STYLE_ENUM style, bool enabled)
{
    switch (style) {
    case InfoButton::IB_WARNING:
        return enabled ? "WARNING" : "WARNING_DISABLED";
    case InfoButton::IB_ERROR:
        // There is no greyed error icon.
        return enabled ? "ERROR" : "WARNING_DISABLED";
    case InfoButton::IB_INFO:
        break;
    }
    return enabled ? "INFO" : "INFO_DISABLED";
}

clsBalloonTip::ttIconType tipIcon(InfoButton::IB_STYLE_ENUM style)
{
    switch (style) {
    case InfoButton::IB_WARNING:
        return clsBalloonTip::TTIconWarning;
    case InfoButton::IB_ERROR:
        return clsBalloonTip::TTIconError;
    case InfoButton::IB_INFO:
        break;
    }
    return clsBalloonTip::TTIconInfo;
}

// "||" and a literal "\n" are the line breaks a host can write in a property.
QString tipLines(const QString &text)
{
    QString lines = text.trimmed();
    lines.replace(QLatin1String("||"), QLatin1String("\r\n"));
    lines.replace(QLatin1String("\\n"), QLatin1String("\r\n"));
    return lines;
}

// Relative documents are opened from the application's root folder.
QString shellTarget(const QString &action)
{
    if (QFileInfo(action).isRelative()) {
        const QString inRoot = modFuncs::GetRootPath() + action;
        if (QFileInfo::exists(inRoot))
            return inRoot;
    }
    return action;
}

} // namespace

class InfoButtonPrivate
{
public:
    explicit InfoButtonPrivate(InfoButton *q)
        : echo(q)
    { }

    QString toolTipTitle;
    InfoButton::TT_STYLE_ENUM toolTipStyle = InfoButton::TTS_DEFAULT;
    QString action;
    QString tipText;
    InfoButton::IB_STYLE_ENUM style = InfoButton::IB_INFO;
    qint32 target = 0;
    QString shownText;
    bool tipDirty = false;
    bool transparent = false;
    bool pressed = false;
    QPixmap icon;
    std::unique_ptr<clsBalloonTip> tip = std::make_unique<clsBalloonTip>();
    platform::AccessibleEcho echo;
};

InfoButton::InfoButton(QWidget *parent)
    : UserControl(parent)
    , d(std::make_unique<InfoButtonPrivate>(this))
{
    d->target = hWnd();
    setFixedSize(SizePixels, SizePixels);
    setMouseTracking(true);
    // Reached with Tab, pressed with Space or Enter; a click leaves the focus where it was.
    setFocusPolicy(Qt::TabFocus);
    paintIcon();
}

InfoButton::~InfoButton() = default;

bool InfoButton::Enabled() const
{
    return !testAttribute(Qt::WA_ForceDisabled);
}

void InfoButton::setEnabled(bool enabled)
{
    const bool changed = enabled != Enabled();
    QWidget::setEnabled(enabled);
    paintIcon();
    if (changed)
        PropertyChanged(QStringLiteral("ibutton.enabled"));
}

QString InfoButton::Action() const
{
    return d->action;
}

void InfoButton::setAction(const QString &action)
{
    const QString trimmed = action.trimmed();
    if (trimmed == d->action)
        return;
    d->action = trimmed;
    if (trimmed.isEmpty())
        unsetCursor();
    else
        setCursor(Qt::PointingHandCursor);
    PropertyChanged(QStringLiteral("ibutton.action"));
}

QString InfoButton::ToolTipTitle() const
{
    return d->toolTipTitle;
}

void InfoButton::setToolTipTitle(const QString &title)
{
    if (title == d->toolTipTitle)
        return;
    d->toolTipTitle = title;
    d->tipDirty = true;
    d->echo.refresh();
    PropertyChanged(QStringLiteral("ibutton.title"));
}

InfoButton::TT_STYLE_ENUM InfoButton::ToolTipStyle() const
{
    return d->toolTipStyle;
}

void InfoButton::setToolTipStyle(TT_STYLE_ENUM style)
{
    if (style == d->toolTipStyle || (style != TTS_DEFAULT && style != TTS_BALLOON))
        return;
    d->toolTipStyle = style;
    d->tipDirty = true;
    PropertyChanged(QStringLiteral("ibutton.style"));
}

InfoButton::IB_STYLE_ENUM InfoButton::Style() const
{
    return d->style;
}

void InfoButton::setStyle(IB_STYLE_ENUM style)
{
    if (style < IB_INFO || style > IB_ERROR)
        return;
    const bool changed = style != d->style;
    d->style = style;
    setEnabled(Enabled());
    d->echo.refresh();
    if (changed)
        PropertyChanged(QStringLiteral("ibutton.bstyle"));
}

qint32 InfoButton::TargethWnd() const
{
    return d->target;
}

void InfoButton::setTargethWnd(qint32 hwnd)
{
    d->target = hwnd;
}

QString InfoButton::TipText() const
{
    return d->tipText;
}

void InfoButton::setTipText(const QString &text)
{
    if (text == d->tipText)
        return;
    d->tipText = text;
    d->echo.refresh();
    PropertyChanged(QStringLiteral("ibutton.tiptext"));
}

bool InfoButton::Transparent() const
{
    return d->transparent;
}

void InfoButton::setTransparent(bool transparent)
{
    if (transparent == d->transparent)
        return;
    d->transparent = transparent;
    update();
    PropertyChanged(QStringLiteral("ibutton.transparent"));
}

void InfoButton::PopupTip()
{
    if (d->tip)
        d->tip->ShowNow();
}

clsBalloonTip *InfoButton::GetTooltipClass() const
{
    return d->tip.get();
}

void InfoButton::InitProperties()
{
    setEnabled(true);
    setToolTipStyle(TTS_BALLOON);
    setToolTipTitle(QStringLiteral("Informação"));
    setStyle(IB_INFO);
}

void InfoButton::ReadProperties(const PropertyBag &bag)
{
    setAction(bag.ReadProperty(QStringLiteral("ibutton.action"), QString()).toString());
    setStyle(IB_STYLE_ENUM(readLong(bag, QStringLiteral("ibutton.bstyle"), IB_INFO, IB_INFO, IB_ERROR)));
    setToolTipStyle(
        TT_STYLE_ENUM(readLong(bag, QStringLiteral("ibutton.style"), TTS_BALLOON, TTS_DEFAULT, TTS_BALLOON)));
    setToolTipTitle(bag.ReadProperty(QStringLiteral("ibutton.title"), QStringLiteral("Informação")).toString());
    setEnabled(readBoolean(bag, QStringLiteral("ibutton.enabled"), true));
    const QVariant plainTip = bag.ReadProperty(QStringLiteral("ToolTipText"), QString());
    setTipText(bag.ReadProperty(QStringLiteral("ibutton.tiptext"), plainTip).toString());
    setTransparent(readBoolean(bag, QStringLiteral("ibutton.transparent"), false));
}

void InfoButton::WriteProperties(PropertyBag &bag)
{
    bag.WriteProperty(QStringLiteral("ibutton.action"), d->action);
    bag.WriteProperty(QStringLiteral("ibutton.enabled"), Enabled());
    bag.WriteProperty(QStringLiteral("ibutton.bstyle"), qint32(d->style));
    bag.WriteProperty(QStringLiteral("ibutton.style"), qint32(d->toolTipStyle));
    bag.WriteProperty(QStringLiteral("ibutton.title"), d->toolTipTitle);
    bag.WriteProperty(QStringLiteral("ibutton.tiptext"), d->tipText);
    bag.WriteProperty(QStringLiteral("ibutton.transparent"), d->transparent);
}

void InfoButton::Terminate()
{
    removeTip();
}

void InfoButton::AmbientChanged(const QString &name)
{
    if (name == QLatin1String("BackColor"))
        update();
}

void InfoButton::paintEvent(QPaintEvent *)
{
    QPainter painter(this);
    if (!d->transparent)
        painter.fillRect(rect(), platform::toQColor(ambient().BackColor));
    painter.drawPixmap(rect(), d->icon);
    if (platform::showsFocusMark(*this))
        platform::paintFocusMark(painter, rect());
}

void InfoButton::changeEvent(QEvent *event)
{
    // The container disabling a form greys the icon too.
    if (event->type() == QEvent::EnabledChange)
        paintIcon();
    UserControl::changeEvent(event);
}

void InfoButton::mouseMoveEvent(QMouseEvent *event)
{
    syncTip();
    UserControl::mouseMoveEvent(event);
}

void InfoButton::keyPressEvent(QKeyEvent *event)
{
    if (platform::pressesButton(*event)) {
        // The keyboard never moved the pointer over the button: the tip is brought up to date here.
        syncTip();
        click();
        return;
    }
    UserControl::keyPressEvent(event);
}

void InfoButton::syncTip()
{
    // A plain tooltip given by the container becomes the balloon's text, so only one shows.
    if (d->tipText.isEmpty() && !extender().ToolTipText().isEmpty()) {
        setTipText(extender().ToolTipText());
        extender().setToolTipText(QString());
    }
    if (d->tipText != d->shownText || d->tipDirty) {
        d->shownText = d->tipText;
        if (d->shownText.trimmed().isEmpty())
            removeTip();
        else
            buildTip();
    }
}

void InfoButton::mousePressEvent(QMouseEvent *event)
{
    if (event->button() == Qt::LeftButton)
        d->pressed = true;
    UserControl::mousePressEvent(event);
}

void InfoButton::mouseReleaseEvent(QMouseEvent *event)
{
    // Accepted, so the release does not travel on to the container, which the host may
    // have deleted together with the button in Click.
    event->accept();
    if (event->button() == Qt::LeftButton && std::exchange(d->pressed, false)
        && rect().contains(event->position().toPoint()))
        click();
}

void InfoButton::mouseDoubleClickEvent(QMouseEvent *event)
{
    // The second press of a double click is not a new press: one double click opens the
    // Action once.
    event->accept();
}

void InfoButton::paintIcon()
{
    const QPixmap icon(QStringLiteral(":/zelctl/icons/%1.png").arg(QLatin1String(iconName(d->style, isEnabled()))));
    if (icon.isNull())
        return;
    d->icon = icon;
    update();
}

void InfoButton::buildTip()
{
    if (!d->tip)
        d->tip = std::make_unique<clsBalloonTip>();
    d->tip->setStyle(clsBalloonTip::ttStyleEnum(d->toolTipStyle));
    d->tip->setMvarParentControlhwnd(d->target != 0 ? d->target : hWnd());
    d->tip->setTitle(d->toolTipTitle);
    d->tip->setIcon(tipIcon(d->style));
    d->tip->setTipText(tipLines(d->shownText));
    d->tip->Create();
    d->tipDirty = false;
}

void InfoButton::removeTip()
{
    if (!d->tip)
        return;
    d->tip->DestroyTip();
    d->tip.reset();
}

void InfoButton::click()
{
    const QString kind = d->action.toLower();
    if (kind.isEmpty()) {
        PopupTip();
    } else if (kind == QLatin1String("nothing")) {
        return;
    } else if (kind != QLatin1String("click")) {
        // A failure to open is not the user's business here; Click still tells the host.
        platform::shellOpen(shellTarget(d->action));
    }
    Q_EMIT Click();
}

ZELCTL_REGISTER_CLASS(InfoButton)

} // namespace zelctl

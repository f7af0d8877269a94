#include "clsBalloonTip.h"

#include "frame/ClassRegistry.h"
#include "platform/WindowHandles.h"
#include "tips/TooltipControl.h"

#include <QPointer>
#include <QWidget>

namespace zelctl {

using namespace tooltipControl;

namespace {

qint32 &tooltipCount()
{
    thread_local qint32 count = 0;
    return count;
}

WPARAM colourParameter(qint32 color)
{
    return static_cast<quint32>(color);
}

} // namespace

class clsBalloonTipPrivate
{
public:
    LiveObject live;
    qint32 parentHwnd = 0;
    qint32 tipHwnd = 0;
    QString tipText;
    QByteArray tipTextBytes;
    qint32 initialDelay = 500;
    qint32 displayTime = 10000;
    qint32 backColor = 0;
    QString title;
    QByteArray titleBytes;
    qint32 foreColor = 0;
    QPointer<QObject> parentObject;
    clsBalloonTip::ttIconType icon = clsBalloonTip::TTIconInfo;
    bool centered = false;
    clsBalloonTip::ttStyleEnum style = clsBalloonTip::TTBalloon;
    bool popupOnDemand = true;
    // Registered with the tip window and kept for the object's whole life.
    TOOLINFOA tool;

    LRESULT send(UINT message, WPARAM wParam, LPARAM lParam) const
    {
        return SendMessageA(tipHwnd, message, wParam, lParam);
    }
    void sendTitle() const { send(TTM_SETTITLEA, WPARAM(icon), reinterpret_cast<LPARAM>(titleBytes.constData())); }
    void resendTitleIfComplete() const
    {
        if (tipHwnd != 0 && !title.isEmpty() && icon != clsBalloonTip::TTNoIcon)
            sendTitle();
    }
};

clsBalloonTip::clsBalloonTip(QObject *parent)
    : QObject(parent)
    , d(std::make_unique<clsBalloonTipPrivate>())
{
    d->tool.cbSize = TOOLINFOA_SIZE;
    d->tool.lpszText = d->tipTextBytes.constData();
    setIcon(TTIconInfo);
    setPopupOnDemand(true);
    setStyle(TTBalloon);
}

clsBalloonTip::~clsBalloonTip()
{
    DestroyTip();
}

qint32 clsBalloonTip::mvarParentControlhwnd() const
{
    return d->parentHwnd;
}

void clsBalloonTip::setMvarParentControlhwnd(qint32 hwnd)
{
    d->parentHwnd = hwnd;
}

qint32 clsBalloonTip::lHwnd() const
{
    return d->tipHwnd;
}

void clsBalloonTip::setLHwnd(qint32 hwnd)
{
    d->tipHwnd = hwnd;
}

clsBalloonTip::ttStyleEnum clsBalloonTip::Style() const
{
    return d->style;
}

void clsBalloonTip::setStyle(ttStyleEnum style)
{
    d->style = style;
}

bool clsBalloonTip::PopupOnDemand() const
{
    return d->popupOnDemand;
}

void clsBalloonTip::setPopupOnDemand(bool onDemand)
{
    d->popupOnDemand = onDemand;
}

bool clsBalloonTip::Centered() const
{
    return d->centered;
}

void clsBalloonTip::setCentered(bool centered)
{
    d->centered = centered;
}

QObject *clsBalloonTip::ParentControl() const
{
    return d->parentObject;
}

void clsBalloonTip::setParentControl(QObject *control)
{
    d->parentObject = control;
    if (!control) {
        d->parentHwnd = 0;
        return;
    }
    // Controls of the library say their window through "hWnd"; any other widget is its own window.
    const QVariant hwnd = control->property("hWnd");
    if (hwnd.isValid())
        d->parentHwnd = hwnd.toInt();
    else
        d->parentHwnd = platform::handleOf(qobject_cast<QWidget *>(control));
}

clsBalloonTip::ttIconType clsBalloonTip::Icon() const
{
    return d->icon;
}

void clsBalloonTip::setIcon(ttIconType icon)
{
    d->icon = icon;
    d->resendTitleIfComplete();
}

qint32 clsBalloonTip::ForeColor() const
{
    return d->foreColor;
}

void clsBalloonTip::setForeColor(qint32 color)
{
    d->foreColor = color;
    if (d->tipHwnd != 0)
        d->send(TTM_SETTIPTEXTCOLOR, colourParameter(color), 0);
}

QString clsBalloonTip::Title() const
{
    return d->title;
}

void clsBalloonTip::setTitle(const QString &title)
{
    d->title = title;
    d->titleBytes = title.toUtf8();
    d->resendTitleIfComplete();
}

qint32 clsBalloonTip::BackColor() const
{
    return d->backColor;
}

void clsBalloonTip::setBackColor(qint32 color)
{
    d->backColor = color;
    if (d->tipHwnd != 0)
        d->send(TTM_SETTIPBKCOLOR, colourParameter(color), 0);
}

QString clsBalloonTip::TipText() const
{
    return d->tipText;
}

void clsBalloonTip::setTipText(const QString &text)
{
    if (text == d->tipText)
        return;
    d->tipText = text;
    d->tipTextBytes = text.toUtf8();
    d->tool.lpszText = d->tipTextBytes.constData();
    d->tool.cbSize = TOOLINFOA_SIZE;
    if (d->tipHwnd != 0) {
        d->send(TTM_UPDATETIPTEXTA, 0, reinterpret_cast<LPARAM>(&d->tool));
        return;
    }
    if (d->parentHwnd == 0 || !d->parentObject)
        return;
    // Until the tip exists, the parent's plain tooltip carries the text on one line.
    QString oneLine = text;
    oneLine.replace(QLatin1String("\r\n"), QLatin1String(" - "));
    QObject *parent = d->parentObject;
    if (parent->metaObject()->indexOfProperty("ToolTipText") >= 0)
        parent->setProperty("ToolTipText", oneLine);
    else if (auto *widget = qobject_cast<QWidget *>(parent))
        widget->setToolTip(oneLine);
}

bool clsBalloonTip::Create()
{
    if (d->tipHwnd != 0)
        DestroyTip();
    UINT style = TTS_ALWAYSTIP | TTS_NOPREFIX;
    if (d->style == TTBalloon)
        style |= TTS_BALLOON;
    ++tooltipCount();

    if (d->parentHwnd != 0)
        d->tipHwnd = CreateTooltipWindow(style, d->parentHwnd);
    if (d->tipHwnd != 0) {
        d->tool.rect = GetClientRect(d->parentHwnd);
        d->tool.uFlags = TTF_SUBCLASS | TTF_TRANSPARENT;
        if (d->centered)
            d->tool.uFlags |= TTF_CENTERTIP;
        if (d->popupOnDemand)
            d->tool.uFlags |= TTF_IDISHWND;
        d->tool.hwnd = d->parentHwnd;
        d->tool.uId = WPARAM(d->parentHwnd);
        d->tool.hinst = 0; // no module handles here
        d->tool.lpszText = d->tipTextBytes.constData();
        d->tool.cbSize = TOOLINFOA_SIZE;
        d->send(TTM_ADDTOOLA, 0, reinterpret_cast<LPARAM>(&d->tool));
        if (!d->title.isEmpty() || d->icon != TTNoIcon)
            d->sendTitle();
        if (d->foreColor != 0)
            d->send(TTM_SETTIPTEXTCOLOR, colourParameter(d->foreColor), 0);
        if (d->backColor != 0)
            d->send(TTM_SETTIPBKCOLOR, colourParameter(d->backColor), 0);
        d->send(TTM_SETDELAYTIME, TTDT_AUTOPOP, d->displayTime);
        d->send(TTM_SETDELAYTIME, TTDT_INITIAL, d->initialDelay);
    }
    d->tool.cbSize = TOOLINFOA_SIZE;
    return d->tipHwnd != 0;
}

void clsBalloonTip::ShowNow()
{
    if (d->tipHwnd != 0)
        d->send(TTM_ACTIVATE, WPARAM(-1), 0);
}

void clsBalloonTip::DestroyTip()
{
    if (d->tipHwnd == 0)
        return;
    --tooltipCount();
    DestroyWindow(d->tipHwnd);
    d->tipHwnd = 0;
}

qint32 clsBalloonTip::TooltipCount() const
{
    return tooltipCount();
}

void clsBalloonTip::SetTimeout(qint32 msDelay, qint32 msDisplay)
{
    d->initialDelay = msDelay;
    d->displayTime = msDisplay;
}

ZELCTL_REGISTER_CLASS(clsBalloonTip)

} // namespace zelctl

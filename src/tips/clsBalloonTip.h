#pragma once

#include "zelctl_export.h"

#include <QObject>
#include <QString>

#include <memory>

namespace zelctl {

class clsBalloonTipPrivate;

// A balloon (or plain) tip attached to one window of the host, the parent window: it shows
// when the pointer rests on the parent for the initial delay and hides after the display
// time or when the pointer leaves. Set the parent and the properties, then call Create();
// ForeColor, BackColor, TipText, and under some conditions Title and Icon, also change a
// tip that exists already. Style, Centered, PopupOnDemand and the delays act only
// through the next Create().
class ZELCTL_EXPORT clsBalloonTip : public QObject
{
    Q_OBJECT
    Q_PROPERTY(qint32 mvarParentControlhwnd READ mvarParentControlhwnd WRITE setMvarParentControlhwnd)
    Q_PROPERTY(qint32 lHwnd READ lHwnd WRITE setLHwnd)
    Q_PROPERTY(ttStyleEnum Style READ Style WRITE setStyle)
    Q_PROPERTY(bool PopupOnDemand READ PopupOnDemand WRITE setPopupOnDemand)
    Q_PROPERTY(bool Centered READ Centered WRITE setCentered)
    Q_PROPERTY(QObject *ParentControl READ ParentControl WRITE setParentControl)
    Q_PROPERTY(ttIconType Icon READ Icon WRITE setIcon)
    Q_PROPERTY(qint32 ForeColor READ ForeColor WRITE setForeColor)
    Q_PROPERTY(QString Title READ Title WRITE setTitle)
    Q_PROPERTY(qint32 BackColor READ BackColor WRITE setBackColor)
    Q_PROPERTY(QString TipText READ TipText WRITE setTipText)

public:
    enum ttStyleEnum : qint32 {
        TTStandard = 0,
        TTBalloon = 1,
    };
    Q_ENUM(ttStyleEnum)

    enum ttIconType : qint32 {
        TTNoIcon = 0,
        TTIconInfo = 1,
        TTIconWarning = 2,
        TTIconError = 3,
    };
    Q_ENUM(ttIconType)

    // A tip with no parent: initial delay 500 ms, display time 10000 ms, the information
    // icon, balloon style, shown when the pointer is on the parent window.
    explicit clsBalloonTip(QObject *parent = nullptr);
    // Destroys the tip window (DestroyTip).
    ~clsBalloonTip() override;

    // Handle of the window the tip is attached to; 0 for none.
    qint32 mvarParentControlhwnd() const;
    void setMvarParentControlhwnd(qint32 hwnd);

    // Handle of the tip window; 0 while there is none.
    qint32 lHwnd() const;
    void setLHwnd(qint32 hwnd);

    // Balloon with a stem, or a plain rectangle.
    ttStyleEnum Style() const;
    void setStyle(ttStyleEnum style);

    // True: the tool is the parent's whole client area at any size. False: the client
    // rectangle the parent had at Create().
    bool PopupOnDemand() const;
    void setPopupOnDemand(bool onDemand);

    // The tip sits centred under the parent instead of beside the pointer.
    bool Centered() const;
    void setCentered(bool centered);

    // The host object the tip belongs to. Setting it also sets mvarParentControlhwnd from
    // the object's "hWnd" property (for a plain widget, its own handle; 0 for nothing).
    // The object is borrowed.
    QObject *ParentControl() const;
    void setParentControl(QObject *control);

    // Icon beside the title. On a live tip the title is sent again only when both the
    // title and the icon are set.
    ttIconType Icon() const;
    void setIcon(ttIconType icon);

    // Text colour, 0x00BBGGRR or a system colour; 0 for the tips' own colour. Sent at once
    // to a live tip.
    qint32 ForeColor() const;
    void setForeColor(qint32 color);

    // Bold title line; on a live tip sent at once when the icon is not TTNoIcon.
    QString Title() const;
    void setTitle(const QString &title);

    // Background colour, 0x00BBGGRR or a system colour; 0 for the tips' own colour. Sent
    // at once to a live tip.
    qint32 BackColor() const;
    void setBackColor(qint32 color);

    // Text of the tip; CR LF pairs break lines. A live tip changes at once. With no tip
    // window yet, the parent object's plain tooltip gets the text, line breaks as " - ".
    QString TipText() const;
    void setTipText(const QString &text);

    // Builds the tip window for the parent (replacing an earlier one) and counts it. True
    // when a window was made; false without a parent window.
    Q_INVOKABLE bool Create();
    // Activates the tip and shows it at once.
    Q_INVOKABLE void ShowNow();
    // Destroys the tip window, if there is one.
    Q_INVOKABLE void DestroyTip();
    // How many tips of this thread have been created and not destroyed; every Create()
    // counts, even one without a parent.
    Q_INVOKABLE qint32 TooltipCount() const;
    // Initial delay and display time in milliseconds, used from the next Create().
    Q_INVOKABLE void SetTimeout(qint32 msDelay, qint32 msDisplay);

private:
    std::unique_ptr<clsBalloonTipPrivate> const d;
};

} // namespace zelctl

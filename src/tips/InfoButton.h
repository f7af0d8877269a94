#pragma once

#include "zelctl_export.h"

#include "frame/UserControl.h"
#include "tips/clsBalloonTip.h"

#include <memory>

namespace zelctl {

class InfoButtonPrivate;

// A 16 x 16 button showing the information, warning or error icon (greyed when disabled)
// with a balloon tip of a title and a text. The tip is built on the first pointer move
// after its text, title or style changed. A click pops the tip up, raises Click, or opens
// the document, program or address given in Action. The keyboard reaches the button with
// Tab; Space or Enter press it.
//
// Persisted as "ibutton.action", "ibutton.bstyle", "ibutton.style", "ibutton.title",
// "ibutton.enabled", "ibutton.tiptext" (falling back to "ToolTipText") and
// "ibutton.transparent".
class ZELCTL_EXPORT InfoButton : public UserControl
{
    Q_OBJECT
    Q_PROPERTY(bool Enabled READ Enabled WRITE setEnabled)
    Q_PROPERTY(QString Action READ Action WRITE setAction)
    Q_PROPERTY(QString ToolTipTitle READ ToolTipTitle WRITE setToolTipTitle)
    Q_PROPERTY(TT_STYLE_ENUM ToolTipStyle READ ToolTipStyle WRITE setToolTipStyle)
    Q_PROPERTY(IB_STYLE_ENUM Style READ Style WRITE setStyle)
    Q_PROPERTY(qint32 TargethWnd READ TargethWnd WRITE setTargethWnd)
    Q_PROPERTY(QString TipText READ TipText WRITE setTipText)
    Q_PROPERTY(bool Transparent READ Transparent WRITE setTransparent)

public:
    enum IB_STYLE_ENUM : qint32 {
        IB_INFO = 0,
        IB_WARNING = 1,
        IB_ERROR = 2,
    };
    Q_ENUM(IB_STYLE_ENUM)

    // The same values as clsBalloonTip::ttStyleEnum.
    enum TT_STYLE_ENUM : qint32 {
        TTS_DEFAULT = 0,
        TTS_BALLOON = 1,
    };
    Q_ENUM(TT_STYLE_ENUM)

    explicit InfoButton(QWidget *parent = nullptr);
    ~InfoButton() override;

    // The button's own enabled state; a disabled button shows the greyed icon.
    bool Enabled() const;
    void setEnabled(bool enabled);

    // What a click does, compared without case: "" pops the tip up and raises Click;
    // "click" only raises Click; "nothing" does nothing; anything else is opened with the
    // desktop (a relative path from the application's root folder) and raises Click.
    // Stored trimmed; a non-empty action shows the hand pointer.
    QString Action() const;
    void setAction(const QString &action);

    // Bold title of the tip ("Informação" on a new button).
    QString ToolTipTitle() const;
    void setToolTipTitle(const QString &title);

    // Balloon or plain rectangle (balloon on a new button).
    TT_STYLE_ENUM ToolTipStyle() const;
    void setToolTipStyle(TT_STYLE_ENUM style);

    // Which icon the button and its tip show; takes effect on the tip at its next rebuild.
    // Values outside the enumeration are ignored.
    IB_STYLE_ENUM Style() const;
    void setStyle(IB_STYLE_ENUM style);

    // Window the tip is attached to; 0 for the button itself. Takes effect at the next
    // rebuild of the tip.
    qint32 TargethWnd() const;
    void setTargethWnd(qint32 hwnd);

    // Text of the tip. "||" and "\n" (a backslash and n) break lines; blank text removes the tip.
    QString TipText() const;
    void setTipText(const QString &text);

    // Whether the container's background shows around the icon.
    bool Transparent() const;
    void setTransparent(bool transparent);

    // Shows the tip at once, if there is one.
    Q_INVOKABLE void PopupTip();
    // The tip, or nullptr after a blank text removed it. Owned by the button.
    Q_INVOKABLE zelctl::clsBalloonTip *GetTooltipClass() const;

Q_SIGNALS:
    void Click();

protected:
    void InitProperties() override;
    void ReadProperties(const PropertyBag &bag) override;
    void WriteProperties(PropertyBag &bag) override;
    void Terminate() override;
    void AmbientChanged(const QString &name) override;

    void paintEvent(QPaintEvent *event) override;
    void changeEvent(QEvent *event) override;
    void mouseMoveEvent(QMouseEvent *event) override;
    void mousePressEvent(QMouseEvent *event) override;
    void mouseReleaseEvent(QMouseEvent *event) override;
    void mouseDoubleClickEvent(QMouseEvent *event) override;
    void keyPressEvent(QKeyEvent *event) override;

private:
    void paintIcon();
    // Builds the tip again if its text, title or style changed since, or removes it.
    void syncTip();
    void buildTip();
    void removeTip();
    void click();

    std::unique_ptr<InfoButtonPrivate> const d;
};

} // namespace zelctl

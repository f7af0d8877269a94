#pragma once

#include "zelctl_export.h"

#include "frame/UserControl.h"
#include "platform/OleColor.h"
#include "platform/gdi/PersistentSurface.h"

#include <QFont>
#include <QVariant>

#include <memory>

namespace zelctl {

class skSubMenuPrivate;

// One item of a horizontal sub-menu: its caption on three picture slices (left piece,
// stretched middle, right piece) or, without pictures, on an arrow-shaped box with a notch
// at its left end and a point at its right end. It widens itself to its caption, changes
// colours while hovered and while active, and raises pointer and click events. Colour
// and margin changes show at the next Redraw.
//
// Persisted, always, as "ForeColor", "BackColor", "HoverForeColor", "HoverBackColor",
// "ActiveForeColor", "ActiveBackColor", "Caption", "Margin" and "TransparentBack".
class ZELCTL_EXPORT skSubMenu : public gdi::SurfaceHost<UserControl>
{
    Q_OBJECT
    // Twips between the point or the left picture and the caption; clamped to ±251658225,
    // the widest a control can be.
    Q_PROPERTY(qint32 Margin READ Margin WRITE setMargin)
    Q_PROPERTY(quint32 TransparencyColor READ TransparencyColor WRITE setTransparencyColor)
    Q_PROPERTY(quint32 ForeColor READ ForeColor WRITE setForeColor)
    Q_PROPERTY(quint32 BackColor READ BackColor WRITE setBackColor)
    Q_PROPERTY(quint32 HoverForeColor READ HoverForeColor WRITE setHoverForeColor)
    Q_PROPERTY(quint32 HoverBackColor READ HoverBackColor WRITE setHoverBackColor)
    Q_PROPERTY(quint32 ActiveForeColor READ ActiveForeColor WRITE setActiveForeColor)
    Q_PROPERTY(quint32 ActiveBackColor READ ActiveBackColor WRITE setActiveBackColor)
    Q_PROPERTY(bool Active READ Active WRITE setActive)
    Q_PROPERTY(QFont Font READ font WRITE setFont)
    Q_PROPERTY(QString Caption READ Caption WRITE setCaption)

public:
    // A TransparencyColor that leaves the arrow box opaque.
    static constexpr platform::OleColor NoTransparency = 0xFFFFFFFFu;

    explicit skSubMenu(QWidget *parent = nullptr);
    ~skSubMenu() override;

    // Space before the caption, in twips.
    qint32 Margin() const;
    void setMargin(qint32 twips);

    // Colour round the arrow box that lets the container through; NoTransparency (-1)
    // keeps the box opaque.
    platform::OleColor TransparencyColor() const;
    void setTransparencyColor(platform::OleColor color);

    platform::OleColor ForeColor() const;
    void setForeColor(platform::OleColor color);
    platform::OleColor BackColor() const;
    void setBackColor(platform::OleColor color);
    platform::OleColor HoverForeColor() const;
    void setHoverForeColor(platform::OleColor color);
    platform::OleColor HoverBackColor() const;
    void setHoverBackColor(platform::OleColor color);
    platform::OleColor ActiveForeColor() const;
    void setActiveForeColor(platform::OleColor color);
    platform::OleColor ActiveBackColor() const;
    void setActiveBackColor(platform::OleColor color);

    // The current item of the menu; a change redraws.
    bool Active() const;
    void setActive(bool active);

    // Whether the pointer is over the item.
    bool hovering() const;

    QString Caption() const;
    void setCaption(const QString &caption);

    // Picture slices: 0 left piece, 1 middle piece, 2 right piece (3 is kept only). nIndex
    // is converted to a number; a bad index or unreadable file is ignored. No redraw.
    Q_INVOKABLE QString ImageFile(const QVariant &nIndex) const;
    Q_INVOKABLE void setImageFile(const QVariant &nIndex, const QString &path);

    // Widens the item when its caption needs more room (and stops there), else draws it.
    Q_INVOKABLE void Redraw();

Q_SIGNALS:
    void Clicked();
    void MouseUp(qint16 &Button, qint16 &Shift, float &X, float &Y);
    void MouseDown(qint16 &Button, qint16 &Shift, float &X, float &Y);
    void MouseMove(qint16 &Button, qint16 &Shift, float &X, float &Y);
    void MouseIn();
    void MouseOut();
    void Resize();

protected:
    void InitProperties() override;
    void ReadProperties(const PropertyBag &bag) override;
    void WriteProperties(PropertyBag &bag) override;
    void Terminate() override;

    void changeEvent(QEvent *event) override;
    void resizeEvent(QResizeEvent *event) override;
    void showEvent(QShowEvent *event) override;
    void hideEvent(QHideEvent *event) override;
    void focusOutEvent(QFocusEvent *event) override;
    void mouseMoveEvent(QMouseEvent *event) override;
    void leaveEvent(QEvent *event) override;
    void mousePressEvent(QMouseEvent *event) override;
    void mouseReleaseEvent(QMouseEvent *event) override;
    void mouseDoubleClickEvent(QMouseEvent *event) override;
    void keyPressEvent(QKeyEvent *event) override;
    void paintEvent(QPaintEvent *event) override;

private:
    // Returns the x where the caption starts, in pixels.
    int drawArrowBox();
    int drawSlices(int captionWidth);
    void clearHover();
    void click();

    std::unique_ptr<skSubMenuPrivate> const d;
};

} // namespace zelctl

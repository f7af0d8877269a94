#pragma once

#include "zelctl_export.h"

#include "frame/UserControl.h"
#include "platform/gdi/PersistentSurface.h"

#include <memory>

namespace zelctl {

class skGoButtonPrivate;

// A square picture button of the navigation chrome. It shows picture slot 0 normally,
// slot 1 while the pointer is over it and slot 2 while the left button is held on it,
// greys the normal picture when disabled, and lets black pixels show the container
// through. It tracks the pointer itself to raise MouseIn and MouseOut, and can carry a
// balloon tip. The keyboard reaches it with Tab; Space or Enter click it.
//
// Persisted as "SkinID" and "Tooltip".
class ZELCTL_EXPORT skGoButton : public gdi::SurfaceHost<UserControl>
{
    Q_OBJECT
    Q_PROPERTY(bool Hovering READ Hovering WRITE setHovering)
    Q_PROPERTY(bool Clicking READ Clicking WRITE setClicking)
    Q_PROPERTY(QString SkinID READ SkinID WRITE setSkinID)
    Q_PROPERTY(QString Tooltip READ Tooltip WRITE setTooltip)
    Q_PROPERTY(bool Active READ Active WRITE setActive)
    Q_PROPERTY(bool Enabled READ Enabled WRITE setEnabled)

public:
    explicit skGoButton(QWidget *parent = nullptr);
    ~skGoButton() override;

    // Whether the pointer is over the button.
    bool Hovering() const;
    void setHovering(bool hovering);

    // A flag for the host; the button neither sets nor reads it.
    bool Clicking() const;
    void setClicking(bool clicking);

    // Path of picture slot imgID (0 normal, 1 hover, 2 pressed; 3 to 5 are kept only).
    // Setting stores the path and loads the picture at once (an empty path empties the
    // slot) without redrawing. Answers 0, or 9 for an index outside 0 to 5 (nothing
    // stored), or the loader's error (53 missing file, 481 not a picture), when the path
    // stays stored and the slot keeps its previous picture. Reading a bad index gives "".
    Q_INVOKABLE QString ImageSource(qint32 imgID) const;
    Q_INVOKABLE qint32 setImageSource(qint32 imgID, const QString &path);

    // Name of the skin; a new value raises RequestSkinRepait.
    QString SkinID() const;
    void setSkinID(const QString &skinId);

    // Text of the balloon tip titled "Navegação"; empty text removes the tip.
    QString Tooltip() const;
    void setTooltip(const QString &text);

    // Whether the left button is held on the button; a change repaints.
    bool Active() const;
    void setActive(bool active);

    bool Enabled() const;
    void setEnabled(bool enabled);

    // Draws the button from its pictures.
    Q_INVOKABLE void Repaint();

Q_SIGNALS:
    void Click();
    void MouseUp(qint16 &Button, qint16 &Shift, float &X, float &Y);
    void MouseDown(qint16 &Button, qint16 &Shift, float &X, float &Y);
    void MouseMove(qint16 &Button, qint16 &Shift, float &X, float &Y);
    // Declared for hosts that connect it; the button never raises it.
    void DoubleClick();
    void RequestSkinRepait();
    void MouseIn();
    void MouseOut();
    void Resize();

protected:
    void ReadProperties(const PropertyBag &bag) override;
    void WriteProperties(PropertyBag &bag) override;
    void Terminate() override;
    void AmbientChanged(const QString &name) override;

    void changeEvent(QEvent *event) override;
    void resizeEvent(QResizeEvent *event) override;
    void mouseMoveEvent(QMouseEvent *event) override;
    void leaveEvent(QEvent *event) override;
    void mousePressEvent(QMouseEvent *event) override;
    void mouseReleaseEvent(QMouseEvent *event) override;
    void mouseDoubleClickEvent(QMouseEvent *event) override;
    void keyPressEvent(QKeyEvent *event) override;
    void paintEvent(QPaintEvent *event) override;

private:
    void loadDesignPreview();
    void click();

    std::unique_ptr<skGoButtonPrivate> const d;
};

} // namespace zelctl

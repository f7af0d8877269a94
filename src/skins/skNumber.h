#pragma once

#include "zelctl_export.h"

#include "frame/UserControl.h"
#include "platform/OleColor.h"
#include "platform/gdi/PersistentSurface.h"

#include <memory>

namespace zelctl {

class skNumberPrivate;

// A round badge with a centred caption (a step number): a disc in Background with the
// caption in Foreground, or BackgroundActive and ForegroundActive while Active, which the
// pointer resting on the badge also sets. With a transparent BackStyle (the default) only
// the disc and caption show and the rest lets the container through; an opaque badge
// shows BackColor round the disc. The badge keeps itself square.
//
// Persisted as "Caption" (read default "1"), "BackColor", "Background", "Foreground",
// "BackgroundActive", "ForegroundActive", "Active", "SkinID" and "BackStyle".
class ZELCTL_EXPORT skNumber : public gdi::SurfaceHost<UserControl>
{
    Q_OBJECT
    Q_PROPERTY(QString Caption READ Caption WRITE setCaption)
    Q_PROPERTY(quint32 BackColor READ BackColor WRITE setBackColor)
    Q_PROPERTY(quint32 Background READ Background WRITE setBackground)
    Q_PROPERTY(quint32 BackgroundActive READ BackgroundActive WRITE setBackgroundActive)
    Q_PROPERTY(quint32 Foreground READ Foreground WRITE setForeground)
    Q_PROPERTY(quint32 ForegroundActive READ ForegroundActive WRITE setForegroundActive)
    Q_PROPERTY(bool Active READ Active WRITE setActive)
    Q_PROPERTY(QString SkinID READ SkinID WRITE setSkinID)
    Q_PROPERTY(qint32 BackStyle READ BackStyle WRITE setBackStyle)

public:
    enum BackStyles { Transparent = 0, Opaque = 1 };
    Q_ENUM(BackStyles)

    explicit skNumber(QWidget *parent = nullptr);
    ~skNumber() override;

    QString Caption() const;
    void setCaption(const QString &caption);

    // Colour round the disc, see-through while BackStyle is Transparent.
    platform::OleColor BackColor() const;
    void setBackColor(platform::OleColor color);

    platform::OleColor Background() const;
    void setBackground(platform::OleColor color);
    platform::OleColor BackgroundActive() const;
    void setBackgroundActive(platform::OleColor color);
    platform::OleColor Foreground() const;
    void setForeground(platform::OleColor color);
    platform::OleColor ForegroundActive() const;
    void setForegroundActive(platform::OleColor color);

    bool Active() const;
    void setActive(bool active);

    // Transparent (0) or Opaque (1); any other value is taken as Transparent.
    qint32 BackStyle() const;
    void setBackStyle(qint32 style);

    // Name of the skin; a new value raises RequestSkinRepait.
    QString SkinID() const;
    void setSkinID(const QString &skinId);

Q_SIGNALS:
    void Clicked();
    void RequestSkinRepait();
    void MouseIn();
    void MouseOut();
    void DoubleClicked();
    void MouseDown(qint16 &Button, qint16 &Shift, float &X, float &Y);
    void MouseUp(qint16 &Button, qint16 &Shift, float &X, float &Y);

protected:
    void InitProperties() override;
    void ReadProperties(const PropertyBag &bag) override;
    void WriteProperties(PropertyBag &bag) override;

    void resizeEvent(QResizeEvent *event) override;
    void mouseMoveEvent(QMouseEvent *event) override;
    void leaveEvent(QEvent *event) override;
    void mousePressEvent(QMouseEvent *event) override;
    void mouseReleaseEvent(QMouseEvent *event) override;
    void mouseDoubleClickEvent(QMouseEvent *event) override;
    void keyPressEvent(QKeyEvent *event) override;
    void paintEvent(QPaintEvent *event) override;

private:
    void redraw();

    std::unique_ptr<skNumberPrivate> const d;
};

} // namespace zelctl

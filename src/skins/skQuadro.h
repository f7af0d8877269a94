#pragma once

#include "zelctl_export.h"

#include "frame/UserControl.h"
#include "platform/OleColor.h"
#include "platform/gdi/PersistentSurface.h"

#include <QVariant>

#include <memory>

namespace zelctl {

class skQuadroPrivate;

// A frame of three picture slices: the top piece, the middle piece stretched to fill and
// the bottom piece, each as wide as the frame. Pixels of TransparencyColor (black on a new
// frame) let the container show through. Nothing is drawn until all three slices hold
// pictures.
//
// Persisted, always, as "TransparentBack" and "DebugDesignImgID".
class ZELCTL_EXPORT skQuadro : public gdi::SurfaceHost<UserControl>
{
    Q_OBJECT
    Q_PROPERTY(quint32 TransparencyColor READ TransparencyColor WRITE setTransparencyColor)
    Q_PROPERTY(qint32 DebugDesign READ DebugDesign WRITE setDebugDesign)

public:
    explicit skQuadro(QWidget *parent = nullptr);
    ~skQuadro() override;

    platform::OleColor TransparencyColor() const;
    void setTransparencyColor(platform::OleColor color);

    // Which pictures a form designer previews: 0 the orange frame, n the numbered set
    // "quadro_" n − 1 "_top.gif" and so on.
    qint32 DebugDesign() const;
    void setDebugDesign(qint32 set);

    // Slices: 0 top, 1 middle, 2 bottom (3 is kept only). nIndex is converted to a
    // number; a bad index or unreadable file is ignored. No redraw.
    Q_INVOKABLE QString ImageFile(const QVariant &nIndex) const;
    Q_INVOKABLE void setImageFile(const QVariant &nIndex, const QString &path);

    Q_INVOKABLE void Redraw();

Q_SIGNALS:
    // Declared for hosts that connect them; the frame never raises them.
    void Clicked();
    void MouseIn();
    void MouseOut();

    void MouseUp(qint16 &Button, qint16 &Shift, float &X, float &Y);
    void MouseDown(qint16 &Button, qint16 &Shift, float &X, float &Y);
    void MouseMove(qint16 &Button, qint16 &Shift, float &X, float &Y);
    void Resize();

protected:
    void InitProperties() override;
    void ReadProperties(const PropertyBag &bag) override;
    void WriteProperties(PropertyBag &bag) override;
    void Terminate() override;

    void resizeEvent(QResizeEvent *event) override;
    void mouseMoveEvent(QMouseEvent *event) override;
    void mousePressEvent(QMouseEvent *event) override;
    void mouseReleaseEvent(QMouseEvent *event) override;

private:
    void loadDesignPreview();

    std::unique_ptr<skQuadroPrivate> const d;
};

} // namespace zelctl

#pragma once

#include "zelctl_export.h"

#include "frame/Picture.h"
#include "frame/UserControl.h"
#include "platform/gdi/PersistentSurface.h"

#include <QList>

#include <memory>

namespace zelctl {

// Shows an animated GIF: loaded from a file, a byte array, a local or remote address, or
// a picture set at design time; each frame shown for its own delay (but at least
// MinFrameDelay), composed with the frames before it as the file asks, scaled, mirrored
// and offset as the properties say. Lengths on this interface are twips unless noted.
class ZELCTL_EXPORT ucAniGIF : public gdi::SurfaceHost<UserControl>
{
    Q_OBJECT
    // Shortest time a frame is shown, in milliseconds: 10..32700 (any value outside is
    // clamped, 40000 to 32700). Persisted as "Delay", default 50.
    Q_PROPERTY(qint32 MinFrameDelay READ MinFrameDelay WRITE setMinFrameDelay)
    // How the picture and the control's size fit each other: a ScaleGIFConstants value.
    // Persisted as "Stretch", default gfsScaleAlways.
    Q_PROPERTY(qint32 Stretch READ Stretch WRITE setStretch)
    // How many times the animation plays; 0 = endless. Loading a GIF takes its own count;
    // negative values count as their absolute value. Persisted as "Loops".
    Q_PROPERTY(qint32 Loops READ Loops WRITE setLoops)
    // When a loaded GIF starts to move: a DelayModeConstants value (0..3). Persisted as
    // "DelayLoad", default gfdDelayStartup.
    Q_PROPERTY(qint32 DelayAnimation READ DelayAnimation WRITE setDelayAnimation)
    // A MirrorConstants value. Persisted as "Mirror", default gfmNone.
    Q_PROPERTY(qint32 Mirrored READ Mirrored WRITE setMirrored)
    // Pointer shown over the control when MousePointer is 99. Persisted as "MouseIcon".
    Q_PROPERTY(zelctl::Picture MouseIcon READ MouseIcon WRITE setMouseIcon)
    // 0 default, 1 arrow, 2 cross, 3 I-beam, 5/15 size all, 6..9 sizing, 10 up arrow,
    // 11 busy, 12 forbidden, 13 arrow and busy, 14 help, 99 MouseIcon. Persisted as
    // "MousePointer", default 0.
    Q_PROPERTY(qint32 MousePointer READ MousePointer WRITE setMousePointer)
    // Persisted as "Enabled", default true. A disabled control still animates but raises
    // no mouse events.
    Q_PROPERTY(bool Enabled READ Enabled WRITE setEnabled)
    // Pixels added to the left and top edge of the picture. Persisted as "OffsetX" and
    // "OffsetY", default 0.
    Q_PROPERTY(qint32 OffsetX READ OffsetX WRITE setOffsetX)
    Q_PROPERTY(qint32 OffsetY READ OffsetY WRITE setOffsetY)
    // Number of frames; 0 when no GIF is loaded.
    Q_PROPERTY(qint32 FrameCount READ FrameCount)
    // Size of the composed picture.
    Q_PROPERTY(qint32 ActualWidth READ ActualWidth)
    Q_PROPERTY(qint32 ActualHeight READ ActualHeight)
    // -1 without a GIF, 0 when it loops endlessly, else the loops still to play.
    Q_PROPERTY(qint32 LoopsRemaining READ LoopsRemaining)
    // Reads the play state (gfaStop, gfaPlay or gfaPause); set to an AnimationActions value
    // to act on a loaded GIF while the host runs.
    Q_PROPERTY(qint32 Action READ Action WRITE setAction)
    // The GIF as a picture (its first frame; the picture carries the whole animation under
    // its text key "GIF"). Set only at design time.
    Q_PROPERTY(zelctl::Picture AnimatedGIF READ AnimatedGIF WRITE setAnimatedGIF)

public:
    enum AnimationActions { gfaStop = 0, gfaPlay = 1, gfaPause = 2, gfaForward = 3, gfaReset = 4 };
    Q_ENUM(AnimationActions)
    enum ScaleGIFConstants {
        gfsClip = 0,
        gfsScaleAlways = 1,
        gfsStretch = 2,
        gfsShrinkScaleToFit = 3,
        gfsActualSize = 4
    };
    Q_ENUM(ScaleGIFConstants)
    enum MirrorConstants { gfmNone = 0, gfmHorizontal = 1, gfmVertical = 2, gfmHorAndVer = 3 };
    Q_ENUM(MirrorConstants)
    enum DelayModeConstants { gfdNone = 0, gfdDelayStartup = 1, gfdDoNotAnimate = 2 };
    Q_ENUM(DelayModeConstants)

    explicit ucAniGIF(QWidget *parent = nullptr);
    ~ucAniGIF() override;

    // Reads the whole file; true when it holds at least one frame. Any load stops and
    // releases the GIF shown first, so a file that is missing, empty, unreadable, not a
    // regular file or larger than a GIF may be leaves the control empty (FrameCount 0).
    Q_INVOKABLE bool LoadAnimatedGIF_File(const QString &FileName);
    // True when the bytes hold at least one frame.
    Q_INVOKABLE bool LoadAnimatedGIF_Array(const QByteArray &Bytes);
    // Starts reading a local path, a file:// or an http(s):// address and returns at once;
    // RemoteLoadComplete or RemoteLoadFailure follows. An empty path does nothing. A local
    // FIFO or device is refused. An address is read with a transfer timeout (the setting
    // "giftimeout" of application "ZEL", section "Config", in seconds, default 30), at most
    // 5 redirects and no more bytes than a GIF may hold; each GIF read is kept in the
    // user's cache folder, and when the network fails the kept copy is loaded instead.
    Q_INVOKABLE void LoadAnimatedGIF_Remote(const QString &RemotePath);

    Q_INVOKABLE void Refresh();
    // Colours (0x00RRGGBB) of the global table (FrameIndex 0) or of a frame's own table
    // (1..FrameCount). False for a frame without a table of its own, an index out of range
    // or no GIF.
    Q_INVOKABLE bool GetPalette(qint32 FrameIndex, QList<qint32> &paletteEntries);
    // Replaces a table's colours from the first entry on, up to the table's size; the
    // picture shows them at once.
    Q_INVOKABLE bool SetPalette(qint32 FrameIndex, const QList<qint32> &paletteEntries);
    // Keeps a copy of all colour tables; false when a copy is already kept.
    Q_INVOKABLE bool CacheColorTables();
    // Puts the kept copy back (and drops it when bReleaseCache); false without a copy.
    Q_INVOKABLE bool RestoreColorTables(bool bReleaseCache);

    qint32 MinFrameDelay() const;
    void setMinFrameDelay(qint32 milliseconds);
    qint32 Stretch() const;
    void setStretch(qint32 stretch);
    qint32 Loops() const;
    void setLoops(qint32 loops);
    qint32 DelayAnimation() const;
    void setDelayAnimation(qint32 mode);
    qint32 Mirrored() const;
    void setMirrored(qint32 mirror);
    Picture MouseIcon() const;
    void setMouseIcon(const Picture &icon);
    qint32 MousePointer() const;
    void setMousePointer(qint32 pointer);
    // The control's own setting: a disabled form around it leaves this alone.
    bool Enabled() const { return !testAttribute(Qt::WA_ForceDisabled); }
    qint32 OffsetX() const;
    void setOffsetX(qint32 pixels);
    qint32 OffsetY() const;
    void setOffsetY(qint32 pixels);
    qint32 FrameCount() const;
    qint32 ActualWidth() const;
    qint32 ActualHeight() const;
    qint32 LoopsRemaining() const;
    qint32 Action() const;
    void setAction(qint32 action);
    Picture AnimatedGIF() const;
    void setAnimatedGIF(const Picture &picture);

    // The picture's size as drawn, so layouts give the control room for it.
    QSize sizeHint() const override;

Q_SIGNALS:
    void Click();
    // Button: 1 left, 2 right, 4 middle; Shift: 1 Shift, 2 Ctrl, 4 Alt.
    void MouseDown(qint16 Button, qint16 Shift, float X, float Y);
    void MouseUp(qint16 Button, qint16 Shift, float X, float Y);
    void MouseMove(qint16 Button, qint16 Shift, float X, float Y);
    // After every frame drawn.
    void FrameChanged(qint32 FrameIndex);
    // The last loop has been shown.
    void LoopsEnded();
    // A remote read has arrived; setting Cancel keeps the current GIF.
    void RemoteLoadComplete(qint32 gifWidth, qint32 gifHeight, bool &Cancel);
    void RemoteLoadFailure();

protected:
    void InitProperties() override;
    void ReadProperties(const PropertyBag &bag) override;
    void WriteProperties(PropertyBag &bag) override;
    void Terminate() override;
    void AmbientChanged(const QString &name) override;

    void paintEvent(QPaintEvent *event) override;
    void resizeEvent(QResizeEvent *event) override;
    void showEvent(QShowEvent *event) override;
    void hideEvent(QHideEvent *event) override;
    void mousePressEvent(QMouseEvent *event) override;
    void mouseReleaseEvent(QMouseEvent *event) override;
    void mouseMoveEvent(QMouseEvent *event) override;
    void mouseDoubleClickEvent(QMouseEvent *event) override;

private:
    class Private;
    std::unique_ptr<Private> const d;
};

} // namespace zelctl

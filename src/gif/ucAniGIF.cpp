#include "ucAniGIF.h"

#include "frame/PropertyReaders.h"
#include "gif/GifAnimator.h"
#include "gif/GifCanvas.h"
#include "gif/GifEncoder.h"
#include "gif/GifFrames.h"
#include "gif/GifLimits.h"
#include "gif/GifRemoteLoader.h"
#include "platform/Accessibility.h"
#include "platform/FileRead.h"
#include "platform/Twips.h"

#include <QBuffer>
#include <QMouseEvent>
#include <QPointer>
#include <QTimer>

#include <cmath>
#include <cstdlib>
#include <limits>

namespace zelctl {

using platform::twipsFromPixels;

namespace {

// Text key under which a picture of this control carries its whole GIF.
const QString GifTextKey = QStringLiteral("GIF");
// The first frame shows at once; the rest is decoded this much later.
constexpr int DeferredStartMs = 20;

Qt::CursorShape cursorShape(qint32 pointer)
{
    switch (pointer) {
    case 1:
        return Qt::ArrowCursor;
    case 2:
        return Qt::CrossCursor;
    case 3:
        return Qt::IBeamCursor;
    case 5:
    case 15:
        return Qt::SizeAllCursor;
    case 6:
        return Qt::SizeBDiagCursor;
    case 7:
        return Qt::SizeVerCursor;
    case 8:
        return Qt::SizeFDiagCursor;
    case 9:
        return Qt::SizeHorCursor;
    case 10:
        return Qt::UpArrowCursor;
    case 11:
        return Qt::WaitCursor;
    case 12:
        return Qt::ForbiddenCursor;
    case 13:
        return Qt::BusyCursor;
    case 14:
        return Qt::WhatsThisCursor;
    default:
        return Qt::ArrowCursor;
    }
}

qint16 buttonsOf(Qt::MouseButtons buttons)
{
    return qint16((buttons & Qt::LeftButton ? 1 : 0) | (buttons & Qt::RightButton ? 2 : 0)
        | (buttons & Qt::MiddleButton ? 4 : 0));
}

qint16 shiftOf(Qt::KeyboardModifiers modifiers)
{
    return qint16((modifiers & Qt::ShiftModifier ? 1 : 0) | (modifiers & Qt::ControlModifier ? 2 : 0)
        | (modifiers & Qt::AltModifier ? 4 : 0));
}

// The absolute value of a Long, as far as it goes.
int loopCountOf(qint32 loops)
{
    return loops == std::numeric_limits<qint32>::min() ? std::numeric_limits<qint32>::max() : std::abs(loops);
}

bool hasGifSignature(const QByteArray &bytes)
{
    const QByteArray signature = bytes.left(6).toLower();
    return signature == "gif89a" || signature == "gif87a";
}

// A picture that did not come from this control becomes a one-frame GIF of its pixels.
QByteArray gifFromImage(const QImage &image)
{
    const QImage indexed = image.convertToFormat(QImage::Format_Indexed8, Qt::ThresholdDither);
    gifEncoder::Animation animation;
    animation.width = indexed.width();
    animation.height = indexed.height();
    gifScanner::ColorTable table;
    table.count = std::max(2, int(indexed.colorCount()));
    int transparent = -1;
    for (int k = 0; k < indexed.colorCount() && k < 256; ++k) {
        table.entries[size_t(k)] = indexed.color(k) & 0xFFFFFF;
        if (transparent < 0 && qAlpha(indexed.color(k)) < 128)
            transparent = k;
    }
    animation.colorTables = { table };
    gifEncoder::Frame frame;
    frame.record.Width = indexed.width();
    frame.record.Height = indexed.height();
    frame.record.HasTransparency = transparent >= 0;
    frame.record.TransparentIndex = quint8(std::max(transparent, 0));
    frame.indices.reserve(qsizetype(indexed.width()) * indexed.height());
    for (int y = 0; y < indexed.height(); ++y) {
        const uchar *row = indexed.constScanLine(y);
        for (int x = 0; x < indexed.width(); ++x) {
            const bool clear = transparent >= 0 && qAlpha(indexed.color(row[x])) < 128;
            frame.indices.append(char(clear ? transparent : row[x]));
        }
    }
    animation.frames = { frame };
    return gifEncoder::encode(animation);
}

} // namespace

class ucAniGIF::Private
{
public:
    explicit Private(ucAniGIF *q);

    bool loaded() const { return !frames.isEmpty(); }
    bool running() const { return !q->designMode(); }
    bool load(const QByteArray &bytes);
    void release();
    void finishFrames();
    void startPlaying();
    void resizeStep();
    void redraw();
    void remoteArrived(const QByteArray &bytes);

    ucAniGIF *q;
    GifFrames frames;
    GifCanvas canvas;
    GifAnimator animator;
    GifRemoteLoader remote;
    QTimer deferred;
    qint32 stretch = gfsScaleAlways;
    qint32 delayMode = gfdDelayStartup;
    qint32 mirror = gfmNone;
    qint32 offsetX = 0;
    qint32 offsetY = 0;
    double scaleX = 1.0;
    double scaleY = 1.0;
    Picture mouseIcon;
    qint32 mousePointer = 0;
    bool inResize = false;
    bool pressed = false;
    // What a screen reader hears: the frames loaded and whether they move.
    platform::AccessibleEcho echo { q };
};

ucAniGIF::Private::Private(ucAniGIF *owner)
    : q(owner)
{
    deferred.setSingleShot(true);
    QObject::connect(&deferred, &QTimer::timeout, q, [this] { finishFrames(); });
    QObject::connect(&animator, &GifAnimator::advanced, q, [this] { redraw(); });
    QObject::connect(&animator, &GifAnimator::loopsEnded, q, [this] {
        echo.refresh();
        Q_EMIT q->LoopsEnded();
    });
    QObject::connect(&remote, &GifRemoteLoader::finished, q, [this](const QByteArray &bytes) { remoteArrived(bytes); });
    QObject::connect(&remote, &GifRemoteLoader::failed, q, &ucAniGIF::RemoteLoadFailure);
}

void ucAniGIF::Private::release()
{
    deferred.stop();
    animator.setDelays({});
    canvas.reset();
    frames.clear();
    scaleX = scaleY = 1.0;
}

bool ucAniGIF::Private::load(const QByteArray &bytes)
{
    release();
    if (bytes.isEmpty() || !frames.load(bytes) || !canvas.create(frames.canvasWidth(), frames.canvasHeight())) {
        release();
        q->update();
        echo.refresh();
        return false;
    }
    frames.setMirror(mirror);
    animator.setDelays(frames.delays());
    animator.setLoopCount(frames.loopCount());
    if (stretch != gfsClip)
        resizeStep();
    if (running() && delayMode != gfdNone && frames.count() > 1) {
        frames.decodeUpTo(1);
        deferred.start(DeferredStartMs);
    } else {
        frames.decodeUpTo(frames.count());
        if (running())
            startPlaying();
    }
    redraw();
    echo.refresh();
    return true;
}

void ucAniGIF::Private::finishFrames()
{
    frames.decodeUpTo(frames.count());
    startPlaying();
}

void ucAniGIF::Private::startPlaying()
{
    if (loaded() && running() && delayMode != gfdDoNotAnimate)
        animator.start();
    echo.refresh();
}

void ucAniGIF::Private::redraw()
{
    if (q->isVisible())
        q->repaint();
}

void ucAniGIF::Private::resizeStep()
{
    if (!loaded() || inResize)
        return;
    inResize = true;
    const int cw = frames.canvasWidth(), ch = frames.canvasHeight();
    const int w = q->width(), h = q->height();
    const double rx = double(w) / cw, ry = double(h) / ch;
    QSize size = q->size();
    scaleX = scaleY = 1.0;
    switch (stretch) {
    case gfsClip:
        size = QSize(std::min(w, cw), std::min(h, ch));
        break;
    case gfsActualSize:
        size = QSize(cw, ch);
        break;
    case gfsStretch:
        if (w > 0 && h > 0) {
            scaleX = rx;
            scaleY = ry;
        }
        break;
    case gfsScaleAlways:
    case gfsShrinkScaleToFit:
        if (w <= 0 || h <= 0 || (stretch == gfsShrinkScaleToFit && rx >= 1.0 && ry >= 1.0)) {
            size = QSize(cw, ch);
        } else {
            scaleX = scaleY = std::min(rx, ry);
            size = QSize(int(std::lround(cw * scaleX)), int(std::lround(ch * scaleY)));
        }
        break;
    }
    if (size != q->size())
        q->resize(size);
    q->updateGeometry();
    inResize = false;
}

void ucAniGIF::Private::remoteArrived(const QByteArray &bytes)
{
    if (bytes.size() < 15 || !hasGifSignature(bytes)) {
        Q_EMIT q->RemoteLoadFailure();
        return;
    }
    const int width = quint8(bytes[6]) | quint8(bytes[7]) << 8;
    const int height = quint8(bytes[8]) | quint8(bytes[9]) << 8;
    bool cancel = false;
    const QPointer<ucAniGIF> alive(q);
    Q_EMIT q->RemoteLoadComplete(twipsFromPixels(width), twipsFromPixels(height), cancel);
    if (alive && !cancel)
        load(bytes);
}

ucAniGIF::ucAniGIF(QWidget *parent)
    : SurfaceHost<UserControl>(parent)
    , d(std::make_unique<Private>(this))
{
    setMouseTracking(true);
}

ucAniGIF::~ucAniGIF() = default;

bool ucAniGIF::LoadAnimatedGIF_File(const QString &FileName)
{
    // A file that cannot be read loads nothing, and the load empties the control as any
    // other does: a host that reads FrameCount afterwards sees that this file failed.
    const platform::FileRead file = platform::readFile(FileName, gifLimits::MaxFileBytes);
    return d->load(file.ok() ? file.bytes : QByteArray());
}

bool ucAniGIF::LoadAnimatedGIF_Array(const QByteArray &Bytes)
{
    return d->load(Bytes);
}

void ucAniGIF::LoadAnimatedGIF_Remote(const QString &RemotePath)
{
    if (RemotePath.isEmpty())
        return;
    if (!d->remote.start(RemotePath))
        Q_EMIT RemoteLoadFailure();
}

void ucAniGIF::Refresh()
{
    repaint();
}

bool ucAniGIF::GetPalette(qint32 FrameIndex, QList<qint32> &paletteEntries)
{
    if (!d->loaded() || FrameIndex < 0 || FrameIndex > FrameCount())
        return false;
    const int t = FrameIndex == 0 ? 0 : d->frames.frame(FrameIndex).ColorTable;
    if ((FrameIndex > 0 && t == 0) || d->frames.table(t).count == 0)
        return false;
    const gifScanner::ColorTable &table = d->frames.table(t);
    paletteEntries.clear();
    for (int k = 0; k < table.count; ++k)
        paletteEntries.append(qint32(table.entries[size_t(k)]));
    return true;
}

bool ucAniGIF::SetPalette(qint32 FrameIndex, const QList<qint32> &paletteEntries)
{
    if (!d->loaded() || FrameIndex < 0 || FrameIndex > FrameCount())
        return false;
    const int t = FrameIndex == 0 ? 0 : d->frames.frame(FrameIndex).ColorTable;
    if ((FrameIndex > 0 && t == 0) || d->frames.table(t).count == 0)
        return false;
    d->frames.setTableEntries(t, paletteEntries);
    d->canvas.invalidate();
    update();
    return true;
}

bool ucAniGIF::CacheColorTables()
{
    return d->loaded() && d->frames.cacheTables();
}

bool ucAniGIF::RestoreColorTables(bool bReleaseCache)
{
    if (!d->loaded() || !d->frames.restoreTables(bReleaseCache))
        return false;
    d->canvas.invalidate();
    update();
    return true;
}

qint32 ucAniGIF::MinFrameDelay() const
{
    return d->animator.minFrameDelay();
}

void ucAniGIF::setMinFrameDelay(qint32 milliseconds)
{
    const int before = d->animator.minFrameDelay();
    d->animator.setMinFrameDelay(milliseconds);
    if (d->animator.minFrameDelay() != before)
        PropertyChanged(QStringLiteral("Delay"));
}

qint32 ucAniGIF::Stretch() const
{
    return d->stretch;
}

void ucAniGIF::setStretch(qint32 stretch)
{
    if (stretch < gfsClip || stretch > gfsActualSize || stretch == d->stretch)
        return;
    const GifAnimator::State state = d->animator.state();
    d->animator.pause();
    d->stretch = stretch;
    d->resizeStep();
    if (state == GifAnimator::Playing)
        d->animator.start();
    else
        update();
    PropertyChanged(QStringLiteral("Stretch"));
}

qint32 ucAniGIF::Loops() const
{
    return d->animator.loopCount();
}

void ucAniGIF::setLoops(qint32 loops)
{
    d->animator.setLoopCount(loopCountOf(loops));
    PropertyChanged(QStringLiteral("Loops"));
}

qint32 ucAniGIF::DelayAnimation() const
{
    return d->delayMode;
}

void ucAniGIF::setDelayAnimation(qint32 mode)
{
    if (mode < 0 || mode > 3)
        return;
    d->delayMode = mode;
    PropertyChanged(QStringLiteral("DelayAnimation"));
}

qint32 ucAniGIF::Mirrored() const
{
    return d->mirror;
}

void ucAniGIF::setMirrored(qint32 mirror)
{
    if (mirror < gfmNone || mirror > gfmHorAndVer || mirror == d->mirror)
        return;
    d->mirror = mirror;
    if (d->loaded()) {
        const bool playing = d->animator.state() == GifAnimator::Playing;
        d->animator.pause();
        d->frames.setMirror(mirror);
        d->canvas.invalidate();
        if (playing)
            d->animator.start();
        update();
    }
    PropertyChanged(QStringLiteral("Mirrored"));
}

Picture ucAniGIF::MouseIcon() const
{
    return d->mouseIcon;
}

void ucAniGIF::setMouseIcon(const Picture &icon)
{
    d->mouseIcon = icon;
    setMousePointer(d->mousePointer);
}

qint32 ucAniGIF::MousePointer() const
{
    return d->mousePointer;
}

void ucAniGIF::setMousePointer(qint32 pointer)
{
    d->mousePointer = pointer;
    if (pointer == 0)
        unsetCursor();
    else if (pointer == 99)
        d->mouseIcon.isNull() ? unsetCursor() : setCursor(QCursor(d->mouseIcon.pixmap()));
    else
        setCursor(cursorShape(pointer));
}

qint32 ucAniGIF::OffsetX() const
{
    return d->offsetX;
}

void ucAniGIF::setOffsetX(qint32 pixels)
{
    d->offsetX = pixels;
    if (d->animator.state() != GifAnimator::Playing || designMode())
        update();
}

qint32 ucAniGIF::OffsetY() const
{
    return d->offsetY;
}

void ucAniGIF::setOffsetY(qint32 pixels)
{
    d->offsetY = pixels;
    if (d->animator.state() != GifAnimator::Playing || designMode())
        update();
}

qint32 ucAniGIF::FrameCount() const
{
    return d->frames.count();
}

qint32 ucAniGIF::ActualWidth() const
{
    return twipsFromPixels(d->frames.canvasWidth());
}

qint32 ucAniGIF::ActualHeight() const
{
    return twipsFromPixels(d->frames.canvasHeight());
}

qint32 ucAniGIF::LoopsRemaining() const
{
    if (!d->loaded())
        return -1;
    if (d->animator.loopCount() == 0)
        return 0;
    return d->animator.loopCount() - d->animator.loopsDone();
}

qint32 ucAniGIF::Action() const
{
    return d->animator.state();
}

void ucAniGIF::setAction(qint32 action)
{
    if (designMode() || !d->loaded())
        return;
    switch (action) {
    case gfaStop:
        d->animator.stop();
        d->animator.rewind();
        d->redraw();
        break;
    case gfaPlay:
        d->animator.start();
        break;
    case gfaPause:
        d->animator.pause();
        break;
    case gfaForward:
        d->animator.forward();
        break;
    case gfaReset:
        d->animator.stop();
        d->animator.rewind();
        d->redraw();
        d->animator.start();
        break;
    default:
        break;
    }
    d->echo.refresh();
}

Picture ucAniGIF::AnimatedGIF() const
{
    if (!d->loaded())
        return Picture();
    const QByteArray gif = d->frames.encode();
    QImage image = Picture::fromData(gif).image();
    image.setText(GifTextKey, QString::fromLatin1(gif.toBase64()));
    return Picture(image);
}

void ucAniGIF::setAnimatedGIF(const Picture &picture)
{
    if (!designMode())
        return;
    QByteArray gif;
    if (!picture.isNull()) {
        const QString carried = picture.image().text(GifTextKey);
        gif = carried.isEmpty() ? gifFromImage(picture.image()) : QByteArray::fromBase64(carried.toLatin1());
    }
    d->load(gif);
    repaint();
    PropertyChanged(QStringLiteral("AnimatedGIF"));
}

QSize ucAniGIF::sizeHint() const
{
    if (!d->loaded())
        return SurfaceHost<UserControl>::sizeHint();
    return { int(std::lround(d->frames.canvasWidth() * d->scaleX)),
        int(std::lround(d->frames.canvasHeight() * d->scaleY)) };
}

void ucAniGIF::InitProperties()
{
    d->animator.setMinFrameDelay(GifAnimator::DefaultMinFrameDelay);
}

void ucAniGIF::ReadProperties(const PropertyBag &bag)
{
    d->animator.setMinFrameDelay(
        readLong(bag, "Delay", GifAnimator::DefaultMinFrameDelay, 10, 32700, OutOfRange::Clamp));
    d->stretch = readLong(bag, "Stretch", gfsScaleAlways, gfsClip, gfsActualSize);
    // A stored -1 reads back as the default.
    d->delayMode = readLong(bag, "DelayLoad", gfdDelayStartup, 0, 3);
    d->mirror = readLong(bag, "Mirror", gfmNone, gfmNone, gfmHorAndVer);
    const QByteArray icon = bag.ReadProperty("MouseIcon").toByteArray();
    d->mouseIcon = icon.isEmpty() ? Picture() : Picture::fromData(icon);
    setMousePointer(readLong(bag, "MousePointer", 0));
    setEnabled(readBoolean(bag, "Enabled", true));
    d->offsetX = readLong(bag, "OffsetX", 0);
    d->offsetY = readLong(bag, "OffsetY", 0);
    d->load(bag.ReadProperty("GIF").toByteArray());
    // Read after the GIF, so that a saved count overrides the file's own.
    d->animator.setLoopCount(loopCountOf(readLong(bag, "Loops", d->frames.loopCount())));
}

void ucAniGIF::WriteProperties(PropertyBag &bag)
{
    bag.WriteProperty("GIF", d->frames.bytes(), QByteArray());
    bag.WriteProperty("Delay", int(MinFrameDelay()), GifAnimator::DefaultMinFrameDelay);
    bag.WriteProperty("Stretch", d->stretch, int(gfsScaleAlways));
    // Always written: with the default left out, an endless count would read back as the
    // file's own count.
    bag.WriteProperty("Loops", Loops());
    bag.WriteProperty("DelayLoad", d->delayMode, int(gfdDelayStartup));
    bag.WriteProperty("Mirror", d->mirror, int(gfmNone));
    if (!d->mouseIcon.isNull()) {
        QByteArray png;
        QBuffer buffer(&png);
        buffer.open(QIODevice::WriteOnly);
        d->mouseIcon.image().save(&buffer, "PNG");
        bag.WriteProperty("MouseIcon", png);
    }
    bag.WriteProperty("MousePointer", d->mousePointer, 0);
    bag.WriteProperty("Enabled", Enabled(), true);
    bag.WriteProperty("OffsetX", d->offsetX, 0);
    bag.WriteProperty("OffsetY", d->offsetY, 0);
}

void ucAniGIF::Terminate()
{
    d->remote.cancel();
    d->release();
}

void ucAniGIF::AmbientChanged(const QString &name)
{
    if (name != QLatin1String("UserMode"))
        return;
    if (designMode()) {
        d->animator.stop();
        d->animator.rewind();
    } else {
        d->frames.decodeUpTo(d->frames.count());
        d->startPlaying();
    }
    update();
}

void ucAniGIF::paintEvent(QPaintEvent *event)
{
    gdi::PersistentSurface &target = surface();
    target.clear(ambient().BackColor);
    const int current = d->animator.currentFrame();
    const bool drawn = d->loaded() && current > 0;
    if (drawn) {
        const bool scaled = d->scaleX != 1.0 || d->scaleY != 1.0;
        const gdi::HDC dc = target.hdc();
        gdi::SetStretchBltMode(dc, scaled ? gdi::HALFTONE : gdi::COLORONCOLOR);
        gdi::SetBrushOrgEx(dc, 0, 0);
        d->canvas.show(d->frames, current);
        const qint64 w = std::lround(d->frames.canvasWidth() * d->scaleX);
        const qint64 h = std::lround(d->frames.canvasHeight() * d->scaleY);
        // Offsets may be any Long: a picture wholly beside the control is not drawn, and one
        // that shows has edges small enough for a rectangle.
        if (d->offsetX < width() && d->offsetX + w > 0 && d->offsetY < height() && d->offsetY + h > 0)
            d->canvas.paint(dc, QRect(d->offsetX, d->offsetY, int(w), int(h)));
    }
    if (designMode()) {
        const gdi::HDC dc = target.hdc();
        const gdi::HGDIOBJ brush = gdi::SelectObject(dc, gdi::GetStockObject(gdi::NULL_BRUSH));
        gdi::Rectangle(dc, 0, 0, width(), height());
        gdi::SelectObject(dc, brush);
    }
    SurfaceHost<UserControl>::paintEvent(event);
    if (drawn)
        Q_EMIT FrameChanged(current);
}

void ucAniGIF::resizeEvent(QResizeEvent *event)
{
    SurfaceHost<UserControl>::resizeEvent(event);
    d->resizeStep();
}

void ucAniGIF::showEvent(QShowEvent *event)
{
    SurfaceHost<UserControl>::showEvent(event);
    if (d->animator.state() == GifAnimator::Paused)
        d->animator.start();
}

void ucAniGIF::hideEvent(QHideEvent *event)
{
    SurfaceHost<UserControl>::hideEvent(event);
    d->animator.pause();
}

void ucAniGIF::mousePressEvent(QMouseEvent *event)
{
    d->pressed = event->button() == Qt::LeftButton;
    const QPointF at = event->position();
    Q_EMIT MouseDown(buttonsOf(event->button()), shiftOf(event->modifiers()), float(twipsFromPixels(1) * at.x()),
        float(twipsFromPixels(1) * at.y()));
}

void ucAniGIF::mouseReleaseEvent(QMouseEvent *event)
{
    const QPointF at = event->position();
    const bool click
        = std::exchange(d->pressed, false) && event->button() == Qt::LeftButton && rect().contains(at.toPoint());
    const QPointer<ucAniGIF> alive(this);
    Q_EMIT MouseUp(buttonsOf(event->button()), shiftOf(event->modifiers()), float(twipsFromPixels(1) * at.x()),
        float(twipsFromPixels(1) * at.y()));
    if (alive && click)
        Q_EMIT Click();
}

void ucAniGIF::mouseDoubleClickEvent(QMouseEvent *)
{
    // The second press of a double click makes no second Click.
}

void ucAniGIF::mouseMoveEvent(QMouseEvent *event)
{
    const QPointF at = event->position();
    Q_EMIT MouseMove(buttonsOf(event->buttons()), shiftOf(event->modifiers()), float(twipsFromPixels(1) * at.x()),
        float(twipsFromPixels(1) * at.y()));
}

ZELCTL_REGISTER_CLASS(ucAniGIF)

} // namespace zelctl

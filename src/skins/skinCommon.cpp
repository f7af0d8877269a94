#include "skinCommon.h"

#include "common/modFuncs.h"
#include "platform/Pointer.h"
#include "platform/Settings.h"
#include "platform/Twips.h"

#include <QFileInfo>
#include <QGuiApplication>
#include <QImageReader>
#include <QMouseEvent>
#include <QWidget>

#include <cmath>

namespace zelctl::skinCommon {

qint32 loadPicture(const QString &path, QImage &picture)
{
    if (!QFileInfo(path).isFile())
        return ErrFileNotFound;
    QImageReader reader(path);
    QImage image = reader.read();
    if (image.isNull())
        return reader.error() == QImageReader::FileNotFoundError ? ErrFileNotFound : ErrInvalidPicture;
    picture = std::move(image);
    return ErrNone;
}

QString previewFolder()
{
    QString folder = platform::GetSetting(QStringLiteral("zEL"), QStringLiteral("Setup"),
        QStringLiteral("SkinPreviewPath"), modFuncs::GetDataPath() + QStringLiteral("skins/default/"));
    if (!folder.endsWith(QLatin1Char('/')))
        folder += QLatin1Char('/');
    return folder;
}

bool pointerInside(const QWidget *control, QPointF global)
{
    const QPointF client = platform::screenToClient(control, global.toPoint());
    const long x = std::lround(client.x() * platform::TwipsPerPixel);
    const long y = std::lround(client.y() * platform::TwipsPerPixel);
    return x >= 0 && y >= 0 && x <= twips(control->width()) && y <= twips(control->height());
}

HoverTracker::HoverTracker(QWidget *control, bool &hovering, Handlers handlers, HeldLeave heldLeave)
    : m_control(control)
    , m_hovering(hovering)
    , m_handlers(std::move(handlers))
    , m_heldLeave(heldLeave)
{ }

void HoverTracker::moved(const QMouseEvent *event)
{
    const bool held = event->buttons() != Qt::NoButton;
    platform::setCapture(m_control);
    const bool inside = pointerInside(m_control, event->globalPosition());
    if (inside && !m_hovering) {
        m_hovering = true;
        const QPointer<QWidget> alive(m_control);
        m_handlers.mouseIn();
        if (alive)
            m_handlers.repaint();
    } else if (!inside && m_hovering) {
        left(held);
    } else if (!inside && !held) {
        platform::releaseCapture();
    }
}

void HoverTracker::windowLeft()
{
    if (m_hovering && QGuiApplication::mouseButtons() == Qt::NoButton)
        left(false);
}

void HoverTracker::left(bool held)
{
    const QPointer<QWidget> alive(m_control);
    m_handlers.mouseOut();
    if (!alive)
        return;
    if (!held || m_heldLeave == HeldLeave::ReleaseCapture)
        platform::releaseCapture();
    m_hovering = false;
    m_handlers.repaint();
}

void HoverTracker::pressed(const QMouseEvent *event)
{
    if (event->button() == Qt::LeftButton)
        m_pressedHere = true;
}

bool HoverTracker::releasedForClick(const QMouseEvent *event)
{
    const bool click = event->button() == Qt::LeftButton && std::exchange(m_pressedHere, false)
        && pointerInside(m_control, event->globalPosition());
    if (click && platform::capturedWidget() == m_control)
        platform::releaseCapture();
    return click;
}

MouseArgs mouseArgs(const QMouseEvent *event)
{
    const Qt::MouseButtons buttons = event->type() == QEvent::MouseMove ? event->buttons() : event->button();
    MouseArgs args;
    args.Button = qint16((buttons & Qt::LeftButton ? 1 : 0) | (buttons & Qt::RightButton ? 2 : 0)
        | (buttons & Qt::MiddleButton ? 4 : 0));
    const Qt::KeyboardModifiers modifiers = event->modifiers();
    args.Shift = qint16((modifiers & Qt::ShiftModifier ? 1 : 0) | (modifiers & Qt::ControlModifier ? 2 : 0)
        | (modifiers & Qt::AltModifier ? 4 : 0));
    args.X = float(event->position().x() * platform::TwipsPerPixel);
    args.Y = float(event->position().y() * platform::TwipsPerPixel);
    return args;
}

namespace {

// A slot number from a host's index value, or -1.
int slotOf(const QVariant &index)
{
    bool ok = false;
    const int slot = index.toInt(&ok);
    return ok && slot >= 0 && slot < ImageFileSlots::Count ? slot : -1;
}

} // namespace

QString ImageFileSlots::path(const QVariant &index) const
{
    const int slot = slotOf(index);
    return slot < 0 ? QString() : m_paths[size_t(slot)];
}

void ImageFileSlots::set(const QVariant &index, const QString &path)
{
    const int slot = slotOf(index);
    if (slot < 0 || path == m_paths[size_t(slot)])
        return;
    m_paths[size_t(slot)] = path;
    m_pictures[size_t(slot)] = QImage();
    loadPicture(path, m_pictures[size_t(slot)]);
}

const QImage &ImageFileSlots::picture(int slot) const
{
    static const QImage none;
    return slot >= 0 && slot < Count ? m_pictures[size_t(slot)] : none;
}

void ImageFileSlots::releasePictures()
{
    m_pictures.fill(QImage());
}

SelectedFont::SelectedFont(gdi::HDC hdc, const QFont &font)
    : m_hdc(hdc)
    , m_font(gdi::CreateFont(font.family(), font.pointSizeF(), font.bold()))
    , m_previous(gdi::SelectObject(hdc, m_font))
{ }

SelectedFont::~SelectedFont()
{
    gdi::SelectObject(m_hdc, m_previous);
    gdi::DeleteObject(m_font);
}

gdi::SIZE SelectedFont::extent(const QString &text) const
{
    gdi::SIZE size;
    gdi::GetTextExtentPoint32(m_hdc, text, size);
    return size;
}

int twips(int pixels)
{
    return platform::twipsFromPixels(pixels);
}

int pixels(int twips)
{
    return platform::pixelsFromTwips(twips);
}

void fillBox(gdi::HDC hdc, int left, int top, int right, int bottom, platform::OleColor color)
{
    const gdi::HBRUSH brush = gdi::CreateSolidBrush(color);
    gdi::FillRect(hdc, gdi::RECT { left, top, right, bottom }, brush);
    gdi::DeleteObject(brush);
}

void line(gdi::HDC hdc, int x0, int y0, int x1, int y1, platform::OleColor color)
{
    const gdi::HPEN pen = gdi::CreatePen(gdi::PS_SOLID, 1, color);
    const gdi::HGDIOBJ previous = gdi::SelectObject(hdc, pen);
    gdi::MoveToEx(hdc, x0, y0);
    gdi::LineTo(hdc, x1, y1);
    gdi::SelectObject(hdc, previous);
    gdi::DeleteObject(pen);
}

} // namespace zelctl::skinCommon

#pragma once

#include "zelctl_export.h"

#include "platform/OleColor.h"
#include "platform/gdi/Gdi.h"
#include "platform/gdi/Pictures.h"

#include <QFont>
#include <QImage>
#include <QPointF>
#include <QPointer>
#include <QString>
#include <QVariant>

#include <array>
#include <functional>

class QMouseEvent;
class QWidget;

// What the skinned controls share: loading their pictures, the design-time preview folder,
// pointer tracking with capture, and a few drawing steps on their surfaces.
namespace zelctl::skinCommon {

// Errors a picture slot reports to its caller, with the numbers hosts know them by.
inline constexpr qint32 ErrNone = 0;
inline constexpr qint32 ErrSubscriptOutOfRange = 9;
inline constexpr qint32 ErrFileNotFound = 53;
inline constexpr qint32 ErrInvalidPicture = 481;

// Reads a picture file with Qt's image readers (GIF with its transparent colour, PNG,
// BMP ...). On success `picture` receives it and the answer is ErrNone; otherwise the
// picture is left alone and the answer says why.
ZELCTL_EXPORT qint32 loadPicture(const QString &path, QImage &picture);

// The folder of the design-time preview pictures, ending with "/": the "SkinPreviewPath"
// setting of application "zEL", section "Setup", or else the data folder's
// "skins/default/".
ZELCTL_EXPORT QString previewFolder();

// Whether a pointer at a screen position lies on the control; the far edges count as on it.
ZELCTL_EXPORT bool pointerInside(const QWidget *control, QPointF global);

// Hovering and clicking for a control that raises MouseIn and MouseOut itself. It takes
// the pointer capture on a move (so the control hears of the pointer leaving) and gives
// it back when the pointer is off an idle control, and before a click is raised, so an
// idle control never keeps the application's pointer input and a host may open a modal
// form from the click. The hovering flag belongs to the control; the tracker keeps it up
// to date. The host may delete the control from MouseIn or MouseOut: the tracker, which
// the control owns, then stops at once.
class ZELCTL_EXPORT HoverTracker
{
public:
    // Whether leaving with a button held keeps the capture, so the release still comes
    // to the control.
    enum class HeldLeave { KeepCapture, ReleaseCapture };

    struct Handlers
    {
        std::function<void()> mouseIn;
        std::function<void()> mouseOut;
        std::function<void()> repaint;
    };

    HoverTracker(QWidget *control, bool &hovering, Handlers handlers, HeldLeave heldLeave = HeldLeave::KeepCapture);

    // From mouseMoveEvent: raises MouseIn or MouseOut as the pointer crosses the edge.
    void moved(const QMouseEvent *event);
    // From leaveEvent: where the window system cannot capture the pointer, leaving the
    // window is the last the control hears of it.
    void windowLeft();

    // From mousePressEvent: remembers a left press on the control.
    void pressed(const QMouseEvent *event);
    // From mouseReleaseEvent: whether this release ends a left press on the control
    // inside it, i.e. makes a click; the capture is given back first. A left release
    // forgets the press either way.
    bool releasedForClick(const QMouseEvent *event);

private:
    void left(bool held);

    QWidget *m_control;
    bool &m_hovering;
    Handlers m_handlers;
    HeldLeave m_heldLeave;
    bool m_pressedHere = false;
};

// The arguments of a mouse event as hosts receive them: Button 1 left, 2 right, 4 middle
// (for a move, the buttons held), Shift 1 shift, 2 control, 4 alt, and the position in
// twips.
struct MouseArgs
{
    qint16 Button = 0;
    qint16 Shift = 0;
    float X = 0;
    float Y = 0;
};
ZELCTL_EXPORT MouseArgs mouseArgs(const QMouseEvent *event);

// Raises one of a control's mouse events (MouseDown, MouseUp, MouseMove) for an event.
// False when the host deleted the control in its handler: the caller must not touch it.
template <typename Control>
bool raiseMouse(Control *control, void (Control::*event)(qint16 &, qint16 &, float &, float &), const QMouseEvent *from)
{
    MouseArgs args = mouseArgs(from);
    const QPointer<Control> alive(control);
    Q_EMIT(control->*event)(args.Button, args.Shift, args.X, args.Y);
    return !alive.isNull();
}

// The four picture slots that ImageFile(nIndex) fills: setting a slot to a new path empties
// it and loads the file afresh; an index that is not a number from 0 to 3, a path the slot
// already holds, or a file that cannot be read change nothing else and report nothing.
class ZELCTL_EXPORT ImageFileSlots
{
public:
    static constexpr int Count = 4;

    // The stored path; "" for an index outside 0 to 3.
    QString path(const QVariant &index) const;
    void set(const QVariant &index, const QString &path);
    // The loaded picture of a slot; a null image when there is none.
    const QImage &picture(int slot) const;
    bool hasPicture(int slot) const { return !picture(slot).isNull(); }
    // Releases the pictures, keeping the paths.
    void releasePictures();

private:
    std::array<QString, Count> m_paths;
    std::array<QImage, Count> m_pictures;
};

// A font selected into a surface for as long as this lives.
class ZELCTL_EXPORT SelectedFont
{
public:
    SelectedFont(gdi::HDC hdc, const QFont &font);
    ~SelectedFont();
    SelectedFont(const SelectedFont &) = delete;
    SelectedFont &operator=(const SelectedFont &) = delete;

    // Width and height of a text in pixels.
    gdi::SIZE extent(const QString &text) const;

private:
    gdi::HDC m_hdc;
    gdi::HFONT m_font;
    gdi::HGDIOBJ m_previous;
};

// Lengths between twips and the surface's pixels (15 twips per pixel).
ZELCTL_EXPORT int twips(int pixels);
ZELCTL_EXPORT int pixels(int twips);

// Fills [left, right) × [top, bottom) with a colour.
ZELCTL_EXPORT void fillBox(gdi::HDC hdc, int left, int top, int right, int bottom, platform::OleColor color);
// A one-pixel line from (x0, y0) up to, not including, (x1, y1).
ZELCTL_EXPORT void line(gdi::HDC hdc, int x0, int y0, int x1, int y1, platform::OleColor color);

} // namespace zelctl::skinCommon

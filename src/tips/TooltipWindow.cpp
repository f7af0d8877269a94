#include "TooltipWindow.h"

#include "platform/Accessibility.h"
#include "platform/OleColor.h"
#include "platform/Pointer.h"

#include <QApplication>
#include <QBitmap>
#include <QEnterEvent>
#include <QMouseEvent>
#include <QPainter>
#include <QScreen>

#include <limits>

namespace zelctl {

using namespace tooltipControl;

namespace {

constexpr int DefaultInitialDelay = 500;
constexpr int DefaultAutoPopDelay = 10 * DefaultInitialDelay;

// Any of CR LF, CR or LF ends a line.
QString normalisedText(const char *text)
{
    QString value = QString::fromUtf8(text);
    value.replace(QLatin1String("\r\n"), QLatin1String("\n"));
    value.replace(QLatin1Char('\r'), QLatin1Char('\n'));
    return value;
}

// Colour 0 stands for the system colour of tips.
QColor tipColour(WPARAM colour, platform::SysColor system)
{
    const auto value = static_cast<platform::OleColor>(colour);
    return platform::toQColor(value == 0 ? platform::systemColor(system) : value);
}

} // namespace

TooltipWindow::TooltipWindow(UINT style, QWidget *owner)
    : QWidget(owner, Qt::ToolTip | Qt::FramelessWindowHint | Qt::WindowStaysOnTopHint | Qt::WindowDoesNotAcceptFocus)
    , m_style(style)
{
    setObjectName(QLatin1String(TOOLTIPS_CLASSA));
    setAttribute(Qt::WA_TranslucentBackground);
    setAttribute(Qt::WA_ShowWithoutActivating);
    m_initialTimer.setSingleShot(true);
    m_initialTimer.setInterval(DefaultInitialDelay);
    m_autoPopTimer.setSingleShot(true);
    m_autoPopTimer.setInterval(DefaultAutoPopDelay);
    connect(&m_initialTimer, &QTimer::timeout, this, [this] {
        if (m_tool && m_active && !m_content.text.isEmpty())
            popUp();
        else
            m_pointer = Pointer::Spent;
    });
    connect(&m_autoPopTimer, &QTimer::timeout, this, &TooltipWindow::dismiss);
}

TooltipWindow::~TooltipWindow()
{
    qApp->removeEventFilter(this);
    if (m_tool)
        m_tool->removeEventFilter(this);
}

LRESULT TooltipWindow::message(UINT message, WPARAM wParam, LPARAM lParam)
{
    switch (message) {
    case TTM_ACTIVATE:
        activate(wParam != 0);
        return 0;
    case TTM_SETDELAYTIME:
        setDelay(wParam, lParam);
        return 0;
    case TTM_ADDTOOLA:
        return addTool(reinterpret_cast<const TOOLINFOA *>(lParam));
    case TTM_UPDATETIPTEXTA:
        return updateText(reinterpret_cast<const TOOLINFOA *>(lParam));
    case TTM_SETTIPBKCOLOR:
        m_background = wParam;
        relayout();
        return 0;
    case TTM_SETTIPTEXTCOLOR:
        m_foreground = wParam;
        relayout();
        return 0;
    case TTM_SETTITLEA:
        return setTitle(wParam, reinterpret_cast<const char *>(lParam));
    default:
        return 0;
    }
}

QColor TooltipWindow::foreground() const
{
    return tipColour(m_foreground, platform::COLOR_INFOTEXT);
}

QColor TooltipWindow::background() const
{
    return tipColour(m_background, platform::COLOR_INFOBK);
}

LRESULT TooltipWindow::addTool(const TOOLINFOA *tool)
{
    if (!tool || tool->cbSize != TOOLINFOA_SIZE)
        return 0;
    QWidget *window = platform::widgetOf(tool->uFlags & TTF_IDISHWND ? HWND(tool->uId) : tool->hwnd);
    if (!window)
        return 0;

    // One tool a window: a new one replaces the old.
    pointerGone();
    if (m_tool)
        m_tool->removeEventFilter(this);
    m_tool = window;
    m_toolHwnd = tool->hwnd;
    m_toolId = tool->uId;
    m_flags = tool->uFlags;
    m_toolRect = QRect(QPoint(tool->rect.left, tool->rect.top), QPoint(tool->rect.right - 1, tool->rect.bottom - 1));
    m_content.text = normalisedText(tool->lpszText);
    setWindowFlag(Qt::WindowTransparentForInput, m_flags & TTF_TRANSPARENT);
    if (m_flags & TTF_SUBCLASS) {
        window->installEventFilter(this);
        // The pointer may already rest on the tool, as when the tool adds its tip on a pointer move.
        if (window->underMouse()) {
            const QPoint global = platform::cursorPos();
            const QPoint local = window->mapFromGlobal(global);
            pointerAt(inTool(local) ? local : window->rect().center(),
                inTool(local) ? global : window->mapToGlobal(window->rect().center()));
        }
    }
    return 1;
}

LRESULT TooltipWindow::updateText(const TOOLINFOA *tool)
{
    if (!tool || !m_tool || tool->hwnd != m_toolHwnd || tool->uId != m_toolId)
        return 0;
    m_content.text = normalisedText(tool->lpszText);
    if (m_content.text.isEmpty())
        dismiss();
    relayout();
    return 1;
}

LRESULT TooltipWindow::setTitle(WPARAM icon, const char *title)
{
    if (!title || icon > TTI_ERROR)
        return 0;
    m_content.icon = int(icon);
    m_content.title = QString::fromUtf8(title);
    relayout();
    return 1;
}

void TooltipWindow::setDelay(WPARAM kind, LPARAM milliseconds)
{
    // A negative time restores the default.
    const int clamped = int(std::min<LPARAM>(milliseconds, std::numeric_limits<int>::max()));
    if (kind == TTDT_INITIAL)
        m_initialTimer.setInterval(clamped < 0 ? DefaultInitialDelay : clamped);
    else if (kind == TTDT_AUTOPOP)
        m_autoPopTimer.setInterval(clamped < 0 ? DefaultAutoPopDelay : clamped);
}

void TooltipWindow::activate(bool active)
{
    m_active = active;
    if (!active)
        dismiss();
    else if (m_tool && !m_content.text.isEmpty())
        popUp();
}

bool TooltipWindow::eventFilter(QObject *watched, QEvent *event)
{
    if (watched != m_tool) {
        // While the pointer is on the tool, any move elsewhere means it has left, even when
        // the tool missed its leave event (as when a window opened under the pointer).
        if (event->type() == QEvent::MouseMove && m_pointer != Pointer::Outside) {
            const QPoint global = static_cast<QMouseEvent *>(event)->globalPosition().toPoint();
            if (!m_tool || !m_tool->isVisible() || !inTool(m_tool->mapFromGlobal(global)))
                pointerGone();
        }
        return false;
    }
    switch (event->type()) {
    case QEvent::Enter: {
        // Coming in starts afresh, whatever was missed while the pointer was away.
        pointerGone();
        const auto *enter = static_cast<QEnterEvent *>(event);
        pointerAt(enter->position().toPoint(), enter->globalPosition().toPoint());
        break;
    }
    case QEvent::MouseMove: {
        const auto *move = static_cast<QMouseEvent *>(event);
        pointerAt(move->position().toPoint(), move->globalPosition().toPoint());
        break;
    }
    case QEvent::Leave:
    case QEvent::Hide:
        pointerGone();
        break;
    case QEvent::MouseButtonPress:
    case QEvent::MouseButtonDblClick:
    case QEvent::Wheel:
    case QEvent::KeyPress:
        if (m_pointer != Pointer::Outside)
            dismiss();
        break;
    case QEvent::ToolTip:
        // This tip stands in for the tool's plain tooltip; both at once would overlap.
        return true;
    default:
        break;
    }
    return false;
}

bool TooltipWindow::inTool(QPoint local) const
{
    return m_flags & TTF_IDISHWND ? m_tool->rect().contains(local) : m_toolRect.contains(local);
}

void TooltipWindow::pointerAt(QPoint local, QPoint global)
{
    if (!inTool(local)) {
        pointerGone();
        return;
    }
    m_pointerPos = global;
    if (m_pointer == Pointer::Outside)
        qApp->installEventFilter(this);
    if (m_pointer == Pointer::Outside || m_pointer == Pointer::Resting) {
        // Every move starts the wait again: the pointer must rest.
        m_pointer = Pointer::Resting;
        m_initialTimer.start();
    }
}

void TooltipWindow::pointerGone()
{
    m_initialTimer.stop();
    m_autoPopTimer.stop();
    if (m_pointer != Pointer::Outside)
        qApp->removeEventFilter(this);
    m_pointer = Pointer::Outside;
    hide();
}

void TooltipWindow::dismiss()
{
    m_initialTimer.stop();
    m_autoPopTimer.stop();
    if (m_pointer != Pointer::Outside)
        m_pointer = Pointer::Spent;
    hide();
}

void TooltipWindow::popUp()
{
    const QRect tool = m_flags & TTF_IDISHWND ? m_tool->rect() : m_toolRect;
    const bool pointerOnTool = m_pointer != Pointer::Outside;
    m_centred = (m_flags & TTF_CENTERTIP) || !pointerOnTool;
    m_anchor = m_centred ? m_tool->mapToGlobal(QPoint(tool.center().x(), tool.bottom())) : m_pointerPos;
    if (pointerOnTool)
        m_pointer = Pointer::Shown;
    m_initialTimer.stop();
    place();
    show();
    // Qt announces no tooltip window as it shows; a screen reader reads this one's title and
    // text from its interface.
    platform::raiseAccessibleEvent(this, QAccessible::ObjectShow);
    m_autoPopTimer.start();
}

void TooltipWindow::place()
{
    const QScreen *screen = QGuiApplication::screenAt(m_anchor);
    if (!screen)
        screen = m_tool ? m_tool->screen() : QGuiApplication::primaryScreen();
    const tipShape::Content shown = content();
    m_placement = tipShape::place(
        tipShape::contentSize(shown, font()), m_anchor, screen->availableGeometry(), isBalloon(), m_centred);
    setGeometry(m_placement.geometry);

    shapeWindow();
    update();
}

void TooltipWindow::shapeWindow()
{
    // X11 may run without a compositor, and then the transparent corners would show black;
    // the mask cuts them off. Other platforms compose, or cannot shape windows at all.
    if (QGuiApplication::platformName() != QLatin1String("xcb"))
        return;
    QImage shape(m_placement.geometry.size(), QImage::Format_ARGB32_Premultiplied);
    shape.fill(Qt::transparent);
    QPainter painter(&shape);
    painter.setPen(QPen(Qt::black, 1));
    painter.setBrush(Qt::black);
    painter.drawPath(m_placement.outline);
    painter.end();
    setMask(QBitmap::fromImage(shape.createAlphaMask()));
}

void TooltipWindow::relayout()
{
    if (isVisible())
        place();
}

tipShape::Content TooltipWindow::content() const
{
    tipShape::Content shown = m_content;
    shown.foreground = foreground();
    shown.background = background();
    return shown;
}

void TooltipWindow::paintEvent(QPaintEvent *)
{
    QPainter painter(this);
    tipShape::paint(painter, m_placement, content(), font());
}

} // namespace zelctl

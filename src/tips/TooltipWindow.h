#pragma once

#include "zelctl_export.h"

#include "tips/TipShape.h"
#include "tips/TooltipControl.h"

#include <QPointer>
#include <QTimer>
#include <QWidget>

namespace zelctl {

// The tooltip window: one tool (a window, or an area of one) whose pointer input it watches.
// When the pointer rests on the tool for the initial delay the tip shows beside the pointer
// (or centred under the tool) and hides after the display time, when the pointer leaves,
// or when a button is pressed on the tool. It is configured only through message().
class ZELCTL_EXPORT TooltipWindow : public QWidget
{
    Q_OBJECT

public:
    TooltipWindow(tooltipControl::UINT style, QWidget *owner);
    ~TooltipWindow() override;

    // Handles one TTM_ message (see tooltipControl).
    tooltipControl::LRESULT message(
        tooltipControl::UINT message, tooltipControl::WPARAM wParam, tooltipControl::LPARAM lParam);

    // What the window holds.
    tooltipControl::UINT style() const { return m_style; }
    bool isBalloon() const { return m_style & tooltipControl::TTS_BALLOON; }
    bool isActive() const { return m_active; }
    QWidget *tool() const { return m_tool; }
    tooltipControl::UINT toolFlags() const { return m_flags; }
    QString text() const { return m_content.text; }
    QString title() const { return m_content.title; }
    int icon() const { return m_content.icon; }
    QColor foreground() const;
    QColor background() const;
    int initialDelay() const { return m_initialTimer.interval(); }
    int autoPopDelay() const { return m_autoPopTimer.interval(); }
    // Where the tip was last placed, and what it referred to.
    const tipShape::Placement &placement() const { return m_placement; }
    QPoint anchor() const { return m_anchor; }

protected:
    bool eventFilter(QObject *watched, QEvent *event) override;
    void paintEvent(QPaintEvent *event) override;

private:
    enum class Pointer {
        Outside,
        Resting, // on the tool, waiting for the initial delay
        Shown,
        Spent, // still on the tool, but the tip has had its turn
    };

    tooltipControl::LRESULT addTool(const tooltipControl::TOOLINFOA *tool);
    tooltipControl::LRESULT updateText(const tooltipControl::TOOLINFOA *tool);
    tooltipControl::LRESULT setTitle(tooltipControl::WPARAM icon, const char *title);
    void setDelay(tooltipControl::WPARAM kind, tooltipControl::LPARAM milliseconds);
    void activate(bool active);

    bool inTool(QPoint local) const;
    void pointerAt(QPoint local, QPoint global);
    void pointerGone();
    void dismiss();
    void popUp();
    void place();
    void shapeWindow();
    void relayout();
    tipShape::Content content() const;

    tooltipControl::UINT m_style;
    bool m_active = true;
    QPointer<QWidget> m_tool;
    tooltipControl::HWND m_toolHwnd = 0;
    tooltipControl::WPARAM m_toolId = 0;
    tooltipControl::UINT m_flags = 0;
    QRect m_toolRect;
    tipShape::Content m_content;
    tooltipControl::WPARAM m_foreground = 0;
    tooltipControl::WPARAM m_background = 0;

    Pointer m_pointer = Pointer::Outside;
    QPoint m_pointerPos; // in screen pixels
    QPoint m_anchor; // what the tip refers to: the pointer, or the middle of the tool's lower edge
    bool m_centred = false;
    tipShape::Placement m_placement;
    QTimer m_initialTimer;
    QTimer m_autoPopTimer;
};

} // namespace zelctl

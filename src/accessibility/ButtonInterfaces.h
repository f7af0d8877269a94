#pragma once

#include <QAccessibleWidget>

// What assistive technology reads of the library's buttons. Each class describes one kind of
// button from its control's public state; none keeps a pointer of its own, so an interface
// asked after its widget has gone answers nothing (QAccessibleWidget::isValid).
namespace zelctl::accessibility {

// A button a user presses with the keyboard's Space: its press action posts that key to it,
// so the action does exactly what the key does, after the caller has had its answer (a press
// may open a modal dialog).
class PressableButton : public QAccessibleWidget
{
public:
    explicit PressableButton(QWidget *widget);

    QStringList actionNames() const override;
    void doAction(const QString &actionName) override;
    QStringList keyBindingsForAction(const QString &actionName) const override;
};

// The companion command button: named after its whole caption (a caption cut short with "…"
// on screen is read whole), else its tooltip; a toggle button is checkable, and checked while
// pressed.
class CommandButtonInterface : public PressableButton
{
public:
    using PressableButton::PressableButton;

    QString text(QAccessible::Text t) const override;
    QAccessible::State state() const override;
};

// The toggle of cSlider: named after what it does ("Abrir o painel", "Fechar o painel"),
// expandable, and expanded while the slider is open.
class SliderToggleInterface : public CommandButtonInterface
{
public:
    using CommandButtonInterface::CommandButtonInterface;

    QString text(QAccessible::Text t) const override;
    QAccessible::State state() const override;
};

// skGoButton: named after its tip text; pressed while the left button holds it (Active).
class GoButtonInterface : public PressableButton
{
public:
    using PressableButton::PressableButton;

    QString text(QAccessible::Text t) const override;
    QAccessible::State state() const override;
};

// skNumber and skSubMenu: named after their caption, checked while Active (the current step
// or page).
class CaptionButtonInterface : public PressableButton
{
public:
    using PressableButton::PressableButton;

    QString text(QAccessible::Text t) const override;
    QAccessible::State state() const override;
};

// InfoButton: named after its tip's title (or its kind: information, warning, error), with
// the tip's text as its description.
class InfoButtonInterface : public PressableButton
{
public:
    using PressableButton::PressableButton;

    QString text(QAccessible::Text t) const override;
};

} // namespace zelctl::accessibility

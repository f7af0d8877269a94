#include "ButtonInterfaces.h"

#include "companion/CommandButton.h"
#include "platform/Accessibility.h"
#include "skins/cSlider.h"
#include "skins/skGoButton.h"
#include "tips/InfoButton.h"

#include <QCoreApplication>
#include <QKeyEvent>
#include <QKeySequence>

namespace zelctl::accessibility {

namespace {

// The lines of an information button's tip, as InfoButton breaks them.
QString tipLines(const QString &text)
{
    QString lines = text.trimmed();
    lines.replace(QLatin1String("||"), QLatin1String("\n"));
    lines.replace(QLatin1String("\\n"), QLatin1String("\n"));
    return lines;
}

} // namespace

PressableButton::PressableButton(QWidget *widget)
    : QAccessibleWidget(widget, QAccessible::Button)
{ }

QStringList PressableButton::actionNames() const
{
    return QStringList { pressAction() } + QAccessibleWidget::actionNames();
}

void PressableButton::doAction(const QString &actionName)
{
    if (actionName != pressAction()) {
        QAccessibleWidget::doAction(actionName);
        return;
    }
    if (!widget()->isEnabled())
        return;
    // Posted: a widget deleted before they arrive takes them with it.
    QCoreApplication::postEvent(
        widget(), new QKeyEvent(QEvent::KeyPress, Qt::Key_Space, Qt::NoModifier, QStringLiteral(" ")));
    QCoreApplication::postEvent(
        widget(), new QKeyEvent(QEvent::KeyRelease, Qt::Key_Space, Qt::NoModifier, QStringLiteral(" ")));
}

QStringList PressableButton::keyBindingsForAction(const QString &actionName) const
{
    if (actionName == pressAction())
        return { QKeySequence(Qt::Key_Space).toString(QKeySequence::NativeText) };
    return QAccessibleWidget::keyBindingsForAction(actionName);
}

QString CommandButtonInterface::text(QAccessible::Text t) const
{
    const auto *button = static_cast<const CommandButton *>(widget());
    switch (t) {
    case QAccessible::Name:
        if (!button->accessibleName().isEmpty())
            return button->accessibleName();
        return button->Caption().isEmpty() ? button->toolTip() : platform::withoutAccessKey(button->Caption());
    case QAccessible::Description:
        if (!button->accessibleDescription().isEmpty())
            return button->accessibleDescription();
        return button->Caption().isEmpty() ? QString() : button->toolTip();
    case QAccessible::Accelerator: {
        const QKeySequence key = QKeySequence::mnemonic(button->Caption());
        return key.isEmpty() ? QString() : key.toString(QKeySequence::NativeText);
    }
    default:
        return QAccessibleWidget::text(t);
    }
}

QAccessible::State CommandButtonInterface::state() const
{
    const auto *button = static_cast<const CommandButton *>(widget());
    QAccessible::State state = QAccessibleWidget::state();
    state.checkable = button->Toggle();
    state.checked = button->Value();
    state.pressed = button->isDown();
    state.defaultButton = button->Default();
    return state;
}

QString SliderToggleInterface::text(QAccessible::Text t) const
{
    const auto *slider = static_cast<const cSlider *>(widget()->parentWidget());
    if (t == QAccessible::Name && widget()->accessibleName().isEmpty())
        return slider->SlideOpen() ? QStringLiteral("Fechar o painel") : QStringLiteral("Abrir o painel");
    return CommandButtonInterface::text(t);
}

QAccessible::State SliderToggleInterface::state() const
{
    const auto *slider = static_cast<const cSlider *>(widget()->parentWidget());
    QAccessible::State state = CommandButtonInterface::state();
    state.expandable = true;
    state.expanded = slider->SlideOpen();
    state.collapsed = !slider->SlideOpen();
    return state;
}

QString GoButtonInterface::text(QAccessible::Text t) const
{
    const auto *button = static_cast<const skGoButton *>(widget());
    if (t == QAccessible::Name) {
        const QString given = platform::hostGivenName(*button);
        return given.isEmpty() ? button->Tooltip() : given;
    }
    return QAccessibleWidget::text(t);
}

QAccessible::State GoButtonInterface::state() const
{
    QAccessible::State state = QAccessibleWidget::state();
    state.pressed = static_cast<const skGoButton *>(widget())->Active();
    return state;
}

QString CaptionButtonInterface::text(QAccessible::Text t) const
{
    if (t == QAccessible::Name) {
        const QString given = platform::hostGivenName(*widget());
        return given.isEmpty() ? widget()->property("Caption").toString() : given;
    }
    return QAccessibleWidget::text(t);
}

QAccessible::State CaptionButtonInterface::state() const
{
    QAccessible::State state = QAccessibleWidget::state();
    state.checkable = true;
    state.checked = widget()->property("Active").toBool();
    return state;
}

QString InfoButtonInterface::text(QAccessible::Text t) const
{
    const auto *button = static_cast<const InfoButton *>(widget());
    switch (t) {
    case QAccessible::Name:
        if (!button->accessibleName().isEmpty())
            return button->accessibleName();
        if (!button->ToolTipTitle().isEmpty())
            return button->ToolTipTitle();
        switch (button->Style()) {
        case InfoButton::IB_WARNING:
            return QStringLiteral("Aviso");
        case InfoButton::IB_ERROR:
            return QStringLiteral("Erro");
        case InfoButton::IB_INFO:
            break;
        }
        return QStringLiteral("Informação");
    case QAccessible::Description:
        // A plain tooltip given by the container is the tip's text until the tip takes it.
        return tipLines(button->TipText().isEmpty() ? button->toolTip() : button->TipText());
    default:
        return QAccessibleWidget::text(t);
    }
}

} // namespace zelctl::accessibility

#include "Accessibility.h"

#include <QLabel>
#include <QWidget>

namespace zelctl::platform {

namespace {

// The states a control's changes turn on and off; focus and visibility have events of their own.
QAccessible::State changedStates(const QAccessible::State &was, const QAccessible::State &now)
{
    QAccessible::State changed;
    changed.disabled = was.disabled != now.disabled;
    changed.checkable = was.checkable != now.checkable;
    changed.checked = was.checked != now.checked;
    changed.pressed = was.pressed != now.pressed;
    changed.readOnly = was.readOnly != now.readOnly;
    changed.expandable = was.expandable != now.expandable;
    changed.expanded = was.expanded != now.expanded;
    changed.collapsed = was.collapsed != now.collapsed;
    changed.busy = was.busy != now.busy;
    changed.animated = was.animated != now.animated;
    changed.invalid = was.invalid != now.invalid;
    changed.editable = was.editable != now.editable;
    changed.hasPopup = was.hasPopup != now.hasPopup;
    return changed;
}

} // namespace

QString withoutAccessKey(const QString &caption)
{
    QString plain;
    plain.reserve(caption.size());
    for (qsizetype i = 0; i < caption.size(); ++i) {
        if (caption[i] == u'&' && i + 1 < caption.size())
            ++i;
        plain += caption[i];
    }
    return plain;
}

QString hostGivenName(const QWidget &control)
{
    if (!control.accessibleName().isEmpty())
        return control.accessibleName();
    if (const QWidget *parent = control.parentWidget()) {
        for (const QObject *child : parent->children()) {
            const auto *label = qobject_cast<const QLabel *>(child);
            if (label && label->buddy() == &control && !label->text().isEmpty())
                return withoutAccessKey(label->text());
        }
    }
    return control.toolTip();
}

void setAccessibleTexts(QWidget &widget, const QString &name, const QString &description)
{
    if (widget.accessibleName() != name)
        widget.setAccessibleName(name);
    if (widget.accessibleDescription() != description)
        widget.setAccessibleDescription(description);
}

void raiseAccessibleEvent(QObject *object, QAccessible::Event kind)
{
    if (!QAccessible::isActive() || !object)
        return;
    QAccessibleEvent event(object, kind);
    QAccessible::updateAccessibility(&event);
}

AccessibleEcho::AccessibleEcho(QObject *object)
    : m_object(object)
{ }

void AccessibleEcho::refresh()
{
    if (!QAccessible::isActive() || !m_object)
        return;
    QAccessibleInterface *iface = QAccessible::queryAccessibleInterface(m_object);
    if (!iface || !iface->isValid())
        return;
    // Each event may run a listener's code; the object is asked again only while it lives.
    const QPointer<QObject> alive = m_object;
    const QString name = iface->text(QAccessible::Name);
    if (name != m_name) {
        m_name = name;
        QAccessibleEvent event(m_object, QAccessible::NameChanged);
        QAccessible::updateAccessibility(&event);
    }
    const QString description = iface->text(QAccessible::Description);
    if (alive && description != m_description) {
        m_description = description;
        QAccessibleEvent event(m_object, QAccessible::DescriptionChanged);
        QAccessible::updateAccessibility(&event);
    }
    const QString value = alive ? iface->text(QAccessible::Value) : QString();
    if (alive && value != m_value) {
        m_value = value;
        QAccessibleValueChangeEvent event(m_object, value);
        QAccessible::updateAccessibility(&event);
    }
    if (!alive)
        return;
    const QAccessible::State state = iface->state();
    const QAccessible::State changed = changedStates(m_state, state);
    m_state = state;
    if (changed != QAccessible::State()) {
        QAccessibleStateChangeEvent event(m_object, changed);
        QAccessible::updateAccessibility(&event);
    }
}

void AccessibleEcho::mirrorTo(QWidget &part)
{
    if (QAccessible::isActive() && m_object)
        setAccessibleTexts(part, m_name, m_description);
}

} // namespace zelctl::platform

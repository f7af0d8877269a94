#pragma once

#include "zelctl_export.h"

#include <QAccessible>
#include <QPointer>
#include <QString>

class QWidget;

// What the controls tell assistive technology (screen readers, over AT-SPI on Linux). The
// interfaces that describe each control live in accessibility/; the controls use what is here
// to name their parts and to raise the events of their changes.
namespace zelctl::platform {

// The name a host gave a control: the accessible name it set, else the text of a label whose
// buddy the control is (without its access-key "&"), else the control's tooltip; "" when none.
ZELCTL_EXPORT QString hostGivenName(const QWidget &control);

// A caption as a screen reader reads it: "&&" is an ampersand, a lone "&" marks the access key.
ZELCTL_EXPORT QString withoutAccessKey(const QString &caption);

// Sets a widget's accessible name and description, only where they differ (each change is an
// event a screen reader hears).
ZELCTL_EXPORT void setAccessibleTexts(QWidget &widget, const QString &name, const QString &description);

// Raises an event of one kind (QAccessible::ObjectShow, QAccessible::Alert ...) for an object,
// when assistive technology listens.
ZELCTL_EXPORT void raiseAccessibleEvent(QObject *object, QAccessible::Event kind);

// What assistive technology last heard of one object: its name, description, value and
// states, as its accessible interface gives them. A control calls refresh() after each change
// of its state; the events for what differs since the last call are raised then, so a screen
// reader hears "NIF inválido" as it happens. Nothing is asked while no assistive technology
// listens. Never call refresh() from the constructor of a base class of the object: its
// interface would be made for the base.
class ZELCTL_EXPORT AccessibleEcho
{
public:
    explicit AccessibleEcho(QObject *object);

    void refresh();

    // After refresh(): gives a part that speaks for the object (the box inside a control that
    // takes the focus) the object's name and description.
    void mirrorTo(QWidget &part);

private:
    QPointer<QObject> m_object;
    QString m_name;
    QString m_description;
    QString m_value;
    QAccessible::State m_state;
};

} // namespace zelctl::platform

#pragma once

#include <QAccessible>
#include <QList>
#include <QPointer>
#include <QStringList>

namespace zelctl::test {

// Switches Qt's accessibility on, as the arrival of a screen reader does, and records the
// accessibility events raised while it lives (instead of sending them to a bridge).
class AccessibleEventSpy
{
public:
    AccessibleEventSpy();
    ~AccessibleEventSpy();
    AccessibleEventSpy(const AccessibleEventSpy &) = delete;
    AccessibleEventSpy &operator=(const AccessibleEventSpy &) = delete;

    // How many events of a kind were raised about the object.
    int count(const QObject *object, QAccessible::Event type) const;
    // Every state that a state change about the object turned on or off.
    QAccessible::State changedStates(const QObject *object) const;
    // The values the object's value changes gave, oldest first.
    QStringList values(const QObject *object) const;
    void clear() { m_events.clear(); }

private:
    struct Event
    {
        QAccessible::Event type;
        QPointer<QObject> object;
        QString value;
        QAccessible::State changed;
    };
    static void record(QAccessibleEvent *event);

    QList<Event> m_events;
};

} // namespace zelctl::test

#include "AccessibleEventSpy.h"

#include <QtGui/private/qguiapplication_p.h>
#include <qpa/qplatformaccessibility.h>
#include <qpa/qplatformintegration.h>

#include <algorithm>
#include <bit>
#include <cstdint>

namespace zelctl::test {

namespace {

AccessibleEventSpy *current = nullptr;

// Qt offers no public way to switch accessibility on: a platform's bridge does it when a
// screen reader asks, and Qt's own tests do it through the platform's object, as here.
void setAccessibilityActive(bool active)
{
    if (QPlatformAccessibility *platform = QGuiApplicationPrivate::platformIntegration()->accessibility())
        platform->setActive(active);
}

static_assert(sizeof(QAccessible::State) == sizeof(std::uint64_t));

} // namespace

AccessibleEventSpy::AccessibleEventSpy()
{
    current = this;
    QAccessible::installUpdateHandler(&AccessibleEventSpy::record);
    setAccessibilityActive(true);
}

AccessibleEventSpy::~AccessibleEventSpy()
{
    setAccessibilityActive(false);
    QAccessible::installUpdateHandler(nullptr);
    current = nullptr;
}

void AccessibleEventSpy::record(QAccessibleEvent *event)
{
    Event seen { event->type(), event->object(), {}, {} };
    if (event->type() == QAccessible::ValueChanged)
        seen.value = static_cast<QAccessibleValueChangeEvent *>(event)->value().toString();
    if (event->type() == QAccessible::StateChanged)
        seen.changed = static_cast<QAccessibleStateChangeEvent *>(event)->changedStates();
    current->m_events.append(seen);
}

int AccessibleEventSpy::count(const QObject *object, QAccessible::Event type) const
{
    return int(std::count_if(m_events.cbegin(), m_events.cend(),
        [&](const Event &event) { return event.object == object && event.type == type; }));
}

QAccessible::State AccessibleEventSpy::changedStates(const QObject *object) const
{
    std::uint64_t bits = 0;
    for (const Event &event : m_events)
        if (event.object == object)
            bits |= std::bit_cast<std::uint64_t>(event.changed);
    return std::bit_cast<QAccessible::State>(bits);
}

QStringList AccessibleEventSpy::values(const QObject *object) const
{
    QStringList values;
    for (const Event &event : m_events)
        if (event.object == object && event.type == QAccessible::ValueChanged)
            values << event.value;
    return values;
}

} // namespace zelctl::test

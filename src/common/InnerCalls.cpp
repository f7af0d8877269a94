#include "InnerCalls.h"

#include <QWidget>

namespace zelctl {

InnerCalls::Scope::Scope(InnerCalls &calls, QObject *inner)
    : m_owner(calls.m_owner)
    , m_calls(&calls)
    , m_inner(inner)
{
    if (Calls *known = calls.find(inner)) {
        ++known->depth;
        return;
    }
    // Objects that went are forgotten when a new one comes.
    calls.m_calls.removeIf([](const Calls &each) { return !each.inner; });
    calls.m_calls.append(Calls { inner, 1 });
}

InnerCalls::Scope::~Scope()
{
    if (!m_owner)
        return;
    if (Calls *known = m_calls->find(m_inner))
        --known->depth;
}

InnerCalls::Calls *InnerCalls::find(const QObject *inner)
{
    for (Calls &calls : m_calls) {
        if (calls.inner.data() == inner)
            return &calls;
    }
    return nullptr;
}

void InnerCalls::releaseBusy()
{
    for (const Calls &calls : std::as_const(m_calls)) {
        QObject *inner = calls.inner;
        if (!inner || calls.depth == 0)
            continue;
        inner->disconnect(m_owner);
        m_owner->disconnect(inner);
        inner->removeEventFilter(m_owner);
        if (auto *widget = qobject_cast<QWidget *>(inner)) {
            widget->hide();
            widget->setParent(nullptr);
        } else {
            inner->setParent(nullptr);
        }
        inner->deleteLater();
    }
    m_calls.clear();
}

} // namespace zelctl

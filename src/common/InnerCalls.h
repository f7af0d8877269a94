#pragma once

#include "zelctl_export.h"

#include <QList>
#include <QObject>
#include <QPointer>

namespace zelctl {

// Keeps a control's inner objects alive while their own code calls the control. A text
// box calls the control from inside its own editing (textChanged), a fetcher from inside
// its own answer; the control raises events there, and a host may delete the control from
// such an event. Deleting the inner object then would pull it from under its own code, so
// the control's destructor hands every inner object with a call in progress to
// releaseBusy(), which takes it away from the control and deletes it once its code has
// returned to the event loop.
class ZELCTL_EXPORT InnerCalls
{
public:
    explicit InnerCalls(QObject *owner)
        : m_owner(owner)
    { }

    // One call from `inner` into the control, for the scope's lifetime.
    class Scope
    {
    public:
        Scope(InnerCalls &calls, QObject *inner);
        ~Scope();
        Q_DISABLE_COPY_MOVE(Scope)

    private:
        // Cleared when the control goes; the tally goes with it and is not touched then.
        QPointer<QObject> m_owner;
        InnerCalls *m_calls;
        QObject *m_inner;
    };

    // From the control's destructor: every inner object with a call in progress is
    // disconnected from the control, taken out of it (hidden, when it is a widget) and
    // deleted later. The others are left to the control's ordinary clean-up.
    void releaseBusy();

private:
    struct Calls
    {
        QPointer<QObject> inner;
        int depth = 0;
    };
    Calls *find(const QObject *inner);

    QObject *m_owner;
    QList<Calls> m_calls;
};

} // namespace zelctl

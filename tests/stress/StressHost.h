#pragma once

#include <QLineEdit>
#include <QMetaMethod>
#include <QPointer>

#include <functional>
#include <memory>
#include <string>
#include <vector>

// A host that uses a class of the library the way careless real hosts do: random input,
// property writes, method calls, resizes, focus moves and, at a random moment, the
// control's deletion, sometimes from inside one of its own events. Everything it does
// follows from a seed, and every step is written down, so a failure can be replayed.
namespace zelctl::stress {

// Whether Qt is delivering an event to a widget after which Qt itself still touches it
// (paint, resize, show, focus, a right-button press...): a handler that runs inside one
// may only delete the control later, as in any Qt program.
bool insideUnsafeEvent();

// Runs an action whenever an object raises a signal chosen at run time, as a host's
// late-bound event handler does.
class SignalHook : public QObject
{
    Q_OBJECT

public:
    SignalHook(QObject *sender, const QMetaMethod &signal, std::function<void()> action);

private Q_SLOTS:
    void fire() { m_action(); }

private:
    std::function<void()> m_action;
};

// The members of one kind that the library's own classes declare: the signals (the events
// a host handles) or the methods a host calls late-bound.
std::vector<QMetaMethod> membersOf(const QObject *object, QMetaMethod::MethodType kind);

class Watcher;

// A host's form: a text box and, beside it, the object; a watcher dismisses the menus and
// modal forms the object opens. The form may die before the host.
struct HostForm
{
    explicit HostForm(quint64 seed);
    // The object created by name, initialised as new, at 20,40 200 x 60 of a shown form;
    // its steps are journaled as an episode of seed 0.
    HostForm(const QString &className, QSize size);
    ~HostForm();
    // Called once when a menu or modal form is open, before it is dismissed.
    void onModal(std::function<void()> action);
    // What a user does by hand: pointer, wheel, focus and keys; then, `asHost`, a resize,
    // the form disabled and enabled again and every method called. Each step while the
    // object lives, followed by the deletions it asked for.
    void use(bool asHost);
    // Whether the text box still takes typing, in the form enabled and shown again.
    bool neighbourWorks();

    QPointer<QWidget> form;
    QPointer<QLineEdit> neighbour;
    QPointer<QObject> object;
    std::unique_ptr<Watcher> watcher;
};

// The names of the classes the registry can create in this build (of the controls only).
std::vector<std::string> servedClasses(bool controlsOnly = false);

// One episode of `steps` random steps, printed as they run when `echo`: the object is
// deleted at some point, then the host checks its form. Answers the steps run, and in
// `failure` the faults found with the steps that replay them (empty when none).
int runEpisode(const QString &className, quint64 seed, int steps, bool echo, QString &failure);

} // namespace zelctl::stress

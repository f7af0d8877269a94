#pragma once

#include <QMetaMethod>
#include <QObject>
#include <QPointer>
#include <QStringList>
#include <QTimer>
#include <QVariant>

#include <chrono>
#include <functional>
#include <random>
#include <string>
#include <vector>

class QLineEdit;
class QWidget;

// A host that uses a class of the library the way careless real hosts do: random input,
// property writes, method calls, resizes, focus moves and, at a random moment, the
// control's deletion, sometimes from inside one of its own events. Everything it does
// follows from a seed, and every step is written down, so a failure can be replayed.
namespace zelctl::stress {

class Random
{
public:
    explicit Random(quint64 seed)
        : m_engine(seed)
    { }
    // 0 .. n-1 (n > 0).
    int below(int n) { return int(m_engine() % quint64(n)); }
    bool chance(double p) { return double(m_engine() % 1000000) < p * 1000000.0; }
    template <typename T> const T &pick(const std::vector<T> &from) { return from[size_t(below(int(from.size())))]; }

private:
    std::mt19937_64 m_engine;
};

// The steps of the episode that runs now, printed when it fails, also from a sanitizer's
// report or a watchdog that sees no progress.
class Journal
{
public:
    static Journal &current();

    void begin(const QString &className, quint64 seed, const QString &platform);
    // No episode runs: the watchdog rests.
    void end();
    void add(const QString &step);
    // Marks progress for the watchdog.
    void tick();
    QString replay() const;
    // Prints every step as it happens (for a replay run).
    void setEcho(bool echo) { m_echo = echo; }

    // Installs the sanitizer death callback and the hang watchdog; once per process.
    static void installReporters(std::chrono::seconds hangAfter);

private:
    QString m_class;
    quint64 m_seed = 0;
    QString m_platform;
    std::vector<std::string> m_steps;
    bool m_echo = false;
};

// Runs an action whenever an object raises a signal chosen at run time, as a host's
// late-bound event handler does.
class SignalHook : public QObject
{
    Q_OBJECT

public:
    SignalHook(QObject *sender, const QMetaMethod &signal, std::function<void()> action);

private Q_SLOTS:
    void fire();

private:
    std::function<void()> m_action;
};

// The signals a public class declares itself (its events), not those of Qt's classes.
std::vector<QMetaMethod> eventsOf(const QObject *object);

// Counts the events being delivered to widgets after which Qt itself still touches the
// widget: paint, resize, show, focus and the like, and a right-button press, which Qt
// follows with a context menu event to the same widget. A handler that runs inside such an
// event may only delete the control later, as in any Qt program. Input events of the
// library's widgets and of the inner boxes of its controls, timers, queued calls and
// network replies are safe: the library keeps alive whatever of it their code still uses.
class UnsafeEvents
{
public:
    static bool isSafe(const QObject *receiver, const QEvent *event);
    static void enter() { ++s_depth; }
    static void leave() { --s_depth; }
    static bool inside() { return s_depth > 0; }

private:
    static inline int s_depth = 0;
};

// Closes whatever a step left open in a nested event loop (menus, modal forms, message
// boxes), after pressing a few of their keys and buttons as a user would.
class Watcher : public QObject
{
public:
    explicit Watcher(Random &random);
    // Called once when a modal form or menu is open, before it is dismissed.
    void setOnModal(std::function<void()> action) { m_onModal = std::move(action); }

private:
    void look();

    Random &m_random;
    QTimer m_timer;
    int m_ticks = 0;
    std::function<void()> m_onModal;
};

// Values for every type a member of the library takes: ordinary, boundary and hostile.
class Values
{
public:
    explicit Values(Random &random);
    ~Values();
    Values(const Values &) = delete;
    Values &operator=(const Values &) = delete;

    // A value of the metatype; `name` (of a parameter or property) steers handles, files
    // and windows towards meaningful ones.
    QVariant make(QMetaType type, const QByteArray &name);
    QString text();
    void addWindow(qint32 hwnd) { m_windows.push_back(hwnd); }
    void addObject(QObject *object) { m_objects.push_back(object); }

private:
    qint64 integer();
    quint32 color();
    QString file();

    Random &m_random;
    std::vector<qint32> m_devices;
    std::vector<qint32> m_bitmaps;
    std::vector<qint32> m_windows;
    std::vector<QPointer<QObject>> m_objects;
};

// Calls a method late-bound with arguments from `values`, noting the call in the journal.
void call(QObject *object, const QMetaMethod &method, Values &values);

// One episode: a form with the object and a neighbouring text box, `steps` random steps,
// the object deleted at some point, then checks that the form lives on.
struct EpisodeResult
{
    bool formSurvived = true;
    bool neighbourWorks = true;
    bool objectGone = true;
    int stepsRun = 0;
    QStringList faults;
};

// The names of the classes the registry can create in this build.
std::vector<std::string> servedClasses();

EpisodeResult runEpisode(const QString &className, quint64 seed, int steps);

} // namespace zelctl::stress

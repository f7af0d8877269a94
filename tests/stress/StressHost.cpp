// The stress host: a host that uses every class of the library as careless real hosts do,
// at random but from a seed, journaling each step so that a failure can be replayed. Its
// main is every test program's, but with the library's real menus, modal forms and message
// boxes, which a watcher dismisses.

#include "support/TestSupport.h"

#include "frame/ClassRegistry.h"
#include "frame/EntryPoints.h"
#include "frame/Picture.h"
#include "frame/PropertyBag.h"
#include "frame/UserControl.h"
#include "platform/Settings.h"
#include "platform/Shell.h"
#include "platform/WindowHandles.h"
#include "platform/gdi/Gdi.h"
#include "selection/GFXTypes.h"

#include <QAbstractButton>
#include <QApplication>
#include <QClipboard>
#include <QCursor>
#include <QDebug>
#include <QDialog>
#include <QDir>
#include <QElapsedTimer>
#include <QLineEdit>
#include <QMetaProperty>
#include <QMouseEvent>
#include <QSignalSpy>
#include <QTemporaryDir>
#include <QTest>
#include <QVBoxLayout>
#include <QWheelEvent>
#include <QWindow>

#include <gtest/gtest.h>

#if defined(__SANITIZE_ADDRESS__)
#include <sanitizer/common_interface_defs.h>
#endif

#include <climits>
#include <cmath>
#include <csignal>
#include <cstdio>
#include <functional>
#include <numeric>
#include <random>

#include <unistd.h>

using namespace Qt::StringLiterals;

namespace zelctl::stress {

namespace {

// The steps of the episode that runs now, printed when it fails, crashes or hangs.
struct Journal
{
    // The episode's name, and what runs it again.
    void begin(const QString &name, const QString &filter, const QString &replaying = {})
    {
        episode = name;
        command = u"%1 QT_QPA_PLATFORM=%2 tests/test_stress --gtest_filter='%3'"_s.arg(
            replaying, QGuiApplication::platformName(), filter);
        steps.clear();
        // Names the episode also when UBSan, which does not call back, stops the process.
        std::fprintf(stderr, "[ episode  ] %s\n", qPrintable(episode));
    }

    void note(const QString &step)
    {
        steps << step;
        if (echo)
            std::fprintf(stderr, "  %lld. %s\n", steps.size(), qPrintable(step));
        // A step still running in two minutes hangs: the alarm prints the journal.
        ::alarm(120);
    }

    QString replay() const
    {
        QString text = u"stress host: %1, after these steps:\n"_s.arg(episode);
        for (qsizetype i = 0; i < steps.size(); ++i)
            text += u"  %1. %2\n"_s.arg(i + 1).arg(steps[i]);
        return text + u"replay:%1\n"_s.arg(command);
    }

    QString episode, command;
    QStringList steps;
    bool echo = false;
} journal;

void printJournal()
{
    std::fputs(qPrintable(journal.replay()), stderr);
}

void watchForHangs()
{
#if defined(__SANITIZE_ADDRESS__)
    __sanitizer_set_death_callback(printJournal);
#endif
    std::signal(SIGALRM, [](int) {
        std::fputs("stress host: a step made no progress for 120 s\n", stderr);
        printJournal();
        std::abort();
    });
}

bool declaredByTheLibrary(const QMetaObject *meta)
{
    return QByteArray(meta->className()).startsWith("zelctl::");
}

// A value as the journal shows it, cut short.
QString shortly(const QVariant &value)
{
    if (value.metaType().id() == QMetaType::QByteArray)
        return u"%1 bytes"_s.arg(value.toByteArray().size());
    QString text;
    QDebug(&text).nospace() << value;
    return text.size() > 60 ? text.left(57) + u"... (%1 characters)"_s.arg(text.size()) : text;
}

QString describe(const QWidget *widget)
{
    return (QLatin1String(widget->metaObject()->className()) + u' ' + widget->objectName()).trimmed();
}

// The text a key press carries, as a keyboard gives it (QTest aborts on keys it does not know).
QString keyText(Qt::Key key, Qt::KeyboardModifiers modifiers)
{
    static const QHash<int, QString> controls = { { Qt::Key_Return, u"\r"_s }, { Qt::Key_Enter, u"\r"_s },
        { Qt::Key_Tab, u"\t"_s }, { Qt::Key_Backspace, u"\b"_s }, { Qt::Key_Escape, u"\x1b"_s } };
    if (modifiers & (Qt::ControlModifier | Qt::AltModifier))
        return {};
    if ((key >= Qt::Key_0 && key <= Qt::Key_9) || (key >= Qt::Key_A && key <= Qt::Key_Z) || key == Qt::Key_Space) {
        const QString text = QChar(char16_t(key));
        return modifiers & Qt::ShiftModifier ? text : text.toLower();
    }
    return controls.value(key);
}

int unsafeDepth = 0;

// Input events of the library's widgets and their inner boxes, timers and queued calls are
// safe: the library keeps alive whatever of it their code still uses.
bool safeToDeleteIn(const QWidget *receiver, const QEvent *event)
{
    static const QList<QEvent::Type> safe = { QEvent::MouseButtonPress, QEvent::MouseButtonDblClick,
        QEvent::MouseButtonRelease, QEvent::MouseMove, QEvent::KeyPress, QEvent::KeyRelease, QEvent::Wheel,
        QEvent::Timer, QEvent::MetaCall, QEvent::ContextMenu };
    const QEvent::Type type = event->type();
    // Qt follows a right-button press with a context menu event through a plain pointer.
    if (!safe.contains(type)
        || ((type == QEvent::MouseButtonPress || type == QEvent::MouseButtonDblClick)
            && static_cast<const QMouseEvent *>(event)->button() == Qt::RightButton))
        return false;
    for (const QWidget *part = receiver; part; part = part->isWindow() ? nullptr : part->parentWidget())
        if (declaredByTheLibrary(part->metaObject()))
            return true;
    return false;
}

class Application : public QApplication
{
public:
    using QApplication::QApplication;

    bool notify(QObject *receiver, QEvent *event) override
    {
        const bool unsafe = receiver->isWidgetType() && !safeToDeleteIn(static_cast<QWidget *>(receiver), event);
        unsafeDepth += unsafe;
        const bool handled = QApplication::notify(receiver, event);
        unsafeDepth -= unsafe;
        return handled;
    }
};

// Whether Qt is delivering an event after which Qt itself still touches the widget (paint,
// show, focus, a right-button press...): a handler inside one may only delete it later.
bool insideUnsafeEvent()
{
    return unsafeDepth > 0;
}

// Runs an action whenever an object raises a signal chosen at run time, as a host's
// late-bound event handler does.
class SignalHook : public QObject
{
    Q_OBJECT

public:
    SignalHook(QObject *sender, const QMetaMethod &signal, std::function<void()> action)
        : m_action(std::move(action))
    {
        connect(sender, signal, this, staticMetaObject.method(staticMetaObject.indexOfSlot("fire()")));
    }

private Q_SLOTS:
    void fire() { m_action(); }

private:
    std::function<void()> m_action;
};

// The public signals (events) or methods that the library's classes declare.
std::vector<QMetaMethod> membersOf(const QObject *object, QMetaMethod::MethodType kind)
{
    std::vector<QMetaMethod> found;
    const QMetaObject *meta = object->metaObject();
    for (int i = 0; i < meta->methodCount(); ++i) {
        const QMetaMethod method = meta->method(i);
        // propertyChanged is the container's bookkeeping, not an event a host handles.
        if (method.methodType() == kind && method.access() == QMetaMethod::Public
            && declaredByTheLibrary(method.enclosingMetaObject()) && method.name() != "propertyChanged")
            found.push_back(method);
    }
    return found;
}

struct Random : std::mt19937_64
{
    using std::mt19937_64::mt19937_64;
    // 0 .. n-1 (n > 0).
    int below(int n) { return int((*this)() % quint64(n)); }
    bool chance(double p) { return double((*this)() % 1000000) < p * 1000000.0; }
    template <typename T> const T &pick(const std::vector<T> &from) { return from[size_t(below(int(from.size())))]; }
};

// Values for every type a member of the library takes: ordinary, boundary and hostile.
class Values
{
public:
    explicit Values(Random &random)
        : m_random(random)
    {
        // Real device contexts of each depth a painting member may be given, and stale ones.
        for (const auto &[bpp, topDown] : { std::pair { 32, true }, std::pair { 24, false }, std::pair { 8, true } }) {
            gdi::BITMAPINFO info;
            info.bmiHeader.biWidth = 40;
            info.bmiHeader.biHeight = topDown ? -30 : 30;
            info.bmiHeader.biBitCount = quint16(bpp);
            m_bitmaps.push_back(gdi::CreateDIBSection(0, &info, gdi::DIB_RGB_COLORS, nullptr));
            m_devices.push_back(gdi::CreateCompatibleDC(0));
            gdi::SelectObject(m_devices.back(), m_bitmaps.back());
        }
        m_devices.insert(m_devices.end(), { 0, 987654 });
    }

    ~Values()
    {
        for (size_t i = 0; i < m_bitmaps.size(); ++i) {
            gdi::DeleteDC(m_devices[i]);
            gdi::DeleteObject(m_bitmaps[i]);
        }
    }

    Values(const Values &) = delete;

    // `name` (of a parameter or property) steers handles, colours and files to meaningful ones.
    QVariant make(QMetaType type, const QByteArray &name)
    {
        static const QList<int> integers
            = { QMetaType::Short, QMetaType::UShort, QMetaType::Int, QMetaType::UInt, QMetaType::Long, QMetaType::ULong,
                  QMetaType::LongLong, QMetaType::ULongLong, QMetaType::UChar, QMetaType::Char, QMetaType::SChar };
        static const std::vector<double> reals = { 0.0, -1.0, 0.5, 1.0, 2.2, 100.0, 1e308, -1e308, std::nan("") };
        static const std::vector<QSize> sizes = { QSize(0, 0), QSize(1, 1), QSize(2, 3), QSize(17, 9), QSize(300, 40),
            QSize(40, 300), QSize(3000, 2000), QSize(70000, 4), QSize(4, 70000) };
        const QByteArray lower = name.toLower();
        const auto named = [&](std::initializer_list<const char *> words) {
            return m_random.chance(0.8)
                && std::any_of(words.begin(), words.end(), [&](const char *word) { return lower.contains(word); });
        };
        QVariant value;
        if (type.id() == QMetaType::Bool)
            value = m_random.chance(0.5);
        else if (integers.contains(type.id()) || type.flags().testFlag(QMetaType::IsEnumeration))
            value = named({ "hdc" }) || (name.endsWith("DC") && m_random.chance(0.8)) ? m_random.pick(m_devices)
                : named({ "hwnd" }) && !windows.empty()                               ? m_random.pick(windows)
                : named({ "color", "colour", "back", "fore", "ground" })              ? qint64(color())
                                                                                      : integer();
        else if (type.id() == QMetaType::Double || type.id() == QMetaType::Float)
            value = m_random.pick(reals);
        else if (type.id() == QMetaType::QString)
            value = named({ "file", "path", "image" }) || m_random.chance(0.05) ? file() : text();
        else if (type.id() == QMetaType::QSize)
            value = m_random.chance(0.5) ? m_random.pick(sizes) : QSize(m_random.below(600), m_random.below(400));
        else if (type.id() == QMetaType::QByteArray)
            value = bytes();
        else if (type.id() == QMetaType::QVariant)
            return m_random.chance(0.5) ? QVariant(text()) : QVariant(integer());
        else if (type.id() == QMetaType::QFont)
            value = QFont(u"Liberation Sans"_s, m_random.pick(std::vector<int> { 1, 6, 8, 11, 72, 400 }),
                m_random.chance(0.5) ? QFont::Bold : QFont::Normal);
        else if (type == QMetaType::fromType<QList<qint32>>()) {
            QList<qint32> list(m_random.below(300));
            std::generate(list.begin(), list.end(), [this] { return qint32(integer()); });
            value = QVariant::fromValue(list);
        } else if (type == QMetaType::fromType<Picture>())
            value = QVariant::fromValue(m_random.chance(0.2) ? Picture() : Picture::fromFile(file()));
        else if (type == QMetaType::fromType<GFXSelection>()) {
            GFXSelection selection;
            selection.Title = text();
            selection.Subtitle = text();
            selection.DisableCancel = m_random.chance(0.3);
            if (!objects.empty() && m_random.chance(0.7))
                selection.ParentObj = m_random.pick(objects).data();
            selection.WindowPositionRelation = GFXPositioning(m_random.below(12) - 1);
            value = QVariant::fromValue(selection);
        } else if (type == QMetaType::fromType<QList<GFXItem>>()) {
            QList<GFXItem> items(m_random.below(m_random.chance(0.1) ? 200 : 8));
            for (GFXItem &item : items) {
                item.Title = text();
                item.Image = m_random.chance(0.5) ? QVariant(file()) : QVariant();
                item.Selected = m_random.chance(0.3);
                item.Disabled = m_random.chance(0.2);
                item.Default = m_random.chance(0.2);
                item.Value = text();
            }
            value = QVariant::fromValue(items);
        }
        return value.convert(type) ? value : QVariant(type);
    }

    QString text()
    {
        static const std::vector<QString> pieces = { QString(), u"PT"_s, u"pt"_s, u"EL"_s, u"ES"_s, u"XX"_s,
            u"123456789"_s, u"PT501964843"_s, u"501964843"_s, u"0"_s, u"-1"_s, u"A"_s, u"D2"_s, u"S1"_s, u"H3"_s,
            u"ABDSFCH"_s, u"Click"_s, u"nothing"_s, u"||"_s, u"a||b\\nc"_s, u"&Ficheiro"_s, u"çãõ€ 😀"_s, u"\t\r\n"_s,
            u"%1 %s %n"_s, u"0003 0000 0000 0000 0000 0"_s, u"   "_s, u"DE,FR;PT"_s, u"/opt/zel,2024"_s };
        QString digits;
        switch (m_random.below(4)) {
        case 0:
            return QString(m_random.below(40) + 1, QChar(u'0' + m_random.below(10)));
        case 1:
            for (int n = m_random.below(25); n > 0; --n)
                digits += QChar(u'0' + m_random.below(10));
            return digits;
        case 2:
            return m_random.chance(0.05) ? QString(20000, u'9') : m_random.pick(pieces) + m_random.pick(pieces);
        default:
            return m_random.pick(pieces);
        }
    }

    std::vector<qint32> windows;
    std::vector<QPointer<QObject>> objects;

private:
    // A file's first megabyte, or garbage.
    QByteArray bytes()
    {
        QFile source(file());
        if (m_random.chance(0.7) && source.open(QIODevice::ReadOnly))
            return source.read(1 << 20);
        QByteArray garbage(m_random.below(64), '\0');
        for (char &c : garbage)
            c = char(m_random.below(256));
        return garbage;
    }

    qint64 integer()
    {
        static const std::vector<qint64> boundaries = { 0, 1, -1, 2, 3, 4, 5, 9, 10, 15, 99, 100, 255, 256, 1000, 32767,
            -32768, 65535, 65536, 70000, INT_MAX, INT_MIN, qint64(UINT_MAX) };
        const int kind = m_random.below(3);
        if (kind == 0)
            return m_random.pick(boundaries);
        if (kind == 1)
            return m_random.below(2001) - 1000;
        return qint64(m_random.below(INT_MAX)) * (m_random.chance(0.5) ? 1 : -1);
    }

    quint32 color()
    {
        static const std::vector<quint32> colors
            = { 0, 0xFFFFFF, 0x00FF00, 0x80000005, 0x80000018, 0x800000FF, 0xFFFFFFFF, 0x7FFFFFFF, 0x01000000 };
        return m_random.chance(0.7) ? m_random.pick(colors) : quint32(m_random.below(INT_MAX)) << 1;
    }

    QString file()
    {
        static const std::vector<QString> files = [] {
            std::vector<QString> list = { test::sourcePath(u"data/gif/aguarde.gif"_s),
                test::sourcePath(u"data/skins/default/btn_go_normal.gif"_s), test::sourcePath(u"data/iso3166.txt"_s),
                test::sourcePath(u"data/images/flags_iso/16/pt.png"_s), test::testDataPath(u"png/seed000.png"_s),
                test::testDataPath(u"png/seed004.png"_s), u"/nonexistent/picture.png"_s, QString(), u"/"_s,
                u"/dev/null"_s, u"relative.gif"_s, u"http://127.0.0.1:9/x.gif"_s, u"file:///nonexistent.gif"_s,
                u"ftp://127.0.0.1/x.gif"_s };
            const QDir crashers(test::testDataPath(u"crashers"_s));
            for (const QString &name : crashers.entryList(QDir::Files, QDir::Name))
                list.push_back(crashers.filePath(name));
            return list;
        }();
        return m_random.pick(files);
    }

    Random &m_random;
    std::vector<qint32> m_devices;
    std::vector<qint32> m_bitmaps;
};

// Closes the menus, modal forms and message boxes a step left open, after pressing a few of
// their keys and buttons.
class Watcher : public QObject
{
public:
    explicit Watcher(quint64 seed)
        : m_random(seed)
    {
        startTimer(10);
    }

    std::function<void()> onModal;

private:
    void timerEvent(QTimerEvent *) override
    {
        QWidget *open
            = QApplication::activePopupWidget() ? QApplication::activePopupWidget() : QApplication::activeModalWidget();
        m_ticks = open ? m_ticks + 1 : 0;
        const QPointer<QWidget> guard(open);
        if (m_ticks == 1 && onModal)
            std::exchange(onModal, nullptr)();
        if (!guard)
            return;
        // Queued: a form this opens must not run inside this timer's event, which it blocks.
        if (m_ticks < 5 && m_random.chance(0.6)) {
            QList<QAbstractButton *> buttons = open->findChildren<QAbstractButton *>();
            buttons.removeIf([](QAbstractButton *button) { return !button->isVisible() || !button->isEnabled(); });
            if (!buttons.isEmpty() && m_random.chance(0.5)) {
                QAbstractButton *button = buttons.at(m_random.below(int(buttons.size())));
                journal.note(u"watcher clicks %1 \"%2\" in %3"_s.arg(describe(button), button->text(), describe(open)));
                return void(QMetaObject::invokeMethod(button, &QAbstractButton::click, Qt::QueuedConnection));
            }
            static const std::vector<Qt::Key> keys = { Qt::Key_Down, Qt::Key_Up, Qt::Key_Tab, Qt::Key_Space,
                Qt::Key_Return, Qt::Key_Escape, Qt::Key_Right };
            const Qt::Key key = m_random.pick(keys);
            journal.note(u"watcher presses %1 in %2"_s.arg(QKeySequence(key).toString(), describe(open)));
            return void(QMetaObject::invokeMethod(
                open, [open, key] { QTest::sendKeyEvent(QTest::Click, open, key, keyText(key, {}), {}); },
                Qt::QueuedConnection));
        }
        journal.note(u"watcher closes %1"_s.arg(describe(open)));
        if (auto *dialog = qobject_cast<QDialog *>(open))
            dialog->reject();
        else
            open->close();
    }

    Random m_random;
    int m_ticks = 0;
};

// A host's form: a text box and, beside it, an object of the class; a watcher dismisses the
// menus and modal forms the object opens. The form may die before the host.
struct HostForm
{
    HostForm(const QString &className, quint64 seed)
        : className(className)
        , form(new QWidget)
        , neighbour(new QLineEdit(form))
        , random(seed)
        , values(random)
        , watcher(seed ^ 0x9E3779B97F4A7C15ull)
    {
        form->setObjectName(u"form"_s);
        neighbour->setObjectName(u"neighbour"_s);
        neighbour->setGeometry(0, 0, 120, 22);
        values.objects.push_back(form.data());
    }

    // The object created by name, initialised as new, at 20,40 200 x 60 of a shown form.
    HostForm(const QString &className, QSize size)
        : HostForm(className, quint64(7))
    {
        journal.begin(className, u"EveryControl/DisabledParent.*/"_s + className);
        form->resize(size);
        object = CreateObject(className, form);
        if (UserControl *created = control())
            created->InitNew();
        if (QWidget *created = widget())
            created->setGeometry(20, 40, 200, 60);
        form->show();
        EXPECT_TRUE(QTest::qWaitForWindowExposed(form));
    }

    ~HostForm()
    {
        delete form.data();
        ::alarm(0);
    }

    // Called once when a menu or modal form is open, before it is dismissed.
    void onModal(std::function<void()> action) { watcher.onModal = std::move(action); }

    // Whether the text box still takes typing, in the form enabled and shown again.
    bool neighbourWorks()
    {
        form->setEnabled(true);
        form->show();
        neighbour->setFocus();
        neighbour->clear();
        QTest::keyClicks(neighbour, u"ok"_s);
        return neighbour->text() == "ok"_L1;
    }

    QWindow *window() const { return form ? form->windowHandle() : nullptr; }
    QWidget *widget() const { return qobject_cast<QWidget *>(object.data()); }
    UserControl *control() const { return qobject_cast<UserControl *>(object.data()); }

    QString className;
    QPointer<QWidget> form;
    QPointer<QLineEdit> neighbour;
    QPointer<QObject> object;
    Random random;
    Values values;
    Watcher watcher;
    // What the steps found wrong; the locks the host holds on the library.
    QStringList faults;
    int locks = 0;
};

// Calls a method late-bound with arguments from `values`, noting the call in the journal.
void call(QObject *object, const QMetaMethod &method, Values &values)
{
    std::array<QVariant, 10> arguments;
    std::array<QGenericArgument, 10> generic;
    QStringList shown;
    const QList<QByteArray> names = method.parameterNames();
    for (int i = 0; i < method.parameterCount() && i < 10; ++i) {
        arguments[size_t(i)] = values.make(method.parameterMetaType(i), names.value(i));
        generic[size_t(i)] = QGenericArgument(method.parameterMetaType(i).name(), arguments[size_t(i)].data());
        shown << shortly(arguments[size_t(i)]);
    }
    journal.note(u"call %1(%2)"_s.arg(QLatin1String(method.name()), shown.join(u", ")));
    QVariant answer(method.returnMetaType());
    const QGenericReturnArgument returned = method.returnMetaType().id() == QMetaType::Void
        ? QGenericReturnArgument()
        : QGenericReturnArgument(method.returnMetaType().name(), answer.data());
    std::apply([&](auto... argument) { method.invoke(object, Qt::DirectConnection, returned, argument...); }, generic);
}

// A part of the object, the object itself or the form.
QWidget *target(HostForm &h)
{
    if (!h.widget() || h.random.chance(0.1))
        return h.form;
    QList<QWidget *> parts = h.widget()->findChildren<QWidget *>();
    parts.removeIf([](QWidget *part) { return !part->isVisible() || part->isWindow(); });
    return parts.isEmpty() || h.random.chance(0.4) ? h.widget() : parts.at(h.random.below(int(parts.size())));
}

QPoint pointIn(HostForm &h, QWidget *on)
{
    QPoint point(h.random.below(std::max(on->width(), 1)), h.random.below(std::max(on->height(), 1)));
    if (h.random.chance(0.1))
        point += QPoint(h.random.below(21) - 10, h.random.below(21) - 10);
    return on->mapTo(on->window(), point);
}

void click(HostForm &h, QWidget *on, bool twice)
{
    static const std::vector<std::pair<Qt::MouseButton, const char *>> buttons
        = { { Qt::LeftButton, "left" }, { Qt::RightButton, "right" }, { Qt::MiddleButton, "middle" } };
    const int roll = h.random.below(20);
    const auto [button, side] = buttons[roll < 15 ? 0 : roll < 19 ? 1 : 2];
    const QPoint at = pointIn(h, on);
    journal.note(
        u"%1 %2 on %3 at %4,%5"_s.arg(twice ? "double-click" : "click", side, describe(on)).arg(at.x()).arg(at.y()));
    // One double click is one Click (or Clicked) of a control that draws itself.
    std::unique_ptr<QSignalSpy> clicks;
    if (twice && on == h.object && button == Qt::LeftButton && !on->childAt(on->mapFrom(on->window(), at))) {
        const QMetaObject *meta = h.object->metaObject();
        if (const int index = std::max(meta->indexOfSignal("Click()"), meta->indexOfSignal("Clicked()")); index >= 0)
            clicks = std::make_unique<QSignalSpy>(h.object.data(), meta->method(index));
    }
    if (twice)
        QTest::mouseDClick(h.window(), button, {}, at);
    else
        QTest::mouseClick(h.window(), button, {}, at);
    if (clicks && h.object && clicks->count() > 1)
        h.faults << u"a double click raised %1 Click events"_s.arg(clicks->count());
}

void write(HostForm &h, QObject *object, const QMetaProperty &property, const QString &owner)
{
    const QVariant value = h.values.make(property.metaType(), property.name());
    journal.note(u"set %1%2 = %3"_s.arg(owner, QLatin1String(property.name()), shortly(value)));
    property.write(object, value);
}

struct StepKind
{
    int weight;
    // A step a user takes by hand, not the host's code.
    bool byUser;
    void (*step)(HostForm &);
};

// What a careless host does, weighted: input first, then its late-bound calls, then the rest.
const std::vector<StepKind> stepKinds = {
    { 24, true,
        [](HostForm &h) {
            static const std::vector<Qt::Key> keys
                = { Qt::Key_0, Qt::Key_1, Qt::Key_5, Qt::Key_9, Qt::Key_A, Qt::Key_E, Qt::Key_L, Qt::Key_P, Qt::Key_T,
                      Qt::Key_Z, Qt::Key_Tab, Qt::Key_Backtab, Qt::Key_Backspace, Qt::Key_Delete, Qt::Key_Left,
                      Qt::Key_Right, Qt::Key_Home, Qt::Key_End, Qt::Key_Up, Qt::Key_Down, Qt::Key_Return, Qt::Key_Enter,
                      Qt::Key_Escape, Qt::Key_Space, Qt::Key_F1, Qt::Key_F4, Qt::Key_Insert, Qt::Key_Menu };
            static const std::vector<Qt::KeyboardModifiers> modifiers = { Qt::NoModifier, Qt::NoModifier,
                Qt::NoModifier, Qt::ShiftModifier, Qt::ControlModifier, Qt::AltModifier };
            // Keys with modifiers, text typed, and pastes by either route, 14 : 7 : 3.
            const int how = h.random.below(24);
            const QString text = how < 14 ? QString() : h.values.text().left(how < 21 ? 60 : 20000);
            if (how >= 14 && how < 21) {
                journal.note(u"type %1"_s.arg(shortly(text)));
                for (const QChar c : text) {
                    const char32_t upper = c.toUpper().unicode();
                    const bool plain
                        = (upper >= u'0' && upper <= u'9') || (upper >= u'A' && upper <= u'Z') || upper == u' ';
                    if (h.window())
                        QTest::sendKeyEvent(QTest::Click, h.window(), plain ? Qt::Key(upper) : Qt::Key_unknown,
                            QString(c), Qt::NoModifier);
                }
                return;
            }
            Qt::Key key = h.random.pick(keys);
            Qt::KeyboardModifiers modifier = h.random.pick(modifiers);
            if (how >= 21) {
                QGuiApplication::clipboard()->setText(text);
                key = how == 21 ? Qt::Key_Insert : Qt::Key_V;
                modifier = how == 21 ? Qt::ShiftModifier : Qt::ControlModifier;
            }
            journal.note(u"press %1%2"_s.arg(
                QKeySequence(key | modifier).toString(), how >= 21 ? u", pasting "_s + shortly(text) : QString()));
            if (h.window())
                QTest::sendKeyEvent(QTest::Click, h.window(), key, keyText(key, modifier), modifier);
        } },
    { 28, true,
        [](HostForm &h) {
            QWidget *on = target(h);
            if (!on || !h.window())
                return;
            // Clicks, double clicks, pointer moves and the wheel, 12 : 5 : 8 : 3.
            const int roll = h.random.below(28);
            if (roll < 17)
                return click(h, on, roll >= 12);
            if (roll < 25) {
                const QPoint at
                    = h.random.chance(0.2) ? QPoint(h.form->width() + 20, h.form->height() + 20) : pointIn(h, on);
                // Warped, the real pointer goes through grabs and crossing events on an X server.
                const bool warp = !h.random.chance(0.5);
                journal.note(
                    u"%1 the pointer to %2,%3 of the form"_s.arg(warp ? "warp" : "move").arg(at.x()).arg(at.y()));
                if (warp)
                    QCursor::setPos(h.form->mapToGlobal(at));
                else
                    QTest::mouseMove(h.window(), at);
                return QCoreApplication::processEvents();
            }
            const QPoint at = on->mapFrom(on->window(), pointIn(h, on));
            const int delta = h.random.chance(0.5) ? 120 : -120;
            journal.note(u"turn the wheel %1 over %2"_s.arg(delta).arg(describe(on)));
            QWheelEvent event(at, on->mapToGlobal(at), QPoint(), QPoint(0, delta), Qt::NoButton, Qt::NoModifier,
                Qt::NoScrollPhase, false);
            QApplication::sendEvent(on, &event);
        } },
    { 6, true,
        [](HostForm &h) {
            QWidget *on = target(h);
            const int how = h.random.below(4);
            if (how == 0) {
                journal.note(u"focus the neighbouring text box"_s);
                h.neighbour->setFocus(Qt::TabFocusReason);
            } else if (how == 1 && on) {
                journal.note(u"setFocus() on %1"_s.arg(describe(on)));
                on->setFocus(Qt::OtherFocusReason);
            } else if (how == 2) {
                journal.note(u"activate the form"_s);
                h.form->activateWindow();
                QCoreApplication::processEvents();
            } else if (how == 3 && QApplication::focusWidget()) {
                journal.note(u"clear the focus"_s);
                QApplication::focusWidget()->clearFocus();
            }
        } },
    { 9, false,
        [](HostForm &h) {
            // The control as a widget: enabled, shown, of odd sizes; or the form enabled.
            static const std::vector<const char *> names = { "enabled", "visible", "size", "size" };
            QObject *which = h.widget() && h.random.chance(0.6) ? h.object.data() : h.form.data();
            const char *name = which == h.form.data() ? "enabled" : h.random.pick(names);
            const QMetaObject *meta = which->metaObject();
            write(h, which, meta->property(meta->indexOfProperty(name)),
                which == h.form.data() ? u"the form's "_s : u"the control's "_s);
        } },
    { 12, false,
        [](HostForm &h) {
            const QMetaObject *meta = h.object->metaObject();
            std::vector<QMetaProperty> writable;
            for (int i = 0; i < meta->propertyCount(); ++i)
                if (meta->property(i).isWritable() && declaredByTheLibrary(meta->property(i).enclosingMetaObject()))
                    writable.push_back(meta->property(i));
            if (!writable.empty())
                write(h, h.object, h.random.pick(writable), QString());
        } },
    { 10, false,
        [](HostForm &h) {
            const std::vector<QMetaMethod> methods = membersOf(h.object, QMetaMethod::Method);
            if (!methods.empty())
                call(h.object, h.random.pick(methods), h.values);
        } },
    { 5, false,
        [](HostForm &h) {
            journal.note(u"read every property, Save, then Load what was saved"_s);
            const QMetaObject *meta = h.object->metaObject();
            for (int i = 0; i < meta->propertyCount() && h.object; ++i)
                meta->property(i).read(h.object);
            const QPointer<UserControl> control = h.control();
            if (!control)
                return;
            const PropertyBag saved = control->Save();
            control->Load(saved);
            const PropertyBag again = control ? control->Save() : saved;
            for (const QString &name : saved.names() + again.names()) {
                const QVariant before = saved.ReadProperty(name), after = again.ReadProperty(name);
                // The number badge's empty caption is not written and reads back as "1", as
                // its saved forms always have.
                if (before != after
                    && !(h.className == "skNumber"_L1 && name == "Caption"_L1 && !before.isValid() && after == "1"_L1))
                    return void(h.faults << u"a Save/Load round trip changed %1 from %2 to %3"_s.arg(
                                    name, shortly(before), shortly(after)));
            }
        } },
    { 4, false,
        [](HostForm &h) {
            const int ms = h.random.below(60);
            journal.note(u"let the event loop run %1 ms"_s.arg(ms));
            QTest::qWait(ms);
        } },
};

// The names of the classes the registry can create in this build (of the controls only).
std::vector<std::string> servedClasses(bool controlsOnly = false)
{
    std::vector<std::string> names;
    for (const ClassInfo &info : ClassRegistry::classes())
        if (ClassRegistry::factoryFor(info.classId) && (info.isControl || !controlsOnly))
            names.emplace_back(info.name);
    return names;
}

struct Episode : HostForm
{
    using HostForm::HostForm;

    void place()
    {
        // The pointer and clipboard start afresh, so that the episode follows from its seed alone.
        QCursor::setPos(0, 0);
        QGuiApplication::clipboard()->clear();
        form->resize(300 + random.below(400), 200 + random.below(300));
        if (random.chance(0.5)) {
            journal.note(u"LockServer(true)"_s);
            ClassFactory::LockServer(true);
            ++locks;
        }
        object = CreateObject(className, form);
        const bool laidOut = random.chance(0.5);
        if (laidOut) {
            auto *layout = new QVBoxLayout(form);
            layout->addWidget(neighbour);
            if (widget())
                layout->addWidget(widget());
            layout->addStretch();
        } else if (widget())
            widget()->move(10, 40);
        journal.note(u"create %1 on a form, %2"_s.arg(className, laidOut ? "in a vertical layout" : "placed"));
        values.objects.push_back(object);
        values.windows.push_back(platform::handleOf(form));
        if (widget())
            values.windows.push_back(platform::handleOf(widget()));
        if (UserControl *created = control()) {
            if (random.chance(0.1)) {
                journal.note(u"in a designer"_s);
                Ambient designer;
                designer.UserMode = false;
                created->setAmbient(designer);
            }
            if (random.chance(0.5)) {
                journal.note(u"InitNew"_s);
                created->InitNew();
            } else {
                const PropertyBag bag = randomBag();
                journal.note(u"Load a bag of %1 properties"_s.arg(bag.names().size()));
                created->Load(bag);
            }
        }
        if (!form)
            return;
        journal.note(u"show the form"_s);
        form->show();
        if (!QTest::qWaitForWindowExposed(form, 2000))
            journal.note(u"the form was not exposed in time"_s);
    }

    // The names a fresh control saves, with random values of any type.
    PropertyBag randomBag()
    {
        static const std::vector<QMetaType> types = { QMetaType::fromType<bool>(), QMetaType::fromType<qint32>(),
            QMetaType::fromType<QString>(), QMetaType::fromType<QByteArray>(), QMetaType::fromType<quint32>() };
        PropertyBag bag;
        const std::unique_ptr<QObject> fresh(CreateObject(className));
        auto *control = qobject_cast<UserControl *>(fresh.get());
        if (!control)
            return bag;
        control->InitNew();
        const PropertyBag saved = control->Save();
        for (const QString &name : saved.names())
            if (!random.chance(0.2))
                bag.WriteProperty(name,
                    random.chance(0.5) ? saved.ReadProperty(name, QVariant())
                                       : values.make(random.pick(types), name.toUtf8()));
        return bag;
    }

    void destroy(const QString &how)
    {
        QPointer<QObject> victim = victimIsForm ? QPointer<QObject>(form.data()) : object;
        if (!victim)
            return;
        if (!victimIsForm && random.chance(0.3) && control()) {
            journal.note(u"the container releases the control (%1)"_s.arg(how));
            control()->Release();
            return;
        }
        const bool later = insideUnsafeEvent();
        journal.note(u"the host deletes the %1 %2%3"_s.arg(
            victimIsForm ? "form" : "control", how, later ? " (later: Qt goes on with the widget)" : ""));
        if (later)
            victim->deleteLater();
        else
            delete victim.data();
    }

    // Modes 0 and 1 delete the object now (or release it), 2 the form; 3 arms a deletion of
    // either inside one of the object's events (the one at `index`, if any), 4 while a menu
    // or modal form is open.
    void arm(int mode, int index)
    {
        const std::vector<QMetaMethod> events
            = mode == 3 ? membersOf(object, QMetaMethod::Signal) : std::vector<QMetaMethod>();
        victimIsForm = mode == 2;
        if (mode < 3 || (mode == 3 && events.empty()))
            return destroy(u"between two steps"_s);
        const QMetaMethod event = mode == 4 ? QMetaMethod() : index >= 0 ? events[size_t(index)] : random.pick(events);
        const QString when
            = mode == 4 ? u"while a menu or modal form is open"_s : u"inside "_s + QLatin1String(event.name());
        victimIsForm = random.chance(0.3);
        journal.note(u"from now on the host deletes the %1 %2"_s.arg(victimIsForm ? "form" : "control", when));
        if (mode == 4)
            onModal([this, when] { destroy(when); });
        else
            hook = std::make_unique<SignalHook>(object, event, [this, when] { destroy(when); });
    }

    void check()
    {
        journal.note(u"the host checks its form"_s);
        // Now and then long enough for the timers left behind (a tip's is 500 ms) to come due.
        QTest::qWait(random.chance(0.1) ? 600 : 30);
        QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
        if (object)
            faults << u"the control outlived its deletion"_s;
        if (!form && !victimIsForm)
            faults << u"the form was deleted with the control"_s;
        if (!form)
            return;
        if (!neighbourWorks())
            faults << u"the neighbouring text box no longer takes typing: \"%1\""_s.arg(neighbour->text());
        form->grab();
    }

    int run(int steps, int deleteIn)
    {
        static const int totalWeight = std::accumulate(
            stepKinds.begin(), stepKinds.end(), 0, [](int sum, const StepKind &kind) { return sum + kind.weight; });
        const int liveBefore = LiveObject::count();
        const qsizetype windowsBefore = QApplication::topLevelWidgets().size();
        place();
        const int deleteAt = deleteIn >= 0 ? 0 : random.below(steps + 1);
        const size_t events = object ? membersOf(object, QMetaMethod::Signal).size() : 0;
        const int mode = deleteIn < 0 ? random.below(5) : size_t(deleteIn) < events ? 3 : 4;
        int ran = 0;
        for (; ran < steps && form && object; ++ran) {
            if (ran == deleteAt)
                arm(mode, mode == 3 ? deleteIn : -1);
            if (!object || !form)
                break;
            int roll = random.below(totalWeight);
            std::find_if(stepKinds.begin(), stepKinds.end(), [&](const StepKind &kind) {
                return (roll -= kind.weight) < 0;
            })->step(*this);
        }
        if (object && !hook)
            destroy(u"between two steps"_s);
        else if (object) {
            journal.note(u"the event never came: the host deletes the control"_s);
            delete object.data();
        }
        check();
        hook.reset();
        delete form.data();
        QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
        for (; locks > 0; --locks)
            ClassFactory::LockServer(false);
        if (liveBefore == 0 && LiveObject::count() == 0 && DllCanUnloadNow() != S_OK)
            faults << u"DllCanUnloadNow keeps the library loaded with nothing alive and no lock"_s;
        if (QApplication::topLevelWidgets().size() > windowsBefore)
            faults << u"%1 windows outlive their form"_s.arg(QApplication::topLevelWidgets().size() - windowsBefore);
        if (LiveObject::count() != liveBefore)
            faults << u"%1 public objects outlive their form"_s.arg(LiveObject::count() - liveBefore);
        return ran;
    }

    std::unique_ptr<SignalHook> hook;
    bool victimIsForm = false;
};

// One episode of `steps` random steps (printed as they run when `echo`) in which the host
// deletes the object, then checks its form: at random, or from the first step inside event
// `deleteIn` of the object (past the last, while a menu or modal form is open). Answers the
// steps run, and in `failure` the faults found with the steps that replay them.
int runEpisode(const QString &className, quint64 seed, int steps, bool echo, QString &failure, int deleteIn = -1)
{
    journal.echo = echo;
    journal.begin(u"%1, seed %2"_s.arg(className).arg(seed),
        deleteIn < 0 ? u"EveryClass/RandomUse.*"_s : u"EveryClass/Lifetime.*/"_s + className,
        deleteIn < 0 ? u" ZELCTL_STRESS_REPLAY=%1:%2"_s.arg(className).arg(seed) : QString());
    Episode episode(className, seed);
    const int ran = episode.run(steps, deleteIn);
    failure = episode.faults.isEmpty() ? QString() : episode.faults.join(u"; ") + u'\n' + journal.replay();
    return ran;
}

} // namespace

} // namespace zelctl::stress

using namespace zelctl;
using namespace zelctl::stress;

using RandomUse = ::testing::TestWithParam<std::string>;
using Lifetime = ::testing::TestWithParam<std::string>;
using DisabledParent = ::testing::TestWithParam<std::string>;

// Random episodes, each from its own seed, for a budget of seconds shared among the classes
// (ZELCTL_STRESS_SECONDS, 12 by default; ZELCTL_STRESS_SEED picks another series).
// ZELCTL_STRESS_REPLAY=Class:seed replays one episode and prints its steps as they run.
TEST_P(RandomUse, aCarelessHostBreaksNothing)
{
    const QString name = QString::fromStdString(GetParam());
    const QList<QByteArray> replaying = qgetenv("ZELCTL_STRESS_REPLAY").split(':');
    if (replaying.size() == 2 && replaying[0] != name.toLatin1())
        GTEST_SKIP() << "replaying another class";
    const std::vector<std::string> classes = servedClasses();
    const int seconds = qEnvironmentVariableIntValue("ZELCTL_STRESS_SECONDS");
    const qint64 budget = (seconds > 0 ? seconds : 12) * 1000ll / qint64(classes.size());
    const quint64 series
        = qEnvironmentVariableIsSet("ZELCTL_STRESS_SEED") ? qgetenv("ZELCTL_STRESS_SEED").toULongLong() : 1;
    // Neighbouring series and classes give unrelated seeds.
    Random seeds(
        series * classes.size() + size_t(std::find(classes.begin(), classes.end(), GetParam()) - classes.begin()));
    QElapsedTimer clock;
    clock.start();
    int episodes = 0, steps = 0, failures = 0;
    for (; episodes == 0 || (replaying.size() != 2 && clock.elapsed() < budget); ++episodes) {
        const quint64 seed = replaying.size() == 2 ? replaying[1].toULongLong() : seeds() >> 16;
        QString failure;
        steps += runEpisode(name, seed, 50 + int(seed % 350), replaying.size() == 2, failure);
        if (!failure.isEmpty() && ++failures <= 3)
            ADD_FAILURE() << qPrintable(failure);
    }
    std::printf("[ stress   ] %s: %d episodes, %d steps, series %llu\n", GetParam().c_str(), episodes, steps,
        static_cast<unsigned long long>(series));
}

// For each event of the class, and while a menu or modal form of it is open, an episode in
// which the host deletes the object (or its form) then, from the first step on.
TEST_P(Lifetime, theHostMayDeleteTheObjectInAnyOfItsEventsOrWhileItsMenuOrFormIsOpen)
{
    const QString name = QString::fromStdString(GetParam());
    const size_t events = membersOf(std::unique_ptr<QObject>(CreateObject(name)).get(), QMetaMethod::Signal).size();
    for (size_t event = 0; event <= events; ++event) {
        QString failure;
        runEpisode(name, event, 60, false, failure, int(event));
        EXPECT_TRUE(failure.isEmpty()) << qPrintable(failure);
    }
}

// Inside a disabled form a control looks as when disabled itself, answers no input with an
// event, a menu or a form, and keeps its own setting.
TEST_P(DisabledParent, looksAndActsDisabledAndKeepsItsOwnSetting)
{
    HostForm host(QString::fromStdString(GetParam()), QSize(300, 200));
    const QPointer<UserControl> control = qobject_cast<UserControl *>(host.object.data());
    ASSERT_NE(control, nullptr);
    const auto picture = [&] { return control->grab().toImage().convertToFormat(QImage::Format_RGB32); };
    const PropertyBag saved = control->Save();
    // Through the control's own Enabled where it has one, as a host sets it.
    const auto enableItself = [&](bool enabled) {
        if (!control->setProperty("Enabled", enabled))
            control->QWidget::setEnabled(enabled);
    };
    enableItself(false);
    const QImage disabledItself = picture();
    enableItself(true);

    int opened = 0;
    host.onModal([&] { ++opened; });
    host.form->setEnabled(false);
    EXPECT_EQ(picture(), disabledItself);
    QStringList raised;
    std::vector<std::unique_ptr<SignalHook>> hooks;
    for (const QMetaMethod &event : membersOf(control, QMetaMethod::Signal))
        hooks.push_back(std::make_unique<SignalHook>(control, event, [&raised, event] { raised << event.name(); }));
    // Every kind of step a user takes by hand, a few rounds.
    for (int round = 0; round < 12; ++round)
        for (const StepKind &kind : stepKinds)
            if (kind.byUser)
                kind.step(host);
    QTest::qWait(20);
    ASSERT_TRUE(control);
    EXPECT_TRUE(raised.isEmpty()) << "events answered input in a disabled form: " << raised.join(u", ").toStdString();
    EXPECT_EQ(opened, 0) << "a menu or form opened in a disabled form";
    EXPECT_EQ(control->Save(), saved) << "the form's state leaked into the control's own setting";
    const QVariant own = control->property("Enabled");
    EXPECT_TRUE(!own.isValid() || own.toBool());
}

const auto byName = [](const ::testing::TestParamInfo<std::string> &info) { return info.param; };
INSTANTIATE_TEST_SUITE_P(EveryClass, RandomUse, ::testing::ValuesIn(servedClasses()), byName);
INSTANTIATE_TEST_SUITE_P(EveryClass, Lifetime, ::testing::ValuesIn(servedClasses()), byName);
INSTANTIATE_TEST_SUITE_P(EveryControl, DisabledParent, ::testing::ValuesIn(servedClasses(true)), byName);

int main(int argc, char **argv)
{
    QTemporaryDir home;
    if (!zelctl::test::usePrivateEnvironment(home))
        return 1;
    zelctl::stress::Application app(argc, argv);
    zelctl::platform::SaveSetting("zEL", "Setup", "RootPath", ZELCTL_SOURCE_DIR "/");
    // Documents and addresses are not opened for real.
    zelctl::platform::setShellOpenHook([](const QString &) { return true; });
    zelctl::stress::watchForHangs();
    ::testing::InitGoogleTest(&argc, argv);
    return RUN_ALL_TESTS();
}

#include "StressHost.moc"

// The stress host's machinery and its main: private settings and data folders and the
// source tree as root, as in every test program, but with the library's real menus, modal
// forms and message boxes, which a watcher dismisses.

#include "StressHost.h"

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
#include <QDialog>
#include <QDir>
#include <QMetaProperty>
#include <QMouseEvent>
#include <QSignalSpy>
#include <QTemporaryDir>
#include <QTest>
#include <QTimer>
#include <QVBoxLayout>
#include <QWheelEvent>
#include <QWindow>

#include <gtest/gtest.h>

#if defined(__SANITIZE_ADDRESS__)
#include <sanitizer/common_interface_defs.h>
#endif

#include <atomic>
#include <bit>
#include <climits>
#include <cmath>
#include <cstdio>
#include <numeric>
#include <random>
#include <thread>

using namespace Qt::StringLiterals;

namespace zelctl::stress {

namespace {

struct Random : std::mt19937_64
{
    using std::mt19937_64::mt19937_64;
    // 0 .. n-1 (n > 0).
    int below(int n) { return int((*this)() % quint64(n)); }
    bool chance(double p) { return double((*this)() % 1000000) < p * 1000000.0; }
    template <typename T> const T &pick(const std::vector<T> &from) { return from[size_t(below(int(from.size())))]; }
};

qint64 nowMs()
{
    using namespace std::chrono;
    return duration_cast<milliseconds>(steady_clock::now().time_since_epoch()).count();
}

// The steps of the episode that runs now, printed when it fails, also from a sanitizer's
// report or from a watchdog that sees no progress.
struct Journal
{
    void begin(const QString &className, quint64 seed)
    {
        const QString platform = QGuiApplication::platformName();
        episode = u"%1, seed %2, on %3"_s.arg(className).arg(seed).arg(platform);
        command = u"ZELCTL_STRESS_REPLAY=%1:%2 QT_QPA_PLATFORM=%3"_s.arg(className).arg(seed).arg(platform);
        steps.clear();
        lastStep = nowMs();
        // The last of these lines names the episode to replay when a sanitizer stops the
        // process without calling back (UBSan has a runtime of its own).
        std::fprintf(stderr, "[ episode  ] %s\n", qPrintable(episode));
    }

    void note(const QString &step)
    {
        // A step that took long is named, so a long run shows where its time went.
        if (const qint64 took = nowMs() - lastStep; lastStep != 0 && took > 2000 && !steps.isEmpty())
            std::fprintf(stderr, "[ slow     ] %s: %lld ms in step %lld, %s\n", qPrintable(episode), took, steps.size(),
                qPrintable(steps.last()));
        steps << step;
        if (echo)
            std::fprintf(stderr, "  %lld. %s\n", steps.size(), qPrintable(step));
        lastStep = nowMs();
    }

    QString replay() const
    {
        QString text = u"stress host: %1, after these steps:\n"_s.arg(episode);
        for (qsizetype i = 0; i < steps.size(); ++i)
            text += u"  %1. %2\n"_s.arg(i + 1).arg(steps[i]);
        return text + u"replay: %1 tests/test_stress --gtest_filter='EveryClass/RandomUse.*'\n"_s.arg(command);
    }

    QString episode, command;
    QStringList steps;
    bool echo = false;
    // When the last step began; 0 while no episode runs and the watchdog rests.
    std::atomic<qint64> lastStep { 0 };
} journal;

void printJournal()
{
    std::fputs(qPrintable(journal.replay()), stderr);
}

void watchForHangs(qint64 limitMs)
{
#if defined(__SANITIZE_ADDRESS__)
    __sanitizer_set_death_callback(printJournal);
#endif
    std::thread([limitMs] {
        for (;;) {
            std::this_thread::sleep_for(std::chrono::seconds(1));
            if (const qint64 last = journal.lastStep; last != 0 && nowMs() - last > limitMs) {
                std::fprintf(stderr, "stress host: no progress for %lld s\n", limitMs / 1000);
                printJournal();
                std::abort();
            }
        }
    }).detach();
}

bool declaredByTheLibrary(const QMetaObject *meta)
{
    return QByteArray(meta->className()).startsWith("zelctl::");
}

QString shortly(const QVariant &value)
{
    const int id = value.metaType().id();
    QString text = id == QMetaType::QByteArray ? u"%1 bytes"_s.arg(value.toByteArray().size())
        : id == QMetaType::QSize               ? u"%1 x %2"_s.arg(value.toSize().width()).arg(value.toSize().height())
                                               : value.toString();
    if (text.isEmpty() && value.isValid() && !value.canConvert<QString>())
        text = QLatin1String(value.typeName());
    if (text.size() > 40)
        text = text.left(37) + u"... (%1 characters)"_s.arg(text.size());
    return u"\"%1\""_s.arg(text.replace(u'\n', "\\n"_L1));
}

QString describe(const QWidget *widget)
{
    return (QLatin1String(widget->metaObject()->className()) + u' ' + widget->objectName()).trimmed();
}

// The text a key press carries, as a keyboard gives it; QTest's own table stops the
// process on keys it does not know.
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

// Input events of the library's widgets and of the inner boxes of its controls (the text
// boxes of the NIF and NIB boxes), timers and queued calls are safe: the library keeps
// alive whatever of it their code still uses.
bool safeToDeleteIn(const QWidget *receiver, const QEvent *event)
{
    static const QList<QEvent::Type> safe = { QEvent::MouseButtonPress, QEvent::MouseButtonDblClick,
        QEvent::MouseButtonRelease, QEvent::MouseMove, QEvent::KeyPress, QEvent::KeyRelease, QEvent::Wheel,
        QEvent::Timer, QEvent::MetaCall, QEvent::ContextMenu };
    const QEvent::Type type = event->type();
    // Qt follows a right-button press with a context menu event to the same widget, through
    // a plain pointer.
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

    // A value of the metatype; `name` (of a parameter or property) steers handles, colours
    // and files towards meaningful ones.
    QVariant make(QMetaType type, const QByteArray &name)
    {
        static const QList<int> integers
            = { QMetaType::Short, QMetaType::UShort, QMetaType::Int, QMetaType::UInt, QMetaType::Long, QMetaType::ULong,
                  QMetaType::LongLong, QMetaType::ULongLong, QMetaType::UChar, QMetaType::Char, QMetaType::SChar };
        static const std::vector<double> reals = { 0.0, -1.0, 0.5, 1.0, 2.2, 100.0, 1e308, -1e308, std::nan("") };
        const QByteArray lower = name.toLower();
        const auto named = [&](std::initializer_list<const char *> words) {
            return std::any_of(words.begin(), words.end(), [&](const char *word) { return lower.contains(word); });
        };
        QVariant result;
        if (type.id() == QMetaType::Bool) {
            return m_random.chance(0.5);
        } else if (integers.contains(type.id()) || type.flags().testFlag(QMetaType::IsEnumeration)) {
            qint64 value = integer();
            if ((named({ "hdc" }) || name.endsWith("DC")) && m_random.chance(0.8))
                value = m_random.pick(m_devices);
            else if (named({ "hwnd" }) && !windows.empty() && m_random.chance(0.8))
                value = m_random.pick(windows);
            else if (named({ "color", "colour", "back", "fore", "ground" }) && m_random.chance(0.8))
                value = color();
            result = value;
        } else if (type.id() == QMetaType::Double || type.id() == QMetaType::Float) {
            result = m_random.pick(reals);
        } else if (type.id() == QMetaType::QString) {
            return named({ "file", "path", "image" }) || m_random.chance(0.05) ? file() : text();
        } else if (type.id() == QMetaType::QSize) {
            static const std::vector<QSize> sizes = { QSize(0, 0), QSize(1, 1), QSize(2, 3), QSize(17, 9),
                QSize(300, 40), QSize(40, 300), QSize(3000, 2000), QSize(70000, 4), QSize(4, 70000) };
            return m_random.chance(0.5) ? m_random.pick(sizes) : QSize(m_random.below(600), m_random.below(400));
        } else if (type.id() == QMetaType::QByteArray) {
            QFile source(file());
            if (m_random.chance(0.7) && source.open(QIODevice::ReadOnly))
                return source.read(1 << 20);
            QByteArray garbage(m_random.below(64), '\0');
            for (char &c : garbage)
                c = char(m_random.below(256));
            return garbage;
        } else if (type.id() == QMetaType::QVariant) {
            return m_random.chance(0.5) ? QVariant(text()) : QVariant(integer());
        } else if (type.id() == QMetaType::QFont) {
            return QFont(u"Liberation Sans"_s, m_random.pick(std::vector<int> { 1, 6, 8, 11, 72, 400 }),
                m_random.chance(0.5) ? QFont::Bold : QFont::Normal);
        } else if (type == QMetaType::fromType<QList<qint32>>()) {
            QList<qint32> list(m_random.below(300));
            for (qint32 &entry : list)
                entry = qint32(integer());
            return QVariant::fromValue(list);
        } else if (type == QMetaType::fromType<Picture>()) {
            return QVariant::fromValue(m_random.chance(0.2) ? Picture() : Picture::fromFile(file()));
        } else if (type == QMetaType::fromType<GFXSelection>()) {
            GFXSelection selection;
            selection.Title = text();
            selection.Subtitle = text();
            selection.DisableCancel = m_random.chance(0.3);
            if (!objects.empty() && m_random.chance(0.7))
                selection.ParentObj = m_random.pick(objects).data();
            selection.WindowPositionRelation = GFXPositioning(m_random.below(12) - 1);
            return QVariant::fromValue(selection);
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
            return QVariant::fromValue(items);
        }
        return result.convert(type) ? result : QVariant(type);
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

} // namespace

// Closes whatever a step left open in a nested event loop (menus, modal forms, message
// boxes), after pressing a few of their keys and buttons as a user would.
class Watcher : public QObject
{
public:
    explicit Watcher(quint64 seed)
        : m_random(seed)
    {
        m_timer.setInterval(10);
        connect(&m_timer, &QTimer::timeout, this, &Watcher::look);
        m_timer.start();
    }

    std::function<void()> onModal;

private:
    void look()
    {
        QWidget *open
            = QApplication::activePopupWidget() ? QApplication::activePopupWidget() : QApplication::activeModalWidget();
        m_ticks = open ? m_ticks + 1 : 0;
        const QPointer<QWidget> guard(open);
        if (m_ticks == 1 && onModal)
            std::exchange(onModal, nullptr)();
        if (!guard)
            return;
        if (m_ticks < 5 && m_random.chance(0.6)) {
            const QList<QAbstractButton *> buttons = open->findChildren<QAbstractButton *>();
            if (!buttons.isEmpty() && m_random.chance(0.5)) {
                QAbstractButton *button = buttons.at(m_random.below(int(buttons.size())));
                if (button->isVisible() && button->isEnabled()) {
                    journal.note(
                        u"watcher clicks %1 \"%2\" in %3"_s.arg(describe(button), button->text(), describe(open)));
                    // Queued: a form the click opens must not run inside this timer's own
                    // slot, where the timer cannot fire again to close it.
                    QMetaObject::invokeMethod(button, &QAbstractButton::click, Qt::QueuedConnection);
                    return;
                }
            }
            static const std::vector<Qt::Key> keys = { Qt::Key_Down, Qt::Key_Up, Qt::Key_Tab, Qt::Key_Space,
                Qt::Key_Return, Qt::Key_Escape, Qt::Key_Right };
            const Qt::Key key = m_random.pick(keys);
            journal.note(u"watcher presses %1 in %2"_s.arg(QKeySequence(key).toString(), describe(open)));
            QMetaObject::invokeMethod(
                open, [open, key] { QTest::sendKeyEvent(QTest::Click, open, key, keyText(key, {}), {}); },
                Qt::QueuedConnection);
            return;
        }
        journal.note(u"watcher closes %1"_s.arg(describe(open)));
        if (auto *dialog = qobject_cast<QDialog *>(open))
            dialog->reject();
        else
            open->close();
    }

    Random m_random;
    QTimer m_timer;
    int m_ticks = 0;
};

bool insideUnsafeEvent()
{
    return unsafeDepth > 0;
}

SignalHook::SignalHook(QObject *sender, const QMetaMethod &signal, std::function<void()> action)
    : m_action(std::move(action))
{
    connect(sender, signal, this, staticMetaObject.method(staticMetaObject.indexOfSlot("fire()")));
}

std::vector<QMetaMethod> membersOf(const QObject *object, QMetaMethod::MethodType kind)
{
    std::vector<QMetaMethod> found;
    const QMetaObject *meta = object->metaObject();
    for (int i = 0; i < meta->methodCount(); ++i) {
        const QMetaMethod method = meta->method(i);
        // propertyChanged is the container's bookkeeping of a modified form, not an event of
        // the control that a host handles.
        if (method.methodType() == kind && method.access() == QMetaMethod::Public
            && declaredByTheLibrary(method.enclosingMetaObject()) && method.name() != "propertyChanged")
            found.push_back(method);
    }
    return found;
}

HostForm::HostForm(quint64 seed)
    : form(new QWidget)
    , neighbour(new QLineEdit(form))
    , watcher(std::make_unique<Watcher>(seed))
{
    form->setObjectName(u"form"_s);
    neighbour->setObjectName(u"neighbour"_s);
    neighbour->setGeometry(0, 0, 120, 22);
}

HostForm::HostForm(const QString &className, QSize size)
    : HostForm(7)
{
    journal.begin(className, 0);
    form->resize(size);
    object = CreateObject(className, form);
    if (auto *control = qobject_cast<UserControl *>(object.data()))
        control->InitNew();
    if (auto *widget = qobject_cast<QWidget *>(object.data()))
        widget->setGeometry(20, 40, 200, 60);
    form->show();
    EXPECT_TRUE(QTest::qWaitForWindowExposed(form));
}

HostForm::~HostForm()
{
    delete form.data();
    journal.lastStep = 0;
}

void HostForm::onModal(std::function<void()> action)
{
    watcher->onModal = std::move(action);
}

bool HostForm::neighbourWorks()
{
    form->setEnabled(true);
    form->show();
    neighbour->setFocus();
    neighbour->clear();
    QTest::keyClicks(neighbour, u"ok"_s);
    return neighbour->text() == "ok"_L1;
}

void HostForm::use(bool asHost)
{
    QWindow *window = form->windowHandle();
    // Into the object itself: some controls keep a height of their own.
    const auto *widget = qobject_cast<QWidget *>(object.data());
    const QPoint centre = widget ? widget->geometry().center() : QPoint(120, 70);
    Random random(1);
    Values values(random);
    values.objects.push_back(form.data());
    std::vector<std::function<void()>> steps = {
        [=] { QTest::mouseMove(window, centre); },
        [=] { QTest::mouseMove(window, centre + QPoint(3, 2)); },
        [=] { QTest::mouseClick(window, Qt::LeftButton, {}, centre); },
        [=] { QTest::mouseDClick(window, Qt::LeftButton, {}, centre); },
        [=] { QTest::mouseClick(window, Qt::RightButton, {}, centre); },
        [=] {
            QWheelEvent wheel(QPointF(centre), QPointF(window->mapToGlobal(centre)), {}, { 0, 120 }, Qt::NoButton, {},
                Qt::NoScrollPhase, false);
            QApplication::sendEvent(window, &wheel);
        },
        [=, this] { QTest::mouseMove(window, QPoint(form->width() - 10, form->height() - 10)); },
        [this] {
            if (auto *widget = qobject_cast<QWidget *>(object.data()))
                widget->setFocus();
        },
        [] {
            if (QWidget *focus = QApplication::focusWidget())
                QTest::keyClicks(focus, u"PT501964843"_s);
        },
    };
    for (const Qt::Key key :
        { Qt::Key_Space, Qt::Key_Return, Qt::Key_1, Qt::Key_Down, Qt::Key_Menu, Qt::Key_Tab, Qt::Key_Escape })
        steps.push_back([window, key] { QTest::keyClick(window, key); });
    if (asHost && object) {
        steps.push_back([this] {
            if (auto *widget = qobject_cast<QWidget *>(object.data()))
                widget->resize(90, 30);
        });
        steps.push_back([this] { form->setEnabled(false); });
        steps.push_back([this] { form->setEnabled(true); });
        for (const QMetaMethod &method : membersOf(object, QMetaMethod::Method))
            steps.push_back([&, method] {
                call(object, method, values);
                QTest::qWait(5);
            });
        steps.push_back([] { QTest::qWait(100); });
    }
    for (const auto &step : steps) {
        if (!object)
            return;
        step();
        QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    }
}

std::vector<std::string> servedClasses(bool controlsOnly)
{
    std::vector<std::string> names;
    for (const ClassInfo &info : ClassRegistry::classes())
        if (ClassRegistry::factoryFor(info.classId) && (info.isControl || !controlsOnly))
            names.emplace_back(info.name);
    return names;
}

// --- The episode ------------------------------------------------------------------------

namespace {

struct Episode : HostForm
{
    Episode(const QString &className, quint64 seed)
        : HostForm(seed ^ 0x9E3779B97F4A7C15ull)
        , random(seed)
        , values(random)
        , className(className)
    { }

    QWindow *window() const { return form ? form->windowHandle() : nullptr; }
    QWidget *widget() const { return qobject_cast<QWidget *>(object.data()); }
    UserControl *control() const { return qobject_cast<UserControl *>(object.data()); }
    void note(const QString &step) { journal.note(step); }

    void place()
    {
        // The pointer and the clipboard are the machine's: each episode starts them afresh,
        // so that it follows from its seed alone.
        QCursor::setPos(0, 0);
        QGuiApplication::clipboard()->clear();
        form->setWindowTitle(u"stress "_s + className);
        form->resize(300 + random.below(400), 200 + random.below(300));
        // As a host does: the class factory through the entry point, locked while it is kept.
        const GUID classId = std::bit_cast<GUID>(ClassRegistry::factoryFor(className)->info().classId);
        void *factory = nullptr;
        if (DllGetClassObject(&classId, &IID_IClassFactory, &factory) != S_OK || !factory) {
            faults << u"DllGetClassObject gave no factory"_s;
            return;
        }
        if (random.chance(0.5))
            lock();
        object = static_cast<const ClassFactory *>(factory)->CreateInstance(form);
        const bool laidOut = random.chance(0.5);
        if (laidOut) {
            auto *layout = new QVBoxLayout(form);
            layout->addWidget(neighbour);
            if (widget())
                layout->addWidget(widget());
            layout->addStretch();
        } else if (widget())
            widget()->move(10, 40);
        note(u"create %1 on a form, %2"_s.arg(className, laidOut ? "in a vertical layout" : "placed"));
        values.objects = { form.data(), object };
        values.windows.push_back(platform::handleOf(form));
        if (widget())
            values.windows.push_back(platform::handleOf(widget()));
        if (UserControl *control = this->control()) {
            if (random.chance(0.1)) {
                Ambient designer;
                designer.UserMode = false;
                note(u"the container is a form designer"_s);
                control->setAmbient(designer);
            }
            if (random.chance(0.5)) {
                note(u"InitNew"_s);
                control->InitNew();
            } else {
                const PropertyBag bag = randomBag();
                note(u"Load a bag of %1 properties"_s.arg(bag.names().size()));
                control->Load(bag);
            }
        }
        if (!form)
            return;
        note(u"show the form"_s);
        form->show();
        if (!QTest::qWaitForWindowExposed(form, 2000))
            note(u"the form was not exposed in time"_s);
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

    void lock()
    {
        note(u"LockServer(true)"_s);
        ClassFactory::LockServer(true);
        ++locks;
    }

    void destroy(const QString &how)
    {
        QPointer<QObject> victim = victimIsForm ? QPointer<QObject>(form.data()) : object;
        if (!victim)
            return;
        if (!victimIsForm && random.chance(0.3) && control()) {
            note(u"the container releases the control (%1)"_s.arg(how));
            control()->Release();
            return;
        }
        // Inside an event after which Qt itself goes on with the widget, deletion can only
        // wait for the event loop.
        const bool later = insideUnsafeEvent();
        note(u"the host deletes the %1 %2%3"_s.arg(
            victimIsForm ? "form" : "control", how, later ? " (later: Qt goes on with the widget)" : ""));
        if (later)
            victim->deleteLater();
        else
            delete victim.data();
    }

    // Modes 0 and 1 delete the object now (or release it), 2 the form; 3 arms a deletion of
    // either inside one of the object's events, 4 while a menu or modal form is open.
    void arm(int mode)
    {
        const std::vector<QMetaMethod> events
            = mode == 3 ? membersOf(object, QMetaMethod::Signal) : std::vector<QMetaMethod>();
        victimIsForm = mode == 2;
        if (mode < 3 || (mode == 3 && events.empty()))
            return destroy(u"between two steps"_s);
        const QMetaMethod event = mode == 3 ? random.pick(events) : QMetaMethod();
        const QString when
            = mode == 4 ? u"while a menu or modal form is open"_s : u"inside "_s + QLatin1String(event.name());
        victimIsForm = random.chance(0.3);
        note(u"from now on the host deletes the %1 %2"_s.arg(victimIsForm ? "form" : "control", when));
        if (mode == 4)
            onModal([this, when] { destroy(when); });
        else
            hook = std::make_unique<SignalHook>(object, event, [this, when] { destroy(when); });
    }

    void check()
    {
        note(u"the host checks its form"_s);
        // Long enough for the timers the object may have left behind (a tip's first delay is
        // half a second) to come due: none of them may reach it.
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

    // A part of the object, the object itself or the form.
    QWidget *target()
    {
        if (!widget() || random.chance(0.1))
            return form;
        QList<QWidget *> parts = widget()->findChildren<QWidget *>();
        parts.removeIf([](QWidget *part) { return !part->isVisible() || part->isWindow(); });
        return parts.isEmpty() || random.chance(0.4) ? widget() : parts.at(random.below(int(parts.size())));
    }

    QPoint pointIn(QWidget *on)
    {
        QPoint point(random.below(std::max(on->width(), 1)), random.below(std::max(on->height(), 1)));
        if (random.chance(0.1))
            point += QPoint(random.below(21) - 10, random.below(21) - 10);
        return on->mapTo(on->window(), point);
    }

    void click(bool twice)
    {
        QWidget *on = target();
        if (!on || !window())
            return;
        static const std::vector<std::pair<Qt::MouseButton, const char *>> buttons
            = { { Qt::LeftButton, "left" }, { Qt::RightButton, "right" }, { Qt::MiddleButton, "middle" } };
        const int roll = random.below(20);
        const auto [button, side] = buttons[roll < 15 ? 0 : roll < 19 ? 1 : 2];
        const QPoint at = pointIn(on);
        note(u"%1 %2 on %3 at %4,%5"_s.arg(twice ? "double-click" : "click", side, describe(on))
                 .arg(at.x())
                 .arg(at.y()));
        // One double click is one Click (or Clicked) of a control that draws itself.
        std::unique_ptr<QSignalSpy> clicks;
        if (twice && on == object && button == Qt::LeftButton && !on->childAt(on->mapFrom(on->window(), at))) {
            const QMetaObject *meta = object->metaObject();
            if (const int index = std::max(meta->indexOfSignal("Click()"), meta->indexOfSignal("Clicked()"));
                index >= 0)
                clicks = std::make_unique<QSignalSpy>(object.data(), meta->method(index));
        }
        if (twice)
            QTest::mouseDClick(window(), button, {}, at);
        else
            QTest::mouseClick(window(), button, {}, at);
        if (clicks && object && clicks->count() > 1)
            faults << u"a double click raised %1 Click events"_s.arg(clicks->count());
    }

    int run(int steps);

    Random random;
    Values values;
    QString className;
    std::unique_ptr<SignalHook> hook;
    QStringList faults;
    bool victimIsForm = false;
    // Locks this host holds on the library, as a host that keeps a class factory does.
    int locks = 0;
};

// What a careless host does, weighted: input first, then its late-bound calls, then the rest.
const std::vector<std::pair<int, void (*)(Episode &)>> stepKinds = {
    { 14,
        [](Episode &e) {
            static const std::vector<Qt::Key> keys
                = { Qt::Key_0, Qt::Key_1, Qt::Key_5, Qt::Key_9, Qt::Key_A, Qt::Key_E, Qt::Key_L, Qt::Key_P, Qt::Key_T,
                      Qt::Key_Z, Qt::Key_Tab, Qt::Key_Backtab, Qt::Key_Backspace, Qt::Key_Delete, Qt::Key_Left,
                      Qt::Key_Right, Qt::Key_Home, Qt::Key_End, Qt::Key_Up, Qt::Key_Down, Qt::Key_Return, Qt::Key_Enter,
                      Qt::Key_Escape, Qt::Key_Space, Qt::Key_F1, Qt::Key_F4, Qt::Key_Insert, Qt::Key_Menu };
            static const std::vector<Qt::KeyboardModifiers> modifiers = { Qt::NoModifier, Qt::NoModifier,
                Qt::NoModifier, Qt::ShiftModifier, Qt::ControlModifier, Qt::AltModifier };
            if (!e.window())
                return;
            const Qt::Key key = e.random.pick(keys);
            const Qt::KeyboardModifiers modifier = e.random.pick(modifiers);
            e.note(u"press %1"_s.arg(QKeySequence(key | modifier).toString()));
            QTest::sendKeyEvent(QTest::Click, e.window(), key, keyText(key, modifier), modifier);
        } },
    { 7,
        [](Episode &e) {
            const QPointer<QWidget> focus = QApplication::focusWidget();
            const QString text = e.values.text().left(60);
            if (!focus || focus->window() != e.form)
                return;
            e.note(u"type %1 into %2"_s.arg(shortly(text), describe(focus)));
            for (const QChar c : text) {
                const char32_t upper = c.toUpper().unicode();
                const bool plain
                    = (upper >= u'0' && upper <= u'9') || (upper >= u'A' && upper <= u'Z') || upper == u' ';
                if (focus)
                    QTest::sendKeyEvent(
                        QTest::Click, focus, plain ? Qt::Key(upper) : Qt::Key_unknown, QString(c), Qt::NoModifier);
            }
        } },
    { 3,
        [](Episode &e) {
            const QString text = e.values.text();
            QGuiApplication::clipboard()->setText(text);
            const bool shiftInsert = e.random.chance(0.5);
            e.note(u"paste %1 with %2"_s.arg(shortly(text), shiftInsert ? "Shift+Insert" : "Ctrl+V"));
            if (e.window())
                QTest::keyClick(e.window(), shiftInsert ? Qt::Key_Insert : Qt::Key_V,
                    shiftInsert ? Qt::ShiftModifier : Qt::ControlModifier);
        } },
    { 12, [](Episode &e) { e.click(false); } },
    { 5, [](Episode &e) { e.click(true); } },
    { 8,
        [](Episode &e) {
            QWidget *on = e.target();
            if (!on || !e.window())
                return;
            const QPoint at
                = e.random.chance(0.2) ? QPoint(e.form->width() + 20, e.form->height() + 20) : e.pointIn(on);
            // Warped, the real pointer goes through grabs and crossing events on an X server.
            const bool warp = !e.random.chance(0.5);
            e.note(u"%1 the pointer to %2,%3 of the form"_s.arg(warp ? "warp" : "move").arg(at.x()).arg(at.y()));
            if (warp)
                QCursor::setPos(e.form->mapToGlobal(at));
            else
                QTest::mouseMove(e.window(), at);
            QCoreApplication::processEvents();
        } },
    { 3,
        [](Episode &e) {
            const QPointer<QWidget> on = e.target();
            if (!on)
                return;
            const QPoint at = on->mapFrom(on->window(), e.pointIn(on));
            const int delta = e.random.chance(0.5) ? 120 : -120;
            e.note(u"turn the wheel %1 over %2"_s.arg(delta).arg(describe(on)));
            QWheelEvent event(at, on->mapToGlobal(at), QPoint(), QPoint(0, delta), Qt::NoButton, Qt::NoModifier,
                Qt::NoScrollPhase, false);
            QApplication::sendEvent(on, &event);
        } },
    { 6,
        [](Episode &e) {
            QWidget *on = e.target();
            const int how = e.random.below(4);
            if (how == 0) {
                e.note(u"focus the neighbouring text box"_s);
                e.neighbour->setFocus(Qt::TabFocusReason);
            } else if (how == 1 && on) {
                e.note(u"setFocus() on %1"_s.arg(describe(on)));
                on->setFocus(Qt::OtherFocusReason);
            } else if (how == 2) {
                e.note(u"activate the form"_s);
                e.form->activateWindow();
                QCoreApplication::processEvents();
            } else if (how == 3 && QApplication::focusWidget()) {
                e.note(u"clear the focus"_s);
                QApplication::focusWidget()->clearFocus();
            }
        } },
    { 9,
        [](Episode &e) {
            // The control as a widget: enabled, shown, of odd sizes; or the form enabled.
            static const std::vector<QByteArray> names = { "enabled", "visible", "size", "size" };
            QWidget *which = e.widget() && e.random.chance(0.6) ? e.widget() : e.form.data();
            const QByteArray name = which == e.form ? "enabled" : e.random.pick(names);
            const QVariant value = e.values.make(which->property(name).metaType(), name);
            e.note(u"set the %1's %2 = %3"_s.arg(which == e.form ? "form" : "control", name, shortly(value)));
            which->setProperty(name, value);
        } },
    { 12,
        [](Episode &e) {
            const QMetaObject *meta = e.object->metaObject();
            std::vector<QMetaProperty> writable;
            for (int i = 0; i < meta->propertyCount(); ++i)
                if (meta->property(i).isWritable() && declaredByTheLibrary(meta->property(i).enclosingMetaObject()))
                    writable.push_back(meta->property(i));
            if (writable.empty())
                return;
            const QMetaProperty property = e.random.pick(writable);
            const QVariant value = e.values.make(property.metaType(), property.name());
            e.note(u"set %1 = %2"_s.arg(QLatin1String(property.name()), shortly(value)));
            property.write(e.object, value);
        } },
    { 2,
        [](Episode &e) {
            e.note(u"read every property"_s);
            const QMetaObject *meta = e.object->metaObject();
            for (int i = 0; i < meta->propertyCount() && e.object; ++i)
                meta->property(i).read(e.object);
        } },
    { 10,
        [](Episode &e) {
            const std::vector<QMetaMethod> methods = membersOf(e.object, QMetaMethod::Method);
            if (!methods.empty())
                call(e.object, e.random.pick(methods), e.values);
        } },
    { 3,
        [](Episode &e) {
            const QPointer<UserControl> control = e.control();
            if (!control)
                return;
            e.note(u"Save, then Load what was saved"_s);
            const PropertyBag saved = control->Save();
            control->Load(saved);
            const PropertyBag again = control ? control->Save() : saved;
            for (const QString &name : saved.names() + again.names()) {
                const QVariant before = saved.ReadProperty(name), after = again.ReadProperty(name);
                // The number badge's empty caption is not written and reads back as "1", as
                // its saved forms always have.
                const bool documented
                    = e.className == "skNumber"_L1 && name == "Caption"_L1 && !before.isValid() && after == "1"_L1;
                if (before != after && !documented) {
                    e.faults << u"a Save/Load round trip changed %1 from %2 to %3"_s.arg(
                        name, shortly(before), shortly(after));
                    return;
                }
            }
        } },
    { 2,
        [](Episode &e) {
            if (!e.control())
                return;
            Ambient ambient = e.control()->ambient();
            const int which = e.random.below(3);
            if (which == 0)
                ambient.UserMode = !ambient.UserMode;
            else if (which == 1)
                ambient.UIDead = !ambient.UIDead;
            else
                ambient.BackColor = e.values.make(QMetaType::fromType<quint32>(), "BackColor").toUInt();
            e.note(u"the container changes its ambient properties (design mode %1, UI dead %2)"_s.arg(
                ambient.UserMode ? "off" : "on", ambient.UIDead ? "yes" : "no"));
            e.control()->setAmbient(ambient);
        } },
    { 4,
        [](Episode &e) {
            const int ms = e.random.below(60);
            e.note(u"let the event loop run %1 ms"_s.arg(ms));
            QTest::qWait(ms);
        } },
    { 1,
        [](Episode &e) {
            if (e.random.below(3) == 0) {
                e.lock();
            } else {
                // With no lock of its own, a careless host's unlock that the library must ignore.
                e.note(u"LockServer(false)%1"_s.arg(e.locks > 0 ? "" : ", holding no lock"));
                ClassFactory::LockServer(false);
                e.locks = std::max(e.locks - 1, 0);
            }
            if (DllCanUnloadNow() != S_FALSE)
                e.faults << u"DllCanUnloadNow lets the library unload under a live object"_s;
        } },
};

int Episode::run(int steps)
{
    static const int totalWeight = std::accumulate(
        stepKinds.begin(), stepKinds.end(), 0, [](int sum, const auto &kind) { return sum + kind.first; });
    const int liveBefore = LiveObject::count();
    const qsizetype windowsBefore = QApplication::topLevelWidgets().size();
    place();
    const int deleteAt = random.below(steps + 1);
    const int mode = random.below(5);
    int ran = 0;
    for (; ran < steps && form && object; ++ran) {
        if (ran == deleteAt)
            arm(mode);
        if (!object || !form)
            break;
        int roll = random.below(totalWeight);
        const auto kind = std::find_if(
            stepKinds.begin(), stepKinds.end(), [&](const auto &kind) { return (roll -= kind.first) < 0; });
        kind->second(*this);
    }
    if (object && !hook)
        destroy(u"between two steps"_s);
    else if (object) {
        note(u"the event never came: the host deletes the control"_s);
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

} // namespace

int runEpisode(const QString &className, quint64 seed, int steps, bool echo, QString &failure)
{
    journal.echo = echo;
    journal.begin(className, seed);
    Episode episode(className, seed);
    const int ran = episode.run(steps);
    failure = episode.faults.isEmpty() ? QString() : episode.faults.join(u"; ") + u'\n' + journal.replay();
    return ran;
}

} // namespace zelctl::stress

int main(int argc, char **argv)
{
    QTemporaryDir home;
    if (!home.isValid())
        return 1;
    for (const char *folder : { "config", "data", "cache" }) {
        const QByteArray variable = "XDG_" + QByteArray(folder).toUpper() + "_HOME";
        qputenv(variable.constData(), QFile::encodeName(home.filePath(folder)));
    }
    if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");
    if (qgetenv("QT_QPA_PLATFORM") == "xcb" && qEnvironmentVariableIsEmpty("DISPLAY")) {
        std::fprintf(
            stderr, "the stress host on xcb needs an X server: run it through scripts/test or scripts/stress\n");
        return 1;
    }
    zelctl::stress::Application app(argc, argv);
    zelctl::platform::SaveSetting("zEL", "Setup", "RootPath", ZELCTL_SOURCE_DIR "/");
    // Documents and addresses are not opened for real.
    zelctl::platform::setShellOpenHook([](const QString &) { return true; });
    zelctl::stress::watchForHangs(120000);
    ::testing::InitGoogleTest(&argc, argv);
    return RUN_ALL_TESTS();
}

#include "StressHost.h"

#include "support/TestSupport.h"

#include "frame/ClassRegistry.h"
#include "frame/EntryPoints.h"
#include "frame/Picture.h"
#include "frame/PropertyBag.h"
#include "frame/UserControl.h"
#include "platform/WindowHandles.h"
#include "platform/gdi/Gdi.h"
#include "selection/GFXTypes.h"

#include <QAbstractButton>
#include <QApplication>
#include <QClipboard>
#include <QCursor>
#include <QDeadlineTimer>
#include <QDialog>
#include <QDir>
#include <QFont>
#include <QLineEdit>
#include <QMenu>
#include <QMetaProperty>
#include <QMouseEvent>
#include <QSignalSpy>
#include <QTest>
#include <QVBoxLayout>
#include <QWheelEvent>
#include <QWindow>

#if defined(__SANITIZE_ADDRESS__)
#include <sanitizer/common_interface_defs.h>
#endif

#include <atomic>
#include <climits>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <mutex>
#include <thread>

namespace zelctl::stress {

namespace {

std::mutex journalMutex;
std::atomic<qint64> lastTick { 0 };

qint64 nowMs()
{
    using namespace std::chrono;
    return duration_cast<milliseconds>(steady_clock::now().time_since_epoch()).count();
}

void printJournal()
{
    // Best effort: the crash may have happened while the journal was being written.
    std::unique_lock lock(journalMutex, std::try_to_lock);
    const QByteArray text = Journal::current().replay().toLocal8Bit();
    std::fwrite(text.constData(), 1, size_t(text.size()), stderr);
    std::fflush(stderr);
}

QString shortly(const QVariant &value)
{
    QString text = value.metaType().id() == QMetaType::QByteArray
        ? QStringLiteral("%1 bytes").arg(value.toByteArray().size())
        : value.toString();
    if (text.isEmpty() && value.isValid() && !value.canConvert<QString>())
        text = QLatin1String(value.typeName());
    if (text.size() > 40)
        text = text.left(37) + QStringLiteral("... (%1 characters)").arg(text.size());
    return QLatin1Char('"') + text.replace(QLatin1Char('\n'), QLatin1String("\\n")) + QLatin1Char('"');
}

QString describe(const QWidget *widget)
{
    const QString name = widget->objectName();
    return QLatin1String(widget->metaObject()->className()) + (name.isEmpty() ? QString() : QLatin1Char(' ') + name);
}

QString keyText(Qt::Key key, Qt::KeyboardModifiers modifiers);

bool declaredByTheLibrary(const QMetaObject *meta)
{
    return QByteArray(meta->className()).startsWith("zelctl::");
}

} // namespace

// --- Journal ---------------------------------------------------------------------------

Journal &Journal::current()
{
    static Journal journal;
    return journal;
}

void Journal::begin(const QString &className, quint64 seed, const QString &platform)
{
    const std::lock_guard lock(journalMutex);
    m_class = className;
    m_seed = seed;
    m_platform = platform;
    m_steps.clear();
    lastTick = nowMs();
    // The last of these lines names the episode to replay when a sanitizer stops the
    // process without calling back (UBSan has a runtime of its own).
    std::fprintf(stderr, "[ episode  ] %s seed %llu on %s\n", qPrintable(className),
        static_cast<unsigned long long>(seed), qPrintable(platform));
}

void Journal::end()
{
    lastTick = 0;
}

void Journal::add(const QString &step)
{
    // A step that took long is named, so a long run shows where its time went.
    const qint64 took = nowMs() - lastTick;
    if (lastTick != 0 && took > 2000 && !m_steps.empty())
        std::fprintf(stderr, "[ slow     ] %s seed %llu: %lld ms in step %zu, %s\n", qPrintable(m_class),
            static_cast<unsigned long long>(m_seed), static_cast<long long>(took), m_steps.size(),
            m_steps.back().c_str());
    {
        const std::lock_guard lock(journalMutex);
        m_steps.push_back(step.toStdString());
    }
    if (m_echo)
        std::fprintf(stderr, "  %zu. %s\n", m_steps.size(), qPrintable(step));
    tick();
}

void Journal::tick()
{
    lastTick = nowMs();
}

QString Journal::replay() const
{
    QString text = QStringLiteral("stress host: %1, seed %2, on %3, after these steps:\n")
                       .arg(m_class)
                       .arg(m_seed)
                       .arg(m_platform);
    for (size_t i = 0; i < m_steps.size(); ++i)
        text += QStringLiteral("  %1. %2\n").arg(i + 1).arg(QString::fromStdString(m_steps[i]));
    text += QStringLiteral("replay: ZELCTL_STRESS_REPLAY=%1:%2 QT_QPA_PLATFORM=%3 tests/test_stress "
                           "--gtest_filter='EveryClass/RandomUse.*'\n")
                .arg(m_class)
                .arg(m_seed)
                .arg(m_platform);
    return text;
}

void Journal::installReporters(std::chrono::seconds hangAfter)
{
    static std::once_flag once;
    std::call_once(once, [hangAfter] {
#if defined(__SANITIZE_ADDRESS__)
        __sanitizer_set_death_callback(printJournal);
#endif
        std::thread([limit = qint64(hangAfter.count()) * 1000] {
            for (;;) {
                std::this_thread::sleep_for(std::chrono::seconds(1));
                const qint64 last = lastTick;
                if (last != 0 && nowMs() - last > limit) {
                    std::fprintf(stderr, "stress host: no progress for %lld s\n", limit / 1000);
                    printJournal();
                    std::abort();
                }
            }
        }).detach();
    });
}

// --- Signals ----------------------------------------------------------------------------

SignalHook::SignalHook(QObject *sender, const QMetaMethod &signal, std::function<void()> action)
    : m_action(std::move(action))
{
    const QMetaMethod slot = staticMetaObject.method(staticMetaObject.indexOfSlot("fire()"));
    connect(sender, signal, this, slot);
}

void SignalHook::fire()
{
    m_action();
}

std::vector<QMetaMethod> eventsOf(const QObject *object)
{
    std::vector<QMetaMethod> events;
    const QMetaObject *meta = object->metaObject();
    for (int i = 0; i < meta->methodCount(); ++i) {
        const QMetaMethod method = meta->method(i);
        // propertyChanged is the container's bookkeeping of a modified form, not an event of
        // the control that a host handles.
        if (method.methodType() == QMetaMethod::Signal && declaredByTheLibrary(method.enclosingMetaObject())
            && method.name() != "propertyChanged")
            events.push_back(method);
    }
    return events;
}

bool UnsafeEvents::isSafe(const QObject *receiver, const QEvent *event)
{
    switch (event->type()) {
    case QEvent::MouseButtonPress:
    case QEvent::MouseButtonDblClick:
        // Qt follows a right-button press with a context menu event to the same widget,
        // through a plain pointer.
        if (static_cast<const QMouseEvent *>(event)->button() == Qt::RightButton)
            return false;
        break;
    case QEvent::MouseButtonRelease:
    case QEvent::MouseMove:
    case QEvent::KeyPress:
    case QEvent::KeyRelease:
    case QEvent::Wheel:
    case QEvent::Timer:
    case QEvent::MetaCall:
    case QEvent::ContextMenu:
        break;
    default:
        return false;
    }
    if (declaredByTheLibrary(receiver->metaObject()))
        return true;
    // A Qt widget that is an inner part of a library control (the text boxes of the NIF and
    // NIB boxes): the control keeps it alive while its own input code raises the control's
    // events.
    for (const QWidget *part = static_cast<const QWidget *>(receiver); !part->isWindow();) {
        part = part->parentWidget();
        if (declaredByTheLibrary(part->metaObject()))
            return true;
    }
    return false;
}

// --- Watcher ----------------------------------------------------------------------------

Watcher::Watcher(Random &random)
    : m_random(random)
{
    m_timer.setInterval(10);
    connect(&m_timer, &QTimer::timeout, this, &Watcher::look);
    m_timer.start();
}

void Watcher::look()
{
    QWidget *open = QApplication::activePopupWidget();
    if (!open)
        open = QApplication::activeModalWidget();
    if (!open) {
        m_ticks = 0;
        return;
    }
    const QPointer<QWidget> guard(open);
    if (++m_ticks == 1 && m_onModal) {
        const std::function<void()> action = std::exchange(m_onModal, nullptr);
        action();
        if (!guard)
            return;
    }
    Journal &journal = Journal::current();
    if (m_ticks < 5 && m_random.chance(0.6)) {
        const QList<QAbstractButton *> buttons = open->findChildren<QAbstractButton *>();
        if (!buttons.isEmpty() && m_random.chance(0.5)) {
            QAbstractButton *button = buttons.at(m_random.below(int(buttons.size())));
            if (button->isVisible() && button->isEnabled()) {
                journal.add(QStringLiteral("watcher clicks %1 \"%2\" in %3")
                                .arg(describe(button), button->text(), describe(open)));
                // Queued: a form the click opens must not run inside this timer's own slot,
                // where the timer cannot fire again to close it.
                QMetaObject::invokeMethod(button, &QAbstractButton::click, Qt::QueuedConnection);
                return;
            }
        }
        static const std::vector<Qt::Key> keys
            = { Qt::Key_Down, Qt::Key_Up, Qt::Key_Tab, Qt::Key_Space, Qt::Key_Return, Qt::Key_Escape, Qt::Key_Right };
        const Qt::Key key = m_random.pick(keys);
        journal.add(QStringLiteral("watcher presses %1 in %2").arg(QKeySequence(key).toString(), describe(open)));
        QMetaObject::invokeMethod(
            open,
            [open, key] { QTest::sendKeyEvent(QTest::Click, open, key, keyText(key, Qt::NoModifier), Qt::NoModifier); },
            Qt::QueuedConnection);
        return;
    }
    journal.add(QStringLiteral("watcher closes %1").arg(describe(open)));
    if (auto *dialog = qobject_cast<QDialog *>(open))
        dialog->reject();
    else
        open->close();
}

// --- Values -----------------------------------------------------------------------------

Values::Values(Random &random)
    : m_random(random)
{
    // Real device contexts of each depth a painting member may be given, and stale ones.
    for (const auto &[bpp, topDown] : { std::pair { 32, true }, std::pair { 24, false }, std::pair { 8, true } }) {
        gdi::BITMAPINFO info;
        info.bmiHeader.biWidth = 40;
        info.bmiHeader.biHeight = topDown ? -30 : 30;
        info.bmiHeader.biBitCount = quint16(bpp);
        const gdi::HBITMAP bitmap = gdi::CreateDIBSection(0, &info, gdi::DIB_RGB_COLORS, nullptr);
        const gdi::HDC dc = gdi::CreateCompatibleDC(0);
        gdi::SelectObject(dc, bitmap);
        m_devices.push_back(dc);
        m_bitmaps.push_back(bitmap);
    }
    m_devices.push_back(0);
    m_devices.push_back(987654);
}

Values::~Values()
{
    for (gdi::HDC dc : m_devices)
        gdi::DeleteDC(dc);
    for (gdi::HBITMAP bitmap : m_bitmaps)
        gdi::DeleteObject(bitmap);
}

qint64 Values::integer()
{
    static const std::vector<qint64> boundaries = { 0, 1, -1, 2, 3, 4, 5, 9, 10, 15, 99, 100, 255, 256, 1000, 32767,
        -32768, 65535, 65536, 70000, INT_MAX, INT_MIN, qint64(UINT_MAX) };
    switch (m_random.below(3)) {
    case 0:
        return m_random.pick(boundaries);
    case 1:
        return m_random.below(2001) - 1000;
    default:
        return qint64(m_random.below(INT_MAX)) * (m_random.chance(0.5) ? 1 : -1);
    }
}

quint32 Values::color()
{
    static const std::vector<quint32> colors
        = { 0, 0xFFFFFF, 0x00FF00, 0x80000005, 0x80000018, 0x800000FF, 0xFFFFFFFF, 0x7FFFFFFF, 0x01000000 };
    return m_random.chance(0.7) ? m_random.pick(colors) : quint32(m_random.below(INT_MAX)) << 1;
}

QString Values::text()
{
    static const std::vector<QString> pieces = { QString(), QStringLiteral("PT"), QStringLiteral("pt"),
        QStringLiteral("EL"), QStringLiteral("ES"), QStringLiteral("XX"), QStringLiteral("123456789"),
        QStringLiteral("PT501964843"), QStringLiteral("501964843"), QStringLiteral("0"), QStringLiteral("-1"),
        QStringLiteral("A"), QStringLiteral("D2"), QStringLiteral("S1"), QStringLiteral("H3"),
        QStringLiteral("ABDSFCH"), QStringLiteral("Click"), QStringLiteral("nothing"), QStringLiteral("||"),
        QStringLiteral("a||b\\nc"), QStringLiteral("&Ficheiro"), QStringLiteral("çãõ€ 😀"), QStringLiteral("\t\r\n"),
        QStringLiteral("%1 %s %n"), QStringLiteral("0003 0000 0000 0000 0000 0"), QStringLiteral("   "),
        QStringLiteral("DE,FR;PT"), QStringLiteral("/opt/zel,2024") };
    switch (m_random.below(4)) {
    case 0:
        return QString(m_random.below(40) + 1, QChar(u'0' + m_random.below(10)));
    case 1: {
        QString digits;
        for (int n = m_random.below(25); n > 0; --n)
            digits += QChar(u'0' + m_random.below(10));
        return digits;
    }
    case 2:
        return m_random.chance(0.05) ? QString(20000, u'9') : m_random.pick(pieces) + m_random.pick(pieces);
    default:
        return m_random.pick(pieces);
    }
}

QString Values::file()
{
    static const std::vector<QString> files = [] {
        std::vector<QString> list = { test::sourcePath("data/gif/aguarde.gif"),
            test::sourcePath("data/skins/default/btn_go_normal.gif"), test::sourcePath("data/iso3166.txt"),
            test::sourcePath("data/images/flags_iso/16/pt.png"), test::testDataPath("png/seed000.png"),
            test::testDataPath("png/seed004.png"), QStringLiteral("/nonexistent/picture.png"), QString(),
            QStringLiteral("/"), QStringLiteral("/dev/null"), QStringLiteral("relative.gif"),
            QStringLiteral("http://127.0.0.1:9/x.gif"), QStringLiteral("file:///nonexistent.gif"),
            QStringLiteral("ftp://127.0.0.1/x.gif") };
        const QDir crashers(test::testDataPath("crashers"));
        for (const QString &name : crashers.entryList(QDir::Files, QDir::Name))
            list.push_back(crashers.filePath(name));
        return list;
    }();
    return m_random.pick(files);
}

QVariant Values::make(QMetaType type, const QByteArray &name)
{
    const QByteArray lower = name.toLower();
    const bool device = lower.contains("hdc") || name.endsWith("DC");
    const bool window = lower.contains("hwnd");
    const bool colour = lower.contains("color") || lower.contains("colour") || lower.contains("back")
        || lower.contains("fore") || lower.contains("ground");
    switch (type.id()) {
    case QMetaType::Bool:
        return m_random.chance(0.5);
    case QMetaType::Short:
    case QMetaType::UShort:
    case QMetaType::Int:
    case QMetaType::UInt:
    case QMetaType::Long:
    case QMetaType::ULong:
    case QMetaType::LongLong:
    case QMetaType::ULongLong:
    case QMetaType::UChar:
    case QMetaType::Char:
    case QMetaType::SChar: {
        qint64 value = integer();
        if (device && m_random.chance(0.8))
            value = m_random.pick(m_devices);
        else if (window && !m_windows.empty() && m_random.chance(0.8))
            value = m_random.pick(m_windows);
        else if (colour && m_random.chance(0.8))
            value = color();
        QVariant result(value);
        result.convert(type);
        return result.isValid() ? result : QVariant(type);
    }
    case QMetaType::Double:
    case QMetaType::Float: {
        static const std::vector<double> reals = { 0.0, -1.0, 0.5, 1.0, 2.2, 100.0, 1e308, -1e308, std::nan("") };
        QVariant result(m_random.pick(reals));
        result.convert(type);
        return result;
    }
    case QMetaType::QString:
        return lower.contains("file") || lower.contains("path") || lower.contains("image") || m_random.chance(0.05)
            ? file()
            : text();
    case QMetaType::QStringList:
        return QStringList { text(), text() };
    case QMetaType::QByteArray: {
        QFile source(file());
        if (m_random.chance(0.7) && source.open(QIODevice::ReadOnly))
            return source.read(1 << 20);
        QByteArray garbage(m_random.below(64), '\0');
        for (char &c : garbage)
            c = char(m_random.below(256));
        return garbage;
    }
    case QMetaType::QVariant:
        return m_random.chance(0.5) ? QVariant(text()) : QVariant(integer());
    case QMetaType::QColor:
        return QColor::fromRgba(color());
    case QMetaType::QFont:
        return QFont(QStringLiteral("Liberation Sans"), m_random.pick(std::vector<int> { 1, 6, 8, 11, 72, 400 }),
            m_random.chance(0.5) ? QFont::Bold : QFont::Normal);
    default:
        break;
    }
    if (type == QMetaType::fromType<QList<qint32>>()) {
        QList<qint32> list;
        for (int n = m_random.below(300); n > 0; --n)
            list.append(qint32(integer()));
        return QVariant::fromValue(list);
    }
    if (type == QMetaType::fromType<Picture>())
        return QVariant::fromValue(m_random.chance(0.2) ? Picture() : Picture::fromFile(file()));
    if (type == QMetaType::fromType<GFXSelection>()) {
        GFXSelection selection;
        selection.Title = text();
        selection.Subtitle = text();
        selection.DisableCancel = m_random.chance(0.3);
        if (!m_objects.empty() && m_random.chance(0.7))
            selection.ParentObj = m_random.pick(m_objects).data();
        selection.WindowPositionRelation = GFXPositioning(m_random.below(12) - 1);
        return QVariant::fromValue(selection);
    }
    if (type == QMetaType::fromType<QList<GFXItem>>()) {
        QList<GFXItem> items;
        for (int n = m_random.below(m_random.chance(0.1) ? 200 : 8); n > 0; --n) {
            GFXItem item;
            item.Title = text();
            item.Image = m_random.chance(0.5) ? QVariant(file()) : QVariant();
            item.Selected = m_random.chance(0.3);
            item.Disabled = m_random.chance(0.2);
            item.Default = m_random.chance(0.2);
            item.Value = text();
            items.append(item);
        }
        return QVariant::fromValue(items);
    }
    return QVariant(type);
}

// --- The episode ------------------------------------------------------------------------

namespace {

enum class Deletion { Direct, Release, Form, InEvent, InModal };

// Members a host reaches late-bound: those the library's classes declare.
std::vector<QMetaProperty> writableProperties(const QObject *object)
{
    std::vector<QMetaProperty> found;
    const QMetaObject *meta = object->metaObject();
    for (int i = 0; i < meta->propertyCount(); ++i) {
        const QMetaProperty property = meta->property(i);
        if (property.isWritable() && declaredByTheLibrary(property.enclosingMetaObject()))
            found.push_back(property);
    }
    return found;
}

std::vector<QMetaMethod> invokables(const QObject *object)
{
    std::vector<QMetaMethod> found;
    const QMetaObject *meta = object->metaObject();
    for (int i = 0; i < meta->methodCount(); ++i) {
        const QMetaMethod method = meta->method(i);
        if (method.access() == QMetaMethod::Public && method.methodType() != QMetaMethod::Signal
            && method.methodType() != QMetaMethod::Constructor && declaredByTheLibrary(method.enclosingMetaObject()))
            found.push_back(method);
    }
    return found;
}

// The text a key press carries, as a keyboard would give it; QTest's own table stops the
// process on keys it does not know.
QString keyText(Qt::Key key, Qt::KeyboardModifiers modifiers)
{
    if (modifiers & (Qt::ControlModifier | Qt::AltModifier))
        return {};
    if (key >= Qt::Key_0 && key <= Qt::Key_9)
        return QString(QChar(u'0' + (key - Qt::Key_0)));
    if (key >= Qt::Key_A && key <= Qt::Key_Z) {
        const QChar letter(u'a' + (key - Qt::Key_A));
        return QString(modifiers & Qt::ShiftModifier ? letter.toUpper() : letter);
    }
    switch (key) {
    case Qt::Key_Space:
        return QStringLiteral(" ");
    case Qt::Key_Return:
    case Qt::Key_Enter:
        return QStringLiteral("\r");
    case Qt::Key_Tab:
        return QStringLiteral("\t");
    case Qt::Key_Backspace:
        return QStringLiteral("\b");
    case Qt::Key_Escape:
        return QStringLiteral("\x1b");
    default:
        return {};
    }
}

void pressOn(QWindow *window, Qt::Key key, Qt::KeyboardModifiers modifiers)
{
    QTest::sendKeyEvent(QTest::Click, window, key, keyText(key, modifiers), modifiers);
}

void processFor(int milliseconds)
{
    QDeadlineTimer deadline(milliseconds);
    do {
        QCoreApplication::processEvents(QEventLoop::AllEvents, 5);
    } while (!deadline.hasExpired());
}

class Episode
{
public:
    Episode(const QString &className, quint64 seed)
        : m_random(seed)
        , m_watcherRandom(seed ^ 0x9E3779B97F4A7C15ull)
        , m_values(m_random)
        , m_watcher(m_watcherRandom)
        , m_className(className)
    { }

    EpisodeResult run(int steps);

private:
    void place();
    PropertyBag randomBag();
    void step();
    void destroy(const QString &how);
    void arm(Deletion mode);
    void check(EpisodeResult &result);

    // Steps.
    void pressKey();
    void typeText();
    void paste();
    void clickOnce();
    void clickTwice();
    void click(bool twice);
    void move();
    void wheel();
    void moveFocus();
    void toggleEnabled();
    void toggleVisible();
    void resize();
    void writeProperty();
    void readProperties();
    void invoke();
    void roundTrip();
    void changeAmbient();
    void wait();
    void lockServer();

    QWidget *target();
    QPoint pointIn(QWidget *widget);
    QWindow *window() const { return m_form ? m_form->windowHandle() : nullptr; }
    void note(const QString &step) { Journal::current().add(step); }

    Random m_random;
    Random m_watcherRandom;
    Values m_values;
    Watcher m_watcher;
    QString m_className;
    QPointer<QWidget> m_form;
    QPointer<QLineEdit> m_neighbour;
    QPointer<QObject> m_object;
    std::unique_ptr<SignalHook> m_hook;
    QStringList m_faults;
    bool m_victimIsForm = false;
    // Locks this host holds on the library, as a host that keeps a class factory does.
    int m_locks = 0;
};

void Episode::place()
{
    // The pointer and the clipboard are the machine's: each episode starts them afresh, so
    // that it follows from its seed alone.
    QCursor::setPos(0, 0);
    QGuiApplication::clipboard()->clear();
    m_form = new QWidget;
    m_form->setObjectName(QStringLiteral("form"));
    m_form->setWindowTitle(QStringLiteral("stress ") + m_className);
    m_form->resize(300 + m_random.below(400), 200 + m_random.below(300));
    m_neighbour = new QLineEdit(m_form);
    m_neighbour->setObjectName(QStringLiteral("neighbour"));
    // As a host does: the class factory through the entry point, locked while it is kept.
    const QUuid id = ClassRegistry::factoryFor(m_className)->info().classId;
    const GUID classId = { id.data1, id.data2, id.data3,
        { id.data4[0], id.data4[1], id.data4[2], id.data4[3], id.data4[4], id.data4[5], id.data4[6], id.data4[7] } };
    void *factory = nullptr;
    if (DllGetClassObject(&classId, &IID_IClassFactory, &factory) != S_OK || !factory) {
        m_faults << QStringLiteral("DllGetClassObject gave no factory");
        return;
    }
    if (m_random.chance(0.5)) {
        note(QStringLiteral("LockServer(true)"));
        ClassFactory::LockServer(true);
        ++m_locks;
    }
    m_object = static_cast<const ClassFactory *>(factory)->CreateInstance(m_form);
    auto *widget = qobject_cast<QWidget *>(m_object.data());
    const bool laidOut = m_random.chance(0.5);
    if (laidOut) {
        auto *layout = new QVBoxLayout(m_form);
        layout->addWidget(m_neighbour);
        if (widget)
            layout->addWidget(widget);
        layout->addStretch();
    } else {
        m_neighbour->setGeometry(0, 0, 120, 22);
        if (widget)
            widget->move(10, 40);
    }
    note(QStringLiteral("create %1 on a form, %2").arg(m_className, laidOut ? "in a vertical layout" : "placed"));
    m_values.addObject(m_form);
    m_values.addObject(m_object);
    m_values.addWindow(platform::handleOf(m_form));
    if (widget)
        m_values.addWindow(platform::handleOf(widget));

    if (auto *control = qobject_cast<UserControl *>(m_object.data())) {
        if (m_random.chance(0.1)) {
            Ambient ambient;
            ambient.UserMode = false;
            control->setAmbient(ambient);
            note(QStringLiteral("the container is a form designer"));
        }
        if (m_random.chance(0.5)) {
            note(QStringLiteral("InitNew"));
            control->InitNew();
        } else {
            const PropertyBag bag = randomBag();
            note(QStringLiteral("Load a bag of %1 properties").arg(bag.names().size()));
            control->Load(bag);
        }
    }
    if (!m_form)
        return;
    note(QStringLiteral("show the form"));
    m_form->show();
    if (!QTest::qWaitForWindowExposed(m_form, 2000))
        note(QStringLiteral("the form was not exposed in time"));
}

// The names a fresh control saves, with random values of any type.
PropertyBag Episode::randomBag()
{
    PropertyBag bag;
    std::unique_ptr<QObject> fresh(CreateObject(m_className));
    auto *control = qobject_cast<UserControl *>(fresh.get());
    if (!control)
        return bag;
    control->InitNew();
    const PropertyBag saved = control->Save();
    static const std::vector<QMetaType> types = { QMetaType::fromType<bool>(), QMetaType::fromType<qint32>(),
        QMetaType::fromType<QString>(), QMetaType::fromType<QByteArray>(), QMetaType::fromType<quint32>() };
    for (const QString &name : saved.names()) {
        if (m_random.chance(0.2))
            continue;
        const QVariant value = m_random.chance(0.5) ? saved.ReadProperty(name, QVariant())
                                                    : m_values.make(m_random.pick(types), name.toUtf8());
        bag.WriteProperty(name, value);
    }
    return bag;
}

void Episode::destroy(const QString &how)
{
    QPointer<QObject> victim = m_victimIsForm ? QPointer<QObject>(m_form.data()) : m_object;
    if (!victim)
        return;
    if (!m_victimIsForm && m_random.chance(0.3)) {
        if (auto *control = qobject_cast<UserControl *>(victim.data())) {
            note(QStringLiteral("the container releases the control (%1)").arg(how));
            control->Release();
            return;
        }
    }
    // Inside an event after which Qt itself goes on with the widget, deletion can only wait
    // for the event loop.
    const bool later = UnsafeEvents::inside();
    note(QStringLiteral("the host deletes the %1 %2%3")
             .arg(m_victimIsForm ? "form" : "control", how, later ? " (later: Qt goes on with the widget)" : ""));
    if (later)
        victim->deleteLater();
    else
        delete victim.data();
}

void Episode::arm(Deletion mode)
{
    switch (mode) {
    case Deletion::Direct:
    case Deletion::Release:
        destroy(QStringLiteral("between two steps"));
        return;
    case Deletion::Form:
        m_victimIsForm = true;
        destroy(QStringLiteral("between two steps"));
        return;
    case Deletion::InEvent: {
        const std::vector<QMetaMethod> events = eventsOf(m_object);
        if (events.empty()) {
            destroy(QStringLiteral("between two steps"));
            return;
        }
        const QMetaMethod event = m_random.pick(events);
        m_victimIsForm = m_random.chance(0.3);
        note(QStringLiteral("from now on the host deletes the %1 in %2")
                 .arg(m_victimIsForm ? "form" : "control", QLatin1String(event.name())));
        m_hook = std::make_unique<SignalHook>(m_object, event,
            [this, name = QString::fromLatin1(event.name())] { destroy(QStringLiteral("inside ") + name); });
        return;
    }
    case Deletion::InModal:
        m_victimIsForm = m_random.chance(0.3);
        note(QStringLiteral("from now on the host deletes the %1 while a menu or modal form is open")
                 .arg(m_victimIsForm ? "form" : "control"));
        m_watcher.setOnModal([this] { destroy(QStringLiteral("while a menu or modal form is open")); });
        return;
    }
}

EpisodeResult Episode::run(int steps)
{
    EpisodeResult result;
    const int liveBefore = LiveObject::count();
    const qsizetype windowsBefore = QApplication::topLevelWidgets().size();
    place();
    const int deleteAt = m_random.below(steps + 1);
    const Deletion mode = Deletion(m_random.below(5));
    for (int i = 0; i < steps && m_form && m_object; ++i) {
        if (i == deleteAt)
            arm(mode);
        if (!m_object || !m_form)
            break;
        step();
        ++result.stepsRun;
    }
    if (m_object && !m_hook)
        arm(Deletion::Direct);
    else if (m_object) {
        note(QStringLiteral("the event never came: the host deletes the control"));
        delete m_object.data();
    }
    check(result);
    result.faults = m_faults;
    m_hook.reset();
    delete m_form.data();
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    for (; m_locks > 0; --m_locks)
        ClassFactory::LockServer(false);
    if (liveBefore == 0 && LiveObject::count() == 0 && DllCanUnloadNow() != S_OK)
        result.faults << QStringLiteral("DllCanUnloadNow keeps the library loaded with nothing alive and no lock");
    if (QApplication::topLevelWidgets().size() > windowsBefore)
        result.faults << QStringLiteral("%1 windows outlive their form")
                             .arg(QApplication::topLevelWidgets().size() - windowsBefore);
    if (LiveObject::count() != liveBefore)
        result.faults << QStringLiteral("%1 public objects outlive their form").arg(LiveObject::count() - liveBefore);
    return result;
}

void Episode::check(EpisodeResult &result)
{
    note(QStringLiteral("the host checks its form"));
    // Long enough for the timers the object may have left behind (a tip's first delay is
    // half a second) to come due: none of them may reach it.
    processFor(m_random.chance(0.1) ? 600 : 30);
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    result.objectGone = m_object.isNull();
    if (!result.objectGone)
        m_faults << QStringLiteral("the control outlived its deletion");
    if (!m_form) {
        result.formSurvived = m_victimIsForm;
        if (!m_victimIsForm)
            m_faults << QStringLiteral("the form was deleted with the control");
        return;
    }
    m_form->setEnabled(true);
    m_form->show();
    m_neighbour->setFocus();
    m_neighbour->clear();
    QTest::keyClicks(m_neighbour, QStringLiteral("ok"));
    result.neighbourWorks = m_neighbour->text() == QLatin1String("ok");
    if (!result.neighbourWorks)
        m_faults << QStringLiteral("the neighbouring text box no longer takes typing: \"%1\"").arg(m_neighbour->text());
    m_form->grab();
}

void Episode::step()
{
    // Weighted: input first, then the host's late-bound calls, then the rest.
    static const std::vector<std::pair<int, void (Episode::*)()>> kinds = {
        { 14, &Episode::pressKey },
        { 7, &Episode::typeText },
        { 3, &Episode::paste },
        { 12, &Episode::clickOnce },
        { 5, &Episode::clickTwice },
        { 8, &Episode::move },
        { 3, &Episode::wheel },
        { 6, &Episode::moveFocus },
        { 3, &Episode::toggleEnabled },
        { 2, &Episode::toggleVisible },
        { 4, &Episode::resize },
        { 12, &Episode::writeProperty },
        { 2, &Episode::readProperties },
        { 10, &Episode::invoke },
        { 3, &Episode::roundTrip },
        { 2, &Episode::changeAmbient },
        { 4, &Episode::wait },
        { 1, &Episode::lockServer },
    };
    static const int total = [] {
        int sum = 0;
        for (const auto &kind : kinds)
            sum += kind.first;
        return sum;
    }();
    int roll = m_random.below(total);
    for (const auto &[weight, run] : kinds) {
        if (roll < weight) {
            (this->*run)();
            return;
        }
        roll -= weight;
    }
}

QWidget *Episode::target()
{
    auto *widget = qobject_cast<QWidget *>(m_object.data());
    if (!widget || m_random.chance(0.1))
        return m_form;
    QList<QWidget *> parts = widget->findChildren<QWidget *>();
    parts.removeIf([](QWidget *part) { return !part->isVisible() || part->isWindow(); });
    if (parts.isEmpty() || m_random.chance(0.4))
        return widget;
    return parts.at(m_random.below(int(parts.size())));
}

QPoint Episode::pointIn(QWidget *widget)
{
    const int w = std::max(widget->width(), 1), h = std::max(widget->height(), 1);
    QPoint point(m_random.below(w), m_random.below(h));
    if (m_random.chance(0.1))
        point += QPoint(m_random.below(21) - 10, m_random.below(21) - 10);
    return widget->mapTo(widget->window(), point);
}

void Episode::pressKey()
{
    static const std::vector<Qt::Key> keys = { Qt::Key_0, Qt::Key_1, Qt::Key_5, Qt::Key_9, Qt::Key_A, Qt::Key_E,
        Qt::Key_L, Qt::Key_P, Qt::Key_T, Qt::Key_Z, Qt::Key_Tab, Qt::Key_Backtab, Qt::Key_Backspace, Qt::Key_Delete,
        Qt::Key_Left, Qt::Key_Right, Qt::Key_Home, Qt::Key_End, Qt::Key_Up, Qt::Key_Down, Qt::Key_Return, Qt::Key_Enter,
        Qt::Key_Escape, Qt::Key_Space, Qt::Key_F1, Qt::Key_F4, Qt::Key_Insert, Qt::Key_Menu };
    static const std::vector<Qt::KeyboardModifiers> modifiers
        = { Qt::NoModifier, Qt::NoModifier, Qt::NoModifier, Qt::ShiftModifier, Qt::ControlModifier, Qt::AltModifier };
    if (!window())
        return;
    const Qt::Key key = m_random.pick(keys);
    const Qt::KeyboardModifiers modifier = m_random.pick(modifiers);
    note(QStringLiteral("press %1").arg(QKeySequence(key | modifier).toString()));
    pressOn(window(), key, modifier);
}

void Episode::typeText()
{
    QWidget *focus = QApplication::focusWidget();
    const QString text = m_values.text().left(60);
    if (!focus || focus->window() != m_form)
        return;
    note(QStringLiteral("type %1 into %2").arg(shortly(text), describe(focus)));
    const QPointer<QWidget> into(focus);
    for (const QChar c : text) {
        if (!into)
            return;
        const char32_t upper = c.toUpper().unicode();
        const bool plain = (upper >= u'0' && upper <= u'9') || (upper >= u'A' && upper <= u'Z') || upper == u' ';
        QTest::sendKeyEvent(QTest::Click, into, plain ? Qt::Key(upper) : Qt::Key_unknown, QString(c), Qt::NoModifier);
    }
}

void Episode::paste()
{
    const QString text = m_values.text();
    QGuiApplication::clipboard()->setText(text);
    const bool shiftInsert = m_random.chance(0.5);
    note(QStringLiteral("paste %1 with %2").arg(shortly(text), shiftInsert ? "Shift+Insert" : "Ctrl+V"));
    if (window())
        QTest::keyClick(
            window(), shiftInsert ? Qt::Key_Insert : Qt::Key_V, shiftInsert ? Qt::ShiftModifier : Qt::ControlModifier);
}

void Episode::clickOnce()
{
    click(false);
}

void Episode::clickTwice()
{
    click(true);
}

void Episode::click(bool twice)
{
    QWidget *on = target();
    if (!on || !window())
        return;
    const int roll = m_random.below(20);
    const Qt::MouseButton button = roll < 15 ? Qt::LeftButton : roll < 19 ? Qt::RightButton : Qt::MiddleButton;
    const QPoint at = pointIn(on);
    note(QStringLiteral("%1 %2 on %3 at %4,%5")
             .arg(twice ? "double-click" : "click",
                 button == Qt::LeftButton        ? "left"
                     : button == Qt::RightButton ? "right"
                                                 : "middle",
                 describe(on))
             .arg(at.x())
             .arg(at.y()));
    // One double click is one Click (or Clicked) of a control that draws itself.
    std::unique_ptr<QSignalSpy> clicks;
    if (twice && on == m_object && button == Qt::LeftButton && !on->childAt(on->mapFrom(on->window(), at))) {
        const QMetaObject *meta = m_object->metaObject();
        int index = meta->indexOfSignal("Click()");
        if (index < 0)
            index = meta->indexOfSignal("Clicked()");
        if (index >= 0)
            clicks = std::make_unique<QSignalSpy>(m_object.data(), meta->method(index));
    }
    const QPointer<QWindow> into = window();
    if (twice)
        QTest::mouseDClick(into, button, {}, at);
    else
        QTest::mouseClick(into, button, {}, at);
    if (clicks && m_object && clicks->count() > 1)
        m_faults << QStringLiteral("a double click raised %1 Click events").arg(clicks->count());
}

void Episode::move()
{
    QWidget *on = target();
    if (!on || !window())
        return;
    const QPoint at = m_random.chance(0.2) ? QPoint(m_form->width() + 20, m_form->height() + 20) : pointIn(on);
    if (m_random.chance(0.5)) {
        note(QStringLiteral("move the pointer to %1,%2 of the form").arg(at.x()).arg(at.y()));
        QTest::mouseMove(window(), at);
    } else {
        // The real pointer: on an X server this goes through grabs and crossing events.
        note(QStringLiteral("warp the pointer to %1,%2 of the form").arg(at.x()).arg(at.y()));
        QCursor::setPos(m_form->mapToGlobal(at));
        QCoreApplication::processEvents();
    }
}

void Episode::wheel()
{
    QPointer<QWidget> on = target();
    if (!on)
        return;
    const QPoint at = on->mapFrom(on->window(), pointIn(on));
    const int delta = m_random.chance(0.5) ? 120 : -120;
    note(QStringLiteral("turn the wheel %1 over %2").arg(delta).arg(describe(on)));
    QWheelEvent event(
        at, on->mapToGlobal(at), QPoint(), QPoint(0, delta), Qt::NoButton, Qt::NoModifier, Qt::NoScrollPhase, false);
    QApplication::sendEvent(on, &event);
}

void Episode::moveFocus()
{
    QWidget *on = target();
    switch (m_random.below(4)) {
    case 0:
        note(QStringLiteral("focus the neighbouring text box"));
        m_neighbour->setFocus(Qt::TabFocusReason);
        break;
    case 1:
        if (!on)
            return;
        note(QStringLiteral("setFocus() on %1").arg(describe(on)));
        on->setFocus(Qt::OtherFocusReason);
        break;
    case 2:
        note(QStringLiteral("activate the form"));
        m_form->activateWindow();
        QCoreApplication::processEvents();
        break;
    default:
        note(QStringLiteral("clear the focus"));
        if (QWidget *focus = QApplication::focusWidget())
            focus->clearFocus();
        break;
    }
}

void Episode::toggleEnabled()
{
    auto *widget = qobject_cast<QWidget *>(m_object.data());
    QWidget *which = widget && m_random.chance(0.6) ? widget : m_form.data();
    const bool enable = !which->isEnabled();
    note(QStringLiteral("%1 the %2").arg(enable ? "enable" : "disable", which == m_form ? "form" : "control"));
    which->setEnabled(enable);
}

void Episode::toggleVisible()
{
    auto *widget = qobject_cast<QWidget *>(m_object.data());
    if (!widget)
        return;
    const bool show = widget->isHidden();
    note(QStringLiteral("%1 the control").arg(show ? "show" : "hide"));
    widget->setVisible(show);
}

void Episode::resize()
{
    static const std::vector<QSize> sizes = { QSize(0, 0), QSize(1, 1), QSize(2, 3), QSize(17, 9), QSize(300, 40),
        QSize(40, 300), QSize(3000, 2000), QSize(70000, 4), QSize(4, 70000) };
    auto *widget = qobject_cast<QWidget *>(m_object.data());
    if (!widget)
        return;
    const QSize size = m_random.chance(0.5) ? m_random.pick(sizes) : QSize(m_random.below(600), m_random.below(400));
    note(QStringLiteral("resize the control to %1 x %2").arg(size.width()).arg(size.height()));
    widget->resize(size);
}

void Episode::writeProperty()
{
    const std::vector<QMetaProperty> properties = writableProperties(m_object);
    if (properties.empty())
        return;
    const QMetaProperty property = m_random.pick(properties);
    const QVariant value = m_values.make(property.metaType(), property.name());
    note(QStringLiteral("set %1 = %2").arg(QLatin1String(property.name()), shortly(value)));
    property.write(m_object, value);
}

void Episode::readProperties()
{
    note(QStringLiteral("read every property"));
    const QMetaObject *meta = m_object->metaObject();
    for (int i = 0; i < meta->propertyCount() && m_object; ++i)
        meta->property(i).read(m_object);
}

void Episode::invoke()
{
    const std::vector<QMetaMethod> methods = invokables(m_object);
    if (!methods.empty())
        call(m_object, m_random.pick(methods), m_values);
}

void Episode::roundTrip()
{
    auto *control = qobject_cast<UserControl *>(m_object.data());
    if (!control)
        return;
    note(QStringLiteral("Save, then Load what was saved"));
    const PropertyBag saved = control->Save();
    const QPointer<UserControl> alive(control);
    control->Load(saved);
    if (!alive)
        return;
    const PropertyBag again = alive->Save();
    for (const QString &name : saved.names() + again.names()) {
        const QVariant before = saved.ReadProperty(name), after = again.ReadProperty(name);
        // The number badge's empty caption is not written and reads back as "1", as its
        // saved forms always have.
        const bool documented = m_className == QLatin1String("skNumber") && name == QLatin1String("Caption")
            && !before.isValid() && after == QLatin1String("1");
        if (before != after && !documented) {
            m_faults << QStringLiteral("a Save/Load round trip changed %1 from %2 to %3")
                            .arg(name, shortly(before), shortly(after));
            return;
        }
    }
}

void Episode::changeAmbient()
{
    auto *control = qobject_cast<UserControl *>(m_object.data());
    if (!control)
        return;
    Ambient ambient = control->ambient();
    switch (m_random.below(3)) {
    case 0:
        ambient.UserMode = !ambient.UserMode;
        break;
    case 1:
        ambient.UIDead = !ambient.UIDead;
        break;
    default:
        ambient.BackColor = m_values.make(QMetaType::fromType<quint32>(), "BackColor").toUInt();
        break;
    }
    note(QStringLiteral("the container changes its ambient properties (design mode %1, UI dead %2)")
             .arg(ambient.UserMode ? "off" : "on", ambient.UIDead ? "yes" : "no"));
    control->setAmbient(ambient);
}

void Episode::wait()
{
    const int ms = m_random.below(60);
    note(QStringLiteral("let the event loop run %1 ms").arg(ms));
    processFor(ms);
}

void Episode::lockServer()
{
    const int roll = m_random.below(3);
    if (roll == 0) {
        note(QStringLiteral("LockServer(true)"));
        ClassFactory::LockServer(true);
        ++m_locks;
    } else {
        // With no lock of its own, a careless host's unlock that the library must ignore.
        note(QStringLiteral("LockServer(false)%1").arg(m_locks > 0 ? "" : ", holding no lock"));
        ClassFactory::LockServer(false);
        m_locks = std::max(m_locks - 1, 0);
    }
    if (DllCanUnloadNow() != S_FALSE)
        m_faults << QStringLiteral("DllCanUnloadNow lets the library unload under a live object");
}

} // namespace

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
    Journal::current().add(
        QStringLiteral("call %1(%2)").arg(QLatin1String(method.name()), shown.join(QStringLiteral(", "))));
    QVariant answer(method.returnMetaType());
    const QGenericReturnArgument returned = method.returnMetaType().id() == QMetaType::Void
        ? QGenericReturnArgument()
        : QGenericReturnArgument(method.returnMetaType().name(), answer.data());
    method.invoke(object, Qt::DirectConnection, returned, generic[0], generic[1], generic[2], generic[3], generic[4],
        generic[5], generic[6], generic[7], generic[8], generic[9]);
}

EpisodeResult runEpisode(const QString &className, quint64 seed, int steps)
{
    Journal::current().begin(className, seed, QGuiApplication::platformName());
    Episode episode(className, seed);
    EpisodeResult result = episode.run(steps);
    Journal::current().end();
    return result;
}

std::vector<std::string> servedClasses()
{
    std::vector<std::string> names;
    for (const ClassInfo &info : ClassRegistry::classes())
        if (ClassRegistry::factoryFor(info.classId))
            names.emplace_back(info.name);
    return names;
}

} // namespace zelctl::stress

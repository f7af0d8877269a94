// For every class and each of its events, a host that deletes the object in that event
// (or while a menu or modal form of the object is open) along one fixed use of it: the
// form and its other controls live on, and nothing of the object runs afterwards.

#include "StressHost.h"

#include "frame/ClassRegistry.h"
#include "frame/UserControl.h"

#include <QApplication>
#include <QDeadlineTimer>
#include <QLineEdit>
#include <QMetaProperty>
#include <QTest>
#include <QWindow>

#include <gtest/gtest.h>

using namespace zelctl;
using namespace zelctl::stress;

namespace {

void runFor(int milliseconds)
{
    QDeadlineTimer deadline(milliseconds);
    do {
        QCoreApplication::processEvents(QEventLoop::AllEvents, 5);
    } while (!deadline.hasExpired());
}

// A form holding the object beside a text box, and one use of the object that reaches
// its events: pointer, keys, layout, then every member with fixed values.
class Host
{
public:
    explicit Host(const QString &className)
    {
        form.resize(400, 300);
        neighbour = new QLineEdit(&form);
        neighbour->setGeometry(0, 0, 100, 22);
        object = CreateObject(className, &form);
        if (auto *control = qobject_cast<UserControl *>(object.data()))
            control->InitNew();
        if (auto *widget = qobject_cast<QWidget *>(object.data()))
            widget->setGeometry(20, 40, 200, 60);
        form.show();
        EXPECT_TRUE(QTest::qWaitForWindowExposed(&form));
    }

    void use()
    {
        QWindow *window = form.windowHandle();
        const QPoint centre(120, 70);
        for (const auto &step : std::vector<std::function<void()>> {
                 [&] { QTest::mouseMove(window, centre); },
                 [&] { QTest::mouseClick(window, Qt::LeftButton, {}, centre); },
                 [&] { QTest::mouseDClick(window, Qt::LeftButton, {}, centre); },
                 [&] { QTest::mouseClick(window, Qt::RightButton, {}, centre); },
                 [&] { QTest::mouseMove(window, QPoint(390, 290)); },
                 [&] {
                     if (auto *widget = qobject_cast<QWidget *>(object.data()))
                         widget->setFocus();
                 },
                 [&] {
                     if (QWidget *focus = QApplication::focusWidget())
                         QTest::keyClicks(focus, QStringLiteral("PT501964843"));
                 },
                 [&] { QTest::keyClick(window, Qt::Key_Tab); },
                 [&] { QTest::keyClick(window, Qt::Key_Escape); },
                 [&] {
                     if (auto *widget = qobject_cast<QWidget *>(object.data()))
                         widget->resize(90, 30);
                 },
                 [&] { form.setEnabled(false); },
                 [&] { form.setEnabled(true); },
                 [&] { callEveryMember(); },
                 [&] { runFor(100); },
             }) {
            if (!object)
                return;
            step();
            QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
        }
    }

    bool neighbourWorks()
    {
        neighbour->setFocus();
        neighbour->clear();
        QTest::keyClicks(neighbour, QStringLiteral("ok"));
        return neighbour->text() == QLatin1String("ok");
    }

    QWidget form;
    QPointer<QLineEdit> neighbour;
    QPointer<QObject> object;

private:
    void callEveryMember()
    {
        Random random(1);
        Values values(random);
        values.addObject(&form);
        const QMetaObject *meta = object->metaObject();
        for (int i = 0; i < meta->methodCount() && object; ++i) {
            const QMetaMethod method = meta->method(i);
            if (method.methodType() != QMetaMethod::Method || method.access() != QMetaMethod::Public
                || !QByteArray(method.enclosingMetaObject()->className()).startsWith("zelctl::"))
                continue;
            call(object, method, values);
            runFor(5);
        }
    }
};

class Lifetime : public ::testing::TestWithParam<std::string>
{ };

} // namespace

TEST_P(Lifetime, theHostMayDeleteTheObjectInAnyOfItsEvents)
{
    const QString name = QString::fromStdString(GetParam());
    std::vector<QMetaMethod> events;
    {
        const std::unique_ptr<QObject> probe(CreateObject(name));
        events = eventsOf(probe.get());
    }
    Random random(7);
    Watcher watcher(random);
    for (const QMetaMethod &event : events) {
        Journal::current().begin(name, 0, QGuiApplication::platformName());
        Host host(name);
        bool raised = false;
        const SignalHook hook(host.object, event, [&] {
            raised = true;
            if (UnsafeEvents::inside())
                host.object->deleteLater();
            else
                delete host.object.data();
        });
        host.use();
        QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
        EXPECT_EQ(host.object.isNull(), raised) << event.name().constData();
        EXPECT_TRUE(host.neighbourWorks()) << event.name().constData();
        Journal::current().end();
    }
}

TEST_P(Lifetime, theHostMayDeleteTheObjectWhileItsMenuOrFormIsOpen)
{
    const QString name = QString::fromStdString(GetParam());
    Random random(7);
    Watcher watcher(random);
    Host host(name);
    watcher.setOnModal([&] { delete host.object.data(); });
    host.use();
    EXPECT_TRUE(host.neighbourWorks());
}

INSTANTIATE_TEST_SUITE_P(EveryClass, Lifetime, ::testing::ValuesIn(servedClasses()),
    [](const ::testing::TestParamInfo<std::string> &info) { return info.param; });

// For every class and each of its events, a host that deletes the object in that event
// (or while a menu or modal form of the object is open) along one fixed use of it: the
// form and its other controls live on, and nothing of the object runs afterwards.

#include "StressHost.h"

#include "frame/ClassRegistry.h"

#include <gtest/gtest.h>

using namespace zelctl;
using namespace zelctl::stress;

using Lifetime = ::testing::TestWithParam<std::string>;

TEST_P(Lifetime, theHostMayDeleteTheObjectInAnyOfItsEvents)
{
    const QString name = QString::fromStdString(GetParam());
    for (const QMetaMethod &event :
        membersOf(std::unique_ptr<QObject>(CreateObject(name)).get(), QMetaMethod::Signal)) {
        SCOPED_TRACE(event.name().constData());
        HostForm host(name, QSize(400, 300));
        bool raised = false;
        const SignalHook hook(host.object, event, [&] {
            raised = true;
            if (insideUnsafeEvent())
                host.object->deleteLater();
            else
                delete host.object.data();
        });
        host.use(true);
        QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
        EXPECT_EQ(host.object.isNull(), raised);
        EXPECT_TRUE(host.neighbourWorks());
    }
}

TEST_P(Lifetime, theHostMayDeleteTheObjectWhileItsMenuOrFormIsOpen)
{
    HostForm host(QString::fromStdString(GetParam()), QSize(400, 300));
    host.onModal([&] { delete host.object.data(); });
    host.use(true);
    EXPECT_TRUE(host.neighbourWorks());
}

INSTANTIATE_TEST_SUITE_P(EveryClass, Lifetime, ::testing::ValuesIn(servedClasses()),
    [](const ::testing::TestParamInfo<std::string> &info) { return info.param; });

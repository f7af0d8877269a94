// For every control the library serves: inside a disabled form it looks as when disabled
// itself, answers no input with an event, a menu or a form, and keeps its own setting.

#include "StressHost.h"

#include "frame/UserControl.h"

#include <QTest>

#include <gtest/gtest.h>

using namespace zelctl;
using namespace zelctl::stress;

using DisabledParent = ::testing::TestWithParam<std::string>;

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
    host.use(false);
    QTest::qWait(20);
    ASSERT_TRUE(control);
    EXPECT_TRUE(raised.isEmpty()) << "events answered input in a disabled form: " << raised.join(u", ").toStdString();
    EXPECT_EQ(opened, 0) << "a menu or form opened in a disabled form";
    EXPECT_EQ(control->Save(), saved) << "the form's state leaked into the control's own setting";
    const QVariant own = control->property("Enabled");
    EXPECT_TRUE(!own.isValid() || own.toBool());
}

INSTANTIATE_TEST_SUITE_P(EveryControl, DisabledParent, ::testing::ValuesIn(servedClasses(true)),
    [](const ::testing::TestParamInfo<std::string> &info) { return info.param; });

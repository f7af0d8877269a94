// For every control the library serves: inside a disabled form it looks as when disabled
// itself, answers no input with an event, a menu or a form, and keeps its own setting.

#include "StressHost.h"

#include "frame/ClassRegistry.h"
#include "frame/UserControl.h"

#include <QApplication>
#include <QLineEdit>
#include <QTest>
#include <QWheelEvent>
#include <QWindow>

#include <gtest/gtest.h>

using namespace zelctl;
using namespace zelctl::stress;

namespace {

std::vector<std::string> servedControls()
{
    std::vector<std::string> names;
    for (const ClassInfo &info : ClassRegistry::classes()) {
        if (!ClassRegistry::factoryFor(info.classId))
            continue;
        const std::unique_ptr<QObject> probe(CreateObject(info.name));
        if (probe->isWidgetType())
            names.emplace_back(info.name);
    }
    return names;
}

class DisabledParent : public ::testing::TestWithParam<std::string>
{
protected:
    void SetUp() override
    {
        form.resize(300, 200);
        auto *neighbour = new QLineEdit(&form);
        neighbour->setGeometry(0, 0, 100, 22);
        control = qobject_cast<UserControl *>(CreateObject(QString::fromStdString(GetParam()), &form));
        ASSERT_NE(control, nullptr);
        control->InitNew();
        control->setGeometry(20, 40, 200, 60);
        form.show();
        ASSERT_TRUE(QTest::qWaitForWindowExposed(&form));
        for (const QMetaMethod &event : eventsOf(control))
            hooks.push_back(std::make_unique<SignalHook>(
                control, event, [this, name = QString::fromLatin1(event.name())] { raised << name; }));
    }

    // What a user can do to the control with pointer, wheel and keyboard.
    void useIt()
    {
        QWindow *window = form.windowHandle();
        const QPoint centre = control->geometry().center();
        QTest::mouseMove(window, centre);
        QTest::mouseClick(window, Qt::LeftButton, {}, centre);
        QTest::mouseDClick(window, Qt::LeftButton, {}, centre);
        QTest::mouseClick(window, Qt::RightButton, {}, centre);
        QWheelEvent wheel(QPointF(centre), QPointF(window->mapToGlobal(centre)), {}, { 0, 120 }, Qt::NoButton, {},
            Qt::NoScrollPhase, false);
        QApplication::sendEvent(window, &wheel);
        control->setFocus();
        for (const Qt::Key key : { Qt::Key_Space, Qt::Key_Return, Qt::Key_1, Qt::Key_Down, Qt::Key_Menu })
            QTest::keyClick(window, key);
        QTest::mouseMove(window, QPoint(290, 190));
        QTest::qWait(20);
    }

    QImage picture() { return control->grab().toImage().convertToFormat(QImage::Format_RGB32); }

    QWidget form;
    UserControl *control = nullptr;
    std::vector<std::unique_ptr<SignalHook>> hooks;
    QStringList raised;
};

} // namespace

TEST_P(DisabledParent, looksAndActsDisabledAndKeepsItsOwnSetting)
{
    const PropertyBag saved = control->Save();
    // Through the control's own Enabled where it has one, as a host sets it.
    const auto enableItself = [&](bool enabled) {
        if (!control->setProperty("Enabled", enabled))
            control->QWidget::setEnabled(enabled);
    };
    enableItself(false);
    const QImage disabledItself = picture();
    enableItself(true);

    Random random(3);
    Watcher watcher(random);
    int opened = 0;
    watcher.setOnModal([&] { ++opened; });
    form.setEnabled(false);
    EXPECT_EQ(picture(), disabledItself);
    raised.clear();
    useIt();
    EXPECT_EQ(raised, QStringList()) << "events answered input in a disabled form";
    EXPECT_EQ(opened, 0) << "a menu or form opened in a disabled form";
    EXPECT_EQ(control->Save(), saved) << "the form's state leaked into the control's own setting";
    const QVariant own = control->property("Enabled");
    EXPECT_TRUE(!own.isValid() || own.toBool());
}

INSTANTIATE_TEST_SUITE_P(EveryControl, DisabledParent, ::testing::ValuesIn(servedControls()),
    [](const ::testing::TestParamInfo<std::string> &info) { return info.param; });

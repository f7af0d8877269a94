// Tips shown by resting the pointer on their tool (their pictures are in the golden pictures).

#include "tips/TooltipWindow.h"
#include "platform/WindowHandles.h"
#include "tips/clsBalloonTip.h"

#include <QTest>
#include <QWidget>

#include <gtest/gtest.h>

using namespace zelctl;

namespace {

// A shown form with a tool widget in it, the pointer away from it, and a tip on the tool.
struct HoverTip : ::testing::Test
{
    QWidget form;
    QWidget *tool = new QWidget(&form);
    clsBalloonTip tip;

    HoverTip()
    {
        form.resize(300, 200);
        tool->setGeometry(20, 20, 100, 40);
        tool->setMouseTracking(true);
        form.show();
        EXPECT_TRUE(QTest::qWaitForWindowExposed(&form));
        leave();
        tip.setParentControl(tool);
        tip.setTipText("Texto da dica");
    }

    TooltipWindow *window() const { return qobject_cast<TooltipWindow *>(platform::widgetOf(tip.lHwnd())); }
    bool becomes(bool visible) const
    {
        return QTest::qWaitFor([&] { return window()->isVisible() == visible; });
    }
    void leave() { QTest::mouseMove(&form, QPoint(250, 150)); }
};

} // namespace

TEST_F(HoverTip, appearsAfterTheInitialDelayAtThePointerAndHidesAfterTheDisplayTime)
{
    tip.SetTimeout(400, 400);
    ASSERT_TRUE(tip.Create());
    QTest::mouseMove(tool, QPoint(30, 10));
    EXPECT_FALSE(window()->isVisible()) << "the pointer has not rested yet";
    ASSERT_TRUE(becomes(true));
    EXPECT_EQ(window()->anchor(), tool->mapToGlobal(QPoint(30, 10)));
    EXPECT_TRUE(window()->placement().stemUp);
    ASSERT_TRUE(becomes(false));
    QTest::mouseMove(tool, QPoint(31, 10));
    leave();
    QTest::mouseMove(tool, QPoint(40, 12));
    EXPECT_TRUE(becomes(true)) << "leaving and coming back shows it again";
}

TEST_F(HoverTip, aCentredTipSitsUnderTheToolAndGoesWhenThePointerLeavesOrPresses)
{
    tip.SetTimeout(30, 60000);
    tip.setCentered(true);
    tip.Create();
    QTest::mouseMove(tool, QPoint(5, 5));
    ASSERT_TRUE(becomes(true));
    EXPECT_EQ(window()->anchor(), tool->mapToGlobal(QPoint(49, 39)));
    leave();
    EXPECT_FALSE(window()->isVisible());
    QTest::mouseMove(tool, QPoint(12, 10));
    ASSERT_TRUE(becomes(true));
    QTest::mousePress(tool, Qt::LeftButton, {}, QPoint(12, 10));
    EXPECT_FALSE(window()->isVisible());
    QTest::mouseRelease(tool, Qt::LeftButton, {}, QPoint(12, 10));
}

TEST_F(HoverTip, aToolByRectangleKeepsTheAreaOfCreate)
{
    tip.setPopupOnDemand(false);
    tip.SetTimeout(0, 60000);
    tip.Create();
    tool->resize(200, 40);
    const auto restsAt = [&](QPoint at) {
        QTest::mouseMove(tool, at);
        QCoreApplication::processEvents();
        QCoreApplication::processEvents();
        return window()->isVisible();
    };
    EXPECT_FALSE(restsAt(QPoint(150, 10))) << "outside the area the tool had at Create";
    EXPECT_TRUE(restsAt(QPoint(50, 10)));
}

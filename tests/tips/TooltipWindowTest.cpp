#include "tips/TooltipWindow.h"
#include "platform/WindowHandles.h"
#include "tips/TipShape.h"
#include "tips/clsBalloonTip.h"

#include <QGuiApplication>
#include <QScreen>
#include <QTest>
#include <QWidget>

#include <gtest/gtest.h>

using namespace zelctl;

namespace {

// A shown form with a tool widget in it, and a tip on the tool with short delays.
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
        QTest::mouseMove(&form, QPoint(250, 150));
        tip.setParentControl(tool);
        tip.setTipText("Texto da dica");
        tip.setTitle("Título");
        tip.SetTimeout(400, 400);
    }

    TooltipWindow *window() const { return qobject_cast<TooltipWindow *>(platform::widgetOf(tip.lHwnd())); }
};

} // namespace

TEST_F(HoverTip, appearsAfterTheInitialDelayAndHidesAfterTheDisplayTime)
{
    ASSERT_TRUE(tip.Create());
    EXPECT_FALSE(window()->isVisible());
    QTest::mouseMove(tool, QPoint(30, 10));
    EXPECT_FALSE(window()->isVisible()) << "the pointer has not rested yet";
    ASSERT_TRUE(QTest::qWaitFor([&] { return window()->isVisible(); }));
    // The stem points at the pointer; the balloon lies below it.
    EXPECT_EQ(window()->anchor(), tool->mapToGlobal(QPoint(30, 10)));
    EXPECT_TRUE(window()->placement().stemUp);
    EXPECT_GT(window()->geometry().bottom(), window()->anchor().y());
    ASSERT_TRUE(QTest::qWaitFor([&] { return !window()->isVisible(); }));

    // Resting on after the display time brings no second tip; leaving and coming back does.
    QTest::mouseMove(tool, QPoint(31, 10));
    QTest::mouseMove(&form, QPoint(250, 150));
    QTest::mouseMove(tool, QPoint(40, 12));
    ASSERT_TRUE(QTest::qWaitFor([&] { return window()->isVisible(); }));
}

TEST_F(HoverTip, leavingOrPressingOnTheToolHidesTheTip)
{
    tip.SetTimeout(50, 60000);
    tip.Create();
    QTest::mouseMove(tool, QPoint(10, 10));
    ASSERT_TRUE(QTest::qWaitFor([&] { return window()->isVisible(); }));
    QTest::mouseMove(&form, QPoint(250, 150));
    EXPECT_FALSE(window()->isVisible());

    QTest::mouseMove(tool, QPoint(12, 10));
    ASSERT_TRUE(QTest::qWaitFor([&] { return window()->isVisible(); }));
    QTest::mousePress(tool, Qt::LeftButton, {}, QPoint(12, 10));
    EXPECT_FALSE(window()->isVisible());
    QTest::mouseRelease(tool, Qt::LeftButton, {}, QPoint(12, 10));
}

TEST_F(HoverTip, aTipWithoutTextNeverShows)
{
    tip.setTipText("");
    tip.SetTimeout(0, 60000);
    tip.Create();
    QTest::mouseMove(tool, QPoint(10, 10));
    QCoreApplication::processEvents();
    QCoreApplication::processEvents();
    EXPECT_FALSE(window()->isVisible());
    tip.ShowNow();
    EXPECT_FALSE(window()->isVisible());
}

TEST_F(HoverTip, centredTipSitsUnderTheMiddleOfTheTool)
{
    tip.SetTimeout(30, 60000);
    tip.setCentered(true);
    tip.Create();
    QTest::mouseMove(tool, QPoint(5, 5));
    ASSERT_TRUE(QTest::qWaitFor([&] { return window()->isVisible(); }));
    EXPECT_EQ(window()->anchor(), tool->mapToGlobal(QPoint(49, 39)));
    EXPECT_GE(window()->geometry().top(), window()->anchor().y());
}

TEST_F(HoverTip, aToolByRectangleKeepsTheAreaOfCreate)
{
    tip.setPopupOnDemand(false);
    tip.SetTimeout(0, 60000);
    tip.Create();
    tool->resize(200, 40);
    // Outside the area the tool had at Create: the tip does not show.
    QTest::mouseMove(tool, QPoint(150, 10));
    QCoreApplication::processEvents();
    QCoreApplication::processEvents();
    EXPECT_FALSE(window()->isVisible());
    QTest::mouseMove(tool, QPoint(50, 10));
    ASSERT_TRUE(QTest::qWaitFor([&] { return window()->isVisible(); }));
}

TEST(TipShape, balloonStaysOnTheScreenAndPointsAtTheAnchor)
{
    const QRect screen(0, 0, 800, 600);
    const QSize content(150, 40);
    const QPoint anchors[] = { { 400, 300 }, { 2, 2 }, { 798, 5 }, { 5, 598 }, { 797, 597 } };
    for (const bool centred : { false, true }) {
        for (const QPoint anchor : anchors) {
            const tipShape::Placement placement = tipShape::place(content, anchor, screen, true, centred);
            EXPECT_TRUE(screen.contains(placement.geometry)) << anchor.x() << "," << anchor.y();
            EXPECT_TRUE(placement.geometry.contains(anchor));
            // The stem reaches the anchor.
            const QPointF local = QPointF(anchor - placement.geometry.topLeft());
            EXPECT_TRUE(placement.outline.intersects(QRectF(local - QPointF(1, 1), QSizeF(2, 2))))
                << anchor.x() << "," << anchor.y();
            EXPECT_TRUE(placement.geometry.contains(placement.content.translated(placement.geometry.topLeft())));
            EXPECT_EQ(placement.content.size(), content);
        }
    }
    EXPECT_TRUE(tipShape::place(content, { 400, 300 }, screen, true, false).stemUp);
    EXPECT_FALSE(tipShape::place(content, { 400, 590 }, screen, true, false).stemUp);
}

// The pictures of the tips are in the golden pictures; these are the sizes behind them.
TEST(TipShape, theHeaderKeepsRoomForAnIconOnlyWhenThereIsOne)
{
    const QFont font;
    QFont bold = font;
    bold.setBold(true);
    const QFontMetrics title(bold);
    const QString name = QStringLiteral("Informação");

    const QSize titleOnly = tipShape::contentSize({ name, 0, QString(), {}, {} }, font);
    EXPECT_EQ(titleOnly, QSize(title.horizontalAdvance(name), title.height()));
    const QSize withIcon = tipShape::contentSize({ name, 1, QString(), {}, {} }, font);
    EXPECT_EQ(withIcon.width(), titleOnly.width() + 16 + 6) << "the icon and its gap";
    EXPECT_EQ(withIcon.height(), std::max(16, title.height()));

    const QSize text = tipShape::contentSize({ QString(), 0, QStringLiteral("Primeira linha"), {}, {} }, font);
    const QSize twoLines
        = tipShape::contentSize({ QString(), 0, QStringLiteral("Primeira linha\nSegunda linha"), {}, {} }, font);
    EXPECT_GT(twoLines.height(), text.height());
    EXPECT_EQ(tipShape::contentSize({ name, 0, QStringLiteral("Primeira linha"), {}, {} }, font).height(),
        titleOnly.height() + 6 + text.height());
}

#include "MessageSpy.h"

#include "frame/UserControl.h"
#include "platform/OleColor.h"
#include "platform/WindowHandles.h"
#include "tips/TooltipWindow.h"
#include "tips/clsBalloonTip.h"

#include <QPointer>
#include <QWidget>

#include <gtest/gtest.h>

using namespace zelctl;
using namespace zelctl::tooltipControl;
using zelctl::test::MessageSpy;

namespace {

// A tip whose parent is a widget of 120 x 30 pixels.
struct AttachedTip : ::testing::Test
{
    QWidget parent;
    clsBalloonTip tip;
    MessageSpy spy;

    AttachedTip()
    {
        parent.resize(120, 30);
        tip.setParentControl(&parent);
    }
    TooltipWindow *window() const { return qobject_cast<TooltipWindow *>(platform::widgetOf(tip.lHwnd())); }
};

} // namespace

TEST_F(AttachedTip, createTwiceKeepsOneWindowAndOneCount)
{
    const qint32 before = tip.TooltipCount();
    ASSERT_TRUE(tip.Create());
    const qint32 first = tip.lHwnd();
    ASSERT_TRUE(tip.Create());
    EXPECT_EQ(platform::widgetOf(first), nullptr) << "the first window must be destroyed";
    EXPECT_EQ(tip.TooltipCount(), before + 1);

    QPointer<QWidget> window = this->window();
    tip.DestroyTip();
    tip.DestroyTip();
    EXPECT_EQ(tip.lHwnd(), 0);
    EXPECT_TRUE(window.isNull());
    EXPECT_EQ(tip.TooltipCount(), before);
    {
        clsBalloonTip other;
        other.setParentControl(&parent);
        other.Create();
        window = platform::widgetOf(other.lHwnd());
        EXPECT_EQ(tip.TooltipCount(), before + 1);
    }
    EXPECT_TRUE(window.isNull()) << "releasing a tip destroys its window and gives back its count";
    EXPECT_EQ(tip.TooltipCount(), before);
}

TEST(BalloonTip, withoutAParentWindowCreateCountsButMakesNoWindowAndNothingIsSent)
{
    MessageSpy spy;
    clsBalloonTip tip;
    QObject windowless;
    tip.setParentControl(&windowless);
    EXPECT_EQ(tip.mvarParentControlhwnd(), 0);
    const qint32 before = tip.TooltipCount();
    EXPECT_FALSE(tip.Create());
    tip.DestroyTip();
    EXPECT_EQ(tip.TooltipCount(), before + 1);
    tip.setForeColor(5);
    tip.setTitle("T");
    tip.setTipText("x");
    tip.ShowNow();
    EXPECT_TRUE(spy.sent().isEmpty());

    auto *gone = new QWidget;
    tip.setMvarParentControlhwnd(platform::handleOf(gone));
    delete gone;
    EXPECT_FALSE(tip.Create()) << "a handle whose window is gone is no parent";
    EXPECT_EQ(tip.lHwnd(), 0);

    UserControl control;
    tip.setParentControl(&control);
    EXPECT_EQ(tip.mvarParentControlhwnd(), control.hWnd());
}

TEST_F(AttachedTip, createSendsTheToolThenTheTitleThenTheDelaysANewTimeoutWaitsForIt)
{
    tip.setTipText("Linha");
    tip.SetTimeout(250, 5000);
    tip.Create();
    EXPECT_EQ(spy.sent(), QStringList({ "add Linha", "title 1 ", "delay 2 5000", "delay 3 250" }));
    EXPECT_EQ(spy.tool().hwnd, platform::handleOf(&parent));
    EXPECT_EQ(spy.tool().uId, WPARAM(platform::handleOf(&parent)));
    EXPECT_EQ(spy.tool().rect, (RECT { 0, 0, 120, 30 }));
    EXPECT_EQ(window()->text(), "Linha");
    tip.SetTimeout(100, 200);
    EXPECT_EQ(window()->initialDelay(), 250);
    EXPECT_EQ(window()->autoPopDelay(), 5000);

    const std::tuple<bool, bool, UINT> rows[]
        = { { false, false, 0x110 }, { false, true, 0x111 }, { true, false, 0x112 }, { true, true, 0x113 } };
    for (const auto &[centered, onDemand, flags] : rows) {
        tip.setCentered(centered);
        tip.setPopupOnDemand(onDemand);
        tip.Create();
        EXPECT_EQ(spy.tool().uFlags, flags) << centered << onDemand;
        EXPECT_EQ(window()->toolFlags(), flags);
    }
}

TEST_F(AttachedTip, aLiveTipGetsATitleOnlyWithAnIconAndCreateWithEither)
{
    tip.setIcon(clsBalloonTip::TTNoIcon);
    tip.Create();
    EXPECT_FALSE(spy.sent().join('|').contains("title")) << "no title and no icon";
    spy.clear();
    tip.setTitle("Aviso");
    EXPECT_TRUE(spy.sent().isEmpty()) << "a title without an icon";
    tip.setIcon(clsBalloonTip::TTIconWarning);
    EXPECT_EQ(spy.sent(), QStringList { "title 2 Aviso" });
    EXPECT_EQ(window()->title(), "Aviso");

    tip.setIcon(clsBalloonTip::TTNoIcon);
    spy.clear();
    tip.Create();
    EXPECT_TRUE(spy.sent().contains("title 0 Aviso"));
    spy.clear();
    tip.setTitle("");
    tip.setIcon(clsBalloonTip::TTIconError);
    EXPECT_TRUE(spy.sent().isEmpty()) << "an empty title";
}

TEST_F(AttachedTip, coloursZeroWaitAtCreateButAreSentLater)
{
    tip.Create();
    EXPECT_EQ(spy.sent(), QStringList({ "add ", "title 1 ", "delay 2 10000", "delay 3 500" }));
    tip.setForeColor(platform::rgb(0xFF, 0, 0));
    EXPECT_EQ(window()->foreground(), QColor(0xFF, 0, 0));
    spy.clear();
    tip.setForeColor(0);
    tip.setBackColor(0);
    EXPECT_EQ(spy.sent(), QStringList({ "fore 0", "back 0" }));
    // 0 brings back the tips' own colours.
    EXPECT_EQ(window()->foreground(), platform::toQColor(platform::systemColor(platform::COLOR_INFOTEXT)));
    EXPECT_EQ(window()->background(), platform::toQColor(platform::systemColor(platform::COLOR_INFOBK)));
}

TEST_F(AttachedTip, tipTextGoesToThePlainTooltipBeforeCreateAndToALiveTipOnlyWhenChanged)
{
    tip.setTipText("Nome\r\nMorada");
    EXPECT_EQ(parent.toolTip(), "Nome - Morada");
    tip.Create();
    spy.clear();
    tip.setTipText("Nome\r\nMorada");
    EXPECT_TRUE(spy.sent().isEmpty());
    tip.setTipText("um\r\ndois\rtres");
    EXPECT_EQ(spy.sent(), QStringList { "text um\r\ndois\rtres" });
    EXPECT_EQ(window()->text(), "um\ndois\ntres");
}

TEST_F(AttachedTip, showNowActivatesAndShowsACreatedTip)
{
    tip.setTipText("Agora");
    tip.ShowNow();
    EXPECT_TRUE(spy.sent().isEmpty());
    parent.show();
    tip.Create();
    spy.clear();
    tip.ShowNow();
    EXPECT_EQ(spy.sent(), QStringList { "activate -1" });
    EXPECT_TRUE(window()->isVisible());
}

TEST(TooltipMessages, badRecordsAndHandlesAreRefused)
{
    QWidget owner;
    const HWND window = CreateTooltipWindow(TTS_BALLOON, platform::handleOf(&owner));
    ASSERT_NE(window, 0);
    TOOLINFOA tool;
    tool.cbSize = 40;
    tool.uFlags = TTF_IDISHWND;
    tool.uId = WPARAM(platform::handleOf(&owner));
    EXPECT_EQ(SendMessageA(window, TTM_ADDTOOLA, 0, reinterpret_cast<LPARAM>(&tool)), 0);
    EXPECT_EQ(SendMessageA(window, TTM_ADDTOOLA, 0, 0), 0);
    tool.cbSize = TOOLINFOA_SIZE;
    tool.uId = 0x7FFFFFFF;
    EXPECT_EQ(SendMessageA(window, TTM_ADDTOOLA, 0, reinterpret_cast<LPARAM>(&tool)), 0) << "no such tool window";
    EXPECT_EQ(SendMessageA(window, TTM_SETTITLEA, 7, reinterpret_cast<LPARAM>("x")), 0) << "no such icon";
    EXPECT_EQ(SendMessageA(window, TTM_SETTITLEA, TTI_INFO, 0), 0);
    EXPECT_EQ(SendMessageA(window, TTM_UPDATETIPTEXTA, 0, reinterpret_cast<LPARAM>(&tool)), 0) << "unknown tool";
    EXPECT_EQ(SendMessageA(0, TTM_ACTIVATE, 1, 0), 0);
    // Only tooltip windows can be destroyed through this door.
    EXPECT_FALSE(DestroyWindow(platform::handleOf(&owner)));
    EXPECT_TRUE(DestroyWindow(window));
    EXPECT_FALSE(DestroyWindow(window));
}

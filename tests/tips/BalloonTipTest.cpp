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
using zelctl::test::SentMessage;

namespace {

TooltipWindow *windowOf(const clsBalloonTip &tip)
{
    return qobject_cast<TooltipWindow *>(platform::widgetOf(tip.lHwnd()));
}

// A tip whose parent is a widget of 120 x 30 pixels.
struct AttachedTip : ::testing::Test
{
    QWidget parent;
    clsBalloonTip tip;

    AttachedTip()
    {
        parent.resize(120, 30);
        tip.setParentControl(&parent);
    }
};

} // namespace

TEST_F(AttachedTip, createTwiceKeepsOneWindowAndOneCount)
{
    const qint32 before = tip.TooltipCount();
    ASSERT_TRUE(tip.Create());
    const qint32 first = tip.lHwnd();
    ASSERT_NE(windowOf(tip), nullptr);
    EXPECT_EQ(tip.TooltipCount(), before + 1);

    ASSERT_TRUE(tip.Create());
    EXPECT_NE(tip.lHwnd(), first);
    EXPECT_EQ(platform::widgetOf(first), nullptr) << "the first window must be destroyed";
    EXPECT_EQ(tip.TooltipCount(), before + 1);

    QPointer<QWidget> window = windowOf(tip);
    tip.DestroyTip();
    EXPECT_EQ(tip.lHwnd(), 0);
    EXPECT_TRUE(window.isNull());
    EXPECT_EQ(tip.TooltipCount(), before);
    tip.DestroyTip();
    EXPECT_EQ(tip.TooltipCount(), before);

    // Releasing a tip destroys its window and gives back its count.
    QPointer<QWidget> released;
    {
        clsBalloonTip other;
        other.setParentControl(&parent);
        other.Create();
        EXPECT_EQ(tip.TooltipCount(), before + 1);
        released = windowOf(other);
    }
    EXPECT_TRUE(released.isNull());
    EXPECT_EQ(tip.TooltipCount(), before);
}

TEST(BalloonTip, createWithoutParentCountsButMakesNoWindow)
{
    MessageSpy spy;
    clsBalloonTip tip;
    const qint32 before = tip.TooltipCount();
    EXPECT_FALSE(tip.Create());
    EXPECT_EQ(tip.lHwnd(), 0);
    EXPECT_EQ(tip.TooltipCount(), before + 1);
    tip.DestroyTip();
    EXPECT_EQ(tip.TooltipCount(), before + 1);
    // Nor do properties send anything without a window.
    tip.setForeColor(5);
    tip.setTitle("T");
    tip.setTipText("x");
    tip.ShowNow();
    EXPECT_TRUE(spy.sent().isEmpty());

    // A handle whose window is gone is no parent either.
    auto *gone = new QWidget;
    tip.setMvarParentControlhwnd(platform::handleOf(gone));
    delete gone;
    EXPECT_FALSE(tip.Create());
    EXPECT_EQ(tip.lHwnd(), 0);
    EXPECT_EQ(tip.TooltipCount(), before + 2);
}

TEST_F(AttachedTip, createSendsTheToolThenTheTitleThenTheDelays)
{
    tip.setTipText("Linha");
    MessageSpy spy;
    tip.Create();
    ASSERT_EQ(spy.messages(), QList<UINT>({ TTM_ADDTOOLA, TTM_SETTITLEA, TTM_SETDELAYTIME, TTM_SETDELAYTIME }));

    const SentMessage &add = spy.sent()[0];
    EXPECT_EQ(add.tool.hwnd, platform::handleOf(&parent));
    EXPECT_EQ(add.tool.uId, WPARAM(platform::handleOf(&parent)));
    EXPECT_EQ(add.tool.rect, (RECT { 0, 0, 120, 30 }));
    EXPECT_EQ(add.text, "Linha");

    EXPECT_EQ(spy.sent()[1].wParam, WPARAM(clsBalloonTip::TTIconInfo));
    EXPECT_EQ(spy.sent()[1].text, "");
    EXPECT_EQ(spy.sent()[2].wParam, TTDT_AUTOPOP);
    EXPECT_EQ(spy.sent()[2].lParam, 10000);
    EXPECT_EQ(spy.sent()[3].wParam, TTDT_INITIAL);
    EXPECT_EQ(spy.sent()[3].lParam, 500);
    EXPECT_EQ(windowOf(tip)->text(), "Linha");
}

TEST_F(AttachedTip, toolFlagsFollowCentredAndPopupOnDemand)
{
    struct Row
    {
        bool centered;
        bool onDemand;
        UINT flags;
    };
    for (const Row &row : { Row { false, false, 0x110 }, Row { false, true, 0x111 }, Row { true, false, 0x112 },
             Row { true, true, 0x113 } }) {
        tip.setCentered(row.centered);
        tip.setPopupOnDemand(row.onDemand);
        MessageSpy spy;
        tip.Create();
        ASSERT_FALSE(spy.sent().isEmpty());
        EXPECT_EQ(spy.sent()[0].tool.uFlags, row.flags) << row.centered << row.onDemand;
        EXPECT_EQ(windowOf(tip)->toolFlags(), row.flags);
    }
}

TEST_F(AttachedTip, titleIsSentOnlyWithATitleAndAnIcon)
{
    tip.setIcon(clsBalloonTip::TTNoIcon);
    MessageSpy spy;
    tip.Create();
    EXPECT_FALSE(spy.messages().contains(TTM_SETTITLEA)) << "no title and no icon";

    spy.clear();
    tip.setTitle("Aviso");
    EXPECT_TRUE(spy.sent().isEmpty()) << "a title without an icon is not sent to a live tip";
    tip.setIcon(clsBalloonTip::TTIconWarning);
    ASSERT_EQ(spy.messages(), QList<UINT>({ TTM_SETTITLEA }));
    EXPECT_EQ(spy.sent()[0].wParam, WPARAM(clsBalloonTip::TTIconWarning));
    EXPECT_EQ(spy.sent()[0].text, "Aviso");
    EXPECT_EQ(windowOf(tip)->title(), "Aviso");

    // At Create either one is enough.
    tip.setIcon(clsBalloonTip::TTNoIcon);
    spy.clear();
    tip.Create();
    EXPECT_TRUE(spy.messages().contains(TTM_SETTITLEA));

    spy.clear();
    tip.setTitle("");
    tip.setIcon(clsBalloonTip::TTIconError);
    EXPECT_TRUE(spy.sent().isEmpty()) << "an empty title is not sent to a live tip";
}

TEST_F(AttachedTip, coloursZeroWaitAtCreateButAreSentLater)
{
    MessageSpy spy;
    tip.Create();
    EXPECT_FALSE(spy.messages().contains(TTM_SETTIPTEXTCOLOR));
    EXPECT_FALSE(spy.messages().contains(TTM_SETTIPBKCOLOR));

    tip.setForeColor(platform::rgb(0xFF, 0, 0));
    EXPECT_EQ(windowOf(tip)->foreground(), QColor(0xFF, 0, 0));

    spy.clear();
    tip.setForeColor(0);
    tip.setBackColor(0);
    ASSERT_EQ(spy.messages(), QList<UINT>({ TTM_SETTIPTEXTCOLOR, TTM_SETTIPBKCOLOR }));
    EXPECT_EQ(spy.sent()[0].wParam, 0u);
    EXPECT_EQ(spy.sent()[1].wParam, 0u);
    // 0 brings back the tips' own colours.
    EXPECT_EQ(windowOf(tip)->foreground(), platform::toQColor(platform::systemColor(platform::COLOR_INFOTEXT)));
    EXPECT_EQ(windowOf(tip)->background(), platform::toQColor(platform::systemColor(platform::COLOR_INFOBK)));
}

TEST_F(AttachedTip, tipTextUpdatesALiveTipOnlyWhenItChanges)
{
    tip.setTipText("um");
    tip.Create();
    MessageSpy spy;
    tip.setTipText("um");
    EXPECT_TRUE(spy.sent().isEmpty());

    tip.setTipText("um\r\ndois");
    ASSERT_EQ(spy.messages(), QList<UINT>({ TTM_UPDATETIPTEXTA }));
    EXPECT_EQ(spy.sent()[0].text, "um\r\ndois");
    EXPECT_EQ(windowOf(tip)->text(), "um\ndois");
}

TEST(BalloonTip, tipTextBeforeCreateGoesToTheParentsPlainTooltip)
{
    QWidget parent;
    clsBalloonTip tip;
    tip.setParentControl(&parent);
    tip.setTipText("Nome\r\nMorada");
    EXPECT_EQ(parent.toolTip(), "Nome - Morada");
}

TEST_F(AttachedTip, setTimeoutActsAtTheNextCreate)
{
    tip.Create();
    tip.SetTimeout(250, 5000);
    EXPECT_EQ(windowOf(tip)->initialDelay(), 500);
    EXPECT_EQ(windowOf(tip)->autoPopDelay(), 10000);

    MessageSpy spy;
    tip.Create();
    ASSERT_EQ(spy.sent().size(), 4);
    EXPECT_EQ(spy.sent()[2].lParam, 5000);
    EXPECT_EQ(spy.sent()[3].lParam, 250);
}

TEST(BalloonTip, parentControlGivesTheHandle)
{
    clsBalloonTip tip;
    UserControl control;
    tip.setParentControl(&control);
    EXPECT_EQ(tip.mvarParentControlhwnd(), control.hWnd());
    QObject windowless;
    tip.setParentControl(&windowless);
    EXPECT_EQ(tip.mvarParentControlhwnd(), 0);
}

TEST_F(AttachedTip, showNowActivatesAndShowsTheTip)
{
    tip.setTipText("Agora");
    MessageSpy spy;
    tip.ShowNow();
    EXPECT_TRUE(spy.sent().isEmpty());

    parent.show();
    tip.Create();
    spy.clear();
    tip.ShowNow();
    ASSERT_EQ(spy.messages(), QList<UINT>({ TTM_ACTIVATE }));
    EXPECT_EQ(spy.sent()[0].wParam, WPARAM(-1));
    EXPECT_TRUE(windowOf(tip)->isVisible());
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

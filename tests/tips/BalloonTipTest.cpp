// The balloon tip as the messages it sends to its tooltip window, one line each: "add <text>",
// "title <icon> <title>", "text <text>", "delay <kind> <ms>", "fore <colour>", "back <colour>",
// "activate <wParam>".

#include "frame/UserControl.h"
#include "platform/OleColor.h"
#include "platform/WindowHandles.h"
#include "tips/TooltipWindow.h"
#include "tips/clsBalloonTip.h"

#include <QPointer>
#include <QWidget>

#include <gtest/gtest.h>

#include <functional>

using namespace zelctl;
using namespace zelctl::tooltipControl;

namespace {

// A tip on a widget of 120 x 30 pixels, every message to a tooltip window recorded and the
// last tool record kept whole.
struct AttachedTip : ::testing::Test
{
    QWidget parent;
    clsBalloonTip tip;
    QStringList sent;
    TOOLINFOA tool {};
    MessageHook previous = setMessageHook([this](HWND, UINT message, WPARAM wParam, LPARAM lParam) {
        const QString number = QString::number(qintptr(wParam));
        if (message == TTM_ADDTOOLA || message == TTM_UPDATETIPTEXTA) {
            tool = *reinterpret_cast<const TOOLINFOA *>(lParam);
            sent << (message == TTM_ADDTOOLA ? "add " : "text ") + QString::fromUtf8(tool.lpszText);
        } else if (message == TTM_SETTITLEA) {
            sent << "title " + number + ' ' + QString::fromUtf8(reinterpret_cast<const char *>(lParam));
        } else if (message == TTM_SETDELAYTIME) {
            sent << "delay " + number + ' ' + QString::number(lParam);
        } else {
            const char *name = message == TTM_SETTIPTEXTCOLOR ? "fore "
                : message == TTM_SETTIPBKCOLOR                ? "back "
                                                              : "activate ";
            sent << name + number;
        }
    });

    AttachedTip()
    {
        parent.resize(120, 30);
        tip.setParentControl(&parent);
    }
    ~AttachedTip() override { setMessageHook(std::move(previous)); }

    TooltipWindow *window() const { return qobject_cast<TooltipWindow *>(platform::widgetOf(tip.lHwnd())); }
    QString sends(const std::function<void()> &act)
    {
        sent.clear();
        act();
        return sent.join('|');
    }
};

using Icon = clsBalloonTip::ttIconType;

} // namespace

TEST_F(AttachedTip, createSendsTheWholeTipAndChangesAreSentOnlyWhenTheyShow)
{
    EXPECT_EQ(sends([&] {
        tip.setTipText("Nome\r\nMorada");
        tip.ShowNow();
    }),
        "");
    EXPECT_EQ(parent.toolTip(), "Nome - Morada") << "before Create the text goes to the plain tooltip";
    const struct
    {
        const char *step;
        std::function<void()> act;
        QString sent;
    } steps[] = {
        { "Create", [&] { tip.Create(); }, "add Nome\r\nMorada|title 1 |delay 2 10000|delay 3 500" },
        { "the same text", [&] { tip.setTipText("Nome\r\nMorada"); }, "" },
        { "a new text", [&] { tip.setTipText("um\r\ndois\rtres"); }, "text um\r\ndois\rtres" },
        { "a timeout waits for Create", [&] { tip.SetTimeout(0, 5000); }, "" },
        { "a title without an icon", [&] { tip.setIcon(Icon::TTNoIcon), tip.setTitle("Aviso"); }, "" },
        { "an icon to the title", [&] { tip.setIcon(Icon::TTIconWarning); }, "title 2 Aviso" },
        { "Create, a title alone", [&] { tip.setIcon(Icon::TTNoIcon), tip.Create(); },
            "add um\r\ndois\rtres|title 0 Aviso|delay 2 5000|delay 3 0" },
        { "Create, neither", [&] { tip.setTitle(""), tip.Create(); }, "add um\r\ndois\rtres|delay 2 5000|delay 3 0" },
        { "an icon to no title", [&] { tip.setIcon(Icon::TTIconError); }, "" },
        { "colour 0 is sent later", [&] { tip.setForeColor(0), tip.setBackColor(0); }, "fore 0|back 0" },
        { "ShowNow", [&] { parent.show(), tip.ShowNow(); }, "activate -1" },
    };
    for (const auto &step : steps)
        EXPECT_EQ(sends(step.act), step.sent) << step.step;
    EXPECT_EQ(window()->text(), "um\ndois\ntres");
    EXPECT_TRUE(window()->isVisible());
    EXPECT_EQ(QList<int>({ window()->initialDelay(), window()->autoPopDelay() }), QList<int>({ 0, 5000 }));
    // 0 brings back the tips' own colours.
    EXPECT_EQ(window()->foreground(), platform::toQColor(platform::systemColor(platform::COLOR_INFOTEXT)));
    EXPECT_EQ(window()->background(), platform::toQColor(platform::systemColor(platform::COLOR_INFOBK)));

    EXPECT_EQ(tool.hwnd, platform::handleOf(&parent));
    EXPECT_EQ(tool.uId, WPARAM(platform::handleOf(&parent)));
    EXPECT_EQ(tool.rect, (RECT { 0, 0, 120, 30 }));
    const std::tuple<bool, bool, UINT> flags[]
        = { { false, false, 0x110 }, { false, true, 0x111 }, { true, false, 0x112 }, { true, true, 0x113 } };
    for (const auto &[centered, onDemand, expected] : flags) {
        tip.setCentered(centered);
        tip.setPopupOnDemand(onDemand);
        tip.Create();
        EXPECT_EQ(tool.uFlags, expected) << centered << onDemand;
        EXPECT_EQ(window()->toolFlags(), expected);
    }
}

TEST_F(AttachedTip, oneWindowAndOneCountPerTipAndNoneWithoutAParentWindow)
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
    EXPECT_TRUE(window.isNull());
    EXPECT_EQ(tip.TooltipCount(), before);

    // Without a parent window Create counts but makes no window, and nothing is sent.
    QObject windowless;
    tip.setParentControl(&windowless);
    EXPECT_EQ(tip.mvarParentControlhwnd(), 0);
    EXPECT_FALSE(tip.Create());
    tip.DestroyTip();
    EXPECT_EQ(tip.TooltipCount(), before + 1);
    EXPECT_EQ(sends([&] { tip.setForeColor(5), tip.setTitle("T"), tip.setTipText("x"), tip.ShowNow(); }), "");

    auto *gone = new QWidget;
    tip.setMvarParentControlhwnd(platform::handleOf(gone));
    delete gone;
    EXPECT_FALSE(tip.Create()) << "a handle whose window is gone is no parent";
    EXPECT_EQ(tip.lHwnd(), 0);

    UserControl control;
    tip.setParentControl(&control);
    EXPECT_EQ(tip.mvarParentControlhwnd(), control.hWnd());
}

TEST(TooltipMessages, badRecordsAndHandlesAreRefused)
{
    QWidget owner;
    const HWND window = CreateTooltipWindow(TTS_BALLOON, platform::handleOf(&owner));
    ASSERT_NE(window, 0);
    auto *tipWindow = qobject_cast<TooltipWindow *>(platform::widgetOf(window));
    EXPECT_EQ(QList<int>({ tipWindow->initialDelay(), tipWindow->autoPopDelay() }), QList<int>({ 500, 5000 }))
        << "the delays of a window nobody set them on";
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

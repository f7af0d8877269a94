// The balloon tip as what its tooltip window holds after each change.

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

// A tip on a widget of 120 x 30 pixels.
struct AttachedTip : ::testing::Test
{
    QWidget parent;
    clsBalloonTip tip;

    AttachedTip()
    {
        parent.resize(120, 30);
        tip.setParentControl(&parent);
    }

    TooltipWindow *window() const { return qobject_cast<TooltipWindow *>(platform::widgetOf(tip.lHwnd())); }
    // Text, icon and title, initial and display delays, and whether it shows; empty without a window.
    std::string held() const
    {
        const TooltipWindow *w = window();
        return w ? QString::asprintf("%s|%d %s|%d %d|%d", qUtf8Printable(w->text()), w->icon(),
                   qUtf8Printable(w->title()), w->initialDelay(), w->autoPopDelay(), w->isVisible())
                       .toStdString()
                 : std::string();
    }
};

using Icon = clsBalloonTip::ttIconType;

} // namespace

TEST_F(AttachedTip, createSendsTheWholeTipAndChangesShowOnlyWhereTheyShould)
{
    tip.setTipText("Nome\r\nMorada");
    tip.ShowNow();
    EXPECT_EQ(held(), "");
    EXPECT_EQ(parent.toolTip(), "Nome - Morada") << "before Create the text goes to the plain tooltip";
    const struct
    {
        const char *step;
        std::function<void()> act;
        const char *held;
    } steps[] = {
        { "Create", [&] { tip.Create(); }, "Nome\nMorada|1 |500 10000|0" },
        { "a new text", [&] { tip.setTipText("um\r\ndois\rtres"); }, "um\ndois\ntres|1 |500 10000|0" },
        { "a timeout waits for Create", [&] { tip.SetTimeout(0, 5000); }, "um\ndois\ntres|1 |500 10000|0" },
        { "a title without an icon", [&] { tip.setIcon(Icon::TTNoIcon), tip.setTitle("Aviso"); },
            "um\ndois\ntres|1 |500 10000|0" },
        { "an icon to the title", [&] { tip.setIcon(Icon::TTIconWarning); }, "um\ndois\ntres|2 Aviso|500 10000|0" },
        { "Create, a title alone", [&] { tip.setIcon(Icon::TTNoIcon), tip.Create(); },
            "um\ndois\ntres|0 Aviso|0 5000|0" },
        { "Create, neither", [&] { tip.setTitle(""), tip.Create(); }, "um\ndois\ntres|0 |0 5000|0" },
        { "an icon to no title", [&] { tip.setIcon(Icon::TTIconError); }, "um\ndois\ntres|0 |0 5000|0" },
        { "ShowNow", [&] { parent.show(), tip.ShowNow(); }, "um\ndois\ntres|0 |0 5000|1" },
    };
    for (const auto &step : steps) {
        step.act();
        EXPECT_EQ(held(), step.held) << step.step;
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

    // Without a parent window Create counts but makes no window, and changes go nowhere.
    QObject windowless;
    tip.setParentControl(&windowless);
    EXPECT_EQ(tip.mvarParentControlhwnd(), 0);
    EXPECT_FALSE(tip.Create());
    tip.DestroyTip();
    EXPECT_EQ(tip.TooltipCount(), before + 1);
    tip.setForeColor(5), tip.setTitle("T"), tip.setTipText("x"), tip.ShowNow();
    EXPECT_EQ(tip.lHwnd(), 0);

    auto *gone = new QWidget;
    tip.setMvarParentControlhwnd(platform::handleOf(gone));
    delete gone;
    EXPECT_FALSE(tip.Create()) << "a handle whose window is gone is no parent";
    EXPECT_EQ(tip.lHwnd(), 0);
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

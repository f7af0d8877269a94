// The information button as the user meets it: its tip on hover, its click. Its pictures
// are in the golden pictures.

#include "tips/InfoButton.h"
#include "common/modFuncs.h"
#include "platform/Shell.h"
#include "platform/WindowHandles.h"
#include "tips/TooltipWindow.h"

#include <QSignalSpy>
#include <QTest>

#include <gtest/gtest.h>

using namespace zelctl;

namespace {

// A new button on a shown form, as a designer places it; what it would open is recorded
// instead, and fails.
struct PlacedButton : ::testing::Test
{
    QWidget form;
    InfoButton *button = new InfoButton(&form);
    QStringList opened;
    const platform::ShellOpenHook previous = platform::setShellOpenHook([this](const QString &action) {
        opened << action;
        return false;
    });

    PlacedButton()
    {
        form.resize(100, 60);
        button->move(10, 10);
        button->InitNew();
        form.show();
        EXPECT_TRUE(QTest::qWaitForWindowExposed(&form));
        QTest::mouseMove(&form, QPoint(90, 50));
    }
    ~PlacedButton() override { platform::setShellOpenHook(previous); }

    // A pointer move over the button, which builds its tip when needed; the tip's window.
    TooltipWindow *hover()
    {
        QTest::mouseMove(button, QPoint(2 + ++moves % 10, 5));
        const clsBalloonTip *tip = button->GetTooltipClass();
        return tip ? qobject_cast<TooltipWindow *>(platform::widgetOf(tip->lHwnd())) : nullptr;
    }
    int moves = 0;
};

} // namespace

TEST_F(PlacedButton, tipIsBuiltOnHoverFromTheTextTitleAndStylesAndGoesWithItsText)
{
    for (const QString &text : { QString("um||dois"), QString("um\\ndois"), QString("  um||dois  ") }) {
        button->setTipText(text);
        ASSERT_NE(hover(), nullptr) << text.toStdString();
        EXPECT_EQ(hover()->text(), "um\ndois");
    }

    button->setToolTipTitle("Prazo");
    button->setStyle(InfoButton::IB_ERROR);
    EXPECT_EQ(hover()->title(), "Prazo");
    EXPECT_EQ(hover()->icon(), clsBalloonTip::TTIconError);
    EXPECT_TRUE(hover()->isBalloon());
    // A new style alone waits for the next rebuild, which a new tip style forces.
    const qint32 built = button->GetTooltipClass()->lHwnd();
    button->setStyle(InfoButton::IB_WARNING);
    hover();
    EXPECT_EQ(button->GetTooltipClass()->lHwnd(), built);
    button->setToolTipStyle(InfoButton::TTS_DEFAULT);
    EXPECT_FALSE(hover()->isBalloon());
    EXPECT_EQ(hover()->icon(), clsBalloonTip::TTIconWarning);

    button->setTipText("   ");
    EXPECT_EQ(hover(), nullptr);
    EXPECT_EQ(button->GetTooltipClass(), nullptr);
    EXPECT_EQ(platform::widgetOf(built), nullptr);
    button->PopupTip();
    button->setTipText("de volta");
    ASSERT_NE(hover(), nullptr);
    EXPECT_EQ(hover()->text(), "de volta");
}

TEST_F(PlacedButton, clickDependsOnTheActionWhichIsKeptTrimmedAndADoubleClickActsOnce)
{
    const std::tuple<QString, int, QString> rows[] = { { " Click ", 1, "" }, { "Nothing ", 0, "" },
        { "https://www.example.pt/ajuda", 1, "https://www.example.pt/ajuda" },
        { "/sem/tal/ficheiro.pdf", 1, "/sem/tal/ficheiro.pdf" },
        { "README.md", 1, modFuncs::GetRootPath() + "README.md" } };
    for (const auto &[action, clicks, expected] : rows) {
        SCOPED_TRACE(action.toStdString());
        opened.clear();
        button->setAction(action);
        EXPECT_EQ(button->Action(), action.trimmed());
        EXPECT_EQ(button->cursor().shape(), Qt::PointingHandCursor);
        QSignalSpy clicked(button, &InfoButton::Click);
        // Its second press is no new press.
        QTest::mouseClick(button, Qt::LeftButton, {}, QPoint(8, 8));
        QTest::mouseDClick(button, Qt::LeftButton, {}, QPoint(8, 8));
        QTest::mouseRelease(button, Qt::LeftButton, {}, QPoint(8, 8));
        EXPECT_EQ(clicked.count(), clicks);
        EXPECT_EQ(opened.join('|'), expected);
    }

    // Without an action a click pops the tip up.
    opened.clear();
    button->setAction("");
    EXPECT_EQ(button->cursor().shape(), Qt::ArrowCursor);
    button->setTipText("Clique para ver");
    button->GetTooltipClass()->SetTimeout(60000, 60000);
    TooltipWindow *tip = hover();
    ASSERT_NE(tip, nullptr);
    EXPECT_FALSE(tip->isVisible());
    QSignalSpy clicks(button, &InfoButton::Click);
    QTest::mouseClick(button, Qt::LeftButton, {}, QPoint(8, 8));
    EXPECT_EQ(clicks.count(), 1);
    EXPECT_TRUE(tip->isVisible());
    EXPECT_TRUE(opened.isEmpty());
}

TEST(InfoButtonPersistence, aSavedButtonLoadsAsItWasUnderItsNamesAndAnOldTipTextIsRead)
{
    InfoButton saved;
    saved.InitNew();
    saved.setStyle(InfoButton::IB_ERROR);
    saved.setToolTipStyle(InfoButton::TTS_DEFAULT);
    saved.setEnabled(false);
    saved.setTipText("linha um||linha dois");
    const PropertyBag bag = saved.Save();
    InfoButton loaded;
    loaded.Load(bag);
    EXPECT_EQ(loaded.Save(), bag);

    PropertyBag old;
    old.WriteProperty("ToolTipText", "texto antigo");
    loaded.Load(old);
    EXPECT_EQ(QStringList({ loaded.TipText(), loaded.ToolTipTitle(), QString::number(loaded.Enabled()) }),
        QStringList({ "texto antigo", "Informação", "1" }))
        << "absent names give the defaults";
    old.WriteProperty("ibutton.tiptext", "novo");
    loaded.Load(old);
    EXPECT_EQ(loaded.TipText(), "novo");
}

#include "AccessibleEventSpy.h"

#include "common/modFuncs.h"
#include "companion/CommandButton.h"
#include "gif/ucAniGIF.h"
#include "skins/cSlider.h"
#include "skins/skGoButton.h"
#include "skins/skNumber.h"
#include "skins/skSubMenu.h"
#include "tips/InfoButton.h"
#include "tips/TooltipWindow.h"

#include <QApplication>
#include <QSignalSpy>
#include <QTest>

#include <gtest/gtest.h>

using namespace zelctl;
using namespace zelctl::test;

// What a screen reader hears of the buttons that draw themselves and of the animation, and
// how the keyboard presses them.
namespace {

QAccessibleInterface *accessible(QObject *object)
{
    return QAccessible::queryAccessibleInterface(object);
}

TEST(ButtonAccessibility, skinnedButtonsAreNamedPressedFromTheKeyboardOrTheirActionAndSayTheirState)
{
    AccessibleEventSpy spy;
    QWidget form;
    auto *go = new skGoButton(&form);
    go->setTooltip("Página seguinte");
    auto *number = new skNumber(&form);
    number->setCaption("2");
    auto *item = new skSubMenu(&form);
    item->setCaption("Anexo A");
    auto *info = new InfoButton(&form);
    info->InitNew();
    info->setToolTipTitle("Atenção");
    info->setAction("click");
    form.show();
    const struct
    {
        UserControl *control;
        const char *click;
        QString name;
    } rows[] = {
        { go, SIGNAL(Click()), "Página seguinte" },
        { number, SIGNAL(Clicked()), "2" },
        { item, SIGNAL(Clicked()), "Anexo A" },
        { info, SIGNAL(Click()), "Atenção" },
    };
    for (const auto &row : rows) {
        const char *control = row.control->metaObject()->className();
        QAccessibleInterface *iface = accessible(row.control);
        EXPECT_EQ(iface->role(), QAccessible::Button) << control;
        EXPECT_EQ(iface->text(QAccessible::Name), row.name) << control;
        EXPECT_EQ(row.control->focusPolicy(), Qt::TabFocus) << control << ": Tab reaches it, a click leaves the focus";
        QSignalSpy clicks(row.control, row.click);
        QTest::keyClick(row.control, Qt::Key_Space);
        QTest::keyClick(row.control, Qt::Key_Return);
        EXPECT_EQ(clicks.size(), 2) << control;
        iface->actionInterface()->doAction(QAccessibleActionInterface::pressAction());
        ASSERT_TRUE(QTest::qWaitFor([&] { return clicks.size() == 3; })) << control;
    }

    go->setActive(true);
    number->setActive(true);
    item->setActive(true);
    EXPECT_TRUE(accessible(go)->state().pressed);
    EXPECT_TRUE(spy.changedStates(go).pressed);
    for (UserControl *current : { static_cast<UserControl *>(number), static_cast<UserControl *>(item) }) {
        EXPECT_TRUE(accessible(current)->state().checked);
        EXPECT_TRUE(spy.changedStates(current).checked);
    }
}

TEST(ButtonAccessibility, informationButtonDescribesItsTipAndTheTipIsAnnouncedAsItShows)
{
    AccessibleEventSpy spy;
    QWidget form;
    auto *button = new InfoButton(&form);
    button->InitNew();
    button->setToolTipTitle("Atenção");
    button->setTipText("O prazo termina em breve.||Confirme os rendimentos.");
    form.show();
    EXPECT_EQ(
        accessible(button)->text(QAccessible::Description), "O prazo termina em breve.\nConfirme os rendimentos.");

    spy.clear();
    QTest::keyClick(button, Qt::Key_Return);
    TooltipWindow *shown = nullptr;
    for (QWidget *window : QApplication::topLevelWidgets())
        if (auto *tip = qobject_cast<TooltipWindow *>(window); tip && tip->isVisible())
            shown = tip;
    ASSERT_TRUE(shown) << "Enter shows the tip at once";
    EXPECT_EQ(spy.count(shown, QAccessible::ObjectShow), 1);
    QAccessibleInterface *tip = accessible(shown);
    EXPECT_EQ(tip->role(), QAccessible::ToolTip);
    EXPECT_EQ(tip->text(QAccessible::Name), "Atenção");
    EXPECT_EQ(tip->text(QAccessible::Description), "O prazo termina em breve.\nConfirme os rendimentos.");
}

TEST(ButtonAccessibility, sliderToggleSaysWhatItDoesAndWhetherThePanelIsOpen)
{
    AccessibleEventSpy spy;
    QWidget form;
    auto *slider = new cSlider(&form);
    form.show();
    CommandButton *toggle = slider->button();
    QAccessibleInterface *iface = accessible(toggle);
    EXPECT_EQ(iface->text(QAccessible::Name), "Abrir o painel");
    EXPECT_TRUE(iface->state().expandable);
    EXPECT_TRUE(iface->state().collapsed);

    spy.clear();
    QTest::keyClick(toggle, Qt::Key_Space);
    ASSERT_TRUE(slider->SlideOpen());
    EXPECT_EQ(iface->text(QAccessible::Name), "Fechar o painel");
    EXPECT_TRUE(iface->state().expanded);
    EXPECT_GE(spy.count(toggle, QAccessible::NameChanged), 1);
    EXPECT_TRUE(spy.changedStates(toggle).expanded);
    EXPECT_EQ(accessible(slider)->role(), QAccessible::Grouping);
    EXPECT_TRUE(accessible(slider)->state().expanded);
}

TEST(ButtonAccessibility, animationIsAnImageThatSaysWhetherItMoves)
{
    AccessibleEventSpy spy;
    QWidget form;
    auto *gif = new ucAniGIF(&form);
    gif->InitNew();
    gif->extender().setToolTipText("A aguardar");
    form.show();
    ASSERT_TRUE(gif->LoadAnimatedGIF_File(modFuncs::GetDataPath() + "gif/aguarde.gif"));
    QAccessibleInterface *iface = accessible(gif);
    EXPECT_EQ(iface->role(), QAccessible::Graphic);
    EXPECT_EQ(iface->text(QAccessible::Name), "A aguardar");
    const QString moving = QString("Imagem animada, %1 imagens, em movimento").arg(gif->FrameCount());
    ASSERT_TRUE(QTest::qWaitFor([&] { return iface->text(QAccessible::Description) == moving; }));
    EXPECT_TRUE(iface->state().animated);
    EXPECT_EQ(iface->imageInterface()->imageDescription(), moving);

    spy.clear();
    gif->setAction(ucAniGIF::gfaPause);
    EXPECT_EQ(
        iface->text(QAccessible::Description), QString("Imagem animada, %1 imagens, em pausa").arg(gif->FrameCount()));
    EXPECT_EQ(spy.count(gif, QAccessible::DescriptionChanged), 1);
    EXPECT_TRUE(spy.changedStates(gif).animated);
}

} // namespace

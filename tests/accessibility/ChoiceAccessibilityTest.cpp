#include "AccessibleEventSpy.h"

#include "common/modFuncs.h"
#include "companion/CommandButton.h"
#include "companion/JsonDeclaration.h"
#include "selection/clsGFXSelection.h"
#include "selection/frmSelector.h"
#include "subject/ListMenuPresenter.h"
#include "subject/cSujeitoSelector.h"
#include "support/TestSupport.h"

#include <QLineEdit>
#include <QMenu>
#include <QTest>

#include <gtest/gtest.h>

#include <algorithm>

using namespace zelctl;
using namespace zelctl::test;

// What a screen reader hears of the controls that offer a choice: the subject selector with
// its list of subjects, and the selection dialog.
namespace {

QAccessibleInterface *accessible(QObject *object)
{
    return QAccessible::queryAccessibleInterface(object);
}

QString shortName(const char *name)
{
    return modFuncs::FormatShortName(QString::fromUtf8(name));
}

TEST(ChoiceAccessibility, subjectButtonsAreNamedAfterTheirSubjectsAndTheListItemsAfterTheirs)
{
    AccessibleEventSpy spy;
    companion::JsonDeclaration declaration;
    ASSERT_TRUE(declaration.load(modFuncs::GetDataPath() + "declaracao.json"));
    cSujeitoSelector selector;
    selector.setPossible("*");
    selector.setIRSClass(&declaration);
    selector.setSelectedSujeito("A");
    QList<CommandButton *> buttons = selector.findChildren<CommandButton *>("sujeito_selector");
    std::sort(buttons.begin(), buttons.end(), [](auto *a, auto *b) { return a->Index() < b->Index(); });
    ASSERT_EQ(buttons.size(), 7);

    const struct
    {
        int button;
        QString name;
        QString description;
        bool checked;
    } before[] = {
        { 0, shortName("ANA MARIA FERREIRA LOPES"), "Sujeito passivo A", true },
        { 1, shortName("RUI PEDRO SOUSA LOPES"), "Sujeito passivo B", false },
        { 2, "Dependente", "", false },
        { 5, "Agregado", "Sujeitos A e B", false },
    };
    for (const auto &row : before) {
        QAccessibleInterface *iface = accessible(buttons[row.button]);
        EXPECT_EQ(iface->role(), QAccessible::Button);
        EXPECT_EQ(iface->text(QAccessible::Name), row.name);
        EXPECT_EQ(iface->text(QAccessible::Description), row.description);
        EXPECT_TRUE(iface->state().checkable);
        EXPECT_EQ(iface->state().checked, row.checked) << row.name.toStdString();
    }

    // The user presses "Dependente" with the keyboard and chooses the second from the list.
    QStringList listed;
    const subject::ListMenuPresenter previous = subject::setListMenuPresenter([&](QMenu &menu, const QPoint &) {
        QAccessibleInterface *list = accessible(&menu);
        for (int i = 0; i < list->childCount(); ++i)
            if (menu.actions().at(i)->isVisible())
                listed << list->child(i)->text(QAccessible::Name);
        return menu.actions().at(2);
    });
    spy.clear();
    QTest::keyClick(buttons[2], Qt::Key_Space);
    subject::setListMenuPresenter(previous);
    EXPECT_EQ(listed.join(" | ").toStdString(),
        ("=== Listagem de DEPENDENTES === | D1 - " + shortName("MARTA SOFIA FERREIRA LOPES") + " | D2 - "
            + shortName("TIAGO ANDRÉ FERREIRA LOPES"))
            .toStdString());
    ASSERT_EQ(selector.SelectedSujeito(), "D2");
    EXPECT_EQ(accessible(buttons[2])->text(QAccessible::Name), shortName("TIAGO ANDRÉ FERREIRA LOPES"));
    EXPECT_EQ(accessible(buttons[2])->text(QAccessible::Description), "Dependente 2");
    EXPECT_TRUE(accessible(buttons[2])->state().checked);
    EXPECT_TRUE(spy.changedStates(buttons[0]).checked) << "A was released";
    EXPECT_TRUE(spy.changedStates(buttons[2]).checked);
    EXPECT_GE(spy.count(buttons[2], QAccessible::NameChanged), 1);
}

TEST(ChoiceAccessibility, selectionDialogHasATitleAndItsItemsAreButtonsNamedWhole)
{
    frmSelector::setZoomStepInterval(0);
    QList<GFXItem> items;
    for (int i = 0; i < 25; ++i) {
        GFXItem item;
        item.Title = QString("Rendimentos da categoria %1 obtidos no estrangeiro sem retenção").arg(i);
        item.Value = i;
        item.Selected = i == 3;
        items.append(item);
    }
    GFXSelection settings;
    settings.Title = "Categoria";
    clsGFXSelection selection;
    ModalDriver driver([&](QDialog &dialog) {
        dialog.show();
        EXPECT_EQ(accessible(&dialog)->role(), QAccessible::Dialog);
        EXPECT_EQ(accessible(&dialog)->text(QAccessible::Name), "Categoria");
        EXPECT_EQ(accessible(dialog.findChild<QLineEdit *>("txtFilter"))->text(QAccessible::Name), "Procurar");
        for (CommandButton *button : dialog.findChildren<CommandButton *>("btnSelector")) {
            if (button->isHidden())
                continue;
            QAccessibleInterface *iface = accessible(button);
            EXPECT_EQ(iface->role(), QAccessible::Button);
            EXPECT_EQ(iface->text(QAccessible::Name), button->Caption()) << "read whole, though cut short on screen";
            EXPECT_NE(button->text(), button->Caption());
            EXPECT_EQ(iface->state().checked, button->Index() == 3);
        }
        return int(QDialog::Rejected);
    });
    selection.SelectFrom(settings, items);
    EXPECT_EQ(driver.shownCount(), 1);
}

} // namespace

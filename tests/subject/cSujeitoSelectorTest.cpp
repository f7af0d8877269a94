#include "subject/cSujeitoSelector.h"
#include "subject/ListMenuPresenter.h"

#include "companion/CommandButton.h"
#include "companion/JsonDeclaration.h"

#include "support/TestSupport.h"

#include <QAction>
#include <QFrame>
#include <QMenu>
#include <QPointer>
#include <QTest>

#include <gtest/gtest.h>

using namespace zelctl;

namespace {

// A married couple plus the given subjects (id, number, name).
std::unique_ptr<companion::JsonDeclaration> declarationWith(const QList<QStringList> &subjects = {})
{
    auto declaration = std::make_unique<companion::JsonDeclaration>();
    declaration->DeclarationData().FieldStore().Set("casado", "1");
    declaration->setSubject("A", { "210345675", "ANA MARIA FERREIRA LOPES" });
    declaration->setSubject("B", { "198765436", "RUI PEDRO SOUSA LOPES" });
    for (const QStringList &s : subjects)
        declaration->setSubject(s[0], { s[1], s[2] });
    return declaration;
}

class SubjectSelector : public ::testing::Test
{
protected:
    void SetUp() override
    {
        previousList
            = subject::setListMenuPresenter([this](QMenu &menu, const QPoint &pos) { return listShown(menu, pos); });
        form.resize(800, 100);
        form.show();
        makeSelector();
    }
    void TearDown() override { subject::setListMenuPresenter(std::move(previousList)); }

    // Stands in for the user at the list menu: records its items ("[x]" marks a checked one,
    // " (off)" a disabled one) and chooses the item of index `choice` (0 dismisses the menu).
    QAction *listShown(QMenu &menu, const QPoint &pos)
    {
        ++lists;
        listPosition = pos;
        listItems.clear();
        QAction *chosen = nullptr;
        for (QAction *action : menu.actions()) {
            if (!action->isVisible())
                continue;
            listItems << (action->isChecked() ? "[x]" : "") + action->text() + (action->isEnabled() ? "" : " (off)");
            if (choice > 0 && action->property("Index").toInt() == choice) {
                action->trigger(); // as the menu does; this also flips the check mark
                chosen = action;
            }
        }
        return chosen;
    }

    // A new selector in place of the current one, which may be gone already.
    void makeSelector()
    {
        delete alive.data();
        alive = selector = new cSujeitoSelector(&form);
        selector->show();
        QObject::connect(selector, &cSujeitoSelector::Clicked, [this] { events << "Clicked"; });
        QObject::connect(selector, &cSujeitoSelector::Changed, [this] { events << "Changed"; });
    }

    CommandButton *button(QChar kind) const
    {
        const int index = int(QStringView(u"ABDSFCH").indexOf(kind));
        for (CommandButton *b : selector->findChildren<CommandButton *>("sujeito_selector")) {
            if (b->Index() == index)
                return b;
        }
        return nullptr;
    }

    QString pressed() const
    {
        QString letters;
        for (const QChar kind : QStringView(u"ABDSFCH")) {
            if (button(kind)->Value())
                letters += kind;
        }
        return letters;
    }

    // Clicks each kind in turn, as the user would.
    void click(QStringView kinds)
    {
        for (const QChar kind : kinds) {
            ASSERT_TRUE(button(kind)->isVisible()) << QString(kind).toStdString();
            QTest::mouseClick(button(kind), Qt::LeftButton);
        }
    }

    bool underlined() const { return selector->findChild<QFrame *>("Line1")->isVisible(); }

    QWidget form;
    cSujeitoSelector *selector = nullptr;
    QPointer<cSujeitoSelector> alive;
    QStringList events;
    subject::ListMenuPresenter previousList;
    int choice = 0, lists = 0;
    QPoint listPosition;
    QStringList listItems;
};

} // namespace

// Only the possible kinds show, in button order from the left: C only with B; the letters are
// case-sensitive, others are ignored.
TEST_F(SubjectSelector, onlyPossibleKindsTakeRoomFromTheLeft)
{
    for (const auto &[written, stored] :
        { std::pair { "*", "ABDSFCH" }, { "HCA", "AH" }, { "HBCA", "ABCH" }, { "xSd-D", "DS" } }) {
        selector->setPossible(QString::fromLatin1(written));
        EXPECT_EQ(selector->Possible(), stored) << written;
        for (const QChar kind : QStringView(u"ABDSFCH"))
            EXPECT_EQ(button(kind)->isVisible(), QLatin1String(stored).contains(kind)) << written;
    }

    selector->setPossible("HBA");
    selector->setSujeitoValueType("B");
    EXPECT_EQ(button('H')->Left(), 500 + 2500) << "placed in twips, not in rounded pixels";
}

// Each property written in turn, with what the selector then answers; writing raises no event.
TEST_F(SubjectSelector, selectingByEachPropertyAndReadingBack)
{
    selector->setPossible("*");
    const struct
    {
        const char *property;
        QVariant value;
        const char *selected, *pressed, *caption;
    } steps[] = {
        { "SelectedSujeito", "D2", "D2", "D", "Dependente 2" },
        { "SujeitoValueType", "S", "S", "S", "Ascendente" }, // no index left over from the dependant
        { "SelectedSujeitoIndex", 3, "S3", "S", "Ascendente 3" }, { "SujeitoValueType", "A", "A", "A", "Sujeito A" },
        { "SelectedSujeitoIndex", 3, "A", "A", "Sujeito A" }, // A, B, C and F take no index
        { "SelectedSujeito", "Dx", "D", "D", nullptr }, // no number, no index
        { "SelectedSujeito", "H40000", "H", "H", nullptr }, // beyond a 16-bit index
        { "SujeitoValueType", "X", "", "", nullptr },
        { "SelectedSujeito", "", "A", "A", nullptr }, // no empty choice without CanSelectNone
    };
    for (const auto &step : steps) {
        SCOPED_TRACE(step.property + (" = " + step.value.toString().toStdString()));
        selector->setProperty(step.property, step.value);
        EXPECT_EQ(selector->SelectedSujeito(), step.selected);
        EXPECT_EQ(pressed(), step.pressed);
        EXPECT_EQ(underlined(), *step.pressed != 0);
        if (step.caption) {
            EXPECT_EQ(button(QLatin1Char(*step.pressed))->Caption(), step.caption);
        }
    }
    selector->setCanSelectNone(true);
    selector->setSelectedSujeito("");
    EXPECT_EQ(pressed(), "") << "an empty choice, now that CanSelectNone allows it";
    EXPECT_TRUE(events.isEmpty());
}

// Clicks on a new selector with A pressed; `events` are those of the last click.
TEST_F(SubjectSelector, clicksRaiseClickedThenChangedAndASecondClickMayEmpty)
{
    const struct
    {
        bool canSelectNone;
        const char16_t *clicks;
        const char *pressed, *events;
    } cases[] = {
        { false, u"B", "B", "Clicked Changed" },
        { false, u"BB", "B", "Clicked Changed" }, // the only pressed button stays pressed
        { false, u"BC", "BC", "Clicked Changed" }, // C keeps B's state
        { false, u"BCAC", "C", "Clicked Changed" }, { false, u"BCACB", "B", "Clicked Changed" }, // B does not keep C
        { true, u"A", "A", "Clicked Changed" }, // a first click on a pressed button does not empty the choice
        { true, u"AA", "", "Changed" }, // a second click does
        { true, u"AAA", "A", "Clicked Changed" }, // and is forgotten
        { true, u"ABA", "A", "Clicked Changed" }, // only a click on the same button is a second click
    };
    for (const auto &c : cases) {
        const QStringView clicks(c.clicks);
        SCOPED_TRACE(clicks.toString().toStdString());
        makeSelector();
        selector->setPossible("*");
        selector->setCanSelectNone(c.canSelectNone);
        selector->setSujeitoValueType("A");
        click(clicks.chopped(1));
        events.clear();
        click(clicks.last(1));
        EXPECT_EQ(pressed(), c.pressed);
        EXPECT_EQ(events.join(' '), c.events);
    }
}

TEST_F(SubjectSelector, theHostMayDeleteItInClickedOrWhileItsListIsOpen)
{
    auto declaration
        = declarationWith({ { "D1", "234567813", "ANA RITA LOPES" }, { "D2", "246813571", "TIAGO LOPES" } });
    selector->setIRSClass(declaration.get());
    subject::setListMenuPresenter([&](QMenu &, const QPoint &) {
        delete alive.data();
        return nullptr;
    });
    click(u"D");
    EXPECT_TRUE(alive.isNull());

    makeSelector();
    QObject::connect(selector, &cSujeitoSelector::Clicked, [&] { delete alive.data(); });
    click(u"B");
    EXPECT_TRUE(alive.isNull());
}

// A kind with more than one subject offers them in a list under its button: short names, or
// the kind's caption where there is none; ascendants' names come from the NIF information.
TEST_F(SubjectSelector, listsOfDependantsAndAscendants)
{
    auto declaration = declarationWith(
        { { "D1", "234567813", "ANA RITA LOPES" }, { "D2", "246813571", "TIAGO ANDRÉ FERREIRA LOPES" },
            { "D3", "255555558", "" }, { "S1", "PT182937461", "NOT THIS NAME" }, { "S2", "", "" } });
    declaration->DeclarationData().NifInfoStore().Write("PT182937461.nome", "MARIA DA CONCEIÇÃO FERREIRA");
    selector->setPossible("*");
    selector->setIRSClass(declaration.get());
    const struct
    {
        char16_t kind;
        int choice;
        QStringList items;
        const char *selected, *caption, *events;
    } steps[] = {
        { u'D', 2, { "=== Listagem de DEPENDENTES === (off)", "D1 - Ana R. Lopes", "D2 - Tiago Lopes", "Dependente 3" },
            "D2", "Tiago Lopes", "Clicked Changed Changed" }, // the item, then the click
        // There is no third ascendant to choose: the first is taken.
        { u'S', 3, { "=== Listagem de ASCENDENTES === (off)", "S1 - Maria Ferreira", "Ascendente 2" }, "S1",
            "Maria Ferreira", "Clicked Changed" },
    };
    for (const auto &step : steps) {
        SCOPED_TRACE(step.selected);
        choice = step.choice;
        events.clear();
        click(QStringView(&step.kind, 1));
        EXPECT_EQ(listItems, step.items);
        EXPECT_EQ(listPosition, selector->mapToGlobal(QPoint(button(step.kind)->x(), button(step.kind)->height())));
        EXPECT_EQ(selector->SelectedSujeito(), step.selected);
        EXPECT_EQ(button(step.kind)->Caption(), step.caption);
        EXPECT_EQ(selector->SelectedNIF(), declaration->DeclarationData().SubjectNif(step.selected));
        EXPECT_EQ(events.join(' '), step.events);
    }
    choice = 0;
    click(u"D");
    EXPECT_EQ(listItems.filter("[x]"), QStringList()) << "nothing is chosen after another kind";
    EXPECT_EQ(selector->SelectedSujeito(), "D1") << "a dismissed list chooses the first";
}

// One subject of a kind is chosen without a list.
TEST_F(SubjectSelector, namesAndNumbersComeFromTheDeclaration)
{
    click(u"D");
    EXPECT_EQ(selector->SelectedSujeito(), "D1") << "without a declaration";
    selector->setSelectedSujeito("A");
    EXPECT_EQ(button('A')->Caption(), "Sujeito A");

    auto declaration = declarationWith({ { "D1", "234567813", "MARTA SOFIA FERREIRA LOPES" } });
    selector->setIRSClass(declaration.get());
    EXPECT_EQ(button('A')->Caption(), "Ana M. Lopes");
    EXPECT_EQ(button('B')->accessibleName(), "Rui P. Lopes") << "a screen reader hears whom a button holds";
    EXPECT_EQ(selector->SelectedNIF("B"), "198765436");
    click(u"D");
    EXPECT_EQ(lists, 0);
    EXPECT_EQ(selector->SelectedNIF(), "234567813");
    selector->setSelectedSujeito("A");

    declaration.reset();
    EXPECT_EQ(selector->IRSClass(), nullptr) << "a borrowed declaration that went away";
    EXPECT_EQ(selector->SelectedNIF(), "");
    selector->RefreshButtonCaption();
    EXPECT_EQ(button('A')->Caption(), "Sujeito A");
}

TEST_F(SubjectSelector, persistsPossibleAsStoredAndCanSelectNone)
{
    PropertyBag stored;
    stored.WriteProperty("Possible", "DA");
    stored.WriteProperty("CanSelectNone", true);
    selector->Load(stored);
    EXPECT_EQ(selector->Possible(), "DA") << "kept as stored";
    EXPECT_TRUE(selector->CanSelectNone());
    EXPECT_EQ(selector->Save(), stored);
}

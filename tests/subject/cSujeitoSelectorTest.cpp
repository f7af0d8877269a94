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

// Stands in for the user at the list menu: records its items ("[x]" marks a checked one,
// " (off)" a disabled one) and chooses the item of index `choice` (0 dismisses the menu).
class ListMenuDriver
{
public:
    explicit ListMenuDriver(int choice)
        : choice(choice)
        , m_previous(subject::setListMenuPresenter([this](QMenu &menu, const QPoint &pos) {
            ++shown;
            position = pos;
            items.clear();
            QAction *chosen = nullptr;
            for (QAction *action : menu.actions()) {
                if (!action->isVisible())
                    continue;
                items << (action->isChecked() ? "[x]" : "") + action->text() + (action->isEnabled() ? "" : " (off)");
                if (this->choice > 0 && action->property("Index").toInt() == this->choice) {
                    action->trigger(); // as the menu does; this also flips the check mark
                    chosen = action;
                }
            }
            return chosen;
        }))
    { }
    ~ListMenuDriver() { subject::setListMenuPresenter(std::move(m_previous)); }

    int choice;
    int shown = 0;
    QPoint position;
    QStringList items;

private:
    subject::ListMenuPresenter m_previous;
};

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
        form.resize(800, 100);
        form.show();
        makeSelector();
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
};

} // namespace

TEST_F(SubjectSelector, possibleKeepsTheKindsInButtonOrder)
{
    // All kinds; C only with B; button order; case-sensitive letters, others ignored.
    for (const auto &[written, stored] :
        { std::pair { "*", "ABDSFCH" }, { "HCA", "AH" }, { "HBCA", "ABCH" }, { "xSd-D", "DS" } }) {
        selector->setPossible(QString::fromLatin1(written));
        EXPECT_EQ(selector->Possible(), stored) << written;
    }
    QString empty;
    selector->setPossible(empty);
    EXPECT_EQ(selector->Possible(), "ABD");
    EXPECT_EQ(empty, "ABD") << "the replacement goes back to the caller";
}

TEST_F(SubjectSelector, onlyPossibleKindsTakeRoomFromTheLeft)
{
    selector->setPossible("HBA");
    selector->setSujeitoValueType("B");
    for (const QChar kind : QStringView(u"ABDSFCH"))
        EXPECT_EQ(button(kind)->isVisible(), QStringView(u"ABH").contains(kind)) << QString(kind).toStdString();

    EXPECT_EQ(button('A')->Left(), 0);
    EXPECT_EQ(button('B')->Left(), 495) << "500 twips in whole pixels";
    EXPECT_EQ(button('B')->Width(), 2490);
    EXPECT_EQ(button('C')->ToolTip(), "Sujeitos A e B");
    EXPECT_EQ(button('H')->Left(), 3000) << "placed in twips, not in rounded pixels";

    EXPECT_EQ(selector->findChild<QFrame *>("Line1")->x(), button('B')->x());
    button('A')->setHeight(450);
    selector->resize(selector->width() + 10, selector->height());
    EXPECT_EQ(selector->height(), (450 + 60) / 15) << "the height follows button A";

    // Pictures go by the kind's letter, also of a lower-case identifier.
    QImage image(8, 8, QImage::Format_ARGB32);
    image.fill(Qt::red);
    selector->setImageFile("d2", Picture(image));
    EXPECT_EQ(button('D')->Picture().image(), image);
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
        { "SelectedSujeito", "F2", "F", "F", nullptr },
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
        for (const QChar kind : QStringView(u"ABDSFH"))
            EXPECT_EQ(button(kind)->Caption().isEmpty(), !pressed().contains(kind)) << "captions only when pressed";
    }
}

TEST_F(SubjectSelector, theHostMayDeleteItInClickedOrWhileItsListIsOpen)
{
    auto declaration
        = declarationWith({ { "D1", "234567813", "ANA RITA LOPES" }, { "D2", "246813571", "TIAGO LOPES" } });
    selector->setIRSClass(declaration.get());
    const subject::ListMenuPresenter previous = subject::setListMenuPresenter([&](QMenu &, const QPoint &) {
        delete alive.data();
        return nullptr;
    });
    click(u"D");
    subject::setListMenuPresenter(previous);
    EXPECT_TRUE(alive.isNull());

    makeSelector();
    QObject::connect(selector, &cSujeitoSelector::Clicked, [&] { delete alive.data(); });
    click(u"B");
    EXPECT_TRUE(alive.isNull());
}

// A kind with more than one subject offers them in a list under its button: short names, or
// the kind's caption where there is none; ascendants' names come from the NIF information.
TEST_F(SubjectSelector, listsOfDependantsAscendantsAndEstates)
{
    auto declaration = declarationWith(
        { { "D1", "234567813", "ANA RITA LOPES" }, { "D2", "246813571", "TIAGO ANDRÉ FERREIRA LOPES" },
            { "D3", "255555558", "" }, { "S1", "PT182937461", "NOT THIS NAME" }, { "S2", "", "" },
            { "H1", "700123458", "HERANÇA DE JOSÉ LOPES" }, { "H2", "700123466", "" }, { "H3", "700123474", "" } });
    declaration->DeclarationData().NifInfoStore().Write("PT182937461.nome", "MARIA DA CONCEIÇÃO FERREIRA");
    declaration->DeclarationData().FieldStore().Set("herancas", "3");
    selector->setPossible("*");
    selector->setIRSClass(declaration.get());
    const struct
    {
        char16_t kind;
        int choice;
        QStringList items;
        const char *selected, *caption, *events;
    } lists[] = {
        { u'D', 2, { "=== Listagem de DEPENDENTES === (off)", "D1 - Ana R. Lopes", "D2 - Tiago Lopes", "Dependente 3" },
            "D2", "Tiago Lopes", "Clicked Changed Changed" }, // the item, then the click
        // There is no third ascendant to choose: the first is taken.
        { u'S', 3, { "=== Listagem de ASCENDENTES === (off)", "S1 - Maria Ferreira", "Ascendente 2" }, "S1",
            "Maria Ferreira", "Clicked Changed" },
        { u'H', 3, { "=== Listagem das HERANÇAS INDIVISAS === (off)", "H1 - Herança Lopes", "Herança 2", "Herança 3" },
            "H3", "Herança 3", "Clicked Changed Changed" },
    };
    ListMenuDriver menu(0);
    for (const auto &list : lists) {
        SCOPED_TRACE(list.selected);
        menu.choice = list.choice;
        events.clear();
        click(QStringView(&list.kind, 1));
        EXPECT_EQ(menu.items, list.items);
        EXPECT_EQ(menu.position, selector->mapToGlobal(QPoint(button(list.kind)->x(), button(list.kind)->height())));
        EXPECT_EQ(selector->SelectedSujeito(), list.selected);
        EXPECT_EQ(button(list.kind)->Caption(), list.caption);
        EXPECT_EQ(selector->SelectedNIF(), declaration->DeclarationData().SubjectNif(list.selected));
        EXPECT_EQ(events.join(' '), list.events);
    }
    EXPECT_EQ(selector->SelectedNIF(), "700123474");
    click(u"F");
    EXPECT_EQ(selector->SelectedSujeito(), "F") << "the index does not follow to another kind";

    menu.choice = 0;
    menu.shown = 0;
    click(u"D");
    EXPECT_EQ(menu.items.filter("[x]"), QStringList()) << "nothing is chosen after another kind";
    EXPECT_EQ(selector->SelectedSujeito(), "D1") << "a dismissed list chooses the first";
    click(u"D");
    EXPECT_EQ(menu.shown, 1) << "a chosen dependant is kept when D is clicked again";
    EXPECT_EQ(selector->SelectedSujeito(), "D1");
}

// One subject of a kind is chosen without a list.
TEST_F(SubjectSelector, namesAndNumbersComeFromTheDeclaration)
{
    ListMenuDriver menu(0);
    click(u"D");
    EXPECT_EQ(selector->SelectedSujeito(), "D1") << "without a declaration";
    selector->setSelectedSujeito("A");
    EXPECT_EQ(selector->SelectedNIF(), "");
    EXPECT_EQ(button('A')->Caption(), "Sujeito A");

    QObject notADeclaration;
    selector->setIRSClass(&notADeclaration);
    EXPECT_EQ(selector->IRSClass(), nullptr);

    auto declaration = declarationWith({ { "D1", "234567813", "MARTA SOFIA FERREIRA LOPES" } });
    selector->setIRSClass(declaration.get());
    EXPECT_EQ(button('A')->Caption(), "Ana M. Lopes");
    EXPECT_EQ(button('B')->accessibleName(), "Rui P. Lopes") << "a screen reader hears whom a button holds";
    EXPECT_EQ(selector->SelectedNIF(), "210345675");
    EXPECT_EQ(selector->SelectedNIF("B"), "198765436");
    click(u"D");
    EXPECT_EQ(menu.shown, 0);
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
    EXPECT_TRUE(selector->Save().isEmpty()) << "defaults are not stored";
    PropertyBag stored;
    stored.WriteProperty("Possible", "DA");
    stored.WriteProperty("CanSelectNone", true);
    selector->Load(stored);
    EXPECT_EQ(selector->Possible(), "DA") << "kept as stored";
    EXPECT_TRUE(selector->CanSelectNone());
    EXPECT_EQ(selector->Save(), stored);
}

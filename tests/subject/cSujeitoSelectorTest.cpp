#include "subject/cSujeitoSelector.h"
#include "subject/ListMenuPresenter.h"

#include "companion/CommandButton.h"
#include "companion/JsonDeclaration.h"
#include "frame/ClassRegistry.h"

#include "support/TestSupport.h"

#include <QAction>
#include <QFrame>
#include <QMenu>
#include <QTest>

#include <gtest/gtest.h>

using namespace zelctl;

namespace {

// What the list menu showed, and which item the "user" chose from it.
class ListMenuDriver
{
public:
    struct Item
    {
        QString text;
        bool checked;
        bool enabled;
    };

    // Chooses the item of that index; 0 or a missing index dismisses the menu.
    explicit ListMenuDriver(int choice)
        : m_previous(subject::setListMenuPresenter([this, choice](QMenu &menu, const QPoint &pos) {
            ++shown;
            position = pos;
            items.clear();
            QAction *chosen = nullptr;
            for (QAction *action : menu.actions()) {
                if (!action->isVisible())
                    continue;
                items.append({ action->text(), action->isChecked(), action->isEnabled() });
                if (choice > 0 && action->property("Index").toInt() == choice) {
                    // As the menu does: the chosen item is triggered, and flips its check mark.
                    action->trigger();
                    chosen = action;
                }
            }
            return chosen;
        }))
    { }
    ~ListMenuDriver() { subject::setListMenuPresenter(std::move(m_previous)); }

    QStringList texts() const
    {
        QStringList result;
        for (const Item &item : items)
            result << item.text;
        return result;
    }

    int shown = 0;
    QPoint position;
    QList<Item> items;

private:
    subject::ListMenuPresenter m_previous;
};

// A declaration of a married couple; more subjects are added per test.
std::unique_ptr<companion::JsonDeclaration> couple()
{
    auto declaration = std::make_unique<companion::JsonDeclaration>();
    companion::FieldCollection &fields = declaration->DeclarationData().FieldStore();
    fields.Set("casado", "1");
    declaration->setSubject("A", { "210345675", "ANA MARIA FERREIRA LOPES" });
    declaration->setSubject("B", { "198765436", "RUI PEDRO SOUSA LOPES" });
    return declaration;
}

class SubjectSelector : public ::testing::Test
{
protected:
    void SetUp() override
    {
        selector = new cSujeitoSelector(&form);
        form.resize(800, 100);
        form.show();
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

    void click(QChar kind)
    {
        CommandButton *b = button(kind);
        ASSERT_TRUE(b->isVisible()) << QString(kind).toStdString();
        QTest::mouseClick(b, Qt::LeftButton);
    }

    QWidget form;
    cSujeitoSelector *selector = nullptr;
    QStringList events;
};

} // namespace

TEST(SubjectSelectorClass, isCreatedByName)
{
    std::unique_ptr<QObject> object(CreateObject("UKAZELCTL.cSujeitoSelector"));
    ASSERT_NE(qobject_cast<cSujeitoSelector *>(object.get()), nullptr);
    EXPECT_EQ(object->property("Possible").toString(), "ABD");
}

TEST_F(SubjectSelector, possibleKeepsTheKindsInButtonOrder)
{
    const struct
    {
        const char *written;
        const char *stored;
    } cases[] = {
        { "*", "ABDSFCH" },
        { "HCA", "AH" }, // C only with B
        { "HBCA", "ABCH" },
        { "xSd-D", "DS" }, // letters are case-sensitive, others ignored
        { "ABDSFCH", "ABDSFCH" },
    };
    for (const auto &c : cases) {
        selector->setPossible(QString::fromLatin1(c.written));
        EXPECT_EQ(selector->Possible(), c.stored) << c.written;
    }

    QString empty;
    selector->setPossible(empty);
    EXPECT_EQ(selector->Possible(), "ABD");
    EXPECT_EQ(empty, "ABD") << "the replacement goes back to the caller";

    QString byName;
    selector->setPossible("AB");
    ASSERT_TRUE(QMetaObject::invokeMethod(selector, "setPossible", Q_ARG(QString &, byName)));
    EXPECT_EQ(byName, "ABD");
    EXPECT_EQ(selector->Possible(), "ABD");

    ASSERT_TRUE(selector->setProperty("Possible", QString()));
    EXPECT_EQ(selector->property("Possible").toString(), "ABD");
}

TEST_F(SubjectSelector, onlyPossibleKindsTakeRoomFromTheLeft)
{
    selector->setPossible("HBA");
    selector->setSujeitoValueType("B");
    EXPECT_TRUE(button('A')->isVisible());
    EXPECT_TRUE(button('B')->isVisible());
    EXPECT_TRUE(button('H')->isVisible());
    for (const QChar hidden : QStringView(u"DSFC"))
        EXPECT_FALSE(button(hidden)->isVisible()) << QString(hidden).toStdString();

    EXPECT_EQ(button('A')->Left(), 0);
    EXPECT_EQ(button('B')->Left(), 495) << "500 twips in whole pixels";
    EXPECT_EQ(button('B')->Width(), 2490);
    EXPECT_EQ(button('B')->Caption(), "Sujeito B");
    EXPECT_EQ(button('A')->Caption(), "");
    EXPECT_EQ(button('C')->ToolTip(), "Sujeitos A e B");
    EXPECT_EQ(button('H')->Left(), 3000) << "placed in twips, not in rounded pixels";
    EXPECT_EQ(selector->sizeHint().width(), button('H')->geometry().right() + 1);

    const auto *line = selector->findChild<QFrame *>("Line1");
    ASSERT_NE(line, nullptr);
    EXPECT_TRUE(line->isVisible());
    EXPECT_EQ(line->x(), button('B')->x());
    EXPECT_EQ(line->y(), (button('B')->Height() + 30) / 15);
    EXPECT_EQ(selector->height(), (button('A')->Height() + 60) / 15);

    button('A')->setHeight(450);
    selector->resize(selector->width() + 10, selector->height());
    EXPECT_EQ(selector->height(), (450 + 60) / 15) << "the height follows button A";
}

TEST_F(SubjectSelector, picturesByKindLetter)
{
    EXPECT_NE(selector->ImageFile("A"), selector->ImageFile("B"));
    EXPECT_FALSE(selector->ImageFile("H").isNull());

    QImage image(8, 8, QImage::Format_ARGB32);
    image.fill(Qt::red);
    const Picture red(image);
    selector->setImageFile("d2", red);
    EXPECT_EQ(selector->ImageFile("D"), red) << "the letter of a lower-case identifier";
    EXPECT_EQ(button('D')->Picture(), red);
    selector->setImageFile("X", Picture());
    EXPECT_TRUE(selector->ImageFile("X").isNull());
    EXPECT_EQ(selector->ImageFile("D"), red);
}

TEST_F(SubjectSelector, selectingAndReadingBack)
{
    selector->setPossible("*");
    selector->setSelectedSujeito("D2");
    EXPECT_EQ(pressed(), "D");
    EXPECT_EQ(selector->SujeitoValueType(), "D");
    EXPECT_EQ(selector->SelectedSujeitoIndex(), 2);
    EXPECT_EQ(selector->SelectedSujeito(), "D2");
    EXPECT_EQ(button('D')->Caption(), "Dependente 2");
    EXPECT_EQ(button('D')->Width(), 2490);

    selector->setSujeitoValueType("S");
    EXPECT_EQ(selector->SelectedSujeito(), "S");
    EXPECT_EQ(selector->SelectedSujeitoIndex(), 0);
    EXPECT_EQ(button('S')->Caption(), "Ascendente") << "no index left over from the dependant";

    selector->setSelectedSujeitoIndex(3);
    EXPECT_EQ(selector->SelectedSujeito(), "S3");
    EXPECT_EQ(button('S')->Caption(), "Ascendente 3");
    selector->setSelectedSujeito("H1");
    EXPECT_EQ(selector->SelectedSujeito(), "H1");
    selector->setProperty("SelectedSujeito", "A");
    EXPECT_EQ(selector->property("SelectedSujeito").toString(), "A");

    selector->setSelectedSujeito("Dx");
    EXPECT_EQ(selector->SelectedSujeito(), "D") << "no number, no index";
    selector->setSelectedSujeito("H40000");
    EXPECT_EQ(selector->SelectedSujeito(), "H") << "beyond a 16-bit index";

    selector->setSujeitoValueType("");
    EXPECT_EQ(pressed(), "A");
    selector->setSujeitoValueType("X");
    EXPECT_EQ(pressed(), "");
    EXPECT_EQ(selector->SujeitoValueType(), "");
    EXPECT_EQ(selector->SelectedSujeito(), "");
    EXPECT_FALSE(selector->findChild<QFrame *>("Line1")->isVisible());
}

TEST_F(SubjectSelector, theIndexBelongsToDependantsAscendantsAndEstatesOnly)
{
    selector->setPossible("*");
    for (const QChar kind : QStringView(u"ABCF")) {
        selector->setSujeitoValueType(QString(kind));
        selector->setSelectedSujeitoIndex(3);
        EXPECT_EQ(selector->SelectedSujeitoIndex(), 0) << QString(kind).toStdString();
        EXPECT_EQ(selector->SelectedSujeito(), QString(kind));
    }
    selector->setSelectedSujeito("F2");
    EXPECT_EQ(selector->SelectedSujeito(), "F");
    for (const QChar kind : QStringView(u"DSH")) {
        selector->setSujeitoValueType(QString(kind));
        selector->setSelectedSujeitoIndex(3);
        EXPECT_EQ(selector->SelectedSujeito(), QString(kind) + "3");
    }
}

TEST_F(SubjectSelector, emptyChoiceOnlyWithCanSelectNone)
{
    selector->setSelectedSujeito("D2");
    selector->setSelectedSujeito("");
    EXPECT_EQ(selector->SelectedSujeito(), "A");

    selector->setCanSelectNone(true);
    selector->setSelectedSujeito("");
    EXPECT_EQ(pressed(), "");
    EXPECT_EQ(selector->SelectedSujeito(), "");
    for (const QChar kind : QStringView(u"ABD"))
        EXPECT_EQ(button(kind)->Caption(), "");
    EXPECT_TRUE(events.isEmpty()) << "writing raises no event";
}

TEST_F(SubjectSelector, clickingAKindRaisesClickedThenChanged)
{
    selector->setSujeitoValueType("A");
    click('B');
    EXPECT_EQ(pressed(), "B");
    EXPECT_EQ(button('B')->Caption(), "Sujeito B");
    EXPECT_EQ(button('A')->Caption(), "");
    EXPECT_EQ(events, QStringList({ "Clicked", "Changed" }));

    events.clear();
    click('B');
    EXPECT_EQ(pressed(), "B") << "the only pressed button stays pressed";
    EXPECT_EQ(events, QStringList({ "Clicked", "Changed" }));
    EXPECT_TRUE(selector->findChild<QFrame *>("Line1")->isVisible());
}

TEST_F(SubjectSelector, secondClickEmptiesTheChoiceWithCanSelectNone)
{
    selector->setCanSelectNone(true);
    selector->setSujeitoValueType("A");
    click('A');
    EXPECT_EQ(pressed(), "A") << "a first click on a pressed button does not empty the choice";
    events.clear();

    click('A');
    EXPECT_EQ(pressed(), "");
    EXPECT_EQ(selector->SelectedSujeito(), "");
    EXPECT_EQ(events, QStringList({ "Changed" }));
    EXPECT_FALSE(selector->findChild<QFrame *>("Line1")->isVisible());

    events.clear();
    click('A');
    EXPECT_EQ(selector->SelectedSujeito(), "A") << "the remembered click was forgotten";
    EXPECT_EQ(events, QStringList({ "Clicked", "Changed" }));

    click('B');
    click('A');
    EXPECT_EQ(selector->SelectedSujeito(), "A") << "only a click on the same button is a second click";
}

TEST_F(SubjectSelector, agregadoKeepsTaxpayerB)
{
    selector->setPossible("*");
    selector->setSujeitoValueType("B");
    click('C');
    EXPECT_EQ(pressed(), "BC");
    selector->setSujeitoValueType("A");
    click('C');
    EXPECT_EQ(pressed(), "C");
    EXPECT_EQ(selector->SelectedSujeito(), "C");
    click('B');
    EXPECT_EQ(pressed(), "B") << "B does not keep C";
}

TEST_F(SubjectSelector, oneSubjectOfAKindIsChosenWithoutAList)
{
    ListMenuDriver menu(0);
    click('D');
    EXPECT_EQ(menu.shown, 0);
    EXPECT_EQ(selector->SelectedSujeito(), "D1") << "without a declaration";
    EXPECT_EQ(button('D')->Caption(), "Dependente 1");

    auto declaration = couple();
    declaration->setSubject("D1", { "234567813", "MARTA SOFIA FERREIRA LOPES" });
    selector->setIRSClass(declaration.get());
    selector->setSujeitoValueType("A");
    events.clear();
    click('D');
    EXPECT_EQ(menu.shown, 0);
    EXPECT_EQ(selector->SelectedSujeito(), "D1");
    EXPECT_EQ(button('D')->Caption(), "Dependente 1") << "the declaration's title of D1";
    EXPECT_EQ(events, QStringList({ "Clicked", "Changed" }));
}

TEST_F(SubjectSelector, listOfDependants)
{
    auto declaration = couple();
    declaration->setSubject("D1", { "234567813", "ANA RITA LOPES" });
    declaration->setSubject("D2", { "246813571", "TIAGO ANDRÉ FERREIRA LOPES" });
    declaration->setSubject("D3", { "255555558", "" });
    selector->setIRSClass(declaration.get());
    selector->setSujeitoValueType("A");

    {
        ListMenuDriver menu(2);
        click('D');
        ASSERT_EQ(menu.shown, 1);
        EXPECT_EQ(menu.texts(),
            QStringList(
                { "=== Listagem de DEPENDENTES ===", "D1 - Ana R. Lopes", "D2 - Tiago Lopes", "Dependente 3" }));
        EXPECT_FALSE(menu.items.at(0).enabled) << "the heading is no choice";
        EXPECT_EQ(menu.position, selector->mapToGlobal(QPoint(button('D')->x(), button('D')->height())));
        EXPECT_EQ(selector->SelectedSujeito(), "D2");
        EXPECT_EQ(button('D')->Caption(), "Tiago Lopes");
        EXPECT_EQ(selector->SelectedNIF(), "246813571");
        EXPECT_EQ(events, QStringList({ "Clicked", "Changed", "Changed" })) << "the item, then the click";
    }
    {
        ListMenuDriver menu(0);
        click('D');
        EXPECT_EQ(menu.shown, 0) << "a chosen dependant is kept when D is clicked again";
        EXPECT_EQ(selector->SelectedSujeito(), "D2");

        click('A');
        click('D');
        ASSERT_EQ(menu.shown, 1);
        for (const ListMenuDriver::Item &item : menu.items)
            EXPECT_FALSE(item.checked) << item.text.toStdString() << ": nothing is chosen now";
        EXPECT_EQ(selector->SelectedSujeito(), "D1") << "a dismissed list chooses the first";
    }
    {
        auto shorter = couple();
        shorter->setSubject("D1", { "234567813", "" });
        shorter->setSubject("D2", { "246813571", "" });
        selector->setIRSClass(shorter.get());
        ListMenuDriver menu(0);
        click('A');
        click('D');
        EXPECT_EQ(menu.texts(), QStringList({ "=== Listagem de DEPENDENTES ===", "Dependente 1", "Dependente 2" }));
        selector->setIRSClass(nullptr);
    }
}

TEST_F(SubjectSelector, listsOfAscendantsAndEstates)
{
    auto declaration = couple();
    declaration->setSubject("S1", { "PT182937461", "NOT THIS NAME" });
    declaration->setSubject("S2", { "", "" });
    declaration->DeclarationData().NifInfoStore().Write("PT182937461.nome", "MARIA DA CONCEIÇÃO FERREIRA");
    declaration->setSubject("H1", { "700123458", "HERANÇA DE JOSÉ LOPES" });
    declaration->setSubject("H2", { "700123466", "" });
    declaration->setSubject("H3", { "700123474", "" });
    declaration->DeclarationData().FieldStore().Set("herancas", "3");
    selector->setPossible("*");
    selector->setIRSClass(declaration.get());

    ListMenuDriver menu(3);
    click('S');
    EXPECT_EQ(menu.texts(), QStringList({ "=== Listagem de ASCENDENTES ===", "S1 - Maria Ferreira", "Ascendente 2" }))
        << "ascendants' names come from the NIF information";
    EXPECT_EQ(selector->SelectedSujeito(), "S1") << "there is no third ascendant to choose";

    click('H');
    EXPECT_EQ(menu.texts(),
        QStringList({ "=== Listagem das HERANÇAS INDIVISAS ===", "H1 - Herança Lopes", "Herança 2", "Herança 3" }));
    EXPECT_EQ(selector->SelectedSujeito(), "H3");
    EXPECT_EQ(button('H')->Caption(), "Herança 3");
    EXPECT_EQ(selector->SelectedNIF(), "700123474");
}

TEST_F(SubjectSelector, anIndexDoesNotFollowTheUserToAnotherKind)
{
    auto declaration = couple();
    declaration->setSubject("D1", { "234567813", "" });
    declaration->setSubject("D2", { "246813571", "" });
    declaration->setSubject("S1", { "182937461", "" });
    selector->setPossible("*");
    selector->setIRSClass(declaration.get());
    selector->setSelectedSujeito("D2");

    ListMenuDriver menu(0);
    click('S');
    EXPECT_EQ(selector->SelectedSujeito(), "S1") << "the declaration has one ascendant";
    click('F');
    EXPECT_EQ(selector->SelectedSujeito(), "F");
}

TEST_F(SubjectSelector, namesAndNumbersComeFromTheDeclaration)
{
    selector->setSelectedSujeito("A");
    EXPECT_EQ(selector->SelectedNIF(), "");
    EXPECT_EQ(selector->SelectedNIF("B"), "");
    EXPECT_EQ(button('A')->Caption(), "Sujeito A");

    auto declaration = couple();
    QObject notADeclaration;
    selector->setIRSClass(&notADeclaration);
    EXPECT_EQ(selector->IRSClass(), nullptr);

    selector->setIRSClass(declaration.get());
    EXPECT_EQ(selector->IRSClass(), declaration.get());
    EXPECT_EQ(button('A')->Caption(), "Ana M. Lopes");
    EXPECT_EQ(selector->SelectedNIF(), "210345675");
    EXPECT_EQ(selector->SelectedNIF("B"), "198765436");
    EXPECT_EQ(selector->property("SelectedNIF").toString(), "210345675");
    selector->setProperty("SelectedNIF", "999999990");
    EXPECT_EQ(selector->SelectedNIF(), "210345675") << "writing is ignored";

    declaration.reset();
    EXPECT_EQ(selector->IRSClass(), nullptr) << "a borrowed declaration that went away";
    EXPECT_EQ(selector->SelectedNIF(), "");
    selector->RefreshButtonCaption();
    EXPECT_EQ(button('A')->Caption(), "Sujeito A");
}

TEST_F(SubjectSelector, persistsPossibleAndCanSelectNone)
{
    EXPECT_TRUE(selector->Save().isEmpty()) << "defaults are not stored";

    selector->setPossible("*");
    selector->setCanSelectNone(true);
    const PropertyBag bag = selector->Save();
    EXPECT_EQ(bag.ReadProperty("Possible").toString(), "ABDSFCH");
    EXPECT_EQ(bag.ReadProperty("CanSelectNone").toBool(), true);

    cSujeitoSelector loaded(&form);
    loaded.Load(bag);
    EXPECT_EQ(loaded.Possible(), "ABDSFCH");
    EXPECT_TRUE(loaded.CanSelectNone());

    PropertyBag stored;
    stored.WriteProperty("Possible", "DA");
    loaded.Load(stored);
    EXPECT_EQ(loaded.Possible(), "DA") << "kept as stored";
    EXPECT_FALSE(loaded.CanSelectNone());
}

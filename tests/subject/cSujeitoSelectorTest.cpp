#include "subject/cSujeitoSelector.h"
#include "subject/ListMenuPresenter.h"

#include "companion/CommandButton.h"
#include "companion/JsonDeclaration.h"
#include "frame/ClassRegistry.h"

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
        : m_previous(subject::setListMenuPresenter([this, choice](QMenu &menu, const QPoint &pos) {
            ++shown;
            position = pos;
            items.clear();
            QAction *chosen = nullptr;
            for (QAction *action : menu.actions()) {
                if (!action->isVisible())
                    continue;
                items << (action->isChecked() ? "[x]" : "") + action->text() + (action->isEnabled() ? "" : " (off)");
                if (choice > 0 && action->property("Index").toInt() == choice) {
                    action->trigger(); // as the menu does; this also flips the check mark
                    chosen = action;
                }
            }
            return chosen;
        }))
    { }
    ~ListMenuDriver() { subject::setListMenuPresenter(std::move(m_previous)); }

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
    EXPECT_EQ(pressed(), "B");
    for (const QChar kind : QStringView(u"ABDSFCH"))
        EXPECT_EQ(button(kind)->isVisible(), QStringView(u"ABH").contains(kind)) << QString(kind).toStdString();

    EXPECT_EQ(button('A')->Left(), 0);
    EXPECT_EQ(button('B')->Left(), 495) << "500 twips in whole pixels";
    EXPECT_EQ(button('B')->Width(), 2490);
    EXPECT_EQ(button('B')->Caption(), "Sujeito B");
    EXPECT_EQ(button('C')->ToolTip(), "Sujeitos A e B");
    EXPECT_EQ(button('H')->Left(), 3000) << "placed in twips, not in rounded pixels";

    EXPECT_TRUE(underlined());
    EXPECT_EQ(selector->findChild<QFrame *>("Line1")->x(), button('B')->x());
    button('A')->setHeight(450);
    selector->resize(selector->width() + 10, selector->height());
    EXPECT_EQ(selector->height(), (450 + 60) / 15) << "the height follows button A";
}

TEST_F(SubjectSelector, picturesByKindLetter)
{
    EXPECT_NE(selector->ImageFile("A"), selector->ImageFile("B"));
    QImage image(8, 8, QImage::Format_ARGB32);
    image.fill(Qt::red);
    const Picture red(image);
    selector->setImageFile("d2", red);
    EXPECT_EQ(selector->ImageFile("D"), red) << "the letter of a lower-case identifier";
    EXPECT_EQ(button('D')->Picture(), red);
}

TEST_F(SubjectSelector, selectingByEachPropertyAndReadingBack)
{
    selector->setPossible("*");
    selector->setSelectedSujeito("D2");
    EXPECT_EQ(pressed(), "D");
    EXPECT_EQ(selector->SujeitoValueType(), "D");
    EXPECT_EQ(selector->SelectedSujeitoIndex(), 2);
    EXPECT_EQ(button('D')->Caption(), "Dependente 2");

    selector->setSujeitoValueType("S");
    EXPECT_EQ(selector->SelectedSujeito(), "S") << "no index left over from the dependant";
    selector->setSelectedSujeitoIndex(3);
    EXPECT_EQ(selector->SelectedSujeito(), "S3");
    EXPECT_EQ(button('S')->Caption(), "Ascendente 3");

    for (const QChar kind : QStringView(u"ABCF")) {
        selector->setSujeitoValueType(QString(kind));
        selector->setSelectedSujeitoIndex(3);
        EXPECT_EQ(selector->SelectedSujeito(), QString(kind)) << "no index for " << QString(kind).toStdString();
    }
    selector->setSelectedSujeito("F2");
    EXPECT_EQ(selector->SelectedSujeito(), "F");
    selector->setSelectedSujeito("Dx");
    EXPECT_EQ(selector->SelectedSujeito(), "D") << "no number, no index";
    selector->setSelectedSujeito("H40000");
    EXPECT_EQ(selector->SelectedSujeito(), "H") << "beyond a 16-bit index";

    selector->setSujeitoValueType("X");
    EXPECT_EQ(pressed(), "");
    EXPECT_EQ(selector->SelectedSujeito(), "");
    EXPECT_FALSE(underlined());
    selector->setSelectedSujeito("");
    EXPECT_EQ(selector->SelectedSujeito(), "A") << "no empty choice without CanSelectNone";
    EXPECT_TRUE(events.isEmpty()) << "writing raises no event";
}

TEST_F(SubjectSelector, clicksRaiseClickedThenChangedAndASecondClickMayEmpty)
{
    selector->setPossible("*");
    selector->setSujeitoValueType("A");
    click(u"B");
    EXPECT_EQ(pressed(), "B");
    EXPECT_EQ(button('A')->Caption(), "");
    EXPECT_EQ(events, QStringList({ "Clicked", "Changed" }));

    events.clear();
    click(u"B");
    EXPECT_EQ(pressed(), "B") << "the only pressed button stays pressed";
    EXPECT_EQ(events, QStringList({ "Clicked", "Changed" }));

    click(u"C");
    EXPECT_EQ(pressed(), "BC") << "C keeps B's state";
    click(u"AC");
    EXPECT_EQ(pressed(), "C");
    click(u"B");
    EXPECT_EQ(pressed(), "B") << "B does not keep C";

    // With CanSelectNone a second click on the same button empties the choice.
    selector->setCanSelectNone(true);
    selector->setSujeitoValueType("A");
    click(u"A");
    EXPECT_EQ(pressed(), "A") << "a first click on a pressed button does not empty the choice";

    events.clear();
    click(u"A");
    EXPECT_EQ(selector->SelectedSujeito(), "");
    EXPECT_EQ(pressed(), "");
    EXPECT_EQ(events, QStringList({ "Changed" }));

    events.clear();
    click(u"A");
    EXPECT_EQ(selector->SelectedSujeito(), "A") << "the remembered click was forgotten";
    EXPECT_EQ(events, QStringList({ "Clicked", "Changed" }));
    click(u"BA");
    EXPECT_EQ(selector->SelectedSujeito(), "A") << "only a click on the same button is a second click";
}

TEST_F(SubjectSelector, oneSubjectOfAKindIsChosenWithoutAList)
{
    ListMenuDriver menu(0);
    click(u"D");
    EXPECT_EQ(selector->SelectedSujeito(), "D1") << "without a declaration";

    auto declaration = declarationWith({ { "D1", "234567813", "MARTA SOFIA FERREIRA LOPES" } });
    selector->setIRSClass(declaration.get());
    selector->setSujeitoValueType("A");
    events.clear();
    click(u"D");
    EXPECT_EQ(menu.shown, 0);
    EXPECT_EQ(selector->SelectedSujeito(), "D1");
    EXPECT_EQ(events, QStringList({ "Clicked", "Changed" }));
}

TEST_F(SubjectSelector, listOfDependants)
{
    auto declaration = declarationWith({ { "D1", "234567813", "ANA RITA LOPES" },
        { "D2", "246813571", "TIAGO ANDRÉ FERREIRA LOPES" }, { "D3", "255555558", "" } });
    selector->setIRSClass(declaration.get());
    {
        ListMenuDriver menu(2);
        click(u"D");
        EXPECT_EQ(menu.items,
            QStringList(
                { "=== Listagem de DEPENDENTES === (off)", "D1 - Ana R. Lopes", "D2 - Tiago Lopes", "Dependente 3" }));
        EXPECT_EQ(menu.position, selector->mapToGlobal(QPoint(button('D')->x(), button('D')->height())));
        EXPECT_EQ(selector->SelectedSujeito(), "D2");
        EXPECT_EQ(button('D')->Caption(), "Tiago Lopes");
        EXPECT_EQ(selector->SelectedNIF(), "246813571");
        EXPECT_EQ(events, QStringList({ "Clicked", "Changed", "Changed" })) << "the item, then the click";
    }
    ListMenuDriver menu(0);
    click(u"D");
    EXPECT_EQ(menu.shown, 0) << "a chosen dependant is kept when D is clicked again";
    EXPECT_EQ(selector->SelectedSujeito(), "D2");

    click(u"AD");
    ASSERT_EQ(menu.shown, 1);
    EXPECT_EQ(menu.items.filter("[x]"), QStringList()) << "nothing is chosen after A";
    EXPECT_EQ(selector->SelectedSujeito(), "D1") << "a dismissed list chooses the first";
}

TEST_F(SubjectSelector, theHostMayDeleteItInClickedOrWhileItsListIsOpen)
{
    auto declaration
        = declarationWith({ { "D1", "234567813", "ANA RITA LOPES" }, { "D2", "246813571", "TIAGO LOPES" } });
    selector->setIRSClass(declaration.get());
    QPointer<cSujeitoSelector> alive(selector);
    const subject::ListMenuPresenter previous = subject::setListMenuPresenter([&](QMenu &, const QPoint &) {
        delete alive.data();
        return nullptr;
    });
    click(u"D");
    subject::setListMenuPresenter(previous);
    EXPECT_TRUE(alive.isNull());

    selector = new cSujeitoSelector(&form);
    selector->show();
    alive = selector;
    QObject::connect(selector, &cSujeitoSelector::Clicked, [&] { delete alive.data(); });
    click(u"B");
    EXPECT_TRUE(alive.isNull());
}

TEST_F(SubjectSelector, listsOfAscendantsAndEstates)
{
    auto declaration = declarationWith({ { "S1", "PT182937461", "NOT THIS NAME" }, { "S2", "", "" },
        { "H1", "700123458", "HERANÇA DE JOSÉ LOPES" }, { "H2", "700123466", "" }, { "H3", "700123474", "" } });
    declaration->DeclarationData().NifInfoStore().Write("PT182937461.nome", "MARIA DA CONCEIÇÃO FERREIRA");
    declaration->DeclarationData().FieldStore().Set("herancas", "3");
    selector->setPossible("*");
    selector->setIRSClass(declaration.get());

    ListMenuDriver menu(3);
    click(u"S");
    EXPECT_EQ(menu.items.mid(1), QStringList({ "S1 - Maria Ferreira", "Ascendente 2" }))
        << "ascendants' names come from the NIF information";
    EXPECT_EQ(selector->SelectedSujeito(), "S1") << "there is no third ascendant to choose";

    click(u"H");
    EXPECT_EQ(menu.items,
        QStringList(
            { "=== Listagem das HERANÇAS INDIVISAS === (off)", "H1 - Herança Lopes", "Herança 2", "Herança 3" }));
    EXPECT_EQ(selector->SelectedSujeito(), "H3");
    EXPECT_EQ(button('H')->Caption(), "Herança 3");
    EXPECT_EQ(selector->SelectedNIF(), "700123474");
    click(u"F");
    EXPECT_EQ(selector->SelectedSujeito(), "F") << "the index does not follow to another kind";
}

TEST_F(SubjectSelector, namesAndNumbersComeFromTheDeclaration)
{
    selector->setSelectedSujeito("A");
    EXPECT_EQ(selector->SelectedNIF(), "");
    EXPECT_EQ(button('A')->Caption(), "Sujeito A");

    QObject notADeclaration;
    selector->setIRSClass(&notADeclaration);
    EXPECT_EQ(selector->IRSClass(), nullptr);

    auto declaration = declarationWith();
    selector->setIRSClass(declaration.get());
    EXPECT_EQ(button('A')->Caption(), "Ana M. Lopes");
    EXPECT_EQ(selector->SelectedNIF(), "210345675");
    EXPECT_EQ(selector->SelectedNIF("B"), "198765436");

    declaration.reset();
    EXPECT_EQ(selector->IRSClass(), nullptr) << "a borrowed declaration that went away";
    EXPECT_EQ(selector->SelectedNIF(), "");
    selector->RefreshButtonCaption();
    EXPECT_EQ(button('A')->Caption(), "Sujeito A");
}

TEST_F(SubjectSelector, persistsPossibleAndCanSelectNone)
{
    std::unique_ptr<QObject> byName(CreateObject("UKAZELCTL.cSujeitoSelector"));
    ASSERT_NE(qobject_cast<cSujeitoSelector *>(byName.get()), nullptr);
    EXPECT_TRUE(selector->Save().isEmpty()) << "defaults are not stored";

    selector->setPossible("*");
    selector->setCanSelectNone(true);
    cSujeitoSelector loaded(&form);
    loaded.Load(selector->Save());
    EXPECT_EQ(loaded.Possible(), "ABDSFCH");
    EXPECT_TRUE(loaded.CanSelectNone());

    PropertyBag stored;
    stored.WriteProperty("Possible", "DA");
    loaded.Load(stored);
    EXPECT_EQ(loaded.Possible(), "DA") << "kept as stored";
    EXPECT_FALSE(loaded.CanSelectNone());
}

#include "AccessibleEventSpy.h"

#include "nib/NibCheckDigits.h"
#include "nib/cNIB.h"
#include "nif/cNIF.h"
#include "platform/Settings.h"
#include "selection/frmSelectCountry.h"
#include "support/TestSupport.h"

#include <QLabel>
#include <QLineEdit>
#include <QPointer>
#include <QTest>

#include <gtest/gtest.h>

using namespace zelctl;
using namespace zelctl::test;

// What a screen reader hears of the two number entries, driven as a user drives them.
namespace {

class EntryAccessibility : public ::testing::Test
{
protected:
    void SetUp() override
    {
        // A valid number is not looked up: the holder's name is the test's to give.
        platform::SaveSetting("ZEL", "Config", "allowautonif", "0");
        form.show();
    }

    template <typename Control> Control *add()
    {
        auto *control = new Control(&form);
        control->InitNew();
        control->show();
        spy.clear();
        return control;
    }

    static QLineEdit *box(QWidget *control, int index = 0) { return control->findChildren<QLineEdit *>().at(index); }
    static QAccessibleInterface *accessible(QObject *object) { return QAccessible::queryAccessibleInterface(object); }

    AccessibleEventSpy spy;
    QWidget form;
};

TEST_F(EntryAccessibility, nifIsNamedByItsAccessibleNameLabelTooltipOrName)
{
    auto *nif = add<cNIF>();
    EXPECT_EQ(accessible(nif)->role(), QAccessible::EditableText);
    EXPECT_EQ(accessible(nif)->text(QAccessible::Name), "NIF");
    nif->extender().setName("txtNIF");
    EXPECT_EQ(accessible(nif)->text(QAccessible::Name), "txtNIF");
    nif->extender().setToolTipText("Contribuinte");
    EXPECT_EQ(accessible(nif)->text(QAccessible::Name), "Contribuinte");
    (new QLabel("&NIF do titular:", &form))->setBuddy(nif);
    EXPECT_EQ(accessible(nif)->text(QAccessible::Name), "NIF do titular:");
    nif->setAccessibleName("NIF do cônjuge");
    EXPECT_EQ(accessible(nif)->text(QAccessible::Name), "NIF do cônjuge");
}

TEST_F(EntryAccessibility, nifSaysItsValidityAndHolderAsTheUserTypes)
{
    auto *nif = add<cNIF>();
    QAccessibleInterface *iface = accessible(nif);
    QTest::keyClicks(box(nif), "123456789");
    EXPECT_EQ(iface->text(QAccessible::Value), "Portugal, 123456789");
    EXPECT_EQ(iface->text(QAccessible::Description), "NIF válido");
    EXPECT_TRUE(spy.values(nif).endsWith("Portugal, 123456789")) << "each keystroke is a value change";

    QTest::keyClick(box(nif), Qt::Key_Backspace);
    QTest::keyClick(box(nif), Qt::Key_8);
    EXPECT_EQ(iface->text(QAccessible::Description), "NIF inválido");
    EXPECT_TRUE(iface->state().invalid);
    EXPECT_TRUE(spy.changedStates(nif).invalid) << "heard as it happens";
    EXPECT_EQ(accessible(box(nif))->text(QAccessible::Name), "NIF") << "the box has the focus and speaks for it";
    EXPECT_EQ(accessible(box(nif))->text(QAccessible::Description), "NIF inválido");

    QTest::keyClick(box(nif), Qt::Key_Backspace);
    QTest::keyClick(box(nif), Qt::Key_9);
    spy.clear();
    nif->setNome("Maria Silva");
    EXPECT_EQ(iface->text(QAccessible::Description), "NIF válido. Titular: Maria Silva");
    EXPECT_EQ(spy.count(nif, QAccessible::DescriptionChanged), 1);
    nif->setEnabled(false);
    EXPECT_TRUE(spy.changedStates(nif).disabled);
}

TEST_F(EntryAccessibility, nifFlagIsAButtonNamedAfterTheCountryThatOpensTheCountryList)
{
    auto *nif = add<cNIF>();
    QAccessibleInterface *flag = accessible(nif->findChild<QWidget *>("cPicture"));
    EXPECT_EQ(flag->role(), QAccessible::Button);
    EXPECT_EQ(flag->text(QAccessible::Name), "Portugal");
    QTest::keyClicks(box(nif), "ES12345678Z");
    EXPECT_EQ(flag->text(QAccessible::Name), "Espanha");
    EXPECT_EQ(spy.count(flag->object(), QAccessible::NameChanged), 1);

    nif->setCountries(GSEL_OnlyEU);
    QStringList chosen = { "FR", "DE", "IT" };
    ModalDriver countryList([&chosen](QDialog &dialog) {
        qobject_cast<frmSelectCountry *>(&dialog)->setTag(chosen.takeFirst());
        return int(QDialog::Accepted);
    });
    flag->actionInterface()->doAction(QAccessibleActionInterface::pressAction());
    EXPECT_EQ(countryList.shownCount(), 0) << "whoever pressed has had the answer first";
    ASSERT_TRUE(QTest::qWaitFor([&] { return nif->CountryID() == "FR"; }));
    QTest::keyClick(box(nif), Qt::Key_Down, Qt::AltModifier);
    EXPECT_EQ(nif->CountryID(), "DE");
    nif->setLocked(true);
    QTest::keyClick(box(nif), Qt::Key_F4);
    EXPECT_EQ(countryList.shownCount(), 2) << "a locked box offers no country list";
    nif->setLocked(false);
    QTest::keyClick(box(nif), Qt::Key_F4);
    EXPECT_EQ(nif->CountryID(), "IT");
}

TEST_F(EntryAccessibility, nibIsOneEntryWhoseBoxesAreItsPartsAndItsErrorMarkIsATabStop)
{
    auto *nib = add<cNIB>();
    QAccessibleInterface *iface = accessible(nib);
    EXPECT_EQ(iface->role(), QAccessible::EditableText);
    EXPECT_EQ(iface->text(QAccessible::Name), "NIB");
    EXPECT_EQ(accessible(box(nib, 2))->text(QAccessible::Name), "Conta");
    EXPECT_EQ(accessible(box(nib, 2))->text(QAccessible::Description), "Parte 3 de 4 do NIB");
    EXPECT_EQ(accessible(box(nib, 2))->parent()->object(), nib);

    const QString number = "0035065100000012345";
    const QString right = number + CalculateNibCheckDigits(number);
    nib->setText(number + (right.endsWith("00") ? "01" : "00"));
    EXPECT_EQ(iface->text(QAccessible::Description), "NIB inválido");
    EXPECT_TRUE(spy.changedStates(nib).invalid);
    QWidget *mark = nib->findChild<QWidget *>("Image1");
    EXPECT_EQ(mark->focusPolicy(), Qt::TabFocus);
    EXPECT_EQ(accessible(mark)->role(), QAccessible::Graphic);
    MessageBoxRecorder boxes;
    QTest::keyClick(mark, Qt::Key_Space);
    EXPECT_EQ(boxes.shown().size(), 1) << "Space explains the mark, as a click does";

    spy.clear();
    nib->setText(right);
    EXPECT_EQ(iface->text(QAccessible::Value), right);
    EXPECT_EQ(iface->text(QAccessible::Description), "NIB válido");
    EXPECT_EQ(spy.count(nib, QAccessible::DescriptionChanged), 1);
}

TEST_F(EntryAccessibility, entriesDeletedFromTheirOwnEventsWhileHeard)
{
    QPointer<cNIF> nif = add<cNIF>();
    QObject::connect(nif, &cNIF::Changed, nif, [&nif] { delete nif; });
    QTest::keyClick(box(nif), Qt::Key_1);
    EXPECT_TRUE(nif.isNull());
    QPointer<cNIB> nib = add<cNIB>();
    QObject::connect(nib, &cNIB::Changed, nib, [&nib] { delete nib; });
    nib->setText("003506510000001234580");
    EXPECT_TRUE(nib.isNull());
}

} // namespace

#include "NifTestSupport.h"

#include "companion/DirectoryNIFGrabber.h"
#include "frame/ClassRegistry.h"
#include "platform/Settings.h"
#include "selection/PictureBox.h"
#include "selection/frmSelectCountry.h"
#include "selection/mod_CTL.h"
#include "support/TestSupport.h"

#include <QApplication>
#include <QDialog>
#include <QRegularExpression>
#include <QTest>

#include <gtest/gtest.h>

using namespace zelctl;
using namespace zelctl::test;

namespace {

constexpr platform::OleColor White = 0xFFFFFF;
constexpr platform::OleColor Green = 0x008000;
constexpr platform::OleColor Red = 0x0000FF;

class NifControl : public ::testing::Test
{
protected:
    void SetUp() override
    {
        control = new cNIF(&form);
        control->InitNew();
        other = new QLineEdit(&form);
        other->move(0, 40);
        form.show();
        QApplication::setActiveWindow(&form);
        ASSERT_TRUE(QTest::qWaitForWindowActive(&form));
        box = entryBox(*control);
        log = std::make_unique<EventLog>(*control);
    }

    void type(const QString &text)
    {
        box->setFocus();
        QTest::keyClicks(box, text);
    }

    void erase()
    {
        box->setFocus();
        box->selectAll();
        QTest::keyClick(box, Qt::Key_Backspace);
    }

    QStringList eventsNamed(const QString &prefix) const
    {
        return log->events.filter(QRegularExpression("^" + prefix));
    }

    ScriptedGrabberFactory grabbers;
    QWidget form;
    cNIF *control = nullptr;
    QLineEdit *other = nullptr;
    QLineEdit *box = nullptr;
    std::unique_ptr<EventLog> log;
    companion::JsonDeclaration declaration;
};

} // namespace

TEST_F(NifControl, startsOnPortugalBlankAndNineCharactersLong)
{
    EXPECT_EQ(control->CountryID(), "PT");
    EXPECT_EQ(control->Value(), "PT");
    EXPECT_FALSE(control->findChild<PictureBox *>("cPicture")->Picture().isNull());
    EXPECT_EQ(textColour(*control), 0u);
    EXPECT_EQ(backColour(*control), White);
    EXPECT_TRUE(control->IsEmpty());

    type("12345678901");
    EXPECT_EQ(box->text(), "123456789");
}

TEST_F(NifControl, countryCodeSetterRules)
{
    control->setCountryID("");
    EXPECT_EQ(control->CountryID(), "PT");

    control->setCountryID("es");
    EXPECT_EQ(control->CountryID(), "ES");
    type("12345678Z");
    EXPECT_TRUE(control->IsValid()) << "Spanish rules apply";
    type("00");
    EXPECT_EQ(box->text(), "12345678Z00") << "no length limit outside Portugal";

    log->clear();
    control->setCountryID("PT");
    EXPECT_EQ(box->text(), "12345678Z");
    EXPECT_EQ(log->count("Changed"), 1) << "the cut is a change of the text";

    control->setCountryID("pt");
    box->setText("12345678901");
    EXPECT_EQ(box->text(), "123456789") << "a lower-case code still limits the length";

    control->setCountryID("EL");
    EXPECT_FALSE(control->findChild<PictureBox *>("cPicture")->Picture().isNull()) << "Greece has a flag";
}

TEST_F(NifControl, typedCountryCodeSwitchesTheCountry)
{
    type("DE123");
    EXPECT_EQ(control->CountryID(), "DE");
    EXPECT_EQ(box->text(), "123");
    EXPECT_EQ(box->cursorPosition(), 3);

    erase();
    type("es12345678Z");
    EXPECT_EQ(control->CountryID(), "ES");
    EXPECT_EQ(box->text(), "12345678Z");
    EXPECT_TRUE(control->IsOK());

    erase();
    type("US123");
    EXPECT_EQ(control->CountryID(), "ES") << "only member states switch";
    EXPECT_EQ(box->text(), "US123");

    log->clear();
    box->setText("PT" + PlainNif);
    EXPECT_EQ(control->CountryID(), "PT");
    EXPECT_EQ(box->text(), PlainNif) << "the number is kept whole through the Portuguese cut";
    EXPECT_EQ(log->count("Changed"), 1) << "no Changed for the switch itself";

    erase();
    type("PT123456789");
    EXPECT_EQ(box->text(), "PT1234567") << "the own code is kept as typed";
    EXPECT_FALSE(control->IsValid());
}

TEST_F(NifControl, coloursFollowTheState)
{
    type(PlainNif.left(8));
    EXPECT_EQ(textColour(*control), White);
    EXPECT_EQ(backColour(*control), Red);
    EXPECT_EQ(statusColour(*control), Red);

    type(PlainNif.right(1));
    EXPECT_EQ(textColour(*control), Green);
    EXPECT_EQ(backColour(*control), White);

    erase();
    EXPECT_EQ(textColour(*control), 0u);
    EXPECT_EQ(backColour(*control), White);
    EXPECT_EQ(statusColour(*control), White);
}

TEST_F(NifControl, enabledAndLockedAdjustTheColours)
{
    type(PlainNif.left(8));
    control->setEnabled(false);
    EXPECT_FALSE(box->isEnabled());
    EXPECT_EQ(backColour(*control), 0xC8C8C8u);
    control->setEnabled(true);
    EXPECT_EQ(backColour(*control), Red) << "the invalid number's background comes back";

    control->setLocked(true);
    EXPECT_TRUE(box->isReadOnly());
    EXPECT_EQ(textColour(*control), 0x404040u);
    control->setValue("PT" + PlainNif);
    EXPECT_TRUE(control->Locked());
    EXPECT_EQ(textColour(*control), Green) << "a refresh colours by state again";

    control->setLocked(false);
    EXPECT_FALSE(box->isReadOnly());
    EXPECT_EQ(textColour(*control), Green);
}

TEST_F(NifControl, emptyingANamedNumberRaisesClearedTwice)
{
    storeInfo(declaration, "PT" + PlainNif + ".nome", "MARIA");
    control->setIRSClass(&declaration);
    type(PlainNif);
    ASSERT_EQ(control->Nome(), "MARIA");

    log->clear();
    erase();
    EXPECT_EQ(log->events, QStringList({ "Cleared", "Cleared", "Changed" }));
    EXPECT_EQ(control->Description(), "PT");
}

TEST_F(NifControl, validityAndOkRules)
{
    control->setRequired(true);
    EXPECT_FALSE(control->IsOK()) << "an empty box is never OK";
    type("   ");
    EXPECT_TRUE(control->IsEmpty());

    control->setValue("PT" + PlainNif);
    log->clear();
    EXPECT_TRUE(control->IsOK());
    EXPECT_EQ(log->events, QStringList { "Validated" });
    log->clear();
    control->RefreshMe();
    EXPECT_EQ(log->count("NIFIndicated"), 1);
}

TEST_F(NifControl, valueRoundTrips)
{
    type(PlainNif);
    EXPECT_EQ(control->Value(), "PT123456789");

    control->setValue("ES12345678Z");
    EXPECT_EQ(control->CountryID(), "ES");
    EXPECT_EQ(box->text(), "12345678Z");
    EXPECT_EQ(control->Value(), "ES12345678Z");

    control->setValue("12345678");
    EXPECT_EQ(control->CountryID(), "ES") << "a bare number keeps the country";
    EXPECT_EQ(box->text(), "12345678");

    control->setValue(PlainNif);
    EXPECT_EQ(control->Value(), "ES123456789");

    control->setValue("PT" + PlainNif);
    EXPECT_EQ(control->Value(), "PT123456789");
    EXPECT_TRUE(control->IsOK());

    control->setValue("");
    EXPECT_EQ(control->Value(), "PT");
    EXPECT_TRUE(control->IsEmpty());
}

TEST_F(NifControl, countryNamesComeFromTheCountryFile)
{
    EXPECT_EQ(control->CountryName(), "Portugal");
    control->setCountryID("ES");
    EXPECT_EQ(control->CountryName(true), "Espanha - Código ISO3166: 724 (ES,ESP) - País da União Europeia");
    control->setCountryID("SK");
    EXPECT_TRUE(control->CountryName(true).endsWith(" - País da União Europeia"));
    control->setCountryID("US");
    EXPECT_FALSE(control->CountryName(true).contains("União Europeia"));
    control->setCountryID("XX");
    EXPECT_EQ(control->CountryName(true), "");
}

TEST_F(NifControl, declarationNameIsFoundWithoutFetching)
{
    storeInfo(declaration, "PT" + PlainNif + ".nome", "MARIA DA SILVA");
    control->setIRSClass(&declaration);
    type(PlainNif);

    EXPECT_EQ(control->Nome(), "MARIA DA SILVA");
    EXPECT_TRUE(grabbers.last->fetched.isEmpty());
    EXPECT_GE(log->count("NameUpdated:MARIA DA SILVA"), 1);
    const qsizetype named = log->events.indexOf("NameUpdated:MARIA DA SILVA");
    const qsizetype finished = log->events.indexOf("DataFinished");
    EXPECT_LT(named, finished);
    EXPECT_LT(finished, log->events.lastIndexOf("Changed"));
    EXPECT_EQ(statusColour(*control), 0x00FF00u);
}

TEST_F(NifControl, fetchedInformationFillsTheRecordInOrder)
{
    control->setIRSClass(&declaration);
    type(AnaNif);
    ASSERT_EQ(grabbers.last->fetched, QStringList { "PT" + AnaNif });
    EXPECT_EQ(log->count("DataFinished"), 0) << "the answer comes later";

    log->clear();
    QWidget *mark = control->findChild<QWidget *>("Shape1");
    QObject::connect(grabbers.last, &companion::NIFGrabber::Starting, [&] {
        // The control's own handler ran first: fetching shows as a blue mark.
        EXPECT_EQ(statusColour(*control), 0xC04040u);
        EXPECT_TRUE(mark->isVisible());
    });
    grabbers.last->answer("PT" + AnaNif,
        { { "NAME", "ANA LOPES" }, { "SERVICO", "3131" }, { "STATUS", "Activo" }, { "EMAIL", "" },
            { "LASTSTATUS", "Activo" } });

    EXPECT_EQ(eventsNamed("UpdatedInformation"),
        QStringList({ "UpdatedInformation:nome", "UpdatedInformation:servico", "UpdatedInformation:status",
            "UpdatedInformation:laststatus" }));
    EXPECT_EQ(log->events.last(), "DataFinished");
    EXPECT_GE(log->count("NameUpdated:ANA LOPES"), 1);
    EXPECT_EQ(control->Nome(), "ANA LOPES");
    EXPECT_EQ(storedInfo(declaration, "PT" + AnaNif + ".servico"), "3131");
    EXPECT_EQ(storedInfo(declaration, "PT" + AnaNif + ".nome"), "ANA LOPES");
    EXPECT_EQ(control->Information("status"), "Activo");
    EXPECT_EQ(statusColour(*control), 0x00FF00u);
}

TEST_F(NifControl, answerForAnOlderNumberIsIgnored)
{
    type(AnaNif);
    erase();
    type(OtherNif);
    EXPECT_EQ(grabbers.last->fetched, QStringList { "PT" + AnaNif }) << "no second fetch while one runs";

    log->clear();
    grabbers.last->answer("PT" + AnaNif, { { "NAME", "ANA LOPES" }, { "SERVICO", "3131" } });
    EXPECT_EQ(log->events, QStringList { "DataFinished" });
    EXPECT_EQ(control->Nome(), "");
    EXPECT_EQ(control->Information("servico"), "") << "another holder's data are not this number's record";
    EXPECT_EQ(statusColour(*control), White);
}

TEST_F(NifControl, autoFetchCanBeSwitchedOff)
{
    platform::SaveSetting("ZEL", "Config", "allowautonif", "0");
    type(AnaNif);
    EXPECT_TRUE(grabbers.last->fetched.isEmpty());

    storeInfo(declaration, "PT" + PlainNif + ".nome", "MARIA");
    control->setIRSClass(&declaration);
    control->setValue("PT" + PlainNif);
    EXPECT_EQ(control->Nome(), "MARIA") << "stored names are still found";
    platform::DeleteSetting("ZEL", "Config", "allowautonif");
}

TEST_F(NifControl, informationLetRules)
{
    control->setIRSClass(&declaration);
    type(PlainNif.left(8));
    log->clear();
    control->setInformation("email", "x@example.invalid");
    EXPECT_EQ(log->events, QStringList { "Validated" }) << "an invalid number takes nothing";
    EXPECT_EQ(storedInfo(declaration, "PT12345678.email"), "");

    type(PlainNif.right(1));
    log->clear();
    control->setInformation("AUTO", "x");
    EXPECT_EQ(storedInfo(declaration, "PT123456789.AUTO"), "x");
    EXPECT_EQ(log->events, QStringList { "Validated" });

    log->clear();
    control->setInformation("email", "x@example.invalid");
    EXPECT_EQ(log->events, QStringList({ "Validated", "UpdatedInformation:email" }));
    log->clear();
    control->setInformation("email", "x@example.invalid");
    EXPECT_EQ(log->events, QStringList { "Validated" }) << "the same value changes nothing";
    log->clear();
    control->setInformation("email", "");
    EXPECT_EQ(log->events, QStringList { "Validated" }) << "emptying raises no UpdatedInformation";
    EXPECT_EQ(control->Information("email"), "");

    log->clear();
    control->setNome("JOSÉ");
    EXPECT_EQ(log->events.last(), "NameUpdated:JOSÉ");
    EXPECT_EQ(storedInfo(declaration, "PT123456789.nome"), "JOSÉ");
    EXPECT_EQ(control->Description(), "JOSÉ");
}

TEST_F(NifControl, nomeFallsBackToTheFetchersName)
{
    type(AnaNif);
    grabbers.last->answer("PT" + AnaNif, { { "NAME", "ANA LOPES" } });
    erase(); // forgets the name
    grabbers.last->busy = true; // and no new fetch brings it back
    control->setValue("PT" + AnaNif);
    EXPECT_EQ(control->Nome(), "ANA LOPES");
}

TEST_F(NifControl, tipShowsTheHolder)
{
    box->setFocus();
    EXPECT_EQ(tipText(*control), "");
    storeInfo(declaration, "PT" + PlainNif + ".nome", "MARIA");
    control->setIRSClass(&declaration);
    type(PlainNif);
    EXPECT_EQ(tipText(*control), "MARIA\r\nNIF: 123456789\r\nPaís: Portugal");

    storeInfo(declaration, "PT" + PlainNif + ".codigopostal", "1000-001");
    storeInfo(declaration, "PT" + PlainNif + ".localidade", "Lisboa");
    other->setFocus();
    box->setFocus();
    EXPECT_EQ(tipText(*control), "MARIA\r\n1000-001\r\nLisboa\r\nNIF: 123456789\r\nPaís: Portugal")
        << "focus refreshes the tip";

    storeInfo(declaration, "ES12345678Z.nome", "JUAN");
    control->setValue("ES12345678Z");
    EXPECT_EQ(tipText(*control), "JUAN\r\nNIF: 12345678Z\r\nPaís: Espanha");

    type("1");
    EXPECT_EQ(tipText(*control), "");
}

TEST_F(NifControl, countryListFollowsTheFilter)
{
    control->setCountryID("ES");
    control->ShowCountryList(); // GSEL_OnlyPT: no dialog (the test main fails on one)
    EXPECT_EQ(control->CountryID(), "PT");

    control->setCountries(GSEL_Custom);
    control->setCountries(GSEL_CountryFilterList(5));
    control->setCustomCountryList("ES,FR");
    QStringList answers { "FR", "" };
    ModalDriver driver([&answers](QDialog &dialog) {
        auto *form = qobject_cast<frmSelectCountry *>(&dialog);
        EXPECT_EQ(form->filterMode(), GSEL_Custom);
        EXPECT_EQ(form->customList(), "ES,FR");
        form->setTag(answers.takeFirst());
        return int(form->Tag().isEmpty() ? QDialog::Rejected : QDialog::Accepted);
    });
    QTest::mouseClick(control->findChild<QWidget *>("cPicture"), Qt::LeftButton);
    EXPECT_EQ(control->CountryID(), "FR");
    control->ShowCountryList();
    EXPECT_EQ(driver.shownCount(), 2);
    EXPECT_EQ(control->CountryID(), "FR") << "a cancelled list keeps the country";
}

TEST(NifPersistence, savesAndLoadsItsProperties)
{
    cNIF saved;
    saved.InitNew();
    PropertyBag defaults = saved.Save();
    EXPECT_EQ(defaults.names(), QStringList({ "Countries", "CustomCountryList" }));

    saved.setCountries(GSEL_Custom);
    saved.setCustomCountryList("ES,FR");
    saved.setRequired(true);
    saved.setBackColor(0x00C0FF);
    saved.setCountryID("ES");
    saved.setDisablePopupMenu(true);
    const PropertyBag bag = saved.Save();
    EXPECT_EQ(bag.ReadProperty("Country").toString(), "ES");

    cNIF loaded;
    loaded.Load(bag);
    EXPECT_EQ(loaded.Countries(), GSEL_Custom);
    EXPECT_EQ(loaded.CustomCountryList(), "ES,FR");
    EXPECT_TRUE(loaded.Required());
    EXPECT_EQ(loaded.BackColor(), 0x00C0FFu);
    EXPECT_EQ(loaded.CountryID(), "ES") << "the saved country comes back";
    EXPECT_TRUE(loaded.DisablePopupMenu());
    EXPECT_EQ(loaded.Save(), bag);

    PropertyBag legacy;
    legacy.WriteProperty("Required", "True");
    legacy.WriteProperty("Country", "ES");
    legacy.WriteProperty("CountryID", "FR");
    legacy.WriteProperty("Countries", 9);
    cNIF old;
    old.Load(legacy);
    EXPECT_TRUE(old.Required());
    EXPECT_EQ(old.CountryID(), "FR");
    EXPECT_EQ(old.Countries(), GSEL_OnlyPT);
}

TEST(NifHost, drivesTheControlByName)
{
    std::unique_ptr<QObject> object(CreateObject("UKAZELCTL.cNIF"));
    ASSERT_NE(object, nullptr);
    ASSERT_TRUE(object->setProperty("Value", "PT123456789"));
    bool ok = false;
    ASSERT_TRUE(QMetaObject::invokeMethod(object.get(), "IsOK", Q_RETURN_ARG(bool, ok)));
    EXPECT_TRUE(ok);
    ASSERT_TRUE(QMetaObject::invokeMethod(object.get(), "setInformation", Q_ARG(QString, "AUTO"), Q_ARG(QString, "x")));
    ASSERT_TRUE(object->setProperty("Nome", "MARIA"));
    QString name;
    ASSERT_TRUE(QMetaObject::invokeMethod(object.get(), "Description", Q_RETURN_ARG(QString, name)));
    EXPECT_EQ(name, "MARIA");
    EXPECT_GT(object->property("hWnd").toInt(), 0);
}

TEST(NifLifeCycle, countsLiveControlsAndForgetsTheDeclaration)
{
    const int before = mod_CTL::NifControlCount;
    auto declaration = std::make_unique<companion::JsonDeclaration>();
    auto *control = new cNIF;
    control->setIRSClass(declaration.get());
    EXPECT_EQ(mod_CTL::NifControlCount, before + 1);
    declaration.reset();
    EXPECT_EQ(control->IRSClass(), nullptr) << "a declaration that went is not used";
    control->setValue("PT123456789");
    control->Release();
    EXPECT_EQ(mod_CTL::NifControlCount, before);
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);

    delete new cNIF;
    EXPECT_EQ(mod_CTL::NifControlCount, before) << "a control deleted without Release is uncounted once";
}

TEST(NifDirectoryFetch, answersArriveWithoutBlocking)
{
    QWidget form;
    auto *control = new cNIF(&form);
    form.show();
    EventLog log(*control);
    control->setValue("PT" + AnaNif);
    EXPECT_EQ(control->Nome(), "") << "Fetch returned at once";
    QTRY_COMPARE(log.count("DataFinished"), 1);
    EXPECT_EQ(control->Nome(), "ANA MARIA FERREIRA LOPES");
    EXPECT_EQ(control->Information("concelho"), "Lisboa");
    EXPECT_EQ(tipText(*control), "ANA MARIA FERREIRA LOPES\r\n1000-001\r\nLisboa\r\nNIF: 210345675\r\nPaís: Portugal");
}

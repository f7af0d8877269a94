#include "NifTestSupport.h"

#include "frame/ClassRegistry.h"
#include "platform/Settings.h"
#include "selection/PictureBox.h"
#include "selection/frmSelectCountry.h"
#include "selection/mod_CTL.h"
#include "support/TestSupport.h"

#include <QDialog>
#include <QRegularExpression>

using namespace zelctl;
using namespace zelctl::test;

namespace {

constexpr platform::OleColor White = 0xFFFFFF;
constexpr platform::OleColor Green = 0x008000;
constexpr platform::OleColor Red = 0x0000FF;
constexpr platform::OleColor NamedMark = 0x00FF00;

using NifControl = NifFixture;

} // namespace

TEST_F(NifControl, typingSwitchesTheCountryAndCutsPortugueseNumbers)
{
    EXPECT_FALSE(control->findChild<PictureBox *>("cPicture")->Picture().isNull());
    EXPECT_EQ(control->Value(), "PT") << "starts on Portugal, blank";
    const struct
    {
        const char *rule;
        QString typed;
        QString country;
        QString text;
    } cases[] = {
        { "nine characters for Portugal", "12345678901", "PT", "123456789" },
        { "a member state's code switches", "DE123", "DE", "123" },
        { "lower-case codes too", "es12345678Z", "ES", "12345678Z" },
        { "only member states switch", "US123", "PT", "US123" },
        { "the own code is kept as typed", "PT123456789", "PT", "PT1234567" },
    };
    for (const auto &c : cases) {
        control->setCountryID("PT");
        erase();
        type(c.typed);
        EXPECT_EQ(control->CountryID(), c.country) << c.rule;
        EXPECT_EQ(box->text(), c.text) << c.rule;
        EXPECT_EQ(box->cursorPosition(), c.text.size()) << c.rule;
    }
    EXPECT_FALSE(control->IsValid());

    control->setCountryID("ES");
    log->clear();
    box->setText("PT" + PlainNif);
    EXPECT_EQ(box->text(), PlainNif) << "the number is kept whole through the Portuguese cut";
    EXPECT_EQ(log->count("Changed"), 1) << "no Changed for the switch itself";
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
}

TEST_F(NifControl, coloursFollowTheStateEnabledAndLocked)
{
    EXPECT_EQ(textColour(*control), 0u);
    type(PlainNif.left(8));
    EXPECT_EQ(textColour(*control), White);
    EXPECT_EQ(backColour(*control), Red);
    EXPECT_EQ(statusColour(*control), Red);

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
    EXPECT_EQ(backColour(*control), White);
    control->setLocked(false);
    EXPECT_FALSE(box->isReadOnly());

    erase();
    EXPECT_EQ(textColour(*control), 0u);
    EXPECT_EQ(backColour(*control), White);
    EXPECT_EQ(statusColour(*control), White);
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

TEST_F(NifControl, valueRoundTrips)
{
    control->setRequired(true);
    EXPECT_FALSE(control->IsOK()) << "an empty box is never OK";
    type(PlainNif);
    EXPECT_EQ(control->Value(), "PT123456789");
    const struct
    {
        const char *rule;
        QString value;
        QString text;
        QString readBack;
    } cases[] = {
        { "a code switches the country", "ES12345678Z", "12345678Z", "ES12345678Z" },
        { "a bare number keeps the country", PlainNif, PlainNif, "ES123456789" },
        { "back to Portugal", "PT" + PlainNif, PlainNif, "PT123456789" },
        { "empty is Portugal, blank", "", "", "PT" },
    };
    for (const auto &c : cases) {
        control->setValue(c.value);
        EXPECT_EQ(box->text(), c.text) << c.rule;
        EXPECT_EQ(control->Value(), c.readBack) << c.rule;
    }
    EXPECT_TRUE(control->IsEmpty());

    control->setValue("PT" + PlainNif);
    log->clear();
    EXPECT_TRUE(control->IsOK());
    EXPECT_EQ(log->events, QStringList { "Validated" });
    control->RefreshMe();
    EXPECT_EQ(log->count("NIFIndicated"), 1);
}

TEST_F(NifControl, countryNamesComeFromTheCountryFile)
{
    EXPECT_EQ(control->CountryName(), "Portugal");
    control->setCountryID("ES");
    EXPECT_EQ(control->CountryName(true), "Espanha - Código ISO3166: 724 (ES,ESP) - País da União Europeia");
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
    const qsizetype named = log->events.indexOf("NameUpdated:MARIA DA SILVA");
    const qsizetype finished = log->events.indexOf("DataFinished");
    EXPECT_GE(named, 0);
    EXPECT_LT(named, finished);
    EXPECT_LT(finished, log->events.lastIndexOf("Changed"));
    EXPECT_EQ(statusColour(*control), NamedMark);
}

TEST_F(NifControl, fetchedInformationFillsTheRecordInOrder)
{
    control->setIRSClass(&declaration);
    type(AnaNif);
    ASSERT_EQ(grabbers.last->fetched, QStringList { "PT" + AnaNif });
    EXPECT_EQ(log->count("DataFinished"), 0) << "the answer comes later";

    log->clear();
    QObject::connect(grabbers.last, &companion::NIFGrabber::Starting, [&] {
        // The control's own handler ran first: fetching shows as a blue mark.
        EXPECT_EQ(statusColour(*control), 0xC04040u);
    });
    grabbers.last->answer(
        "PT" + AnaNif, { { "NAME", "ANA LOPES" }, { "SERVICO", "3131" }, { "STATUS", "Activo" }, { "EMAIL", "" } });

    EXPECT_EQ(log->events.filter(QRegularExpression("^UpdatedInformation")),
        QStringList({ "UpdatedInformation:nome", "UpdatedInformation:servico", "UpdatedInformation:status" }));
    EXPECT_EQ(log->events.last(), "DataFinished");
    EXPECT_GE(log->count("NameUpdated:ANA LOPES"), 1);
    EXPECT_EQ(storedInfo(declaration, "PT" + AnaNif + ".servico"), "3131");
    EXPECT_EQ(control->Information("status"), "Activo");
    EXPECT_EQ(statusColour(*control), NamedMark);
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
    const struct
    {
        const char *rule;
        QString key;
        QString value;
        QStringList events;
    } cases[] = {
        { "AUTO is stored quietly", "AUTO", "x", { "Validated" } },
        { "a new value", "email", "x@example.invalid", { "Validated", "UpdatedInformation:email" } },
        { "the same value changes nothing", "email", "x@example.invalid", { "Validated" } },
        { "emptying raises no UpdatedInformation", "email", "", { "Validated" } },
    };
    for (const auto &c : cases) {
        log->clear();
        control->setInformation(c.key, c.value);
        EXPECT_EQ(log->events, c.events) << c.rule;
        EXPECT_EQ(storedInfo(declaration, "PT123456789." + c.key), c.value) << c.rule;
    }

    control->setNome("JOSÉ");
    EXPECT_EQ(log->events.last(), "NameUpdated:JOSÉ");
    EXPECT_EQ(storedInfo(declaration, "PT123456789.nome"), "JOSÉ");
}

TEST_F(NifControl, tipShowsTheHolder)
{
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
    control->ShowCountryList(); // only Portugal: no dialog (the test main fails on one)
    EXPECT_EQ(control->CountryID(), "PT");

    control->setCountries(GSEL_Custom);
    control->setCustomCountryList("ES,FR");
    QStringList answers { "FR", "" };
    ModalDriver driver([&answers](QDialog &dialog) {
        auto *form = qobject_cast<frmSelectCountry *>(&dialog);
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
    EXPECT_EQ(saved.Save().names(), QStringList({ "Countries", "CustomCountryList" }));

    saved.setCountries(GSEL_Custom);
    saved.setRequired(true);
    saved.setCountryID("ES");
    saved.setDisablePopupMenu(true);
    const PropertyBag bag = saved.Save();
    cNIF loaded;
    loaded.Load(bag);
    EXPECT_EQ(loaded.Countries(), GSEL_Custom);
    EXPECT_TRUE(loaded.Required());
    EXPECT_EQ(loaded.CountryID(), "ES") << "the saved country comes back";
    EXPECT_TRUE(loaded.DisablePopupMenu());
    EXPECT_EQ(loaded.Save(), bag);

    PropertyBag legacy;
    legacy.WriteProperty("Country", "ES");
    legacy.WriteProperty("CountryID", "FR");
    legacy.WriteProperty("Countries", 9);
    cNIF old;
    old.Load(legacy);
    EXPECT_EQ(old.CountryID(), "FR");
    EXPECT_EQ(old.Countries(), GSEL_OnlyPT) << "an unknown filter falls back";
}

TEST(NifHost, drivesTheControlByNameAndCountsIt)
{
    const int before = mod_CTL::NifControlCount;
    std::unique_ptr<QObject> object(CreateObject("UKAZELCTL.cNIF"));
    ASSERT_NE(object, nullptr);
    EXPECT_EQ(mod_CTL::NifControlCount, before + 1);
    ASSERT_TRUE(object->setProperty("Value", "PT123456789"));
    bool ok = false;
    ASSERT_TRUE(QMetaObject::invokeMethod(object.get(), "IsOK", Q_RETURN_ARG(bool, ok)));
    EXPECT_TRUE(ok);

    auto declaration = std::make_unique<companion::JsonDeclaration>();
    auto *control = qobject_cast<cNIF *>(object.get());
    control->setIRSClass(declaration.get());
    declaration.reset();
    EXPECT_EQ(control->IRSClass(), nullptr) << "a declaration that went is not used";
    control->Release();
    EXPECT_EQ(mod_CTL::NifControlCount, before);
    object.reset();
    EXPECT_EQ(mod_CTL::NifControlCount, before) << "released, then deleted: uncounted once";
    delete new cNIF;
    EXPECT_EQ(mod_CTL::NifControlCount, before) << "deleted without Release: uncounted once";
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
    EXPECT_EQ(tipText(*control), "ANA MARIA FERREIRA LOPES\r\n1000-001\r\nLisboa\r\nNIF: 210345675\r\nPaís: Portugal");
}

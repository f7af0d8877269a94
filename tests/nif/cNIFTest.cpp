#include "NifTestSupport.h"

#include "frame/ClassRegistry.h"
#include "platform/Settings.h"
#include "selection/PictureBox.h"
#include "selection/frmSelectCountry.h"
#include "selection/mod_CTL.h"
#include "support/TestSupport.h"

#include <QClipboard>
#include <QDialog>
#include <QRegularExpression>

#include <optional>
#include <tuple>

using namespace zelctl;
using namespace zelctl::test;

namespace {

constexpr platform::OleColor White = 0xFFFFFF, Green = 0x008000, Red = 0x0000FF, NamedMark = 0x00FF00, Grey = 0xC8C8C8;

using NifControl = NifFixture;

// Fetching off for the scope.
struct NoAutoFetch
{
    NoAutoFetch() { platform::SaveSetting("ZEL", "Config", "allowautonif", "0"); }
    ~NoAutoFetch() { platform::DeleteSetting("ZEL", "Config", "allowautonif"); }
};

} // namespace

TEST_F(NifControl, typingSwitchesTheCountryAndCutsPortugueseNumbers)
{
    // The rule, the country before, what is typed, then the country and text after.
    const std::tuple<const char *, QString, QString, QString, QString> cases[] = {
        { "nine characters for Portugal", "", "12345678901", "PT", "123456789" },
        { "a member state's code switches", "PT", "DE123", "DE", "123" },
        { "lower-case codes too", "PT", "es12345678Z", "ES", "12345678Z" },
        { "only member states switch", "PT", "US123", "PT", "US123" },
        { "the own code is kept as typed", "PT", "PT123456789", "PT", "PT1234567" },
        { "no limit outside Portugal", "es", "12345678Z00", "ES", "12345678Z00" },
        { "a lower-case code still limits", "pt", "12345678901", "PT", "123456789" },
    };
    for (const auto &[rule, before, typed, country, text] : cases) {
        control->setCountryID(before);
        erase();
        type(typed);
        EXPECT_EQ(control->CountryID(), country) << rule;
        EXPECT_EQ(box->text(), text) << rule;
        EXPECT_EQ(box->cursorPosition(), text.size()) << rule;
    }
    box->setText("1234");
    box->setCursorPosition(2);
    QTest::keyClicks(box, "5678901");
    EXPECT_EQ(box->text(), "125678934") << "keys beyond the ninth character are refused, the rest kept";

    control->setCountryID("ES");
    log->clear();
    box->setText("PT" + PlainNif);
    EXPECT_EQ(box->text(), PlainNif) << "the number is kept whole through the Portuguese cut";
    EXPECT_EQ(log->count("Changed"), 1) << "no Changed for the switch itself";
    control->setCountryID("ES");
    type("00");
    log->clear();
    control->setCountryID("PT");
    EXPECT_EQ(box->text(), PlainNif);
    EXPECT_EQ(log->count("Changed"), 1) << "the cut is a change of the text";
}

TEST_F(NifControl, coloursAndMarksFollowTheState)
{
    type(PlainNif.left(8));
    EXPECT_EQ(textColour(*control), White);
    EXPECT_EQ(backColour(*control), Red);
    EXPECT_EQ(statusColour(*control), Red);

    control->setEnabled(false);
    EXPECT_EQ(backColour(*control), Grey);
    control->setEnabled(true);
    EXPECT_EQ(backColour(*control), Red) << "the invalid number's background comes back";

    control->setLocked(true);
    EXPECT_EQ(textColour(*control), 0x404040u);
    control->setValue("PT" + PlainNif);
    EXPECT_TRUE(control->Locked());
    EXPECT_EQ(textColour(*control), Green) << "a refresh colours by state again";
    EXPECT_EQ(backColour(*control), White);
    control->setLocked(false);

    // Whatever keeps the lookup from running, a valid number drops the red mark of the
    // keystroke before.
    {
        NoAutoFetch off;
        erase();
        type(PlainNif);
        EXPECT_EQ(statusColour(*control), White) << "fetching off";
    }
    grabbers.last->busy = true;
    QTest::keyClick(box, Qt::Key_Backspace);
    type("9");
    EXPECT_EQ(statusColour(*control), White) << "fetcher busy";

    control->setCountryID("ES");
    EXPECT_EQ(backColour(*control), White) << "the country alone does not check again";
    QTest::mouseClick(control->findChild<QWidget *>("cPicture"), Qt::LeftButton);
    EXPECT_EQ(control->CountryID(), "PT") << "only Portugal to choose from";
    EXPECT_EQ(backColour(*control), White);
    EXPECT_EQ(log->events.last(), "NIFIndicated") << "the flag's Portugal was checked";

    erase();
    EXPECT_EQ(textColour(*control), 0u);
    EXPECT_EQ(backColour(*control), White);
    EXPECT_EQ(statusColour(*control), White);
}

TEST_F(NifControl, valueRoundTrips)
{
    control->setRequired(true);
    EXPECT_FALSE(control->IsOK()) << "an empty box is never OK";
    type(PlainNif);
    EXPECT_EQ(control->Value(), "PT123456789");
    // The rule, the Value written, then the box's text, Value read back and background.
    const std::tuple<const char *, QString, QString, QString, platform::OleColor> cases[] = {
        { "a code switches the country", "ES12345678Z", "12345678Z", "ES12345678Z", White },
        { "a bare number keeps the country", PlainNif, PlainNif, "ES123456789", Red },
        { "back to Portugal", "PT" + PlainNif, PlainNif, "PT123456789", White },
        { "the same digits are checked by the new country's rules", "ES" + PlainNif, PlainNif, "ES123456789", Red },
        { "empty is Portugal, blank", "", "", "PT", White },
    };
    for (const auto &[rule, value, text, readBack, back] : cases) {
        control->setValue(value);
        EXPECT_EQ(box->text(), text) << rule;
        EXPECT_EQ(control->Value(), readBack) << rule;
        EXPECT_EQ(backColour(*control), back) << rule;
    }
    EXPECT_TRUE(control->IsEmpty());

    control->setValue("PT" + PlainNif);
    log->clear();
    EXPECT_TRUE(control->IsOK());
    EXPECT_EQ(log->events, QStringList { "Validated" });
    control->RefreshMe();
    EXPECT_EQ(log->count("NIFIndicated"), 1);
}

TEST_F(NifControl, declarationNameIsFoundWithoutFetchingAndShownInTheTip)
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
    EXPECT_EQ(tipText(*control), "MARIA DA SILVA\r\nNIF: 123456789\r\nPaís: Portugal");

    storeInfo(declaration, "PT" + PlainNif + ".codigopostal", "1000-001");
    storeInfo(declaration, "PT" + PlainNif + ".localidade", "Lisboa");
    other->setFocus();
    box->setFocus();
    EXPECT_EQ(tipText(*control), "MARIA DA SILVA\r\n1000-001\r\nLisboa\r\nNIF: 123456789\r\nPaís: Portugal")
        << "focus refreshes the tip";

    log->clear();
    erase();
    EXPECT_EQ(log->events, QStringList({ "Cleared", "Cleared", "Changed" })) << "emptying a named number";
    EXPECT_EQ(control->Description(), "PT");
    EXPECT_EQ(tipText(*control), "");

    storeInfo(declaration, "EL123456783.nome", "NIKOS");
    control->setValue("EL123456783");
    EXPECT_EQ(tipText(*control), "NIKOS\r\nNIF: 123456783\r\nPaís: Grécia");
}

TEST_F(NifControl, fetchedInformationFillsTheRecordInOrderAndOnlyThatNumbers)
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

    control->setInformation("email", "ana@example.invalid");
    grabbers.last->answer("PT" + AnaNif, { { "NAME", "ANA LOPES" }, { "SERVICO", "3132" } });
    EXPECT_EQ(control->Information("servico"), "3132");
    EXPECT_EQ(control->Information("email"), "ana@example.invalid") << "a field the fetcher lacks is kept";

    grabbers.last->fetched.clear();
    erase();
    type(PlainNif);
    erase();
    type(OtherNif);
    EXPECT_EQ(grabbers.last->fetched, QStringList { "PT" + PlainNif }) << "no second fetch while one runs";

    log->clear();
    grabbers.last->answer("PT" + PlainNif, { { "NAME", "MARIA" }, { "SERVICO", "3132" } });
    EXPECT_EQ(log->events, QStringList { "DataFinished" });
    EXPECT_EQ(control->Nome(), "");
    EXPECT_EQ(control->Information("servico"), "") << "another holder's data are not this number's record";
}

// The record of a number keeps what is let into it however the holder was looked up, with
// or without a declaration, and only for that number.
TEST_F(NifControl, recordIsKeptPerNumber)
{
    // How the holder was looked up: with a declaration, the fetcher busy, fetching off.
    const std::tuple<const char *, bool, bool, bool> lookups[]
        = { { "a declaration", true, false, false }, { "nothing found", false, false, false },
              { "fetcher busy", false, true, false }, { "fetching off", false, false, true } };
    // What is let into the record, and the events that raises.
    const std::tuple<const char *, QString, QString, QStringList> lets[] = {
        { "AUTO is stored quietly", "AUTO", "x", { "Validated" } },
        { "a new value", "email", "x@example.invalid", { "Validated", "UpdatedInformation:email" } },
        { "the same value changes nothing", "email", "x@example.invalid", { "Validated" } },
        { "emptying raises no UpdatedInformation", "email", "", { "Validated" } },
        { "a name", "nome", "JOSÉ", { "Validated", "UpdatedInformation:nome", "NameUpdated:JOSÉ" } },
    };
    for (const auto &[where, declared, busy, fetchingOff] : lookups) {
        replaceControl();
        companion::JsonDeclaration fresh;
        control->setIRSClass(declared ? &fresh : nullptr);
        grabbers.last->busy = busy;
        std::optional<NoAutoFetch> off;
        if (fetchingOff)
            off.emplace();
        type(PlainNif.left(8));
        log->clear();
        control->setInformation("email", "x");
        EXPECT_EQ(log->events, QStringList { "Validated" }) << where << ": an invalid number takes nothing";

        type(PlainNif.right(1));
        EXPECT_EQ(grabbers.last->fetched.isEmpty(), busy || fetchingOff) << where;
        if (!busy)
            grabbers.last->answer("PT" + PlainNif, {});
        for (const auto &[rule, key, value, events] : lets) {
            log->clear();
            control->setInformation(key, value);
            EXPECT_EQ(log->events, events) << where << ": " << rule;
            EXPECT_EQ(control->Information(key), value) << where << ": " << rule;
            EXPECT_EQ(storedInfo(fresh, "PT123456789." + key), declared ? value : "") << rule;
        }
        control->setNome("ANA");
        EXPECT_EQ(log->events.last(), "NameUpdated:ANA") << where;
        control->setInformation("telefone", "210000000");

        control->setValue("PT" + AnaNif);
        EXPECT_EQ(control->Information("telefone"), "") << where << ": another number's record is its own";
        EXPECT_NE(control->Nome(), "ANA") << where;
        control->setValue("PT" + PlainNif);
        EXPECT_EQ(control->Information("telefone"), "210000000") << where << ": kept through the lookups";
        EXPECT_EQ(control->Nome(), "ANA") << where;
        companion::JsonDeclaration another;
        control->setIRSClass(&another);
        EXPECT_EQ(control->Information("telefone"), "") << where << ": another declaration, another record";
    }
}

// Going straight from one holder's number to another's shows nothing of the first.
TEST_F(NifControl, aNewNumberStartsClean)
{
    storeInfo(declaration, "PT" + PlainNif + ".nome", "MARIA");
    control->setIRSClass(&declaration);
    control->setCountries(GSEL_Custom);
    control->setCustomCountryList("PT,US");
    ModalDriver countryList([](QDialog &dialog) {
        qobject_cast<frmSelectCountry *>(&dialog)->setTag("US");
        return int(QDialog::Accepted);
    });
    const std::tuple<const char *, std::function<void()>, QString> routes[] = {
        { "Value", [&] { control->setValue("PT" + AnaNif); }, "PT" + AnaNif },
        { "paste",
            [&] {
                QGuiApplication::clipboard()->setText(AnaNif);
                QTest::keyClick(box, Qt::Key_V, Qt::ControlModifier);
            },
            "PT" + AnaNif },
        { "country list", [&] { control->ShowCountryList(); }, "US" + PlainNif },
    };
    for (const auto &[route, go, value] : routes) {
        control->setValue("PT" + PlainNif);
        ASSERT_EQ(control->Nome(), "MARIA") << route;
        ASSERT_EQ(statusColour(*control), NamedMark) << route;
        go();
        EXPECT_EQ(control->Value(), value) << route;
        EXPECT_EQ(control->Nome(), "") << route;
        EXPECT_EQ(control->Description(), value) << route;
        EXPECT_EQ(tipText(*control), "") << route;
        EXPECT_NE(statusColour(*control), NamedMark) << route;
        grabbers.last->answer(value, {});
    }
}

TEST_F(NifControl, countryNamesFlagsAndTheListFollowTheFilter)
{
    control->setCountryID("EL");
    EXPECT_EQ(control->CountryName(true), "Grécia - Código ISO3166: 300 (EL,GRC) - País da União Europeia");
    PictureBox surface;
    EXPECT_EQ(control->findChild<PictureBox *>("cPicture")->Picture(), mod_CTL::flagOn(surface, "GR"));
    control->setCountryID("XX");
    EXPECT_EQ(control->CountryName(true), "");

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

TEST(NifPersistence, savesAndLoadsItsPropertiesAndOldOnes)
{
    cNIF saved;
    saved.InitNew();
    EXPECT_EQ(saved.Save().names(), QStringList({ "Countries", "CustomCountryList" }));
    saved.setCountries(GSEL_Custom);
    saved.setRequired(true);
    saved.setCountryID("ES");
    saved.setDisablePopupMenu(true);
    cNIF loaded;
    loaded.Load(saved.Save());
    EXPECT_EQ(loaded.Save(), saved.Save());

    PropertyBag legacy;
    legacy.WriteProperty("Country", "ES");
    legacy.WriteProperty("CountryID", "FR");
    legacy.WriteProperty("BackColor", "&H00FF00&");
    cNIF old;
    old.Load(legacy);
    EXPECT_EQ(old.CountryID(), "FR") << "CountryID before the older Country";
    EXPECT_EQ(old.palette().color(QPalette::Window), QColor(0, 255, 0)) << "a colour written as a literal";
}

TEST(NifHost, countsItsControlsOnceAndForgetsADeclarationThatWent)
{
    const int before = mod_CTL::NifControlCount;
    std::unique_ptr<QObject> object(CreateObject("UKAZELCTL.cNIF"));
    auto *control = qobject_cast<cNIF *>(object.get());
    ASSERT_NE(control, nullptr);
    EXPECT_EQ(mod_CTL::NifControlCount, before + 1);
    auto declaration = std::make_unique<companion::JsonDeclaration>();
    control->setIRSClass(declaration.get());
    declaration.reset();
    EXPECT_EQ(control->IRSClass(), nullptr);
    control->Release();
    EXPECT_EQ(mod_CTL::NifControlCount, before);
    object.reset();
    EXPECT_EQ(mod_CTL::NifControlCount, before) << "released, then deleted: uncounted once";
    delete new cNIF;
    EXPECT_EQ(mod_CTL::NifControlCount, before) << "deleted without Release: uncounted once";
}

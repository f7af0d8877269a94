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
#include <QVBoxLayout>

#include <optional>

using namespace zelctl;
using namespace zelctl::test;

namespace {

constexpr platform::OleColor White = 0xFFFFFF;
constexpr platform::OleColor Green = 0x008000;
constexpr platform::OleColor Red = 0x0000FF;
constexpr platform::OleColor NamedMark = 0x00FF00;
constexpr platform::OleColor Grey = 0xC8C8C8;

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
    EXPECT_EQ(control->Value(), "PT") << "starts on Portugal, blank";
    const struct
    {
        const char *rule;
        QString before;
        QString typed;
        QString country;
        QString text;
    } cases[] = {
        { "nine characters for Portugal", "", "12345678901", "PT", "123456789" },
        { "a member state's code switches", "PT", "DE123", "DE", "123" },
        { "lower-case codes too", "PT", "es12345678Z", "ES", "12345678Z" },
        { "only member states switch", "PT", "US123", "PT", "US123" },
        { "the own code is kept as typed", "PT", "PT123456789", "PT", "PT1234567" },
        { "no limit outside Portugal", "es", "12345678Z00", "ES", "12345678Z00" },
        { "a lower-case code still limits", "pt", "12345678901", "PT", "123456789" },
    };
    for (const auto &c : cases) {
        control->setCountryID(c.before);
        erase();
        type(c.typed);
        EXPECT_EQ(control->CountryID(), c.country) << c.rule;
        EXPECT_EQ(box->text(), c.text) << c.rule;
        EXPECT_EQ(box->cursorPosition(), c.text.size()) << c.rule;
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
    EXPECT_EQ(textColour(*control), 0u);
    type(PlainNif.left(8));
    EXPECT_EQ(textColour(*control), White);
    EXPECT_EQ(backColour(*control), Red);
    EXPECT_EQ(statusColour(*control), Red);

    control->setEnabled(false);
    EXPECT_FALSE(box->isEnabled());
    EXPECT_EQ(backColour(*control), Grey);
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
    const struct
    {
        const char *rule;
        QString value;
        QString text;
        QString readBack;
        platform::OleColor back;
    } cases[] = {
        { "a code switches the country", "ES12345678Z", "12345678Z", "ES12345678Z", White },
        { "a bare number keeps the country", PlainNif, PlainNif, "ES123456789", Red },
        { "back to Portugal", "PT" + PlainNif, PlainNif, "PT123456789", White },
        { "the same digits are checked by the new country's rules", "ES" + PlainNif, PlainNif, "ES123456789", Red },
        { "empty is Portugal, blank", "", "", "PT", White },
    };
    for (const auto &c : cases) {
        control->setValue(c.value);
        EXPECT_EQ(box->text(), c.text) << c.rule;
        EXPECT_EQ(control->Value(), c.readBack) << c.rule;
        EXPECT_EQ(backColour(*control), c.back) << c.rule;
    }
    EXPECT_TRUE(control->IsEmpty());

    control->setValue("PT" + PlainNif);
    log->clear();
    EXPECT_TRUE(control->IsOK());
    EXPECT_EQ(log->events, QStringList { "Validated" });
    control->RefreshMe();
    EXPECT_EQ(log->count("NIFIndicated"), 1);
}

TEST_F(NifControl, countryNamesAndFlagsComeFromTheCountryFileAndTheStrip)
{
    EXPECT_EQ(control->CountryName(), "Portugal");
    control->setCountryID("ES");
    EXPECT_EQ(control->CountryName(true), "Espanha - Código ISO3166: 724 (ES,ESP) - País da União Europeia");
    control->setCountryID("EL");
    EXPECT_EQ(control->CountryName(true), "Grécia - Código ISO3166: 300 (EL,GRC) - País da União Europeia");
    PictureBox surface;
    EXPECT_EQ(control->findChild<PictureBox *>("cPicture")->Picture(), mod_CTL::flagOn(surface, "GR"));
    control->setCountryID("XX");
    EXPECT_EQ(control->CountryName(true), "");
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

    control->setInformation("email", "ana@example.invalid");
    grabbers.last->answer("PT" + AnaNif, { { "NAME", "ANA LOPES" }, { "SERVICO", "3132" } });
    EXPECT_EQ(control->Information("servico"), "3132");
    EXPECT_EQ(control->Information("email"), "ana@example.invalid") << "a field the fetcher lacks is kept";
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

// The record of a number keeps what is let into it however the holder was looked up, with
// or without a declaration, and only for that number.
TEST_F(NifControl, recordIsKeptPerNumber)
{
    const struct
    {
        const char *lookup;
        bool declared;
        bool busy;
        bool fetchingOff;
    } lookups[] = {
        { "a declaration", true, false, false },
        { "nothing found", false, false, false },
        { "fetcher busy", false, true, false },
        { "fetching off", false, false, true },
    };
    const struct
    {
        const char *rule;
        QString key;
        QString value;
        QStringList events;
    } lets[] = {
        { "AUTO is stored quietly", "AUTO", "x", { "Validated" } },
        { "a new value", "email", "x@example.invalid", { "Validated", "UpdatedInformation:email" } },
        { "the same value changes nothing", "email", "x@example.invalid", { "Validated" } },
        { "emptying raises no UpdatedInformation", "email", "", { "Validated" } },
        { "a name", "nome", "JOSÉ", { "Validated", "UpdatedInformation:nome", "NameUpdated:JOSÉ" } },
    };
    for (const auto &lookup : lookups) {
        const std::string where = lookup.lookup;
        replaceControl();
        companion::JsonDeclaration fresh;
        control->setIRSClass(lookup.declared ? &fresh : nullptr);
        grabbers.last->busy = lookup.busy;
        std::optional<NoAutoFetch> off;
        if (lookup.fetchingOff)
            off.emplace();
        type(PlainNif.left(8));
        log->clear();
        control->setInformation("email", "x");
        EXPECT_EQ(log->events, QStringList { "Validated" }) << where << ": an invalid number takes nothing";

        type(PlainNif.right(1));
        EXPECT_EQ(grabbers.last->fetched.isEmpty(), lookup.busy || lookup.fetchingOff) << where;
        if (!lookup.busy)
            grabbers.last->answer("PT" + PlainNif, {});
        for (const auto &let : lets) {
            log->clear();
            control->setInformation(let.key, let.value);
            EXPECT_EQ(log->events, let.events) << where << ": " << let.rule;
            EXPECT_EQ(control->Information(let.key), let.value) << where << ": " << let.rule;
            if (lookup.declared) {
                EXPECT_EQ(storedInfo(fresh, "PT123456789." + let.key), let.value) << let.rule;
            }
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
    const struct
    {
        const char *route;
        std::function<void()> go;
        QString value;
    } routes[] = {
        { "Value", [&] { control->setValue("PT" + AnaNif); }, "PT" + AnaNif },
        { "paste",
            [&] {
                QGuiApplication::clipboard()->setText(AnaNif);
                QTest::keyClick(box, Qt::Key_V, Qt::ControlModifier);
            },
            "PT" + AnaNif },
        { "country list", [&] { control->ShowCountryList(); }, "US" + PlainNif },
    };
    for (const auto &route : routes) {
        control->setValue("PT" + PlainNif);
        ASSERT_EQ(control->Nome(), "MARIA") << route.route;
        ASSERT_EQ(statusColour(*control), NamedMark) << route.route;
        route.go();
        EXPECT_EQ(control->Value(), route.value) << route.route;
        EXPECT_EQ(control->Nome(), "") << route.route;
        EXPECT_EQ(control->Description(), route.value) << route.route;
        EXPECT_EQ(tipText(*control), "") << route.route;
        EXPECT_NE(statusColour(*control), NamedMark) << route.route;
        grabbers.last->answer(route.value, {});
    }
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
    legacy.WriteProperty("BackColor", "&H00FF00&");
    cNIF old;
    old.Load(legacy);
    EXPECT_EQ(old.CountryID(), "FR");
    EXPECT_EQ(old.Countries(), GSEL_OnlyPT) << "an unknown filter falls back";
    EXPECT_EQ(old.BackColor(), 0x00FF00u) << "a colour written as a literal";
    EXPECT_EQ(old.palette().color(QPalette::Window), QColor(0, 255, 0));
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
    for (const int answers : { 1, 2 }) {
        ASSERT_TRUE(QTest::qWaitFor([&log, answers] { return log.count("DataFinished") == answers; }));
        control->setValue("PT" + (answers == 1 ? OtherNif : AnaNif));
    }
    EXPECT_EQ(control->Nome(), "ANA MARIA FERREIRA LOPES") << "a holder looked up before is known at once";
    EXPECT_EQ(tipText(*control), "ANA MARIA FERREIRA LOPES\r\n1000-001\r\nLisboa\r\nNIF: 210345675\r\nPaís: Portugal");
}

TEST(NifLayout, keepsItsHeightAndLooksDisabledInADisabledParent)
{
    QWidget form;
    auto *column = new QVBoxLayout(&form);
    auto *control = new cNIF;
    column->addWidget(control);
    form.resize(300, 400);
    form.show();
    EXPECT_EQ(control->height(), 21) << "one line high in a column";

    form.setEnabled(false);
    EXPECT_EQ(backColour(*control), Grey);
    EXPECT_TRUE(control->Enabled()) << "the host's own setting is unchanged";
    MenuChooser menu;
    rightClick(entryBox(*control));
    rightClick(control->findChild<QWidget *>("cPicture"));
    EXPECT_EQ(menu.shown, 0);
    form.setEnabled(true);
    EXPECT_EQ(backColour(*control), White);
}

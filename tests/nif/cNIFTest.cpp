#include "NifTestSupport.h"

#include "frame/ClassRegistry.h"
#include "nif/frmEditNIF.h"
#include "platform/Settings.h"
#include "selection/PictureBox.h"
#include "selection/frmSelectCountry.h"
#include "selection/mod_CTL.h"
#include "support/TestSupport.h"

#include <QClipboard>
#include <QContextMenuEvent>
#include <QDialog>
#include <QMimeData>
#include <QRegularExpression>
#include <QTimer>

#include <optional>
#include <tuple>

using namespace zelctl;
using namespace zelctl::test;

namespace {

constexpr platform::OleColor White = 0xFFFFFF, Red = 0x0000FF, NamedMark = 0x00FF00;

// Fetching off for the scope.
struct NoAutoFetch
{
    NoAutoFetch() { platform::SaveSetting("ZEL", "Config", "allowautonif", "0"); }
    ~NoAutoFetch() { platform::DeleteSetting("ZEL", "Config", "allowautonif"); }
};

class NifControl : public NifFixture
{
protected:
    void choose(const QString &entry)
    {
        MenuChooser chooser(entry);
        control->PopupContextMenu();
        ASSERT_EQ(chooser.shown, 1);
    }

    void paste(const QString &clipboardText)
    {
        QGuiApplication::clipboard()->setText(clipboardText);
        choose("mnu_paste");
    }

    static QString clipboard() { return QGuiApplication::clipboard()->text(); }

    // Every way the user pastes the clipboard into the box (the middle click is an X11 test).
    const std::pair<const char *, std::function<void()>> pasteRoutes[4] = {
        { "menu Paste", [this] { choose("mnu_paste"); } },
        { "Ctrl+V", [this] { QTest::keyClick(box, Qt::Key_V, Qt::ControlModifier); } },
        { "Shift+Insert", [this] { QTest::keyClick(box, Qt::Key_Insert, Qt::ShiftModifier); } },
        { "drop",
            [this] {
                QMimeData data;
                data.setText(clipboard());
                QDragEnterEvent enter(QPoint(5, 5), Qt::CopyAction, &data, Qt::LeftButton, Qt::NoModifier);
                QApplication::sendEvent(box, &enter);
                QDropEvent drop(QPointF(5, 5), Qt::CopyAction, &data, Qt::LeftButton, Qt::NoModifier);
                QApplication::sendEvent(box, &drop);
            } },
    };
};
using NifMenu = NifControl;

// A host may delete the control, or close the window that holds it, from any of its events
// and while its fetch, menu, country list or record form is pending. Nothing may run on
// what was deleted afterwards (the sanitizers watch), and what the host kept lives on.
class NifLifetime : public NifFixture
{
public:
    void reset()
    {
        TearDown();
        SetUp();
    }

    void goAway(bool wholeWindow)
    {
        if (wholeWindow)
            delete form.data();
        else
            delete control.data();
    }

    // The user's path, step by step, until the control has gone: a pasted number whose
    // holder is fetched, its country changed by the flag, then the box emptied.
    void walkUntilDeleted()
    {
        const QPointer<ScriptedGrabber> grabber = grabbers.last;
        const std::function<void()> steps[] = {
            [&] { QTest::keyClicks(box, PlainNif.left(8)); },
            [&] { QTest::keyClicks(box, PlainNif.right(1)); },
            [&] {
                grabber->answer("PT" + PlainNif, { { "NAME", "MARIA" }, { "SERVICO", "3131" } });
            },
            [&] {
                QGuiApplication::clipboard()->setText("ES12345678Z");
                QTest::keyClick(box, Qt::Key_V, Qt::ControlModifier);
            },
            [&] { QTest::mouseClick(control->findChild<QWidget *>("cPicture"), Qt::LeftButton); },
            [&] {
                box->selectAll();
                QTest::keyClick(box, Qt::Key_Backspace);
            },
        };
        for (const auto &step : steps) {
            step();
            if (!control)
                break;
        }
        runDeferredDeletes();
    }
};

} // namespace

// A host's own paste() is read as typing is.
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
    for (const bool byHost : { false, true }) {
        for (const auto &[rule, before, typed, country, text] : cases) {
            control->setCountryID(before);
            erase();
            QGuiApplication::clipboard()->setText(typed);
            byHost ? box->paste() : type(typed);
            EXPECT_EQ(control->CountryID(), country) << rule << (byHost ? ", pasted by the host" : "");
            EXPECT_EQ(box->text(), text) << rule << (byHost ? ", pasted by the host" : "");
            EXPECT_EQ(box->cursorPosition(), text.size()) << rule;
        }
    }
}

// The colours of each state are in the golden pictures; here what changes them.
TEST_F(NifControl, marksFollowTheNumber)
{
    // Whatever keeps the lookup from running, a valid number drops the red mark.
    {
        NoAutoFetch off;
        type(PlainNif);
        EXPECT_EQ(statusColour(*control), White) << "fetching off";
    }
    grabbers.last->busy = true;
    QTest::keyClick(box, Qt::Key_Backspace);
    type("9");
    EXPECT_EQ(statusColour(*control), White) << "fetcher busy";

    control->setCountryID("ES");
    QTest::mouseClick(control->findChild<QWidget *>("cPicture"), Qt::LeftButton);
    EXPECT_EQ(control->CountryID(), "PT") << "only Portugal to choose from";
    EXPECT_EQ(events.last(), "NIFIndicated") << "the flag's Portugal was checked";
}

TEST_F(NifControl, valueRoundTrips)
{
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
        EXPECT_EQ(colour(*control), back) << rule;
    }
    EXPECT_TRUE(control->IsEmpty());
    control->setRequired(true);
    EXPECT_FALSE(control->IsOK()) << "an empty box is never OK";
}

TEST_F(NifControl, declarationNameIsFoundWithoutFetchingAndShownInTheTip)
{
    declaration.DeclarationData().NifInfoStore().Write("PT" + PlainNif + ".nome", "MARIA DA SILVA");
    control->setIRSClass(&declaration);
    type(PlainNif);

    EXPECT_TRUE(grabbers.last->fetched.isEmpty());
    const qsizetype named = events.indexOf("NameUpdated:MARIA DA SILVA");
    const qsizetype finished = events.indexOf("DataFinished");
    EXPECT_GE(named, 0);
    EXPECT_LT(named, finished);
    EXPECT_LT(finished, events.lastIndexOf("Changed"));
    EXPECT_EQ(tipText(*control), "MARIA DA SILVA\r\nNIF: 123456789\r\nPaís: Portugal");

    events.clear();
    erase();
    EXPECT_EQ(events, QStringList({ "Cleared", "Cleared", "Changed" })) << "emptying a named number";
    EXPECT_EQ(tipText(*control), "");
}

TEST_F(NifControl, fetchedInformationFillsTheRecordInOrderAndOnlyThatNumbers)
{
    control->setIRSClass(&declaration);
    type(AnaNif);
    ASSERT_EQ(grabbers.last->fetched, QStringList { "PT" + AnaNif });
    EXPECT_EQ(events.count("DataFinished"), 0) << "the answer comes later";

    events.clear();
    grabbers.last->answer(
        "PT" + AnaNif, { { "NAME", "ANA LOPES" }, { "SERVICO", "3131" }, { "STATUS", "Activo" }, { "EMAIL", "" } });

    EXPECT_EQ(events.filter(QRegularExpression("^UpdatedInformation")),
        QStringList({ "UpdatedInformation:nome", "UpdatedInformation:servico", "UpdatedInformation:status" }));
    EXPECT_EQ(events.last(), "DataFinished");
    EXPECT_GE(events.count("NameUpdated:ANA LOPES"), 1);
    EXPECT_EQ(declaration.DeclarationData().NifInfoStore().Read("PT" + AnaNif + ".servico"), "3131");
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

    events.clear();
    grabbers.last->answer("PT" + PlainNif, { { "NAME", "MARIA" }, { "SERVICO", "3132" } });
    EXPECT_EQ(events, QStringList { "DataFinished" });
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
        events.clear();
        control->setInformation("email", "x");
        EXPECT_EQ(events, QStringList { "Validated" }) << where << ": an invalid number takes nothing";

        type(PlainNif.right(1));
        EXPECT_EQ(grabbers.last->fetched.isEmpty(), busy || fetchingOff) << where;
        if (!busy)
            grabbers.last->answer("PT" + PlainNif, {});
        for (const auto &[rule, key, value, raised] : lets) {
            events.clear();
            control->setInformation(key, value);
            EXPECT_EQ(events, raised) << where << ": " << rule;
            EXPECT_EQ(control->Information(key), value) << where << ": " << rule;
            EXPECT_EQ(
                fresh.DeclarationData().NifInfoStore().Read("PT123456789." + key).toString(), declared ? value : "")
                << rule;
        }
        control->setNome("ANA");
        control->setInformation("telefone", "210000000");

        control->setValue("PT" + AnaNif);
        EXPECT_EQ(control->Information("telefone"), "") << where << ": another number's record is its own";
        EXPECT_NE(control->Nome(), "ANA") << where;
        control->setValue("PT" + PlainNif);
        EXPECT_EQ(control->Information("telefone"), "210000000") << where << ": kept through the lookups";
        EXPECT_EQ(control->Nome(), "ANA") << where;
    }
}

// Going straight from one holder's number to another's shows nothing of the first.
TEST_F(NifControl, aNewNumberStartsClean)
{
    declaration.DeclarationData().NifInfoStore().Write("PT" + PlainNif + ".nome", "MARIA");
    control->setIRSClass(&declaration);
    control->setCountries(GSEL_Custom);
    control->setCustomCountryList("PT,US");
    ModalDriver countryList([](QDialog &dialog) {
        EXPECT_EQ(qobject_cast<frmSelectCountry *>(&dialog)->customList(), "PT,US") << "the list follows the filter";
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
        EXPECT_EQ(tipText(*control), "") << route;
        EXPECT_NE(statusColour(*control), NamedMark) << route;
        grabbers.last->answer(value, {});
    }
}

TEST_F(NifControl, greeceIsNamedAndFlaggedFromItsLine)
{
    control->setCountryID("EL");
    EXPECT_EQ(control->CountryName(true), "Grécia - Código ISO3166: 300 (EL,GRC) - País da União Europeia");
    PictureBox surface;
    EXPECT_EQ(control->findChild<PictureBox *>("cPicture")->Picture(), mod_CTL::flagOn(surface, "GR"));
    control->setCountryID("XX");
    EXPECT_EQ(control->CountryName(true), "");
}

TEST(NifPersistence, savesAndLoadsItsPropertiesAndOldOnes)
{
    cNIF saved;
    saved.InitNew();
    saved.setCountries(GSEL_Custom);
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

TEST_F(NifMenu, offersItsEntriesOnTheBoxAndTheFlagAndRefreshFetchesAgain)
{
    control->setValue("PT" + AnaNif);
    grabbers.last->answer("PT" + AnaNif, {});
    choose("mnu_RefreshNIFInfo");
    EXPECT_EQ(grabbers.last->fetched, QStringList({ "PT" + AnaNif, "PT" + AnaNif }));
    MenuChooser chooser;
    rightClick(box);
    rightClick(control->findChild<QWidget *>("cPicture"));
    EXPECT_EQ(chooser.shown, 2);
    // Only a valid number has a record.
    for (const auto &[number, record] : { std::pair { PlainNif, true }, { PlainNif.left(8), false }, { "", false } }) {
        box->setText(number);
        control->PopupContextMenu();
        EXPECT_EQ(chooser.offered.contains("mnu_ficha"), record) << number.toStdString();
    }
}

TEST_F(NifMenu, disabledMenuShowsNoMenuAtAll)
{
    control->setDisablePopupMenu(true);
    MenuChooser chooser;
    bool sawAMenu = false;
    QObject watch;
    // Any menu at all (the box's own included) would be the active pop-up when this runs.
    QTimer::singleShot(0, &watch, [&] {
        if (QWidget *popup = QApplication::activePopupWidget()) {
            sawAMenu = true;
            popup->close();
        }
    });
    rightClick(box);
    rightClick(control->findChild<QWidget *>("cPicture"));
    QContextMenuEvent byKey(QContextMenuEvent::Keyboard, QPoint(5, 5), box->mapToGlobal(QPoint(5, 5)));
    QApplication::sendEvent(box, &byKey);
    QMetaObject::invokeMethod(control, "PopupContextMenu");
    QCoreApplication::processEvents();
    EXPECT_EQ(chooser.shown, 0);
    EXPECT_FALSE(sawAMenu);

    control->setDisablePopupMenu(false);
    QApplication::sendEvent(box, &byKey);
    EXPECT_EQ(chooser.shown, 1) << "the menu key opens the control's menu";
}

TEST_F(NifMenu, editingEntriesByMenuAndKey)
{
    QTest::keyClicks(box, PlainNif);
    box->setSelection(2, 3);
    choose("mnu_Copy");
    EXPECT_EQ(clipboard(), PlainNif) << "the whole number, no country code, selection ignored";
    QGuiApplication::clipboard()->clear();
    box->setSelection(2, 3);
    choose("mnu_cut");
    EXPECT_EQ(clipboard(), PlainNif);
    EXPECT_EQ(box->text(), "126789") << "only the selection goes";
    paste("ES12345678Z");
    choose("mnu_undo");
    EXPECT_EQ(box->text(), "126789") << "undo takes the paste back";
}

// Every route reads the country code and loses no character to the Portuguese limit.
TEST_F(NifMenu, pasteByEveryRouteReadsTheCountryCode)
{
    // The rule, the clipboard, then the country and the text after pasting.
    const std::tuple<const char *, QString, QString, QString> cases[] = {
        { "a member state's number", "ES12345678Z", "ES", "12345678Z" },
        { "a long bare number is cut to nine", "1234567890123", "PT", PlainNif },
        { "any code before digits", "us123456", "US", "123456" },
        { "the first 100 characters", "US" + QString(298, '7'), "US", QString(98, '7') },
        { "an empty clipboard", "", "PT", "" },
        { "text without a code", "abc", "PT", "abc" },
        { "another country's code only before a number", "US1A", "PT", "US1A" },
    };
    for (const auto &[route, pasteBy] : pasteRoutes) {
        for (const auto &[rule, text, country, after] : cases) {
            control->setCountryID("FR");
            box->setText("0000");
            QGuiApplication::clipboard()->setText(text);
            pasteBy();
            EXPECT_EQ(control->CountryID(), country) << route << ": " << rule;
            EXPECT_EQ(box->text(), after) << route << ": " << rule;
        }
    }
}

// Locked, disabled, or in a disabled form: no route of the user's changes the number.
TEST_F(NifMenu, aBoxTheUserMayNotChangeKeepsItsText)
{
    // The state, how to set it, the background it gives and the menus a right click opens
    // (a disabled box still offers Copy; a disabled form takes no click).
    const std::tuple<const char *, std::function<void(bool)>, platform::OleColor, int> states[] = {
        { "locked", [&](bool on) { control->setLocked(on); }, 0xFFFFFF, 1 },
        { "disabled", [&](bool on) { control->setEnabled(!on); }, 0xC8C8C8, 1 },
        { "in a disabled form",
            [&](bool on) {
                form->setEnabled(!on);
                EXPECT_TRUE(control->Enabled()) << "the host's own setting is unchanged";
            },
            0xC8C8C8, 0 },
    };
    control->setCountries(GSEL_OnlyEU);
    for (const auto &[state, set, back, menus] : states) {
        control->setValue("ES12345678Z");
        set(true);
        EXPECT_EQ(colour(*control), back) << state;
        MenuChooser chooser;
        rightClick(box);
        EXPECT_EQ(chooser.shown, menus) << state;
        control->PopupContextMenu();
        for (const char *entry : { "mnu_undo", "mnu_cut", "mnu_paste", "mnu_Delete" })
            EXPECT_FALSE(chooser.offered.contains(entry)) << state << ": " << entry;
        EXPECT_TRUE(chooser.offered.contains("mnu_Copy")) << state;

        QGuiApplication::clipboard()->setText("PT" + PlainNif);
        for (const auto &[route, pasteBy] : pasteRoutes) {
            pasteBy();
            EXPECT_EQ(control->Value(), "ES12345678Z") << state << ": " << route;
        }
        QTest::keyClick(box, Qt::Key_X, Qt::ControlModifier);
        QTest::mouseClick(control->findChild<QWidget *>("cPicture"), Qt::LeftButton);
        EXPECT_EQ(control->Value(), "ES12345678Z") << state << ": the flag opens no list";
        EXPECT_EQ(clipboard(), "PT" + PlainNif) << state;
        set(false);
    }
    EXPECT_EQ(colour(*control), 0xFFFFFFu);
}

TEST_F(NifLifetime, deletedFromInsideEachOfItsEvents)
{
    for (const bool wholeWindow : { false, true }) {
        for (const QString event : { "Changed", "Validated", "NIFIndicated", "UpdatedInformation", "NameUpdated",
                 "DataFinished", "Cleared" }) {
            reset();
            onEveryEvent(*control, [this, event, wholeWindow](const QString &raised) {
                if (raised.section(':', 0, 0) == event)
                    goAway(wholeWindow);
            });
            walkUntilDeleted();
            EXPECT_TRUE(control.isNull()) << event.toStdString() << " was raised on the user's path";
            EXPECT_EQ(form.isNull(), wholeWindow) << event.toStdString();
        }
    }
}

TEST_F(NifLifetime, deletedWhileSomethingOfItsOwnIsPendingOrLoading)
{
    bool wholeWindow = false;
    const std::pair<const char *, std::function<void()>> cases[] = {
        { "its menu", [&] { rightClick(box); } },
        { "its country list",
            [&] {
                control->setCountries(GSEL_All);
                QTest::mousePress(control->findChild<QWidget *>("cPicture"), Qt::LeftButton);
                QTest::mouseRelease(control->findChild<QWidget *>("cPicture"), Qt::LeftButton);
            } },
        { "its record form",
            [&] {
                control->setValue("PT" + PlainNif);
                MenuChooser chooser("mnu_ficha");
                control->PopupContextMenu();
            } },
        // Loading refreshes the valid number it holds, which raises NIFIndicated.
        { "its loading",
            [&] {
                control->setValue("PT" + PlainNif);
                const PropertyBag saved = control->Save();
                onEveryEvent(*control, [&](const QString &raised) {
                    if (raised == "NIFIndicated")
                        goAway(wholeWindow);
                });
                control->Load(saved);
            } },
    };
    for (const bool whole : { false, true }) {
        wholeWindow = whole;
        for (const auto &[pending, open] : cases) {
            reset();
            MenuChooser menu({}, [&] { goAway(wholeWindow); });
            ModalDriver dialogs([&](QDialog &) {
                goAway(wholeWindow);
                return int(QDialog::Rejected);
            });
            open();
            runDeferredDeletes();
            EXPECT_TRUE(control.isNull()) << pending;
            EXPECT_EQ(form.isNull(), wholeWindow) << pending;
        }
    }

    // A fetch that answers after its control went reaches nothing.
    reset();
    companion::setNIFGrabberFactory({});
    auto *fetching = new cNIF(form);
    fetching->setValue("PT" + AnaNif);
    delete fetching;
    auto *later = new cNIF(form);
    bool answered = false;
    QObject::connect(later, &cNIF::DataFinished, [&answered] { answered = true; });
    later->setValue("PT" + OtherNif);
    ASSERT_TRUE(QTest::qWaitFor([&answered] { return answered; })) << "a later fetch answered";
}

TEST_F(NifLifetime, recordFormSurvivesItsHostsEvents)
{
    control->setValue("PT" + PlainNif);
    // The host closes the form, or deletes the control, when the name it confirmed arrives.
    QPointer<frmEditNIF> editor = new frmEditNIF(form);
    editor->SetNIFControl(control);
    editor->findChild<QLineEdit *>("xNome")->setText("OUTRO NOME");
    QObject::connect(control, &cNIF::NameUpdated, [&editor] { delete editor.data(); });
    press(*editor, 1);
    EXPECT_TRUE(editor.isNull());

    editor = new frmEditNIF(form);
    editor->SetNIFControl(control);
    editor->findChild<QLineEdit *>("xNome")->setText("TERCEIRO");
    QObject::connect(control, &cNIF::UpdatedInformation, [this] { delete control.data(); });
    press(*editor, 0);
    EXPECT_TRUE(control.isNull());
    EXPECT_FALSE(editor.isNull());

    // A form closed while its public information is fetched hears nothing of the answer.
    reset();
    control->setValue("PT" + AnaNif);
    QPointer<ScriptedGrabber> grabber = grabbers.last;
    grabber->answer("PT" + AnaNif, {});
    editor = new frmEditNIF(form);
    editor->SetNIFControl(control);
    press(*editor, 3);
    delete editor.data();
    grabber->answer("PT" + AnaNif, { { "NAME", "ANA LOPES" } });
    EXPECT_EQ(control->Nome(), "ANA LOPES");
}

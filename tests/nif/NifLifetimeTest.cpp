#include "NifTestSupport.h"

#include "nif/frmEditNIF.h"
#include "selection/frmSelectCountry.h"
#include "support/TestSupport.h"

#include <QClipboard>
#include <QDialog>
#include <QPointer>

using namespace zelctl;
using namespace zelctl::test;

// A host may delete the control, or close the window that holds it, from any of its events
// and while its fetch, menu, country list or record form is pending. Nothing may run on
// what was deleted afterwards (the sanitizers watch), and what the host kept lives on.
namespace {

class NifLifetime : public ::testing::Test
{
public:
    void SetUp() override
    {
        window = new QWidget;
        control = new cNIF(window);
        control->InitNew();
        window->show();
    }

    void TearDown() override
    {
        delete window.data();
        runDeferredDeletes();
    }

    void reset()
    {
        TearDown();
        SetUp();
    }

    void goAway(bool wholeWindow)
    {
        if (wholeWindow)
            delete window.data();
        else
            delete control.data();
    }

    QLineEdit *box() const { return entryBox(*control); }

    // The user's path, step by step, until the control has gone: a pasted number whose
    // holder is fetched, its country changed by the flag, then the box emptied.
    void walkUntilDeleted()
    {
        const QPointer<ScriptedGrabber> grabber = grabbers.last;
        const std::function<void()> steps[] = {
            [&] { QTest::keyClicks(box(), PlainNif.left(8)); },
            [&] { QTest::keyClicks(box(), PlainNif.right(1)); },
            [&] {
                grabber->answer("PT" + PlainNif, { { "NAME", "MARIA" }, { "SERVICO", "3131" } });
            },
            [&] {
                QGuiApplication::clipboard()->setText("ES12345678Z");
                QTest::keyClick(box(), Qt::Key_V, Qt::ControlModifier);
            },
            [&] { QTest::mouseClick(control->findChild<QWidget *>("cPicture"), Qt::LeftButton); },
            [&] {
                box()->selectAll();
                QTest::keyClick(box(), Qt::Key_Backspace);
            },
        };
        for (const auto &step : steps) {
            step();
            if (!control)
                break;
        }
        runDeferredDeletes();
    }

    ScriptedGrabberFactory grabbers;
    QPointer<QWidget> window;
    QPointer<cNIF> control;
};

} // namespace

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
            EXPECT_EQ(window.isNull(), wholeWindow) << event.toStdString();
        }
    }
}

TEST_F(NifLifetime, deletedWhileSomethingOfItsOwnIsPendingOrLoading)
{
    bool wholeWindow = false;
    const std::pair<const char *, std::function<void()>> cases[] = {
        { "its menu", [&] { rightClick(box()); } },
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
            EXPECT_EQ(window.isNull(), wholeWindow) << pending;
        }
    }

    // A fetch that answers after its control went reaches nothing.
    reset();
    companion::setNIFGrabberFactory({});
    auto *fetching = new cNIF(window);
    fetching->setValue("PT" + AnaNif);
    delete fetching;
    auto *later = new cNIF(window);
    EventLog log(*later);
    later->setValue("PT" + OtherNif);
    ASSERT_TRUE(QTest::qWaitFor([&log] { return log.count("DataFinished") == 1; })) << "a later fetch answered";
}

TEST_F(NifLifetime, recordFormSurvivesItsHostsEvents)
{
    control->setValue("PT" + PlainNif);
    // The host closes the form, or deletes the control, when the name it confirmed arrives.
    QPointer<frmEditNIF> form = new frmEditNIF(window);
    form->SetNIFControl(control);
    form->findChild<QLineEdit *>("xNome")->setText("OUTRO NOME");
    QObject::connect(control, &cNIF::NameUpdated, [&form] { delete form.data(); });
    press(*form, 1);
    EXPECT_TRUE(form.isNull());

    form = new frmEditNIF(window);
    form->SetNIFControl(control);
    form->findChild<QLineEdit *>("xNome")->setText("TERCEIRO");
    QObject::connect(control, &cNIF::UpdatedInformation, [this] { delete control.data(); });
    press(*form, 0);
    EXPECT_TRUE(control.isNull());
    EXPECT_FALSE(form.isNull());

    // A form closed while its public information is fetched hears nothing of the answer.
    reset();
    control->setValue("PT" + AnaNif);
    QPointer<ScriptedGrabber> grabber = grabbers.last;
    grabber->answer("PT" + AnaNif, {});
    form = new frmEditNIF(window);
    form->SetNIFControl(control);
    press(*form, 3);
    delete form.data();
    grabber->answer("PT" + AnaNif, { { "NAME", "ANA LOPES" } });
    EXPECT_EQ(control->Nome(), "ANA LOPES");
}

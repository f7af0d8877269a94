#include "NifTestSupport.h"

#include "nif/PopupMenuPresenter.h"
#include "nif/frmEditNIF.h"
#include "support/TestSupport.h"

#include <QAction>
#include <QClipboard>
#include <QContextMenuEvent>
#include <QMenu>
#include <QMimeData>
#include <QTimer>

using namespace zelctl;
using namespace zelctl::test;

namespace {

class NifMenu : public NifFixture
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
};

} // namespace

TEST_F(NifMenu, offersItsEntriesOnTheBoxAndTheFlag)
{
    MenuChooser chooser;
    rightClick(box);
    ASSERT_EQ(chooser.shown, 1);
    EXPECT_EQ(chooser.entries,
        QStringList({ "mnu_undo|&Desfazer|Ctrl+Z|off", "mnu_blank00|||on", "mnu_cut|&Cortar|Ctrl+X|on",
            "mnu_Copy|&Copiar|Ctrl+C|on", "mnu_paste|&Colar|Ctrl+V|on", "mnu_Delete|&Apagar||on", "mnu_blank01|||on",
            "mnu_selectall|&Escolher tudo|Ctrl+A|on", "mnu_blank02|||on",
            "mnu_RefreshNIFInfo|&Reobter informações...||on", "mnu_search|&Pesquisar...||off",
            "mnu_listnif|&Escolher da lista...||off", "mnu_ficha|&Ficha de contribuinte||off" }));
    EXPECT_EQ(chooser.defaultEntry, "mnu_paste");

    QTest::keyClicks(box, PlainNif);
    rightClick(control->findChild<QWidget *>("cPicture"));
    EXPECT_EQ(chooser.shown, 2);
    EXPECT_TRUE(chooser.offered("mnu_ficha")) << "a valid number has a record";
    EXPECT_TRUE(chooser.offered("mnu_undo"));

    QTest::keyClick(box, Qt::Key_Backspace);
    control->PopupContextMenu();
    EXPECT_FALSE(chooser.offered("mnu_ficha")) << "an invalid number has no record";
    QTest::keyClicks(box, "9");
    erase();
    control->PopupContextMenu();
    EXPECT_FALSE(chooser.offered("mnu_ficha")) << "nor has an empty box";
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

TEST_F(NifMenu, copyAndCutTakeTheWholeNumber)
{
    QTest::keyClicks(box, PlainNif);
    box->setSelection(2, 3);
    choose("mnu_Copy");
    EXPECT_EQ(clipboard(), PlainNif) << "no country code, selection ignored";
    EXPECT_EQ(box->text(), PlainNif);

    QGuiApplication::clipboard()->clear();
    box->setSelection(2, 3);
    choose("mnu_cut");
    EXPECT_EQ(clipboard(), PlainNif);
    EXPECT_EQ(box->text(), "126789") << "only the selection goes";

    box->deselect();
    choose("mnu_cut");
    EXPECT_EQ(clipboard(), "126789");
    EXPECT_EQ(box->text(), "");
}

TEST_F(NifMenu, pasteReadsTheCountryCode)
{
    struct Case
    {
        const char *rule;
        QString clipboard;
        QString country;
        QString text;
    };
    const QString longNumber = "US" + QString(298, '7');
    const Case cases[] = {
        { "a member state's number", "ES12345678Z", "ES", "12345678Z" },
        { "a bare number is Portuguese", PlainNif, "PT", PlainNif },
        { "any code before digits", "us123456", "US", "123456" },
        { "the first 100 characters", longNumber, "US", QString(98, '7') },
        { "an empty clipboard", "", "PT", "" },
        { "text without a code", "abc", "PT", "abc" },
        { "another country's code only before a number", "US1A", "PT", "US1A" },
    };
    for (const Case &c : cases) {
        control->setCountryID("FR");
        box->setText("0000");
        paste(c.clipboard);
        EXPECT_EQ(control->CountryID(), c.country) << c.rule;
        EXPECT_EQ(box->text(), c.text) << c.rule;
    }
    paste("US123456");
    EXPECT_TRUE(control->IsValid()) << "numbers of a country without a check are valid";

    // Every way of pasting reads the code, and no character is lost to the Portuguese limit.
    const std::pair<const char *, std::function<void()>> routes[] = {
        { "Ctrl+V", [&] { QTest::keyClick(box, Qt::Key_V, Qt::ControlModifier); } },
        { "Shift+Insert", [&] { QTest::keyClick(box, Qt::Key_Insert, Qt::ShiftModifier); } },
        { "a host's paste()",
            [&] {
                box->selectAll();
                box->paste();
            } },
        { "drop",
            [&] {
                QMimeData data;
                data.setText(clipboard());
                QDragEnterEvent enter(QPoint(5, 5), Qt::CopyAction, &data, Qt::LeftButton, Qt::NoModifier);
                QApplication::sendEvent(box, &enter);
                QDropEvent drop(QPointF(5, 5), Qt::CopyAction, &data, Qt::LeftButton, Qt::NoModifier);
                QApplication::sendEvent(box, &drop);
            } },
    };
    const Case everyRoute[] = {
        { "a member state's number", "ES12345678Z", "ES", "12345678Z" },
        { "a Portuguese number", PlainNif, "PT", PlainNif },
        { "a long number is cut to nine", "1234567890123", "PT", PlainNif },
    };
    for (const auto &[route, paste] : routes) {
        for (const Case &c : everyRoute) {
            control->setCountryID("PT");
            box->setText("0000");
            QGuiApplication::clipboard()->setText(c.clipboard);
            paste();
            EXPECT_EQ(control->CountryID(), c.country) << route << ": " << c.rule;
            EXPECT_EQ(box->text(), c.text) << route << ": " << c.rule;
        }
    }
}

TEST_F(NifMenu, deleteSelectAllAndUndoByMenuAndKey)
{
    QTest::keyClicks(box, "12345");
    choose("mnu_selectall");
    EXPECT_EQ(box->selectedText(), "12345");
    choose("mnu_Delete");
    EXPECT_EQ(box->text(), "");
    choose("mnu_undo");
    EXPECT_EQ(box->text(), "12345") << "undo takes the last edit back";

    paste("ES12345678Z");
    EXPECT_EQ(box->text(), "12345678Z");
    choose("mnu_undo");
    EXPECT_EQ(box->text(), "12345");

    QGuiApplication::clipboard()->setText("ES12345678Z");
    QTest::keyClick(box, Qt::Key_V, Qt::ControlModifier);
    QTest::keyClick(box, Qt::Key_A, Qt::ControlModifier);
    QTest::keyClick(box, Qt::Key_X, Qt::ControlModifier);
    EXPECT_EQ(box->text(), "");
    QTest::keyClick(box, Qt::Key_Z, Qt::ControlModifier);
    EXPECT_EQ(control->Value(), "ES12345678Z");
}

// Locked, disabled, or in a disabled form: only the host's code changes the number.
TEST_F(NifMenu, aBoxTheUserMayNotChangeKeepsItsText)
{
    const struct
    {
        const char *state;
        std::function<void(bool)> set;
    } states[] = {
        { "locked", [&](bool on) { control->setLocked(on); } },
        { "disabled", [&](bool on) { control->setEnabled(!on); } },
    };
    control->setCountries(GSEL_OnlyEU);
    for (const auto &state : states) {
        control->setValue("ES12345678Z");
        state.set(true);
        MenuChooser chooser;
        control->PopupContextMenu();
        for (const char *entry : { "mnu_undo", "mnu_cut", "mnu_paste", "mnu_Delete" })
            EXPECT_FALSE(chooser.offered(entry)) << state.state << ": " << entry;
        EXPECT_TRUE(chooser.offered("mnu_Copy")) << state.state;

        QGuiApplication::clipboard()->setText("PT" + PlainNif);
        QTest::keyClick(box, Qt::Key_V, Qt::ControlModifier);
        QTest::keyClick(box, Qt::Key_X, Qt::ControlModifier);
        QTest::mouseClick(control->findChild<QWidget *>("cPicture"), Qt::LeftButton);
        EXPECT_EQ(control->Value(), "ES12345678Z") << state.state << ": the flag opens no list";
        EXPECT_EQ(clipboard(), "PT" + PlainNif) << state.state;
        state.set(false);
    }
}

TEST_F(NifMenu, refreshAndRecordEntriesServeTheHolder)
{
    control->setValue("PT" + AnaNif);
    ScriptedGrabber *grabber = grabbers.last;
    grabber->answer("PT" + AnaNif, {});
    choose("mnu_RefreshNIFInfo");
    EXPECT_EQ(grabber->fetched, QStringList({ "PT" + AnaNif, "PT" + AnaNif }));

    ModalDriver driver([](QDialog &dialog) {
        EXPECT_EQ(dialog.windowTitle(), "Editar informação de contribuinte");
        EXPECT_EQ(dialog.findChild<cNIF *>("cNIF1")->Value(), "PT" + AnaNif);
        return int(QDialog::Rejected);
    });
    choose("mnu_ficha");
    EXPECT_EQ(driver.shownCount(), 1);
}

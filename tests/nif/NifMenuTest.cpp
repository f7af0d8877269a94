#include "NifTestSupport.h"

#include "nif/PopupMenuPresenter.h"

#include <QAction>
#include <QClipboard>
#include <QContextMenuEvent>
#include <QMenu>
#include <QMimeData>
#include <QTimer>

#include <tuple>

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
    EXPECT_TRUE(chooser.offered("mnu_undo"));
    // Only a valid number has a record.
    for (const auto &[number, record] : { std::pair { PlainNif, true }, { PlainNif.left(8), false }, { "", false } }) {
        box->setText(number);
        control->PopupContextMenu();
        EXPECT_EQ(chooser.offered("mnu_ficha"), record) << number.toStdString();
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

    QTest::keyClicks(box, "12345");
    choose("mnu_selectall");
    EXPECT_EQ(box->selectedText(), "12345");
    choose("mnu_Delete");
    EXPECT_EQ(box->text(), "");
    choose("mnu_undo");
    EXPECT_EQ(box->text(), "12345") << "undo takes the last edit back";
    paste("ES12345678Z");
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

// Every route reads the country code and loses no character to the Portuguese limit.
TEST_F(NifMenu, pasteByEveryRouteReadsTheCountryCode)
{
    // The rule, the clipboard, then the country and the text after pasting.
    const std::tuple<const char *, QString, QString, QString> cases[] = {
        { "a member state's number", "ES12345678Z", "ES", "12345678Z" },
        { "a bare number is Portuguese", PlainNif, "PT", PlainNif },
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
    paste("US123456");
    EXPECT_TRUE(control->IsValid()) << "numbers of a country without a check are valid";

    // A host's own paste() is read as typing is: a member state's code switches, the limit holds.
    const std::tuple<const char *, const char *, const char *> pastedByTheHost[]
        = { { "ES12345678Z", "ES", "12345678Z" }, { "123456789", "PT", "123456789" },
              { "1234567890123", "PT", "123456789" } };
    for (const auto &[text, country, after] : pastedByTheHost) {
        control->setCountryID("PT");
        box->setText("0000");
        QGuiApplication::clipboard()->setText(text);
        box->selectAll();
        box->paste();
        EXPECT_EQ(control->CountryID(), country) << text;
        EXPECT_EQ(box->text(), after) << text;
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
                form.setEnabled(!on);
                EXPECT_TRUE(control->Enabled()) << "the host's own setting is unchanged";
            },
            0xC8C8C8, 0 },
    };
    control->setCountries(GSEL_OnlyEU);
    for (const auto &[state, set, back, menus] : states) {
        control->setValue("ES12345678Z");
        set(true);
        EXPECT_EQ(backColour(*control), back) << state;
        MenuChooser chooser;
        rightClick(box);
        EXPECT_EQ(chooser.shown, menus) << state;
        control->PopupContextMenu();
        for (const char *entry : { "mnu_undo", "mnu_cut", "mnu_paste", "mnu_Delete" })
            EXPECT_FALSE(chooser.offered(entry)) << state << ": " << entry;
        EXPECT_TRUE(chooser.offered("mnu_Copy")) << state;

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
    EXPECT_EQ(backColour(*control), 0xFFFFFFu);
}

TEST_F(NifMenu, refreshFetchesTheHolderAgain)
{
    control->setValue("PT" + AnaNif);
    grabbers.last->answer("PT" + AnaNif, {});
    choose("mnu_RefreshNIFInfo");
    EXPECT_EQ(grabbers.last->fetched, QStringList({ "PT" + AnaNif, "PT" + AnaNif }));
}

// The gallery worked with the keyboard alone on a real display: Tab to each control, arrows
// within a group, Space and Enter to press, the dialogs and the list menu answered with keys.

#include "Gallery.h"

#include "companion/CommandButton.h"
#include "nif/cNIF.h"
#include "selection/frmSelector.h"
#include "subject/cSujeitoSelector.h"
#include "support/TestSupport.h"

#include <QApplication>
#include <QLabel>
#include <QPushButton>
#include <QTest>
#include <QTimer>
#include <QTreeWidget>

#include <gtest/gtest.h>

#include <functional>

using namespace zelctl;

namespace {

class KeyboardWalk : public ::testing::Test
{
protected:
    void SetUp() override
    {
        frmSelector::setZoomStepInterval(0);
        ASSERT_TRUE(test::showActive(&gallery));
    }

    static QWidget *focus() { return QApplication::focusWidget(); }

    static void key(Qt::Key key, Qt::KeyboardModifiers modifiers = {}) { QTest::keyClick(focus(), key, modifiers); }

    // Presses Tab until the focus is on a widget that `wanted` takes; nullptr when a whole
    // round of the form finds none.
    QWidget *tabTo(const std::function<bool(QWidget *)> &wanted)
    {
        for (int step = 0; step < 200 && focus(); ++step) {
            if (wanted(focus()))
                return focus();
            key(Qt::Key_Tab);
        }
        return nullptr;
    }

    QWidget *tabInto(QWidget *control)
    {
        return tabTo([control](QWidget *w) { return w == control || control->isAncestorOf(w); });
    }

    template <typename Control> Control *find(const std::function<bool(Control *)> &wanted = {})
    {
        for (Control *control : gallery.findChildren<Control *>())
            if (!wanted || wanted(control))
                return control;
        return nullptr;
    }

    // A modal dialog of the library answered with the keyboard: shown, then `keys` typed.
    static test::ModalDriver dialogAnswered(std::function<void()> keys)
    {
        return test::ModalDriver([keys](QDialog &dialog) {
            dialog.show();
            dialog.activateWindow();
            // Its owner's activation would satisfy qWaitForWindowActive; the keys need its own.
            EXPECT_TRUE(QTest::qWaitFor([&dialog] { return QApplication::activeWindow() == &dialog; }));
            keys();
            return dialog.result();
        });
    }

    // Back on the form once a dialog closed (a window manager would give it the activation).
    void backOnTheForm()
    {
        gallery.activateWindow();
        ASSERT_TRUE(QTest::qWaitFor([] { return QApplication::activeWindow() && focus(); }));
    }

    Gallery gallery;
};

TEST_F(KeyboardWalk, nifEntryAndItsCountryList)
{
    auto *nif = find<cNIF>();
    ASSERT_TRUE(tabInto(nif));
    QString listed;
    {
        const test::ModalDriver countries = dialogAnswered([&listed] {
            key(Qt::Key_Down);
            key(Qt::Key_Down);
            listed = qobject_cast<QTreeWidget *>(focus())->currentItem()->text(1);
            key(Qt::Key_Return);
        });
        key(Qt::Key_Down, Qt::AltModifier);
        ASSERT_EQ(countries.shownCount(), 1);
    }
    backOnTheForm();
    EXPECT_EQ(nif->CountryID(), listed);
    key(Qt::Key_A, Qt::ControlModifier);
    QTest::keyClicks(focus(), "PT123456789");
    EXPECT_EQ(nif->Value(), "PT123456789");
}

TEST_F(KeyboardWalk, subjectButtonsAndTheirList)
{
    auto *selector = find<cSujeitoSelector>();
    QWidget *first = tabInto(selector);
    ASSERT_TRUE(first);
    key(Qt::Key_Right);
    EXPECT_NE(focus(), first) << "arrows move among the subject buttons";
    key(Qt::Key_Left);
    EXPECT_EQ(focus(), first);
    auto *dependant = qobject_cast<CommandButton *>(tabTo([](QWidget *w) {
        auto *button = qobject_cast<CommandButton *>(w);
        return button && button->Tag() == "D";
    }));
    ASSERT_TRUE(dependant);
    // The real menu, answered with the keys once it is up.
    QTimer answer;
    QObject::connect(&answer, &QTimer::timeout, [&answer] {
        if (QWidget *menu = QApplication::activePopupWidget()) {
            answer.stop();
            QTest::keyClick(menu, Qt::Key_Down);
            QTest::keyClick(menu, Qt::Key_Down);
            QTest::keyClick(menu, Qt::Key_Return);
        }
    });
    answer.start(10);
    key(Qt::Key_Space);
    EXPECT_EQ(selector->SelectedSujeito(), "D2");
}

TEST_F(KeyboardWalk, selectionDialogAnsweredWithArrowsSpaceAndEnter)
{
    auto *languages = find<QPushButton>([](auto *b) { return b->text() == "Escolher a língua..."; });
    ASSERT_TRUE(tabTo([languages](QWidget *w) { return w == languages; }));
    QStringList visited;
    {
        const test::ModalDriver language = dialogAnswered([&visited] {
            visited << qobject_cast<CommandButton *>(focus())->Caption();
            key(Qt::Key_Right);
            key(Qt::Key_Right);
            visited << qobject_cast<CommandButton *>(focus())->Caption();
            const int row = focus()->y();
            key(Qt::Key_Down);
            EXPECT_GT(focus()->y(), row) << "Down goes to the next row";
            key(Qt::Key_Up);
            key(Qt::Key_Left);
            visited << qobject_cast<CommandButton *>(focus())->Caption();
            key(Qt::Key_Space);
            key(Qt::Key_Return);
        });
        key(Qt::Key_Space);
        ASSERT_EQ(language.shownCount(), 1);
    }
    backOnTheForm();
    EXPECT_EQ(visited, QStringList({ "Português", "Français", "English" }));
    EXPECT_TRUE(find<QLabel>([](auto *l) { return l->text() == "Escolhido: GB"; }));
}

} // namespace

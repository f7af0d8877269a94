#include "../NifTestSupport.h"

#include "nif/frmEditNIF.h"

#include <QClipboard>
#include <QLabel>
#include <QPointer>
#include <QVBoxLayout>

using namespace zelctl;
using namespace zelctl::test;

// Keyboard focus, activation and the X11 selection as a real X server gives them: a form
// with a box, a label whose buddy is the control ("&NIF:", Alt+N), and the control.
namespace {

class NifFocus : public ::testing::Test
{
protected:
    void SetUp() override
    {
        auto *column = new QVBoxLayout(&form);
        column->addWidget(first = new QLineEdit);
        auto *label = new QLabel(QStringLiteral("&NIF:"));
        column->addWidget(label);
        column->addWidget(control = new cNIF);
        label->setBuddy(control);
        form.show();
        form.activateWindow();
        ASSERT_TRUE(QTest::qWaitForWindowActive(&form));
    }

    ScriptedGrabberFactory grabbers;
    QWidget form;
    QLineEdit *first = nullptr;
    QPointer<cNIF> control;
};

} // namespace

TEST_F(NifFocus, focusGivenToTheControlLandsInTheBoxAndWritesMoveNone)
{
    EXPECT_EQ(control->height(), 21) << "one line high in a column";
    control->setFocus();
    EXPECT_EQ(QApplication::focusWidget(), entryBox(*control));
    first->setFocus();
    QTest::keyClick(first, Qt::Key_N, Qt::AltModifier);
    EXPECT_EQ(QApplication::focusWidget(), entryBox(*control)) << "the label's mnemonic";

    first->setFocus();
    control->setValue("PT" + PlainNif);
    control->setValue("ES12345678Z");
    EXPECT_EQ(QApplication::focusWidget(), first) << "writing Value leaves the user's caret alone";
}

TEST_F(NifFocus, middleClickPastesTheSelectionWithItsCountry)
{
    QClipboard *clipboard = QGuiApplication::clipboard();
    ASSERT_TRUE(clipboard->supportsSelection());
    clipboard->setText(QStringLiteral("ES12345678Z"), QClipboard::Selection);
    QTest::mouseClick(entryBox(*control), Qt::MiddleButton);
    EXPECT_EQ(control->CountryID(), "ES");
    EXPECT_EQ(entryBox(*control)->text(), "12345678Z") << "nothing lost to the Portuguese limit";

    control->setLocked(true);
    clipboard->setText(PlainNif, QClipboard::Selection);
    QTest::mouseClick(entryBox(*control), Qt::MiddleButton);
    EXPECT_EQ(control->Value(), "ES12345678Z") << "a locked box takes no paste";
}

TEST_F(NifFocus, deletedWhileItsBoxOrItsRecordFormHasTheFocus)
{
    control->setValue("PT" + PlainNif);
    QPointer<frmEditNIF> editor = new frmEditNIF(&form);
    editor->SetNIFControl(control);
    editor->show();
    editor->activateWindow();
    ASSERT_TRUE(QTest::qWaitForWindowActive(editor));
    auto *name = editor->findChild<QLineEdit *>("xNome");
    name->setFocus();
    // Without a window manager the server may hand activation back once more; wait for it.
    ASSERT_TRUE(QTest::qWaitFor([name] { return name->hasFocus(); }));
    QTest::keyClicks(name, "NOVO");
    delete editor.data();

    form.activateWindow();
    ASSERT_TRUE(QTest::qWaitForWindowActive(&form));
    QLineEdit *box = entryBox(*control);
    box->setFocus();
    ASSERT_TRUE(QTest::qWaitFor([box] { return box->hasFocus(); }));
    QTest::keyClicks(box, "1");
    delete control.data();
    QTest::keyClicks(first, "ok");
    EXPECT_EQ(first->text(), "ok") << "the form lives on";
}

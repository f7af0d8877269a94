#include "../NifTestSupport.h"

#include "nif/frmEditNIF.h"

#include <QClipboard>
#include <QLabel>

using namespace zelctl;
using namespace zelctl::test;

// Keyboard focus, activation and the X11 selection as a real X server gives them, with a
// label whose buddy is the control ("&NIF:", Alt+N).
namespace {

class NifFocus : public NifFixture
{
protected:
    void SetUp() override
    {
        NifFixture::SetUp();
        auto *label = new QLabel(QStringLiteral("&NIF:"), form);
        label->move(0, 80);
        label->setBuddy(control);
        label->show();
        other->setFocus();
    }
};

} // namespace

TEST_F(NifFocus, focusGivenToTheControlLandsInTheBoxAndWritesMoveNone)
{
    control->setFocus();
    EXPECT_EQ(QApplication::focusWidget(), box);
    other->setFocus();
    QTest::keyClick(other, Qt::Key_N, Qt::AltModifier);
    EXPECT_EQ(QApplication::focusWidget(), box) << "the label's mnemonic";

    other->setFocus();
    control->setValue("PT" + PlainNif);
    control->setValue("ES12345678Z");
    EXPECT_EQ(QApplication::focusWidget(), other) << "writing Value leaves the user's caret alone";
}

TEST_F(NifFocus, middleClickPastesTheSelectionWithItsCountry)
{
    QClipboard *clipboard = QGuiApplication::clipboard();
    ASSERT_TRUE(clipboard->supportsSelection());
    clipboard->setText(QStringLiteral("ES12345678Z"), QClipboard::Selection);
    QTest::mouseClick(box, Qt::MiddleButton);
    EXPECT_EQ(control->CountryID(), "ES");
    EXPECT_EQ(box->text(), "12345678Z") << "nothing lost to the Portuguese limit";

    control->setLocked(true);
    clipboard->setText(PlainNif, QClipboard::Selection);
    QTest::mouseClick(box, Qt::MiddleButton);
    EXPECT_EQ(control->Value(), "ES12345678Z") << "a locked box takes no paste";
}

TEST_F(NifFocus, deletedWhileItsBoxOrItsRecordFormHasTheFocus)
{
    control->setValue("PT" + PlainNif);
    QPointer<frmEditNIF> editor = new frmEditNIF(form);
    editor->SetNIFControl(control);
    ASSERT_TRUE(test::showActive(editor));
    auto *name = editor->findChild<QLineEdit *>("xNome");
    name->setFocus();
    // Without a window manager the server may hand activation back once more; wait for it.
    ASSERT_TRUE(QTest::qWaitFor([name] { return name->hasFocus(); }));
    QTest::keyClicks(name, "NOVO");
    delete editor.data();

    ASSERT_TRUE(test::showActive(form));
    box->setFocus();
    ASSERT_TRUE(QTest::qWaitFor([this] { return box->hasFocus(); }));
    QTest::keyClicks(box, "1");
    delete control.data();
    QTest::keyClicks(other, "ok");
    EXPECT_EQ(other->text(), "ok") << "the form lives on";
}

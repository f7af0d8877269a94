#include "nib/cNIB.h"
#include "nib/NibCheckDigits.h"

#include "support/TestSupport.h"

#include <QLabel>
#include <QLineEdit>
#include <QPointer>
#include <QSignalSpy>
#include <QTest>

#include <gtest/gtest.h>

#include <tuple>

using namespace zelctl;

namespace {

const QString bankBranchAccount = "0035065100000012345"; // 19 characters
const QString number = bankBranchAccount + CalculateNibCheckDigits(bankBranchAccount);

} // namespace

// Known answers: "PT50" and each whole number make a valid IBAN (ISO 13616, mod 97).
TEST(NibCheckDigits, knownAnswers)
{
    EXPECT_EQ(CalculateNibCheckDigits(QString(19, '1')), "28");
    EXPECT_EQ(CalculateNibCheckDigits(u"1234567890123456789"), "68");
    EXPECT_EQ(CalculateNibCheckDigits(u"12345678A0123456789"), "33") << "a letter counts as 0";
    EXPECT_EQ(CalculateNibCheckDigits(QString(18, '1')), "");
    EXPECT_EQ(CalculateNibCheckDigits(u"123456789012345678999"), "68") << "characters 20 and 21 are ignored";
    EXPECT_EQ(CalculateNibCheckDigits(u"1234567890123456789١"), "68") << "only ASCII digits count";
}

class NibControl : public ::testing::Test
{
protected:
    void SetUp() override { open(); }
    void TearDown() override { delete form.data(); }

    // A shown, active form holding a fresh control and another box.
    void open()
    {
        form = new QWidget;
        nib = new cNIB(form);
        other = new QLineEdit(form);
        other->move(0, 40);
        ASSERT_TRUE(test::showActive(form));
    }

    QLineEdit *box(int index) const { return nib->findChildren<QLineEdit *>("nib").at(index); }
    QLabel *validMark() const { return nib->findChild<QLabel *>("validpic"); }
    QLabel *errorMark() const { return nib->findChild<QLabel *>("Image1"); }

    // Keys into whichever box has the focus, one at a time ('\b' is Backspace), while the
    // control lives.
    void type(const QString &text)
    {
        for (const QChar c : text) {
            if (nib)
                QTest::keyClick(QApplication::focusWidget(), c == u'\b' ? Qt::Key_Backspace : Qt::Key(c.toLatin1()));
        }
    }

    QPointer<QWidget> form;
    QPointer<cNIB> nib;
    QLineEdit *other = nullptr;
};

TEST_F(NibControl, typingHopsBoxesForwardAndBackspaceErasesBack)
{
    QSignalSpy changed(nib, &cNIB::Changed);
    box(0)->setFocus();
    type(number.left(20));
    EXPECT_EQ(changed.count(), 0);
    EXPECT_EQ(QApplication::focusWidget(), box(3));
    type(number.right(1));
    EXPECT_EQ(changed.count(), 1) << "raised once, at the last character";
    EXPECT_EQ(nib->Text(), number);
    EXPECT_EQ(box(2)->text(), "00000012345");
    EXPECT_TRUE(nib->Valid());
    EXPECT_TRUE(validMark()->isVisible());

    type(QString(21 + 3, u'\b'));
    EXPECT_EQ(nib->Text(), "");
    EXPECT_EQ(QApplication::focusWidget(), box(0));
    EXPECT_EQ(changed.count(), 2) << "raised when the last character is erased";

    nib->setText(number);
    box(2)->setText("");
    box(2)->setFocus();
    type("\b");
    EXPECT_EQ(box(1)->text(), "065");
    EXPECT_EQ(QApplication::focusWidget(), box(1));
    EXPECT_EQ(box(1)->cursorPosition(), 3);
}

// Leaving the control, not moving between its boxes, refreshes the marks.
TEST_F(NibControl, leavingTheControlRefreshesTheMarks)
{
    // Typed, then the check digits shown on leaving (filled in when missing) and the verdict.
    const std::tuple<QString, QString, bool> cases[]
        = { { bankBranchAccount, number.right(2), true }, { "0035065", "", false } };
    for (const auto &[typed, checkDigits, valid] : cases) {
        nib->setText(QString());
        box(0)->setFocus();
        type(typed);
        EXPECT_FALSE(validMark()->isVisible() || errorMark()->isVisible()) << "not while the user is still typing";
        other->setFocus();
        EXPECT_EQ(box(3)->text(), checkDigits) << typed.toStdString();
        EXPECT_EQ(nib->Valid(), valid) << typed.toStdString();
        EXPECT_EQ(validMark()->isVisible(), valid) << typed.toStdString();
        EXPECT_EQ(errorMark()->isVisible(), !valid) << typed.toStdString();
    }
}

TEST_F(NibControl, wrongCheckDigitsShowTheErrorMarkWhichExplainsItself)
{
    nib->setText(bankBranchAccount + (number.right(2) == "11" ? "12" : "11"));
    EXPECT_FALSE(nib->Valid());
    EXPECT_TRUE(errorMark()->isVisible());
    EXPECT_FALSE(validMark()->isVisible());

    test::MessageBoxRecorder boxes;
    form->setEnabled(false);
    QTest::mouseClick(errorMark(), Qt::LeftButton);
    form->setEnabled(true);
    QTest::mouseClick(errorMark(), Qt::RightButton);
    EXPECT_TRUE(boxes.shown().isEmpty()) << "a disabled control, or another button, explains nothing";
    QTest::mouseClick(errorMark(), Qt::LeftButton);
    EXPECT_EQ(boxes.shown().size(), 1);
}

TEST_F(NibControl, writingTextDistributesOnlyWholeNumbers)
{
    nib->setText(number);
    QSignalSpy changed(nib, &cNIB::Changed);
    nib->setText(number.left(20));
    EXPECT_EQ(nib->Text(), "") << "a partial value is never distributed";
    EXPECT_EQ(changed.count(), 1);
    ASSERT_TRUE(nib->setProperty("Text", number + "9")) << "a host writes by name";
    EXPECT_EQ(nib->Text(), number) << "characters after the 21st are ignored";
    EXPECT_EQ(changed.count(), 2);

    EXPECT_TRUE(nib->Save().contains("BackColor")) << "always written";
    PropertyBag literal;
    literal.WriteProperty("BackColor", "&HFF00&");
    nib->Load(literal);
    EXPECT_EQ(nib->palette().color(QPalette::Window), QColor(0, 255, 0)) << "a colour written as a literal";
}

// A host may delete the control from its Changed event, wherever the user's editing raised
// it: the last character typed, the check digits filled in on leaving, the last one erased;
// and the whole form it sits on where typing raised it. (Leaving hands the focus to another
// widget of the form: Qt goes on with that one after the event, as with any focus change.)
TEST_F(NibControl, survivesBeingDeletedFromItsChangedEvent)
{
    const struct
    {
        bool typed;
        std::function<void()> prepare;
        std::function<void()> act;
    } raisers[] = {
        { true, [&] { box(0)->setFocus(); }, [&] { type(number); } },
        { false,
            [&] {
                box(0)->setFocus();
                type(bankBranchAccount);
            },
            [&] { other->setFocus(); } },
        { true,
            [&] {
                nib->setText(number);
                box(3)->setFocus();
                QTest::keyClick(box(3), Qt::Key_End);
            },
            [&] { type(QString(24, u'\b')); } },
    };
    for (const bool wholeForm : { false, true }) {
        for (const auto &raiser : raisers) {
            if (wholeForm && !raiser.typed)
                continue;
            TearDown();
            open();
            raiser.prepare();
            QObject::connect(nib, &cNIB::Changed, nib, [&] { delete (wholeForm ? form.data() : nib.data()); });
            raiser.act();
            QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
            EXPECT_TRUE(nib.isNull());
            EXPECT_EQ(form.isNull(), wholeForm);
        }
    }
}

#include "nib/cNIB.h"
#include "nib/NibCheckDigits.h"

#include "support/TestSupport.h"

#include <QLabel>
#include <QLineEdit>
#include <QPointer>
#include <QRandomGenerator>
#include <QSignalSpy>
#include <QTest>

#include <gtest/gtest.h>

using namespace zelctl;

namespace {

const QString bankBranchAccount = "0035065100000012345"; // 19 characters
const QString number = bankBranchAccount + CalculateNibCheckDigits(bankBranchAccount);

} // namespace

TEST(NibCheckDigits, workedExamples)
{
    EXPECT_EQ(CalculateNibCheckDigits(QString(19, '0')), "98");
    EXPECT_EQ(CalculateNibCheckDigits(QString(19, '1')), "28");
    EXPECT_EQ(CalculateNibCheckDigits(u"1234567890123456789"), "68");
    EXPECT_EQ(CalculateNibCheckDigits(u"12345678A0123456789"), "33") << "a letter counts as 0";
    EXPECT_EQ(CalculateNibCheckDigits(QString(18, '1')), "");
    EXPECT_EQ(CalculateNibCheckDigits(u"123456789012345678999"), "68") << "characters 20 and 21 are ignored";
    EXPECT_EQ(CalculateNibCheckDigits(u"1234567890123456789١"), "68") << "only ASCII digits count";
}

// The control's verdict agrees with an independent rule, both ways: "PT50" and a NIB make a
// valid IBAN (ISO 13616, mod 97) exactly when the NIB's check digits are right.
TEST(NibCheckDigits, controlAgreesWithTheIbanRuleOnRandomNumbers)
{
    const auto ibanValid = [](const QString &nib) {
        int remainder = 0;
        for (const QChar c : nib + "252950") // "PT50", letters as numbers, moved to the end
            remainder = (remainder * 10 + c.digitValue()) % 97;
        return remainder == 1;
    };
    cNIB nib;
    QRandomGenerator random(20261206);
    for (int i = 0; i < 500; ++i) {
        QString body;
        for (int k = 0; k < 19; ++k)
            body += QChar(u'0' + random.bounded(10));
        const QString right = CalculateNibCheckDigits(body);
        // Any other pair that is not the same number mod 97.
        const QString wrong = QString::number((right.toInt() + 1 + random.bounded(96)) % 97).rightJustified(2, u'0');
        for (const QString &digits : { right, wrong }) {
            nib.setText(body + digits);
            EXPECT_EQ(nib.Valid(), ibanValid(body + digits)) << (body + digits).toStdString();
        }
    }
}

class NibControl : public ::testing::Test
{
protected:
    void SetUp() override
    {
        nib = new cNIB(&form);
        other = new QLineEdit(&form);
        other->move(0, 40);
        form.show();
        QApplication::setActiveWindow(&form);
        ASSERT_TRUE(QTest::qWaitForWindowActive(&form));
    }

    QLineEdit *box(int index) const { return nib->findChildren<QLineEdit *>("nib").at(index); }
    QLabel *validMark() const { return nib->findChild<QLabel *>("validpic"); }
    QLabel *errorMark() const { return nib->findChild<QLabel *>("Image1"); }

    // Keys into whichever box has the focus, one at a time ('\b' is Backspace), while the
    // control lives.
    void type(const QString &text)
    {
        const QPointer<cNIB> alive = nib;
        for (const QChar c : text) {
            if (alive)
                QTest::keyClick(QApplication::focusWidget(), c == u'\b' ? Qt::Key_Backspace : Qt::Key(c.toLatin1()));
        }
    }

    QWidget form;
    cNIB *nib = nullptr;
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
    EXPECT_FALSE(errorMark()->isVisible());

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
    const struct
    {
        QString typed;
        QString checkDigits;
        bool valid;
    } cases[] = {
        { bankBranchAccount, number.right(2), true }, // the check digits are filled in
        { "0035065", "", false },
    };
    for (const auto &c : cases) {
        nib->setText(QString());
        box(0)->setFocus();
        type(c.typed);
        EXPECT_FALSE(validMark()->isVisible() || errorMark()->isVisible()) << "not while the user is still typing";
        other->setFocus();
        EXPECT_EQ(box(3)->text(), c.checkDigits) << c.typed.toStdString();
        EXPECT_EQ(nib->Valid(), c.valid) << c.typed.toStdString();
        EXPECT_EQ(validMark()->isVisible(), c.valid) << c.typed.toStdString();
        EXPECT_EQ(errorMark()->isVisible(), !c.valid) << c.typed.toStdString();
    }
}

TEST_F(NibControl, wrongCheckDigitsShowTheErrorMarkWhichExplainsItself)
{
    nib->setText(bankBranchAccount + (number.right(2) == "11" ? "12" : "11"));
    EXPECT_FALSE(nib->Valid());
    EXPECT_TRUE(errorMark()->isVisible());
    EXPECT_FALSE(validMark()->isVisible());

    test::MessageBoxRecorder boxes;
    form.setEnabled(false);
    QTest::mouseClick(errorMark(), Qt::LeftButton);
    form.setEnabled(true);
    QTest::mouseClick(errorMark(), Qt::RightButton);
    EXPECT_TRUE(boxes.shown().isEmpty()) << "a disabled control, or another button, explains nothing";
    QTest::mouseClick(errorMark(), Qt::LeftButton);
    ASSERT_EQ(boxes.shown().size(), 1);
    EXPECT_EQ(boxes.shown().first().icon, platform::MsgIcon::Information);
    EXPECT_EQ(boxes.shown().first().title, "NIB incorrecto");
    EXPECT_EQ(boxes.shown().first().text,
        QString::fromUtf8("O número de identificação bancário (NIB) não se encontra correcto.\n"
                          "Por favor verifique o NIB inserido"));
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
}

TEST_F(NibControl, keepsItsSizeAndPersistsItsBackColour)
{
    nib->resize(400, 100);
    EXPECT_EQ(nib->size(), QSize(179, 22));
    EXPECT_EQ(nib->extender().Width(), 2685);

    QSignalSpy changes(nib, &UserControl::propertyChanged);
    nib->setBackColor(nib->BackColor());
    EXPECT_EQ(changes.count(), 0) << "the same colour is no change";
    nib->setBackColor(platform::rgb(255, 0, 0));
    cNIB loaded;
    loaded.Load(nib->Save());
    EXPECT_EQ(loaded.palette().color(QPalette::Window), QColor(255, 0, 0));
    EXPECT_TRUE(cNIB().Save().contains("BackColor")) << "always written";
    PropertyBag literal;
    literal.WriteProperty("BackColor", "&HFF00&");
    loaded.Load(literal);
    EXPECT_EQ(loaded.BackColor(), 0x00FF00u) << "a colour written as a literal";
}

// A host may delete the control from its Changed event, wherever the user's editing raised
// it: the last character typed, the check digits filled in on leaving, the last one erased;
// and the whole form it sits on where typing raised it. (Leaving hands the focus to another
// widget of the form: Qt goes on with that one after the event, as with any focus change.)
TEST_F(NibControl, survivesBeingDeletedFromItsChangedEvent)
{
    QPointer<QWidget> page;
    QLineEdit *neighbour = nullptr;
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
            [&] { neighbour->setFocus(); } },
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
            page = new QWidget;
            nib = new cNIB(page);
            neighbour = new QLineEdit(page);
            neighbour->move(0, 40);
            page->show();
            QApplication::setActiveWindow(page);
            ASSERT_TRUE(QTest::qWaitForWindowActive(page));
            const QPointer<cNIB> alive = nib;
            raiser.prepare();
            QObject::connect(nib, &cNIB::Changed, nib, [&] { delete (wholeForm ? page.data() : nib); });
            raiser.act();
            QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
            EXPECT_TRUE(alive.isNull());
            EXPECT_EQ(page.isNull(), wholeForm);
            delete page.data();
            nib = nullptr;
        }
    }
}

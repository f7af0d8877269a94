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

// Independent oracle: "PT50" followed by a NIB is a valid IBAN (ISO 13616 mod 97 = 1)
// exactly when the NIB's check digits are right.
bool ibanValid(const QString &iban)
{
    const QString rearranged = iban.mid(4) + iban.left(4);
    int remainder = 0;
    for (const QChar c : rearranged) {
        const int value = c.isDigit() ? c.digitValue() : c.toLatin1() - 'A' + 10;
        remainder = (value >= 10 ? remainder * 100 : remainder * 10) + value;
        remainder %= 97;
    }
    return remainder == 1;
}

QString randomDigits(QRandomGenerator &random, int count)
{
    QString digits;
    for (int i = 0; i < count; ++i)
        digits += QChar(u'0' + random.bounded(10));
    return digits;
}

const QString bankBranchAccount = "0035"
                                  "0651"
                                  "00000012345"; // 19 characters
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

TEST(NibCheckDigits, agreeWithTheIbanRuleOnRandomNumbers)
{
    QRandomGenerator random(20261206);
    for (int i = 0; i < 2000; ++i) {
        const QString body = randomDigits(random, 19);
        const QString digits = CalculateNibCheckDigits(body);
        ASSERT_EQ(digits.size(), 2);
        EXPECT_TRUE(ibanValid("PT50" + body + digits)) << body.toStdString();
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

    // Types into whichever box has the focus, one key at a time, as a user would.
    void type(const QString &text)
    {
        for (const QChar c : text)
            QTest::keyClick(QApplication::focusWidget(), c.toLatin1());
    }

    QWidget form;
    cNIB *nib = nullptr;
    QLineEdit *other = nullptr;
};

TEST_F(NibControl, typingAllCharactersHopsBoxesAndRaisesChangedOnceAtTheEnd)
{
    QSignalSpy changed(nib, &cNIB::Changed);
    box(0)->setFocus();
    type(number.left(20));
    EXPECT_EQ(changed.count(), 0);
    EXPECT_EQ(QApplication::focusWidget(), box(3));
    type(number.right(1));
    EXPECT_EQ(changed.count(), 1);
    EXPECT_EQ(nib->Text(), number);
    EXPECT_TRUE(nib->Valid());
    EXPECT_TRUE(validMark()->isVisible());
    EXPECT_FALSE(errorMark()->isVisible());
    EXPECT_EQ(box(2)->text(), "00000012345");
}

TEST_F(NibControl, backspaceInAnEmptyBoxErasesBackAcrossBoxes)
{
    nib->setText(number);
    QSignalSpy changed(nib, &cNIB::Changed);
    box(3)->setFocus();
    for (int i = 0; i < 21 + 3; ++i)
        QTest::keyClick(QApplication::focusWidget(), Qt::Key_Backspace);
    EXPECT_EQ(nib->Text(), "");
    EXPECT_EQ(QApplication::focusWidget(), box(0));
    EXPECT_EQ(changed.count(), 1) << "raised when the last character is erased";

    nib->setText(number);
    box(2)->setText("");
    box(2)->setFocus();
    QTest::keyClick(box(2), Qt::Key_Backspace);
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
    const QString wrong = bankBranchAccount + (number.right(2) == "11" ? "12" : "11");
    nib->setText(wrong);
    EXPECT_FALSE(nib->Valid());
    EXPECT_TRUE(errorMark()->isVisible());
    EXPECT_FALSE(validMark()->isVisible());

    form.setEnabled(false);
    QTest::mouseClick(errorMark(), Qt::LeftButton); // a disabled control explains nothing (no box)
    form.setEnabled(true);
    test::MessageBoxRecorder boxes;
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
    nib->setText(number + "9");
    EXPECT_EQ(nib->Text(), number) << "characters after the 21st are ignored";
    EXPECT_EQ(changed.count(), 2);
    EXPECT_TRUE(nib->Valid());
}

TEST_F(NibControl, keepsItsSizeAndPersistsItsBackColour)
{
    EXPECT_EQ(nib->size(), QSize(179, 22));
    nib->resize(400, 100);
    EXPECT_EQ(nib->size(), QSize(179, 22));
    EXPECT_EQ(nib->extender().Width(), 2685);
    EXPECT_EQ(nib->extender().Height(), 330);

    QSignalSpy changes(nib, &UserControl::propertyChanged);
    nib->setBackColor(nib->BackColor());
    EXPECT_EQ(changes.count(), 0) << "the same colour is no change";
    nib->setBackColor(platform::rgb(255, 0, 0));
    const PropertyBag bag = nib->Save();
    EXPECT_EQ(bag.ReadProperty("BackColor").toUInt(), platform::rgb(255, 0, 0));
    cNIB loaded;
    loaded.Load(bag);
    EXPECT_EQ(loaded.BackColor(), platform::rgb(255, 0, 0));
    EXPECT_EQ(loaded.palette().color(QPalette::Window), QColor(255, 0, 0));
    EXPECT_TRUE(cNIB().Save().contains("BackColor")) << "always written";
    PropertyBag literal;
    literal.WriteProperty("BackColor", "&HFF00&");
    loaded.Load(literal);
    EXPECT_EQ(loaded.BackColor(), 0x00FF00u) << "a colour written as a literal";

    // A host reaches every member by name.
    ASSERT_TRUE(nib->setProperty("Text", number));
    bool valid = false;
    ASSERT_TRUE(QMetaObject::invokeMethod(nib, "Valid", Q_RETURN_ARG(bool, valid)));
    EXPECT_TRUE(valid);
    QString digits;
    ASSERT_TRUE(QMetaObject::invokeMethod(
        nib, "CalculateCheckDigits", Q_RETURN_ARG(QString, digits), Q_ARG(QString, QString(19, '0'))));
    EXPECT_EQ(digits, "98");
}

// A host may delete the control from its Changed event, wherever the user's editing raised
// it: the last character typed, the check digits filled in on leaving, the last one erased;
// and the whole form it sits on where typing raised it. (Leaving hands the focus to another
// widget of the form: Qt goes on with that one after the event, as with any focus change.)
TEST_F(NibControl, survivesBeingDeletedFromItsChangedEvent)
{
    QPointer<cNIB> alive;
    const auto keys = [&](const QString &text) {
        for (const QChar c : text) {
            if (alive && c == u'\b')
                QTest::keyClick(QApplication::focusWidget(), Qt::Key_Backspace);
            else if (alive)
                QTest::keyClick(QApplication::focusWidget(), c.toLatin1());
        }
    };
    QPointer<QWidget> page;
    QLineEdit *neighbour = nullptr;
    const struct
    {
        bool typed;
        std::function<void()> prepare;
        std::function<void()> act;
    } raisers[] = {
        { true, [&] { box(0)->setFocus(); }, [&] { keys(number); } },
        { false,
            [&] {
                box(0)->setFocus();
                keys(bankBranchAccount);
            },
            [&] { neighbour->setFocus(); } },
        { true,
            [&] {
                nib->setText(number);
                box(3)->setFocus();
                QTest::keyClick(box(3), Qt::Key_End);
            },
            [&] { keys(QString(24, u'\b')); } },
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
            alive = nib;
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

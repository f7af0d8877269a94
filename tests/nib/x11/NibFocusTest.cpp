#include "nib/NibCheckDigits.h"
#include "nib/cNIB.h"
#include "support/TestSupport.h"

#include <QApplication>
#include <QLabel>
#include <QLineEdit>
#include <QPointer>
#include <QTest>
#include <QVBoxLayout>

#include <gtest/gtest.h>

using namespace zelctl;

// Keyboard focus as a real X server gives it: a form with a box, a label whose buddy is the
// control ("&NIB:", Alt+N), and the control.
namespace {

class NibFocus : public ::testing::Test
{
protected:
    void SetUp() override
    {
        auto *column = new QVBoxLayout(&form);
        column->addWidget(first = new QLineEdit);
        auto *label = new QLabel(QStringLiteral("&NIB:"));
        column->addWidget(label);
        column->addWidget(nib = new cNIB);
        label->setBuddy(nib);
        nib->setText(number);
        ASSERT_TRUE(test::showActive(&form));
    }

    QLineEdit *box(int index) const { return nib->findChildren<QLineEdit *>(QStringLiteral("nib")).at(index); }

    QWidget form;
    QLineEdit *first = nullptr;
    QPointer<cNIB> nib;
    const QString number = QStringLiteral("0035065100000012345") + CalculateNibCheckDigits(u"0035065100000012345");
};

} // namespace

TEST_F(NibFocus, focusGivenToTheControlLandsInTheFirstBoxAndWritesMoveNone)
{
    EXPECT_EQ(QApplication::focusWidget(), first) << "a form filled before it is shown opens where it would";

    nib->setFocus();
    EXPECT_EQ(QApplication::focusWidget(), box(0));
    first->setFocus();
    QTest::keyClick(first, Qt::Key_N, Qt::AltModifier);
    EXPECT_EQ(QApplication::focusWidget(), box(0)) << "the label's mnemonic";

    first->setFocus();
    nib->setText(QString());
    nib->setText(number);
    EXPECT_EQ(QApplication::focusWidget(), first) << "writing Text leaves the user's caret alone";
}

TEST_F(NibFocus, deletedWhileOneOfItsBoxesHasTheFocus)
{
    box(2)->setFocus();
    QTest::keyClicks(box(2), "123");
    ASSERT_TRUE(box(2)->hasFocus());
    delete nib;
    QTest::keyClicks(first, "ok");
    EXPECT_EQ(first->text(), "ok") << "the form lives on";
}

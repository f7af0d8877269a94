#include "companion/CommandButton.h"
#include "subject/cSujeitoSelector.h"
#include "support/TestSupport.h"

#include <QApplication>
#include <QLabel>
#include <QLineEdit>
#include <QTest>

#include <gtest/gtest.h>

using namespace zelctl;

// Keyboard focus as a real X server gives it: a form with a box, a label whose buddy is the
// selector ("&Sujeito:", Alt+S), and the selector.
TEST(SubjectFocus, focusGivenToTheSelectorLandsOnThePressedButtonAndWritesMoveNone)
{
    QWidget form;
    auto *first = new QLineEdit(&form);
    auto *label = new QLabel(QStringLiteral("&Sujeito:"), &form);
    auto *selector = new cSujeitoSelector(&form);
    label->setBuddy(selector);
    selector->InitNew();
    selector->setSelectedSujeito(QStringLiteral("B"));
    ASSERT_TRUE(test::showActive(&form));
    // The kind of the focused button, if it is the pressed one.
    const auto focused = [] {
        const auto *button = qobject_cast<CommandButton *>(QApplication::focusWidget());
        return button && button->Value() ? button->Tag() : QString();
    };
    EXPECT_EQ(QApplication::focusWidget(), first);
    selector->setFocus();
    EXPECT_EQ(focused(), "B");
    first->setFocus();
    QTest::keyClick(first, Qt::Key_S, Qt::AltModifier);
    EXPECT_EQ(focused(), "B") << "the label's mnemonic";

    first->setFocus();
    selector->setSelectedSujeito(QStringLiteral("A"));
    EXPECT_EQ(QApplication::focusWidget(), first) << "choosing from code leaves the user's caret alone";
    QTest::keyClick(first, Qt::Key_S, Qt::AltModifier);
    EXPECT_EQ(focused(), "A") << "the newly pressed button";
}

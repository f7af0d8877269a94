#include "companion/CommandButton.h"
#include "subject/cSujeitoSelector.h"

#include <QApplication>
#include <QLabel>
#include <QLineEdit>
#include <QTest>
#include <QVBoxLayout>

#include <gtest/gtest.h>

using namespace zelctl;

// Keyboard focus as a real X server gives it: a form with a box, a label whose buddy is the
// selector ("&Sujeito:", Alt+S), and the selector.
TEST(SubjectFocus, focusGivenToTheSelectorLandsOnThePressedButtonAndWritesMoveNone)
{
    QWidget form;
    auto *column = new QVBoxLayout(&form);
    auto *first = new QLineEdit;
    column->addWidget(first);
    auto *label = new QLabel(QStringLiteral("&Sujeito:"));
    column->addWidget(label);
    auto *selector = new cSujeitoSelector;
    column->addWidget(selector);
    label->setBuddy(selector);
    selector->InitNew();
    selector->setSelectedSujeito(QStringLiteral("B"));
    form.show();
    form.activateWindow();
    ASSERT_TRUE(QTest::qWaitForWindowActive(&form));
    const auto pressed = [&] {
        for (CommandButton *button : selector->findChildren<CommandButton *>(QStringLiteral("sujeito_selector")))
            if (button->Value())
                return button;
        return static_cast<CommandButton *>(nullptr);
    };
    ASSERT_EQ(pressed()->Tag(), "B");
    EXPECT_EQ(QApplication::focusWidget(), first);

    selector->setFocus();
    EXPECT_EQ(QApplication::focusWidget(), pressed());
    first->setFocus();
    QTest::keyClick(first, Qt::Key_S, Qt::AltModifier);
    EXPECT_EQ(QApplication::focusWidget(), pressed()) << "the label's mnemonic";

    first->setFocus();
    selector->setSelectedSujeito(QStringLiteral("A"));
    EXPECT_EQ(QApplication::focusWidget(), first) << "choosing from code leaves the user's caret alone";
    QTest::keyClick(first, Qt::Key_S, Qt::AltModifier);
    EXPECT_EQ(pressed()->Tag(), "A");
    EXPECT_EQ(QApplication::focusWidget(), pressed()) << "the newly pressed button";
}

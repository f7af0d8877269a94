#include "companion/CommandButton.h"
#include "skins/cSlider.h"
#include "support/TestSupport.h"

#include <QApplication>
#include <QLabel>
#include <QLineEdit>
#include <QTest>

#include <gtest/gtest.h>

using namespace zelctl;

// A label's buddy and a host's setFocus land on the slider's button; the focus going into a
// control inside opens the slider, and the host may delete the slider then.
TEST(SliderFocus, focusGivenToTheSliderLandsOnItsButtonAndItMayGoWhileAControlInsideHasIt)
{
    QWidget form;
    auto *first = new QLineEdit(&form);
    auto *label = new QLabel(QStringLiteral("&Mais:"), &form);
    label->move(0, 30);
    auto *slider = new cSlider(&form);
    slider->move(0, 60);
    auto *inside = new QLineEdit(slider);
    inside->move(5, 5);
    label->setBuddy(slider);
    form.resize(300, 200);
    ASSERT_TRUE(test::showActive(&form));
    auto *button = slider->findChild<CommandButton *>(QStringLiteral("cc"));

    QTest::keyClick(first, Qt::Key_M, Qt::AltModifier);
    EXPECT_EQ(QApplication::focusWidget(), button) << "the label's mnemonic";
    first->setFocus();
    slider->setFocus();
    EXPECT_EQ(QApplication::focusWidget(), button);
    inside->setFocus();
    ASSERT_TRUE(inside->hasFocus());
    EXPECT_TRUE(slider->SlideOpen()) << "the focus inside opens the slider";
    delete slider;
    QTest::keyClicks(first, "ok");
    EXPECT_EQ(first->text(), "ok") << "the form lives on";
}

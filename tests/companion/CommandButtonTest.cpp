#include "companion/CommandButton.h"
#include "companion/CommandButtonArray.h"
#include "companion/KeyCodes.h"

#include <QApplication>
#include <QDialog>
#include <QHelpEvent>
#include <QSignalSpy>
#include <QTest>
#include <QToolTip>

#include <gtest/gtest.h>

using namespace zelctl;

namespace {

QList<int> indexes(const QSignalSpy &spy)
{
    QList<int> result;
    for (const QList<QVariant> &args : spy)
        result << args.at(0).toInt();
    return result;
}

} // namespace

TEST(CommandButton, geometryIsInTwipsAndAPictureSizesTheIcon)
{
    QWidget form;
    CommandButton button(&form);
    button.Move(150, 300, 1500, 375);
    EXPECT_EQ(button.geometry(), QRect(10, 20, 100, 25));
    EXPECT_EQ(QList<int>({ button.Left(), button.Top(), button.Width(), button.Height() }),
        QList<int>({ 150, 300, 1500, 375 }));
    button.Move(30, 45);
    button.setWidth(750);
    button.setHeight(150);
    EXPECT_EQ(button.geometry(), QRect(2, 3, 50, 10));
    button.setLeft(0);
    button.setTop(15);
    EXPECT_EQ(button.pos(), QPoint(0, 1));

    button.setPicture(Picture(QImage(20, 12, QImage::Format_RGB32)));
    EXPECT_EQ(button.iconSize(), QSize(20, 12));
    button.setPicture({});
    EXPECT_TRUE(button.icon().isNull());
}

TEST(CommandButton, toggleButtonsKeepTheirPressedValue)
{
    CommandButton plain;
    plain.setValue(true);
    EXPECT_FALSE(plain.Value());

    CommandButton toggle;
    toggle.setToggle(true);
    QSignalSpy clicks(&toggle, &CommandButton::Click);
    toggle.setValue(true);
    EXPECT_TRUE(toggle.Value());
    EXPECT_EQ(clicks.count(), 0);
    bool valueAtClick = true;
    QObject::connect(&toggle, &CommandButton::Click, [&] { valueAtClick = toggle.Value(); });
    QTest::mouseClick(&toggle, Qt::LeftButton);
    EXPECT_FALSE(valueAtClick) << "the value has changed by the time Click arrives";
    EXPECT_EQ(indexes(clicks), QList<int> { -1 });
}

TEST(CommandButton, keyDownCarriesTheKeyCodeAndCanSwallowTheKeyAndTheDefaultButtonAnswersEnter)
{
    QDialog form;
    CommandButtonArray buttons(QStringLiteral("btn_Handle"), &form, 2);
    CommandButton &button = *buttons(1);
    QSignalSpy clicks(&buttons, &CommandButtonArray::Click);
    QList<std::pair<int, int>> keys;
    bool swallow = false;
    QObject::connect(&button, &CommandButton::KeyDown, [&](int, int &keyCode, int shift) {
        keys.append({ keyCode, shift });
        if (swallow)
            keyCode = 0;
    });
    QTest::keyClick(&button, Qt::Key_A, Qt::ShiftModifier);
    QTest::keyClick(&button, Qt::Key_F2, Qt::ControlModifier | Qt::AltModifier);
    EXPECT_EQ(keys, (QList<std::pair<int, int>> { { 16, 1 }, { 65, 1 }, { 17, 2 }, { 18, 6 }, { 113, 6 } }))
        << "the modifier keys go down first and are reported too";
    QTest::keyClick(&button, Qt::Key_Space);
    swallow = true;
    QTest::keyClick(&button, Qt::Key_Space);
    EXPECT_EQ(indexes(clicks), QList<int> { 1 });

    buttons(0)->setDefault(true);
    form.show();
    QTest::keyClick(&form, Qt::Key_Return);
    EXPECT_EQ(indexes(clicks), QList<int>({ 1, 0 }));
}

TEST(CommandButton, reportsThePointerComingAndGoingAndTakesACaptionColourButStaysGreyedWhenDisabled)
{
    QWidget form;
    form.resize(200, 100);
    auto *button = new CommandButton(&form);
    button->setGeometry(10, 10, 50, 30);
    form.show();
    ASSERT_TRUE(QTest::qWaitForWindowExposed(&form));
    QTest::mouseMove(&form, QPoint(150, 80));
    QSignalSpy hover(button, &CommandButton::MouseHover);
    QTest::mouseMove(button, QPoint(20, 10));
    QTest::mouseMove(&form, QPoint(150, 70));
    EXPECT_EQ(hover, (QList<QVariantList> { { true }, { false } }));

    button->setForeColor(0xC00000);
    EXPECT_EQ(button->palette().color(QPalette::ButtonText), QColor(0, 0, 0xC0));
    button->setEnabled(false);
    EXPECT_EQ(button->ForeColor(), 0xC00000u);
    EXPECT_NE(button->palette().color(QPalette::Disabled, QPalette::ButtonText), QColor(0, 0, 0xC0));
}

TEST(CommandButton, aCaptionTooLongIsCutShortAndShownWholeInTheTooltip)
{
    QWidget form;
    form.resize(300, 100);
    auto *button = new CommandButton(&form);
    const QString name = QStringLiteral("Ilhas Geórgia do Sul e Sandwich do Sul");
    button->setCaption(name);
    button->setGeometry(10, 10, 90, 25);
    form.show();
    EXPECT_EQ(button->Caption(), name);
    EXPECT_TRUE(button->text().endsWith(QChar(0x2026))) << button->text().toStdString();
    EXPECT_LE(button->fontMetrics().horizontalAdvance(button->text()), 90);
    EXPECT_GT(button->sizeHint().width(), button->fontMetrics().horizontalAdvance(name))
        << "a layout is asked for room for the whole caption";
    QHelpEvent help(QEvent::ToolTip, QPoint(5, 5), button->mapToGlobal(QPoint(5, 5)));
    QApplication::sendEvent(button, &help);
    EXPECT_EQ(QToolTip::text(), name);
    QToolTip::hideText();

    button->resize(290, 25);
    EXPECT_EQ(button->text(), name) << "whole again once there is room";
    button->setCaption(QStringLiteral("&Cancelar"));
    button->resize(20, 25);
    EXPECT_EQ(button->text(), QStringLiteral("&Cancelar")) << "an access key is never cut";
}

TEST(CommandButton, aSymbolFontCaptionShowsItsSymbolsAndTheStyleValuesTakeEffect)
{
    CommandButton button;
    button.setFont(QFont(QStringLiteral("Wingdings"), 10));
    button.setCaption(QStringLiteral("ç"));
    EXPECT_EQ(button.Caption(), QStringLiteral("ç"));
    EXPECT_EQ(button.text(), QString(QChar(0x2B05)));
    button.setFont(QFont(QStringLiteral("DejaVu Sans"), 10));
    EXPECT_EQ(button.text(), QStringLiteral("ç")) << "in an ordinary font the letter is the letter";

    button.setButtonStyle(CommandButton::FlatStyle);
    EXPECT_TRUE(button.isFlat());
    EXPECT_TRUE(button.autoFillBackground()) << "a flat button still covers what lies under it";
    button.setBevelWidth(-2);
    EXPECT_EQ(button.BevelWidth(), 0);
}

TEST(KeyCodes, qtKeysMapToVirtualKeyCodes)
{
    const std::pair<int, int> cases[]
        = { { Qt::Key_A, 65 }, { Qt::Key_Z, 90 }, { Qt::Key_0, 48 }, { Qt::Key_9, 57 }, { Qt::Key_Return, 13 },
              { Qt::Key_Enter, 13 }, { Qt::Key_Escape, 27 }, { Qt::Key_Down, 40 }, { Qt::Key_Delete, 46 },
              { Qt::Key_Plus, 107 }, { Qt::Key_F1, 112 }, { Qt::Key_F12, 123 }, { Qt::Key_Eacute, 0 } };
    for (const auto &[qtKey, code] : cases)
        EXPECT_EQ(keyCodes::fromQtKey(qtKey), code) << qtKey;
    EXPECT_EQ(keyCodes::shiftState(Qt::ShiftModifier | Qt::AltModifier), 5);
    EXPECT_EQ(keyCodes::shiftState(Qt::NoModifier), 0);
}

TEST(CommandButtonArray, eventsCarryTheElementsIndex)
{
    QWidget form;
    CommandButtonArray buttons(QStringLiteral("sujeito_selector"), &form, 3);
    EXPECT_EQ(form.findChildren<CommandButton *>(QStringLiteral("sujeito_selector")).size(), 3);
    QSignalSpy clicks(&buttons, &CommandButtonArray::Click);
    QSignalSpy doubles(&buttons, &CommandButtonArray::DblClick);
    QList<std::pair<int, int>> keys;
    QObject::connect(&buttons, &CommandButtonArray::KeyDown, [&](int index, int &keyCode, int) {
        keys.append({ index, keyCode });
    });
    QTest::mouseClick(buttons(2), Qt::LeftButton);
    buttons(0)->click();
    QTest::mouseDClick(buttons(1), Qt::LeftButton);
    QTest::keyClick(buttons(1), Qt::Key_Down);
    EXPECT_EQ(indexes(doubles), QList<int> { 1 });
    EXPECT_EQ(indexes(clicks).mid(0, 2), (QList<int> { 2, 0 }));
    EXPECT_EQ(keys, (QList<std::pair<int, int>> { { 1, 40 } }));
    EXPECT_EQ(buttons(2)->Index(), 2);
}

TEST(CommandButtonArray, loadCopiesElementZeroHiddenAndUnloadRemovesOnlyRunTimeElements)
{
    QWidget form;
    CommandButtonArray buttons(QStringLiteral("btnSelector"), &form);
    CommandButton *model = buttons(0);
    model->setCaption(QStringLiteral("lblButton"));
    model->setTag(QStringLiteral("7"));
    model->setToggle(true);
    model->setEnabled(false);
    model->setPicture(Picture(QImage(8, 8, QImage::Format_RGB32)));
    model->Move(60, 60, 1250, 375);

    CommandButton *loaded = buttons.Load(4);
    ASSERT_NE(loaded, nullptr);
    EXPECT_EQ(QStringList({ loaded->Caption(), loaded->Tag(), loaded->objectName() }),
        QStringList({ "lblButton", "7", "btnSelector" }));
    EXPECT_TRUE(loaded->Toggle() && !loaded->Enabled() && !loaded->Visible());
    EXPECT_EQ(loaded->Picture(), model->Picture());
    EXPECT_EQ(loaded->geometry(), model->geometry());
    EXPECT_EQ(loaded->Index(), 4);
    EXPECT_EQ(buttons(4), loaded);
    EXPECT_EQ(buttons(2), nullptr);
    EXPECT_EQ(buttons.Load(4), nullptr);
    EXPECT_EQ(buttons.Load(-1), nullptr);
    EXPECT_EQ(QList<int>({ buttons.LBound(), buttons.UBound(), buttons.Count() }), QList<int>({ 0, 4, 2 }));

    EXPECT_FALSE(buttons.Unload(0));
    EXPECT_FALSE(buttons.Unload(5));
    buttons.Load(1);
    // An element may unload itself from its own click.
    QObject::connect(&buttons, &CommandButtonArray::Click, [&](int index) { EXPECT_TRUE(buttons.Unload(index)); });
    loaded->setEnabled(true);
    loaded->show();
    loaded->click();
    EXPECT_EQ(buttons(4), nullptr);
    EXPECT_EQ(buttons.UBound(), 1);
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    EXPECT_EQ(form.findChildren<CommandButton *>().size(), 2);
    EXPECT_TRUE(buttons.Unload(1));
    EXPECT_EQ(buttons.Count(), 1);
}

// The command button and its control array as a form uses them (symbol captions: the slider's tests).

#include "companion/CommandButton.h"
#include "companion/CommandButtonArray.h"

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

TEST(CommandButton, eventsCarryTheIndexTheKeyCodeAndTheToggledValue)
{
    QDialog form;
    CommandButtonArray buttons(QStringLiteral("sujeito_selector"), &form, 3);
    CommandButton &button = *buttons(1);
    QSignalSpy clicks(&buttons, &CommandButtonArray::Click);
    QSignalSpy doubles(&buttons, &CommandButtonArray::DblClick);
    QList<std::pair<int, int>> keys;
    bool swallow = false;
    QObject::connect(&buttons, &CommandButtonArray::KeyDown, [&](int index, int &keyCode, int shift) {
        keys.append({ index * 1000 + keyCode, shift });
        if (swallow)
            keyCode = 0;
    });
    QTest::keyClick(&button, Qt::Key_A, Qt::ShiftModifier);
    QTest::keyClick(&button, Qt::Key_F2, Qt::ControlModifier | Qt::AltModifier);
    QTest::keyClick(&button, Qt::Key_Plus);
    EXPECT_EQ(keys,
        (QList<std::pair<int, int>> { { 1016, 1 }, { 1065, 1 }, { 1017, 2 }, { 1018, 6 }, { 1113, 6 }, { 1107, 0 } }))
        << "the modifier keys go down first and are reported too";
    QTest::keyClick(&button, Qt::Key_Space);
    swallow = true;
    QTest::keyClick(&button, Qt::Key_Space);
    buttons(0)->setDefault(true);
    form.show();
    QTest::keyClick(&form, Qt::Key_Return);
    QTest::mouseClick(buttons(2), Qt::LeftButton);
    QTest::mouseDClick(buttons(1), Qt::LeftButton);
    EXPECT_EQ(indexes(doubles), QList<int> { 1 });
    EXPECT_EQ(indexes(clicks).mid(0, 3), (QList<int> { 1, 0, 2 }));

    CommandButton toggle;
    toggle.setToggle(true);
    toggle.setValue(true);
    bool valueAtClick = true;
    QObject::connect(&toggle, &CommandButton::Click, [&] { valueAtClick = toggle.Value(); });
    QTest::mouseClick(&toggle, Qt::LeftButton);
    EXPECT_FALSE(valueAtClick) << "the value has changed by the time Click arrives";
}

TEST(CommandButton, aCaptionTooLongIsCutShortAndShownWholeInTheTooltipAndAColouredCaptionGreysWhenDisabled)
{
    QWidget form;
    form.resize(300, 100);
    auto *button = new CommandButton(&form);
    const QString name = QStringLiteral("Ilhas Geórgia do Sul e Sandwich do Sul");
    button->setCaption(name);
    button->setGeometry(10, 10, 90, 25);
    form.show();
    EXPECT_TRUE(button->text().endsWith(QChar(0x2026))) << button->text().toStdString();
    EXPECT_LE(button->fontMetrics().horizontalAdvance(button->text()), 90);
    QHelpEvent help(QEvent::ToolTip, QPoint(5, 5), button->mapToGlobal(QPoint(5, 5)));
    QApplication::sendEvent(button, &help);
    EXPECT_EQ(QToolTip::text(), name);
    QToolTip::hideText();

    button->setCaption(QStringLiteral("&Cancelar"));
    button->resize(20, 25);
    EXPECT_EQ(button->text(), QStringLiteral("&Cancelar")) << "an access key is never cut";

    button->setForeColor(0xC00000);
    EXPECT_EQ(button->palette().color(QPalette::ButtonText), QColor(0, 0, 0xC0));
    button->setEnabled(false);
    EXPECT_NE(button->palette().color(QPalette::Disabled, QPalette::ButtonText), QColor(0, 0, 0xC0));
    button->setButtonStyle(CommandButton::FlatStyle);
    EXPECT_TRUE(button->isFlat() && button->autoFillBackground()) << "a flat button still covers what lies under it";
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
    model->Move(60, 60, 1250, 375);

    CommandButton *loaded = buttons.Load(4);
    ASSERT_NE(loaded, nullptr);
    EXPECT_EQ(QStringList({ loaded->Caption(), loaded->Tag(), loaded->objectName() }),
        QStringList({ "lblButton", "7", "btnSelector" }));
    EXPECT_TRUE(loaded->Toggle() && !loaded->Enabled() && !loaded->Visible());
    EXPECT_EQ(loaded->geometry(), model->geometry());
    EXPECT_EQ(buttons.Load(4), nullptr);
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

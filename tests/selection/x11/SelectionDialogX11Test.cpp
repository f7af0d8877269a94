// The selection dialog as a user meets it on a real display: the window active, the keys
// going wherever the focus is.

#include "selection/clsGFXSelection.h"
#include "selection/frmSelector.h"

#include "companion/CommandButton.h"
#include "support/TestSupport.h"

#include <QApplication>
#include <QTest>

#include <gtest/gtest.h>

using namespace zelctl;

TEST(SelectionDialogOnScreen, aCountryIsFoundByTypingAndTakenWithEnter)
{
    frmSelector::setZoomStepInterval(0);
    clsGFXSelection selection;
    int visibleItems = -1;
    test::ModalDriver user([&](QDialog &dialog) {
        dialog.show();
        EXPECT_TRUE(QTest::qWaitForWindowActive(&dialog));
        // Straight away, without clicking anywhere first.
        QTest::keyClicks(QApplication::focusWidget(), QStringLiteral("russa"));
        visibleItems = 0;
        for (const CommandButton *button : dialog.findChildren<CommandButton *>(QStringLiteral("btnSelector")))
            visibleItems += button->isVisible();
        QTest::keyClick(QApplication::focusWidget(), Qt::Key_Return);
        return dialog.result();
    });
    QString filter;
    EXPECT_EQ(selection.SelectCountry({}, GSEL_All, filter), QStringLiteral("RU"));
    EXPECT_EQ(visibleItems, 1);
}

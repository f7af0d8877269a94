#include "SkinTestSupport.h"

#include "skins/skGoButton.h"
#include "skins/skinCommon.h"
#include "support/TestSupport.h"
#include "tips/TooltipWindow.h"

using namespace zelctl;
using zelctl::test::pixel;

namespace {

constexpr platform::OleColor Normal = 0x3264C8; // RGB(200, 100, 50)
constexpr platform::OleColor Hover = 0x00FF00;
constexpr platform::OleColor Pressed = 0xFF0000;

// Plain colours, so that a state is told by one pixel; the real pictures are in the golden pictures.
class GoButton : public zelctl::test::SkinForm
{
protected:
    skGoButton *button = new skGoButton(&form);
    QStringList events;

    void SetUp() override
    {
        button->setGeometry(20, 20, 40, 40);
        // Round-ish pictures: a transparent border that the black mask cuts away.
        button->setImageSource(0, pictures.write("normal.png", QSize(40, 40), QColor(200, 100, 50), 4));
        button->setImageSource(1, pictures.write("hover.png", QSize(40, 40), QColor(0, 255, 0), 4));
        button->setImageSource(2, pictures.write("pressed.png", QSize(40, 40), QColor(0, 0, 255), 4));
        showForm();
        button->Repaint();
        zelctl::test::recordEvents(button, &skGoButton::Click, events);
    }

    platform::OleColor centre() { return pixel(*button, 20, 20); }
};

} // namespace

// The grey look of a disabled button is in the golden pictures; disabling the form it is on
// must repaint it too, even while hovered.
TEST_F(GoButton, disabledByItsFormShowsTheNormalPictureAndedOnGrey)
{
    constexpr platform::OleColor Greyed = 0x306048; // RGB(200, 100, 50) AND RGB(120, 120, 120)
    button->setHovering(true);
    form.setEnabled(false);
    EXPECT_EQ(centre(), Greyed);
}

TEST_F(GoButton, hoverShowsTheHoverPicture)
{
    expectHoverInAndOut(
        button, QPoint(20, 20), [this] { EXPECT_EQ(centre(), Hover); }, [this] { EXPECT_EQ(centre(), Normal); });
}

TEST_F(GoButton, aClickFreesThePointerThenRaisesClickAndMouseOut)
{
    QTest::mouseMove(button, QPoint(20, 20));
    QTest::mousePress(button, Qt::LeftButton, {}, QPoint(20, 20));
    EXPECT_EQ(centre(), Pressed);
    QTest::mouseRelease(button, Qt::LeftButton, {}, QPoint(20, 20));
    // A double click is one click: the second press and its release only raise MouseUp.
    QTest::mouseDClick(button, Qt::LeftButton, {}, QPoint(20, 20));
    QTest::mouseRelease(button, Qt::LeftButton, {}, QPoint(20, 20));
    EXPECT_EQ(events, (QStringList { "MouseIn", "MouseDown 1", "MouseUp 1", "Click", "MouseOut", "MouseUp 1" }));
    EXPECT_FALSE(button->Hovering());
    EXPECT_FALSE(button->Active());
    EXPECT_EQ(centre(), Normal);

    // The right button neither presses nor clicks.
    events.clear();
    QTest::mouseClick(button, Qt::RightButton, {}, QPoint(20, 20));
    EXPECT_EQ(events, (QStringList { "MouseDown 2", "MouseUp 2" }));

    // Pressed, moved out and released there: the button keeps the pointer for the release,
    // which does not click.
    moveAway();
    events.clear();
    QTest::mouseMove(button, QPoint(20, 20));
    QTest::mousePress(button, Qt::LeftButton, {}, QPoint(20, 20));
    QTest::mouseMove(button, QPoint(200, 150));
    EXPECT_EQ(platform::capturedWidget(), button);
    QTest::mouseRelease(button, Qt::LeftButton, {}, QPoint(200, 150));
    EXPECT_EQ(platform::capturedWidget(), nullptr);
    EXPECT_EQ(events, (QStringList { "MouseIn", "MouseDown 1", "MouseOut", "MouseUp 1" }));
    EXPECT_EQ(centre(), Normal);
}

// A failed load keeps the path and the previous picture; an empty path empties a slot.
TEST_F(GoButton, pictureSlotsFollowTheIndexAndLoadingRulesAndTheButtonStaysSquare)
{
    for (int slot : { -1, 6 })
        EXPECT_EQ(button->setImageSource(slot, pictures.path("normal.png")), skinCommon::ErrSubscriptOutOfRange);
    EXPECT_EQ(button->setImageSource(0, pictures.path("missing.gif")), skinCommon::ErrFileNotFound);
    EXPECT_EQ(button->ImageSource(0), pictures.path("missing.gif"));
    EXPECT_EQ(button->setImageSource(0, test::sourcePath("data/iso3166.txt")), skinCommon::ErrInvalidPicture);
    button->Repaint();
    EXPECT_EQ(centre(), Normal);
    EXPECT_EQ(button->setImageSource(0, QString()), skinCommon::ErrNone);
    button->Repaint();
    EXPECT_EQ(centre(), 0x000000u);
    EXPECT_FALSE(button->mask().contains(QPoint(20, 20)));
    button->resize(26, 20);
    EXPECT_EQ(button->size(), QSize(20, 20)) << "it keeps itself square";
}

TEST_F(GoButton, tooltipIsABalloonTitledNavegacao)
{
    const auto tip = [this]() -> TooltipWindow * {
        for (QWidget *widget : QApplication::allWidgets())
            if (auto *window = qobject_cast<TooltipWindow *>(widget); window && window->tool() == button)
                return window;
        return nullptr;
    };
    button->setTooltip(QStringLiteral("Seguinte"));
    button->setTooltip(QStringLiteral("Passo seguinte"));
    ASSERT_NE(tip(), nullptr);
    EXPECT_TRUE(tip()->isBalloon());
    EXPECT_EQ(tip()->title(), QStringLiteral("Navegação"));
    EXPECT_EQ(tip()->text(), QStringLiteral("Passo seguinte"));
    button->setTooltip(QString());
    EXPECT_EQ(tip(), nullptr);
}

TEST_F(GoButton, designModePreviewsTheDefaultPicturesWithoutTouchingThePaths)
{
    skGoButton preview(&form);
    preview.setGeometry(100, 20, 32, 32);
    Ambient designer;
    designer.UserMode = false;
    preview.setAmbient(designer);
    preview.Load(PropertyBag());
    preview.Repaint();
    EXPECT_EQ(preview.ImageSource(0), QString());
    EXPECT_EQ(pixel(preview, 5, 16), platform::rgb(232, 119, 34)) << "the orange disc of btn_go_normal.gif";
    EXPECT_FALSE(preview.mask().contains(QPoint(0, 0))) << "the picture's transparent corner";
}

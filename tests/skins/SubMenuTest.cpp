#include "SkinTestSupport.h"

#include "skins/skSubMenu.h"

using namespace zelctl;
using zelctl::test::pixel;

namespace {

constexpr platform::OleColor Fill = 0xC3AB00;
constexpr platform::OleColor HoverFill = 0xE1D57F;
constexpr platform::OleColor ActiveFill = 0x7FD5E1;

// How the item looks in each state is in the golden pictures.
class SubMenu : public zelctl::test::SkinForm
{
protected:
    skSubMenu *item = new skSubMenu(&form);
    QStringList events;

    void SetUp() override
    {
        item->InitNew();
        item->setGeometry(10, 10, 200, 20);
        showForm();
        zelctl::test::recordEvents(item, &skSubMenu::Clicked, events);
    }

    platform::OleColor middle() { return pixel(*item, 100, 10); }
};

} // namespace

TEST_F(SubMenu, hoverLightensTheBoxAndActiveWinsOverHover)
{
    expectHoverInAndOut(
        item, QPoint(100, 10), [this] { EXPECT_EQ(middle(), HoverFill); }, [this] { EXPECT_EQ(middle(), Fill); });
    QTest::mouseMove(item, QPoint(100, 10));
    item->setActive(true);
    EXPECT_EQ(middle(), ActiveFill);
}

// Every slice is ANDed onto what lies below: the ends onto the stretched middle. Bad indices
// are ignored; the same path is not read again, though the file changed.
TEST_F(SubMenu, slicesAreAndedOnWhiteOrOnGreyWhenHoveredAndReadOncePerPath)
{
    const QString left = pictures.write("left.png", QSize(4, 24), QColor(255, 0, 255));
    item->setImageFile(4, left);
    item->setImageFile(QStringLiteral("um"), left);
    item->setImageFile(QStringLiteral("0"), left);
    EXPECT_EQ(item->ImageFile(4), QString());
    item->setImageFile(1, pictures.write("middle.png", QSize(10, 24), QColor(255, 255, 0)));
    item->setImageFile(2, pictures.write("right.png", QSize(4, 24), QColor(0, 255, 255)));
    pictures.write("left.png", QSize(4, 24), QColor(0, 255, 0));
    item->setImageFile(0, left);
    item->resize(300, 24);
    item->setCaption(QString());
    EXPECT_EQ(item->size(), QSize(14, 24)) << "left width + caption width + middle width";
    const std::pair<int, platform::OleColor> expected[] = { { 2, 0x0000FF }, { 6, 0x00FFFF }, { 12, 0x00FF00 } };
    for (const auto &[x, colour] : expected)
        EXPECT_EQ(pixel(*item, x, 5), colour) << x;
    EXPECT_TRUE(item->mask().isEmpty());
    // Now narrower than twice its height: the next Redraw widens it again first.
    item->Redraw();
    EXPECT_EQ(item->width(), 48);
    // Hovering draws on light grey (and narrows the item once more).
    QTest::mouseMove(item, QPoint(2, 5));
    EXPECT_EQ(item->width(), 14);
    EXPECT_EQ(pixel(*item, 2, 5), platform::rgb(192, 0, 0));
}

TEST_F(SubMenu, clickRaisesClickedBeforeMouseOutAndUndoesActive)
{
    QObject::connect(item, &skSubMenu::Clicked, item, [this] { item->setActive(true); });
    QTest::mouseMove(item, QPoint(100, 10));
    ASSERT_EQ(QWidget::mouseGrabber(), item) << "hovering captures the pointer";
    // A double click is one click.
    QTest::mouseClick(item, Qt::LeftButton, {}, QPoint(100, 10));
    QTest::mouseDClick(item, Qt::LeftButton, {}, QPoint(100, 10));
    QTest::mouseRelease(item, Qt::LeftButton, {}, QPoint(100, 10));
    EXPECT_EQ(events, (QStringList { "MouseIn", "MouseDown 1", "MouseUp 1", "Click", "MouseOut", "MouseUp 1" }));
    EXPECT_FALSE(item->Active());
    EXPECT_FALSE(item->hovering());
    EXPECT_EQ(middle(), Fill);
}

TEST_F(SubMenu, persistsEveryPropertyInOrderWithTheirReadDefaults)
{
    EXPECT_EQ(item->Save().names(),
        (QStringList { "ForeColor", "BackColor", "HoverForeColor", "HoverBackColor", "ActiveForeColor",
            "ActiveBackColor", "Caption", "Margin", "TransparentBack" }));

    // A saved item without the values reads other defaults: the caption is its name.
    Ambient named;
    named.DisplayName = QStringLiteral("skSubMenu3");
    item->setAmbient(named);
    item->Load(PropertyBag());
    EXPECT_EQ(item->ActiveBackColor(), HoverFill);
    EXPECT_EQ(item->Caption(), QStringLiteral("skSubMenu3"));
    EXPECT_EQ(item->TransparencyColor(), 0xFFFFFFu);
}

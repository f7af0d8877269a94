#include "SkinTestSupport.h"

#include "skins/skNumber.h"

using namespace zelctl;

namespace {

// How the badge looks in each state, and what its mask lets through (the white caption on
// the white see-through colour stays, the corners go), is in the golden pictures.
class Number : public zelctl::test::SkinForm
{
protected:
    skNumber *badge = new skNumber(&form);

    void SetUp() override
    {
        badge->InitNew();
        badge->setGeometry(20, 20, 30, 30);
        showForm();
    }
};

} // namespace

TEST_F(Number, aStyleItDoesNotKnowIsTransparentAndItStaysSquare)
{
    badge->setBackStyle(skNumber::Opaque);
    EXPECT_TRUE(badge->mask().isEmpty());
    badge->setBackStyle(42);
    EXPECT_EQ(badge->BackStyle(), skNumber::Transparent);
    EXPECT_FALSE(badge->mask().contains(QPoint(0, 0)));
    badge->resize(30, 20);
    EXPECT_EQ(badge->size(), QSize(30, 30)) << "its width as height";
}

TEST_F(Number, aDoubleClickIsOneClickAndOneDoubleClick)
{
    QSignalSpy clicked(badge, &skNumber::Clicked);
    QSignalSpy doubleClicked(badge, &skNumber::DoubleClicked);
    QTest::mouseClick(badge, Qt::LeftButton, {}, QPoint(15, 15));
    // The second press of a double click, then its release.
    QTest::mouseDClick(badge, Qt::LeftButton, {}, QPoint(15, 15));
    QTest::mouseRelease(badge, Qt::LeftButton, {}, QPoint(15, 15));
    EXPECT_EQ(doubleClicked.count(), 1);
    EXPECT_EQ(clicked.count(), 1);
}

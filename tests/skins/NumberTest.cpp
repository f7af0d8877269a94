#include "SkinTestSupport.h"

#include "skins/skNumber.h"

using namespace zelctl;
using zelctl::test::pixel;

namespace {

// How the badge looks in each state is in the golden pictures.
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

TEST_F(Number, onlyWhatLiesRoundTheDiscIsSeeThroughAndOnlyWhenTransparent)
{
    // With the default colours the caption is as white as the background round the disc.
    badge->setCaption(QStringLiteral("8"));
    const QImage image = badge->surface().image();
    int captionPixels = 0;
    for (int y = 8; y < 22; ++y)
        for (int x = 8; x < 22; ++x)
            if (platform::fromQColor(QColor(image.pixel(x, y))) == 0xFFFFFFu) {
                ++captionPixels;
                EXPECT_TRUE(badge->mask().contains(QPoint(x, y))) << "caption pixel " << x << "," << y;
            }
    EXPECT_GT(captionPixels, 5);
    EXPECT_FALSE(badge->mask().contains(QPoint(0, 0)));
    EXPECT_FALSE(badge->mask().contains(QPoint(29, 0)));

    badge->setBackStyle(skNumber::Opaque);
    EXPECT_TRUE(badge->mask().isEmpty());
    badge->setBackStyle(42);
    EXPECT_EQ(badge->BackStyle(), skNumber::Transparent);
    EXPECT_FALSE(badge->mask().contains(QPoint(0, 0)));
}

TEST_F(Number, staysSquareByTakingItsWidthAsHeightAndSizesItsFontToIt)
{
    badge->resize(30, 20);
    EXPECT_EQ(badge->size(), QSize(30, 30));
    for (auto [width, points] : { std::pair { 16, 6 }, std::pair { 20, 10 }, std::pair { 40, 20 } }) {
        badge->resize(width, width);
        EXPECT_EQ(badge->font().pointSize(), points) << width;
    }
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

#include "SkinTestSupport.h"

#include "skins/skNumber.h"

#include <QSignalSpy>

using namespace zelctl;
using zelctl::test::pixel;

namespace {

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

// How it looks in each state is in the golden pictures; this is about what the mask takes.
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
    EXPECT_TRUE(badge->mask().contains(QPoint(15, 15)));
    EXPECT_FALSE(badge->mask().contains(QPoint(0, 0)));
    EXPECT_FALSE(badge->mask().contains(QPoint(29, 0)));

    badge->setBackStyle(skNumber::Opaque);
    EXPECT_TRUE(badge->mask().isEmpty()) << "an opaque badge shows its BackColor round the disc";
    EXPECT_EQ(pixel(*badge, 0, 0), 0xFFFFFFu);
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

TEST_F(Number, hoverSetsActiveWithOneMouseInAndOneMouseOut)
{
    QSignalSpy in(badge, &skNumber::MouseIn);
    QSignalSpy out(badge, &skNumber::MouseOut);
    QTest::mouseMove(badge, QPoint(15, 15));
    QTest::mouseMove(badge, QPoint(16, 14));
    EXPECT_EQ(in.count(), 1);
    EXPECT_TRUE(badge->Active());
    EXPECT_EQ(pixel(*badge, 3, 15), 0x5652B8u);

    QTest::mouseMove(&form, QPoint(300, 200));
    QTest::mouseMove(&form, QPoint(301, 201));
    EXPECT_EQ(out.count(), 1);
    EXPECT_FALSE(badge->Active());
    EXPECT_EQ(platform::capturedWidget(), nullptr);
}

TEST_F(Number, clicksAndDoubleClicksReachTheHost)
{
    QSignalSpy clicked(badge, &skNumber::Clicked);
    QSignalSpy doubleClicked(badge, &skNumber::DoubleClicked);
    int down = 0;
    QObject::connect(badge, &skNumber::MouseDown, [&down](qint16 &, qint16 &, float &, float &) { ++down; });
    QTest::mouseClick(badge, Qt::LeftButton, {}, QPoint(15, 15));
    EXPECT_EQ(clicked.count(), 1);
    EXPECT_EQ(down, 1);
    // The second press of a double click, then its release.
    QTest::mouseDClick(badge, Qt::LeftButton, {}, QPoint(15, 15));
    QTest::mouseRelease(badge, Qt::LeftButton, {}, QPoint(15, 15));
    EXPECT_EQ(doubleClicked.count(), 1);
    EXPECT_EQ(clicked.count(), 1);
}

TEST_F(Number, persistsWithItsReadAndWriteDefaults)
{
    badge->setCaption(QString());
    PropertyBag saved = badge->Save();
    EXPECT_EQ(saved.names(), QStringList { "Active" }) << "only Active is written at its default";

    skNumber loaded(&form);
    loaded.Load(saved);
    EXPECT_EQ(loaded.Caption(), QStringLiteral("1")) << "an empty caption reads back as 1";
    EXPECT_EQ(loaded.Background(), 0x404040u);
    EXPECT_EQ(loaded.BackgroundActive(), 0x5652B8u);
    EXPECT_EQ(loaded.BackColor(), 0xFFFFFFu);
    EXPECT_EQ(loaded.BackStyle(), skNumber::Transparent);

    PropertyBag bag;
    bag.WriteProperty("Caption", "3");
    bag.WriteProperty("Background", 0x112233u);
    bag.WriteProperty("Active", true);
    bag.WriteProperty("BackStyle", skNumber::Opaque);
    loaded.Load(bag);
    EXPECT_EQ(loaded.BackStyle(), skNumber::Opaque);
    EXPECT_EQ(loaded.Caption(), QStringLiteral("3"));
    EXPECT_EQ(loaded.Background(), 0x112233u);
    EXPECT_TRUE(loaded.Active());
}

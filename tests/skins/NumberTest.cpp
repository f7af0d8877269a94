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

    // How many pixels of the surface have the colour.
    int count(platform::OleColor color)
    {
        const QImage image = badge->surface().image();
        int n = 0;
        for (int y = 0; y < image.height(); ++y)
            for (int x = 0; x < image.width(); ++x)
                n += platform::fromQColor(QColor(image.pixel(x, y))) == color;
        return n;
    }
};

} // namespace

TEST_F(Number, drawsADiscWithAnXorRingAndMasksTheBackground)
{
    badge->setCaption(QString());
    EXPECT_EQ(pixel(*badge, 15, 15), 0x404040u);
    EXPECT_EQ(pixel(*badge, 0, 0), 0xFFFFFFu);
    EXPECT_GT(count(0xFFFFFFu ^ 0x404040u), 0) << "the ring of mixed colour round the disc";
    EXPECT_EQ(count(0xFFFFFFu) + count(0x404040u) + count(0xBFBFBFu), 30 * 30) << "no caption: only the disc";
    EXPECT_TRUE(badge->mask().contains(QPoint(15, 15)));
    EXPECT_FALSE(badge->mask().contains(QPoint(0, 0)));
    EXPECT_FALSE(badge->mask().contains(QPoint(29, 0)));
}

TEST_F(Number, captionIsCentredInTheForegroundColourAndFollowsActive)
{
    badge->setForeground(0x00FFFF);
    badge->setForegroundActive(0xFF00FF);
    badge->setCaption(QStringLiteral("8"));
    EXPECT_GT(count(0x00FFFFu), 5);
    EXPECT_EQ(count(0xFF00FFu), 0);
    // The caption's pixels lie round the centre.
    const QImage image = badge->surface().image();
    QRect box;
    for (int y = 0; y < 30; ++y)
        for (int x = 0; x < 30; ++x)
            if (platform::fromQColor(QColor(image.pixel(x, y))) == 0x00FFFFu)
                box |= QRect(x, y, 1, 1);
    EXPECT_NEAR(box.center().x(), 15, 2);
    EXPECT_NEAR(box.center().y(), 15, 3);

    badge->setActive(true);
    EXPECT_EQ(pixel(*badge, 3, 15), 0x5652B8u) << "the active disc";
    EXPECT_EQ(count(0x00FFFFu), 0);
    EXPECT_GT(count(0xFF00FFu), 5);
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

    PropertyBag bag;
    bag.WriteProperty("Caption", "3");
    bag.WriteProperty("Background", 0x112233u);
    bag.WriteProperty("Active", true);
    loaded.Load(bag);
    EXPECT_EQ(loaded.Caption(), QStringLiteral("3"));
    EXPECT_EQ(loaded.Background(), 0x112233u);
    EXPECT_TRUE(loaded.Active());
}

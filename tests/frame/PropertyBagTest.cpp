#include "frame/PropertyBag.h"

#include <QJsonDocument>
#include <QJsonObject>

#include <gtest/gtest.h>

using zelctl::PropertyBag;

TEST(PropertyBag, readsTheDefaultForAnAbsentName)
{
    PropertyBag bag;
    EXPECT_EQ(bag.ReadProperty("BackColor", 0x80000005u).toUInt(), 0x80000005u);
    EXPECT_FALSE(bag.ReadProperty("Nothing").isValid());
}

TEST(PropertyBag, skipsValuesEqualToTheWriteDefault)
{
    PropertyBag bag;
    bag.WriteProperty("Locked", false, false);
    bag.WriteProperty("Text", "", "");
    bag.WriteProperty("Filter", 1, 0);
    EXPECT_EQ(bag.names(), QStringList({ "Filter" }));

    bag.WriteProperty("Filter", 0, 0);
    EXPECT_TRUE(bag.isEmpty()) << "writing the default drops the earlier value";

    bag.WriteProperty("Always", 0);
    EXPECT_TRUE(bag.contains("Always")) << "without a default every value is written";
}

TEST(PropertyBag, keepsTheOrderOfFirstWritesWhenNamesComeAndGo)
{
    PropertyBag bag;
    bag.WriteProperty("Zeta", 1);
    bag.WriteProperty("Alpha", 2);
    bag.WriteProperty("Beta", 3);
    bag.WriteProperty("Zeta", 4);
    EXPECT_EQ(bag.names(), QStringList({ "Zeta", "Alpha", "Beta" }));
    EXPECT_EQ(bag.ReadProperty("Zeta").toInt(), 4);

    bag.WriteProperty("Zeta", 0, 0);
    bag.WriteProperty("Beta", 5);
    bag.WriteProperty("Gamma", 6);
    EXPECT_EQ(bag.names(), QStringList({ "Alpha", "Beta", "Gamma" }));
    EXPECT_EQ(bag.ReadProperty("Alpha").toInt(), 2);
    EXPECT_EQ(bag.ReadProperty("Beta").toInt(), 5);
    EXPECT_EQ(bag.ReadProperty("Gamma").toInt(), 6);
    EXPECT_FALSE(bag.contains("Zeta"));
}

TEST(PropertyBag, holdsAtMostItsCapOfNames)
{
    // 80,000 names, as a hostile form may hold, of which one is written twice.
    QJsonArray json;
    for (int i = 0; i < 80000; ++i)
        json.append(QJsonObject { { "name", QStringLiteral("P%1").arg(i) }, { "value", i } });
    json.append(QJsonObject { { "name", "P7" }, { "value", -7 } });
    const PropertyBag bag = PropertyBag::fromJson(json);
    ASSERT_EQ(bag.names().size(), PropertyBag::MaxEntries);
    EXPECT_EQ(bag.names().last(), QStringLiteral("P%1").arg(PropertyBag::MaxEntries - 1));
    EXPECT_EQ(bag.ReadProperty("P7").toInt(), -7) << "a later value of a kept name still counts";
    EXPECT_FALSE(bag.contains(QStringLiteral("P%1").arg(PropertyBag::MaxEntries)));
}

TEST(PropertyBag, survivesAJsonRoundTripWithEveryValueKind)
{
    PropertyBag bag;
    bag.WriteProperty("CountryID", "PT");
    bag.WriteProperty("Locked", true);
    bag.WriteProperty("Filter", 3);
    bag.WriteProperty("BackColor", 0x8000000Fu);
    bag.WriteProperty("MinFrameDelay", 12.5);
    bag.WriteProperty("GIF", QByteArray("GIF89a\0\xff", 8));
    bag.WriteProperty("Nome", QString::fromUtf8("João Conceição"));

    const QByteArray text = QJsonDocument(bag.toJson()).toJson();
    const PropertyBag back = PropertyBag::fromJson(QJsonDocument::fromJson(text).array());
    EXPECT_EQ(back.names(), bag.names());
    EXPECT_EQ(back.ReadProperty("GIF").toByteArray(), QByteArray("GIF89a\0\xff", 8));
    EXPECT_EQ(back.ReadProperty("BackColor").toUInt(), 0x8000000Fu);
    EXPECT_EQ(back.ReadProperty("Filter"), QVariant(3));
    EXPECT_EQ(back.ReadProperty("Locked"), QVariant(true));
    EXPECT_DOUBLE_EQ(back.ReadProperty("MinFrameDelay").toDouble(), 12.5);
    EXPECT_EQ(back.ReadProperty("Nome").toString(), QString::fromUtf8("João Conceição"));
}

TEST(PropertyBag, ignoresMalformedJsonEntries)
{
    const QJsonArray json
        = QJsonDocument::fromJson(R"([1, {"value": 2}, {"name": 3}, {"name": "Ok", "value": 4}])").array();
    const PropertyBag bag = PropertyBag::fromJson(json);
    EXPECT_EQ(bag.names(), QStringList({ "Ok" }));
}

#include "frame/PropertyBag.h"

#include <QJsonDocument>

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

TEST(PropertyBag, keepsTheOrderOfFirstWrites)
{
    PropertyBag bag;
    bag.WriteProperty("Zeta", 1);
    bag.WriteProperty("Alpha", 2);
    bag.WriteProperty("Zeta", 3);
    EXPECT_EQ(bag.names(), QStringList({ "Zeta", "Alpha" }));
    EXPECT_EQ(bag.ReadProperty("Zeta").toInt(), 3);
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

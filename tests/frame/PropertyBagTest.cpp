#include "frame/PropertyBag.h"

#include <QJsonDocument>
#include <QJsonObject>

#include <gtest/gtest.h>

using zelctl::PropertyBag;

// Defaults are not written, and writing one drops the earlier value; names keep the order
// of their first write, even when others come and go.
TEST(PropertyBag, skipsDefaultsAndKeepsTheOrderOfFirstWrites)
{
    PropertyBag bag;
    bag.WriteProperty("Locked", false, false);
    bag.WriteProperty("Zeta", 1, 0);
    bag.WriteProperty("Alpha", 2);
    bag.WriteProperty("Beta", 3);
    bag.WriteProperty("Zeta", 4);
    EXPECT_EQ(bag.names(), QStringList({ "Zeta", "Alpha", "Beta" }));
    EXPECT_EQ(bag.ReadProperty("Zeta").toInt(), 4);

    bag.WriteProperty("Zeta", 0, 0);
    bag.WriteProperty("Beta", 5);
    bag.WriteProperty("Gamma", 6);
    EXPECT_EQ(bag.names(), QStringList({ "Alpha", "Beta", "Gamma" }));
    for (const auto &[name, value] : { std::pair { "Alpha", 2 }, { "Beta", 5 }, { "Gamma", 6 } })
        EXPECT_EQ(bag.ReadProperty(name).toInt(), value) << name;
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

// Every kind of value comes back equal; entries that are not a name with a value are skipped.
TEST(PropertyBag, survivesAJsonRoundTripWithEveryValueKind)
{
    PropertyBag bag;
    bag.WriteProperty("Locked", true);
    bag.WriteProperty("Filter", 3);
    bag.WriteProperty("BackColor", 0x8000000Fu);
    bag.WriteProperty("MinFrameDelay", 12.5);
    bag.WriteProperty("GIF", QByteArray("GIF89a\0\xff", 8));
    bag.WriteProperty("Nome", QString::fromUtf8("João Conceição"));

    const QByteArray text = QJsonDocument(bag.toJson()).toJson();
    const PropertyBag back = PropertyBag::fromJson(QJsonDocument::fromJson(text).array());
    EXPECT_EQ(back.names(), bag.names());
    for (const QString &name : bag.names())
        EXPECT_EQ(back.ReadProperty(name), bag.ReadProperty(name)) << name.toStdString();
    EXPECT_EQ(back.ReadProperty("Filter").typeId(), QMetaType::Int) << "whole numbers come back as integers";

    const QJsonArray malformed
        = QJsonDocument::fromJson(R"([1, {"value": 2}, {"name": 3}, {"name": "Ok", "value": 4}])").array();
    EXPECT_EQ(PropertyBag::fromJson(malformed).names(), QStringList({ "Ok" }));
}

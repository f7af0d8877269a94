#include "frame/PropertyReaders.h"
#include "frame/ClassRegistry.h"
#include "frame/UserControl.h"

#include <gtest/gtest.h>

#include <memory>

using namespace zelctl;

namespace {

PropertyBag bagWith(const QString &name, const QVariant &value)
{
    PropertyBag bag;
    bag.WriteProperty(name, value);
    return bag;
}

} // namespace

TEST(PropertyReaders, readColoursInEveryFormAFormFileHolds)
{
    constexpr platform::OleColor fallback = 0x123456;
    const struct
    {
        QVariant stored;
        platform::OleColor colour;
    } cases[] = {
        { 65280, 0x00FF00 },
        { qint64(0x8000000F), 0x8000000F },
        { 65280.0, 0x00FF00 },
        { "65280", 0x00FF00 },
        { " -2147483633 ", 0x8000000F }, // a system colour kept as a signed Long
        { "&H00FF00&", 0x00FF00 },
        { "&HFF00&", 0x00FF00 },
        { "&hff00", 0x00FF00 },
        { "&H8000000F&", 0x8000000F },
        { "&H100000000&", fallback },
        { "&H&", fallback },
        { "&HGG&", fallback },
        { "verde", fallback },
        { "", fallback },
        { 12.5, fallback },
        { qint64(1) << 40, fallback },
        { true, fallback },
    };
    for (const auto &c : cases) {
        EXPECT_EQ(readColor(bagWith("C", c.stored), "C", fallback), c.colour) << c.stored.toString().toStdString();
    }
    EXPECT_EQ(readColor(PropertyBag(), "C", fallback), fallback);
}

TEST(PropertyReaders, everyControlReadsItsColoursThroughIt)
{
    const struct
    {
        const char *control;
        const char *name;
        const char *property;
    } colours[] = {
        { "cNIF", "BackColor", "BackColor" },
        { "cNIB", "BackColor", "BackColor" },
        { "skNumber", "Background", "Background" },
        { "skNumber", "ForegroundActive", "ForegroundActive" },
        { "skSubMenu", "HoverBackColor", "HoverBackColor" },
        { "skSubMenu", "TransparentBack", "TransparencyColor" },
        { "skQuadro", "TransparentBack", "TransparencyColor" },
        { "skGrowth", "CaptionColor", "CaptionColor" },
    };
    for (const auto &c : colours) {
        std::unique_ptr<QObject> object(CreateObject(QString::fromLatin1(c.control)));
        auto *control = qobject_cast<UserControl *>(object.get());
        ASSERT_NE(control, nullptr) << c.control;
        control->Load(bagWith(QString::fromLatin1(c.name), "&H00FF00&"));
        EXPECT_EQ(control->property(c.property).toUInt(), 0x00FF00u) << c.control << " " << c.name;
    }
}

TEST(PropertyReaders, readBooleansWrittenAsTextOrNumbers)
{
    for (const QVariant &yes : { QVariant(true), QVariant(-1), QVariant("True"), QVariant(" -1"), QVariant("1") })
        EXPECT_TRUE(readBoolean(bagWith("B", yes), "B", false)) << yes.toString().toStdString();
    for (const QVariant &no : { QVariant(false), QVariant(0), QVariant("false"), QVariant("0") })
        EXPECT_FALSE(readBoolean(bagWith("B", no), "B", true)) << no.toString().toStdString();
    EXPECT_TRUE(readBoolean(bagWith("B", "talvez"), "B", true));
    EXPECT_FALSE(readBoolean(PropertyBag(), "B", false));
}

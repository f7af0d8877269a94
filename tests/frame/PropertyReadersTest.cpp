#include "frame/PropertyReaders.h"
#include "frame/ClassRegistry.h"
#include "frame/UserControl.h"

#include <gtest/gtest.h>

#include <limits>
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

TEST(PropertyReaders, readLongsIntoTheirRange)
{
    const struct
    {
        QVariant stored;
        OutOfRange rule;
        qint32 value;
    } cases[] = {
        { 70, OutOfRange::Refuse, 70 },
        { "  70 ", OutOfRange::Refuse, 70 },
        { 70.5, OutOfRange::Refuse, 70 }, // halves to even
        { 71.5, OutOfRange::Refuse, 72 },
        { 10, OutOfRange::Refuse, 10 },
        { 9, OutOfRange::Refuse, -1 },
        { 9, OutOfRange::Clamp, 10 },
        { 101, OutOfRange::Clamp, 100 },
        { 1e300, OutOfRange::Clamp, 100 },
        { -1e300, OutOfRange::Clamp, 10 },
        { 1e300, OutOfRange::Refuse, -1 },
        { "1e300", OutOfRange::Refuse, -1 },
        { qint64(1) << 62, OutOfRange::Clamp, 100 },
        { quint64(1) << 63, OutOfRange::Refuse, -1 },
        { std::numeric_limits<double>::quiet_NaN(), OutOfRange::Clamp, -1 },
        { std::numeric_limits<double>::infinity(), OutOfRange::Clamp, -1 },
        { "inf", OutOfRange::Clamp, -1 },
        { "setenta", OutOfRange::Clamp, -1 },
        { QByteArray("70"), OutOfRange::Clamp, -1 },
    };
    for (const auto &c : cases) {
        EXPECT_EQ(readLong(bagWith("N", c.stored), "N", -1, 10, 100, c.rule), c.value)
            << c.stored.toString().toStdString();
    }
    EXPECT_EQ(readLong(PropertyBag(), "N", -1, 10, 100, OutOfRange::Clamp), -1);
    EXPECT_EQ(readLong(bagWith("N", -2147483648.0), "N", 0), std::numeric_limits<qint32>::min());
    EXPECT_EQ(readLong(bagWith("N", 2147483648.0), "N", 0), 0);
    EXPECT_EQ(readColor(bagWith("C", 1e300), "C", 7), 7u) << "no out-of-range conversion";
}

// Every persisted number of every control, beyond its range: the control keeps a value
// of the range, as its setter would.
TEST(PropertyReaders, everyControlReadsItsNumbersIntoRange)
{
    const struct
    {
        const char *control;
        const char *name;
        const char *property;
        QVariant stored;
        qint64 value;
    } numbers[] = {
        { "ucAniGIF", "Delay", "MinFrameDelay", 40000, 32700 },
        { "ucAniGIF", "Delay", "MinFrameDelay", -1e300, 10 },
        { "ucAniGIF", "Stretch", "Stretch", 9.3e18, 1 },
        { "ucAniGIF", "DelayLoad", "DelayAnimation", -1, 1 },
        { "ucAniGIF", "Mirror", "Mirrored", 5, 0 },
        { "ucAniGIF", "MousePointer", "MousePointer", 1e300, 0 },
        { "ucAniGIF", "OffsetX", "OffsetX", 2147483648.0, 0 },
        { "ucAniGIF", "OffsetY", "OffsetY", -2147483649.0, 0 },
        { "ucAniGIF", "Loops", "Loops", -2147483648.0, 2147483647 },
        { "ucAniGIF", "Loops", "Loops", 1e300, 0 },
        { "skSubMenu", "Margin", "Margin", 1e300, 251658225 },
        { "skQuadro", "DebugDesignImgID", "DebugDesign", -1e300, 0 },
        { "InfoButton", "ibutton.bstyle", "Style", 3, 0 },
        { "InfoButton", "ibutton.style", "ToolTipStyle", 2, 1 },
        { "cNIF", "Countries", "Countries", 4294967296.0, 0 },
    };
    for (const auto &n : numbers) {
        std::unique_ptr<QObject> object(CreateObject(QString::fromLatin1(n.control)));
        auto *control = qobject_cast<UserControl *>(object.get());
        ASSERT_NE(control, nullptr) << n.control;
        control->Load(bagWith(QString::fromLatin1(n.name), n.stored));
        EXPECT_EQ(control->property(n.property).toLongLong(), n.value) << n.control << " " << n.name;
    }
}

#include "frame/PropertyReaders.h"
#include "frame/ClassRegistry.h"
#include "frame/UserControl.h"

#include <gtest/gtest.h>

#include <limits>
#include <memory>

using namespace zelctl;

namespace {

constexpr qint64 Fallback = -1;
constexpr auto Nan = std::numeric_limits<double>::quiet_NaN();
constexpr auto LongMin = std::numeric_limits<qint32>::min();

// Colour; Boolean; a Long in 10..100 that clamps or refuses; a Long of the whole range.
enum Reader { Colour, Boolean, Clamp, Refuse, Long };

// What `reader` makes of the bag, Fallback where it falls back to its default.
qint64 read(Reader reader, const PropertyBag &bag)
{
    switch (reader) {
    case Colour: {
        const platform::OleColor colour = readColor(bag, "P", 0x123456);
        return colour == 0x123456 ? Fallback : colour;
    }
    case Boolean: {
        const bool withFalse = readBoolean(bag, "P", false);
        return withFalse == readBoolean(bag, "P", true) ? withFalse : Fallback;
    }
    case Long:
        return readLong(bag, "P", Fallback);
    default:
        return readLong(bag, "P", Fallback, 10, 100, reader == Clamp ? OutOfRange::Clamp : OutOfRange::Refuse);
    }
}

PropertyBag bagWith(const QString &name, const QVariant &value)
{
    PropertyBag bag;
    bag.WriteProperty(name, value);
    return bag;
}

} // namespace

// Every form a form file may hold a value in, as each reader takes it.
TEST(PropertyReaders, readEveryFormAFormFileHolds)
{
    const struct
    {
        Reader reader;
        QVariant stored;
        qint64 value;
    } cases[] = {
        { Colour, 65280.0, 0x00FF00 },
        { Colour, " -2147483633 ", 0x8000000F }, // a system colour kept as a signed Long
        { Colour, "&hff00", 0x00FF00 },
        { Colour, "&H8000000F&", 0x8000000F },
        { Colour, "&H100000000&", Fallback },
        { Colour, 12.5, Fallback },
        { Colour, qint64(1) << 40, Fallback },
        { Boolean, -1, 1 },
        { Boolean, "True", 1 },
        { Boolean, " -1", 1 },
        { Boolean, "1", 1 },
        { Boolean, "false", 0 },
        { Boolean, "talvez", Fallback },
        { Refuse, "  70 ", 70 },
        { Refuse, 70.5, 70 }, // halves to even
        { Refuse, 71.5, 72 },
        { Refuse, 9, Fallback },
        { Clamp, 9, 10 },
        { Clamp, 101, 100 },
        { Refuse, "1e300", Fallback },
        { Clamp, qint64(1) << 62, 100 },
        { Refuse, quint64(1) << 63, Fallback },
        { Clamp, Nan, Fallback },
        { Clamp, QByteArray("70"), Fallback },
        { Long, -2147483648.0, LongMin },
        { Long, 2147483648.0, Fallback },
    };
    for (const auto &c : cases) {
        SCOPED_TRACE(QStringLiteral("reader %1, %2").arg(c.reader).arg(c.stored.toString()).toStdString());
        EXPECT_EQ(read(c.reader, bagWith("P", c.stored)), c.value);
    }
    for (const Reader reader : { Colour, Boolean, Clamp, Refuse, Long })
        EXPECT_EQ(read(reader, PropertyBag()), Fallback) << "an absent name, reader " << reader;
}

// Every persisted colour and number of every control, in a form or beyond a range its
// setter keeps: the control reads it through the readers.
TEST(PropertyReaders, everyControlReadsItsColoursAndNumbersThroughThem)
{
    const struct
    {
        const char *control, *name, *property;
        QVariant stored;
        qint64 value;
    } cases[] = {
        { "cNIF", "BackColor", "BackColor", "&H00FF00&", 0x00FF00 },
        { "skNumber", "Background", "Background", "&H00FF00&", 0x00FF00 },
        { "skSubMenu", "TransparentBack", "TransparencyColor", "&H00FF00&", 0x00FF00 },
        { "skGrowth", "CaptionColor", "CaptionColor", "&H00FF00&", 0x00FF00 },
        { "ucAniGIF", "Delay", "MinFrameDelay", 40000, 32700 },
        { "ucAniGIF", "Stretch", "Stretch", 9.3e18, 1 },
        { "ucAniGIF", "DelayLoad", "DelayAnimation", -1, 1 },
        { "ucAniGIF", "Mirror", "Mirrored", 5, 0 },
        { "ucAniGIF", "MousePointer", "MousePointer", 1e300, 0 },
        { "ucAniGIF", "Loops", "Loops", -2147483648.0, 2147483647 },
        { "skSubMenu", "Margin", "Margin", 1e300, 251658225 },
        { "skQuadro", "DebugDesignImgID", "DebugDesign", -1e300, 0 },
        { "InfoButton", "ibutton.bstyle", "Style", 3, 0 },
        { "InfoButton", "ibutton.style", "ToolTipStyle", 2, 1 },
        { "cNIF", "Countries", "Countries", 4294967296.0, 0 },
    };
    for (const auto &c : cases) {
        SCOPED_TRACE(std::string(c.control) + "." + c.name);
        std::unique_ptr<QObject> object(CreateObject(QString::fromLatin1(c.control)));
        auto *control = qobject_cast<UserControl *>(object.get());
        ASSERT_NE(control, nullptr);
        control->Load(bagWith(QString::fromLatin1(c.name), c.stored));
        EXPECT_EQ(control->property(c.property).toLongLong(), c.value);
    }
}

#include "SymbolFonts.h"

#include <QFontDatabase>
#include <QGuiApplication>

#include <array>

namespace zelctl::platform::symbolFonts {

namespace {

const QString Wingdings = QStringLiteral("Wingdings");

// The Unicode symbol of each Wingdings code point from 0x20 to 0xFF, 0 where the font draws
// nothing.
constexpr std::array<char32_t, 0xE0> WingdingsTable = {
    // 0x20: space, pencil, scissors, envelopes and mail boxes
    0x0020,
    0x1F589,
    0x2702,
    0x2701,
    0x1F453,
    0x1F56D,
    0x1F56E,
    0x1F56F,
    0x1F57F,
    0x2706,
    0x1F582,
    0x1F583,
    0x1F4EA,
    0x1F4EB,
    0x1F4EC,
    0x1F4ED,
    // 0x30: folders, documents, hourglass, computer parts, writing hand
    0x1F5C0,
    0x1F5C1,
    0x1F5CE,
    0x1F5CF,
    0x1F5D0,
    0x1F5C4,
    0x231B,
    0x1F5AE,
    0x1F5B0,
    0x1F5B2,
    0x1F5B3,
    0x1F5B4,
    0x1F5AB,
    0x1F5AC,
    0x2707,
    0x270D,
    // 0x40: hands, faces, bomb, skull, flags
    0x1F58E,
    0x270C,
    0x1F44C,
    0x1F44D,
    0x1F44E,
    0x261C,
    0x261E,
    0x261D,
    0x261F,
    0x1F590,
    0x263A,
    0x1F610,
    0x2639,
    0x1F4A3,
    0x2620,
    0x1F3F3,
    // 0x50: pennant, plane, sun, droplet, snowflake, crosses and religious signs, zodiac
    0x1F3F1,
    0x2708,
    0x263C,
    0x1F4A7,
    0x2744,
    0x1F546,
    0x271E,
    0x1F548,
    0x2720,
    0x2721,
    0x262A,
    0x262F,
    0x0950,
    0x2638,
    0x2648,
    0x2649,
    // 0x60: zodiac, ampersand ornaments, circles and squares
    0x264A,
    0x264B,
    0x264C,
    0x264D,
    0x264E,
    0x264F,
    0x2650,
    0x2651,
    0x2652,
    0x2653,
    0x1F670,
    0x1F675,
    0x25CF,
    0x1F53E,
    0x25A0,
    0x25A1,
    // 0x70: squares, lozenges, diamonds, keys, rosettes, quotation ornaments
    0x1F790,
    0x2751,
    0x2752,
    0x29EB,
    0x29EB,
    0x25C6,
    0x2756,
    0x25C6,
    0x2327,
    0x2BB9,
    0x2318,
    0x1F3F5,
    0x1F3F6,
    0x1F676,
    0x1F677,
    0,
    // 0x80: circled digits
    0x24EA,
    0x2460,
    0x2461,
    0x2462,
    0x2463,
    0x2464,
    0x2465,
    0x2466,
    0x2467,
    0x2468,
    0x2469,
    0x24FF,
    0x2776,
    0x2777,
    0x2778,
    0x2779,
    // 0x90: circled digits, leaf ornaments, dots
    0x277A,
    0x277B,
    0x277C,
    0x277D,
    0x277E,
    0x277F,
    0x1F662,
    0x1F660,
    0x1F661,
    0x1F663,
    0x1F65E,
    0x1F65C,
    0x1F65D,
    0x1F65F,
    0x00B7,
    0x2022,
    // 0xA0: squares, circles, stars
    0x25AA,
    0x26AA,
    0x1F786,
    0x1F788,
    0x25C9,
    0x25CE,
    0x1F53F,
    0x25AA,
    0x25FB,
    0x1F7C2,
    0x2726,
    0x2605,
    0x2736,
    0x2734,
    0x2739,
    0x2735,
    // 0xB0: targets, stars, clock faces
    0x2BD0,
    0x2316,
    0x27E1,
    0x2311,
    0x2BD1,
    0x272A,
    0x2730,
    0x1F550,
    0x1F551,
    0x1F552,
    0x1F553,
    0x1F554,
    0x1F555,
    0x1F556,
    0x1F557,
    0x1F558,
    // 0xC0: clock faces, ribbon arrows, leaf ornaments
    0x1F559,
    0x1F55A,
    0x1F55B,
    0x21B2,
    0x21B3,
    0x21B0,
    0x21B1,
    0x21B0,
    0x21B1,
    0x21B2,
    0x21B3,
    0x1F66A,
    0x1F66B,
    0x1F655,
    0x1F654,
    0x1F657,
    // 0xD0: leaf ornaments, erase keys, arrowheads, heavy arrow left
    0x1F656,
    0x1F650,
    0x1F651,
    0x1F652,
    0x1F653,
    0x232B,
    0x2326,
    0x25C0,
    0x25B6,
    0x25B2,
    0x25BC,
    0x25C0,
    0x25B6,
    0x25B2,
    0x25BC,
    0x2B05,
    // 0xE0: heavy arrows right, up, down, diagonal; very heavy arrows ("ç" left, "è" right ...); white arrow left
    0x27A1,
    0x2B06,
    0x2B07,
    0x2B09,
    0x2B08,
    0x2B0B,
    0x2B0A,
    0x2B05,
    0x27A1,
    0x2B06,
    0x2B07,
    0x2B09,
    0x2B08,
    0x2B0B,
    0x2B0A,
    0x21E6,
    // 0xF0: white arrows, boxes, check marks
    0x21E8,
    0x21E7,
    0x21E9,
    0x2B04,
    0x21F3,
    0x2B01,
    0x2B00,
    0x2B03,
    0x2B02,
    0x25AD,
    0x25AB,
    0x2717,
    0x2713,
    0x2612,
    0x2611,
    0x229E,
};

bool installed(const QString &family)
{
    // The font database needs the application's font system.
    return qobject_cast<QGuiApplication *>(QCoreApplication::instance()) && QFontDatabase::hasFamily(family);
}

} // namespace

bool mapsText(const QFont &font)
{
    return font.family().compare(Wingdings, Qt::CaseInsensitive) == 0 && !installed(Wingdings);
}

QString shownText(const QFont &font, const QString &text)
{
    return mapsText(font) ? fromWingdings(text) : text;
}

QString fromWingdings(const QString &text)
{
    QString shown;
    shown.reserve(text.size());
    for (const QChar c : text) {
        const char16_t code = c.unicode();
        const char32_t symbol = code >= 0x20 && code <= 0xFF ? WingdingsTable[code - 0x20] : 0;
        if (symbol == 0)
            shown.append(c);
        else
            shown.append(QString::fromUcs4(&symbol, 1));
    }
    return shown;
}

} // namespace zelctl::platform::symbolFonts

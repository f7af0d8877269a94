#include "platform/SymbolFonts.h"

#include <gtest/gtest.h>

using namespace zelctl::platform;

TEST(SymbolFonts, wingdingsCodePointsBecomeTheSymbolsTheyStandFor)
{
    struct Row
    {
        char16_t code;
        char32_t symbol;
    };
    // One from each part of the table, so a row that slipped shows.
    const Row rows[] = {
        { 0x22, 0x2702 }, // scissors
        { 0x41, 0x270C }, // victory hand
        { 0x6C, 0x25CF }, // black circle
        { 0x81, 0x2460 }, // circled one
        { 0x9F, 0x2022 }, // bullet
        { 0xAB, 0x2605 }, // black star
        { 0xD5, 0x232B }, // erase to the left
        { 0xE7, 0x2B05 }, // "ç": the heavy arrow left
        { 0xE8, 0x27A1 }, // "è": the heavy arrow right
        { 0xF0, 0x21E8 }, // white arrow right
        { 0xFC, 0x2713 }, // check mark
        { 0xFE, 0x2611 }, // ballot box with check
        { 0xFF, 0x229E }, // squared plus
    };
    for (const Row &row : rows)
        EXPECT_EQ(symbolFonts::fromWingdings(QString(QChar(row.code))), QString::fromUcs4(&row.symbol, 1))
            << std::hex << int(row.code);
    EXPECT_EQ(symbolFonts::fromWingdings(QStringLiteral("\x7F€")), QStringLiteral("\x7F€")) << "outside: kept";
    EXPECT_EQ(symbolFonts::fromWingdings(QStringLiteral(" è")), QStringLiteral(" \u27A1"));
}

TEST(SymbolFonts, onlyTextInAMissingSymbolFontIsMapped)
{
    EXPECT_TRUE(symbolFonts::mapsText(QFont(QStringLiteral("Wingdings"))));
    EXPECT_TRUE(symbolFonts::mapsText(QFont(QStringLiteral("wingdings"))));
    EXPECT_FALSE(symbolFonts::mapsText(QFont(QStringLiteral("DejaVu Sans"))));
    EXPECT_EQ(symbolFonts::shownText(QFont(QStringLiteral("Arial")), QStringLiteral("è")), QStringLiteral("è"));
    EXPECT_EQ(
        symbolFonts::shownText(QFont(QStringLiteral("Wingdings")), QStringLiteral("è")), QStringLiteral("\u27A1"));
}

#include "platform/SymbolFonts.h"

#include <gtest/gtest.h>

using namespace zelctl::platform;

TEST(SymbolFonts, onlyTextInAMissingSymbolFontBecomesTheSymbolsItStandsFor)
{
    // The ends of the table and of a run, so a row that slipped shows.
    const std::pair<char16_t, char32_t> rows[] = {
        { 0x22, 0x2702 }, // scissors
        { 0xFF, 0x229E }, // squared plus
    };
    for (const auto &[code, symbol] : rows)
        EXPECT_EQ(symbolFonts::fromWingdings(QString(QChar(code))), QString::fromUcs4(&symbol, 1))
            << std::hex << int(code);
    EXPECT_EQ(symbolFonts::fromWingdings(QStringLiteral("\x7F€ è")), QStringLiteral("\x7F€ \u27A1")) << "outside: kept";

    EXPECT_EQ(symbolFonts::shownText(QFont(QStringLiteral("Arial")), QStringLiteral("è")), QStringLiteral("è"));
    EXPECT_EQ(
        symbolFonts::shownText(QFont(QStringLiteral("Wingdings")), QStringLiteral("è")), QStringLiteral("\u27A1"));
}

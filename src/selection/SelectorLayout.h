#pragma once

#include "zelctl_export.h"

#include <QList>
#include <QRect>

// The arrangement of the selection dialog: the title lines on top, a grid of item buttons
// filling the free area, OK and Cancel at the bottom right. All lengths are twips.
namespace zelctl::selectorLayout {

inline constexpr int Gap = 60;
inline constexpr int BottomReserve = 120;
inline constexpr int MinimumGridWidth = 2500;
inline constexpr int MinimumButtonHeight = 375;
inline constexpr int MinimumButtonWidth = MinimumGridWidth / 2;

// What the arrangement depends on.
struct Metrics
{
    int innerWidth = 0;
    int innerHeight = 0;
    int okWidth = 0;
    int okHeight = 0;
    bool titleVisible = false;
    int titleHeight = 0;
    bool subtitleVisible = false;
    int subtitleHeight = 0;
    int itemCount = 0;
};

struct Layout
{
    QRect title;
    QRect subtitle;
    QRect ok;
    QRect cancel;
    // The grid area; the items are placed only when it is at least MinimumGridWidth wide
    // and MinimumButtonHeight high.
    QRect grid;
    bool itemsPlaced = false;
    int columns = 0;
    int rows = 0;
    int buttonWidth = 0;
    int buttonHeight = 0;
    // One rectangle per item, row by row, left to right; empty unless itemsPlaced.
    QList<QRect> items;
};

// Columns are added until the rows (whole ones, so every item gets a place) leave each
// button at least MinimumButtonHeight, or until all items share one row. Buttons are never
// narrower than MinimumButtonWidth, even when the grid is.
ZELCTL_EXPORT Layout arrange(const Metrics &metrics);

} // namespace zelctl::selectorLayout

#pragma once

#include "zelctl_export.h"

#include <QList>
#include <QRect>

// The arrangement of the selection dialog: the title lines and, for long lists, a filter box
// on top, a grid of item buttons filling the free area (scrolled when the items do not fit),
// OK and Cancel at the bottom right. All lengths are twips.
namespace zelctl::selectorLayout {

inline constexpr int Gap = 60;
inline constexpr int BottomReserve = 120;
inline constexpr int MinimumGridWidth = 2500;
inline constexpr int MinimumButtonHeight = 375;
inline constexpr int MinimumButtonWidth = MinimumGridWidth / 2;
inline constexpr int FilterHeight = MinimumButtonHeight;

// What the arrangement depends on.
struct Metrics
{
    int innerWidth = 0;
    int innerHeight = 0;
    int okWidth = 0;
    int okHeight = 0;
    bool cancelVisible = true;
    bool titleVisible = false;
    int titleHeight = 0;
    bool subtitleVisible = false;
    int subtitleHeight = 0;
    bool filterVisible = false;
    // The items shown (those the filter lets through).
    int itemCount = 0;
    // Width that shows most captions whole, and the width a vertical scroll bar takes.
    int captionWidth = 0;
    int scrollBarWidth = 0;
};

struct Layout
{
    QRect title;
    QRect subtitle;
    QRect filter;
    QRect ok;
    // Where Cancel goes; OK takes its place when Cancel is hidden.
    QRect cancel;
    // The grid area; the items are placed only when it is at least MinimumGridWidth wide
    // and MinimumButtonHeight high.
    QRect grid;
    bool itemsPlaced = false;
    // The items need more room than the grid has: they lie on a taller area of `content`
    // size that scrolls vertically inside the grid.
    bool scrolls = false;
    QSize content;
    int columns = 0;
    int rows = 0;
    int buttonWidth = 0;
    int buttonHeight = 0;
    // One rectangle per item in the form's coordinates (of the scrolled area's top when
    // scrolled to its start), row by row, left to right; empty unless itemsPlaced.
    QList<QRect> items;
};

// Columns are added until the rows (whole ones, so every item gets a place) leave each
// button at least MinimumButtonHeight. When that takes more columns than buttons of
// MinimumButtonWidth fit side by side, the buttons keep the smallest height, are as wide as
// captionWidth asks (within the grid) and scroll. The columns and the gaps between them
// always fit the grid's width.
ZELCTL_EXPORT Layout arrange(const Metrics &metrics);

} // namespace zelctl::selectorLayout

#include "SelectorLayout.h"

#include <algorithm>
#include <cmath>

namespace zelctl::selectorLayout {

namespace {

// Nearest whole number, halves to the even one.
int roundHalfEven(double value)
{
    return static_cast<int>(std::nearbyint(value));
}

// How many buttons at least `width` wide fit side by side, with the gaps between them.
int columnsFitting(int gridWidth, int width)
{
    return std::max(1, (gridWidth + Gap) / (std::max(width, MinimumButtonWidth) + Gap));
}

// Width of each of `columns` buttons filling the grid with the gaps between them.
int columnWidth(int gridWidth, int columns)
{
    return (gridWidth - Gap * (columns - 1)) / columns;
}

} // namespace

Layout arrange(const Metrics &m)
{
    Layout layout;
    layout.title = QRect(0, 0, m.innerWidth, m.titleHeight);
    layout.cancel = QRect(m.innerWidth - m.okWidth, m.innerHeight - m.okHeight, m.okWidth, m.okHeight);
    layout.ok = m.cancelVisible ? layout.cancel.translated(-m.okWidth, 0) : layout.cancel;

    int y0 = m.titleVisible ? m.titleHeight + Gap : Gap;
    layout.subtitle = QRect(0, y0, m.innerWidth, m.subtitleHeight);
    if (m.subtitleVisible)
        y0 += m.subtitleHeight;
    const int width = m.innerWidth - 2 * Gap;
    if (m.filterVisible) {
        layout.filter = QRect(Gap, y0, width, FilterHeight);
        y0 += FilterHeight + Gap;
    }

    const int height = m.innerHeight - m.okHeight - BottomReserve - y0;
    layout.grid = QRect(Gap, y0, width, height);
    layout.content = layout.grid.size();
    if (width < MinimumGridWidth || height < MinimumButtonHeight || m.itemCount < 1)
        return layout;

    const int count = m.itemCount;
    int columns = 1;
    int rows = count;
    while (rows > 1 && (height - Gap * rows) / rows < MinimumButtonHeight) {
        ++columns;
        rows = (count + columns - 1) / columns;
    }
    if (columns <= columnsFitting(width, MinimumButtonWidth)) {
        layout.buttonWidth = columnWidth(width, columns);
        layout.buttonHeight = roundHalfEven(double(height - Gap - Gap * rows) / rows);
    } else {
        const int room = std::max(width - m.scrollBarWidth, MinimumButtonWidth);
        columns = columnsFitting(room, std::min(m.captionWidth, room));
        rows = (count + columns - 1) / columns;
        layout.scrolls = true;
        layout.buttonWidth = std::max(columnWidth(room, columns), MinimumButtonWidth);
        layout.buttonHeight = MinimumButtonHeight;
        layout.content = QSize(width, rows * (MinimumButtonHeight + Gap) - Gap);
    }
    layout.columns = columns;
    layout.rows = rows;

    for (int i = 0; i < count; ++i) {
        const int row = i / columns;
        const int column = i % columns;
        layout.items.append(QRect((layout.buttonWidth + Gap) * column + Gap, (layout.buttonHeight + Gap) * row + y0,
            layout.buttonWidth, layout.buttonHeight));
    }
    layout.itemsPlaced = true;
    return layout;
}

} // namespace zelctl::selectorLayout

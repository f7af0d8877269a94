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

} // namespace

Layout arrange(const Metrics &m)
{
    Layout layout;
    layout.title = QRect(0, 0, m.innerWidth, m.titleHeight);
    layout.ok = QRect(m.innerWidth - 2 * m.okWidth, m.innerHeight - m.okHeight, m.okWidth, m.okHeight);
    layout.cancel = QRect(layout.ok.left() + m.okWidth, layout.ok.top(), m.okWidth, m.okHeight);

    int y0 = m.titleVisible ? m.titleHeight + Gap : Gap;
    layout.subtitle = QRect(0, y0, m.innerWidth, m.subtitleHeight);
    if (m.subtitleVisible)
        y0 += m.subtitleHeight;

    const int width = m.innerWidth - 2 * Gap;
    const int height = m.innerHeight - m.okHeight - BottomReserve - y0;
    layout.grid = QRect(Gap, y0, width, height);
    if (width < MinimumGridWidth || height < MinimumButtonHeight || m.itemCount < 1)
        return layout;

    const int count = m.itemCount;
    int columns = 1;
    int rows = count;
    while (rows > 1 && (height - Gap * rows) / rows < MinimumButtonHeight) {
        ++columns;
        rows = (count + columns - 1) / columns;
    }
    layout.columns = columns;
    layout.rows = rows;
    layout.buttonWidth = std::max(roundHalfEven(double(width) / columns), MinimumButtonWidth);
    layout.buttonHeight = roundHalfEven(double(height - Gap - Gap * rows) / rows);

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

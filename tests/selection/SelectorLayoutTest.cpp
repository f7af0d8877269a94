#include "selection/SelectorLayout.h"

#include <gtest/gtest.h>

using namespace zelctl::selectorLayout;

namespace {

// A form whose grid area is `width` x `height` twips, with OK 1215 x 375 and no title lines.
Metrics gridOf(int width, int height, int items)
{
    Metrics m;
    m.okWidth = 1215;
    m.okHeight = 375;
    m.innerWidth = width + 2 * Gap;
    m.innerHeight = height + Gap + m.okHeight + BottomReserve;
    m.itemCount = items;
    m.scrollBarWidth = 240;
    return m;
}

} // namespace

TEST(SelectorLayout, columnsShareTheGridWithTheGapsBetweenThem)
{
    const Layout layout = arrange(gridOf(5880, 3000, 9));
    // Nine items need two columns; with whole rows the ninth gets a fifth row.
    EXPECT_FALSE(layout.scrolls);
    EXPECT_EQ(layout.columns, 2);
    EXPECT_EQ(layout.rows, 5);
    ASSERT_EQ(layout.items.size(), 9);
    EXPECT_EQ(layout.items[0], QRect(60, 60, 2910, 528));
    EXPECT_EQ(layout.items[1].left(), 2910 + 60 + 60);
    EXPECT_EQ(layout.items[1].right() + 1, 60 + 5880);
    EXPECT_EQ(layout.items[8].topLeft(), QPoint(60, 60 + 4 * (528 + 60)));
}

// Below 2500 x 375 twips the grid leaves the items where they are.
TEST(SelectorLayout, wholeColumnsWithinTheGridWhateverTheCountAndSize)
{
    for (const int width : { 2499, 2500, 3000, 5880, 7380, 11000 })
        for (const int height : { 374, 375, 1000, 4845 })
            for (int count = 1; count <= 260; count += 7) {
                Metrics m = gridOf(width, height, count);
                m.captionWidth = 1800;
                const Layout l = arrange(m);
                ASSERT_EQ(l.itemsPlaced, width >= 2500 && height >= 375) << width << "x" << height;
                if (!l.itemsPlaced)
                    continue;
                const int right = 60 + width - (l.scrolls ? m.scrollBarWidth : 0);
                for (const QRect &item : l.items)
                    ASSERT_LE(item.right() + 1, right) << width << "x" << height << ", " << count << " items";
                EXPECT_GE(l.buttonWidth, MinimumButtonWidth);
            }
}

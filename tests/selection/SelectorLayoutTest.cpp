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
    return m;
}

} // namespace

TEST(SelectorLayout, fourItemsFillOneColumnAboveOkAndCancel)
{
    const Metrics m = gridOf(5880, 3000, 4);
    const Layout layout = arrange(m);
    ASSERT_TRUE(layout.itemsPlaced);
    EXPECT_EQ(layout.columns, 1);
    EXPECT_EQ(layout.rows, 4);
    ASSERT_EQ(layout.items.size(), 4);
    EXPECT_EQ(layout.items[0], QRect(60, 60, 5880, 675));
    EXPECT_EQ(layout.items[3], QRect(60, 60 + 3 * 735, 5880, 675));
    EXPECT_EQ(layout.ok, QRect(m.innerWidth - 2 * 1215, m.innerHeight - 375, 1215, 375));
    EXPECT_EQ(layout.cancel, layout.ok.translated(1215, 0));
}

TEST(SelectorLayout, manyItemsTakeWholeRowsOverSeveralColumns)
{
    // Nine items need two columns; with whole rows the ninth gets a fifth row.
    const Layout layout = arrange(gridOf(5880, 3000, 9));
    EXPECT_EQ(layout.columns, 2);
    EXPECT_EQ(layout.rows, 5);
    EXPECT_EQ(layout.buttonWidth, 2940);
    ASSERT_EQ(layout.items.size(), 9);
    EXPECT_EQ(layout.items[1].left(), 2940 + 60 + 60);
    EXPECT_EQ(layout.items[8].topLeft(), QPoint(60, 60 + 4 * (528 + 60)));
}

TEST(SelectorLayout, narrowAndLowGrids)
{
    const Layout narrow = arrange(gridOf(3000, 1000, 6));
    EXPECT_EQ(narrow.columns, 3);
    EXPECT_EQ(narrow.rows, 2);
    EXPECT_EQ(narrow.buttonWidth, MinimumButtonWidth);

    const Layout low = arrange(gridOf(9000, 400, 5));
    EXPECT_EQ(low.columns, 5);
    EXPECT_EQ(low.rows, 1);

    EXPECT_FALSE(arrange(gridOf(2499, 3000, 3)).itemsPlaced);
    EXPECT_FALSE(arrange(gridOf(5880, 374, 3)).itemsPlaced);
    EXPECT_TRUE(arrange(gridOf(2500, 375, 3)).itemsPlaced);
}

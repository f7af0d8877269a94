#include "selection/SelectorLayout.h"

#include <gtest/gtest.h>

#include <algorithm>

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

TEST(SelectorLayout, fourItemsFitInOneColumn)
{
    const Layout layout = arrange(gridOf(5880, 3000, 4));
    ASSERT_TRUE(layout.itemsPlaced);
    EXPECT_EQ(layout.columns, 1);
    EXPECT_EQ(layout.rows, 4);
    EXPECT_EQ(layout.buttonWidth, 5880);
    EXPECT_EQ(layout.buttonHeight, 675);
    ASSERT_EQ(layout.items.size(), 4);
    EXPECT_EQ(layout.items[0], QRect(60, 60, 5880, 675));
    EXPECT_EQ(layout.items[3], QRect(60, 60 + 3 * 735, 5880, 675));
}

TEST(SelectorLayout, okAndCancelSitSideBySideOnTheBottomRight)
{
    const Metrics m = gridOf(5880, 3000, 4);
    const Layout layout = arrange(m);
    EXPECT_EQ(layout.ok, QRect(m.innerWidth - 2 * 1215, m.innerHeight - 375, 1215, 375));
    EXPECT_EQ(layout.cancel.left(), layout.ok.left() + 1215);
    EXPECT_EQ(layout.cancel.top(), layout.ok.top());
    EXPECT_EQ(layout.cancel.left() + layout.cancel.width(), m.innerWidth);
}

TEST(SelectorLayout, titleLinesPushTheGridDown)
{
    Metrics m = gridOf(5880, 3000, 1);
    m.titleVisible = true;
    m.titleHeight = 450;
    m.subtitleHeight = 300;
    EXPECT_EQ(arrange(m).items.at(0).top(), 450 + 60);
    m.subtitleVisible = true;
    EXPECT_EQ(arrange(m).subtitle.top(), 510);
    EXPECT_EQ(arrange(m).items.at(0).top(), 450 + 60 + 300);
    m.titleVisible = false;
    EXPECT_EQ(arrange(m).items.at(0).top(), 60 + 300);
}

TEST(SelectorLayout, gridsTooSmallLeaveTheItemsAlone)
{
    EXPECT_FALSE(arrange(gridOf(2499, 3000, 3)).itemsPlaced);
    EXPECT_FALSE(arrange(gridOf(5880, 374, 3)).itemsPlaced);
    EXPECT_TRUE(arrange(gridOf(2500, 375, 3)).itemsPlaced);
}

TEST(SelectorLayout, manyItemsTakeWholeRowsOverSeveralColumns)
{
    // Nine items need two columns; with whole rows the ninth gets a fifth row.
    const Layout layout = arrange(gridOf(5880, 3000, 9));
    EXPECT_EQ(layout.columns, 2);
    EXPECT_EQ(layout.rows, 5);
    EXPECT_EQ(layout.buttonWidth, 2940);
    EXPECT_EQ(layout.buttonHeight, (3000 - 60 - 300) / 5);
    ASSERT_EQ(layout.items.size(), 9);
    EXPECT_EQ(layout.items[1].left(), 2940 + 60 + 60);
    EXPECT_EQ(layout.items[8].topLeft(), QPoint(60, 60 + 4 * (528 + 60)));
    for (int i = 0; i < layout.items.size(); ++i) {
        for (int j = i + 1; j < layout.items.size(); ++j)
            EXPECT_FALSE(layout.items[i].intersects(layout.items[j])) << i << " and " << j;
    }
}

TEST(SelectorLayout, narrowColumnsKeepTheMinimumWidth)
{
    const Layout layout = arrange(gridOf(3000, 1000, 6));
    EXPECT_EQ(layout.columns, 3);
    EXPECT_EQ(layout.rows, 2);
    EXPECT_EQ(layout.buttonWidth, MinimumButtonWidth);
}

TEST(SelectorLayout, aLowGridPutsEveryItemInOneRowAndEnds)
{
    const Layout layout = arrange(gridOf(9000, 400, 5));
    EXPECT_EQ(layout.columns, 5);
    EXPECT_EQ(layout.rows, 1);
    EXPECT_EQ(layout.items.size(), 5);
}

TEST(SelectorLayout, widthsRoundHalvesToEven)
{
    EXPECT_EQ(arrange(gridOf(5001, 500, 2)).buttonWidth, 2500);
    EXPECT_EQ(arrange(gridOf(5003, 500, 2)).buttonWidth, 2502);
}

#include "SkinTestSupport.h"

#include "skins/skQuadro.h"

#include <QLabel>

using namespace zelctl;
using zelctl::test::pixel;

namespace {

// How the frame looks with the real pictures (corners, edges, the stretched middle) is in the
// golden pictures.
class Frame : public zelctl::test::SkinForm
{
protected:
    skQuadro *frame = new skQuadro(&form);

    void SetUp() override
    {
        frame->InitNew();
        // 300 twips high; top and bottom pictures of 90 and 60 twips, one transparent pixel round the top.
        frame->setGeometry(10, 10, 30, 20);
        frame->setImageFile(0, pictures.write("top.png", QSize(8, 6), QColor(255, 0, 0), 1));
        frame->setImageFile(1, pictures.write("middle.png", QSize(8, 2), QColor(0, 255, 0)));
        frame->setImageFile(2, pictures.write("bottom.png", QSize(8, 4), QColor(0, 0, 0)));
        showForm();
        frame->Redraw();
    }
};

} // namespace

TEST_F(Frame, blackAndTransparentPixelsLetTheContainerThrough)
{
    EXPECT_EQ(pixel(*frame, 15, 10), 0x00FF00u) << "the stretched middle";
    EXPECT_FALSE(frame->mask().contains(QPoint(0, 0))) << "transparent corner of the top";
    EXPECT_TRUE(frame->mask().contains(QPoint(15, 3)));
    EXPECT_FALSE(frame->mask().contains(QPoint(15, 18))) << "black bottom, TransparencyColor 0";
    frame->setTransparencyColor(0x00FF00);
    frame->Redraw();
    EXPECT_TRUE(frame->mask().contains(QPoint(15, 18)));
    EXPECT_FALSE(frame->mask().contains(QPoint(15, 10)));
}

TEST_F(Frame, persistsBothValuesAlwaysAndHoldsItsContentsInBold)
{
    EXPECT_EQ(frame->Save().names(), (QStringList { "TransparentBack", "DebugDesignImgID" }));
    EXPECT_EQ(QLabel(frame).font(), QFont(QStringLiteral("Arial"), 11, QFont::Bold));
}

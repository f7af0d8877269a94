#include "SkinTestSupport.h"

#include "skins/skGrowth.h"
#include "skins/skQuadro.h"
#include "skins/skinCommon.h"

#include <QLabel>

using namespace zelctl;
using zelctl::test::pixel;

namespace {

// How the frame and the panel look with the real pictures (corners, edges, the stretched
// middle) is in the golden pictures.
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

TEST_F(Frame, blackAndTransparentPixelsLetTheContainerThroughAndAMissingSliceChangesNothing)
{
    EXPECT_EQ(pixel(*frame, 15, 10), 0x00FF00u) << "the stretched middle";
    EXPECT_FALSE(frame->mask().contains(QPoint(0, 0))) << "transparent corner of the top";
    EXPECT_TRUE(frame->mask().contains(QPoint(15, 3)));
    EXPECT_FALSE(frame->mask().contains(QPoint(15, 18))) << "black bottom, TransparencyColor 0";
    frame->setTransparencyColor(0x00FF00);
    frame->Redraw();
    EXPECT_TRUE(frame->mask().contains(QPoint(15, 18)));
    EXPECT_FALSE(frame->mask().contains(QPoint(15, 10)));

    const QImage before = frame->surface().image();
    frame->setImageFile(1, pictures.path("missing.gif"));
    EXPECT_EQ(frame->ImageFile(1), pictures.path("missing.gif"));
    frame->setTransparencyColor(0xFF0000);
    frame->Redraw();
    EXPECT_EQ(frame->surface().image(), before);
}

TEST_F(Frame, raisesPointerEventsButTracksNoHover)
{
    QStringList events;
    QObject::connect(frame, &skQuadro::MouseMove, [&](qint16 &, qint16 &, float &, float &) { events << "move"; });
    QObject::connect(frame, &skQuadro::MouseDown, [&](qint16 &button, qint16 &shift, float &x, float &y) {
        events << QStringLiteral("down %1 %2 %3 %4").arg(button).arg(shift).arg(x).arg(y);
    });
    QObject::connect(frame, &skQuadro::MouseIn, [&] { events << "in"; });
    QTest::mouseMove(frame, QPoint(6, 8));
    QTest::mouseClick(frame, Qt::RightButton, Qt::ShiftModifier, QPoint(5, 6));
    EXPECT_EQ(events, (QStringList { "move", "down 2 1 75 90" })) << "right button, shift, position in twips";
    EXPECT_EQ(platform::capturedWidget(), nullptr);
}

// Design mode previews the pictures of DebugDesignImgID, which an absent value leaves as it is.
TEST_F(Frame, persistsBothValuesAlwaysAndPreviewsInDesignModeOnly)
{
    EXPECT_EQ(frame->Save().names(), (QStringList { "TransparentBack", "DebugDesignImgID" }));
    EXPECT_EQ(QLabel(frame).font(), QFont(QStringLiteral("Arial"), 11, QFont::Bold)) << "what it holds is in bold";
    Ambient designer;
    designer.UserMode = false;
    skQuadro preview(&form);
    preview.setAmbient(designer);
    preview.resize(60, 60);
    preview.setDebugDesign(3);
    preview.Load(PropertyBag());
    EXPECT_EQ(preview.DebugDesign(), 3);
    EXPECT_EQ(preview.ImageFile(0), skinCommon::previewFolder() + "quadro_2_top.gif");
    PropertyBag none;
    none.WriteProperty("DebugDesignImgID", 0);
    preview.Load(none);
    EXPECT_EQ(pixel(preview, 30, 5), platform::rgb(232, 119, 34)) << "the orange band of topo_laranja.gif";
    skQuadro running(&form);
    running.InitNew();
    EXPECT_EQ(running.ImageFile(0), QString());
}

TEST(Panel, withoutSkinOrPicturesTakesTheDefaultSetSkipsAnUnreadableSliceAndPersistsItsCaption)
{
    skGrowth panel;
    EXPECT_EQ(panel.Save().names(), QStringList { "CaptionColor" });
    panel.resize(120, 80);
    panel.Repaint();
    // A slice that cannot be read is skipped; the others still draw.
    panel.setSkinID(QStringLiteral("outra"));
    panel.setImageSource(2, QStringLiteral("/nenhum/ficheiro.gif"));
    EXPECT_EQ(panel.setImageSource(6, QString()), skinCommon::ErrSubscriptOutOfRange);
    panel.resize(150, 80);
    EXPECT_EQ(pixel(panel, 60, 40), platform::rgb(252, 236, 238));
    panel.setCaption(QStringLiteral("Rendimentos do trabalho"));
    EXPECT_EQ(panel.findChild<QLabel *>(QStringLiteral("lblCaption"))->text(), panel.Caption());
    skGrowth loaded;
    loaded.Load(panel.Save());
    EXPECT_EQ(loaded.Caption(), panel.Caption());
}

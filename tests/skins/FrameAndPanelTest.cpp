#include "SkinTestSupport.h"

#include "common/modFuncs.h"
#include "platform/Settings.h"
#include "skins/skGrowth.h"
#include "skins/skQuadro.h"
#include "skins/skinCommon.h"

#include <QLabel>
#include <QSignalSpy>

using namespace zelctl;
using zelctl::test::pixel;

namespace {

constexpr platform::OleColor Red = 0x0000FF;
constexpr platform::OleColor Green = 0x00FF00;
constexpr platform::OleColor Blue = 0xFF0000;

class Frame : public zelctl::test::SkinForm
{
protected:
    zelctl::test::PictureFolder pictures;
    skQuadro *frame = new skQuadro(&form);

    void SetUp() override
    {
        frame->InitNew();
        // 300 twips high; top and bottom pictures of 90 and 60 twips.
        frame->setGeometry(10, 10, 30, 20);
        frame->setImageFile(0, pictures.write("top.png", QSize(8, 6), QColor(255, 0, 0)));
        frame->setImageFile(1, pictures.write("middle.png", QSize(8, 2), QColor(0, 255, 0)));
        frame->setImageFile(2, pictures.write("bottom.png", QSize(8, 4), QColor(0, 0, 255)));
        showForm();
    }
};

class Panel : public zelctl::test::SkinForm
{
protected:
    zelctl::test::PictureFolder pictures;
    skGrowth *panel = new skGrowth(&form);

    void SetUp() override { showForm(); }
};

} // namespace

TEST_F(Frame, stretchesTheMiddleSliceBetweenTopAndBottom)
{
    frame->Redraw();
    // 150 twips of middle between them.
    zelctl::test::expectPixels(*frame,
        { { 15, 0, Red }, { 15, 5, Red }, { 15, 6, Green }, { 29, 15, Green }, { 15, 16, Blue }, { 15, 19, Blue } });
    EXPECT_FALSE(frame->mask().isEmpty());
    EXPECT_TRUE(frame->mask().contains(QPoint(0, 0)));
}

TEST_F(Frame, blackAndTransparentPixelsLetTheContainerThrough)
{
    frame->setImageFile(0, pictures.write("top-round.png", QSize(8, 6), QColor(255, 0, 0), 1));
    frame->setImageFile(2, pictures.write("bottom-black.png", QSize(8, 4), QColor(0, 0, 0)));
    frame->Redraw();
    EXPECT_FALSE(frame->mask().contains(QPoint(0, 0))) << "transparent corner of the top";
    EXPECT_TRUE(frame->mask().contains(QPoint(15, 3)));
    EXPECT_FALSE(frame->mask().contains(QPoint(15, 18))) << "black bottom, TransparencyColor 0";

    frame->setTransparencyColor(0x00FF00);
    frame->Redraw();
    EXPECT_TRUE(frame->mask().contains(QPoint(15, 18)));
    EXPECT_FALSE(frame->mask().contains(QPoint(15, 10)));
}

TEST_F(Frame, withASliceMissingKeepsItsPreviousLook)
{
    frame->Redraw();
    const QImage before = frame->surface().image();
    frame->setImageFile(1, pictures.path("missing.gif"));
    EXPECT_EQ(frame->ImageFile(1), pictures.path("missing.gif"));
    frame->setTransparencyColor(0xFF0000);
    frame->Redraw();
    EXPECT_EQ(frame->surface().image(), before);
}

TEST_F(Frame, raisesPointerEventsButTracksNoHover)
{
    int moved = 0;
    int down = 0;
    QObject::connect(frame, &skQuadro::MouseMove, [&moved](qint16 &, qint16 &, float &, float &) { ++moved; });
    QList<float> downArgs;
    QObject::connect(frame, &skQuadro::MouseDown, [&](qint16 &button, qint16 &shift, float &x, float &y) {
        ++down;
        downArgs = { float(button), float(shift), x, y };
    });
    QSignalSpy in(frame, &skQuadro::MouseIn);
    QSignalSpy resized(frame, &skQuadro::Resize);
    frame->Redraw();
    QTest::mouseMove(frame, QPoint(5, 5));
    QTest::mousePress(frame, Qt::RightButton, Qt::ShiftModifier, QPoint(5, 6));
    QTest::mouseRelease(frame, Qt::RightButton, Qt::ShiftModifier, QPoint(5, 6));
    EXPECT_EQ(downArgs, (QList<float> { 2, 1, 75, 90 })) << "right button, shift, position in twips";
    QTest::mousePress(frame, Qt::LeftButton, {}, QPoint(5, 5));
    QTest::mouseRelease(frame, Qt::LeftButton, {}, QPoint(5, 5));
    frame->resize(40, 30);
    EXPECT_EQ(moved, 1);
    EXPECT_EQ(down, 2);
    EXPECT_EQ(in.count(), 0);
    EXPECT_EQ(resized.count(), 1);
    EXPECT_EQ(platform::capturedWidget(), nullptr);
}

TEST_F(Frame, persistsBothValuesAlwaysAndPreviewsInDesignMode)
{
    const PropertyBag saved = frame->Save();
    EXPECT_EQ(saved.names(), (QStringList { "TransparentBack", "DebugDesignImgID" }));

    skQuadro preview(&form);
    Ambient designer;
    designer.UserMode = false;
    preview.setAmbient(designer);
    preview.setDebugDesign(3);
    preview.Load(PropertyBag());
    EXPECT_EQ(preview.DebugDesign(), 3) << "an absent value keeps the current one";
    EXPECT_EQ(preview.ImageFile(0), skinCommon::previewFolder() + "quadro_2_top.gif");

    PropertyBag first;
    first.WriteProperty("DebugDesignImgID", 1);
    preview.Load(first);
    EXPECT_EQ(preview.ImageFile(0), skinCommon::previewFolder() + "quadro_0_top.gif");
    EXPECT_EQ(preview.ImageFile(1), skinCommon::previewFolder() + "quadro_0_back.gif");
    EXPECT_EQ(preview.ImageFile(2), skinCommon::previewFolder() + "quadro_0_bottom.gif");

    skQuadro fresh(&form);
    fresh.setAmbient(designer);
    fresh.resize(60, 60);
    fresh.InitNew();
    EXPECT_EQ(fresh.ImageFile(0), skinCommon::previewFolder() + "topo_laranja.gif");
    EXPECT_EQ(pixel(fresh, 30, 5), platform::rgb(232, 119, 34)) << "the orange band";
    EXPECT_FALSE(fresh.mask().contains(QPoint(0, 0))) << "its rounded corner";

    // At run time nothing is previewed.
    skQuadro running(&form);
    running.InitNew();
    EXPECT_EQ(running.ImageFile(0), QString());
}

TEST_F(Panel, drawsItsFiveSlicesAtTheirPixelPositions)
{
    panel->setSkinID(QStringLiteral("teste"));
    // Corners with a see-through edge, as the rounding of real ones.
    panel->setImageSource(0, pictures.write("c1.png", QSize(11, 26), QColor(255, 0, 0), 1));
    panel->setImageSource(1, pictures.write("c2.png", QSize(11, 26), QColor(0, 255, 0), 1));
    panel->setImageSource(2, pictures.write("top.png", QSize(5, 26), QColor(0, 0, 255)));
    panel->setImageSource(3, pictures.write("back.png", QSize(5, 5), QColor(255, 255, 0)));
    panel->setImageSource(4, pictures.write("bottom.png", QSize(5, 16), QColor(0, 255, 255)));
    QSignalSpy resized(panel, &skGrowth::Resize);
    panel->resize(200, 100);
    EXPECT_EQ(resized.count(), 1);

    // Top-right corner at W - 11, background from y = 26, bottom edge at y = 84. The top edge
    // runs between the corners: where a corner is see-through the container shows.
    const platform::OleColor container = platform::fromQColor(panel->palette().color(QPalette::Window));
    zelctl::test::expectPixels(*panel,
        { { 5, 5, Red }, { 0, 0, container }, { 11, 5, Blue }, { 188, 5, Blue }, { 189, 5, container },
            { 190, 5, Green }, { 199, 0, container }, { 198, 24, Green }, { 100, 26, 0x00FFFF }, { 100, 83, 0x00FFFF },
            { 100, 84, 0xFFFF00 }, { 100, 99, 0xFFFF00 } });
}

TEST_F(Panel, withoutSkinOrPicturesDrawsTheDefaultRedSet)
{
    panel->resize(120, 80);
    panel->Repaint();
    EXPECT_EQ(panel->ImageSource(0), modFuncs::GetRootPath() + "data/skins/default/gr-corner1-red.gif");
    EXPECT_EQ(panel->ImageSource(4), modFuncs::GetRootPath() + "data/skins/default/gr-bottom-red.gif");

    // A slice that cannot be read is skipped; the others still draw.
    panel->setSkinID(QStringLiteral("outra"));
    panel->setImageSource(2, QStringLiteral("/nenhum/ficheiro.gif"));
    EXPECT_EQ(panel->setImageSource(6, QString()), skinCommon::ErrSubscriptOutOfRange);
    panel->resize(150, 80);
    EXPECT_EQ(pixel(*panel, 60, 40), platform::rgb(252, 236, 238));
}

TEST_F(Panel, captionAndPersistence)
{
    panel->setCaption(QStringLiteral("Rendimentos do trabalho"));
    auto *label = panel->findChild<QLabel *>(QStringLiteral("lblCaption"));
    ASSERT_NE(label, nullptr);
    EXPECT_EQ(label->text(), QStringLiteral("Rendimentos do trabalho"));
    panel->setCaptionColor(0x00FFFF);
    EXPECT_EQ(panel->CaptionColor(), 0x00FFFFu);

    skGrowth blank(&form);
    EXPECT_EQ(blank.Save().names(), QStringList { "CaptionColor" });

    skGrowth loaded(&form);
    loaded.Load(panel->Save());
    EXPECT_EQ(loaded.Caption(), panel->Caption());
    EXPECT_EQ(loaded.CaptionColor(), 0x00FFFFu);
}

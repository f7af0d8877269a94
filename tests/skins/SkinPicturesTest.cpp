#include "SkinTestSupport.h"

#include "common/modFuncs.h"
#include "platform/Settings.h"
#include "skins/skGoButton.h"
#include "skins/skGrowth.h"
#include "skins/skNumber.h"
#include "skins/skinCommon.h"
#include "support/TestSupport.h"

#include <QDir>
#include <QImageReader>
#include <QSignalSpy>

using namespace zelctl;

TEST(DefaultSkins, everyNamedPictureIsAGifWithTransparentPixels)
{
    const QString folder = test::sourcePath("data/skins/default/");
    QStringList names = { "btn_go_normal.gif", "btn_go_hover.gif", "btn_go_click.gif", "topo_laranja.gif",
        "topo_repeat.gif", "fundo_fundo.gif", "gr-corner1-red.gif", "gr-corner2-red.gif", "gr-top-red.gif",
        "gr-background-red.gif", "gr-bottom-red.gif" };
    for (int n = 0; n < 4; ++n)
        for (const char *part : { "top", "back", "bottom" })
            names << QStringLiteral("quadro_%1_%2.gif").arg(n).arg(QLatin1String(part));
    for (const QString &name : names) {
        QImageReader reader(folder + name);
        EXPECT_EQ(reader.format(), QByteArray("gif")) << name.toStdString();
        const QImage image = reader.read();
        ASSERT_FALSE(image.isNull()) << name.toStdString();
        EXPECT_TRUE(image.hasAlphaChannel()) << name.toStdString();
    }
    // The sizes the growing panel's constants stand for.
    EXPECT_EQ(QImage(folder + "gr-corner2-red.gif").size(), QSize(11, 26));
    EXPECT_EQ(QImage(folder + "gr-bottom-red.gif").height(), 16);
    // Round shapes leave their corners transparent.
    EXPECT_EQ(qAlpha(QImage(folder + "btn_go_normal.gif").pixel(0, 0)), 0);
    EXPECT_EQ(qAlpha(QImage(folder + "topo_laranja.gif").pixel(0, 0)), 0);
}

TEST(SkinPictures, loaderTellsMissingFilesFromBadPictures)
{
    QImage picture(1, 1, QImage::Format_RGB32);
    picture.fill(Qt::red);
    EXPECT_EQ(skinCommon::loadPicture("/nenhum/sitio.gif", picture), skinCommon::ErrFileNotFound);
    EXPECT_EQ(skinCommon::loadPicture(test::sourcePath("data/iso3166.txt"), picture), skinCommon::ErrInvalidPicture);
    EXPECT_EQ(picture.pixel(0, 0), QColor(Qt::red).rgb()) << "a failure leaves the picture alone";
    EXPECT_EQ(
        skinCommon::loadPicture(test::sourcePath("data/skins/default/gr-top-red.gif"), picture), skinCommon::ErrNone);
    EXPECT_EQ(picture.size(), QSize(8, 26));
}

TEST(SkinPictures, previewFolderIsASettingDefaultingToTheDataFolder)
{
    EXPECT_EQ(skinCommon::previewFolder(), modFuncs::GetDataPath() + "skins/default/");
    platform::SaveSetting("zEL", "Setup", "SkinPreviewPath", "/opt/zel/skins");
    EXPECT_EQ(skinCommon::previewFolder(), QStringLiteral("/opt/zel/skins/"));
    platform::DeleteSetting("zEL", "Setup", "SkinPreviewPath");
}

// SkinID asks the host for pictures once per new value, and never while loading.
template <typename Control> void checkSkinId()
{
    Control control;
    QSignalSpy requests(&control, &Control::RequestSkinRepait);
    control.setSkinID(QStringLiteral("azul"));
    control.setSkinID(QStringLiteral("azul"));
    EXPECT_EQ(requests.count(), 1);
    control.setSkinID(QString());
    EXPECT_EQ(requests.count(), 2);

    PropertyBag bag;
    bag.WriteProperty("SkinID", "verde");
    Control loaded;
    QSignalSpy loadRequests(&loaded, &Control::RequestSkinRepait);
    loaded.Load(bag);
    EXPECT_EQ(loaded.SkinID(), QStringLiteral("verde"));
    EXPECT_EQ(loadRequests.count(), 0);
    EXPECT_EQ(loaded.Save().ReadProperty("SkinID").toString(), QStringLiteral("verde"));
}

TEST(SkinPictures, skinIdRaisesOnceAndNotOnLoad)
{
    checkSkinId<skGoButton>();
    checkSkinId<skNumber>();
    checkSkinId<skGrowth>();
}

TEST(SkinPictures, controlsComeFromTheClassFactory)
{
    for (const char *name : { "skGoButton", "skNumber", "skSubMenu", "skQuadro", "skGrowth", "cSlider" }) {
        std::unique_ptr<QObject> object(CreateObject(QString::fromLatin1(name)));
        ASSERT_NE(object, nullptr) << name;
        EXPECT_STREQ(object->metaObject()->className(), (std::string("zelctl::") + name).c_str());
    }
}

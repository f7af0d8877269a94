#include "SkinTestSupport.h"

#include "common/modFuncs.h"
#include "platform/Settings.h"
#include "skins/skGoButton.h"
#include "skins/skGrowth.h"
#include "skins/skNumber.h"
#include "skins/skinCommon.h"

using namespace zelctl;

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
    control.setSkinID(QString());
    EXPECT_EQ(requests.count(), 2);

    PropertyBag bag;
    bag.WriteProperty("SkinID", "verde");
    QSignalSpy loadRequests(&control, &Control::RequestSkinRepait);
    control.Load(bag);
    EXPECT_EQ(loadRequests.count(), 0);
    EXPECT_EQ(control.Save().ReadProperty("SkinID").toString(), QStringLiteral("verde"));
}

TEST(SkinPictures, skinIdRaisesOnceAndNotOnLoad)
{
    checkSkinId<skGoButton>();
    checkSkinId<skNumber>();
    checkSkinId<skGrowth>();
}

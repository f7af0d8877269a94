#include "SkinTestSupport.h"

#include "skins/skGoButton.h"
#include "skins/skGrowth.h"
#include "skins/skNumber.h"

using namespace zelctl;

// SkinID asks the host for pictures once per new value, and never while loading.
template <typename Control> void checkSkinId()
{
    Control control;
    QSignalSpy requests(&control, &Control::RequestSkinRepait);
    control.setSkinID(QStringLiteral("azul"));
    control.setSkinID(QStringLiteral("azul"));
    control.setSkinID(QString());
    PropertyBag bag;
    bag.WriteProperty("SkinID", "verde");
    control.Load(bag);
    EXPECT_EQ(requests.count(), 2);
    EXPECT_EQ(control.Save().ReadProperty("SkinID").toString(), QStringLiteral("verde"));
}

TEST(SkinPictures, skinIdRaisesOnceAndNotOnLoad)
{
    checkSkinId<skGoButton>();
    checkSkinId<skNumber>();
    checkSkinId<skGrowth>();
}

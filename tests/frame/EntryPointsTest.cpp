// The library as a host sees it: loaded with dlopen, entry points found with dlsym.

#include "frame/EntryPoints.h"
#include "frame/ClassRegistry.h"
#include "frame/UserControl.h"

#include <QFile>
#include <QFileInfo>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QUuid>

#include <gtest/gtest.h>

#include <dlfcn.h>

#include <cstring>
#include <memory>

using namespace zelctl;

namespace {

struct Library
{
    void *handle = dlopen(ZELCTL_LIBRARY_FILE, RTLD_NOW);
    ~Library()
    {
        if (handle)
            dlclose(handle);
    }
    template <typename F> F *entry(const char *name) const { return reinterpret_cast<F *>(dlsym(handle, name)); }
};

GUID toGuid(const QUuid &id)
{
    GUID guid;
    std::memcpy(&guid, &id, sizeof guid);
    return guid;
}

class EntryPoints : public ::testing::Test
{
protected:
    Library lib;
    decltype(&DllRegisterServer) registerServer = lib.entry<HRESULT()>("DllRegisterServer");
    decltype(&DllUnregisterServer) unregisterServer = lib.entry<HRESULT()>("DllUnregisterServer");
    decltype(&DllGetClassObject) getClassObject
        = lib.entry<HRESULT(const GUID *, const GUID *, void **)>("DllGetClassObject");
    decltype(&DllCanUnloadNow) canUnloadNow = lib.entry<HRESULT()>("DllCanUnloadNow");

    // Exported with C linkage, as a host looks them up.
    void SetUp() override
    {
        ASSERT_NE(lib.handle, nullptr) << dlerror();
        ASSERT_TRUE(registerServer && unregisterServer && getClassObject && canUnloadNow);
    }
};

} // namespace

TEST_F(EntryPoints, registerWritesEveryBuiltClassAndUnregisterRemovesIt)
{
    ASSERT_EQ(registerServer(), S_OK);
    QFile file(registrationFile());
    ASSERT_TRUE(file.open(QIODevice::ReadOnly));
    const QJsonObject doc = QJsonDocument::fromJson(file.readAll()).object();
    file.close();

    EXPECT_EQ(doc["typeLibrary"].toString(), "{8ff70428-d416-416f-9fd9-3b63a7eeefde}");
    EXPECT_EQ(
        QFileInfo(doc["path"].toString()).canonicalFilePath(), QFileInfo(ZELCTL_LIBRARY_FILE).canonicalFilePath());

    QStringList registered;
    for (const QJsonValue &entry : doc["classes"].toArray()) {
        const QJsonObject cls = entry.toObject();
        registered << cls["name"].toString();
        EXPECT_EQ(cls["progId"].toString(), "UKAZELCTL." + cls["name"].toString());
        EXPECT_EQ(cls["interface"].toObject()["name"].toString(), "_" + cls["name"].toString());
    }
    for (const ClassInfo &info : ClassRegistry::classes()) {
        EXPECT_EQ(registered.contains(info.name), ClassRegistry::factoryFor(info.classId) != nullptr) << info.name;
    }

    EXPECT_EQ(unregisterServer(), S_OK);
    EXPECT_FALSE(QFile::exists(registrationFile()));
    EXPECT_EQ(unregisterServer(), S_OK) << "unregistering twice is not an error";
}

TEST_F(EntryPoints, createsEveryBuiltClassCountsItUntilReleasedAndRefusesTheRest)
{
    ASSERT_EQ(canUnloadNow(), S_OK);
    void *factory = reinterpret_cast<void *>(1);
    const GUID unknown = toGuid(QUuid("11111111-2222-3333-4444-555555555555"));
    EXPECT_EQ(getClassObject(&unknown, &IID_IClassFactory, &factory), CLASS_E_CLASSNOTAVAILABLE);
    EXPECT_EQ(factory, nullptr);
    EXPECT_EQ(getClassObject(nullptr, &IID_IClassFactory, &factory), E_POINTER);
    EXPECT_EQ(getClassObject(&unknown, &IID_IClassFactory, nullptr), E_POINTER);
    for (const ClassInfo &info : ClassRegistry::classes()) {
        const GUID id = toGuid(info.classId);
        const GUID other = toGuid(info.interfaceId);
        void *raw = nullptr;
        if (!ClassRegistry::factoryFor(info.classId)) {
            EXPECT_EQ(getClassObject(&id, &IID_IClassFactory, &raw), CLASS_E_CLASSNOTAVAILABLE) << info.name;
            continue;
        }
        EXPECT_EQ(getClassObject(&id, &other, &raw), E_NOINTERFACE) << info.name;
        ASSERT_EQ(getClassObject(&id, &IID_IClassFactory, &raw), S_OK) << info.name;
        auto *factory = static_cast<ClassFactory *>(raw);

        std::unique_ptr<QObject> object(factory->CreateInstance());
        ASSERT_NE(object, nullptr) << info.name;
        EXPECT_STREQ(object->metaObject()->className(), (QByteArray("zelctl::") + info.name).constData());
        EXPECT_EQ(canUnloadNow(), S_FALSE) << info.name << " is alive";
        object.reset();
        EXPECT_EQ(canUnloadNow(), S_OK) << info.name << " was released";
    }
}

TEST_F(EntryPoints, aFactoryTheHostHoldsOutlivesItsReplacement)
{
    const GUID id = toGuid(ClassRegistry::factoryFor(QStringLiteral("cSlider"))->info().classId);
    void *raw = nullptr;
    ASSERT_EQ(getClassObject(&id, &IID_IClassFactory, &raw), S_OK);
    const auto *held = static_cast<const ClassFactory *>(raw);
    ASSERT_TRUE(ClassRegistry::provide("cSlider", [held](QWidget *parent) { return held->CreateInstance(parent); }));

    EXPECT_NE(ClassRegistry::factoryFor(QStringLiteral("cSlider")), held) << "new lookups get the new factory";
    std::unique_ptr<QObject> made(held->CreateInstance());
    EXPECT_STREQ(made->metaObject()->className(), "zelctl::cSlider");
}

// An unbalanced unlock does not outweigh the host's next lock; a live control counts too.
TEST_F(EntryPoints, locksAndLiveControlsKeepTheLibraryLoaded)
{
    ASSERT_EQ(canUnloadNow(), S_OK);
    ClassFactory::LockServer(false);
    EXPECT_EQ(canUnloadNow(), S_OK);
    ClassFactory::LockServer(true);
    EXPECT_EQ(canUnloadNow(), S_FALSE);
    ClassFactory::LockServer(false);
    EXPECT_EQ(canUnloadNow(), S_OK);
    auto control = std::make_unique<UserControl>();
    EXPECT_EQ(canUnloadNow(), S_FALSE);
    control.reset();
    EXPECT_EQ(canUnloadNow(), S_OK);
}

TEST(ClassRegistry, holdsTheFifteenPublicClassesWithTheirIdentities)
{
    const struct
    {
        const char *name;
        bool isControl;
        const char *classId, *interfaceId, *eventsId;
    } rows[] = {
        // clang-format off
        { "cNIF", true, "04900f7a-770f-4840-9c77-1938f4bbd586", "9dfe118f-eb1f-4e10-bd2b-3ee98221f672", "9b256503-739c-4a8f-b1f9-b52456bd499e" },
        { "cNIB", true, "5824dfb8-5d3b-4cc3-a8d1-0befa773df66", "29b086ba-4301-47cc-bcf4-c6c8ab499eae", "70949123-bc5d-4824-aaff-899297c991e6" },
        { "cSujeitoSelector", true, "9113755c-b781-4d55-94ea-3fec54d16a53", "354089b9-84e8-496c-ae55-f0c0fe92eb36", "dcdb0024-201f-4b74-8780-93a26be84262" },
        { "clsGFXSelection", false, "640bf4c6-5985-49f2-9752-dee344a9be1a", "051e318f-f144-4f79-a872-959ff63b82e0", "777767eb-c0e9-4535-9435-9fc63e437162" },
        { "StdPNG", false, "23610899-4a86-4c4f-a26d-c559a6a8b465", "7e239b26-b94c-4a04-9373-8f98524404b2", "819e4cd1-5cce-48be-ac29-a16ece8e4449" },
        { "stdPNGdata", false, "da2285f0-3039-4336-ac5f-6dd557c3a6df", "e7559407-376c-442e-9713-13e457707fc3", "" },
        { "ucAniGIF", true, "401a4f15-5913-44b3-889f-8ea01d84dd88", "ec775c80-2111-460c-8fbd-a3f7c7f3a1ac", "0be658d8-c712-47f3-b168-ecb74107f000" },
        { "clsBalloonTip", false, "d766ba99-3ddc-4a0c-b7fb-a1d0b31953ee", "cdf7a48e-e65a-4e12-add8-fed8c5e5ae72", "" },
        { "InfoButton", true, "61700882-69ef-4eb0-9af2-256a85220228", "1c8c1aec-df45-4684-b52e-87fd8effd800", "8108371b-e4fa-48a1-8a13-08527776b7db" },
        { "skGoButton", true, "2e1559d4-ee08-4f01-9cf1-416f3dd010ed", "ce995758-66b9-4ba2-9f30-99dc8151e2a5", "82d27b50-0629-48f1-9ba5-0002552a633b" },
        { "skNumber", true, "03c6f8e1-6693-4279-aa5e-38f23b82bc7f", "d636c72c-9c65-4b64-b16e-ebd2608a6673", "bba40bc2-d9c5-4cf9-abaa-7106fa774531" },
        { "skSubMenu", true, "b4eba8e9-d190-4a6c-9b57-b9f705812641", "abe3af2b-d045-4fcd-a1d8-bd76a014128f", "44b268d8-a068-48d5-9db5-9057d09777e1" },
        { "skQuadro", true, "140267d3-f119-492c-9b83-4262a236bc69", "ab06ae95-c4ed-4011-b478-bc682a39fbb6", "918920fe-a1db-45b6-a6ff-6e7617f89724" },
        { "skGrowth", true, "ad2c3cf6-4021-455d-98ee-f2c850b8679f", "b788f6c1-54c5-44e3-88c7-d0e88aca84e8", "0ba237e8-5646-426b-b262-d4ae81a701b4" },
        { "cSlider", true, "97f4af26-4ba7-4f7b-adb1-729e41c3d4a7", "5548f5f3-14fd-4ca8-8e73-93517291251e", "e901ab0b-675c-400c-9a01-1408a0a5b92d" },
        // clang-format on
    };
    const auto classes = ClassRegistry::classes();
    ASSERT_EQ(classes.size(), std::size(rows));
    for (size_t i = 0; i < std::size(rows); ++i) {
        SCOPED_TRACE(rows[i].name);
        EXPECT_STREQ(classes[i].name, rows[i].name);
        EXPECT_EQ(classes[i].isControl, rows[i].isControl);
        EXPECT_EQ(classes[i].classId, QUuid(rows[i].classId));
        EXPECT_EQ(classes[i].interfaceId, QUuid(rows[i].interfaceId));
        EXPECT_EQ(classes[i].eventsId, QUuid(rows[i].eventsId));
    }
}

TEST(ClassRegistry, servesNamesOfTheTableInAnyCase)
{
    for (const char *name : { "cslider", "UKAZELCTL.CSLIDER", "ukazelctl.cSlider" }) {
        std::unique_ptr<QObject> made(CreateObject(QLatin1String(name)));
        ASSERT_NE(made, nullptr) << name;
        EXPECT_STREQ(made->metaObject()->className(), "zelctl::cSlider");
    }
    EXPECT_FALSE(ClassRegistry::provide("cUnknown", [](QWidget *) { return new QObject; }));
    EXPECT_EQ(CreateObject("cUnknown"), nullptr);
    EXPECT_EQ(CreateObject("UKAZELCTL.cUnknown"), nullptr);
}

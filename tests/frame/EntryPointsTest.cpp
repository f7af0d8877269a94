#include "frame/EntryPoints.h"
#include "frame/ClassRegistry.h"
#include "frame/UserControl.h"
#include "support/TestSupport.h"

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
using namespace Qt::StringLiterals;

namespace {

GUID toGuid(const QUuid &id)
{
    GUID guid;
    std::memcpy(&guid, &id, sizeof guid);
    return guid;
}

} // namespace

// As a host finds them: with dlsym after dlopen.
TEST(EntryPoints, haveCLinkage)
{
    void *library = dlopen(ZELCTL_LIBRARY_FILE, RTLD_NOW);
    ASSERT_NE(library, nullptr) << dlerror();
    for (const char *name : { "DllRegisterServer", "DllUnregisterServer", "DllGetClassObject", "DllCanUnloadNow" })
        EXPECT_NE(dlsym(library, name), nullptr) << name;
    dlclose(library);
}

TEST(EntryPoints, registerWritesEveryBuiltClassAndUnregisterRemovesIt)
{
    ASSERT_EQ(DllRegisterServer(), S_OK);
    QFile file(registrationFile());
    ASSERT_TRUE(file.open(QIODevice::ReadOnly));
    const QJsonObject doc = QJsonDocument::fromJson(file.readAll()).object();
    file.close();

    EXPECT_EQ(
        QFileInfo(doc["path"].toString()).canonicalFilePath(), QFileInfo(ZELCTL_LIBRARY_FILE).canonicalFilePath());

    QStringList registered;
    for (const QJsonValue &entry : doc["classes"].toArray()) {
        const QJsonObject cls = entry.toObject();
        registered << cls["name"].toString();
        EXPECT_EQ(cls["progId"].toString(), "UKAZELCTL." + cls["name"].toString());
    }
    for (const ClassInfo &info : ClassRegistry::classes()) {
        EXPECT_EQ(registered.contains(info.name), ClassRegistry::factoryFor(info.classId) != nullptr) << info.name;
    }

    EXPECT_EQ(DllUnregisterServer(), S_OK);
    EXPECT_FALSE(QFile::exists(registrationFile()));
    EXPECT_EQ(DllUnregisterServer(), S_OK) << "unregistering twice is not an error";
}

// An unbalanced unlock does not outweigh the host's next lock.
TEST(EntryPoints, createsEveryBuiltClassCountsItAndLocksUntilReleasedAndRefusesTheRest)
{
    ASSERT_EQ(DllCanUnloadNow(), S_OK);
    ClassFactory::LockServer(false);
    ClassFactory::LockServer(true);
    EXPECT_EQ(DllCanUnloadNow(), S_FALSE);
    ClassFactory::LockServer(false);
    EXPECT_EQ(DllCanUnloadNow(), S_OK);
    void *factory = reinterpret_cast<void *>(1);
    const GUID unknown = toGuid(QUuid("11111111-2222-3333-4444-555555555555"));
    EXPECT_EQ(DllGetClassObject(&unknown, &IID_IClassFactory, &factory), CLASS_E_CLASSNOTAVAILABLE);
    EXPECT_EQ(factory, nullptr);
    EXPECT_EQ(DllGetClassObject(nullptr, &IID_IClassFactory, &factory), E_POINTER);
    EXPECT_EQ(DllGetClassObject(&unknown, &IID_IClassFactory, nullptr), E_POINTER);
    for (const ClassInfo &info : ClassRegistry::classes()) {
        const GUID id = toGuid(info.classId);
        const GUID other = toGuid(info.interfaceId);
        void *raw = nullptr;
        if (!ClassRegistry::factoryFor(info.classId)) {
            EXPECT_EQ(DllGetClassObject(&id, &IID_IClassFactory, &raw), CLASS_E_CLASSNOTAVAILABLE) << info.name;
            continue;
        }
        EXPECT_EQ(DllGetClassObject(&id, &other, &raw), E_NOINTERFACE) << info.name;
        ASSERT_EQ(DllGetClassObject(&id, &IID_IClassFactory, &raw), S_OK) << info.name;
        auto *factory = static_cast<ClassFactory *>(raw);

        std::unique_ptr<QObject> object(factory->CreateInstance());
        ASSERT_NE(object, nullptr) << info.name;
        EXPECT_STREQ(object->metaObject()->className(), (QByteArray("zelctl::") + info.name).constData());
        EXPECT_EQ(DllCanUnloadNow(), S_FALSE) << info.name << " is alive";
        object.reset();
        EXPECT_EQ(DllCanUnloadNow(), S_OK) << info.name << " was released";
    }
}

TEST(EntryPoints, aFactoryTheHostHoldsOutlivesItsReplacement)
{
    const GUID id = toGuid(ClassRegistry::factoryFor(QStringLiteral("cSlider"))->info().classId);
    void *raw = nullptr;
    ASSERT_EQ(DllGetClassObject(&id, &IID_IClassFactory, &raw), S_OK);
    const auto *held = static_cast<const ClassFactory *>(raw);
    ASSERT_TRUE(ClassRegistry::provide("cSlider", [held](QWidget *parent) { return held->CreateInstance(parent); }));

    EXPECT_NE(ClassRegistry::factoryFor(QStringLiteral("cSlider")), held) << "new lookups get the new factory";
    std::unique_ptr<QObject> made(held->CreateInstance());
    EXPECT_STREQ(made->metaObject()->className(), "zelctl::cSlider");
}

TEST(ClassRegistry, servesNamesOfTheTableInAnyCase)
{
    for (const char *name : { "cslider", "UKAZELCTL.CSLIDER", "ukazelctl.cSlider" }) {
        std::unique_ptr<QObject> made(CreateObject(QLatin1String(name)));
        ASSERT_NE(made, nullptr) << name;
        EXPECT_STREQ(made->metaObject()->className(), "zelctl::cSlider");
    }
    EXPECT_FALSE(ClassRegistry::provide("cUnknown", [](QWidget *) { return new QObject; }));
    EXPECT_EQ(CreateObject("UKAZELCTL.cUnknown"), nullptr);
}

// What registered hosts know the classes by: name, kind, class, interface and events ids.
TEST(ClassRegistry, holdsTheFifteenPublicClassesWithTheirIdentities)
{
    const QStringList rows = {
        // clang-format off
        u"cNIF control 04900f7a-770f-4840-9c77-1938f4bbd586 9dfe118f-eb1f-4e10-bd2b-3ee98221f672 9b256503-739c-4a8f-b1f9-b52456bd499e"_s,
        u"cNIB control 5824dfb8-5d3b-4cc3-a8d1-0befa773df66 29b086ba-4301-47cc-bcf4-c6c8ab499eae 70949123-bc5d-4824-aaff-899297c991e6"_s,
        u"cSujeitoSelector control 9113755c-b781-4d55-94ea-3fec54d16a53 354089b9-84e8-496c-ae55-f0c0fe92eb36 dcdb0024-201f-4b74-8780-93a26be84262"_s,
        u"clsGFXSelection object 640bf4c6-5985-49f2-9752-dee344a9be1a 051e318f-f144-4f79-a872-959ff63b82e0 777767eb-c0e9-4535-9435-9fc63e437162"_s,
        u"StdPNG object 23610899-4a86-4c4f-a26d-c559a6a8b465 7e239b26-b94c-4a04-9373-8f98524404b2 819e4cd1-5cce-48be-ac29-a16ece8e4449"_s,
        u"stdPNGdata object da2285f0-3039-4336-ac5f-6dd557c3a6df e7559407-376c-442e-9713-13e457707fc3"_s,
        u"ucAniGIF control 401a4f15-5913-44b3-889f-8ea01d84dd88 ec775c80-2111-460c-8fbd-a3f7c7f3a1ac 0be658d8-c712-47f3-b168-ecb74107f000"_s,
        u"clsBalloonTip object d766ba99-3ddc-4a0c-b7fb-a1d0b31953ee cdf7a48e-e65a-4e12-add8-fed8c5e5ae72"_s,
        u"InfoButton control 61700882-69ef-4eb0-9af2-256a85220228 1c8c1aec-df45-4684-b52e-87fd8effd800 8108371b-e4fa-48a1-8a13-08527776b7db"_s,
        u"skGoButton control 2e1559d4-ee08-4f01-9cf1-416f3dd010ed ce995758-66b9-4ba2-9f30-99dc8151e2a5 82d27b50-0629-48f1-9ba5-0002552a633b"_s,
        u"skNumber control 03c6f8e1-6693-4279-aa5e-38f23b82bc7f d636c72c-9c65-4b64-b16e-ebd2608a6673 bba40bc2-d9c5-4cf9-abaa-7106fa774531"_s,
        u"skSubMenu control b4eba8e9-d190-4a6c-9b57-b9f705812641 abe3af2b-d045-4fcd-a1d8-bd76a014128f 44b268d8-a068-48d5-9db5-9057d09777e1"_s,
        u"skQuadro control 140267d3-f119-492c-9b83-4262a236bc69 ab06ae95-c4ed-4011-b478-bc682a39fbb6 918920fe-a1db-45b6-a6ff-6e7617f89724"_s,
        u"skGrowth control ad2c3cf6-4021-455d-98ee-f2c850b8679f b788f6c1-54c5-44e3-88c7-d0e88aca84e8 0ba237e8-5646-426b-b262-d4ae81a701b4"_s,
        u"cSlider control 97f4af26-4ba7-4f7b-adb1-729e41c3d4a7 5548f5f3-14fd-4ca8-8e73-93517291251e e901ab0b-675c-400c-9a01-1408a0a5b92d"_s,
        // clang-format on
    };
    QStringList held;
    for (const ClassInfo &info : ClassRegistry::classes()) {
        QStringList row = { QLatin1String(info.name), info.isControl ? u"control"_s : u"object"_s };
        for (const QUuid &id : { info.classId, info.interfaceId, info.eventsId })
            if (!id.isNull())
                row << id.toString(QUuid::WithoutBraces);
        held << row.join(u' ');
    }
    EXPECT_EQ(held, rows);
}

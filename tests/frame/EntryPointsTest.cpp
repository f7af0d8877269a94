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
};

} // namespace

TEST_F(EntryPoints, areExportedWithCLinkage)
{
    ASSERT_NE(lib.handle, nullptr) << dlerror();
    EXPECT_NE(registerServer, nullptr);
    EXPECT_NE(unregisterServer, nullptr);
    EXPECT_NE(getClassObject, nullptr);
    EXPECT_NE(canUnloadNow, nullptr);
}

TEST_F(EntryPoints, registerWritesEveryBuiltClassAndUnregisterRemovesIt)
{
    ASSERT_EQ(registerServer(), S_OK);
    QFile file(registrationFile());
    ASSERT_TRUE(file.open(QIODevice::ReadOnly));
    const QJsonObject doc = QJsonDocument::fromJson(file.readAll()).object();
    file.close();

    EXPECT_EQ(doc["library"].toString(), "UKAZELCTL");
    EXPECT_EQ(doc["helpString"].toString(), QString::fromUtf8("ZEL - Componentes gráficos"));
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

TEST_F(EntryPoints, getClassObjectRejectsBadArguments)
{
    void *factory = reinterpret_cast<void *>(1);
    const GUID unknown = toGuid(QUuid("11111111-2222-3333-4444-555555555555"));
    EXPECT_EQ(getClassObject(&unknown, &IID_IClassFactory, &factory), CLASS_E_CLASSNOTAVAILABLE);
    EXPECT_EQ(factory, nullptr);
    EXPECT_EQ(getClassObject(nullptr, &IID_IClassFactory, &factory), E_POINTER);
    EXPECT_EQ(getClassObject(&unknown, &IID_IClassFactory, nullptr), E_POINTER);
}

TEST_F(EntryPoints, classesNotBuiltAreNotAvailable)
{
    for (const ClassInfo &info : ClassRegistry::classes()) {
        if (ClassRegistry::factoryFor(info.classId))
            continue;
        void *factory = nullptr;
        const GUID id = toGuid(info.classId);
        EXPECT_EQ(getClassObject(&id, &IID_IClassFactory, &factory), CLASS_E_CLASSNOTAVAILABLE) << info.name;
    }
}

TEST_F(EntryPoints, createsEveryBuiltClassAndCountsItUntilReleased)
{
    ASSERT_EQ(canUnloadNow(), S_OK);
    for (const ClassInfo &info : ClassRegistry::classes()) {
        if (!ClassRegistry::factoryFor(info.classId))
            continue;
        const GUID id = toGuid(info.classId);
        const GUID other = toGuid(info.interfaceId);
        void *raw = nullptr;
        EXPECT_EQ(getClassObject(&id, &other, &raw), E_NOINTERFACE) << info.name;
        ASSERT_EQ(getClassObject(&id, &IID_IClassFactory, &raw), S_OK) << info.name;
        auto *factory = static_cast<ClassFactory *>(raw);

        std::unique_ptr<QObject> object(factory->CreateInstance());
        ASSERT_NE(object, nullptr) << info.name;
        EXPECT_STREQ(object->metaObject()->className(), (QByteArray("zelctl::") + info.name).constData());
        EXPECT_EQ(canUnloadNow(), S_FALSE) << info.name << " is alive";
        object.reset();
        EXPECT_EQ(canUnloadNow(), S_OK) << info.name << " was released";

        factory->LockServer(true);
        EXPECT_EQ(canUnloadNow(), S_FALSE) << "a locked factory keeps the library";
        factory->LockServer(false);
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

TEST_F(EntryPoints, anUnbalancedUnlockDoesNotOutweighTheNextLock)
{
    ASSERT_EQ(canUnloadNow(), S_OK);
    ClassFactory::LockServer(false);
    EXPECT_EQ(canUnloadNow(), S_OK);
    ClassFactory::LockServer(true);
    EXPECT_EQ(canUnloadNow(), S_FALSE) << "the host's lock holds";
    ClassFactory::LockServer(false);
    EXPECT_EQ(canUnloadNow(), S_OK);
}

TEST_F(EntryPoints, liveControlsKeepTheLibraryLoaded)
{
    ASSERT_EQ(canUnloadNow(), S_OK);
    {
        UserControl control;
        EXPECT_EQ(canUnloadNow(), S_FALSE);
    }
    EXPECT_EQ(canUnloadNow(), S_OK);
}

TEST(ClassRegistry, holdsTheFifteenPublicClassesWithTheirIdentities)
{
    const auto classes = ClassRegistry::classes();
    ASSERT_EQ(classes.size(), 15u);
    EXPECT_STREQ(classes.front().name, "cNIF");
    EXPECT_EQ(classes.front().classId, QUuid("04900f7a-770f-4840-9c77-1938f4bbd586"));
    EXPECT_STREQ(classes.back().name, "cSlider");
    EXPECT_EQ(classes.back().eventsId, QUuid("e901ab0b-675c-400c-9a01-1408a0a5b92d"));

    const auto noEvents = [](const char *name) {
        for (const ClassInfo &info : ClassRegistry::classes())
            if (qstrcmp(info.name, name) == 0)
                return info.eventsId.isNull();
        return false;
    };
    EXPECT_TRUE(noEvents("stdPNGdata"));
    EXPECT_TRUE(noEvents("clsBalloonTip"));
    EXPECT_FALSE(noEvents("StdPNG"));
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

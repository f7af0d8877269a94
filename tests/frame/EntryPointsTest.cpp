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

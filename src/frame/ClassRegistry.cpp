#include "ClassRegistry.h"

#include <QHash>

#include <array>
#include <atomic>
#include <memory>
#include <vector>

namespace zelctl {

namespace {

// clang-format off
const std::array<ClassInfo, 15> publicClasses = {{
    { "cNIF", true, QUuid("04900f7a-770f-4840-9c77-1938f4bbd586"), QUuid("9dfe118f-eb1f-4e10-bd2b-3ee98221f672"), QUuid("9b256503-739c-4a8f-b1f9-b52456bd499e") },
    { "cNIB", true, QUuid("5824dfb8-5d3b-4cc3-a8d1-0befa773df66"), QUuid("29b086ba-4301-47cc-bcf4-c6c8ab499eae"), QUuid("70949123-bc5d-4824-aaff-899297c991e6") },
    { "cSujeitoSelector", true, QUuid("9113755c-b781-4d55-94ea-3fec54d16a53"), QUuid("354089b9-84e8-496c-ae55-f0c0fe92eb36"), QUuid("dcdb0024-201f-4b74-8780-93a26be84262") },
    { "clsGFXSelection", false, QUuid("640bf4c6-5985-49f2-9752-dee344a9be1a"), QUuid("051e318f-f144-4f79-a872-959ff63b82e0"), QUuid("777767eb-c0e9-4535-9435-9fc63e437162") },
    { "StdPNG", false, QUuid("23610899-4a86-4c4f-a26d-c559a6a8b465"), QUuid("7e239b26-b94c-4a04-9373-8f98524404b2"), QUuid("819e4cd1-5cce-48be-ac29-a16ece8e4449") },
    { "stdPNGdata", false, QUuid("da2285f0-3039-4336-ac5f-6dd557c3a6df"), QUuid("e7559407-376c-442e-9713-13e457707fc3"), QUuid() },
    { "ucAniGIF", true, QUuid("401a4f15-5913-44b3-889f-8ea01d84dd88"), QUuid("ec775c80-2111-460c-8fbd-a3f7c7f3a1ac"), QUuid("0be658d8-c712-47f3-b168-ecb74107f000") },
    { "clsBalloonTip", false, QUuid("d766ba99-3ddc-4a0c-b7fb-a1d0b31953ee"), QUuid("cdf7a48e-e65a-4e12-add8-fed8c5e5ae72"), QUuid() },
    { "InfoButton", true, QUuid("61700882-69ef-4eb0-9af2-256a85220228"), QUuid("1c8c1aec-df45-4684-b52e-87fd8effd800"), QUuid("8108371b-e4fa-48a1-8a13-08527776b7db") },
    { "skGoButton", true, QUuid("2e1559d4-ee08-4f01-9cf1-416f3dd010ed"), QUuid("ce995758-66b9-4ba2-9f30-99dc8151e2a5"), QUuid("82d27b50-0629-48f1-9ba5-0002552a633b") },
    { "skNumber", true, QUuid("03c6f8e1-6693-4279-aa5e-38f23b82bc7f"), QUuid("d636c72c-9c65-4b64-b16e-ebd2608a6673"), QUuid("bba40bc2-d9c5-4cf9-abaa-7106fa774531") },
    { "skSubMenu", true, QUuid("b4eba8e9-d190-4a6c-9b57-b9f705812641"), QUuid("abe3af2b-d045-4fcd-a1d8-bd76a014128f"), QUuid("44b268d8-a068-48d5-9db5-9057d09777e1") },
    { "skQuadro", true, QUuid("140267d3-f119-492c-9b83-4262a236bc69"), QUuid("ab06ae95-c4ed-4011-b478-bc682a39fbb6"), QUuid("918920fe-a1db-45b6-a6ff-6e7617f89724") },
    { "skGrowth", true, QUuid("ad2c3cf6-4021-455d-98ee-f2c850b8679f"), QUuid("b788f6c1-54c5-44e3-88c7-d0e88aca84e8"), QUuid("0ba237e8-5646-426b-b262-d4ae81a701b4") },
    { "cSlider", true, QUuid("97f4af26-4ba7-4f7b-adb1-729e41c3d4a7"), QUuid("5548f5f3-14fd-4ca8-8e73-93517291251e"), QUuid("e901ab0b-675c-400c-9a01-1408a0a5b92d") },
}};
// clang-format on

std::atomic<int> liveObjects { 0 };
std::atomic<int> locks { 0 };

// Factories of the classes built into the library. A host may hold any factory it got from
// DllGetClassObject for as long as the library is loaded, so one that is replaced stays
// alive; `current` names the one each class uses now.
struct Factories
{
    std::vector<std::unique_ptr<ClassFactory>> all;
    QHash<QString, const ClassFactory *> current;
};

Factories &factories()
{
    static Factories table;
    return table;
}

// The documented name of a class, given its name or prog id in any case; null when none.
const char *canonicalName(const QString &nameOrProgId)
{
    const QString prefix = QLatin1String(ClassRegistry::LibraryName) + QLatin1Char('.');
    const QString name
        = nameOrProgId.startsWith(prefix, Qt::CaseInsensitive) ? nameOrProgId.mid(prefix.size()) : nameOrProgId;
    for (const ClassInfo &info : publicClasses) {
        if (name.compare(QLatin1String(info.name), Qt::CaseInsensitive) == 0)
            return info.name;
    }
    return nullptr;
}

} // namespace

ClassFactory::ClassFactory(const ClassInfo &info, ClassCreator creator)
    : m_info(info)
    , m_creator(std::move(creator))
{ }

QObject *ClassFactory::CreateInstance(QWidget *parent) const
{
    return m_creator(parent);
}

void ClassFactory::LockServer(bool lock)
{
    if (lock) {
        ++locks;
        return;
    }
    // An unbalanced unlock is ignored: a count below zero would let the library unload
    // under the next host that locks it.
    int count = locks;
    while (count > 0 && !locks.compare_exchange_weak(count, count - 1)) { }
}

int ClassFactory::serverLocks()
{
    return locks;
}

namespace ClassRegistry {

QUuid typeLibraryId()
{
    return QUuid("8ff70428-d416-416f-9fd9-3b63a7eeefde");
}

std::span<const ClassInfo> classes()
{
    return publicClasses;
}

bool provide(const char *name, ClassCreator creator)
{
    for (const ClassInfo &info : publicClasses) {
        if (qstrcmp(info.name, name) == 0) {
            Factories &table = factories();
            table.all.push_back(std::make_unique<ClassFactory>(info, std::move(creator)));
            table.current.insert(QLatin1String(info.name), table.all.back().get());
            return true;
        }
    }
    return false;
}

const ClassFactory *factoryFor(const QUuid &classId)
{
    for (const ClassInfo &info : publicClasses) {
        if (info.classId == classId)
            return factories().current.value(QLatin1String(info.name));
    }
    return nullptr;
}

const ClassFactory *factoryFor(const QString &nameOrProgId)
{
    const char *name = canonicalName(nameOrProgId);
    return name ? factories().current.value(QLatin1String(name)) : nullptr;
}

} // namespace ClassRegistry

QObject *CreateObject(const QString &nameOrProgId, QWidget *parent)
{
    const ClassFactory *factory = ClassRegistry::factoryFor(nameOrProgId);
    return factory ? factory->CreateInstance(parent) : nullptr;
}

LiveObject::LiveObject()
{
    ++liveObjects;
}

LiveObject::LiveObject(const LiveObject &)
{
    ++liveObjects;
}

LiveObject::~LiveObject()
{
    --liveObjects;
}

int LiveObject::count()
{
    return liveObjects;
}

} // namespace zelctl

#include "EntryPoints.h"

#include "ClassRegistry.h"

#include <QDir>
#include <QFile>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QSaveFile>
#include <QStandardPaths>

#include <cstring>
#include <dlfcn.h>

namespace zelctl {

namespace {

static_assert(sizeof(GUID) == sizeof(QUuid));

QUuid toUuid(const GUID &guid)
{
    return QUuid(guid.Data1, guid.Data2, guid.Data3, guid.Data4[0], guid.Data4[1], guid.Data4[2], guid.Data4[3],
        guid.Data4[4], guid.Data4[5], guid.Data4[6], guid.Data4[7]);
}

QString braced(const QUuid &id)
{
    return id.toString(QUuid::WithBraces);
}

// The file this library was loaded from, so the registration points hosts at it.
QString libraryPath()
{
    Dl_info info {};
    if (dladdr(reinterpret_cast<const void *>(&DllRegisterServer), &info) && info.dli_fname)
        return QFile::decodeName(info.dli_fname);
    return {};
}

QJsonObject describe(const ClassInfo &info)
{
    const QString name = QLatin1String(info.name);
    QJsonObject entry {
        { "name", name },
        { "progId", info.progId() },
        { "kind", info.isControl ? "control" : "class" },
        { "classId", braced(info.classId) },
        { "interface", QJsonObject { { "name", "_" + name }, { "id", braced(info.interfaceId) } } },
    };
    if (!info.eventsId.isNull())
        entry.insert("events", QJsonObject { { "name", "__" + name }, { "id", braced(info.eventsId) } });
    return entry;
}

} // namespace

QString registrationFile()
{
    return QStandardPaths::writableLocation(QStandardPaths::GenericDataLocation)
        + QStringLiteral("/zelctl/UKAZELCTL.json");
}

} // namespace zelctl

using namespace zelctl;

HRESULT DllRegisterServer(void)
{
    QJsonArray classes;
    for (const ClassInfo &info : ClassRegistry::classes()) {
        if (ClassRegistry::factoryFor(info.classId))
            classes.append(describe(info));
    }
    const QJsonObject registration {
        { "library", ClassRegistry::LibraryName },
        { "helpString", QString::fromUtf8(ClassRegistry::HelpString) },
        { "typeLibrary", braced(ClassRegistry::typeLibraryId()) },
        { "path", libraryPath() },
        { "classes", classes },
    };

    const QString file = registrationFile();
    if (!QDir().mkpath(QFileInfo(file).absolutePath()))
        return SELFREG_E_CLASS;
    QSaveFile out(file);
    if (!out.open(QIODevice::WriteOnly))
        return SELFREG_E_CLASS;
    out.write(QJsonDocument(registration).toJson());
    return out.commit() ? S_OK : SELFREG_E_CLASS;
}

HRESULT DllUnregisterServer(void)
{
    const QString file = registrationFile();
    if (QFile::exists(file) && !QFile::remove(file))
        return SELFREG_E_CLASS;
    return S_OK;
}

HRESULT DllGetClassObject(const GUID *rclsid, const GUID *riid, void **ppv)
{
    if (!ppv)
        return E_POINTER;
    *ppv = nullptr;
    if (!rclsid || !riid)
        return E_POINTER;
    const ClassFactory *factory = ClassRegistry::factoryFor(toUuid(*rclsid));
    if (!factory)
        return CLASS_E_CLASSNOTAVAILABLE;
    if (std::memcmp(riid, &IID_IClassFactory, sizeof(GUID)) != 0 && std::memcmp(riid, &IID_IUnknown, sizeof(GUID)) != 0)
        return E_NOINTERFACE;
    *ppv = const_cast<ClassFactory *>(factory);
    return S_OK;
}

HRESULT DllCanUnloadNow(void)
{
    return LiveObject::count() == 0 && ClassFactory::serverLocks() == 0 ? S_OK : S_FALSE;
}

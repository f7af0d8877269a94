#pragma once

#include "zelctl_export.h"

#include <QObject>
#include <QString>
#include <QUuid>
#include <QWidget>

#include <functional>
#include <span>
#include <type_traits>

namespace zelctl {

// Identity of one public class, as a host registers and creates it.
struct ClassInfo
{
    const char *name; // "cNIF"
    bool isControl; // placed on a form, or created by code
    QUuid classId;
    QUuid interfaceId; // the default interface "_cNIF"
    QUuid eventsId; // the event interface "__cNIF"; null when the class raises no events

    QString progId() const { return QStringLiteral("UKAZELCTL.") + QLatin1String(name); }
};

// Makes a new object of a class; a control gets the widget as parent, a creatable class
// gets it as QObject parent (or none).
using ClassCreator = std::function<QObject *(QWidget *parent)>;

// Creates the objects of one class for a host.
class ZELCTL_EXPORT ClassFactory
{
public:
    ClassFactory(const ClassInfo &info, ClassCreator creator);

    const ClassInfo &info() const { return m_info; }

    // A new object, owned by the caller (or its parent). Never nullptr.
    QObject *CreateInstance(QWidget *parent = nullptr) const;

    // Keeps the library loaded while a host holds factories for later use. An unlock
    // without a lock before it is ignored.
    static void LockServer(bool lock);
    static int serverLocks();

private:
    ClassInfo m_info;
    ClassCreator m_creator;
};

namespace ClassRegistry {

inline constexpr const char *LibraryName = "UKAZELCTL";
inline constexpr const char *HelpString = "ZEL - Componentes gráficos";
ZELCTL_EXPORT QUuid typeLibraryId();

// Every public class of the library, in their documented order.
ZELCTL_EXPORT std::span<const ClassInfo> classes();

// The factory of a class that is built into this library, or nullptr. Names and prog ids
// are matched in any case, as prog ids are looked up on the original platform.
ZELCTL_EXPORT const ClassFactory *factoryFor(const QUuid &classId);
ZELCTL_EXPORT const ClassFactory *factoryFor(const QString &nameOrProgId);

// Called once per class (through ZELCTL_REGISTER_CLASS) when the library loads. A later
// call gives the class a new factory; the one it replaces stays valid while the library is
// loaded, since a host may still hold it.
ZELCTL_EXPORT bool provide(const char *name, ClassCreator creator);

} // namespace ClassRegistry

// Creates a public class by its name ("cNIF") or programmatic id ("UKAZELCTL.cNIF"), in any
// case, as a script host would; nullptr for a name the library does not serve.
ZELCTL_EXPORT QObject *CreateObject(const QString &nameOrProgId, QWidget *parent = nullptr);

// Counts the library's live public objects, so a host knows when it may unload it.
// Every public class holds one as a member.
class ZELCTL_EXPORT LiveObject
{
public:
    LiveObject();
    LiveObject(const LiveObject &);
    LiveObject &operator=(const LiveObject &) = default;
    ~LiveObject();

    static int count();
};

} // namespace zelctl

// Makes a class creatable through its factory. Use once, in the class's source file,
// inside namespace zelctl.
#define ZELCTL_REGISTER_CLASS(Class)                                                                                   \
    namespace {                                                                                                        \
    const bool registered_##Class = ::zelctl::ClassRegistry::provide(                                                  \
        #Class, [](QWidget *parent) -> QObject * { return ::zelctl::detail::construct<Class>(parent); });              \
    }

namespace zelctl::detail {

template <typename T> QObject *construct(QWidget *parent)
{
    if constexpr (std::is_base_of_v<QWidget, T>)
        return new T(parent);
    else
        return new T(static_cast<QObject *>(parent));
}

} // namespace zelctl::detail

#include "Command.h"

#include "frame/ClassRegistry.h"

// Lists the public classes: name, class identity and whether this build serves it.
int runClasses(const QStringList &args, QTextStream &out, QTextStream &err)
{
    if (!args.isEmpty()) {
        err << "zelctl classes: takes no arguments\n";
        return 2;
    }
    for (const zelctl::ClassInfo &info : zelctl::ClassRegistry::classes()) {
        const bool available = zelctl::ClassRegistry::factoryFor(info.classId) != nullptr;
        out << info.name << '\t' << info.classId.toString(QUuid::WithBraces) << '\t'
            << (available ? "available" : "not built") << '\n';
    }
    return 0;
}

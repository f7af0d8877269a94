// zelctl: the library's non-visual services for scripts.

#include "Command.h"

#include <QCoreApplication>

#include <array>

namespace {

const std::array commands = {
    Command { "classes", "zelctl classes", runClasses },
    Command { "nib", "zelctl nib NUMBER", runNib },
    Command { "nif", "zelctl nif CC NUMBER | zelctl nif --batch", runNif },
    Command { "lookup", "zelctl lookup NUMBER [--offline] [--refresh]", runLookup },
    Command { "gif-info", "zelctl gif-info [--hash] FILE", runGifInfo },
    Command { "png-info", "zelctl png-info FILE", runPngInfo },
    Command {
        "png-decode", "zelctl png-decode [--transparent-style N] [--make32] [--alpha A] FILE OUT.pam", runPngDecode },
};

void printUsage(QTextStream &stream)
{
    stream << "usage:\n";
    for (const Command &command : commands)
        stream << "  " << command.usage << '\n';
}

} // namespace

int main(int argc, char **argv)
{
    QCoreApplication app(argc, argv);
    QTextStream out(stdout);
    QTextStream err(stderr);
    QStringList args = app.arguments().mid(1);
    if (args.isEmpty() || args.first() == "--help" || args.first() == "-h") {
        printUsage(args.isEmpty() ? err : out);
        return args.isEmpty() ? 2 : 0;
    }
    const QString name = args.takeFirst();
    for (const Command &command : commands) {
        if (name == QLatin1String(command.name))
            return command.run(args, out, err);
    }
    err << "zelctl: unknown command '" << name << "'\n";
    printUsage(err);
    return 2;
}

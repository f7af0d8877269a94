#include "Command.h"

#include "companion/ChainedNIFGrabber.h"
#include "platform/Settings.h"

#include <QEventLoop>

using namespace zelctl::companion;

namespace {

// The fields a NIF control reads, in its order; any others follow sorted.
const QStringList KnownFields = { "ID", "NAME", "SOURCE", "STATUS", "UPDATED", "MORADA", "CODIGOPOSTAL", "LOCALIDADE",
    "CONCELHO", "SERVICO", "CAE", "CTA", "ESTADOCIVIL", "CONJUGE", "DATANASCIMENTO", "NIB", "TERRITORIO", "TELEFONE",
    "EMAIL", "LASTSTATUS" };

void printFields(const NifFields &fields, QTextStream &out)
{
    QStringList order = KnownFields;
    QStringList others = fields.keys();
    others.sort();
    for (const QString &key : others) {
        if (!order.contains(key))
            order << key;
    }
    for (const QString &key : order) {
        if (!fields.value(key).isEmpty())
            out << key << ": " << QString(fields.value(key)).replace(u'\n', u' ') << '\n';
    }
}

} // namespace

// Looks a holder up through the sources a NIF control uses (stored answers, the directory
// file, and the EU's VAT service when the user allows remote lookups) and prints the record,
// one KEY: value a line. Exit 0 when found, 1 when not, 2 on a fault.
int runLookup(const QStringList &args, QTextStream &out, QTextStream &err)
{
    QString number;
    bool offline = false;
    bool refresh = false;
    for (const QString &arg : args) {
        if (arg == QLatin1String("--offline")) {
            offline = true;
        } else if (arg == QLatin1String("--refresh")) {
            refresh = true;
        } else if (number.isEmpty() && !arg.startsWith(u'-')) {
            number = arg.trimmed().toUpper();
        } else {
            err << "zelctl lookup: expected NUMBER [--offline] [--refresh]\n";
            return 2;
        }
    }
    if (number.isEmpty()) {
        err << "zelctl lookup: expected NUMBER [--offline] [--refresh]\n";
        return 2;
    }
    if (number.front().isDigit())
        number.prepend(QStringLiteral("PT"));

    LookupSettings settings = LookupSettings::fromUserSettings();
    settings.remoteAllowed = settings.remoteAllowed && !offline;
    settings.refresh = refresh;
    // The directory file lives in the application's root folder; a command run from
    // elsewhere must not make its own folder the root, so without one it is not read.
    if (zelctl::platform::GetSetting("zEL", "Setup", "RootPath").isEmpty())
        settings.order.removeAll(LookupSource::Directory);

    ChainedNIFGrabber grabber(settings);
    QEventLoop loop;
    QObject::connect(&grabber, &NIFGrabber::Finished, &loop, &QEventLoop::quit);
    grabber.Fetch(number);
    loop.exec();

    if (grabber.LastOutcome() == NifAnswer::Outcome::Found) {
        printFields(grabber.Fields(), out);
        return 0;
    }
    err << "zelctl lookup: " << number << ": " << grabber.GetField("STATUS") << '\n';
    return grabber.LastOutcome() == NifAnswer::Outcome::NotFound ? 1 : 2;
}

#include "Command.h"

#include "validation/nifValidator.h"

#include <QFile>

namespace {

bool isValid(QStringView country, QStringView number)
{
    using namespace zelctl::nifValidator;
    return CheckTaxNumber(number, CountryIndex(country));
}

const char *verdict(bool valid)
{
    return valid ? "valid" : "invalid";
}

// Reads CC<TAB>NUMBER lines from standard input and answers each with the line and its
// verdict. A malformed line gets an error on err and the run goes on; the exit code then
// tells that some line was skipped.
int runBatch(QTextStream &out, QTextStream &err)
{
    QFile in;
    if (!in.open(stdin, QIODevice::ReadOnly)) {
        err << "zelctl nif: cannot read standard input\n";
        return 2;
    }
    int malformed = 0;
    qint64 lineNumber = 0;
    QByteArray bytes;
    while (!(bytes = in.readLine()).isEmpty()) {
        ++lineNumber;
        if (bytes.endsWith('\n'))
            bytes.chop(1);
        if (bytes.endsWith('\r'))
            bytes.chop(1);
        const QString line = QString::fromUtf8(bytes);
        const qsizetype tab = line.indexOf(u'\t');
        if (tab < 0 || line.indexOf(u'\t', tab + 1) >= 0) {
            out.flush();
            err << "zelctl nif: line " << lineNumber << ": expected CC<TAB>NUMBER" << Qt::endl;
            ++malformed;
            continue;
        }
        const QStringView view(line);
        out << line << '\t' << verdict(isValid(view.first(tab), view.sliced(tab + 1))) << '\n';
    }
    return malformed == 0 ? 0 : 1;
}

} // namespace

// Checks tax numbers: one given as arguments (exit 0 when valid, 1 when not), or, with
// --batch, one per line of standard input.
int runNif(const QStringList &args, QTextStream &out, QTextStream &err)
{
    if (args == QStringList { "--batch" })
        return runBatch(out, err);
    if (args.size() != 2 || args.first().startsWith(u'-')) {
        err << "zelctl nif: expected CC NUMBER or --batch\n";
        return 2;
    }
    const bool valid = isValid(args.at(0), args.at(1));
    out << verdict(valid) << '\n';
    return valid ? 0 : 1;
}

#include "Command.h"

#include "validation/nifValidator.h"

#include <array>
#include <cerrno>
#include <cstring>
#include <utility>

#include <unistd.h>

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

// Longest line answered; a longer one is malformed and its bytes are not kept.
constexpr qsizetype MaxLineBytes = 1024;

// Answers CC<TAB>NUMBER lines with the line and its verdict. A malformed line gets an error
// on err and the run goes on; the exit code then tells that some line was not answered.
class BatchAnswers
{
public:
    BatchAnswers(QTextStream &out, QTextStream &err)
        : m_out(out)
        , m_err(err)
    { }

    // Bytes as they come; a line ends at each LF.
    void take(QByteArrayView bytes)
    {
        while (!bytes.isEmpty()) {
            const qsizetype end = bytes.indexOf('\n');
            append(end < 0 ? bytes : bytes.first(end));
            if (end < 0)
                return;
            answer();
            bytes = bytes.sliced(end + 1);
        }
    }

    // The last line, when the input does not end with a line feed.
    void finish()
    {
        if (!m_line.isEmpty() || m_tooLong)
            answer();
    }

    bool anyMalformed() const { return m_malformed > 0; }

private:
    void append(QByteArrayView part)
    {
        if (m_tooLong)
            return;
        if (m_line.size() + part.size() > MaxLineBytes + 1) {
            m_tooLong = true;
            m_line.clear();
            return;
        }
        m_line += part;
    }

    void answer()
    {
        ++m_lineNumber;
        QByteArray bytes = std::exchange(m_line, {});
        if (bytes.endsWith('\r'))
            bytes.chop(1);
        const QString line = QString::fromUtf8(bytes);
        const qsizetype tab = line.indexOf(u'\t');
        if (std::exchange(m_tooLong, false) || bytes.size() > MaxLineBytes)
            malformed(QStringLiteral("longer than %1 bytes").arg(MaxLineBytes));
        else if (bytes.contains('\0'))
            malformed(QStringLiteral("holds a NUL byte"));
        else if (tab < 0 || line.indexOf(u'\t', tab + 1) >= 0)
            malformed(QStringLiteral("expected CC<TAB>NUMBER"));
        else
            m_out << line << '\t' << verdict(isValid(QStringView(line).first(tab), QStringView(line).sliced(tab + 1)))
                  << '\n';
    }

    void malformed(const QString &why)
    {
        m_out.flush();
        m_err << "zelctl nif: line " << m_lineNumber << ": " << why << Qt::endl;
        ++m_malformed;
    }

    QTextStream &m_out;
    QTextStream &m_err;
    QByteArray m_line;
    bool m_tooLong = false;
    qint64 m_lineNumber = 0;
    qint64 m_malformed = 0;
};

// Standard input is read with read(2): a C stream's line reading stops at a NUL byte.
int runBatch(QTextStream &out, QTextStream &err)
{
    BatchAnswers answers(out, err);
    std::array<char, 64 * 1024> buffer;
    for (;;) {
        const ssize_t got = ::read(STDIN_FILENO, buffer.data(), buffer.size());
        if (got < 0 && errno == EINTR)
            continue;
        if (got < 0) {
            err << "zelctl nif: cannot read standard input: " << QString::fromLocal8Bit(std::strerror(errno)) << '\n';
            return 2;
        }
        if (got == 0)
            break;
        answers.take(QByteArrayView(buffer.data(), got));
    }
    answers.finish();
    return answers.anyMalformed() ? 1 : 0;
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

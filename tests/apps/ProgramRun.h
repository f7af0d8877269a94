#pragma once

#include <QByteArray>
#include <QString>
#include <QStringList>

namespace zelctl::test {

// How a program run ended.
struct ProgramRun
{
    // -1 when a signal ended it.
    int exitCode = -1;
    QByteArray out;
    QByteArray err;
    // The most memory any program run so far held at once (resident; under AddressSanitizer
    // its shadow too), so at least this run's peak.
    qint64 peakBytes = 0;
};

// The memory a command of the tool or the gallery may take on any input: the decoders'
// own caps and no more.
inline constexpr qint64 MemoryLimit = qint64(1536) << 20;

// Runs program with args and input on its standard input while this process's event loop
// turns (a test may serve the program from it), limited to MemoryLimit: a program that goes
// beyond ends with an error instead of its own answer.
ProgramRun runProgram(const QString &program, const QStringList &args, const QByteArray &input = {});

inline ProgramRun runCli(const QStringList &args, const QByteArray &input = {})
{
    return runProgram(QStringLiteral(ZELCTL_CLI_FILE), args, input);
}

// Runs a shell command line the same way; "$0" in it is the zelctl tool.
inline ProgramRun runShell(const QString &commandLine)
{
    return runProgram(
        QStringLiteral("/bin/sh"), { QStringLiteral("-c"), commandLine, QStringLiteral(ZELCTL_CLI_FILE) });
}

} // namespace zelctl::test

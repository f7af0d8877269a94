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
    // The most memory it held at once (resident; under AddressSanitizer its shadow too).
    qint64 peakBytes = 0;
};

// The memory a command of the tool or the gallery may take on any input: the decoders'
// own caps and no more.
inline constexpr qint64 MemoryLimit = qint64(1536) << 20;

// Runs program with args and standard input from stdinPath, limited to MemoryLimit: its
// address space by setrlimit, or, in a build with AddressSanitizer (which reserves terabytes
// of address space for its shadow), its resident memory through the sanitizer's own limit.
// A program that goes beyond ends with an error instead of its own answer.
ProgramRun runLimited(const QString &program, const QStringList &args, const QString &stdinPath = "/dev/null");

// Runs a shell command line the same way; "$0" in it is the zelctl tool.
ProgramRun runShellLimited(const QString &commandLine);

} // namespace zelctl::test

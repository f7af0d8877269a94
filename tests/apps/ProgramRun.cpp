#include "ProgramRun.h"

#include <QFile>
#include <QTemporaryDir>

#include <gtest/gtest.h>

#include <vector>

#include <fcntl.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

extern char **environ;

namespace zelctl::test {

namespace {

#if defined(__SANITIZE_ADDRESS__)
constexpr bool Sanitized = true;
#elif defined(__has_feature)
#if __has_feature(address_sanitizer)
constexpr bool Sanitized = true;
#else
constexpr bool Sanitized = false;
#endif
#else
constexpr bool Sanitized = false;
#endif

QByteArray contentOf(const QString &path)
{
    QFile file(path);
    return file.open(QIODevice::ReadOnly) ? file.readAll() : QByteArray();
}

} // namespace

ProgramRun runLimited(const QString &program, const QStringList &args, const QString &stdinPath)
{
    QTemporaryDir dir;
    const QByteArray outPath = QFile::encodeName(dir.filePath("out"));
    const QByteArray errPath = QFile::encodeName(dir.filePath("err"));
    const QByteArray inPath = QFile::encodeName(stdinPath);

    // Everything the child needs is built before fork: after it only system calls run.
    std::vector<QByteArray> argStore { QFile::encodeName(program) };
    for (const QString &arg : args)
        argStore.push_back(arg.toLocal8Bit());
    std::vector<char *> argv;
    for (QByteArray &arg : argStore)
        argv.push_back(arg.data());
    argv.push_back(nullptr);
    std::vector<QByteArray> envStore;
    for (char **entry = environ; *entry; ++entry) {
        if (!QByteArray(*entry).startsWith("ASAN_OPTIONS="))
            envStore.emplace_back(*entry);
    }
    // Without one, Qt warns on standard error, which must hold the program's own lines only.
    if (qEnvironmentVariableIsEmpty("XDG_RUNTIME_DIR"))
        envStore.push_back("XDG_RUNTIME_DIR=" + QFile::encodeName(dir.path()));
    if (Sanitized) {
        envStore.push_back(
            "ASAN_OPTIONS=" + qgetenv("ASAN_OPTIONS") + ":hard_rss_limit_mb=" + QByteArray::number(MemoryLimit >> 20));
    }
    std::vector<char *> envp;
    for (QByteArray &entry : envStore)
        envp.push_back(entry.data());
    envp.push_back(nullptr);

    const pid_t pid = ::fork();
    if (pid == 0) {
        const int in = ::open(inPath.constData(), O_RDONLY);
        const int out = ::open(outPath.constData(), O_WRONLY | O_CREAT | O_TRUNC, 0600);
        const int err = ::open(errPath.constData(), O_WRONLY | O_CREAT | O_TRUNC, 0600);
        if (in < 0 || out < 0 || err < 0 || ::dup2(in, 0) < 0 || ::dup2(out, 1) < 0 || ::dup2(err, 2) < 0)
            ::_exit(126);
        if (!Sanitized) {
            const rlimit limit { rlim_t(MemoryLimit), rlim_t(MemoryLimit) };
            ::setrlimit(RLIMIT_AS, &limit);
        }
        ::execve(argv[0], argv.data(), envp.data());
        ::_exit(127);
    }
    ProgramRun run;
    if (pid < 0) {
        ADD_FAILURE() << "fork failed";
        return run;
    }
    int status = 0;
    rusage usage {};
    if (::wait4(pid, &status, 0, &usage) != pid) {
        ADD_FAILURE() << "wait4 failed";
        return run;
    }
    run.exitCode = WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    run.out = contentOf(dir.filePath("out"));
    run.err = contentOf(dir.filePath("err"));
    run.peakBytes = qint64(usage.ru_maxrss) * 1024;
    return run;
}

ProgramRun runShellLimited(const QString &commandLine)
{
    return runLimited(
        QStringLiteral("/bin/sh"), { QStringLiteral("-c"), commandLine, QStringLiteral(ZELCTL_CLI_FILE) });
}

} // namespace zelctl::test

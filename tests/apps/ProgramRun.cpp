#include "ProgramRun.h"

#include <QProcess>
#include <QTemporaryDir>
#include <QTest>

#include <gtest/gtest.h>

#include <sys/resource.h>

namespace zelctl::test {

ProgramRun runProgram(const QString &program, const QStringList &args, const QByteArray &input)
{
    QProcess process;
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    // Without one, Qt warns on standard error, which must hold the program's own lines only.
    const QTemporaryDir runtime;
    if (!environment.contains(QStringLiteral("XDG_RUNTIME_DIR")))
        environment.insert(QStringLiteral("XDG_RUNTIME_DIR"), runtime.path());
#if defined(__SANITIZE_ADDRESS__)
    // The sanitizer reserves terabytes of address space for its shadow: its own limit bounds
    // the resident memory instead.
    environment.insert(QStringLiteral("ASAN_OPTIONS"),
        environment.value(QStringLiteral("ASAN_OPTIONS"))
            + QStringLiteral(":hard_rss_limit_mb=%1").arg(MemoryLimit >> 20));
#else
    process.setChildProcessModifier([] {
        const rlimit limit { rlim_t(MemoryLimit), rlim_t(MemoryLimit) };
        ::setrlimit(RLIMIT_AS, &limit);
    });
#endif
    process.setProcessEnvironment(environment);
    process.start(program, args);
    EXPECT_TRUE(process.waitForStarted());
    process.write(input);
    process.closeWriteChannel();
    EXPECT_TRUE(QTest::qWaitFor([&] { return process.state() == QProcess::NotRunning; }, 120000));
    rusage usage {};
    ::getrusage(RUSAGE_CHILDREN, &usage);
    return { process.exitStatus() == QProcess::NormalExit ? process.exitCode() : -1, process.readAllStandardOutput(),
        process.readAllStandardError(), qint64(usage.ru_maxrss) * 1024 };
}

} // namespace zelctl::test

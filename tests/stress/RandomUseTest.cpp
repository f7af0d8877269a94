// The stress host over every class the library serves: random episodes, each from its own
// seed, for a budget of seconds shared among the classes (ZELCTL_STRESS_SECONDS, 12 by
// default; ZELCTL_STRESS_SEED picks another series). ZELCTL_STRESS_REPLAY=Class:seed
// replays one episode and prints its steps as they run.

#include "StressHost.h"

#include "frame/ClassRegistry.h"

#include <QElapsedTimer>

#include <gtest/gtest.h>

#include <cstdio>

using namespace zelctl;
using namespace zelctl::stress;

namespace {

quint64 mix(quint64 value)
{
    // splitmix64: neighbouring inputs give unrelated seeds.
    value += 0x9E3779B97F4A7C15ull;
    value = (value ^ (value >> 30)) * 0xBF58476D1CE4E5B9ull;
    value = (value ^ (value >> 27)) * 0x94D049BB133111EBull;
    return value ^ (value >> 31);
}

int stepsFor(quint64 seed)
{
    return 50 + int(seed % 350);
}

QString faultsOf(const EpisodeResult &result)
{
    return result.faults.join(QStringLiteral("; ")) + QLatin1Char('\n') + Journal::current().replay();
}

class RandomUse : public ::testing::TestWithParam<std::string>
{ };

} // namespace

TEST_P(RandomUse, aCarelessHostBreaksNothing)
{
    const QString name = QString::fromStdString(GetParam());
    const QByteArray replay = qgetenv("ZELCTL_STRESS_REPLAY");
    if (!replay.isEmpty()) {
        if (replay.split(':').value(0) != name.toLatin1())
            GTEST_SKIP() << "replaying another class";
        const quint64 seed = replay.split(':').value(1).toULongLong();
        Journal::current().setEcho(true);
        const EpisodeResult result = runEpisode(name, seed, stepsFor(seed));
        EXPECT_TRUE(result.faults.isEmpty()) << qPrintable(faultsOf(result));
        return;
    }

    const std::vector<std::string> classes = servedClasses();
    const qint64 budget = qEnvironmentVariableIntValue("ZELCTL_STRESS_SECONDS") > 0
        ? qEnvironmentVariableIntValue("ZELCTL_STRESS_SECONDS") * 1000ll / qint64(classes.size())
        : 12000 / qint64(classes.size());
    const quint64 series
        = qEnvironmentVariableIsSet("ZELCTL_STRESS_SEED") ? qgetenv("ZELCTL_STRESS_SEED").toULongLong() : 1;
    const quint64 classIndex = quint64(std::find(classes.begin(), classes.end(), GetParam()) - classes.begin());

    QElapsedTimer clock;
    clock.start();
    int episodes = 0, steps = 0, failures = 0;
    for (quint64 k = 0; episodes == 0 || clock.elapsed() < budget; ++k) {
        const quint64 seed = mix(mix(series) ^ (classIndex << 32) ^ k) >> 16;
        const EpisodeResult result = runEpisode(name, seed, stepsFor(seed));
        ++episodes;
        steps += result.stepsRun;
        if (!result.faults.isEmpty() && ++failures <= 3)
            ADD_FAILURE() << qPrintable(faultsOf(result));
    }
    std::printf("[ stress   ] %s: %d episodes, %d steps, series %llu\n", GetParam().c_str(), episodes, steps,
        static_cast<unsigned long long>(series));
}

INSTANTIATE_TEST_SUITE_P(EveryClass, RandomUse, ::testing::ValuesIn(servedClasses()),
    [](const ::testing::TestParamInfo<std::string> &info) { return info.param; });

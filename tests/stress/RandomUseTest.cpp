// The stress host over every class the library serves: random episodes, each from its own
// seed, for a budget of seconds shared among the classes (ZELCTL_STRESS_SECONDS, 12 by
// default; ZELCTL_STRESS_SEED picks another series). ZELCTL_STRESS_REPLAY=Class:seed
// replays one episode and prints its steps as they run.

#include "StressHost.h"

#include <QElapsedTimer>

#include <gtest/gtest.h>

#include <cstdio>
#include <random>

using namespace zelctl::stress;

using RandomUse = ::testing::TestWithParam<std::string>;

TEST_P(RandomUse, aCarelessHostBreaksNothing)
{
    const QString name = QString::fromStdString(GetParam());
    const QList<QByteArray> replaying = qgetenv("ZELCTL_STRESS_REPLAY").split(':');
    if (replaying.size() == 2 && replaying[0] != name.toLatin1())
        GTEST_SKIP() << "replaying another class";
    const std::vector<std::string> classes = servedClasses();
    const int seconds = qEnvironmentVariableIntValue("ZELCTL_STRESS_SECONDS");
    const qint64 budget = (seconds > 0 ? seconds : 12) * 1000ll / qint64(classes.size());
    const quint64 series
        = qEnvironmentVariableIsSet("ZELCTL_STRESS_SEED") ? qgetenv("ZELCTL_STRESS_SEED").toULongLong() : 1;
    // Neighbouring series and classes give unrelated seeds.
    std::mt19937_64 seeds(
        series * classes.size() + size_t(std::find(classes.begin(), classes.end(), GetParam()) - classes.begin()));

    QElapsedTimer clock;
    clock.start();
    int episodes = 0, steps = 0, failures = 0;
    for (; episodes == 0 || (replaying.size() != 2 && clock.elapsed() < budget); ++episodes) {
        const quint64 seed = replaying.size() == 2 ? replaying[1].toULongLong() : seeds() >> 16;
        QString failure;
        steps += runEpisode(name, seed, 50 + int(seed % 350), replaying.size() == 2, failure);
        if (!failure.isEmpty() && ++failures <= 3)
            ADD_FAILURE() << qPrintable(failure);
    }
    std::printf("[ stress   ] %s: %d episodes, %d steps, series %llu\n", GetParam().c_str(), episodes, steps,
        static_cast<unsigned long long>(series));
}

INSTANTIATE_TEST_SUITE_P(EveryClass, RandomUse, ::testing::ValuesIn(servedClasses()),
    [](const ::testing::TestParamInfo<std::string> &info) { return info.param; });

// The offline cache of NIF lookups: freshness, standing in for the network, sharing, damage.

#include "LookupTestSupport.h"

#include <QDir>
#include <QFile>
#include <QProcess>
#include <QTest>

using namespace zelctl;
using namespace zelctl::companion;
using namespace zelctl::test;

namespace {

using Reply = FakeHttpServer::Reply;
using NifCacheLookup = LookupFixture;

const NifFields OldRecord { { "NAME", "NOME ANTIGO" }, { "SOURCE", "Serviço de IVA da Comissão Europeia" },
    { "STATUS", "Válido" } };

QString writerNumber(const QString &prefix, int i)
{
    return QStringLiteral("PT%1%2").arg(prefix).arg(i, 8, 10, QLatin1Char('0'));
}

} // namespace

TEST_F(NifCacheLookup, aStoredAnswerIsGivenWhileFreshAndStandsInWhenTheNetworkFails)
{
    const QString staleDay = QDateTime::currentDateTimeUtc().addDays(-31).toLocalTime().date().toString(Qt::ISODate);
    const QString stale = "Desatualizado, guardado em " + staleDay + ": ";
    const Reply newHolder = FakeHttpServer::holder("NOME NOVO", "1000-001 LISBOA");
    const struct
    {
        const char *when;
        int age;
        Reply reply;
        bool remote;
        QString name, status;
        int asked;
    } cases[] = {
        { "fresh", 29, newHolder, true, "NOME ANTIGO", "Válido", 0 },
        { "stale, the network up", 31, newHolder, true, "NOME NOVO", "Válido", 1 },
        { "stale, the member state down", 31, FakeHttpServer::userError("MS_UNAVAILABLE"), true, "NOME ANTIGO",
            stale + "Serviço do Estado-membro indisponível (MS_UNAVAILABLE)", 1 },
        { "stale, remote lookups off", 31, newHolder, false, "NOME ANTIGO", stale + "consultas remotas desligadas", 0 },
    };
    for (const auto &c : cases) {
        SCOPED_TRACE(c.when);
        LookupSettings lookup = settings();
        lookup.remoteAllowed = c.remote;
        const std::shared_ptr<NifCache> cache = NifCache::open(lookup.cacheFile);
        ASSERT_TRUE(cache->store(UnknownHolder, { true, OldRecord, QDateTime::currentDateTimeUtc().addDays(-c.age) }));
        service.answerWith(c.reply);
        const qsizetype asked = service.requests().size();

        ChainedNIFGrabber grabber(lookup);
        EXPECT_EQ(fetch(grabber, UnknownHolder),
            QStringList({ "Starting", "ReceivedInformation:" + UnknownHolder, "Finished" }));
        EXPECT_EQ(service.requests().size() - asked, c.asked);
        EXPECT_EQ(grabber.HolderName(), c.name);
        EXPECT_EQ(grabber.GetField("STATUS"), c.status) << grabber.GetField("STATUS").toStdString();
        EXPECT_EQ(grabber.GetField("SOURCE").startsWith("Cache local ("), c.name == "NOME ANTIGO");
        EXPECT_EQ(cache->find(UnknownHolder)->fields.value("NAME"), c.name) << "a new answer replaces the old";
    }
}

TEST_F(NifCacheLookup, directoryAnswersAndRefusalsAreStoredForEveryFetcherOfTheProcess)
{
    LookupSettings lookup = settings();
    ChainedNIFGrabber first(lookup);
    fetch(first, DirectoryHolder);
    EXPECT_EQ(first.GetField("SOURCE"), "Diretório local");
    lookup.directoryFile = folder.filePath("gone.json");
    ChainedNIFGrabber second(lookup);
    fetch(second, DirectoryHolder);
    EXPECT_EQ(second.HolderName(), "ANA MARIA FERREIRA LOPES");
    EXPECT_EQ(second.GetField("SOURCE"), "Cache local (Diretório local)");

    // A number the service does not know beats a stale record, and is remembered.
    ASSERT_TRUE(NifCache::open(lookup.cacheFile)
                    ->store(UnknownHolder, { true, OldRecord, QDateTime::currentDateTimeUtc().addDays(-31) }));
    service.answerWith({ 200, R"({"valid":false})" });
    EXPECT_EQ(fetch(second, UnknownHolder), QStringList({ "Starting", "Finished" }));
    EXPECT_EQ(second.LastOutcome(), NifAnswer::Outcome::NotFound);
    EXPECT_EQ(second.GetField("STATUS"), "Não registado no serviço de IVA");
    service.answerWith(FakeHttpServer::holder("NÃO DEVIA", ""));
    EXPECT_EQ(fetch(second, UnknownHolder), QStringList({ "Starting", "Finished" }));
    EXPECT_EQ(service.requests().size(), 1) << "the stored refusal stands for the service while fresh";
}

TEST(NifCacheFile, aDamagedFileIsSetAsideAndANewOneMade)
{
    // Where 4 KiB are overwritten, in halves of the file; -1 cuts the file in half instead.
    const std::pair<const char *, int> damages[] = { { "truncated to half", -1 },
        { "a page overwritten, the size unchanged", 1 }, { "its header overwritten", 0 } };
    for (const auto &[damage, half] : damages) {
        SCOPED_TRACE(damage);
        QTemporaryDir folder;
        QFile file(folder.filePath("nifcache.sqlite"));
        const QDateTime now = QDateTime::currentDateTimeUtc();
        {
            const std::shared_ptr<NifCache> cache = NifCache::open(file.fileName());
            for (int i = 0; i < 300; ++i)
                cache->store(writerNumber("9", i), { true, OldRecord, now });
        }
        ASSERT_TRUE(file.open(QIODevice::ReadWrite));
        if (half < 0)
            file.resize(file.size() / 2);
        else if (file.seek(half * file.size() / 2))
            file.write(QByteArray(4096, '\xff'));
        file.close();

        const std::shared_ptr<NifCache> cache = NifCache::open(file.fileName());
        EXPECT_TRUE(QFile::exists(cache->setAsideFile())) << "the damaged file is kept for a look";
        EXPECT_FALSE(cache->find(writerNumber("9", 0)).has_value());
        EXPECT_TRUE(cache->store(UnknownHolder, { true, OldRecord, now }));
        EXPECT_TRUE(cache->find(UnknownHolder).has_value());
    }
}

TEST(NifCacheFile, twoProcessesWritingAtOnceLoseNothing)
{
    QTemporaryDir folder;
    const QString path = folder.filePath("shared.sqlite");
    QProcess writers[2];
    const QString prefixes[2] = { "1", "2" };
    for (int w = 0; w < 2; ++w) {
        QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
        environment.insert("ZELCTL_CACHE_WRITER", path + '|' + prefixes[w] + '|' + folder.path());
        writers[w].setProcessEnvironment(environment);
        writers[w].setProcessChannelMode(QProcess::ForwardedChannels);
        writers[w].start(QCoreApplication::applicationFilePath(),
            { "--gtest_filter=NifCacheWriter.DISABLED_writesItsShare", "--gtest_also_run_disabled_tests" });
    }
    for (QProcess &writer : writers) {
        ASSERT_TRUE(writer.waitForFinished(180000));
        EXPECT_TRUE(writer.exitStatus() == QProcess::NormalExit && writer.exitCode() == 0);
    }
    const std::shared_ptr<NifCache> cache = NifCache::open(path);
    int readable = 0;
    for (const QString &prefix : prefixes) {
        for (int i = 0; i < 1000; ++i) {
            const std::optional<NifCache::Entry> entry = cache->find(writerNumber(prefix, i));
            readable += entry && entry->fields.value("NAME") == writerNumber(prefix, i);
        }
    }
    EXPECT_EQ(readable, 2000);
}

// One writer of the test above, run as a child process of it.
TEST(NifCacheWriter, DISABLED_writesItsShare)
{
    const QStringList task = qEnvironmentVariable("ZELCTL_CACHE_WRITER").split('|');
    ASSERT_EQ(task.size(), 3) << "run by twoProcessesWritingAtOnceLoseNothing";
    const QString &path = task[0], &prefix = task[1], &folder = task[2];
    // Both writers open the file and write together, however long each took to start.
    QFile ready(folder + "/ready-" + prefix);
    ASSERT_TRUE(ready.open(QIODevice::WriteOnly));
    ASSERT_TRUE(QTest::qWaitFor([&] { return QDir(folder).entryList({ "ready-*" }, QDir::Files).size() == 2; }, 60000));
    const std::shared_ptr<NifCache> cache = NifCache::open(path);
    ASSERT_TRUE(cache->isUsable());
    for (int i = 0; i < 1000; ++i) {
        const QString number = writerNumber(prefix, i);
        ASSERT_TRUE(cache->store(number, { true, { { "NAME", number } }, QDateTime::currentDateTimeUtc() })) << i;
    }
}

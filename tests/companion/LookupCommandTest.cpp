// `zelctl lookup`, run as a user runs it, against the fake service.

#include "LookupTestSupport.h"

#include <QProcess>
#include <QRegularExpression>
#include <QTest>

using namespace zelctl::test;

namespace {

struct CommandRun
{
    int exitCode = -1;
    QString out;
    QString err;
};

class LookupCommand : public LookupFixture
{
protected:
    // Runs the command while this process serves the fake service (its event loop must
    // turn, so the run is awaited, not blocked on).
    CommandRun lookup(const QStringList &args)
    {
        QProcess process;
        process.start(ZELCTL_CLI_FILE, QStringList { "lookup" } + args);
        EXPECT_TRUE(QTest::qWaitFor([&] { return process.state() == QProcess::NotRunning; }, 30000));
        return { process.exitStatus() == QProcess::NormalExit ? process.exitCode() : -1,
            QString::fromUtf8(process.readAllStandardOutput()), QString::fromUtf8(process.readAllStandardError()) };
    }
};

// A number nobody else in this program looks up, so the user's cache holds only what these
// runs stored.
const QString Number = QStringLiteral("PT505678900");

} // namespace

TEST_F(LookupCommand, printsTheRecordAndTellsFoundNotFoundAndFaultApart)
{
    service.answerWith(FakeVatService::userError("MS_UNAVAILABLE"));
    CommandRun run = lookup({ Number });
    EXPECT_EQ(run.exitCode, 2);
    EXPECT_EQ(run.out, "");
    EXPECT_EQ(run.err, "zelctl lookup: PT505678900: Serviço do Estado-membro indisponível (MS_UNAVAILABLE)\n");

    service.answerWith(FakeVatService::holder("ANA DIAS", R"(RUA A 1\n4700-320 BRAGA)"));
    run = lookup({ Number.mid(2) });
    EXPECT_EQ(run.exitCode, 0) << "a bare number is Portuguese";
    EXPECT_TRUE(run.out.startsWith("ID: PT505678900\nNAME: ANA DIAS\nSOURCE: Serviço de IVA da Comissão Europeia\n"))
        << run.out.toStdString();
    EXPECT_TRUE(run.out.contains("\nCODIGOPOSTAL: 4700-320\nLOCALIDADE: BRAGA\n"));
    EXPECT_TRUE(QRegularExpression("^([A-Z]+: [^\n]+\n)+$").match(run.out).hasMatch());
    EXPECT_EQ(service.requests().size(), 2);

    run = lookup({ "--offline", Number });
    EXPECT_EQ(run.exitCode, 0);
    EXPECT_TRUE(run.out.contains("SOURCE: Cache local (Serviço de IVA da Comissão Europeia)\n"));
    run = lookup({ Number, "--refresh" });
    EXPECT_EQ(run.exitCode, 0);
    EXPECT_EQ(service.requests().size(), 3) << "--offline asked nothing, --refresh asked again";

    run = lookup({ "--offline", "PT999999990" });
    EXPECT_EQ(run.exitCode, 1);
    EXPECT_EQ(
        run.err, "zelctl lookup: PT999999990: Sem dados locais sobre este número (consultas remotas desligadas)\n");

    EXPECT_EQ(lookup({ "--offline", DirectoryHolder }).exitCode, 0) << "the directory file answers offline";
    EXPECT_EQ(lookup({}).exitCode, 2);
    EXPECT_EQ(lookup({ Number, "--fast" }).exitCode, 2);
    EXPECT_EQ(lookup({ "PT12;DROP" }).exitCode, 2);
}

#include "companion/DirectoryNIFGrabber.h"
#include "companion/JsonDeclaration.h"

#include "support/TestSupport.h"

#include <QFileInfo>
#include <QSignalSpy>
#include <QTemporaryDir>
#include <QTest>

#include <gtest/gtest.h>

#include <sys/stat.h>

using namespace zelctl;
using namespace zelctl::companion;

namespace {

// Records the fetcher's signals in the order they arrive.
struct EventLog
{
    explicit EventLog(NIFGrabber &grabber)
    {
        QObject::connect(&grabber, &NIFGrabber::Starting, [this] { events << "Starting"; });
        QObject::connect(&grabber, &NIFGrabber::ReceivedInformation,
            [this](const QString &id) { events << "ReceivedInformation:" + id; });
        QObject::connect(&grabber, &NIFGrabber::Finished, [this] { events << "Finished"; });
    }
    QStringList events;
};

} // namespace

TEST(DirectoryNIFGrabber, answersLaterAndInOrderForAKnownHolder)
{
    DirectoryNIFGrabber grabber(test::sourcePath("data/contribuintes.json"));
    EventLog log(grabber);
    grabber.Fetch("PT210345675");
    EXPECT_TRUE(grabber.IsBusy());
    EXPECT_TRUE(log.events.isEmpty()) << "Fetch returns before anything is answered";
    grabber.Fetch("PT198765436");
    ASSERT_TRUE(QTest::qWaitFor([&] { return !grabber.IsBusy(); }));
    EXPECT_EQ(log.events, QStringList({ "Starting", "ReceivedInformation:PT210345675", "Finished" }))
        << "a second fetch while busy is not started";
    EXPECT_EQ(grabber.HolderName(), "ANA MARIA FERREIRA LOPES");
    EXPECT_EQ(grabber.GetField("ID"), "PT210345675");
    EXPECT_EQ(grabber.GetField("concelho"), "Lisboa") << "keys are compared without regard to case";
    EXPECT_EQ(grabber.GetField("NOSUCHKEY"), "");
}

TEST(DirectoryNIFGrabber, finishesAlsoWhenNothingIsFound)
{
    DirectoryNIFGrabber grabber(test::sourcePath("data/contribuintes.json"));
    grabber.SetField("nome", "antes");
    EventLog log(grabber);
    grabber.Fetch("PT999999990");
    ASSERT_TRUE(QTest::qWaitFor([&] { return !grabber.IsBusy(); }));
    EXPECT_EQ(log.events, QStringList({ "Starting", "Finished" }));
    EXPECT_EQ(grabber.GetField("NOME"), "") << "the fields answer for the last fetch, which found nothing";

    // A directory that is missing, a FIFO (which would block the reading thread) or a
    // device (which would fill the memory) answers nothing.
    QTemporaryDir dir;
    const QString fifo = dir.filePath("contribuintes.json");
    ASSERT_EQ(::mkfifo(QFile::encodeName(fifo).constData(), 0600), 0);
    for (const QString &path :
        { QStringLiteral("/nonexistent/contribuintes.json"), fifo, QStringLiteral("/dev/zero") }) {
        DirectoryNIFGrabber unreadable(path);
        EventLog unreadableLog(unreadable);
        unreadable.Fetch("PT210345675");
        ASSERT_TRUE(QTest::qWaitFor([&] { return !unreadable.IsBusy(); })) << path.toStdString();
        EXPECT_EQ(unreadableLog.events, QStringList({ "Starting", "Finished" }));
    }
}

TEST(DirectoryNIFGrabber, factoryCanBeReplacedByTheHost)
{
    NIFGrabber *made = nullptr;
    NIFGrabberFactory previous = setNIFGrabberFactory([&](QObject *parent) {
        made = new DirectoryNIFGrabber("/elsewhere.json", parent);
        return made;
    });
    QObject owner;
    EXPECT_EQ(createNIFGrabber(&owner), made);
    setNIFGrabberFactory(std::move(previous));
    NIFGrabber *standard = createNIFGrabber(&owner);
    EXPECT_NE(standard, made);
    EXPECT_EQ(standard->parent(), &owner);
}

TEST(JsonDeclaration, answersTheQuestionsOfTheControls)
{
    JsonDeclaration declaration;
    ASSERT_TRUE(declaration.load(test::sourcePath("data/declaracao.json")));
    DeclarationData &data = declaration.DeclarationData();
    EXPECT_EQ(data.FieldStore().Lookup("casado").toString(), "1");
    EXPECT_EQ(data.FieldStore().Lookup("herancas").toString(), "1");
    EXPECT_EQ(data.FieldStore().Lookup("nothing").toString(), "");
    EXPECT_EQ(data.Dependants(), 2);
    EXPECT_EQ(data.Ascendants(), 1);
    EXPECT_EQ(data.Estates(), 1);
    EXPECT_EQ(data.SubjectNif("D2"), "PT246813571");
    EXPECT_EQ(data.SubjectName("D3"), "");
    EXPECT_EQ(data.SubjectNif("S1"), "PT182937461");
    EXPECT_EQ(data.NifInfoStore().Read("PT182937461.nome").toString(), QString::fromUtf8("MARIA DA CONCEIÇÃO FERREIRA"))
        << "records are kept under country code and number, as the NIF control keys them";
    EXPECT_EQ(data.NifInfoStore().Read("absent").toString(), "");
    EXPECT_EQ(data.GetSujeitoTitle("D2"), "Dependente 2");
    EXPECT_EQ(data.GetSujeitoTitle("H1"), QString::fromUtf8("Herança 1"));
}

TEST(JsonDeclaration, savesWhatItHoldsAndRejectsBadFilesWithoutLosingData)
{
    QTemporaryDir dir;
    JsonDeclaration declaration;
    ASSERT_TRUE(declaration.load(test::sourcePath("data/declaracao.json")));
    declaration.DeclarationData().NifInfoStore().Write("PT210345675.telefone", "210000000");
    FieldCollection &fields = declaration.DeclarationData().FieldStore();
    fields.Set("obito", "1");
    fields.Add("casado", "0");
    fields.Add("anexo", "B");
    ASSERT_TRUE(declaration.save(dir.filePath("d.json")));

    JsonDeclaration reloaded;
    ASSERT_TRUE(reloaded.load(dir.filePath("d.json")));
    EXPECT_EQ(reloaded.DeclarationData().NifInfoStore().Read("PT210345675.telefone").toString(), "210000000");
    QStringList saved;
    for (const FieldCollection::Item &item : reloaded.DeclarationData().FieldStore().items())
        saved << item.id + '=' + item.value.toString();
    EXPECT_EQ(saved,
        QStringList({ "casado=1", "dependentes=2", "ascendentes=1", "obito=1", "herancas=1", "casado=0", "anexo=B" }))
        << "the fields keep their order and their repeated ids";
    EXPECT_EQ(reloaded.DeclarationData().SubjectName("A"), "ANA MARIA FERREIRA LOPES");

    QFile broken(dir.filePath("broken.json"));
    ASSERT_TRUE(broken.open(QIODevice::WriteOnly));
    broken.write("{ not json");
    broken.close();
    const QString fifo = dir.filePath("fifo.json");
    ASSERT_EQ(::mkfifo(QFile::encodeName(fifo).constData(), 0600), 0);
    for (const QString &path : { broken.fileName(), dir.filePath("missing.json"), fifo, QStringLiteral("/dev/zero") })
        EXPECT_FALSE(reloaded.load(path)) << path.toStdString();
    EXPECT_FALSE(reloaded.save(fifo)) << "a save never replaces a FIFO";
    EXPECT_TRUE(QFileInfo(fifo).exists() && !QFileInfo(fifo).isFile());
    EXPECT_EQ(reloaded.DeclarationData().Dependants(), 2) << "a failed load keeps the declaration";
}

TEST(JsonDeclaration, readsOlderFilesWithNumbersWithoutTheirCode)
{
    QTemporaryDir dir;
    QFile old(dir.filePath("old.json"));
    ASSERT_TRUE(old.open(QIODevice::WriteOnly));
    old.write(R"({ "fields": { "casado": "1" },
                   "subjects": { "S1": { "nif": "182937461" }, "D1": { "nif": "ES12345678Z" } },
                   "nifInfo": { "182937461.nome": "MARIA", "ES12345678Z.nome": "JUAN" } })");
    old.close();
    JsonDeclaration declaration;
    ASSERT_TRUE(declaration.load(old.fileName()));
    DeclarationData &data = declaration.DeclarationData();
    EXPECT_EQ(data.FieldStore().Lookup("casado").toString(), "1");
    EXPECT_EQ(data.SubjectNif("S1"), "PT182937461");
    EXPECT_EQ(data.NifInfoStore().Read("PT182937461.nome").toString(), "MARIA");
    EXPECT_EQ(data.SubjectNif("D1"), "ES12345678Z");
    EXPECT_EQ(data.NifInfoStore().Read("ES12345678Z.nome").toString(), "JUAN");
}

TEST(FieldCollection, keepsInsertionOrderAndFindsTheFirst)
{
    FieldCollection fields;
    fields.Add("email", "");
    fields.Add("nome", "x");
    fields.Add("email", "second");
    EXPECT_EQ(fields.Count(), 3);
    EXPECT_EQ(fields.items().at(1).id, "nome");
    EXPECT_EQ(fields.Lookup("email").toString(), "");
    fields.Set("email", "first");
    EXPECT_EQ(fields.Lookup("email").toString(), "first");
    EXPECT_EQ(fields.Count(), 3);
}

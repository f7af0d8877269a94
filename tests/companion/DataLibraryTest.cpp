#include "LookupTestSupport.h"

#include "companion/DirectoryNIFGrabber.h"
#include "companion/JsonDeclaration.h"

#include "support/TestSupport.h"

#include <QFileInfo>

using namespace zelctl;
using namespace zelctl::companion;
using namespace zelctl::test;

TEST(DirectoryNIFGrabber, answersLaterInOrderAndFinishesAlsoWhenNothingIsFoundOrTheFileIsUnreadable)
{
    DirectoryNIFGrabber grabber(sourcePath("data/contribuintes.json"));
    EXPECT_EQ(fetch(grabber, DirectoryHolder, "PT198765436"),
        QStringList({ "Starting", "ReceivedInformation:" + DirectoryHolder, "Finished" }))
        << "a second fetch while busy is not started";
    EXPECT_EQ(grabber.HolderName(), "ANA MARIA FERREIRA LOPES");
    EXPECT_EQ(grabber.GetField("ID"), DirectoryHolder);
    EXPECT_EQ(grabber.GetField("concelho"), "Lisboa") << "keys are compared without regard to case";
    EXPECT_EQ(grabber.GetField("NOSUCHKEY"), "");
    EXPECT_EQ(fetch(grabber, "PT999999990"), QStringList({ "Starting", "Finished" }));
    EXPECT_EQ(grabber.GetField("NOME"), "") << "the fields answer for the last fetch, which found nothing";

    // A FIFO would block the reading thread, a device would fill the memory.
    QTemporaryDir dir;
    makeFifo(dir.filePath("fifo.json"));
    for (const QString &path :
        { QString("/nonexistent/contribuintes.json"), dir.filePath("fifo.json"), QString("/dev/zero") }) {
        DirectoryNIFGrabber unreadable(path);
        EXPECT_EQ(fetch(unreadable, DirectoryHolder), QStringList({ "Starting", "Finished" })) << path.toStdString();
    }
}

TEST(DirectoryNIFGrabber, factoryCanBeReplacedByTheHost)
{
    NIFGrabber *made = nullptr;
    NIFGrabberFactory previous = setNIFGrabberFactory(
        [&](QObject *parent) { return made = new DirectoryNIFGrabber("/elsewhere.json", parent); });
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
    ASSERT_TRUE(declaration.load(sourcePath("data/declaracao.json")));
    DeclarationData &data = declaration.DeclarationData();
    const FieldCollection &fields = data.FieldStore();
    EXPECT_EQ(QStringList({ fields.Lookup("casado").toString(), fields.Lookup("herancas").toString(),
                  fields.Lookup("nothing").toString() }),
        QStringList({ "1", "1", "" }));
    EXPECT_EQ(QList<int>({ data.Dependants(), data.Ascendants(), data.Estates() }), QList<int>({ 2, 1, 1 }));
    EXPECT_EQ(QStringList({ data.SubjectNif("D2"), data.SubjectName("D3"), data.SubjectNif("S1") }),
        QStringList({ "PT246813571", "", "PT182937461" }));
    EXPECT_EQ(data.NifInfoStore().Read("PT182937461.nome").toString(), "MARIA DA CONCEIÇÃO FERREIRA")
        << "records are kept under country code and number, as the NIF control keys them";
    EXPECT_EQ(data.NifInfoStore().Read("absent").toString(), "");
    EXPECT_EQ(data.GetSujeitoTitle("D2"), "Dependente 2");
    EXPECT_EQ(data.GetSujeitoTitle("H1"), "Herança 1");
}

TEST(JsonDeclaration, savesWhatItHoldsAndRejectsBadFilesWithoutLosingData)
{
    QTemporaryDir dir;
    JsonDeclaration declaration;
    ASSERT_TRUE(declaration.load(sourcePath("data/declaracao.json")));
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
    ASSERT_TRUE(broken.open(QIODevice::WriteOnly) && broken.write("{ not json") > 0);
    broken.close();
    const QString fifo = dir.filePath("fifo.json");
    makeFifo(fifo);
    for (const QString &path : { broken.fileName(), dir.filePath("missing.json"), fifo, QString("/dev/zero") })
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
    EXPECT_EQ(QStringList({ data.SubjectNif("S1"), data.NifInfoStore().Read("PT182937461.nome").toString(),
                  data.SubjectNif("D1"), data.NifInfoStore().Read("ES12345678Z.nome").toString() }),
        QStringList({ "PT182937461", "MARIA", "ES12345678Z", "JUAN" }));
}

TEST(FieldCollection, keepsInsertionOrderAndFindsTheFirst)
{
    FieldCollection fields;
    fields.Add("email", "");
    fields.Add("nome", "x");
    fields.Add("email", "second");
    EXPECT_EQ(fields.items().at(1).id, "nome");
    EXPECT_EQ(fields.Lookup("email").toString(), "");
    fields.Set("email", "first");
    EXPECT_EQ(fields.Lookup("email").toString(), "first");
    EXPECT_EQ(fields.Count(), 3);
}

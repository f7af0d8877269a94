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

TEST(JsonDeclaration, answersTheQuestionsOfTheControlsAndSavesWhatItHoldsInItsOrder)
{
    QTemporaryDir dir;
    JsonDeclaration declaration;
    ASSERT_TRUE(declaration.load(sourcePath("data/declaracao.json")));
    DeclarationData &data = declaration.DeclarationData();
    FieldCollection &fields = data.FieldStore();
    EXPECT_EQ(QList<int>({ data.Dependants(), data.Ascendants(), data.Estates() }), QList<int>({ 2, 1, 1 }));
    EXPECT_EQ(QStringList({ data.SubjectNif("D2"), data.SubjectName("D3"), data.SubjectNif("S1") }),
        QStringList({ "PT246813571", "", "PT182937461" }));
    EXPECT_EQ(data.NifInfoStore().Read("PT182937461.nome").toString(), "MARIA DA CONCEIÇÃO FERREIRA")
        << "records are kept under country code and number, as the NIF control keys them";
    EXPECT_EQ(QStringList({ data.GetSujeitoTitle("D2"), data.GetSujeitoTitle("H1") }),
        QStringList({ "Dependente 2", "Herança 1" }));

    data.NifInfoStore().Write("PT210345675.telefone", "210000000");
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
        QStringList({ "casado=1", "dependentes=2", "ascendentes=1", "obito=1", "herancas=1", "casado=0", "anexo=B" }));
    EXPECT_EQ(reloaded.DeclarationData().SubjectName("A"), "ANA MARIA FERREIRA LOPES");

    // Older files have numbers without their country code; bad files are refused and lose nothing.
    const QString old = writeFile(dir.filePath("old.json"), R"({ "fields": { "casado": "0" },
        "subjects": { "S1": { "nif": "182937461" }, "D1": { "nif": "ES12345678Z" } },
        "nifInfo": { "182937461.nome": "MARIA", "ES12345678Z.nome": "JUAN" } })");
    const QString fifo = makeFifo(dir.filePath("fifo.json"));
    const QString broken = writeFile(dir.filePath("broken.json"), "{ not json");
    for (const QString &path : { broken, dir.filePath("missing.json"), fifo, QString("/dev/zero") })
        EXPECT_FALSE(reloaded.load(path)) << path.toStdString();
    EXPECT_FALSE(reloaded.save(fifo)) << "a save never replaces a FIFO";
    EXPECT_TRUE(QFileInfo(fifo).exists() && !QFileInfo(fifo).isFile());
    EXPECT_EQ(reloaded.DeclarationData().Dependants(), 2) << "a failed load keeps the declaration";
    ASSERT_TRUE(reloaded.load(old));
    DeclarationData &older = reloaded.DeclarationData();
    EXPECT_EQ(QStringList({ older.FieldStore().Lookup("casado").toString(), older.SubjectNif("S1"),
                  older.NifInfoStore().Read("PT182937461.nome").toString(), older.SubjectNif("D1"),
                  older.NifInfoStore().Read("ES12345678Z.nome").toString() }),
        QStringList({ "0", "PT182937461", "MARIA", "ES12345678Z", "JUAN" }));
}

#include "frame/FormFile.h"
#include "frame/ClassRegistry.h"
#include "frame/UserControl.h"

#include "support/TestSupport.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QImage>
#include <QJsonArray>
#include <QJsonDocument>
#include <QTemporaryDir>

#include <gtest/gtest.h>

using namespace zelctl;

namespace {

// One control of every class this build serves, placed one under another, every other one
// hidden, captioned with its name where it has a caption.
QList<UserControl *> everyControl(QWidget *form)
{
    QList<UserControl *> controls;
    int top = 0;
    for (const ClassInfo &info : ClassRegistry::classes()) {
        if (!info.isControl || !ClassRegistry::factoryFor(info.classId))
            continue;
        auto *control = qobject_cast<UserControl *>(CreateObject(info.name, form));
        if (!control) {
            ADD_FAILURE() << info.name << " is not a UserControl";
            continue;
        }
        control->InitNew();
        control->extender().setName(QStringLiteral("%1_1").arg(info.name));
        control->extender().setTag(info.name);
        if (control->metaObject()->indexOfProperty("Caption") >= 0)
            control->setProperty("Caption", info.name);
        control->extender().setTop(top);
        control->extender().setLeft(150);
        control->extender().setVisible(controls.size() % 2 == 0);
        top += control->extender().Height() + 150;
        controls.append(control);
    }
    return controls;
}

} // namespace

// Saved values go into the controls of the same name and class; unnamed controls of one
// class take the entries of their class in order.
TEST(FormFile, everyControlClassComesBackWithTheSamePropertiesAndApplyMatchesByNameOrOrder)
{
    QWidget form;
    const QList<UserControl *> controls = everyControl(&form);
    ASSERT_FALSE(controls.isEmpty());
    QTemporaryDir dir;
    ASSERT_TRUE(FormFile::save(dir.filePath("form.json"), controls));

    QJsonObject saved;
    ASSERT_TRUE(FormFile::load(dir.filePath("form.json"), &saved));
    // An entry of a class this build does not serve is skipped and named.
    saved["controls"] = saved["controls"].toArray() + QJsonObject { { "class", "cNothing" } };
    QWidget copy;
    QStringList skipped;
    const QList<UserControl *> loaded = FormFile::create(saved, &copy, &skipped);
    EXPECT_EQ(skipped, QStringList({ "cNothing" }));
    ASSERT_EQ(loaded.size(), controls.size());
    for (qsizetype i = 0; i < controls.size(); ++i) {
        const QString name = FormFile::className(controls[i]);
        EXPECT_EQ(FormFile::className(loaded[i]), name);
        EXPECT_EQ(loaded[i]->parent(), &copy);
        EXPECT_EQ(loaded[i]->extender().toJson(), controls[i]->extender().toJson()) << name.toStdString();
        // Every value written comes back. A control may write more after loading: some read a
        // missing name with another default than the one they skip writing.
        const PropertyBag original = controls[i]->Save();
        const PropertyBag reloaded = loaded[i]->Save();
        for (const QString &property : original.names()) {
            EXPECT_EQ(reloaded.ReadProperty(property), original.ReadProperty(property))
                << name.toStdString() << '.' << property.toStdString();
        }
    }
    controls[0]->extender().setName("someone_else");
    EXPECT_EQ(FormFile::apply(saved, controls), controls.size() - 1);

    QJsonObject numbers;
    ASSERT_TRUE(FormFile::load(test::testDataPath("forms/unnamed-numbers.json"), &numbers));
    QList<UserControl *> unnamed;
    for (int i = 0; i < 3; ++i) {
        unnamed << qobject_cast<UserControl *>(CreateObject("skNumber", &form));
        unnamed.last()->InitNew();
    }
    EXPECT_EQ(FormFile::apply(numbers, unnamed), 3);
    for (int i = 0; i < 3; ++i)
        EXPECT_EQ(unnamed[i]->property("Caption").toString(), QString::number(i + 1));
}

TEST(FormFile, refusesWhatIsNotAFormWithAReasonAndWithoutWaiting)
{
    QTemporaryDir dir;
    const auto write
        = [&dir](const QString &name, const QByteArray &bytes) { return test::writeFile(dir.filePath(name), bytes); };
    const QByteArray manyControls = "{\"controls\": [" + QByteArray("{},").repeated(FormFile::MaxControls) + "{}]}";
    const QByteArray manyProperties
        = "{\"controls\": [{\"properties\": [" + QByteArray("{},").repeated(PropertyBag::MaxEntries) + "{}]}]}";

    const struct
    {
        QString path;
        const char *reason;
    } cases[] = {
        { dir.filePath("missing.json"), "Não foi possível ler" },
        { dir.path(), "não é um ficheiro comum" },
        { test::makeFifo(dir.filePath("fifo.json")), "não é um ficheiro comum" },
        { "/dev/zero", "não é um ficheiro comum" },
        { test::sizedFile(dir.filePath("large.json"), FormFile::MaxFileBytes + 1), "o máximo de um formulário" },
        { write("number.json", R"({"controls": 3})"), "não é um formulário" },
        { write("text.json", "controls"), "não é um formulário" },
        { write("controls.json", manyControls), "controlos, o máximo" },
        { write("properties.json", manyProperties), "propriedades, o máximo" },
    };
    for (const auto &c : cases) {
        QJsonObject form { { "kept", true } };
        QString error;
        EXPECT_FALSE(FormFile::load(c.path, &form, &error)) << c.path.toStdString();
        EXPECT_TRUE(error.contains(QString::fromUtf8(c.reason))) << error.toStdString();
        EXPECT_TRUE(error.contains(c.path)) << error.toStdString();
        EXPECT_EQ(form, QJsonObject({ { "kept", true } }));
    }
}

TEST(FormFile, saveNeverReplacesASpecialFileAndWritesThroughALink)
{
    QTemporaryDir dir;
    const QList<UserControl *> controls;
    const QString fifo = test::makeFifo(dir.filePath("fifo"));
    const QString toFifo = dir.filePath("to-fifo.json");
    ASSERT_TRUE(QFile::link(fifo, toFifo));
    for (const QString &path : { fifo, toFifo }) {
        QString error;
        EXPECT_FALSE(FormFile::save(path, controls, &error)) << path.toStdString();
        EXPECT_TRUE(error.contains(u"não é um ficheiro comum")) << error.toStdString();
    }
    EXPECT_TRUE(QFileInfo(fifo).exists() && !QFileInfo(fifo).isFile()) << "the FIFO is still there";

    const QString target = dir.filePath("target.json");
    const QString link = dir.filePath("link.json");
    ASSERT_TRUE(QFile::link(target, link));
    QString error;
    ASSERT_TRUE(FormFile::save(link, controls, &error)) << error.toStdString();
    EXPECT_TRUE(QFileInfo(link).isSymLink()) << "the link stays a link";
    EXPECT_TRUE(QFileInfo(target).isFile());
}

// Every form the fuzzer found trouble with, and the hand-made hostile ones, go as the fuzz
// target takes them: the form's controls, and one of every class with the first entry's
// properties, are created, drawn and saved; the saved form reads back to itself.
TEST(FormFile, everyKnownHostileFormLoadsDrawsAndSavesCleanly)
{
    QStringList files;
    for (const QString &folder : { test::testDataPath("forms"), test::testDataPath("crashers/forms") }) {
        for (const QFileInfo &entry : QDir(folder).entryInfoList(QDir::Files))
            files << entry.filePath();
    }
    ASSERT_FALSE(files.isEmpty());
    const auto savedAgain = [](const QByteArray &json) {
        QWidget parent;
        QJsonObject form;
        EXPECT_TRUE(FormFile::parse(json, "saved", &form));
        return QJsonDocument(FormFile::write(FormFile::create(form, &parent))).toJson();
    };
    for (const QString &path : files) {
        SCOPED_TRACE(path.toStdString());
        QJsonObject form;
        if (!FormFile::load(path, &form))
            continue;
        QWidget parent;
        parent.resize(320, 240);
        QList<UserControl *> controls = FormFile::create(form, &parent);
        const QJsonObject first = form.value("controls").toArray().at(0).toObject();
        for (const ClassInfo &info : ClassRegistry::classes()) {
            auto *control = info.isControl ? qobject_cast<UserControl *>(CreateObject(info.name, &parent)) : nullptr;
            if (!control)
                continue;
            control->extender().loadJson(first.value("extender").toObject());
            control->Load(PropertyBag::fromJson(first.value("properties").toArray()));
            controls << control;
        }
        parent.show();
        QImage target(64, 32, QImage::Format_ARGB32);
        for (UserControl *control : controls)
            control->render(&target, QPoint(), QRegion(0, 0, 64, 32));
        const QByteArray once = savedAgain(QJsonDocument(FormFile::write(controls)).toJson());
        EXPECT_EQ(savedAgain(once), once);
    }
}

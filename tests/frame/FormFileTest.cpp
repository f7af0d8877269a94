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

#include <sys/stat.h>

using namespace zelctl;

namespace {

// One control of every class this build serves, placed on the form one under another.
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
        control->extender().setTop(top);
        control->extender().setLeft(150);
        top += control->extender().Height() + 150;
        controls.append(control);
    }
    return controls;
}

} // namespace

TEST(FormFile, everyControlClassComesBackWithTheSameProperties)
{
    QWidget form;
    const QList<UserControl *> controls = everyControl(&form);
    ASSERT_FALSE(controls.isEmpty());
    QTemporaryDir dir;
    ASSERT_TRUE(FormFile::save(dir.filePath("form.json"), controls));

    QJsonObject saved;
    ASSERT_TRUE(FormFile::load(dir.filePath("form.json"), &saved));
    QWidget copy;
    QStringList skipped;
    const QList<UserControl *> loaded = FormFile::create(saved, &copy, &skipped);
    EXPECT_TRUE(skipped.isEmpty());
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
        // And from then on the form is stable.
        QWidget again;
        const QList<UserControl *> second = FormFile::create(FormFile::write({ loaded[i] }), &again);
        ASSERT_EQ(second.size(), 1);
        EXPECT_EQ(second.first()->Save(), reloaded) << name.toStdString();
    }
}

TEST(FormFile, applyLoadsSavedValuesIntoControlsOfTheSameNameAndClass)
{
    QWidget form;
    const QList<UserControl *> controls = everyControl(&form);
    ASSERT_FALSE(controls.isEmpty());
    QJsonObject saved = FormFile::write(controls);
    QJsonArray entries = saved["controls"].toArray();
    QJsonObject renamed = entries[0].toObject();
    QJsonObject extender = renamed["extender"].toObject();
    extender["Name"] = "someone_else";
    renamed["extender"] = extender;
    entries[0] = renamed;
    saved["controls"] = entries;
    EXPECT_EQ(FormFile::apply(saved, controls), controls.size() - 1);
}

TEST(FormFile, unnamedControlsOfOneClassKeepTheirOwnProperties)
{
    QJsonObject form;
    QString error;
    ASSERT_TRUE(FormFile::load(test::testDataPath("forms/unnamed-numbers.json"), &form, &error)) << error.toStdString();
    QWidget parent;
    QList<UserControl *> numbers;
    for (int i = 0; i < 3; ++i) {
        numbers << qobject_cast<UserControl *>(CreateObject("skNumber", &parent));
        ASSERT_NE(numbers.last(), nullptr);
        numbers.last()->InitNew();
    }
    EXPECT_EQ(FormFile::apply(form, numbers), 3);
    QStringList captions;
    for (UserControl *number : numbers)
        captions << number->property("Caption").toString();
    EXPECT_EQ(captions, QStringList({ "1", "2", "3" }));
}

TEST(FormFile, refusesWhatIsNotAFormWithAReasonAndWithoutWaiting)
{
    QTemporaryDir dir;
    const auto write = [&dir](const QString &name, const QByteArray &bytes) {
        QFile file(dir.filePath(name));
        EXPECT_TRUE(file.open(QIODevice::WriteOnly));
        file.write(bytes);
        return file.fileName();
    };
    const QString fifo = dir.filePath("fifo.json");
    ASSERT_EQ(::mkfifo(QFile::encodeName(fifo).constData(), 0600), 0);
    QFile large(dir.filePath("large.json"));
    ASSERT_TRUE(large.open(QIODevice::WriteOnly));
    ASSERT_TRUE(large.resize(FormFile::MaxFileBytes + 1));
    large.close();
    const QByteArray manyControls = "{\"controls\": [" + QByteArray("{},").repeated(FormFile::MaxControls) + "{}]}";
    QJsonArray properties;
    for (int i = 0; i <= PropertyBag::MaxEntries; ++i)
        properties.append(QJsonObject { { "name", QStringLiteral("P%1").arg(i) }, { "value", i } });
    const QByteArray manyProperties
        = QJsonDocument(QJsonObject { { "controls", QJsonArray { QJsonObject { { "properties", properties } } } } })
              .toJson();

    const struct
    {
        QString path;
        const char *reason;
    } cases[] = {
        { dir.filePath("missing.json"), "Não foi possível ler" },
        { dir.path(), "não é um ficheiro comum" },
        { fifo, "não é um ficheiro comum" },
        { "/dev/zero", "não é um ficheiro comum" },
        { large.fileName(), "o máximo de um formulário" },
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

TEST(FormFile, createSkipsUnknownClasses)
{
    QWidget parent;
    QStringList skipped;
    const QJsonObject unknown { { "controls", QJsonArray { QJsonObject { { "class", "cNothing" } } } } };
    EXPECT_TRUE(FormFile::create(unknown, &parent, &skipped).isEmpty());
    EXPECT_EQ(skipped, QStringList({ "cNothing" }));
    EXPECT_TRUE(parent.children().isEmpty());
}

TEST(FormFile, saveNeverReplacesASpecialFileAndWritesThroughALink)
{
    QTemporaryDir dir;
    QWidget form;
    const QList<UserControl *> controls = everyControl(&form);
    const QString fifo = dir.filePath("fifo");
    ASSERT_EQ(::mkfifo(QFile::encodeName(fifo).constData(), 0600), 0);
    const QString toFifo = dir.filePath("to-fifo.json");
    ASSERT_TRUE(QFile::link(fifo, toFifo));
    for (const QString &path : { fifo, toFifo }) {
        QString error;
        EXPECT_FALSE(FormFile::save(path, controls, &error)) << path.toStdString();
        EXPECT_TRUE(error.contains(u"não é um ficheiro comum")) << error.toStdString();
    }
    EXPECT_TRUE(QFileInfo(fifo).exists() && !QFileInfo(fifo).isFile()) << "the FIFO is still there";
    EXPECT_TRUE(QFileInfo(toFifo).isSymLink());

    const QString target = dir.filePath("target.json");
    const QString link = dir.filePath("link.json");
    ASSERT_TRUE(QFile::link(target, link));
    QString error;
    ASSERT_TRUE(FormFile::save(link, controls, &error)) << error.toStdString();
    EXPECT_TRUE(QFileInfo(link).isSymLink()) << "the link stays a link";
    QJsonObject saved;
    EXPECT_TRUE(FormFile::load(target, &saved));
}

// Every form the fuzzer ever found trouble with, and the hand-made hostile ones, go through
// what the fuzz target does: the form's controls and a control of every class with the
// first entry's properties are created, drawn and saved, and the saved form reads back to
// itself.
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
        QFile file(path);
        ASSERT_TRUE(file.open(QIODevice::ReadOnly));
        QJsonObject form;
        if (!FormFile::parse(file.readAll(), path, &form))
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

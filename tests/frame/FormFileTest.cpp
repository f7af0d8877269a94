#include "frame/FormFile.h"
#include "frame/ClassRegistry.h"
#include "frame/UserControl.h"

#include <QFile>
#include <QJsonArray>
#include <QTemporaryDir>

#include <gtest/gtest.h>

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

TEST(FormFile, rejectsWhatIsNotAFormAndSkipsUnknownClasses)
{
    QTemporaryDir dir;
    QJsonObject form;
    EXPECT_FALSE(FormFile::load(dir.filePath("missing.json"), &form));
    QFile file(dir.filePath("bad.json"));
    ASSERT_TRUE(file.open(QIODevice::WriteOnly));
    file.write(R"({"controls": 3})");
    file.close();
    EXPECT_FALSE(FormFile::load(file.fileName(), &form));

    QWidget parent;
    QStringList skipped;
    const QJsonObject unknown { { "controls", QJsonArray { QJsonObject { { "class", "cNothing" } } } } };
    EXPECT_TRUE(FormFile::create(unknown, &parent, &skipped).isEmpty());
    EXPECT_EQ(skipped, QStringList({ "cNothing" }));
    EXPECT_TRUE(parent.children().isEmpty());
}

#include "FormFile.h"

#include "ClassRegistry.h"
#include "UserControl.h"

#include <QFile>
#include <QJsonArray>
#include <QJsonDocument>
#include <QSaveFile>

namespace zelctl::FormFile {

QString className(const UserControl *control)
{
    QString name = QString::fromLatin1(control->metaObject()->className());
    return name.mid(name.lastIndexOf(QLatin1Char(':')) + 1);
}

QJsonObject write(const QList<UserControl *> &controls)
{
    QJsonArray entries;
    for (UserControl *control : controls) {
        entries.append(QJsonObject {
            { "class", className(control) },
            { "extender", control->extender().toJson() },
            { "properties", control->Save().toJson() },
        });
    }
    return { { "controls", entries } };
}

QList<UserControl *> create(const QJsonObject &form, QWidget *parent, QStringList *skipped)
{
    QList<UserControl *> created;
    for (const QJsonValue &value : form.value("controls").toArray()) {
        const QJsonObject entry = value.toObject();
        const QString name = entry.value("class").toString();
        QObject *object = CreateObject(name, parent);
        auto *control = qobject_cast<UserControl *>(object);
        if (!control) {
            delete object;
            if (skipped)
                skipped->append(name);
            continue;
        }
        control->extender().loadJson(entry.value("extender").toObject());
        control->Load(PropertyBag::fromJson(entry.value("properties").toArray()));
        created.append(control);
    }
    return created;
}

int apply(const QJsonObject &form, const QList<UserControl *> &controls)
{
    int loaded = 0;
    for (const QJsonValue &value : form.value("controls").toArray()) {
        const QJsonObject entry = value.toObject();
        const QString name = entry.value("extender").toObject().value("Name").toString();
        for (UserControl *control : controls) {
            if (control->objectName() == name && className(control) == entry.value("class").toString()) {
                control->Load(PropertyBag::fromJson(entry.value("properties").toArray()));
                ++loaded;
                break;
            }
        }
    }
    return loaded;
}

bool save(const QString &path, const QList<UserControl *> &controls)
{
    QSaveFile file(path);
    if (!file.open(QIODevice::WriteOnly))
        return false;
    file.write(QJsonDocument(write(controls)).toJson());
    return file.commit();
}

bool load(const QString &path, QJsonObject *form)
{
    QFile file(path);
    if (!file.open(QIODevice::ReadOnly))
        return false;
    QJsonParseError error;
    const QJsonDocument doc = QJsonDocument::fromJson(file.readAll(), &error);
    if (error.error != QJsonParseError::NoError || !doc.isObject() || !doc.object().value("controls").isArray())
        return false;
    *form = doc.object();
    return true;
}

} // namespace zelctl::FormFile

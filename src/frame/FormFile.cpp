#include "FormFile.h"

#include "ClassRegistry.h"
#include "UserControl.h"
#include "platform/FileRead.h"

#include <QHash>
#include <QJsonArray>
#include <QJsonDocument>
#include <QSaveFile>

namespace zelctl::FormFile {

namespace {

bool fail(QString *error, const QString &reason)
{
    if (error)
        *error = reason;
    return false;
}

} // namespace

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
    const QJsonArray entries = form.value("controls").toArray();
    for (qsizetype i = 0; i < entries.size() && i < MaxControls; ++i) {
        const QJsonObject entry = entries[i].toObject();
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
    using Key = std::pair<QString, QString>;
    QHash<Key, QList<UserControl *>> byKey;
    for (UserControl *control : controls)
        byKey[{ className(control), control->objectName() }].append(control);
    QHash<Key, qsizetype> used;
    int loaded = 0;
    for (const QJsonValue &value : form.value("controls").toArray()) {
        const QJsonObject entry = value.toObject();
        const Key key { entry.value("class").toString(), entry.value("extender").toObject().value("Name").toString() };
        const auto matching = byKey.constFind(key);
        qsizetype &next = used[key];
        if (matching == byKey.cend() || next >= matching->size())
            continue;
        matching->at(next++)->Load(PropertyBag::fromJson(entry.value("properties").toArray()));
        ++loaded;
    }
    return loaded;
}

bool save(const QString &path, const QList<UserControl *> &controls, QString *error)
{
    // A new file renamed over a FIFO or a device node would replace it.
    if (platform::isSpecialFile(path))
        return fail(error, QStringLiteral("%1 não é um ficheiro comum: o formulário não foi gravado.").arg(path));
    const QByteArray json = QJsonDocument(write(controls)).toJson();
    if (json.size() > MaxFileBytes) {
        return fail(error,
            QStringLiteral("O formulário tem mais de %1 bytes, que não se poderiam ler de novo: não foi "
                           "gravado em %2.")
                .arg(MaxFileBytes)
                .arg(path));
    }
    QSaveFile file(path);
    if (!file.open(QIODevice::WriteOnly) || file.write(json) != json.size() || !file.commit())
        return fail(error, QStringLiteral("Não foi possível gravar o formulário em %1.").arg(path));
    return true;
}

bool load(const QString &path, QJsonObject *form, QString *error)
{
    const platform::FileRead file = platform::readFile(path, MaxFileBytes);
    switch (file.status) {
    case platform::FileRead::Ok:
        return parse(file.bytes, path, form, error);
    case platform::FileRead::Unreadable:
        return fail(error, QStringLiteral("Não foi possível ler %1: %2.").arg(path, file.reason));
    case platform::FileRead::NotRegularFile:
        return fail(error, QStringLiteral("%1 não é um ficheiro comum.").arg(path));
    case platform::FileRead::TooLarge:
        break;
    }
    return fail(
        error, QStringLiteral("%1 tem mais de %2 bytes, o máximo de um formulário.").arg(path).arg(MaxFileBytes));
}

bool parse(const QByteArray &bytes, const QString &path, QJsonObject *form, QString *error)
{
    QJsonParseError parsed;
    const QJsonDocument doc = QJsonDocument::fromJson(bytes, &parsed);
    if (parsed.error != QJsonParseError::NoError || !doc.isObject() || !doc.object().value("controls").isArray())
        return fail(error, QStringLiteral("%1 não é um formulário que se possa ler.").arg(path));
    const QJsonArray controls = doc.object().value("controls").toArray();
    if (controls.size() > MaxControls) {
        return fail(error,
            QStringLiteral("%1 tem mais de %2 controlos, o máximo de um formulário.").arg(path).arg(MaxControls));
    }
    for (const QJsonValue &control : controls) {
        if (control.toObject().value("properties").toArray().size() > PropertyBag::MaxEntries) {
            return fail(error,
                QStringLiteral("%1: um controlo tem mais de %2 propriedades, o máximo de um controlo.")
                    .arg(path)
                    .arg(PropertyBag::MaxEntries));
        }
    }
    *form = doc.object();
    return true;
}

} // namespace zelctl::FormFile

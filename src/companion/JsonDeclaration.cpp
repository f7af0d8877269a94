#include "JsonDeclaration.h"

#include "common/modFuncs.h"
#include "platform/FileRead.h"

#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QSaveFile>

namespace zelctl::companion {

namespace {

// A number kept without its country code is Portuguese: older files wrote them so.
QString withCountryCode(const QString &number)
{
    return !number.isEmpty() && number.front().isDigit() ? QStringLiteral("PT") + number : number;
}

FieldCollection readFields(const QJsonValue &json)
{
    FieldCollection fields;
    if (json.isArray()) {
        for (const QJsonValue &item : json.toArray()) {
            const QJsonObject field = item.toObject();
            if (field.value("id").isString())
                fields.Add(field.value("id").toString(), field.value("value").toVariant().toString());
        }
    } else {
        const QJsonObject object = json.toObject();
        for (auto it = object.begin(); it != object.end(); ++it)
            fields.Add(it.key(), it.value().toVariant().toString());
    }
    return fields;
}

} // namespace

class JsonDeclaration::Store : public KeyedStore
{
public:
    QVariant Read(const QString &key) const override { return values.value(key); }
    void Write(const QString &key, const QVariant &value) override { values.insert(key, value.toString()); }

    QMap<QString, QString> values;
};

JsonDeclaration::JsonDeclaration(QObject *parent)
    : Declaration(parent)
    , m_nifInfo(std::make_unique<Store>())
{ }

JsonDeclaration::~JsonDeclaration() = default;

bool JsonDeclaration::load(const QString &path)
{
    const platform::FileRead file = platform::readFile(path, modFuncs::MaxDataFileBytes);
    if (!file.ok())
        return false;
    QJsonParseError error;
    const QJsonDocument doc = QJsonDocument::fromJson(file.bytes, &error);
    if (error.error != QJsonParseError::NoError || !doc.isObject())
        return false;
    const QJsonObject json = doc.object();

    FieldCollection fields = readFields(json.value("fields"));

    QMap<QString, Subject> subjects;
    const QJsonObject jsonSubjects = json.value("subjects").toObject();
    for (auto it = jsonSubjects.begin(); it != jsonSubjects.end(); ++it) {
        const QJsonObject subject = it.value().toObject();
        subjects.insert(
            it.key(), { withCountryCode(subject.value("nif").toString()), subject.value("name").toString() });
    }

    QHash<QString, QString> titles;
    const QJsonObject jsonTitles = json.value("titles").toObject();
    for (auto it = jsonTitles.begin(); it != jsonTitles.end(); ++it)
        titles.insert(it.key(), it.value().toString());

    QMap<QString, QString> nifInfo;
    const QJsonObject jsonInfo = json.value("nifInfo").toObject();
    for (auto it = jsonInfo.begin(); it != jsonInfo.end(); ++it)
        nifInfo.insert(withCountryCode(it.key()), it.value().toVariant().toString());

    m_fields = std::move(fields);
    m_subjects = std::move(subjects);
    m_titles = std::move(titles);
    m_nifInfo->values = std::move(nifInfo);
    return true;
}

bool JsonDeclaration::save(const QString &path) const
{
    QJsonArray fields;
    for (const FieldCollection::Item &item : m_fields.items())
        fields.append(QJsonObject { { "id", item.id }, { "value", item.value.toString() } });
    QJsonObject subjects;
    for (auto it = m_subjects.begin(); it != m_subjects.end(); ++it)
        subjects.insert(it.key(), QJsonObject { { "nif", it->nif }, { "name", it->name } });
    QJsonObject titles;
    for (auto it = m_titles.begin(); it != m_titles.end(); ++it)
        titles.insert(it.key(), it.value());
    QJsonObject nifInfo;
    for (auto it = m_nifInfo->values.begin(); it != m_nifInfo->values.end(); ++it)
        nifInfo.insert(it.key(), it.value());

    QJsonObject json { { "fields", fields }, { "subjects", subjects }, { "nifInfo", nifInfo } };
    if (!titles.isEmpty())
        json.insert("titles", titles);
    // A new file renamed over a FIFO or a device would replace it.
    QSaveFile out(path);
    if (platform::isSpecialFile(path) || !out.open(QIODevice::WriteOnly))
        return false;
    out.write(QJsonDocument(json).toJson());
    return out.commit();
}

void JsonDeclaration::setSubject(const QString &id, const Subject &subject)
{
    m_subjects.insert(id, subject);
}

KeyedStore &JsonDeclaration::NifInfoStore()
{
    return *m_nifInfo;
}

QString JsonDeclaration::SubjectNif(const QString &subject) const
{
    return m_subjects.value(subject).nif;
}

QString JsonDeclaration::SubjectName(const QString &subject) const
{
    return m_subjects.value(subject).name;
}

int JsonDeclaration::countOf(QChar kind) const
{
    int count = 0;
    for (auto it = m_subjects.begin(); it != m_subjects.end(); ++it) {
        if (it.key().size() > 1 && it.key().front() == kind)
            ++count;
    }
    return count;
}

int JsonDeclaration::Dependants() const
{
    return countOf(u'D');
}

int JsonDeclaration::Ascendants() const
{
    return countOf(u'S');
}

int JsonDeclaration::Estates() const
{
    return countOf(u'H');
}

QString JsonDeclaration::GetSujeitoTitle(const QString &subject) const
{
    if (const auto it = m_titles.constFind(subject); it != m_titles.cend())
        return it.value();
    if (subject.isEmpty())
        return {};
    const QString index = subject.mid(1);
    switch (subject.front().unicode()) {
    case u'A':
        return QStringLiteral("Sujeito Passivo A");
    case u'B':
        return QStringLiteral("Sujeito Passivo B");
    case u'C':
        return QStringLiteral("Agregado");
    case u'F':
        return QStringLiteral("Falecido");
    case u'D':
        return QStringLiteral("Dependente ") + index;
    case u'S':
        return QStringLiteral("Ascendente ") + index;
    case u'H':
        return QStringLiteral("Herança ") + index;
    default:
        return {};
    }
}

} // namespace zelctl::companion

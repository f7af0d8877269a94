#pragma once

#include "Declaration.h"

#include <QHash>
#include <QMap>

namespace zelctl::companion {

// A declaration held in memory and kept in a JSON file:
//
//   { "fields": [ { "id": "casado", "value": "1" }, ... ],   (in order; ids may repeat)
//     "subjects": { "A": { "nif": "PT...", "name": "..." }, "D1": { ... }, ... },
//     "titles": { "A": "Sujeito Passivo A", ... },          (optional)
//     "nifInfo": { "PT123456789.nome": "...", ... } }
//
// Tax numbers are country code and number, as the NIF control's Value gives them, so what
// the control records for a holder is what the subject selector finds. Older files, with
// "fields" as an object and Portuguese numbers without their code, are read the same way.
class ZELCTL_EXPORT JsonDeclaration : public Declaration, private DeclarationData
{
    Q_OBJECT

public:
    explicit JsonDeclaration(QObject *parent = nullptr);
    ~JsonDeclaration() override;

    // False, with the declaration unchanged, when the file cannot be read or is not a
    // declaration.
    bool load(const QString &path);
    bool save(const QString &path) const;

    companion::DeclarationData &DeclarationData() override { return *this; }

    struct Subject
    {
        QString nif;
        QString name;
    };
    void setSubject(const QString &id, const Subject &subject);

private:
    FieldCollection &FieldStore() override { return m_fields; }
    KeyedStore &NifInfoStore() override;
    QString SubjectNif(const QString &subject) const override;
    QString SubjectName(const QString &subject) const override;
    int Dependants() const override;
    int Ascendants() const override;
    int Estates() const override;
    QString GetSujeitoTitle(const QString &subject) const override;

    int countOf(QChar kind) const;

    class Store;
    FieldCollection m_fields;
    QMap<QString, Subject> m_subjects;
    QHash<QString, QString> m_titles;
    std::unique_ptr<Store> m_nifInfo;
};

} // namespace zelctl::companion

#pragma once

#include "FieldCollection.h"

#include <QObject>
#include <QString>
#include <QVariant>

namespace zelctl::companion {

// A store of values by key, such as the declaration's record of NIF information, whose
// keys are a tax number, a full stop and a field id ("PT123456789.nome").
class ZELCTL_EXPORT KeyedStore
{
public:
    virtual ~KeyedStore() = default;
    // The value under the key; "" for an absent key.
    virtual QVariant Read(const QString &key) const = 0;
    virtual void Write(const QString &key, const QVariant &value) = 0;
};

// The data of a declaration, as the controls question it. Subject identifiers are a kind
// letter of "ABDSFCH", followed for dependants, ascendants and estates by a 1-based index.
class ZELCTL_EXPORT DeclarationData
{
public:
    virtual ~DeclarationData() = default;

    virtual FieldCollection &FieldStore() = 0;
    virtual KeyedStore &NifInfoStore() = 0;
    // The subject's NIF and full name; "" when the declaration has none.
    virtual QString SubjectNif(const QString &subject) const = 0;
    virtual QString SubjectName(const QString &subject) const = 0;
    // How many subjects of each numbered kind the declaration holds.
    virtual int Dependants() const = 0;
    virtual int Ascendants() const = 0;
    virtual int Estates() const = 0;
    // The caption the host gives the subject.
    virtual QString GetSujeitoTitle(const QString &subject) const = 0;
};

// The host's declaration object, handed to controls through their IRSClass property and
// borrowed by them: a host passes any QObject deriving from this class.
class ZELCTL_EXPORT Declaration : public QObject
{
    Q_OBJECT

public:
    using QObject::QObject;

    virtual companion::DeclarationData &DeclarationData() = 0;
};

} // namespace zelctl::companion

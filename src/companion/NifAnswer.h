#pragma once

#include <QHash>
#include <QString>

namespace zelctl::companion {

// A holder's record: field values under upper-case keys ("ID", "NAME", "CODIGOPOSTAL" ...).
using NifFields = QHash<QString, QString>;

// What one source answered about a tax number.
struct NifAnswer
{
    enum class Outcome {
        Found, // the record is in `fields`
        NotFound, // the source knows the number has no holder it can name
        Failed, // the source could not answer: `status` says why
    };
    Outcome outcome = Outcome::NotFound;
    NifFields fields;
    // The text the record's STATUS shows when nothing was found or the source failed.
    QString status;
};

} // namespace zelctl::companion

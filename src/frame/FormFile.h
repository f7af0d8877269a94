#pragma once

#include "zelctl_export.h"

#include <QJsonObject>
#include <QList>
#include <QString>

class QWidget;

namespace zelctl {

class UserControl;

// A host form as a JSON document: for each control its class, its container properties
// (name, tag, visibility, tool tip, position and size in twips) and the properties it
// persists itself through WriteProperties:
//
//   { "controls": [ { "class": "cNIB", "extender": { "Name": "NIB1", ... },
//                     "properties": [ { "name": "BackColor", "value": 2147483663 } ] } ] }
namespace FormFile {

// The public class name of a control ("cNIB").
ZELCTL_EXPORT QString className(const UserControl *control);

ZELCTL_EXPORT QJsonObject write(const QList<UserControl *> &controls);

// Creates the form's controls on parent through the class factory, places them and loads
// their saved properties. Entries of classes this library does not serve are skipped and
// named in *skipped.
ZELCTL_EXPORT QList<UserControl *> create(const QJsonObject &form, QWidget *parent, QStringList *skipped = nullptr);

// Loads the saved properties into existing controls, matched by class and name; returns
// how many were loaded.
ZELCTL_EXPORT int apply(const QJsonObject &form, const QList<UserControl *> &controls);

ZELCTL_EXPORT bool save(const QString &path, const QList<UserControl *> &controls);
// The form in the file; false when it cannot be read or is not a form.
ZELCTL_EXPORT bool load(const QString &path, QJsonObject *form);

} // namespace FormFile

} // namespace zelctl

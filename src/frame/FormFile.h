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

// The largest form file read or written, and the most controls one form holds; each
// control holds at most PropertyBag::MaxEntries properties. A form past these limits is
// refused with a message, so no file can make a host wait or exhaust its memory.
inline constexpr qint64 MaxFileBytes = qint64(16) << 20;
inline constexpr qsizetype MaxControls = 4096;

// The public class name of a control ("cNIB").
ZELCTL_EXPORT QString className(const UserControl *control);

ZELCTL_EXPORT QJsonObject write(const QList<UserControl *> &controls);

// Creates the form's controls on parent through the class factory, places them and loads
// their saved properties. Entries of classes this library does not serve are skipped and
// named in *skipped; entries past MaxControls are left out.
ZELCTL_EXPORT QList<UserControl *> create(const QJsonObject &form, QWidget *parent, QStringList *skipped = nullptr);

// Loads the saved properties into existing controls of the same class and name. Where
// several controls share a class and a name (unnamed ones, say), the entries of that class
// and name go to them in order: the n-th entry to the n-th control of the list. Returns
// how many were loaded.
ZELCTL_EXPORT int apply(const QJsonObject &form, const QList<UserControl *> &controls);

// Writes the form to path, replacing the file (or the file a symbolic link points at) only
// once the whole form is written. False, with the reason for the user in *error, when path
// is a directory, FIFO or device, when the form would be larger than MaxFileBytes, or when
// it cannot be written.
ZELCTL_EXPORT bool save(const QString &path, const QList<UserControl *> &controls, QString *error = nullptr);
// The form in the file. False, with the reason for the user in *error, when the file cannot
// be read, is not a regular file, is larger than MaxFileBytes, is not a form, or holds more
// controls or properties than allowed.
ZELCTL_EXPORT bool load(const QString &path, QJsonObject *form, QString *error = nullptr);
// The form in the bytes of a form file named `path`, as load() reads it.
ZELCTL_EXPORT bool parse(const QByteArray &bytes, const QString &path, QJsonObject *form, QString *error = nullptr);

} // namespace FormFile

} // namespace zelctl

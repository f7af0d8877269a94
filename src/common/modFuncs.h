#pragma once

#include "zelctl_export.h"

#include <QString>
#include <QtGlobal>

class QObject;

// Small services several controls share: where the application's files live, reading a
// text file whole, shortening a name for display, and two window operations.
namespace zelctl::modFuncs {

// The application's root folder, ending with "/": the "RootPath" setting of application
// "zEL", section "Setup", or else the current folder, which is then stored there. Computed
// once per user-interface thread and kept.
ZELCTL_EXPORT QString GetRootPath();

// GetRootPath() followed by "data/".
ZELCTL_EXPORT QString GetDataPath();

// The whole file as text (Windows-1252, one character a byte), or "" when it is missing,
// unreadable or empty; then, unless quiet, the user is told in a message box.
ZELCTL_EXPORT QString ReadWholeFile(const QString &path, bool quiet = false);

// The file's length in bytes, or 0 on any error.
ZELCTL_EXPORT qint64 SafeFileLength(const QString &path);

// The display form of a person's name: "first last" or "first M. last", in proper case.
// Runs of blanks count as one; a name of one or two words keeps its outer blanks.
ZELCTL_EXPORT QString FormatShortName(const QString &name);

// Keeps the window above all others, without moving, sizing or activating it, and shows it.
ZELCTL_EXPORT void MakeWindowTopmost(qint32 hwnd);

struct RECT
{
    qint32 left = 0;
    qint32 top = 0;
    qint32 right = 0;
    qint32 bottom = 0;

    bool operator==(const RECT &other) const = default;
};

// The screen rectangle of the window named by the object's "hWnd" property; an empty
// rectangle when the object has none or it names no window.
ZELCTL_EXPORT RECT GetObjectWindowRect(const QObject *object);

// Text of a Windows-1252 file, one character for each byte.
ZELCTL_EXPORT QString decodeWindows1252(const QByteArray &bytes);

} // namespace zelctl::modFuncs

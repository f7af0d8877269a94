#pragma once

#include "zelctl_export.h"

#include <QList>
#include <QString>
#include <QStringView>
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

// Data files (the country file, the holders' directory, a declaration) larger than this
// are refused as unreadable: no file named by a setting can exhaust the memory.
inline constexpr qint64 MaxDataFileBytes = qint64(8) << 20;

// The whole file as text (Windows-1252, one character a byte), or "" when it is missing,
// unreadable, empty, not a regular file (a FIFO is refused without waiting) or larger than
// MaxDataFileBytes; then, unless quiet, the user is told in a message box.
ZELCTL_EXPORT QString ReadWholeFile(const QString &path, bool quiet = false);

// The lines of a text, split at each LF with the CR before it dropped: the country file is
// written with CR LF, but a hand-edited one may end its lines with LF alone.
ZELCTL_EXPORT QList<QStringView> textLines(QStringView text);

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

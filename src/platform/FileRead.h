#pragma once

#include "zelctl_export.h"

#include <QByteArray>
#include <QString>

// Reading and replacing files that a user, a form or a setting names. Such a name may lead
// to a FIFO, a device or a file of any size: a read is bounded and never waits on a special
// file, and a save never replaces one.
namespace zelctl::platform {

struct ZELCTL_EXPORT FileRead
{
    enum Status {
        Ok,
        // Missing, no access, or the read failed; `reason` says why.
        Unreadable,
        // A directory, FIFO, device or socket.
        NotRegularFile,
        // More than the bytes allowed.
        TooLarge,
    };

    Status status = Unreadable;
    QByteArray bytes;
    QString reason;

    bool ok() const { return status == Ok; }
    // One line in English: "No such file or directory", "is not a regular file", ...
    QString message(qint64 maxBytes) const;
};

enum class Pipes { Refused, Read };

// The whole content of the file at path, when it is a regular file of at most maxBytes. It
// is opened without waiting, so a FIFO without a writer is refused at once, and no more
// than maxBytes + 1 bytes are ever read (files under /proc report no size). With Pipes::Read
// a pipe or FIFO is read as well, up to the same bound.
ZELCTL_EXPORT FileRead readFile(const QString &path, qint64 maxBytes, Pipes pipes = Pipes::Refused);

// True when path, after its symbolic links, exists and is not a regular file. A save must
// refuse it: a new file renamed over it would replace a FIFO or a device node (as root even
// /dev/null), and opening a FIFO to read waits for a writer. A save through a link to a
// regular file writes that file and keeps the link.
ZELCTL_EXPORT bool isSpecialFile(const QString &path);

} // namespace zelctl::platform

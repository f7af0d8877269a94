#include "FileRead.h"

#include <QFile>

#include <algorithm>
#include <cerrno>
#include <cstring>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace zelctl::platform {

namespace {

constexpr qint64 Chunk = 64 * 1024;

QString systemReason(int error)
{
    return QString::fromLocal8Bit(std::strerror(error));
}

class FileDescriptor
{
public:
    explicit FileDescriptor(int fd)
        : m_fd(fd)
    { }
    ~FileDescriptor()
    {
        if (m_fd >= 0)
            ::close(m_fd);
    }
    FileDescriptor(const FileDescriptor &) = delete;
    FileDescriptor &operator=(const FileDescriptor &) = delete;

    int get() const { return m_fd; }

private:
    int m_fd;
};

} // namespace

QString FileRead::message(qint64 maxBytes) const
{
    switch (status) {
    case Ok:
        return {};
    case Unreadable:
        return reason;
    case NotRegularFile:
        return QStringLiteral("is not a regular file");
    case TooLarge:
        return QStringLiteral("is larger than %1 bytes").arg(maxBytes);
    }
    return reason;
}

FileRead readFile(const QString &path, qint64 maxBytes, Pipes pipes)
{
    FileRead result;
    // Without O_NONBLOCK, opening a FIFO waits until someone opens it for writing.
    const FileDescriptor fd(::open(QFile::encodeName(path).constData(), O_RDONLY | O_NONBLOCK | O_CLOEXEC));
    if (fd.get() < 0) {
        result.reason = systemReason(errno);
        return result;
    }
    struct stat info
    { };
    if (::fstat(fd.get(), &info) != 0) {
        result.reason = systemReason(errno);
        return result;
    }
    const bool regular = S_ISREG(info.st_mode);
    if (!regular && !(pipes == Pipes::Read && S_ISFIFO(info.st_mode))) {
        result.status = FileRead::NotRegularFile;
        return result;
    }
    if (regular && info.st_size > maxBytes) {
        result.status = FileRead::TooLarge;
        return result;
    }
    if (!regular) {
        // A pipe is read as a file is: each read waits for data, the writer's close ends it.
        ::fcntl(fd.get(), F_SETFL, ::fcntl(fd.get(), F_GETFL) & ~O_NONBLOCK);
    }

    QByteArray bytes;
    qint64 size = 0;
    for (;;) {
        if (size == bytes.size()) {
            // Room for the size the file reports and one byte more, which shows whether it
            // grew; then doubling, but never past the bound. reserve() allocates exactly.
            const qint64 room = std::min(size == 0 ? (regular ? info.st_size + 1 : Chunk) : 2 * size, maxBytes + 1);
            bytes.reserve(qsizetype(room));
            bytes.resize(qsizetype(room));
        }
        const ssize_t got = ::read(fd.get(), bytes.data() + size, size_t(bytes.size() - size));
        if (got < 0 && errno == EINTR)
            continue;
        if (got < 0) {
            result.reason = systemReason(errno);
            return result;
        }
        if (got == 0)
            break;
        size += got;
        if (size > maxBytes) {
            result.status = FileRead::TooLarge;
            return result;
        }
    }
    bytes.resize(qsizetype(size));
    result.status = FileRead::Ok;
    result.bytes = std::move(bytes);
    return result;
}

bool isSpecialFile(const QString &path)
{
    struct stat info
    { };
    return ::stat(QFile::encodeName(path).constData(), &info) == 0 && !S_ISREG(info.st_mode);
}

} // namespace zelctl::platform

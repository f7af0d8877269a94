#include "InputFile.h"

#include "platform/FileRead.h"

std::optional<QByteArray> readInputFile(const QString &path, qint64 maxBytes, const char *command, QTextStream &err)
{
    zelctl::platform::FileRead file = zelctl::platform::readFile(path, maxBytes, zelctl::platform::Pipes::Read);
    if (file.ok())
        return std::move(file.bytes);
    err << "zelctl " << command << ": " << path << ": " << file.message(maxBytes) << '\n';
    return std::nullopt;
}

#pragma once

#include <QByteArray>
#include <QString>
#include <QTextStream>

#include <optional>

// The whole input file of a command: a regular file, or a pipe such as /dev/stdin, of at
// most maxBytes. A device, a directory, a larger file or an endless pipe gives a one-line
// error on err ("zelctl COMMAND: PATH: why") and nothing.
std::optional<QByteArray> readInputFile(const QString &path, qint64 maxBytes, const char *command, QTextStream &err);

#pragma once

#include <QStringList>
#include <QTextStream>

// One subcommand of the zelctl tool. run() gets the arguments after the command's name and
// returns the process exit code; errors go to err as one line.
struct Command
{
    const char *name;
    const char *usage;
    int (*run)(const QStringList &args, QTextStream &out, QTextStream &err);
};

int runGifInfo(const QStringList &args, QTextStream &out, QTextStream &err);
int runClasses(const QStringList &args, QTextStream &out, QTextStream &err);
int runNib(const QStringList &args, QTextStream &out, QTextStream &err);
int runLookup(const QStringList &args, QTextStream &out, QTextStream &err);
int runNif(const QStringList &args, QTextStream &out, QTextStream &err);
int runPngInfo(const QStringList &args, QTextStream &out, QTextStream &err);
int runPngDecode(const QStringList &args, QTextStream &out, QTextStream &err);

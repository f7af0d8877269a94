// snapshots: draws every control in its main states with the bundled fonts.
//   snapshots [--golden DIR] [--sheet FILE] [--only NAME...]
// --golden writes one PNG per picture into DIR (the tests' golden pictures), --sheet all of
// them on one contact sheet.

#include "Snapshots.h"

#include "platform/MessageBox.h"
#include "platform/Settings.h"

#include <QApplication>
#include <QCommandLineParser>
#include <QDir>
#include <QTemporaryDir>
#include <QTextStream>

using namespace zelctl;

int main(int argc, char **argv)
{
    // Settings and caches in a private folder: drawing must neither read nor change the user's.
    QTemporaryDir home;
    if (!home.isValid())
        return 1;
    qputenv("XDG_CONFIG_HOME", QFile::encodeName(home.filePath(QStringLiteral("config"))));
    qputenv("XDG_DATA_HOME", QFile::encodeName(home.filePath(QStringLiteral("data"))));
    qputenv("XDG_CACHE_HOME", QFile::encodeName(home.filePath(QStringLiteral("cache"))));
    if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");
    snapshots::useBundledFonts();

    QApplication app(argc, argv);
    QCommandLineParser parser;
    parser.setApplicationDescription(QStringLiteral("Draws every zelctl control in its main states."));
    parser.addHelpOption();
    const QCommandLineOption golden(
        QStringLiteral("golden"), QStringLiteral("Write one PNG per picture into DIR."), QStringLiteral("DIR"));
    const QCommandLineOption sheet(
        QStringLiteral("sheet"), QStringLiteral("Write the contact sheet to FILE."), QStringLiteral("FILE"));
    const QCommandLineOption root(QStringLiteral("root"),
        QStringLiteral("The application's root folder (its data/ holds the bundled data)."), QStringLiteral("DIR"));
    parser.addOptions({ golden, sheet, root });
    parser.addPositionalArgument(QStringLiteral("names"), QStringLiteral("Only the pictures of these names."));
    parser.process(app);

    platform::SaveSetting(QStringLiteral("zEL"), QStringLiteral("Setup"), QStringLiteral("RootPath"),
        QDir(parser.isSet(root) ? parser.value(root) : QStringLiteral(ZELCTL_SOURCE_DIR)).absolutePath()
            + QLatin1Char('/'));
    platform::setMessageBoxPresenter([](const platform::MessageBoxRequest &request) {
        QTextStream(stderr) << "snapshots: unexpected message: " << request.title << '\n';
        return platform::MsgResult::Ok;
    });
    snapshots::setFixedLook();

    const QStringList only = parser.positionalArguments();
    QList<snapshots::Shot> shots;
    int status = 0;
    for (const snapshots::Scene &scene : snapshots::scenes()) {
        if (!only.isEmpty() && !only.contains(scene.name()))
            continue;
        const QImage picture = scene.render();
        if (picture.isNull()) {
            QTextStream(stderr) << "snapshots: " << scene.name() << " drew nothing\n";
            status = 1;
            continue;
        }
        shots.append({ scene, picture });
        if (parser.isSet(golden)) {
            const QString file = QDir(parser.value(golden)).filePath(scene.name() + QStringLiteral(".png"));
            if (!snapshots::savePicture(picture, file)) {
                QTextStream(stderr) << "snapshots: cannot write " << file << '\n';
                status = 1;
            }
        }
    }
    if (parser.isSet(sheet) && !snapshots::savePicture(snapshots::contactSheet(shots), parser.value(sheet))) {
        QTextStream(stderr) << "snapshots: cannot write " << parser.value(sheet) << '\n';
        status = 1;
    }
    return status;
}

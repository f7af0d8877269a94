// gallery: the demo host of the zelctl controls.
//   gallery [--root DIR] [--form FILE] [--save-form FILE] [--screenshot OUT.png]

#include "Gallery.h"

#include "platform/Settings.h"

#include <QApplication>
#include <QCommandLineParser>
#include <QDir>
#include <QTextStream>
#include <QTimer>

int main(int argc, char **argv)
{
    QApplication app(argc, argv);
    QCommandLineParser parser;
    parser.setApplicationDescription("The zelctl controls on the bundled data.");
    parser.addHelpOption();
    const QCommandLineOption screenshot("screenshot", "Render the window to a PNG file and quit.", "file");
    parser.addOption(screenshot);
    const QCommandLineOption root("root", "The application's root folder (its data/ holds the bundled data).", "dir");
    parser.addOption(root);
    const QCommandLineOption form("form", "Load the controls' properties from a form file.", "file");
    parser.addOption(form);
    const QCommandLineOption saveForm("save-form", "Save the controls' properties to a form file and quit.", "file");
    parser.addOption(saveForm);
    parser.process(app);

    // The root folder is the application's setting; an installer, here the demo script, sets it.
    if (parser.isSet(root))
        zelctl::platform::SaveSetting("zEL", "Setup", "RootPath", QDir(parser.value(root)).absolutePath() + '/');

    Gallery gallery;
    QString error;
    if (parser.isSet(form) && !gallery.openForm(parser.value(form), &error)) {
        QTextStream(stderr) << "gallery: " << error << '\n';
        return 1;
    }
    if (parser.isSet(saveForm)) {
        if (gallery.saveForm(parser.value(saveForm), &error))
            return 0;
        QTextStream(stderr) << "gallery: " << error << '\n';
        return 1;
    }
    gallery.show();
    if (!parser.isSet(screenshot))
        return app.exec();
    gallery.fitToContents();

    // Let the form lay out and paint once, then grab it.
    int status = 1;
    QTimer::singleShot(0, [&] {
        const QString file = parser.value(screenshot);
        if (gallery.grab().save(file)) {
            status = 0;
        } else {
            QTextStream(stderr) << "gallery: cannot write " << file << '\n';
        }
        app.quit();
    });
    app.exec();
    return status;
}

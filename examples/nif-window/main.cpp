// A window holding a NIF box, created by name through the library's class factory as a
// host form would, with its properties set and its methods called late-bound.
//   nif-window [--check]   (--check: create, set, validate and quit; exit 0 on success)

#include "frame/ClassRegistry.h"
#include "frame/UserControl.h"

#include <QApplication>
#include <QTextStream>
#include <QVBoxLayout>

int main(int argc, char **argv)
{
    QApplication app(argc, argv);
    QWidget window;
    window.setWindowTitle("zelctl");
    auto *layout = new QVBoxLayout(&window);

    auto *nif = qobject_cast<zelctl::UserControl *>(zelctl::CreateObject("UKAZELCTL.cNIF", &window));
    if (!nif) {
        QTextStream(stderr) << "nif-window: the library does not serve cNIF\n";
        return 1;
    }
    nif->InitNew();
    nif->setProperty("Value", "PT123456789");
    layout->addWidget(nif);
    QObject::connect(nif, SIGNAL(Validated()), &window, SLOT(update()));

    bool valid = false;
    QMetaObject::invokeMethod(nif, "IsValid", Q_RETURN_ARG(bool, valid));
    if (app.arguments().contains("--check")) {
        QTextStream(stdout) << nif->property("Value").toString() << (valid ? " is valid" : " is not valid") << '\n';
        return valid ? 0 : 1;
    }
    window.show();
    return app.exec();
}

// A window holding one control of the library, created by name through its class factory
// as a host form would, with its properties set late-bound.
//   nif-window [--check]   (--check: create, set, read back and quit; exit 0 on success)

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

    auto *control = qobject_cast<zelctl::UserControl *>(zelctl::CreateObject("UKAZELCTL.cNIB", &window));
    if (!control) {
        QTextStream(stderr) << "nif-window: the library does not serve cNIB\n";
        return 1;
    }
    control->InitNew();
    control->setProperty("Text", "003506510000001234580");
    layout->addWidget(control);

    bool valid = false;
    QMetaObject::invokeMethod(control, "Valid", Q_RETURN_ARG(bool, valid));
    if (app.arguments().contains("--check")) {
        QTextStream(stdout) << "cNIB valid: " << (valid ? "yes" : "no") << '\n';
        return valid ? 0 : 1;
    }
    window.show();
    return app.exec();
}

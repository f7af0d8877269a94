// Feeds arbitrary bytes to the form reader as a host's form file: the form's controls are
// created and loaded, the first entry's properties are loaded into a control of every
// class as well, each control is drawn, and the form is saved and read again. A form
// saved twice must give the same bytes the second time.

#include "frame/ClassRegistry.h"
#include "frame/FormFile.h"
#include "frame/UserControl.h"
#include "platform/MessageBox.h"
#include "platform/ModalPresenter.h"

#include <QApplication>
#include <QDialog>
#include <QImage>
#include <QJsonArray>
#include <QJsonDocument>

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <memory>

namespace {

QApplication *application = nullptr;

// A control of every class, loaded with one entry's properties.
QList<zelctl::UserControl *> everyClassWith(const QJsonObject &entry, QWidget *parent)
{
    QList<zelctl::UserControl *> controls;
    const zelctl::PropertyBag bag = zelctl::PropertyBag::fromJson(entry.value("properties").toArray());
    for (const zelctl::ClassInfo &info : zelctl::ClassRegistry::classes()) {
        if (!info.isControl)
            continue;
        auto *control = qobject_cast<zelctl::UserControl *>(zelctl::CreateObject(info.name, parent));
        if (!control)
            continue;
        control->extender().loadJson(entry.value("extender").toObject());
        control->Load(bag);
        controls.append(control);
    }
    return controls;
}

QByteArray savedAgain(const QByteArray &json)
{
    QWidget parent;
    QJsonObject form;
    if (!zelctl::FormFile::parse(json, QStringLiteral("fuzz"), &form))
        return {};
    return QJsonDocument(zelctl::FormFile::write(zelctl::FormFile::create(form, &parent))).toJson();
}

} // namespace

extern "C" int LLVMFuzzerInitialize(int *argc, char ***argv)
{
    qputenv("QT_QPA_PLATFORM", "offscreen");
    application = new QApplication(*argc, *argv);
    zelctl::platform::setMessageBoxPresenter(
        [](const zelctl::platform::MessageBoxRequest &) { return zelctl::platform::MsgResult::Ok; });
    zelctl::platform::setModalPresenter([](QDialog &) { return int(QDialog::Rejected); });
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size)
{
    QJsonObject form;
    if (!zelctl::FormFile::parse(
            QByteArray(reinterpret_cast<const char *>(data), qsizetype(size)), QStringLiteral("fuzz"), &form))
        return 0;
    {
        QWidget parent;
        parent.resize(320, 240);
        QList<zelctl::UserControl *> controls = zelctl::FormFile::create(form, &parent);
        controls += everyClassWith(form.value("controls").toArray().at(0).toObject(), &parent);
        parent.show();
        QImage target(64, 32, QImage::Format_ARGB32);
        for (zelctl::UserControl *control : controls)
            control->render(&target, QPoint(), QRegion(0, 0, 64, 32));

        // Once saved, a form reads back to itself.
        const QByteArray once = savedAgain(QJsonDocument(zelctl::FormFile::write(controls)).toJson());
        const QByteArray twice = savedAgain(once);
        if (once != twice) {
            std::fprintf(stderr, "a saved form does not read back to itself:\n%s\n---\n%s\n", once.constData(),
                twice.constData());
            std::abort();
        }
    }
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    return 0;
}

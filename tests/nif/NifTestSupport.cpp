#include "NifTestSupport.h"

#include "nif/PopupMenuPresenter.h"
#include "tips/clsBalloonTip.h"

#include <QAction>
#include <QPalette>
#include <QRegularExpression>

namespace zelctl::test {

void ScriptedGrabber::answer(const QString &number, const QHash<QString, QString> &data)
{
    Q_EMIT Starting();
    if (!data.isEmpty()) {
        fields = data;
        fields.insert(QStringLiteral("ID"), number);
        Q_EMIT ReceivedInformation(number);
    }
    busy = false;
    Q_EMIT Finished();
}

ScriptedGrabberFactory::ScriptedGrabberFactory()
    : m_previous(companion::setNIFGrabberFactory([this](QObject *parent) {
        last = new ScriptedGrabber(parent);
        return last;
    }))
{ }

ScriptedGrabberFactory::~ScriptedGrabberFactory()
{
    companion::setNIFGrabberFactory(std::move(m_previous));
}

MenuChooser::MenuChooser(QString choice, std::function<void()> user)
    : m_previous(setPopupMenuPresenter([this, choice, user](QMenu &menu, const QPoint &) {
        ++shown;
        entries.clear();
        for (const QAction *action : menu.actions()) {
            entries << QStringList { action->objectName(), action->text(), action->shortcut().toString(),
                action->isEnabled() ? "on" : "off" }
                           .join('|');
        }
        defaultEntry = menu.defaultAction() ? menu.defaultAction()->objectName() : QString();
        if (user)
            return user();
        QAction *action = choice.isEmpty() ? nullptr : menu.findChild<QAction *>(choice);
        if (action && action->isEnabled())
            action->trigger();
    }))
{ }

MenuChooser::~MenuChooser()
{
    setPopupMenuPresenter(std::move(m_previous));
}

bool MenuChooser::offered(const QString &name) const
{
    return entries.filter(QRegularExpression("^" + name + "\\|.*\\|on$")).size() == 1;
}

void onEveryEvent(cNIF &control, const std::function<void(const QString &)> &heard)
{
    const std::pair<const char *, void (cNIF::*)()> plain[]
        = { { "Changed", &cNIF::Changed }, { "Validated", &cNIF::Validated }, { "NIFIndicated", &cNIF::NIFIndicated },
              { "Cleared", &cNIF::Cleared }, { "DataFinished", &cNIF::DataFinished } };
    for (const auto &[name, signal] : plain)
        QObject::connect(&control, signal, [heard, name] { heard(QString::fromLatin1(name)); });
    QObject::connect(
        &control, &cNIF::UpdatedInformation, [heard](const QString &id) { heard("UpdatedInformation:" + id); });
    QObject::connect(&control, &cNIF::NameUpdated, [heard](const QString &name) { heard("NameUpdated:" + name); });
}

void NifFixture::SetUp()
{
    other = new QLineEdit(&form);
    other->move(0, 40);
    form.show();
    QApplication::setActiveWindow(&form);
    ASSERT_TRUE(QTest::qWaitForWindowActive(&form));
    replaceControl();
}

void NifFixture::replaceControl()
{
    delete control;
    control = new cNIF(&form);
    control->InitNew();
    control->show();
    box = entryBox(*control);
    box->setFocus();
    log = std::make_unique<EventLog>(*control);
}

platform::OleColor textColour(cNIF &control)
{
    return platform::fromQColor(entryBox(control)->palette().color(QPalette::Text));
}

platform::OleColor backColour(cNIF &control)
{
    return platform::fromQColor(entryBox(control)->palette().color(QPalette::Base));
}

platform::OleColor statusColour(cNIF &control)
{
    return control.findChild<QWidget *>(QStringLiteral("Shape1"))->property("BorderColor").toUInt();
}

QString tipText(cNIF &control)
{
    const auto *tip = control.findChild<clsBalloonTip *>(QStringLiteral("tip"));
    return tip ? tip->TipText() : QStringLiteral("<no tip>");
}

void storeInfo(companion::Declaration &declaration, const QString &key, const QString &value)
{
    declaration.DeclarationData().NifInfoStore().Write(key, value);
}

QString storedInfo(companion::Declaration &declaration, const QString &key)
{
    return declaration.DeclarationData().NifInfoStore().Read(key).toString();
}

} // namespace zelctl::test

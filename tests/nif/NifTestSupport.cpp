#include "NifTestSupport.h"

#include "companion/CommandButton.h"
#include "nif/PopupMenuPresenter.h"
#include "tips/clsBalloonTip.h"

#include <QAction>
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

QString tipText(cNIF &control)
{
    const auto *tip = control.findChild<clsBalloonTip *>(QStringLiteral("tip"));
    return tip ? tip->TipText() : QStringLiteral("<no tip>");
}

void press(const QWidget &form, int index)
{
    for (auto *button : form.findChildren<CommandButton *>()) {
        if (button->Index() == index)
            return QTest::mouseClick(button, Qt::LeftButton); // the click may delete the form
    }
}

} // namespace zelctl::test

#pragma once

#include "companion/CommandButton.h"
#include "companion/JsonDeclaration.h"
#include "companion/NIFGrabber.h"
#include "nif/PopupMenuPresenter.h"
#include "nif/cNIF.h"
#include "platform/OleColor.h"
#include "support/TestSupport.h"
#include "tips/clsBalloonTip.h"

#include <QAction>
#include <QApplication>
#include <QHash>
#include <QLineEdit>
#include <QMenu>
#include <QPointer>
#include <QTest>

#include <gtest/gtest.h>

#include <functional>

namespace zelctl::test {

// A fetcher the test answers by hand: Fetch only records the number; answer() raises the
// events a real fetch raises later: Starting, ReceivedInformation (unless data is empty), Finished.
class ScriptedGrabber : public companion::NIFGrabber
{
    Q_OBJECT

public:
    using NIFGrabber::NIFGrabber;

    bool IsBusy() const override { return busy; }
    QString HolderName() const override { return fields.value(QStringLiteral("NAME")); }
    QString GetField(const QString &key) const override { return fields.value(key); }
    void SetField(const QString &key, const QString &value) override { fields.insert(key, value); }
    void Fetch(const QString &taxNumber, const QVariant &) override
    {
        fetched << taxNumber;
        busy = true;
    }

    void answer(const QString &number, const QHash<QString, QString> &data)
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

    QStringList fetched;
    bool busy = false;
    QHash<QString, QString> fields;
};

// Controls made while it lives get a ScriptedGrabber.
class ScriptedGrabberFactory
{
public:
    ScriptedGrabberFactory()
        : m_previous(
            companion::setNIFGrabberFactory([this](QObject *parent) { return last = new ScriptedGrabber(parent); }))
    { }
    ~ScriptedGrabberFactory() { companion::setNIFGrabberFactory(std::move(m_previous)); }
    ScriptedGrabber *last = nullptr;

private:
    companion::NIFGrabberFactory m_previous;
};

// Calls `heard` with every event of a control, as "Name" or "Name:argument", in the order raised.
inline void onEveryEvent(cNIF &control, const std::function<void(const QString &)> &heard)
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

// Stands in for the user at the context menu: records the enabled entries and chooses the
// one named `choice` (when it is enabled), or runs `user` instead.
class MenuChooser
{
public:
    explicit MenuChooser(QString choice = {}, std::function<void()> user = {})
        : m_previous(setPopupMenuPresenter([this, choice, user](QMenu &menu, const QPoint &) {
            ++shown;
            offered.clear();
            for (const QAction *action : menu.actions()) {
                if (action->isEnabled())
                    offered << action->objectName();
            }
            if (user)
                return user();
            if (offered.contains(choice))
                menu.findChild<QAction *>(choice)->trigger();
        }))
    { }
    ~MenuChooser() { setPopupMenuPresenter(std::move(m_previous)); }

    int shown = 0;
    QStringList offered;

private:
    std::function<void(QMenu &, const QPoint &)> m_previous;
};

inline QLineEdit *entryBox(cNIF &control)
{
    return control.findChild<QLineEdit *>(QStringLiteral("nif"));
}

// A right click as the window system delivers it: the press, then Qt's context menu event.
inline void rightClick(QWidget *widget)
{
    QWidget *window = widget->window();
    QTest::mouseClick(window->windowHandle(), Qt::RightButton, {}, widget->mapTo(window, widget->rect().center()));
}

// Deletes what deleteLater left, as the event loop would.
inline void runDeferredDeletes()
{
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
}

inline platform::OleColor colour(cNIF &control, QPalette::ColorRole role = QPalette::Base)
{
    return platform::fromQColor(entryBox(control)->palette().color(role));
}
inline platform::OleColor statusColour(cNIF &control)
{
    return control.findChild<QWidget *>(QStringLiteral("Shape1"))->property("BorderColor").toUInt();
}
inline QString tipText(cNIF &control)
{
    const auto *tip = control.findChild<clsBalloonTip *>(QStringLiteral("tip"));
    return tip ? tip->TipText() : QStringLiteral("<no tip>");
}

// Clicks the record form's command button of that index (0 Apply, 1 OK, 2 Cancel, 3 public information).
inline void press(const QWidget &form, int index)
{
    for (auto *button : form.findChildren<CommandButton *>()) {
        if (button->Index() == index)
            return QTest::mouseClick(button, Qt::LeftButton); // the click may delete the form
    }
}

// A shown, active form holding a fresh control (focused) and another input to move focus to.
class NifFixture : public ::testing::Test
{
protected:
    void SetUp() override
    {
        form = new QWidget;
        other = new QLineEdit(form);
        other->move(0, 40);
        ASSERT_TRUE(test::showActive(form));
        replaceControl();
    }

    void TearDown() override
    {
        delete form.data();
        runDeferredDeletes();
    }

    void replaceControl()
    {
        delete control.data();
        control = new cNIF(form);
        control->InitNew();
        control->show();
        box = entryBox(*control);
        box->setFocus();
        events.clear();
        onEveryEvent(*control, [this](const QString &event) { events << event; });
    }

    void type(const QString &text)
    {
        box->setFocus();
        QTest::keyClicks(box, text);
    }

    void erase()
    {
        box->setFocus();
        box->selectAll();
        QTest::keyClick(box, Qt::Key_Backspace);
    }

    ScriptedGrabberFactory grabbers;
    QPointer<QWidget> form;
    QPointer<cNIF> control;
    QLineEdit *other = nullptr;
    QLineEdit *box = nullptr;
    QStringList events; // every event of the control, in the order raised
    companion::JsonDeclaration declaration;
};

// Valid Portuguese numbers.
inline const QString AnaNif = QStringLiteral("210345675");
inline const QString PlainNif = QStringLiteral("123456789");
inline const QString OtherNif = QStringLiteral("251739465");

} // namespace zelctl::test

#pragma once

#include "companion/JsonDeclaration.h"
#include "companion/NIFGrabber.h"
#include "nif/cNIF.h"
#include "platform/OleColor.h"

#include <QApplication>
#include <QHash>
#include <QLineEdit>
#include <QMenu>
#include <QPalette>
#include <QStringList>
#include <QTest>

#include <functional>

#include <gtest/gtest.h>

#include <memory>
#include <ostream>

// Readable texts in the test's messages.
inline void PrintTo(const QString &text, std::ostream *out)
{
    *out << '"' << text.toStdString() << '"';
}

namespace zelctl::test {

// A fetcher the test answers by hand: Fetch only records the number; answer() raises the
// three events as a real fetch would, later. Field keys are compared exactly.
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

    // Starting, then (unless data is empty) ReceivedInformation for number, then Finished.
    void answer(const QString &number, const QHash<QString, QString> &data);

    QStringList fetched;
    bool busy = false;
    QHash<QString, QString> fields;
};

// Installs a factory of ScriptedGrabber for the controls made while it lives.
class ScriptedGrabberFactory
{
public:
    ScriptedGrabberFactory();
    ~ScriptedGrabberFactory();
    ScriptedGrabber *last = nullptr;

private:
    companion::NIFGrabberFactory m_previous;
};

// Calls `heard` with every event of a control, as "Name" or "Name:argument", in the order raised.
void onEveryEvent(cNIF &control, const std::function<void(const QString &)> &heard);

// Every event of a control, in the order raised.
class EventLog
{
public:
    explicit EventLog(cNIF &control)
    {
        onEveryEvent(control, [this](const QString &event) { events << event; });
    }
    QStringList events;
    int count(const QString &event) const { return int(events.count(event)); }
    void clear() { events.clear(); }
};

// Stands in for the user at the context menu: records what it offered and chooses the
// entry named `choice` (when it is enabled), or runs `user` instead.
class MenuChooser
{
public:
    explicit MenuChooser(QString choice = {}, std::function<void()> user = {});
    ~MenuChooser();
    MenuChooser(const MenuChooser &) = delete;
    MenuChooser &operator=(const MenuChooser &) = delete;

    // Whether the entry was offered and enabled the last time.
    bool offered(const QString &name) const;

    int shown = 0;
    QStringList entries;
    QString defaultEntry;

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

inline platform::OleColor colourOf(QWidget *widget, QPalette::ColorRole role)
{
    return platform::fromQColor(widget->palette().color(role));
}
inline platform::OleColor textColour(cNIF &control)
{
    return colourOf(entryBox(control), QPalette::Text);
}
inline platform::OleColor backColour(cNIF &control)
{
    return colourOf(entryBox(control), QPalette::Base);
}
inline platform::OleColor statusColour(cNIF &control)
{
    return control.findChild<QWidget *>(QStringLiteral("Shape1"))->property("BorderColor").toUInt();
}
QString tipText(cNIF &control);

// Clicks the record form's command button of that index (0 Apply, 1 OK, 2 Cancel, 3 public information).
void press(const QWidget &form, int index);

// A shown, active form holding a fresh control (focused) and another input to move focus to.
class NifFixture : public ::testing::Test
{
protected:
    void SetUp() override;
    // A fresh control in place of the current one, focused.
    void replaceControl();

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
    QWidget form;
    cNIF *control = nullptr;
    QLineEdit *other = nullptr;
    QLineEdit *box = nullptr;
    std::unique_ptr<EventLog> log;
    companion::JsonDeclaration declaration;
};

// A declaration's NIF information store.
inline void storeInfo(companion::Declaration &declaration, const QString &key, const QString &value)
{
    declaration.DeclarationData().NifInfoStore().Write(key, value);
}
inline QString storedInfo(companion::Declaration &declaration, const QString &key)
{
    return declaration.DeclarationData().NifInfoStore().Read(key).toString();
}

// Valid Portuguese numbers.
inline const QString AnaNif = QStringLiteral("210345675");
inline const QString PlainNif = QStringLiteral("123456789");
inline const QString OtherNif = QStringLiteral("251739465");

} // namespace zelctl::test

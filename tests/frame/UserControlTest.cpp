#include "frame/UserControl.h"

#include "platform/OleColor.h"
#include "platform/WindowHandles.h"

#include <QSignalSpy>
#include <QTest>

#include <gtest/gtest.h>

using namespace zelctl;

namespace {

// Records the life-cycle calls it receives, and persists one property "Caption".
class RecordingControl : public UserControl
{
public:
    RecordingControl(QStringList &calls, QWidget *parent)
        : UserControl(parent)
        , m_calls(calls)
    {
        m_calls << "Initialize";
    }

    QString caption;
    void setCaption(const QString &text)
    {
        caption = text;
        PropertyChanged("Caption");
    }

protected:
    void InitProperties() override
    {
        m_calls << "InitProperties";
        caption = "default";
    }
    void ReadProperties(const PropertyBag &bag) override
    {
        m_calls << "ReadProperties";
        setCaption(bag.ReadProperty("Caption", "default").toString());
    }
    void WriteProperties(PropertyBag &bag) override
    {
        m_calls << "WriteProperties";
        bag.WriteProperty("Caption", caption, "default");
    }
    void Terminate() override { m_calls << "Terminate"; }
    void AmbientChanged(const QString &name) override { m_calls << "AmbientChanged:" + name; }

private:
    QStringList &m_calls;
};

class UserControlTest : public ::testing::Test
{
protected:
    QStringList calls;
    QWidget form;
    RecordingControl *control = new RecordingControl(calls, &form);
};

} // namespace

// Released twice, a control terminates once; loading marks nothing as changed.
TEST_F(UserControlTest, runsEachLifeCycleStepOnceAndLoadsWithoutMarkingChanges)
{
    control->InitNew();
    EXPECT_TRUE(control->Save().isEmpty()) << "a default value is not written";
    control->caption = "Olá";
    const PropertyBag bag = control->Save();
    control->Release();
    control->Release();
    QSignalSpy gone(control, &QObject::destroyed);
    ASSERT_TRUE(QTest::qWaitFor([&] { return gone.count() == 1; }));
    EXPECT_EQ(
        calls, QStringList({ "Initialize", "InitProperties", "WriteProperties", "WriteProperties", "Terminate" }));

    calls.clear();
    auto *loaded = new RecordingControl(calls, &form);
    QSignalSpy changes(loaded, &UserControl::propertyChanged);
    loaded->Load(bag);
    EXPECT_EQ(loaded->caption, "Olá");
    EXPECT_EQ(changes.count(), 0);
    loaded->setCaption("novo");
    EXPECT_EQ(changes.count(), 1);
    EXPECT_EQ(calls, QStringList({ "Initialize", "ReadProperties" }));
}

TEST_F(UserControlTest, reportsEachChangedAmbientPropertyOnce)
{
    EXPECT_FALSE(control->designMode());
    Ambient designer = control->ambient();
    designer.UserMode = false;
    designer.UIDead = true;
    designer.DisplayName = "NIF1";
    designer.BackColor = platform::rgb(1, 2, 3);
    designer.Font.setPointSize(designer.Font.pointSize() + 3);
    control->setAmbient(designer);
    control->setAmbient(designer);
    EXPECT_TRUE(control->designMode());
    EXPECT_EQ(calls.mid(1),
        QStringList({ "AmbientChanged:UserMode", "AmbientChanged:UIDead", "AmbientChanged:DisplayName",
            "AmbientChanged:BackColor", "AmbientChanged:Font" }));
}

// A handle of a control that is gone names nothing, and is never given again.
TEST_F(UserControlTest, hWndNamesTheControlUntilItIsGone)
{
    const qint32 handle = control->property("hWnd").value<qint32>();
    EXPECT_EQ(platform::widgetOf(handle), control);
    delete control;
    EXPECT_EQ(platform::widgetOf(handle), nullptr);
    EXPECT_NE(RecordingControl(calls, &form).hWnd(), handle);
}

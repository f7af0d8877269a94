#include "frame/UserControl.h"

#include "platform/Twips.h"
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
    explicit RecordingControl(QStringList &calls)
        : m_calls(calls)
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
    void resizeEvent(QResizeEvent *) override { record("Resize"); }
    void showEvent(QShowEvent *) override { record("Show"); }
    void paintEvent(QPaintEvent *) override { record("Paint"); }

private:
    // Qt may repaint several times; the order of first occurrences is what counts.
    void record(const QString &call)
    {
        if (!m_calls.contains(call))
            m_calls << call;
    }
    QStringList &m_calls;
};

class UserControlTest : public ::testing::Test
{
protected:
    QStringList calls;
    QWidget form;

    RecordingControl *make()
    {
        auto *control = new RecordingControl(calls);
        control->setParent(&form);
        return control;
    }
};

} // namespace

TEST_F(UserControlTest, newControlRunsInitPropertiesThenLayoutThenSaveThenTerminate)
{
    RecordingControl *control = make();
    control->InitNew();
    control->resize(40, 20);
    form.show();
    ASSERT_TRUE(QTest::qWaitFor([&] { return calls.contains("Paint"); }));
    const PropertyBag saved = control->Save();
    control->Release();
    control->Release();
    QSignalSpy gone(control, &QObject::destroyed);
    ASSERT_TRUE(QTest::qWaitFor([&] { return gone.count() == 1; }));

    EXPECT_EQ(calls,
        QStringList({ "Initialize", "InitProperties", "Resize", "Show", "Paint", "WriteProperties", "Terminate" }));
    EXPECT_TRUE(saved.isEmpty()) << "a default value is not written";
}

TEST_F(UserControlTest, savedControlIsLoadedThroughReadPropertiesAndMarkedUnchanged)
{
    RecordingControl *first = make();
    first->caption = "Olá";
    const PropertyBag bag = first->Save();
    calls.clear();
    RecordingControl *second = make();
    QSignalSpy changes(second, &UserControl::propertyChanged);
    second->Load(bag);
    EXPECT_EQ(second->caption, "Olá");
    EXPECT_EQ(changes.count(), 0) << "loading marks nothing as changed";
    second->setCaption("novo");
    EXPECT_EQ(changes.count(), 1);
    EXPECT_EQ(calls, QStringList({ "Initialize", "ReadProperties" }));
}

TEST_F(UserControlTest, reportsEachChangedAmbientPropertyOnce)
{
    RecordingControl *control = make();
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

TEST_F(UserControlTest, extenderPlacesInTwipsAndNamesTheControl)
{
    RecordingControl *control = make();
    Extender &ext = control->extender();
    ext.Move(150, 300, 2685, 330);
    EXPECT_EQ(control->geometry(), QRect(10, 20, 179, 22));
    ext.setTop(450);
    ext.setLeft(75);
    EXPECT_EQ(control->pos(), QPoint(5, 30));
    ext.setName("NIB1");
    ext.setToolTipText("dica");
    EXPECT_EQ(control->objectName(), "NIB1");
    EXPECT_EQ(control->toolTip(), "dica");
}

TEST_F(UserControlTest, hWndNamesTheControlUntilItIsGone)
{
    RecordingControl *control = make();
    const qint32 handle = control->property("hWnd").value<qint32>();
    EXPECT_NE(handle, 0);
    EXPECT_EQ(control->hWnd(), handle);
    EXPECT_EQ(platform::widgetOf(handle), control);
    delete control;
    for (const qint32 gone : { handle, 0, -7 })
        EXPECT_EQ(platform::widgetOf(gone), nullptr) << gone;
    EXPECT_NE(make()->hWnd(), handle) << "handles are never reused";
}

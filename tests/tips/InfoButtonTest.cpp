#include "tips/InfoButton.h"
#include "common/modFuncs.h"
#include "platform/OleColor.h"
#include "platform/Shell.h"
#include "platform/WindowHandles.h"
#include "tips/TooltipWindow.h"

#include <QPainter>
#include <QSignalSpy>
#include <QTest>

#include <gtest/gtest.h>

using namespace zelctl;

namespace {

// Records what would be opened instead of opening it.
class ShellRecorder
{
public:
    explicit ShellRecorder(bool succeed = true)
        : m_previous(platform::setShellOpenHook([this, succeed](const QString &action) {
            opened << action;
            return succeed;
        }))
    { }
    ~ShellRecorder() { platform::setShellOpenHook(std::move(m_previous)); }

    QStringList opened;

private:
    platform::ShellOpenHook m_previous;
};

// A new button on a shown form, as a designer places it.
struct PlacedButton : ::testing::Test
{
    QWidget form;
    InfoButton *button = new InfoButton(&form);

    PlacedButton()
    {
        form.resize(100, 60);
        button->move(10, 10);
        button->InitNew();
        form.show();
        EXPECT_TRUE(QTest::qWaitForWindowExposed(&form));
        QTest::mouseMove(&form, QPoint(90, 50));
    }

    // A pointer move over the button, which builds its tip when needed.
    void hover(QPoint at = QPoint(5, 5)) { QTest::mouseMove(button, at); }

    TooltipWindow *tipWindow() const
    {
        const clsBalloonTip *tip = button->GetTooltipClass();
        return tip ? qobject_cast<TooltipWindow *>(platform::widgetOf(tip->lHwnd())) : nullptr;
    }
};

QImage iconOn(const QString &name, const QColor &background)
{
    QImage expected(16, 16, QImage::Format_RGB32);
    expected.fill(background);
    QPainter painter(&expected);
    painter.drawImage(0, 0, QImage(":/zelctl/icons/" + name + ".png"));
    return expected;
}

} // namespace

TEST_F(PlacedButton, keepsItsSizeOf240Twips)
{
    button->extender().Move(0, 0, 1000, 3000);
    EXPECT_EQ(button->extender().Width(), 240);
    EXPECT_EQ(button->extender().Height(), 240);
}

TEST_F(PlacedButton, lineBreaksInTheTipText)
{
    int x = 1;
    for (const QString &text : { QString("um||dois"), QString("um\\ndois"), QString("  um||dois  ") }) {
        button->setTipText(text);
        hover(QPoint(++x, 5));
        ASSERT_NE(button->GetTooltipClass(), nullptr) << text.toStdString();
        EXPECT_EQ(button->GetTooltipClass()->TipText(), "um\r\ndois") << text.toStdString();
        ASSERT_NE(tipWindow(), nullptr);
        EXPECT_EQ(tipWindow()->text(), "um\ndois");
    }
}

TEST_F(PlacedButton, tipCarriesTitleStyleAndIcon)
{
    button->setTipText("Atenção ao prazo");
    button->setToolTipTitle("Prazo");
    button->setStyle(InfoButton::IB_ERROR);
    hover();
    ASSERT_NE(tipWindow(), nullptr);
    EXPECT_EQ(tipWindow()->title(), "Prazo");
    EXPECT_EQ(tipWindow()->icon(), clsBalloonTip::TTIconError);
    EXPECT_TRUE(tipWindow()->isBalloon());

    // A new style alone waits for the next rebuild, which a new tip style forces.
    const qint32 built = button->GetTooltipClass()->lHwnd();
    button->setStyle(InfoButton::IB_WARNING);
    hover(QPoint(7, 7));
    EXPECT_EQ(button->GetTooltipClass()->lHwnd(), built);
    button->setToolTipStyle(InfoButton::TTS_DEFAULT);
    hover(QPoint(8, 8));
    EXPECT_FALSE(tipWindow()->isBalloon());
    EXPECT_EQ(tipWindow()->icon(), clsBalloonTip::TTIconWarning);
}

TEST_F(PlacedButton, blankTextRemovesTheTip)
{
    button->setTipText("algo");
    hover();
    ASSERT_NE(button->GetTooltipClass(), nullptr);
    const qint32 window = button->GetTooltipClass()->lHwnd();
    button->setTipText("   ");
    hover(QPoint(6, 6));
    EXPECT_EQ(button->GetTooltipClass(), nullptr);
    EXPECT_EQ(platform::widgetOf(window), nullptr);
    button->PopupTip();
    button->setTipText("de volta");
    hover(QPoint(7, 7));
    ASSERT_NE(button->GetTooltipClass(), nullptr);
    EXPECT_EQ(tipWindow()->text(), "de volta");
}

TEST_F(PlacedButton, clickDependsOnTheAction)
{
    struct Row
    {
        QString action;
        QString stored;
        int clicks;
        QStringList opened;
    };
    const QList<Row> rows = {
        { " Click ", "Click", 1, {} },
        { "NOTHING", "NOTHING", 0, {} },
        { "nothing ", "nothing", 0, {} },
        { "https://www.example.pt/ajuda", "https://www.example.pt/ajuda", 1, { "https://www.example.pt/ajuda" } },
        { "/sem/tal/ficheiro.pdf", "/sem/tal/ficheiro.pdf", 1, { "/sem/tal/ficheiro.pdf" } },
        { "README.md", "README.md", 1, { modFuncs::GetRootPath() + "README.md" } },
    };
    for (const Row &row : rows) {
        ShellRecorder shell(false);
        button->setAction(row.action);
        EXPECT_EQ(button->Action(), row.stored);
        EXPECT_EQ(button->cursor().shape(), Qt::PointingHandCursor);
        QSignalSpy clicks(button, &InfoButton::Click);
        // A double click acts once: its second press is no new press.
        QTest::mouseClick(button, Qt::LeftButton, {}, QPoint(8, 8));
        QTest::mouseDClick(button, Qt::LeftButton, {}, QPoint(8, 8));
        QTest::mouseRelease(button, Qt::LeftButton, {}, QPoint(8, 8));
        EXPECT_EQ(clicks.count(), row.clicks) << row.action.toStdString();
        EXPECT_EQ(shell.opened, row.opened) << row.action.toStdString();
    }
}

TEST_F(PlacedButton, clickWithoutActionPopsTheTipUp)
{
    ShellRecorder shell;
    button->setAction("x");
    button->setAction("");
    EXPECT_EQ(button->cursor().shape(), Qt::ArrowCursor);
    button->setTipText("Clique para ver");
    button->GetTooltipClass()->SetTimeout(60000, 60000);
    hover();
    ASSERT_NE(tipWindow(), nullptr);
    EXPECT_FALSE(tipWindow()->isVisible());

    QSignalSpy clicks(button, &InfoButton::Click);
    QTest::mouseClick(button, Qt::LeftButton, {}, QPoint(8, 8));
    EXPECT_EQ(clicks.count(), 1);
    EXPECT_TRUE(tipWindow()->isVisible());
    EXPECT_TRUE(shell.opened.isEmpty());
}

TEST_F(PlacedButton, iconFollowsStyleAndEnabledState)
{
    const QColor back = platform::toQColor(button->ambient().BackColor);
    struct Row
    {
        InfoButton::IB_STYLE_ENUM style;
        bool enabled;
        const char *icon;
    };
    for (const Row &row :
        { Row { InfoButton::IB_INFO, true, "INFO" }, Row { InfoButton::IB_INFO, false, "INFO_DISABLED" },
            Row { InfoButton::IB_WARNING, true, "WARNING" }, Row { InfoButton::IB_WARNING, false, "WARNING_DISABLED" },
            Row { InfoButton::IB_ERROR, true, "ERROR" }, Row { InfoButton::IB_ERROR, false, "WARNING_DISABLED" } }) {
        button->setStyle(row.style);
        button->setEnabled(row.enabled);
        EXPECT_EQ(button->grab().toImage().convertToFormat(QImage::Format_RGB32), iconOn(row.icon, back)) << row.icon;
    }
}

TEST(InfoButtonPersistence, roundTripKeepsEveryProperty)
{
    InfoButton saved;
    saved.InitNew();
    saved.setAction(" https://www.example.pt ");
    saved.setStyle(InfoButton::IB_ERROR);
    saved.setToolTipStyle(InfoButton::TTS_DEFAULT);
    saved.setToolTipTitle("Erro");
    saved.setEnabled(false);
    saved.setTipText("linha um||linha dois");
    saved.setTransparent(true);
    const PropertyBag bag = saved.Save();
    EXPECT_EQ(bag.names(),
        QStringList({ "ibutton.action", "ibutton.enabled", "ibutton.bstyle", "ibutton.style", "ibutton.title",
            "ibutton.tiptext", "ibutton.transparent" }));

    InfoButton loaded;
    loaded.Load(bag);
    EXPECT_EQ(loaded.Action(), "https://www.example.pt");
    EXPECT_EQ(loaded.Style(), InfoButton::IB_ERROR);
    EXPECT_EQ(loaded.ToolTipStyle(), InfoButton::TTS_DEFAULT);
    EXPECT_EQ(loaded.ToolTipTitle(), "Erro");
    EXPECT_FALSE(loaded.Enabled());
    EXPECT_EQ(loaded.TipText(), "linha um||linha dois");
    EXPECT_TRUE(loaded.Transparent());
    EXPECT_EQ(loaded.Save(), bag);
}

TEST(InfoButtonPersistence, absentNamesGiveTheDefaults)
{
    PropertyBag old;
    old.WriteProperty("ToolTipText", "texto antigo");
    InfoButton loaded;
    loaded.Load(old);
    EXPECT_EQ(loaded.TipText(), "texto antigo");
    EXPECT_EQ(loaded.Style(), InfoButton::IB_INFO);
    EXPECT_EQ(loaded.ToolTipStyle(), InfoButton::TTS_BALLOON);
    EXPECT_EQ(loaded.ToolTipTitle(), "Informação");
    EXPECT_TRUE(loaded.Enabled());

    PropertyBag both;
    both.WriteProperty("ToolTipText", "antigo");
    both.WriteProperty("ibutton.tiptext", "novo");
    loaded.Load(both);
    EXPECT_EQ(loaded.TipText(), "novo");
}

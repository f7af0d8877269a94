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

} // namespace

TEST_F(PlacedButton, keepsItsSizeOf240TwipsAndBreaksTheTipTextIntoLines)
{
    button->extender().Move(0, 0, 1000, 3000);
    EXPECT_EQ(QSize(button->extender().Width(), button->extender().Height()), QSize(240, 240));
    int x = 1;
    for (const QString &text : { QString("um||dois"), QString("um\\ndois"), QString("  um||dois  ") }) {
        SCOPED_TRACE(text.toStdString());
        button->setTipText(text);
        hover(QPoint(++x, 5));
        ASSERT_NE(tipWindow(), nullptr);
        EXPECT_EQ(button->GetTooltipClass()->TipText(), "um\r\ndois");
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

TEST_F(PlacedButton, clickDependsOnTheActionWhichIsKeptTrimmed)
{
    const std::tuple<QString, int, QString> rows[] = { { " Click ", 1, "" }, { "NOTHING", 0, "" },
        { "nothing ", 0, "" }, { "https://www.example.pt/ajuda", 1, "https://www.example.pt/ajuda" },
        { "/sem/tal/ficheiro.pdf", 1, "/sem/tal/ficheiro.pdf" },
        { "README.md", 1, modFuncs::GetRootPath() + "README.md" } };
    for (const auto &[action, clicks, opened] : rows) {
        SCOPED_TRACE(action.toStdString());
        ShellRecorder shell(false);
        button->setAction(action);
        EXPECT_EQ(button->Action(), action.trimmed());
        EXPECT_EQ(button->cursor().shape(), Qt::PointingHandCursor);
        QSignalSpy clicked(button, &InfoButton::Click);
        // A double click acts once: its second press is no new press.
        QTest::mouseClick(button, Qt::LeftButton, {}, QPoint(8, 8));
        QTest::mouseDClick(button, Qt::LeftButton, {}, QPoint(8, 8));
        QTest::mouseRelease(button, Qt::LeftButton, {}, QPoint(8, 8));
        EXPECT_EQ(clicked.count(), clicks);
        EXPECT_EQ(shell.opened.join('|'), opened);
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

TEST_F(PlacedButton, iconFollowsStyleAndEnabledStateOnTheAmbientBackColour)
{
    const QColor back = platform::toQColor(button->ambient().BackColor);
    const std::tuple<InfoButton::IB_STYLE_ENUM, bool, const char *> rows[]
        = { { InfoButton::IB_INFO, true, "INFO" }, { InfoButton::IB_INFO, false, "INFO_DISABLED" },
              { InfoButton::IB_ERROR, true, "ERROR" }, { InfoButton::IB_ERROR, false, "WARNING_DISABLED" } };
    for (const auto &[style, enabled, icon] : rows) {
        button->setStyle(style);
        button->setEnabled(enabled);
        QImage expected(16, 16, QImage::Format_RGB32);
        expected.fill(back);
        QPainter(&expected).drawImage(0, 0, QImage(QStringLiteral(":/zelctl/icons/%1.png").arg(icon)));
        EXPECT_EQ(button->grab().toImage().convertToFormat(QImage::Format_RGB32), expected) << icon;
    }
}

TEST(InfoButtonPersistence, roundTripKeepsEveryPropertyAndAbsentNamesGiveTheDefaults)
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
    InfoButton loaded;
    loaded.Load(bag);
    const auto properties = [](const InfoButton &b) {
        return QStringList { b.Action(), QString::number(b.Style()), QString::number(b.ToolTipStyle()),
            b.ToolTipTitle(), QString::number(b.Enabled()), b.TipText(), QString::number(b.Transparent()) };
    };
    EXPECT_EQ(properties(loaded),
        QStringList({ "https://www.example.pt", "2", "0", "Erro", "0", "linha um||linha dois", "1" }));
    EXPECT_EQ(loaded.Save(), bag);
    EXPECT_EQ(bag.names(),
        QStringList({ "ibutton.action", "ibutton.enabled", "ibutton.bstyle", "ibutton.style", "ibutton.title",
            "ibutton.tiptext", "ibutton.transparent" }));

    PropertyBag old;
    old.WriteProperty("ToolTipText", "texto antigo");
    InfoButton fresh;
    fresh.Load(old);
    EXPECT_EQ(properties(fresh), QStringList({ "", "0", "1", "Informação", "1", "texto antigo", "0" }));
    old.WriteProperty("ibutton.tiptext", "novo");
    fresh.Load(old);
    EXPECT_EQ(fresh.TipText(), "novo");
}

// What a screen reader hears of each control, and what it hears change as the user drives it.

#include "common/modFuncs.h"
#include "companion/CommandButton.h"
#include "gif/ucAniGIF.h"
#include "nif/cNIF.h"
#include "platform/Settings.h"
#include "selection/frmSelectCountry.h"
#include "skins/cSlider.h"
#include "skins/skGoButton.h"
#include "skins/skSubMenu.h"
#include "support/TestSupport.h"
#include "tips/InfoButton.h"
#include "tips/TooltipWindow.h"

#include <QApplication>
#include <QtGui/private/qguiapplication_p.h>
#include <qpa/qplatformaccessibility.h>
#include <qpa/qplatformintegration.h>

#include <QLabel>
#include <QLineEdit>
#include <QSignalSpy>
#include <QTest>

#include <gtest/gtest.h>

#include <bit>

using namespace zelctl;
using namespace zelctl::test;

namespace {

// Qt's accessibility switched on through the platform's object, as a screen reader's arrival
// does, the events raised recorded instead of sent to a bridge, and a shown form.
class Accessibility : public ::testing::Test
{
protected:
    void SetUp() override
    {
        // A valid number is not looked up: the holder's name is the test's to give.
        platform::SaveSetting("ZEL", "Config", "allowautonif", "0");
        QAccessible::installUpdateHandler(&record);
        setActive(true);
        form.show();
    }
    void TearDown() override
    {
        setActive(false);
        QAccessible::installUpdateHandler(nullptr);
        forget();
    }

    template <typename Control> Control *add()
    {
        auto *control = new Control(&form);
        control->InitNew();
        control->show();
        return control;
    }

    static QAccessibleInterface *accessible(QObject *object) { return QAccessible::queryAccessibleInterface(object); }
    static QString name(QObject *object) { return accessible(object)->text(QAccessible::Name); }
    static QString description(QObject *object) { return accessible(object)->text(QAccessible::Description); }
    static QAccessible::State state(QObject *object) { return accessible(object)->state(); }
    static QLineEdit *box(QWidget *control, int index = 0) { return control->findChildren<QLineEdit *>().at(index); }

    // How many events of a kind were raised about the object, and every state that a state
    // change about it turned on or off, since the last forget().
    static int count(const QObject *object, QAccessible::Event type) { return int(raised.count({ object, type })); }
    static QAccessible::State changedStates(const QObject *object)
    {
        return std::bit_cast<QAccessible::State>(changed.value(object));
    }
    static void forget() { raised.clear(), changed.clear(); }

    QWidget form;

private:
    static void setActive(bool active)
    {
        if (QPlatformAccessibility *platform = QGuiApplicationPrivate::platformIntegration()->accessibility())
            platform->setActive(active);
    }
    static void record(QAccessibleEvent *event)
    {
        raised.append({ event->object(), event->type() });
        if (event->type() == QAccessible::StateChanged) {
            const QAccessible::State states = static_cast<QAccessibleStateChangeEvent *>(event)->changedStates();
            changed[event->object()] |= std::bit_cast<quint64>(states);
        }
    }
    static inline QList<std::pair<const QObject *, QAccessible::Event>> raised;
    static inline QHash<const QObject *, quint64> changed;
};

TEST_F(Accessibility, everyControlHasItsRoleNameAndDescriptionAndTheButtonsArePressedByKeyOrAction)
{
    auto *go = add<skGoButton>();
    go->setTooltip("Página seguinte");
    auto *item = add<skSubMenu>();
    item->setCaption("Anexo A");
    auto *info = add<InfoButton>();
    info->setToolTipTitle("Atenção");
    info->setTipText("O prazo termina em breve.||Confirme os rendimentos.");
    info->setAction("click");
    auto *slider = add<cSlider>();
    auto *gif = add<ucAniGIF>();
    gif->extender().setToolTipText("A aguardar");
    // What the NIF and NIB boxes say is read through the desktop's bus (atspi/gallery-tree.py).
    // As a selection dialog shows a long item: cut short on screen, read whole.
    auto *cut = new CommandButton(&form);
    cut->setCaption("Rendimentos da categoria B obtidos no estrangeiro sem retenção");
    cut->setGeometry(0, 0, 90, 25);
    cut->show();
    const struct
    {
        QWidget *widget;
        QAccessible::Role role;
        QString name, description;
        const char *click = nullptr;
    } rows[] = {
        { go, QAccessible::Button, "Página seguinte", "", SIGNAL(Click()) },
        { item, QAccessible::Button, "Anexo A", "", SIGNAL(Clicked()) },
        { info, QAccessible::Button, "Atenção", "O prazo termina em breve.\nConfirme os rendimentos.",
            SIGNAL(Click()) },
        { slider, QAccessible::Grouping, "Painel deslizante", "" },
        { slider->button(), QAccessible::Button, "Abrir o painel", "" },
        { gif, QAccessible::Graphic, "A aguardar", "Sem imagem" },
        { cut, QAccessible::Button, cut->Caption(), "" },
    };
    for (const auto &row : rows) {
        SCOPED_TRACE(row.widget->metaObject()->className() + (' ' + row.name.toStdString()));
        QAccessibleInterface *iface = accessible(row.widget);
        EXPECT_EQ(iface->role(), row.role);
        EXPECT_EQ(iface->text(QAccessible::Name), row.name);
        EXPECT_EQ(iface->text(QAccessible::Description), row.description);
        if (!row.click)
            continue;
        EXPECT_EQ(row.widget->focusPolicy(), Qt::TabFocus) << "Tab reaches it, a click leaves the focus";
        QSignalSpy clicks(row.widget, row.click);
        QTest::keyClick(row.widget, Qt::Key_Space);
        QTest::keyClick(row.widget, Qt::Key_Return);
        EXPECT_EQ(clicks.size(), 2);
        iface->actionInterface()->doAction(QAccessibleActionInterface::pressAction());
        ASSERT_TRUE(QTest::qWaitFor([&] { return clicks.size() == 3; }));
    }
    EXPECT_TRUE(accessible(slider->button())->state().expandable);
    EXPECT_EQ(accessible(gif)->imageInterface()->imagePosition(), gif->mapToGlobal(QPoint(0, 0)));
}

TEST_F(Accessibility, whatTheUserChangesIsHeardAsItHappens)
{
    auto *go = add<skGoButton>();
    auto *item = add<skSubMenu>();
    auto *slider = add<cSlider>();
    QWidget *toggle = slider->button();
    auto *nif = add<cNIF>();
    auto *button = new CommandButton(&form);
    button->setToggle(true);
    auto *gif = add<ucAniGIF>();
    ASSERT_TRUE(gif->LoadAnimatedGIF_File(modFuncs::GetDataPath() + "gif/aguarde.gif"));
    const QString frames = QString("Imagem animada, %1 imagens, ").arg(gif->FrameCount());
    ASSERT_TRUE(QTest::qWaitFor([&] { return description(gif) == frames + "em movimento"; }));
    EXPECT_TRUE(state(gif).animated);
    EXPECT_EQ(accessible(gif)->imageInterface()->imageDescription(), frames + "em movimento");
    QTest::mousePress(button, Qt::LeftButton);
    EXPECT_TRUE(state(button).pressed && state(button).checkable) << "held down";
    // Each change, the event it must raise (exactly once or at least once), and what is heard after.
    const struct
    {
        const char *change;
        std::function<void()> act;
        QObject *object;
        QAccessible::Event event;
        bool once;
        std::function<bool()> heard;
    } changes[] = {
        { "a skinned button made active", [&] { go->setActive(true); }, go, QAccessible::StateChanged, false,
            [&] { return state(go).pressed && changedStates(go).pressed; } },
        { "a menu item made active", [&] { item->setActive(true); }, item, QAccessible::StateChanged, false,
            [&] { return state(item).checked && changedStates(item).checked; } },
        { "a toggle button released", [&] { QTest::mouseRelease(button, Qt::LeftButton); }, button,
            QAccessible::StateChanged, false, [&] { return state(button).checked && changedStates(button).checked; } },
        { "the slider opened with Space", [&] { QTest::keyClick(toggle, Qt::Key_Space); }, toggle,
            QAccessible::NameChanged, false,
            [&] {
                return name(toggle) == "Fechar o painel" && state(toggle).expanded && changedStates(toggle).expanded
                    && state(slider).expanded;
            } },
        { "an animation paused", [&] { gif->setAction(ucAniGIF::gfaPause); }, gif, QAccessible::DescriptionChanged,
            true, [&] { return description(gif) == frames + "em pausa" && changedStates(gif).animated; } },
        { "a NIF typed", [&] { QTest::keyClicks(box(nif), "123456789"); }, nif, QAccessible::ValueChanged, false,
            [&] {
                return accessible(nif)->text(QAccessible::Value) == "Portugal, 123456789"
                    && description(nif) == "NIF válido";
            } },
        { "a NIF made wrong", [&] { QTest::keyClick(box(nif), Qt::Key_Backspace), QTest::keyClick(box(nif), '8'); },
            nif, QAccessible::StateChanged, false,
            [&] {
                return state(nif).invalid && changedStates(nif).invalid && description(nif) == "NIF inválido"
                    && name(box(nif)) == "NIF" && description(box(nif)) == "NIF inválido";
            } },
        { "a NIF's holder", [&] { nif->setValue("PT123456789"), forget(), nif->setNome("Maria Silva"); }, nif,
            QAccessible::DescriptionChanged, true,
            [&] { return description(nif) == "NIF válido. Titular: Maria Silva"; } },
        { "a NIF locked", [&] { nif->setLocked(true); }, nif, QAccessible::StateChanged, false,
            [&] { return state(nif).readOnly && !state(nif).editable; } },
        { "a NIF disabled", [&] { nif->setEnabled(false); }, nif, QAccessible::StateChanged, false,
            [&] { return changedStates(nif).disabled; } },
    };
    for (const auto &c : changes) {
        SCOPED_TRACE(c.change);
        forget();
        c.act();
        const int raised = count(c.object, c.event);
        EXPECT_TRUE(c.once ? raised == 1 : raised >= 1) << raised;
        EXPECT_TRUE(c.heard());
    }
}

TEST_F(Accessibility, theInformationTipIsAnnouncedAsEnterShowsIt)
{
    auto *info = add<InfoButton>();
    info->setToolTipTitle("Atenção");
    info->setTipText("O prazo termina em breve.||Confirme os rendimentos.");
    QTest::keyClick(info, Qt::Key_Return);
    TooltipWindow *shown = nullptr;
    for (QWidget *window : QApplication::topLevelWidgets())
        if (auto *tip = qobject_cast<TooltipWindow *>(window); tip && tip->isVisible())
            shown = tip;
    ASSERT_TRUE(shown);
    EXPECT_EQ(count(shown, QAccessible::ObjectShow), 1);
    EXPECT_EQ(name(shown), "Atenção");
    EXPECT_EQ(description(shown), "O prazo termina em breve.\nConfirme os rendimentos.");
}

TEST_F(Accessibility, nifIsNamedByItsAccessibleNameLabelOrName)
{
    auto *nif = add<cNIF>();
    const std::pair<std::function<void()>, QString> steps[] = {
        { [&] { nif->extender().setName("txtNIF"); }, "txtNIF" },
        { [&] { (new QLabel("&NIF do titular:", &form))->setBuddy(nif); }, "NIF do titular:" },
        { [&] { nif->setAccessibleName("NIF do cônjuge"); }, "NIF do cônjuge" },
    };
    auto *other = new QLineEdit(&form);
    other->show();
    ASSERT_TRUE(showActive(&form));
    for (const auto &[step, given] : steps) {
        step();
        EXPECT_EQ(accessible(nif)->text(QAccessible::Name), given);
        other->setFocus();
        box(nif)->setFocus();
        EXPECT_EQ(name(box(nif)), given) << "the box that takes the focus speaks for the control";
    }
}

TEST_F(Accessibility, theFlagOpensTheCountryListByActionOrKeyUnlessLocked)
{
    auto *nif = add<cNIF>();
    nif->setCountries(GSEL_OnlyEU);
    QStringList chosen = { "FR", "DE" };
    ModalDriver countryList([&chosen](QDialog &dialog) {
        qobject_cast<frmSelectCountry *>(&dialog)->setTag(chosen.takeFirst());
        return int(QDialog::Accepted);
    });
    QAccessibleActionInterface *flag = accessible(nif->findChild<QWidget *>("cPicture"))->actionInterface();
    EXPECT_EQ(flag->keyBindingsForAction(flag->pressAction()).size(), 2) << "Alt+Down and F4";
    flag->doAction(flag->pressAction());
    EXPECT_EQ(countryList.shownCount(), 0) << "whoever pressed has had the answer first";
    ASSERT_TRUE(QTest::qWaitFor([&] { return nif->CountryID() == "FR"; }));
    nif->setLocked(true);
    QTest::keyClick(box(nif), Qt::Key_F4);
    EXPECT_EQ(countryList.shownCount(), 1) << "a locked box offers no country list";
    nif->setLocked(false);
    QTest::keyClick(box(nif), Qt::Key_F4);
    EXPECT_EQ(nif->CountryID(), "DE");
}

} // namespace

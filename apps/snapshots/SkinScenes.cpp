#include "Stage.h"

#include "common/modFuncs.h"
#include "companion/CommandButton.h"
#include "skins/cSlider.h"
#include "skins/skGoButton.h"
#include "skins/skGrowth.h"
#include "skins/skNumber.h"
#include "skins/skQuadro.h"
#include "skins/skSubMenu.h"

#include <QCheckBox>
#include <QLabel>
#include <QLineEdit>

namespace zelctl::snapshots {

namespace {

QString skin(const char *name)
{
    return modFuncs::GetDataPath() + QStringLiteral("skins/default/") + QLatin1String(name);
}

// How a control is put in a state once it stands on its form.
enum class State { Normal, Hover, Pressed, Disabled };

const std::pair<State, const char *> EveryState[] = { { State::Normal, "normal" }, { State::Hover, "hover" },
    { State::Pressed, "pressed" }, { State::Disabled, "disabled" } };

void enter(Stage &stage, QWidget *control, State state)
{
    switch (state) {
    case State::Normal:
        break;
    case State::Hover:
        stage.hover(control);
        break;
    case State::Pressed:
        stage.press(control);
        break;
    case State::Disabled:
        control->setEnabled(false);
        break;
    }
}

QImage goButton(State state)
{
    Stage stage(QSize(80, 60));
    auto *button = new skGoButton(stage.form());
    button->InitNew();
    button->setImageSource(0, skin("btn_go_normal.gif"));
    button->setImageSource(1, skin("btn_go_hover.gif"));
    button->setImageSource(2, skin("btn_go_click.gif"));
    button->setGeometry(20, 14, 32, 32);
    button->Repaint();
    enter(stage, button, state);
    return stage.shoot(button);
}

QImage number(State state, bool opaque = false)
{
    Stage stage(QSize(80, 60));
    auto *badge = new skNumber(stage.form());
    badge->InitNew();
    badge->setGeometry(20, 14, 30, 30);
    badge->setCaption(QStringLiteral("2"));
    if (opaque)
        badge->setProperty("BackStyle", 1);
    enter(stage, badge, state);
    return stage.shoot(badge);
}

QImage subMenu(State state, bool active = false)
{
    Stage stage(QSize(200, 60));
    auto *item = new skSubMenu(stage.form());
    item->InitNew();
    item->setMargin(90);
    item->setGeometry(12, 16, 40, 24);
    item->setCaption(QStringLiteral("Anexo A"));
    item->Redraw();
    item->setActive(active);
    enter(stage, item, state);
    return stage.shoot(item);
}

QImage quadro()
{
    Stage stage(QSize(260, 160));
    auto *frame = new skQuadro(stage.form());
    frame->InitNew();
    frame->setGeometry(12, 12, 220, 120);
    frame->setImageFile(0, skin("topo_laranja.gif"));
    frame->setImageFile(1, skin("topo_repeat.gif"));
    frame->setImageFile(2, skin("fundo_fundo.gif"));
    frame->Redraw();
    return stage.shoot(frame);
}

QImage growth(int height)
{
    Stage stage(QSize(260, 200));
    auto *panel = new skGrowth(stage.form());
    panel->InitNew();
    panel->setCaption(QStringLiteral("Dependentes"));
    panel->setGeometry(12, 12, 220, height);
    return stage.shoot(panel);
}

QImage slider(bool open, State state)
{
    Stage stage(QSize(300, 100));
    auto *slide = new cSlider(stage.form());
    slide->setGeometry(12, 12, 240, 64);
    auto *label = new QLabel(QStringLiteral("NIF:"), slide);
    label->setGeometry(6, 8, 30, 20);
    auto *nif = new QLineEdit(slide);
    nif->setPlaceholderText(QStringLiteral("123456789"));
    nif->setGeometry(38, 6, 110, 24);
    auto *check = new QCheckBox(QStringLiteral("Cônjuge"), slide);
    check->setGeometry(6, 36, 120, 22);
    // Opened and, for the closed picture, closed again: a slider sizes itself as it slides.
    slide->setSlideOpen(true);
    slide->setSlideOpen(open);
    Stage::settle();
    // The pointer acts on the toggle button; disabling takes the whole slider.
    enter(stage, state == State::Disabled ? static_cast<QWidget *>(slide) : slide->button(), state);

    return stage.shoot(QRect(6, 6, 264, 76));
}

} // namespace

void addSkinScenes(QList<Scene> &scenes)
{
    for (const auto &[state, name] : EveryState) {
        scenes.append(
            { QStringLiteral("skGoButton"), QLatin1String(name), [state = state] { return goButton(state); } });
    }
    for (const auto &[state, name] : EveryState)
        scenes.append({ QStringLiteral("skNumber"), QLatin1String(name), [state = state] { return number(state); } });
    scenes.append({ QStringLiteral("skNumber"), QStringLiteral("opaque"), [] { return number(State::Normal, true); } });
    for (const auto &[state, name] : EveryState)
        scenes.append({ QStringLiteral("skSubMenu"), QLatin1String(name), [state = state] { return subMenu(state); } });
    scenes.append(
        { QStringLiteral("skSubMenu"), QStringLiteral("active"), [] { return subMenu(State::Normal, true); } });
    scenes.append({ QStringLiteral("skQuadro"), QStringLiteral("normal"), [] { return quadro(); } });
    scenes.append({ QStringLiteral("skGrowth"), QStringLiteral("normal"), [] { return growth(110); } });
    scenes.append({ QStringLiteral("skGrowth"), QStringLiteral("grown"), [] { return growth(150); } });
    scenes.append({ QStringLiteral("cSlider"), QStringLiteral("closed"), [] { return slider(false, State::Normal); } });
    for (const auto &[state, name] : EveryState)
        scenes.append({ QStringLiteral("cSlider"), QStringLiteral("open ") + QLatin1String(name),
            [state = state] { return slider(true, state); } });
}

} // namespace zelctl::snapshots

#include "Stage.h"

#include "platform/WindowHandles.h"
#include "tips/InfoButton.h"
#include "tips/clsBalloonTip.h"

#include <QPainter>

namespace zelctl::snapshots {

namespace {

struct Balloon
{
    const char *name;
    clsBalloonTip::ttStyleEnum style;
    const char *title;
    clsBalloonTip::ttIconType icon;
};

const Balloon Balloons[] = {
    { "balloon title and icon", clsBalloonTip::TTBalloon, "Navegação", clsBalloonTip::TTIconInfo },
    { "balloon title only", clsBalloonTip::TTBalloon, "Navegação", clsBalloonTip::TTNoIcon },
    { "balloon text only", clsBalloonTip::TTBalloon, "", clsBalloonTip::TTNoIcon },
    { "rectangle title and icon", clsBalloonTip::TTStandard, "Atenção", clsBalloonTip::TTIconWarning },
    { "rectangle text only", clsBalloonTip::TTStandard, "", clsBalloonTip::TTNoIcon },
};

// The tip shown at once under its tool, laid on white where it is see-through.
QImage balloon(const Balloon &shape)
{
    Stage stage(QSize(200, 60));
    auto *tool = new QWidget(stage.form());
    tool->setGeometry(20, 20, 24, 24);
    stage.show();
    clsBalloonTip tip;
    tip.setMvarParentControlhwnd(platform::handleOf(tool));
    tip.setStyle(shape.style);
    tip.setIcon(shape.icon);
    tip.setTitle(QString::fromUtf8(shape.title));
    tip.setTipText(QStringLiteral("Passe à página seguinte\r\nda declaração."));
    tip.Create();
    tip.ShowNow();
    Stage::settle();
    QWidget *window = platform::widgetOf(tip.lHwnd());
    if (!window || !window->isVisible())
        return {};
    QImage picture(window->size(), QImage::Format_RGB32);
    picture.fill(Qt::white);
    QPainter painter(&picture);
    painter.drawImage(0, 0, window->grab().toImage());
    return picture;
}

QImage infoButton(InfoButton::IB_STYLE_ENUM style, bool enabled)
{
    Stage stage(QSize(60, 50));
    auto *button = new InfoButton(stage.form());
    button->InitNew();
    button->setStyle(style);
    button->move(16, 12);
    button->setEnabled(enabled);
    return stage.shoot(button);
}

} // namespace

void addTipScenes(QList<Scene> &scenes)
{
    for (const Balloon &shape : Balloons)
        scenes.append(
            { QStringLiteral("clsBalloonTip"), QLatin1String(shape.name), [&shape] { return balloon(shape); } });
    const std::pair<InfoButton::IB_STYLE_ENUM, const char *> styles[]
        = { { InfoButton::IB_INFO, "info" }, { InfoButton::IB_WARNING, "warning" }, { InfoButton::IB_ERROR, "error" } };
    for (const auto &[style, name] : styles) {
        scenes.append(
            { QStringLiteral("InfoButton"), QLatin1String(name), [style = style] { return infoButton(style, true); } });
        scenes.append({ QStringLiteral("InfoButton"), QLatin1String(name) + QStringLiteral(" disabled"),
            [style = style] { return infoButton(style, false); } });
    }
}

} // namespace zelctl::snapshots

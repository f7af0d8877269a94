#include "Sections.h"

#include "common/modFuncs.h"
#include "skins/cSlider.h"
#include "skins/skGoButton.h"
#include "skins/skGrowth.h"
#include "skins/skNumber.h"
#include "skins/skQuadro.h"
#include "skins/skSubMenu.h"

#include <QCheckBox>
#include <QLabel>
#include <QLineEdit>

#include <array>

using namespace zelctl;

namespace {

QString skin(const char *name)
{
    return modFuncs::GetDataPath() + QStringLiteral("skins/default/") + QLatin1String(name);
}

// The host's side of a skinned button: it hands over the pictures when asked.
skGoButton *goButton(QWidget *parent, int x, const QString &tip)
{
    auto *button = new skGoButton(parent);
    button->InitNew();
    QObject::connect(button, &skGoButton::RequestSkinRepait, button, [button] {
        button->setImageSource(0, skin("btn_go_normal.gif"));
        button->setImageSource(1, skin("btn_go_hover.gif"));
        button->setImageSource(2, skin("btn_go_click.gif"));
        button->Repaint();
    });
    button->setSkinID(QStringLiteral("laranja"));
    button->setTooltip(tip);
    button->setGeometry(x, 10, 32, 32);
    return button;
}

skNumber *badge(QWidget *parent, int x, const QString &caption, bool active)
{
    auto *number = new skNumber(parent);
    number->InitNew();
    number->setGeometry(x, 14, 24, 24);
    number->setCaption(caption);
    number->setActive(active);
    return number;
}

// Three sub-menu items side by side; each widens itself to its caption, so each Resize
// moves the ones after it. A click makes the item the active one.
void subMenu(QWidget *parent, QPoint origin)
{
    static const std::array<const char *, 3> captions = { "Rosto", "Anexo A", "Anexo H" };
    auto items = std::make_shared<std::array<skSubMenu *, 3>>();
    const auto layOut = [items, origin] {
        int x = origin.x();
        for (skSubMenu *item : *items) {
            if (!item)
                return;
            item->move(x, origin.y());
            x += item->width() + 2;
        }
    };
    for (size_t i = 0; i < items->size(); ++i) {
        auto *item = new skSubMenu(parent);
        item->InitNew();
        item->setMargin(90);
        item->resize(40, 24);
        (*items)[i] = item;
        QObject::connect(item, &skSubMenu::Resize, item, layOut);
        QObject::connect(item, &skSubMenu::Clicked, item, [items, item] {
            // After the click has done its own clearing.
            QMetaObject::invokeMethod(
                item,
                [items, item] {
                    for (skSubMenu *other : *items)
                        other->setActive(other == item);
                },
                Qt::QueuedConnection);
        });
        item->setCaption(QString::fromUtf8(captions[i]));
        item->Redraw();
    }
    layOut();
    (*items)[1]->setActive(true);
}

void frame(QWidget *parent, QRect where)
{
    auto *quadro = new skQuadro(parent);
    quadro->InitNew();
    quadro->setGeometry(where);
    quadro->setImageFile(0, skin("topo_laranja.gif"));
    quadro->setImageFile(1, skin("topo_repeat.gif"));
    quadro->setImageFile(2, skin("fundo_fundo.gif"));
    quadro->Redraw();
    auto *title = new QLabel(QStringLiteral("Quadro 3 — Rendimentos"), quadro);
    title->setStyleSheet(QStringLiteral("color: white; font-weight: bold"));
    title->move(10, 4);
    auto *text = new QLabel(QStringLiteral("Rendimentos brutos\ne retenções na fonte"), quadro);
    text->move(12, 34);
}

void panel(QWidget *parent, QRect where)
{
    auto *growth = new skGrowth(parent);
    growth->InitNew();
    growth->setCaption(QStringLiteral("Dependentes"));
    growth->setGeometry(where);
    auto *more = new QCheckBox(QStringLiteral("Mais uma linha"), growth);
    more->move(12, 34);
    // The host grows the panel with its content.
    QObject::connect(more, &QCheckBox::toggled, growth,
        [growth, where](bool on) { growth->resize(where.width(), where.height() + (on ? 40 : 0)); });
}

void slider(QWidget *parent, QRect where)
{
    auto *slide = new cSlider(parent);
    slide->setGeometry(where);
    auto *label = new QLabel(QStringLiteral("NIF:"), slide);
    label->setGeometry(6, 8, 30, 20);
    auto *nif = new QLineEdit(slide);
    nif->setPlaceholderText(QStringLiteral("123456789"));
    nif->setGeometry(38, 6, 110, 24);
    auto *check = new QCheckBox(QStringLiteral("Cônjuge"), slide);
    check->setGeometry(6, 36, 120, 22);
    slide->setSlideOpen(true);
}

} // namespace

QWidget *createSkinsSection()
{
    auto *section = new QWidget;
    section->setMinimumSize(860, 200);
    goButton(section, 10, QStringLiteral("Página anterior"));
    goButton(section, 50, QStringLiteral("Página seguinte"));
    goButton(section, 90, QStringLiteral("Confirmar"))->setEnabled(false);
    badge(section, 140, QStringLiteral("1"), false);
    badge(section, 170, QStringLiteral("2"), true);
    badge(section, 200, QStringLiteral("3"), false);
    subMenu(section, QPoint(250, 14));
    frame(section, QRect(10, 60, 220, 120));
    panel(section, QRect(250, 60, 220, 110));
    slider(section, QRect(500, 60, 240, 64));
    auto *caption = new QLabel(QStringLiteral("Botões com dicas, números, submenu, quadro, painel que cresce e "
                                              "um painel deslizante, aberto pelo seu botão"),
        section);
    caption->setGeometry(10, 182, 840, 18);
    return section;
}

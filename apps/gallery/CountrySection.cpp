#include "Sections.h"

#include "companion/CommandButton.h"
#include "companion/CommandButtonArray.h"
#include "platform/ModalPresenter.h"
#include "selection/PictureBox.h"
#include "selection/frmSelectCountry.h"
#include "selection/mod_CTL.h"

#include <QHBoxLayout>
#include <QLabel>
#include <QLineEdit>

#include <iterator>

using namespace zelctl;

namespace {

struct ModeButton
{
    GSEL_CountryFilterList mode;
    const char *caption;
};

constexpr ModeButton Modes[] = {
    { GSEL_OnlyPT, "Só Portugal" },
    { GSEL_OnlyEU, "União Europeia" },
    { GSEL_All, "Todos os países" },
    { GSEL_Custom, "Lista própria:" },
};

} // namespace

QWidget *createCountrySection()
{
    auto *section = new QWidget;
    auto *row = new QHBoxLayout(section);
    auto *buttons = new CommandButtonArray(QStringLiteral("cmdCountry"), section, std::size(Modes));
    for (int index = 0; index < int(std::size(Modes)); ++index) {
        CommandButton *button = (*buttons)(index);
        button->setCaption(QString::fromUtf8(Modes[index].caption));
        button->setToolTip(QStringLiteral("Abre a lista de países"));
        row->addWidget(button);
    }
    auto *custom = new QLineEdit(QStringLiteral("ES,FR,IT,DE"));
    custom->setToolTip(QStringLiteral("Códigos separados por vírgulas"));
    row->addWidget(custom);
    auto *flag = new PictureBox;
    flag->setFixedSize(mod_CTL::FlagSize, mod_CTL::FlagSize);
    row->addWidget(flag);
    auto *chosen = new QLabel(QStringLiteral("(nenhum país escolhido)"));
    row->addWidget(chosen, 1);

    QObject::connect(buttons, &CommandButtonArray::Click, section, [=](int index) {
        frmSelectCountry form(section->window());
        form.setFilterMode(Modes[index].mode);
        form.setCustomList(custom->text());
        form.RelistCountries();
        platform::showModal(form);
        if (!form.Tag().isEmpty()) {
            flag->setPicture(mod_CTL::flagOn(*flag, form.Tag()));
            chosen->setText(form.Tag());
        }
        form.Unload();
    });
    return section;
}

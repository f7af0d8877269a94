#include "Sections.h"

#include "common/modFuncs.h"
#include "companion/JsonDeclaration.h"
#include "subject/cSujeitoSelector.h"

#include <QHBoxLayout>
#include <QLabel>

// A selector offering every kind, bound to the bundled declaration; the label beside it
// follows its Changed event with the chosen subject and its tax number.
QWidget *createSubjectSection()
{
    auto *section = new QWidget;
    auto *layout = new QHBoxLayout(section);
    auto *declaration = new zelctl::companion::JsonDeclaration(section);
    const QString file = zelctl::modFuncs::GetDataPath() + "declaracao.json";
    const bool loaded = declaration->load(file);

    auto *selector = new zelctl::cSujeitoSelector;
    selector->setObjectName("SujeitoSelector1");
    selector->InitNew();
    selector->setPossible("*");
    selector->setIRSClass(declaration);
    selector->setSelectedSujeito("A");

    auto *state = new QLabel;
    const auto show = [selector, state] {
        const QString subject = selector->SelectedSujeito();
        state->setText(subject.isEmpty() ? "Nenhum sujeito escolhido"
                                         : QString("%1 — NIF %2").arg(subject, selector->SelectedNIF()));
    };
    QObject::connect(selector, &zelctl::cSujeitoSelector::Changed, state, show);
    show();
    if (!loaded)
        state->setText("Declaração em falta: " + file);

    layout->addWidget(selector);
    layout->addWidget(state);
    layout->addStretch();
    return section;
}

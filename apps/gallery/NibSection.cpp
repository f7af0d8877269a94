#include "Sections.h"

#include "nib/cNIB.h"

#include <QHBoxLayout>
#include <QLabel>

// A NIB box; the label beside it follows its Changed event.
QWidget *createNibSection()
{
    auto *section = new QWidget;
    auto *layout = new QHBoxLayout(section);
    auto *nib = new zelctl::cNIB;
    nib->setObjectName("NIB1");
    nib->InitNew();
    auto *state = new QLabel("Altere o NIB: os dígitos de controlo são verificados");
    QObject::connect(nib, &zelctl::cNIB::Changed, state, [nib, state] {
        if (nib->Text().isEmpty())
            state->setText("NIB vazio");
        else
            state->setText(nib->Valid() ? "NIB válido" : "NIB com dígitos de controlo errados");
    });
    nib->setText("003506510000001234580");
    auto *label = new QLabel("N&IB:");
    label->setBuddy(nib);
    layout->addWidget(label);
    layout->addWidget(nib);
    layout->addWidget(state);
    layout->addStretch();
    return section;
}

#include "Sections.h"

#include "common/modFuncs.h"
#include "companion/JsonDeclaration.h"
#include "companion/LookupSettings.h"
#include "nif/cNIF.h"

#include <QCheckBox>
#include <QHBoxLayout>
#include <QLabel>
#include <QVBoxLayout>

using namespace zelctl;

namespace {

// Where the holder's data came from, and how the lookup went.
QString origin(cNIF &nif)
{
    QString source = nif.Information(QStringLiteral("SOURCE"));
    if (source.isEmpty())
        source = nif.Nome().isEmpty() ? QStringLiteral("nenhuma") : QStringLiteral("declaração");
    const QString status = nif.Information(QStringLiteral("status"));
    return QStringLiteral("Origem: %1%2").arg(source, status.isEmpty() ? QString() : QStringLiteral(" — ") + status);
}

} // namespace

// A NIF box on the bundled declaration, directory of holders and cache of earlier lookups,
// with the switch that lets numbers go to the EU's VAT service: a valid number shows its
// holder's name in the tip and below the box, and where it came from.
QWidget *createNifSection()
{
    auto *section = new QWidget;
    auto *column = new QVBoxLayout(section);
    auto *declaration = new companion::JsonDeclaration(section);
    declaration->load(modFuncs::GetDataPath() + QStringLiteral("declaracao.json"));

    auto *row = new QHBoxLayout;
    // A host names its controls with labels: a screen reader reads the label as the name.
    auto *label = new QLabel(QStringLiteral("&NIF:"));
    row->addWidget(label);
    auto *nif = new cNIF;
    label->setBuddy(nif);
    nif->setObjectName(QStringLiteral("NIF1"));
    nif->InitNew();
    nif->setCountries(GSEL_OnlyEU);
    nif->setIRSClass(declaration);
    row->addWidget(nif);
    auto *holder = new QLabel(QStringLiteral("(sem titular)"));
    row->addWidget(holder, 1);
    column->addLayout(row);

    auto *events = new QLabel;
    events->setWordWrap(true);
    column->addWidget(events);
    auto *source = new QLabel;
    source->setObjectName(QStringLiteral("origin"));
    source->setWordWrap(true);
    column->addWidget(source);
    auto *remote = new QCheckBox(QStringLiteral("Consultar o serviço de IVA da Comissão Europeia (o número é enviado "
                                                "pela Internet)"));
    remote->setObjectName(QStringLiteral("allowremotenif"));
    remote->setChecked(companion::remoteLookupsAllowed());
    QObject::connect(remote, &QCheckBox::toggled, remote, [](bool on) { companion::setRemoteLookupsAllowed(on); });
    column->addWidget(remote);
    auto *hint = new QLabel(QStringLiteral("Experimente 251739465 (diretório de contribuintes), 263958477 "
                                           "(guardado na declaração) ou ES12345678Z; com a consulta ao serviço "
                                           "ligada, um número que não se conheça aqui é perguntado à Comissão "
                                           "Europeia, e cada resposta fica guardada neste computador. A "
                                           "bandeira abre a lista de países e o botão direito o menu, com a "
                                           "ficha de contribuinte."));
    hint->setWordWrap(true);
    column->addWidget(hint);

    QObject::connect(nif, &cNIF::NameUpdated, holder, [holder](const QString &name) { holder->setText(name); });
    // Another number is another holder: until its name arrives there is none.
    QObject::connect(nif, &cNIF::Changed, holder, [nif, holder] {
        if (nif->Nome().isEmpty())
            holder->setText(QStringLiteral("(sem titular)"));
    });
    QObject::connect(nif, &cNIF::DataFinished, events, [nif, events, source] {
        events->setText(QStringLiteral("Pesquisa terminada: %1").arg(nif->Description()));
        source->setText(origin(*nif));
    });
    QObject::connect(nif, &cNIF::Changed, events, [nif, events] {
        events->setText(nif->IsEmpty() ? QString()
                                       : QStringLiteral("%1 — %2").arg(nif->Value(),
                                           nif->IsValid() ? QStringLiteral("válido") : QStringLiteral("inválido")));
    });
    nif->setValue(QStringLiteral("PT263958477"));
    return section;
}

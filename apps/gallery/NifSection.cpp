#include "Sections.h"

#include "common/modFuncs.h"
#include "companion/DirectoryNIFGrabber.h"
#include "companion/JsonDeclaration.h"
#include "nif/cNIF.h"

#include <QHBoxLayout>
#include <QLabel>
#include <QVBoxLayout>

using namespace zelctl;

namespace {

// The directory answers after a short wait, as a remote service would, so the blue
// "fetching" mark can be seen.
constexpr int FetchLatencyMs = 700;

} // namespace

// A NIF box on the bundled declaration and directory of holders: a valid number shows its
// holder's name in the tip and below the box.
QWidget *createNifSection()
{
    companion::setNIFGrabberFactory([](QObject *parent) {
        auto *grabber
            = new companion::DirectoryNIFGrabber(companion::DirectoryNIFGrabber::defaultDirectoryFile(), parent);
        grabber->setLatency(FetchLatencyMs);
        return grabber;
    });

    auto *section = new QWidget;
    auto *column = new QVBoxLayout(section);
    auto *declaration = new companion::JsonDeclaration(section);
    declaration->load(modFuncs::GetDataPath() + QStringLiteral("declaracao.json"));

    auto *row = new QHBoxLayout;
    auto *nif = new cNIF;
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
    auto *hint = new QLabel(QStringLiteral("Experimente 251739465 (diretório de contribuintes), 263958477 "
                                           "(guardado na declaração) ou ES12345678Z; a bandeira abre a "
                                           "lista de países e o botão direito o menu, com a ficha de "
                                           "contribuinte."));
    hint->setWordWrap(true);
    column->addWidget(hint);

    QObject::connect(nif, &cNIF::NameUpdated, holder, [holder](const QString &name) { holder->setText(name); });
    // Another number is another holder: until its name arrives there is none.
    QObject::connect(nif, &cNIF::Changed, holder, [nif, holder] {
        if (nif->Nome().isEmpty())
            holder->setText(QStringLiteral("(sem titular)"));
    });
    QObject::connect(nif, &cNIF::DataFinished, events,
        [nif, events] { events->setText(QStringLiteral("Pesquisa terminada: %1").arg(nif->Description())); });
    QObject::connect(nif, &cNIF::Changed, events, [nif, events] {
        events->setText(nif->IsEmpty() ? QString()
                                       : QStringLiteral("%1 — %2").arg(nif->Value(),
                                           nif->IsValid() ? QStringLiteral("válido") : QStringLiteral("inválido")));
    });
    nif->setValue(QStringLiteral("PT263958477"));
    return section;
}

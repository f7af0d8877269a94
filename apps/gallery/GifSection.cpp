#include "Sections.h"

#include "common/modFuncs.h"
#include "gif/ucAniGIF.h"

#include <QComboBox>
#include <QHBoxLayout>
#include <QLabel>
#include <QPushButton>

// The bundled "please wait" animation, with buttons to pause it and step through it, and
// a choice of mirroring.
QWidget *createGifSection()
{
    using zelctl::ucAniGIF;
    auto *section = new QWidget;
    auto *layout = new QHBoxLayout(section);
    auto *gif = new ucAniGIF;
    gif->setObjectName("AniGIF1");
    gif->InitNew();
    gif->setStretch(ucAniGIF::gfsActualSize);
    gif->extender().setToolTipText("A aguardar");
    const QString file = zelctl::modFuncs::GetDataPath() + "gif/aguarde.gif";
    auto *state = new QLabel("Imagem 1");
    if (!gif->LoadAnimatedGIF_File(file))
        state->setText("Não foi possível ler " + file);
    QObject::connect(gif, &ucAniGIF::FrameChanged, state,
        [state](qint32 frame) { state->setText(QStringLiteral("Imagem %1").arg(frame)); });

    auto *pause = new QPushButton("Pausa / continuar");
    QObject::connect(pause, &QPushButton::clicked, gif,
        [gif] { gif->setAction(gif->Action() == ucAniGIF::gfaPlay ? ucAniGIF::gfaPause : ucAniGIF::gfaPlay); });
    auto *forward = new QPushButton("Avançar");
    QObject::connect(forward, &QPushButton::clicked, gif, [gif] { gif->setAction(ucAniGIF::gfaForward); });
    auto *mirror = new QComboBox;
    mirror->addItems({ "Sem espelho", "Horizontal", "Vertical", "Horizontal e vertical" });
    QObject::connect(mirror, &QComboBox::currentIndexChanged, gif, [gif](int index) { gif->setMirrored(index); });

    layout->addWidget(gif);
    layout->addWidget(pause);
    layout->addWidget(forward);
    layout->addWidget(mirror);
    layout->addWidget(state);
    layout->addStretch();
    return section;
}

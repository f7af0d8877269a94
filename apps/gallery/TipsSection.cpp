#include "Sections.h"

#include "tips/InfoButton.h"

#include <QGridLayout>
#include <QLabel>

using zelctl::InfoButton;

namespace {

InfoButton *button(InfoButton::IB_STYLE_ENUM style, const QString &title, const QString &text)
{
    auto *button = new InfoButton;
    button->InitNew();
    button->setStyle(style);
    button->setToolTipTitle(title);
    button->setTipText(text);
    return button;
}

} // namespace

QWidget *createTipsSection()
{
    auto *section = new QWidget;
    auto *grid = new QGridLayout(section);
    grid->setColumnStretch(1, 1);
    const auto add = [grid](InfoButton *button, QLabel *caption) {
        const int row = grid->rowCount();
        grid->addWidget(button, row, 0);
        grid->addWidget(caption, row, 1);
    };

    add(button(InfoButton::IB_INFO, QStringLiteral("Informação"),
            QStringLiteral("Indique o NIF do sujeito passivo.||Os dados são obtidos da declaração.")),
        new QLabel(QStringLiteral("Informação: pouse o ponteiro, ou clique para ver a dica de imediato")));

    InfoButton *warning = button(InfoButton::IB_WARNING, QStringLiteral("Atenção"),
        QStringLiteral("O prazo de entrega termina em breve.\\nConfirme os rendimentos antes de enviar."));
    warning->setToolTipStyle(InfoButton::TTS_DEFAULT);
    add(warning, new QLabel(QStringLiteral("Aviso, com a dica num retângulo simples")));

    InfoButton *error = button(InfoButton::IB_ERROR, QStringLiteral("Erro"),
        QStringLiteral("O NIB indicado não é válido.||Verifique os dígitos de controlo."));
    error->setAction(QStringLiteral("click"));
    auto *clicks = new QLabel(QStringLiteral("Erro: o clique chega ao programa (Action = \"click\")"));
    QObject::connect(error, &InfoButton::Click, clicks, [clicks, count = 0]() mutable {
        clicks->setText(QStringLiteral("Erro: %1 clique(s) recebido(s)").arg(++count));
    });
    add(error, clicks);

    InfoButton *disabled = button(InfoButton::IB_ERROR, QStringLiteral("Erro"), QString());
    disabled->setEnabled(false);
    add(disabled, new QLabel(QStringLiteral("Erro, desativado")));
    return section;
}

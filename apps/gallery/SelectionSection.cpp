#include "Sections.h"

#include "common/modFuncs.h"
#include "platform/WindowHandles.h"
#include "selection/clsGFXSelection.h"

#include <QHBoxLayout>
#include <QLabel>
#include <QPushButton>

using namespace zelctl;

namespace {

struct Language
{
    const char *title;
    const char *flag;
};

constexpr Language Languages[] = {
    { "Português", "PT" },
    { "English", "GB" },
    { "Français", "FR" },
    { "Español", "ES" },
    { "Deutsch", "DE" },
};

QString describe(const GFXResult &result)
{
    if (result.Canceled)
        return QStringLiteral("Cancelado");
    if (result.NumberOfSelectedItems == 0)
        return QStringLiteral("Aceite, sem escolha");
    return QStringLiteral("Escolhido: %1").arg(result.SelectedItem.Value.toString());
}

} // namespace

QWidget *createSelectionSection()
{
    auto *section = new QWidget;
    auto *row = new QHBoxLayout(section);
    auto *selection = new clsGFXSelection(section);

    auto *languages = new QPushButton(QStringLiteral("Escolher a língua..."));
    // The dialog is placed against this button.
    languages->setProperty("hWnd", platform::handleOf(languages));
    row->addWidget(languages);
    auto *country = new QPushButton(QStringLiteral("Escolher um país da União Europeia..."));
    row->addWidget(country);
    auto *answer = new QLabel(QStringLiteral("(nada escolhido)"));
    row->addWidget(answer, 1);

    QObject::connect(languages, &QPushButton::clicked, section, [=] {
        GFXSelection settings;
        settings.Title = QStringLiteral("Língua");
        settings.Subtitle = QStringLiteral("Em que língua quer ver a aplicação?");
        settings.ParentObj = languages;
        settings.WindowPositionRelation = GFXPositionObjectBelow;
        QList<GFXItem> items;
        for (const Language &language : Languages) {
            GFXItem item;
            item.Title = QString::fromUtf8(language.title);
            item.Tooltip = item.Title;
            item.Image = modFuncs::GetDataPath() + QStringLiteral("images/flags_iso/16/%1.png").arg(language.flag);
            item.Value = QString::fromLatin1(language.flag);
            item.Selected = items.isEmpty();
            items.append(item);
        }
        answer->setText(describe(selection->SelectFrom(settings, items)));
    });
    QObject::connect(country, &QPushButton::clicked, section, [=] {
        GFXSelection settings;
        settings.Title = QStringLiteral("País");
        settings.Subtitle = QStringLiteral("Escolha um estado membro da União Europeia");
        QString filter;
        const QString code = selection->SelectCountry(settings, GSEL_OnlyEU, filter);
        answer->setText(
            code.isEmpty() ? QStringLiteral("Nenhum país escolhido") : QStringLiteral("País: %1").arg(code));
    });
    return section;
}

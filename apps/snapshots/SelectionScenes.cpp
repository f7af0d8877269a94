#include "Stage.h"

#include "common/modFuncs.h"
#include "platform/ModalPresenter.h"
#include "selection/clsGFXSelection.h"
#include "selection/frmSelectCountry.h"

#include <QLineEdit>
#include <QTest>
#include <QTreeWidget>

namespace zelctl::snapshots {

namespace {

QString flag(const char *code)
{
    return modFuncs::GetDataPath() + QStringLiteral("images/flags_iso/16/") + QLatin1String(code)
        + QStringLiteral(".png");
}

GFXItem language(const char *title, const char *code, bool selected = false)
{
    GFXItem item;
    item.Title = QString::fromUtf8(title);
    item.Image = flag(code);
    item.Value = QString::fromLatin1(code);
    item.Selected = selected;
    return item;
}

QImage fewItems(bool withCancel)
{
    GFXSelection s;
    s.Title = QStringLiteral("Língua da declaração");
    s.Subtitle = QStringLiteral("Escolha a língua em que a declaração é impressa");
    s.DisableCancel = !withCancel;
    const QList<GFXItem> items = { language("Português", "PT", true), language("Español", "ES"),
        language("Français", "FR"), language("Deutsch", "DE") };
    clsGFXSelection selection;
    return shootModal([&] { selection.SelectFrom(s, items); });
}

QImage countries(GSEL_CountryFilterList mode, const QString &typed = {})
{
    GFXSelection s;
    s.Title = QStringLiteral("País de residência");
    clsGFXSelection selection;
    QString filter;
    return shootModal([&] { selection.SelectCountry(s, mode, filter); },
        [&](QDialog &dialog) {
            if (!typed.isEmpty())
                QTest::keyClicks(dialog.findChild<QLineEdit *>(QStringLiteral("txtFilter")), typed);
        });
}

QImage countryDialog()
{
    frmSelectCountry form;
    form.setFilterMode(GSEL_OnlyEU);
    form.RelistCountries();
    return shootModal([&] { platform::showModal(form); },
        [](QDialog &dialog) {
            auto *list = dialog.findChild<QTreeWidget *>(QStringLiteral("cList"));
            list->setCurrentItem(list->topLevelItem(5));
        });
}

} // namespace

void addSelectionScenes(QList<Scene> &scenes)
{
    const QString selector = QStringLiteral("frmSelector");
    scenes.append({ selector, QStringLiteral("few items"), [] { return fewItems(true); } });
    scenes.append({ selector, QStringLiteral("no cancel"), [] { return fewItems(false); } });
    scenes.append({ selector, QStringLiteral("european union"), [] { return countries(GSEL_OnlyEU); } });
    scenes.append({ selector, QStringLiteral("every country"), [] { return countries(GSEL_All); } });
    scenes.append({ selector, QStringLiteral("filtered"), [] { return countries(GSEL_All, QStringLiteral("rei")); } });
    scenes.append(
        { QStringLiteral("frmSelectCountry"), QStringLiteral("european union"), [] { return countryDialog(); } });
}

} // namespace zelctl::snapshots

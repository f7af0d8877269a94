#include "Stage.h"

#include "common/modFuncs.h"
#include "companion/JsonDeclaration.h"
#include "nib/cNIB.h"
#include "nif/cNIF.h"
#include "platform/Settings.h"
#include "subject/cSujeitoSelector.h"

namespace zelctl::snapshots {

namespace {

// How a NIF box is shown.
struct NifState
{
    const char *name;
    const char *value;
    bool disabled;
    bool locked;
};

const NifState NifStates[] = {
    { "new", "", false, false },
    { "valid", "PT263958477", false, false },
    { "invalid", "PT263958478", false, false },
    { "other country", "ES12345678Z", false, false },
    { "disabled", "PT263958477", true, false },
    { "locked", "PT263958477", false, true },
};

QImage nif(const NifState &state)
{
    // The picture shows the box itself: no lookup of the holder's data runs meanwhile.
    platform::SaveSetting(
        QStringLiteral("ZEL"), QStringLiteral("Config"), QStringLiteral("allowautonif"), QStringLiteral("0"));
    Stage stage(QSize(220, 60));
    auto *box = new cNIF(stage.form());
    box->InitNew();
    box->move(12, 16);
    box->setValue(QString::fromLatin1(state.value));
    box->setEnabled(!state.disabled);
    box->setLocked(state.locked);
    const QImage picture = stage.shoot(box);
    platform::SaveSetting(
        QStringLiteral("ZEL"), QStringLiteral("Config"), QStringLiteral("allowautonif"), QStringLiteral("1"));
    return picture;
}

QImage nib(const char *number)
{
    Stage stage(QSize(320, 60));
    auto *box = new cNIB(stage.form());
    box->InitNew();
    box->move(12, 16);
    box->setText(QString::fromLatin1(number));
    return stage.shoot(box);
}

QImage subject(const char *chosen)
{
    Stage stage(QSize(420, 60));
    companion::JsonDeclaration declaration;
    declaration.load(modFuncs::GetDataPath() + QStringLiteral("declaracao.json"));
    auto *selector = new cSujeitoSelector(stage.form());
    selector->InitNew();
    selector->setPossible(QStringLiteral("*"));
    selector->setIRSClass(&declaration);
    selector->move(12, 16);
    selector->setSelectedSujeito(QString::fromLatin1(chosen));
    selector->adjustSize();
    return stage.shoot(selector);
}

} // namespace

void addEntryScenes(QList<Scene> &scenes)
{
    for (const NifState &state : NifStates)
        scenes.append({ QStringLiteral("cNIF"), QLatin1String(state.name), [&state] { return nif(state); } });
    scenes.append({ QStringLiteral("cNIB"), QStringLiteral("right"), [] { return nib("003506510000001234580"); } });
    scenes.append({ QStringLiteral("cNIB"), QStringLiteral("wrong"), [] { return nib("003506510000001234581"); } });
    scenes.append({ QStringLiteral("cNIB"), QStringLiteral("empty"), [] { return nib(""); } });
    for (const char *chosen : { "A", "B", "D1", "S1", "F", "C", "H1" })
        scenes.append(
            { QStringLiteral("cSujeitoSelector"), QString::fromLatin1(chosen), [chosen] { return subject(chosen); } });
}

} // namespace zelctl::snapshots

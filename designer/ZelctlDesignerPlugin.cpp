#include "ZelctlDesignerPlugin.h"

#include "frame/ClassRegistry.h"
#include "frame/UserControl.h"

#include <QtUiPlugin/QDesignerCustomWidgetInterface>

namespace {

// Where a control's header lies under the installed include folder ("nib/cNIB.h").
QString headerOf(const QString &name)
{
    static const QList<std::pair<QString, QString>> areas = {
        { "cNIF", "nif" },
        { "cNIB", "nib" },
        { "cSujeitoSelector", "subject" },
        { "ucAniGIF", "gif" },
        { "InfoButton", "tips" },
        { "cSlider", "skins" },
    };
    for (const auto &[control, area] : areas) {
        if (control == name)
            return area + '/' + name + ".h";
    }
    return "skins/" + name + ".h";
}

class ControlEntry : public QObject, public QDesignerCustomWidgetInterface
{
    Q_INTERFACES(QDesignerCustomWidgetInterface)

public:
    ControlEntry(const zelctl::ClassInfo &info, QObject *parent)
        : QObject(parent)
        , m_name(QLatin1String(info.name))
    { }

    QString name() const override { return "zelctl::" + m_name; }
    QString group() const override { return QString::fromUtf8(zelctl::ClassRegistry::HelpString); }
    QString toolTip() const override { return m_name; }
    QString whatsThis() const override { return m_name; }
    QString includeFile() const override { return headerOf(m_name); }
    QIcon icon() const override { return {}; }
    bool isContainer() const override { return m_name == "cSlider"; }

    QWidget *createWidget(QWidget *parent) override
    {
        auto *control = qobject_cast<zelctl::UserControl *>(zelctl::CreateObject(m_name, parent));
        if (!control)
            return nullptr;
        zelctl::Ambient designer = control->ambient();
        designer.UserMode = false;
        control->setAmbient(designer);
        control->InitNew();
        return control;
    }

private:
    QString m_name;
};

} // namespace

ZelctlDesignerPlugin::ZelctlDesignerPlugin(QObject *parent)
    : QObject(parent)
{
    for (const zelctl::ClassInfo &info : zelctl::ClassRegistry::classes()) {
        if (info.isControl && zelctl::ClassRegistry::factoryFor(info.classId))
            m_widgets.append(new ControlEntry(info, this));
    }
}

ZelctlDesignerPlugin::~ZelctlDesignerPlugin() = default;

QList<QDesignerCustomWidgetInterface *> ZelctlDesignerPlugin::customWidgets() const
{
    return m_widgets;
}

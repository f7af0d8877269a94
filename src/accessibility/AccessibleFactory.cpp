// The library's accessible interfaces, served to assistive technology through Qt's factory,
// which asks for the most derived class first: a host's subclass of a control is described
// as the control.

#include "ButtonInterfaces.h"
#include "DisplayInterfaces.h"
#include "EntryInterfaces.h"

#include "companion/CommandButton.h"
#include "gif/ucAniGIF.h"
#include "nib/cNIB.h"
#include "nif/cNIF.h"
#include "selection/PictureBox.h"
#include "skins/cSlider.h"
#include "skins/skGoButton.h"
#include "skins/skGrowth.h"
#include "skins/skNumber.h"
#include "skins/skQuadro.h"
#include "skins/skSubMenu.h"
#include "subject/cSujeitoSelector.h"
#include "tips/InfoButton.h"
#include "tips/TooltipWindow.h"

#include <QCoreApplication>

namespace zelctl::accessibility {

namespace {

template <typename Interface> QAccessibleInterface *make(QWidget *widget)
{
    return new Interface(widget);
}

QAccessibleInterface *makePicture(QWidget *widget)
{
    if (widget->objectName() == QLatin1String("cPicture") && qobject_cast<cNIF *>(widget->parentWidget()))
        return new FlagInterface(widget);
    return new PictureInterface(widget);
}

QAccessibleInterface *makeCommandButton(QWidget *widget)
{
    const auto *slider = qobject_cast<cSlider *>(widget->parentWidget());
    if (slider && slider->button() == widget)
        return new SliderToggleInterface(widget);
    return new CommandButtonInterface(widget);
}

struct Described
{
    const QMetaObject *type;
    QAccessibleInterface *(*make)(QWidget *);
};

const Described described[] = {
    { &cNIF::staticMetaObject, make<NifInterface> },
    { &cNIB::staticMetaObject, make<NibInterface> },
    { &PictureBox::staticMetaObject, makePicture },
    { &CommandButton::staticMetaObject, makeCommandButton },
    { &skGoButton::staticMetaObject, make<GoButtonInterface> },
    { &skNumber::staticMetaObject, make<CaptionButtonInterface> },
    { &skSubMenu::staticMetaObject, make<CaptionButtonInterface> },
    { &InfoButton::staticMetaObject, make<InfoButtonInterface> },
    { &ucAniGIF::staticMetaObject, make<PictureInterface> },
    { &TooltipWindow::staticMetaObject, make<TipInterface> },
    { &cSujeitoSelector::staticMetaObject, make<PanelInterface> },
    { &skQuadro::staticMetaObject, make<PanelInterface> },
    { &skGrowth::staticMetaObject, make<PanelInterface> },
    { &cSlider::staticMetaObject, make<PanelInterface> },
};

QAccessibleInterface *describe(const QString &className, QObject *object)
{
    auto *widget = qobject_cast<QWidget *>(object);
    if (!widget)
        return nullptr;
    for (const Described &entry : described) {
        if (className == QLatin1String(entry.type->className()))
            return entry.make(widget);
    }
    return nullptr;
}

void installFactory()
{
    QAccessible::installFactory(describe);
}

Q_COREAPP_STARTUP_FUNCTION(installFactory)

} // namespace

} // namespace zelctl::accessibility

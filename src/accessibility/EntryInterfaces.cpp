#include "EntryInterfaces.h"

#include "nib/cNIB.h"
#include "nif/cNIF.h"
#include "platform/Accessibility.h"
#include "validation/nifValidator.h"

#include <QKeySequence>
#include <QLineEdit>

namespace zelctl::accessibility {

namespace {

cNIF &nifOf(QWidget *widget)
{
    return *static_cast<cNIF *>(widget);
}

// A country's name as the control knows it, else its code.
QString countryOf(const cNIF &nif)
{
    const QString name = nif.CountryName(false);
    return name.isEmpty() ? nif.CountryID() : name;
}

} // namespace

NifInterface::NifInterface(QWidget *widget)
    : QAccessibleWidget(widget, QAccessible::EditableText)
{ }

bool NifInterface::isInvalid() const
{
    // Validity is read here without IsValid, which tells the host of every call.
    const cNIF &nif = nifOf(widget());
    const auto *box = nif.findChild<QLineEdit *>(QStringLiteral("nif"), Qt::FindDirectChildrenOnly);
    return box && !nif.IsEmpty()
        && !nifValidator::CheckTaxNumber(box->text(), nifValidator::CountryIndex(nif.CountryID()));
}

QString NifInterface::text(QAccessible::Text t) const
{
    cNIF &nif = nifOf(widget());
    switch (t) {
    case QAccessible::Name: {
        const QString given = platform::hostGivenName(nif);
        if (!given.isEmpty())
            return given;
        return nif.extender().Name().isEmpty() ? QStringLiteral("NIF") : nif.extender().Name();
    }
    case QAccessible::Value: {
        const QString number = nif.Value().sliced(nif.CountryID().size());
        return number.isEmpty() ? countryOf(nif) : countryOf(nif) + QStringLiteral(", ") + number;
    }
    case QAccessible::Description: {
        if (!nif.accessibleDescription().isEmpty())
            return nif.accessibleDescription();
        if (nif.IsEmpty())
            return {};
        if (isInvalid())
            return QStringLiteral("NIF inválido");
        const QString holder = nif.Nome();
        return holder.isEmpty() ? QStringLiteral("NIF válido") : QStringLiteral("NIF válido. Titular: ") + holder;
    }
    default:
        return QAccessibleWidget::text(t);
    }
}

QAccessible::State NifInterface::state() const
{
    const cNIF &nif = nifOf(widget());
    QAccessible::State state = QAccessibleWidget::state();
    state.disabled = state.disabled || !nif.Enabled();
    state.readOnly = nif.Locked();
    state.editable = !nif.Locked();
    state.invalid = isInvalid();
    return state;
}

FlagInterface::FlagInterface(QWidget *widget)
    : QAccessibleWidget(widget, QAccessible::Button)
{ }

QString FlagInterface::text(QAccessible::Text t) const
{
    const cNIF &nif = nifOf(widget()->parentWidget());
    switch (t) {
    case QAccessible::Name:
        return countryOf(nif);
    case QAccessible::Description:
        return nif.Countries() == GSEL_OnlyPT ? QString() : QStringLiteral("Abre a lista de países");
    default:
        return QAccessibleWidget::text(t);
    }
}

QAccessible::State FlagInterface::state() const
{
    const cNIF &nif = nifOf(widget()->parentWidget());
    QAccessible::State state = QAccessibleWidget::state();
    state.disabled = state.disabled || !nif.Enabled() || nif.Locked();
    state.hasPopup = nif.Countries() != GSEL_OnlyPT;
    return state;
}

QStringList FlagInterface::actionNames() const
{
    return { pressAction() };
}

void FlagInterface::doAction(const QString &actionName)
{
    if (actionName != pressAction() || state().disabled)
        return;
    // Queued: the list is modal, and whoever pressed wants an answer first.
    QMetaObject::invokeMethod(widget()->parentWidget(), "ShowCountryList", Qt::QueuedConnection);
}

QStringList FlagInterface::keyBindingsForAction(const QString &actionName) const
{
    if (actionName != pressAction())
        return {};
    return { QKeySequence(Qt::AltModifier | Qt::Key_Down).toString(QKeySequence::NativeText),
        QKeySequence(Qt::Key_F4).toString(QKeySequence::NativeText) };
}

NibInterface::NibInterface(QWidget *widget)
    : QAccessibleWidget(widget, QAccessible::EditableText)
{ }

bool NibInterface::markShown(const char *name) const
{
    const auto *mark = widget()->findChild<QWidget *>(QLatin1String(name), Qt::FindDirectChildrenOnly);
    return mark && mark->isVisibleTo(widget());
}

QString NibInterface::text(QAccessible::Text t) const
{
    const auto &nib = *static_cast<const cNIB *>(widget());
    switch (t) {
    case QAccessible::Name: {
        const QString given = platform::hostGivenName(nib);
        return given.isEmpty() ? QStringLiteral("NIB") : given;
    }
    case QAccessible::Value:
        return nib.Text();
    case QAccessible::Description:
        if (!nib.accessibleDescription().isEmpty())
            return nib.accessibleDescription();
        if (markShown("validpic"))
            return QStringLiteral("NIB válido");
        return markShown("Image1") ? QStringLiteral("NIB inválido") : QString();
    default:
        return QAccessibleWidget::text(t);
    }
}

QAccessible::State NibInterface::state() const
{
    QAccessible::State state = QAccessibleWidget::state();
    state.editable = true;
    state.invalid = markShown("Image1");
    return state;
}

} // namespace zelctl::accessibility

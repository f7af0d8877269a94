#include "UserControl.h"

#include "platform/WindowHandles.h"

#include <QScopedValueRollback>

namespace zelctl {

UserControl::UserControl(QWidget *parent)
    : QWidget(parent)
    , m_extender(this)
{ }

UserControl::~UserControl() = default;

void UserControl::InitNew()
{
    // Taking the defaults or the saved values changes nothing the container must save.
    const QScopedValueRollback quiet(m_quiet, true);
    InitProperties();
}

void UserControl::Load(const PropertyBag &bag)
{
    const QScopedValueRollback quiet(m_quiet, true);
    ReadProperties(bag);
}

void UserControl::PropertyChanged(const QString &name)
{
    if (!m_quiet)
        Q_EMIT propertyChanged(name);
}

PropertyBag UserControl::Save()
{
    PropertyBag bag;
    WriteProperties(bag);
    return bag;
}

void UserControl::Release()
{
    if (!m_terminated) {
        m_terminated = true;
        Terminate();
    }
    deleteLater();
}

void UserControl::setAmbient(const Ambient &ambient)
{
    const Ambient old = std::exchange(m_ambient, ambient);
    if (old.UserMode != ambient.UserMode)
        AmbientChanged(QStringLiteral("UserMode"));
    if (old.UIDead != ambient.UIDead)
        AmbientChanged(QStringLiteral("UIDead"));
    if (old.DisplayName != ambient.DisplayName)
        AmbientChanged(QStringLiteral("DisplayName"));
    if (old.BackColor != ambient.BackColor)
        AmbientChanged(QStringLiteral("BackColor"));
    if (old.Font != ambient.Font)
        AmbientChanged(QStringLiteral("Font"));
}

qint32 UserControl::hWnd()
{
    return platform::handleOf(this);
}

} // namespace zelctl

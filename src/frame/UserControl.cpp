#include "UserControl.h"

#include "platform/WindowHandles.h"

#include <QPointer>

namespace zelctl {

UserControl::UserControl(QWidget *parent)
    : QWidget(parent)
    , m_extender(this)
{ }

UserControl::~UserControl() = default;

void UserControl::InitNew()
{
    quietly([this] { InitProperties(); });
}

void UserControl::Load(const PropertyBag &bag)
{
    quietly([this, &bag] { ReadProperties(bag); });
}

void UserControl::quietly(const std::function<void()> &step)
{
    // Taking the defaults or the saved values changes nothing the container must save. The
    // step may raise events in which the host deletes the control.
    const QPointer<UserControl> alive(this);
    const bool wasQuiet = std::exchange(m_quiet, true);
    step();
    if (alive)
        m_quiet = wasQuiet;
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

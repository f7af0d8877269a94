#pragma once

#include "zelctl_export.h"

#include "frame/Ambient.h"
#include "frame/ClassRegistry.h"
#include "frame/Extender.h"
#include "frame/PropertyBag.h"

#include <QWidget>

#include <functional>

namespace zelctl {

// Base of every control. It runs the life cycle a container expects:
//
//   Initialize (the constructor) → InitProperties (a new control) or ReadProperties (a
//   saved one) → Resize, Show and Paint (Qt's events) → running → WriteProperties whenever
//   the form is saved → Terminate (Release()).
//
// A control keeps what it owns in members that free themselves, so a control deleted without
// Release() still frees everything; Terminate is for the work a control must do first.
class ZELCTL_EXPORT UserControl : public QWidget
{
    Q_OBJECT
    Q_PROPERTY(qint32 hWnd READ hWnd)

public:
    explicit UserControl(QWidget *parent = nullptr);
    ~UserControl() override;

    // Container side of the life cycle.
    void InitNew();
    void Load(const PropertyBag &bag);
    PropertyBag Save();
    // Runs Terminate once and deletes the control when control returns to the event loop.
    void Release();

    const Ambient &ambient() const { return m_ambient; }
    // Replaces the ambient properties; AmbientChanged runs for each that changed.
    void setAmbient(const Ambient &ambient);
    // Design time: the container is a form designer.
    bool designMode() const { return !m_ambient.UserMode; }

    Extender &extender() { return m_extender; }
    const Extender &extender() const { return m_extender; }

    // The control's window handle.
    qint32 hWnd();

Q_SIGNALS:
    // Tells the container that a property changed, so it marks its form as modified.
    void propertyChanged(const QString &name);

protected:
    virtual void InitProperties() { }
    virtual void ReadProperties(const PropertyBag &bag) { Q_UNUSED(bag) }
    virtual void WriteProperties(PropertyBag &bag) { Q_UNUSED(bag) }
    virtual void Terminate() { }
    virtual void AmbientChanged(const QString &name) { Q_UNUSED(name) }

    // Setters call this; it is silent while the control takes its defaults or saved values.
    void PropertyChanged(const QString &name);

private:
    void quietly(const std::function<void()> &step);

    LiveObject m_live;
    Ambient m_ambient;
    Extender m_extender;
    bool m_terminated = false;
    bool m_quiet = false;
};

} // namespace zelctl

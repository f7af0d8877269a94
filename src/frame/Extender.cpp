#include "Extender.h"

#include "platform/Twips.h"

#include <QWidget>

namespace zelctl {

using platform::pixelsFromTwips;
using platform::twipsFromPixels;

Extender::Extender(QWidget *control)
    : m_control(control)
{ }

QString Extender::Name() const
{
    return m_control->objectName();
}

void Extender::setName(const QString &name)
{
    m_control->setObjectName(name);
}

bool Extender::Visible() const
{
    return m_visible;
}

void Extender::setVisible(bool visible)
{
    m_visible = visible;
    if (!visible)
        m_control->hide();
    else if (m_control->parentWidget() && m_control->parentWidget()->isVisible())
        m_control->show();
}

QString Extender::ToolTipText() const
{
    return m_control->toolTip();
}

void Extender::setToolTipText(const QString &text)
{
    m_control->setToolTip(text);
}

int Extender::Left() const
{
    return twipsFromPixels(m_control->x());
}

int Extender::Top() const
{
    return twipsFromPixels(m_control->y());
}

int Extender::Width() const
{
    return twipsFromPixels(m_control->width());
}

int Extender::Height() const
{
    return twipsFromPixels(m_control->height());
}

void Extender::setLeft(int twips)
{
    m_control->move(pixelsFromTwips(twips), m_control->y());
}

void Extender::setTop(int twips)
{
    m_control->move(m_control->x(), pixelsFromTwips(twips));
}

void Extender::setWidth(int twips)
{
    m_control->resize(pixelsFromTwips(twips), m_control->height());
}

void Extender::setHeight(int twips)
{
    m_control->resize(m_control->width(), pixelsFromTwips(twips));
}

void Extender::Move(int left, int top, int width, int height)
{
    m_control->setGeometry(
        pixelsFromTwips(left), pixelsFromTwips(top), pixelsFromTwips(width), pixelsFromTwips(height));
}

QJsonObject Extender::toJson() const
{
    return {
        { "Name", Name() },
        { "Tag", m_tag },
        { "Visible", m_visible },
        { "ToolTipText", ToolTipText() },
        { "Left", Left() },
        { "Top", Top() },
        { "Width", Width() },
        { "Height", Height() },
    };
}

void Extender::loadJson(const QJsonObject &json)
{
    setName(json.value("Name").toString(Name()));
    m_tag = json.value("Tag").toString(m_tag);
    setToolTipText(json.value("ToolTipText").toString(ToolTipText()));
    Move(json.value("Left").toInt(Left()), json.value("Top").toInt(Top()), json.value("Width").toInt(Width()),
        json.value("Height").toInt(Height()));
    setVisible(json.value("Visible").toBool(m_visible));
}

} // namespace zelctl

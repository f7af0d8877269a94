#include "DisplayInterfaces.h"

#include "gif/ucAniGIF.h"
#include "platform/Accessibility.h"
#include "skins/cSlider.h"
#include "subject/cSujeitoSelector.h"
#include "tips/TooltipWindow.h"

namespace zelctl::accessibility {

PictureInterface::PictureInterface(QWidget *widget)
    : QAccessibleWidget(widget, QAccessible::Graphic)
{ }

QString PictureInterface::describe() const
{
    if (!widget()->accessibleDescription().isEmpty())
        return widget()->accessibleDescription();
    const auto *gif = qobject_cast<const ucAniGIF *>(widget());
    if (!gif)
        return {};
    const qint32 frames = gif->FrameCount();
    if (frames == 0)
        return QStringLiteral("Sem imagem");
    if (frames == 1)
        return QStringLiteral("Imagem");
    const QString state = gif->Action() == ucAniGIF::gfaPlay ? QStringLiteral("em movimento")
        : gif->Action() == ucAniGIF::gfaPause                ? QStringLiteral("em pausa")
                                                             : QStringLiteral("parada");
    return QStringLiteral("Imagem animada, %1 imagens, %2").arg(frames).arg(state);
}

QString PictureInterface::text(QAccessible::Text t) const
{
    switch (t) {
    case QAccessible::Name:
        return platform::hostGivenName(*widget());
    case QAccessible::Description:
        return describe();
    default:
        return QAccessibleWidget::text(t);
    }
}

QAccessible::State PictureInterface::state() const
{
    QAccessible::State state = QAccessibleWidget::state();
    const auto *gif = qobject_cast<const ucAniGIF *>(widget());
    state.animated = gif && gif->FrameCount() > 1 && gif->Action() == ucAniGIF::gfaPlay;
    return state;
}

void *PictureInterface::interface_cast(QAccessible::InterfaceType t)
{
    if (t == QAccessible::ImageInterface)
        return static_cast<QAccessibleImageInterface *>(this);
    return QAccessibleWidget::interface_cast(t);
}

QString PictureInterface::imageDescription() const
{
    return describe();
}

QSize PictureInterface::imageSize() const
{
    return widget()->size();
}

QPoint PictureInterface::imagePosition() const
{
    return widget()->mapToGlobal(QPoint(0, 0));
}

TipInterface::TipInterface(QWidget *widget)
    : QAccessibleWidget(widget, QAccessible::ToolTip)
{ }

QString TipInterface::text(QAccessible::Text t) const
{
    const auto *tip = static_cast<const TooltipWindow *>(widget());
    // A tip without a title is named by its text alone.
    switch (t) {
    case QAccessible::Name:
        return tip->title().isEmpty() ? tip->text() : tip->title();
    case QAccessible::Description:
        return tip->title().isEmpty() ? QString() : tip->text();
    default:
        return QAccessibleWidget::text(t);
    }
}

PanelInterface::PanelInterface(QWidget *widget)
    : QAccessibleWidget(widget, QAccessible::Grouping)
{ }

QString PanelInterface::text(QAccessible::Text t) const
{
    if (t != QAccessible::Name)
        return QAccessibleWidget::text(t);
    const QString given = platform::hostGivenName(*widget());
    if (!given.isEmpty())
        return given;
    if (qobject_cast<const cSujeitoSelector *>(widget()))
        return QStringLiteral("Sujeito da declaração");
    if (qobject_cast<const cSlider *>(widget()))
        return QStringLiteral("Painel deslizante");
    return widget()->property("Caption").toString();
}

QAccessible::State PanelInterface::state() const
{
    QAccessible::State state = QAccessibleWidget::state();
    if (const auto *slider = qobject_cast<const cSlider *>(widget())) {
        state.expandable = true;
        state.expanded = slider->SlideOpen();
        state.collapsed = !slider->SlideOpen();
    }
    return state;
}

} // namespace zelctl::accessibility

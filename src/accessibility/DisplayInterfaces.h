#pragma once

#include <QAccessibleWidget>

// What assistive technology reads of the library's pictures, tips and panels.
namespace zelctl::accessibility {

// A picture with a description: PictureBox and ucAniGIF. The name is the host's (accessible
// name, label, tooltip); the description says what the picture is.
class PictureInterface : public QAccessibleWidget, public QAccessibleImageInterface
{
public:
    explicit PictureInterface(QWidget *widget);

    QString text(QAccessible::Text t) const override;
    QAccessible::State state() const override;
    void *interface_cast(QAccessible::InterfaceType t) override;

    QString imageDescription() const override;
    QSize imageSize() const override;
    QPoint imagePosition() const override;

private:
    // "Imagem animada, 8 imagens, em pausa" for an animation; the host's description otherwise.
    QString describe() const;
};

// The window of a balloon tip: a tooltip named after its title, with its text as the
// description. Its showing is announced.
class TipInterface : public QAccessibleWidget
{
public:
    explicit TipInterface(QWidget *widget);

    QString text(QAccessible::Text t) const override;
};

// A control that holds others: cSujeitoSelector, skQuadro, skGrowth and cSlider, named by
// the host or by their caption; an open or closed slider is expanded or collapsed.
class PanelInterface : public QAccessibleWidget
{
public:
    explicit PanelInterface(QWidget *widget);

    QString text(QAccessible::Text t) const override;
    QAccessible::State state() const override;
};

} // namespace zelctl::accessibility

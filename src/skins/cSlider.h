#pragma once

#include "zelctl_export.h"

#include "frame/UserControl.h"

#include <memory>

namespace zelctl {

class CommandButton;
class cSliderPrivate;

// A container that slides open and closed. The host places its own controls inside; the
// toggle button cc on the slider's edge opens it wide enough to show them all (button on
// the right edge, caption "ç") or closes it to the button alone (button on the left edge,
// caption "è"); the captions are the left and right arrows of the symbol font "Wingdings",
// drawn as Unicode arrows where that font is missing. The button is flat with a grey arrow,
// and raised with a frame and a blue arrow while the pointer is on it. Every change of
// SlideOpen raises Slided. A new slider is closed; the Slided of that first closing arrives
// once the event loop runs, so a host that connects right after creating the slider hears
// it. The keyboard reaching one of the host's controls while the slider is closed opens it.
// Lengths are twips.
class ZELCTL_EXPORT cSlider : public UserControl
{
    Q_OBJECT
    Q_PROPERTY(bool SlideOpen READ SlideOpen WRITE setSlideOpen)

public:
    explicit cSlider(QWidget *parent = nullptr);
    ~cSlider() override;

    bool SlideOpen() const;
    void setSlideOpen(bool open);

    // The toggle button.
    CommandButton *button() const;

Q_SIGNALS:
    void Slided();

protected:
    void resizeEvent(QResizeEvent *event) override;

private:
    // Right edge of the host's controls inside, in twips; 0 when there are none.
    int contentsRight() const;
    void open();
    void close();
    void placeButton();
    void styleButton(bool hovering);

    std::unique_ptr<cSliderPrivate> const d;
};

} // namespace zelctl

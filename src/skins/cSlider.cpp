#include "cSlider.h"

#include "skinCommon.h"

#include "companion/CommandButton.h"
#include "platform/Accessibility.h"

#include <QApplication>
#include <QResizeEvent>

namespace zelctl {

namespace {

// Room left between the contents and the button of an open slider.
constexpr int OpenGap = 300;
constexpr int ButtonWidth = 240;

// The arrows of the button's symbol font, left (close) and right (open); where the font is
// missing the button shows the Unicode arrows they stand for.
const QString OpenGlyph = QStringLiteral("ç");
const QString ClosedGlyph = QStringLiteral("è");

// The button's look: raised with a frame and a blue arrow under the pointer, flat otherwise.
struct ButtonLook
{
    qint32 style;
    qint32 bevelWidth;
    quint32 captionColor;
};
constexpr ButtonLook HoverLook { 2, 3, 0xC00000 };
constexpr ButtonLook RestingLook { CommandButton::FlatStyle, 0, 0x404040 };

} // namespace

class cSliderPrivate
{
public:
    explicit cSliderPrivate(cSlider *q)
        : echo(q)
        , cc(new CommandButton(q))
        , toggleEcho(cc)
    { }

    bool open = false;
    platform::AccessibleEcho echo;
    CommandButton *cc;
    platform::AccessibleEcho toggleEcho;
};

cSlider::cSlider(QWidget *parent)
    : UserControl(parent)
    , d(std::make_unique<cSliderPrivate>(this))
{
    d->cc->setObjectName(QStringLiteral("cc"));
    d->cc->setFont(QFont(QStringLiteral("Wingdings"), 10));
    d->cc->setWidth(ButtonWidth);
    styleButton(false);
    connect(d->cc, &CommandButton::Click, this, [this] { setSlideOpen(!d->open); });
    connect(d->cc, &CommandButton::MouseHover, this, [this](bool hovering) { styleButton(hovering); });
    // Focus given to the slider (a label's buddy, a host's setFocus) lands on its button;
    // Tab reaches the button and the host's controls inside, never the bare container.
    setFocusPolicy(Qt::TabFocus);
    setFocusProxy(d->cc);
    // The keyboard reaching a control hidden in the closed slider opens it, so the focus shows.
    connect(qApp, &QApplication::focusChanged, this, [this](QWidget *, QWidget *now) {
        if (!d->open && now && now != d->cc && isAncestorOf(now))
            setSlideOpen(true);
    });

    // Every slider starts closed; its Slided waits for the event loop, when a host can hear it.
    close();
    QMetaObject::invokeMethod(this, &cSlider::Slided, Qt::QueuedConnection);
}

cSlider::~cSlider()
{
    // A control inside gives up the focus while QWidget's destructor deletes it, after d is gone.
    disconnect(qApp, &QApplication::focusChanged, this, nullptr);
}

bool cSlider::SlideOpen() const
{
    return d->open;
}

void cSlider::setSlideOpen(bool open)
{
    if (open == d->open)
        return;
    d->open = open;
    if (open)
        this->open();
    else
        close();
    d->echo.refresh();
    d->toggleEcho.refresh();
    Q_EMIT Slided();
}

CommandButton *cSlider::button() const
{
    return d->cc;
}

void cSlider::resizeEvent(QResizeEvent *event)
{
    UserControl::resizeEvent(event);
    placeButton();
}

int cSlider::contentsRight() const
{
    int right = 0;
    for (QObject *child : children()) {
        auto *control = qobject_cast<QWidget *>(child);
        if (!control || control == d->cc)
            continue;
        right = std::max(right, skinCommon::twips(control->x() + control->width()));
    }
    return right;
}

void cSlider::open()
{
    extender().setWidth(contentsRight() + d->cc->Width() + OpenGap);
    d->cc->setLeft(skinCommon::twips(width()) - d->cc->Width());
    d->cc->setCaption(OpenGlyph);
    d->cc->raise();
}

void cSlider::close()
{
    extender().setWidth(d->cc->Width());
    d->cc->Move(0, 0);
    d->cc->setCaption(ClosedGlyph);
    d->cc->raise();
}

void cSlider::placeButton()
{
    const int innerWidth = skinCommon::twips(width());
    const int innerHeight = skinCommon::twips(height());
    const int left = d->open ? innerWidth - d->cc->Width() : 0;
    d->cc->Move(left, 0, d->cc->Width(), innerHeight);
}

void cSlider::styleButton(bool hovering)
{
    const ButtonLook &look = hovering ? HoverLook : RestingLook;
    d->cc->setButtonStyle(look.style);
    d->cc->setBevelWidth(look.bevelWidth);
    d->cc->setForeColor(look.captionColor);
}

ZELCTL_REGISTER_CLASS(cSlider)

} // namespace zelctl

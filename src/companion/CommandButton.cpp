#include "CommandButton.h"

#include "KeyCodes.h"
#include "platform/OleColor.h"
#include "platform/Twips.h"

#include <QKeyEvent>

namespace zelctl {

using platform::pixelsFromTwips;
using platform::twipsFromPixels;

class CommandButtonPrivate
{
public:
    zelctl::Picture picture;
    QString tag;
    int index = -1;
};

CommandButton::CommandButton(QWidget *parent)
    : QPushButton(parent)
    , d(std::make_unique<CommandButtonPrivate>())
{
    connect(this, &QAbstractButton::clicked, this, [this] { Q_EMIT Click(d->index); });
}

CommandButton::~CommandButton() = default;

void CommandButton::setToggle(bool toggle)
{
    setCheckable(toggle);
}

zelctl::Picture CommandButton::Picture() const
{
    return d->picture;
}

void CommandButton::setPicture(const zelctl::Picture &picture)
{
    if (d->picture == picture)
        return;
    d->picture = picture;
    setIcon(picture.isNull() ? QIcon() : QIcon(picture.pixmap()));
    if (!picture.isNull())
        setIconSize(picture.image().size());
}

QString CommandButton::Tag() const
{
    return d->tag;
}

void CommandButton::setTag(const QString &tag)
{
    d->tag = tag;
}

int CommandButton::Index() const
{
    return d->index;
}

void CommandButton::setIndex(int index)
{
    d->index = index;
}

quint32 CommandButton::ForeColor() const
{
    return platform::fromQColor(palette().color(QPalette::ButtonText));
}

void CommandButton::setForeColor(quint32 color)
{
    QPalette colours = palette();
    colours.setColor(QPalette::ButtonText, platform::toQColor(color));
    setPalette(colours);
}

void CommandButton::enterEvent(QEnterEvent *event)
{
    QPushButton::enterEvent(event);
    Q_EMIT MouseHover(true);
}

void CommandButton::leaveEvent(QEvent *event)
{
    QPushButton::leaveEvent(event);
    Q_EMIT MouseHover(false);
}

int CommandButton::Left() const
{
    return twipsFromPixels(x());
}

int CommandButton::Top() const
{
    return twipsFromPixels(y());
}

int CommandButton::Width() const
{
    return twipsFromPixels(width());
}

int CommandButton::Height() const
{
    return twipsFromPixels(height());
}

void CommandButton::setLeft(int twips)
{
    move(pixelsFromTwips(twips), y());
}

void CommandButton::setTop(int twips)
{
    move(x(), pixelsFromTwips(twips));
}

void CommandButton::setWidth(int twips)
{
    resize(pixelsFromTwips(twips), height());
}

void CommandButton::setHeight(int twips)
{
    resize(width(), pixelsFromTwips(twips));
}

void CommandButton::Move(int left, int top)
{
    move(pixelsFromTwips(left), pixelsFromTwips(top));
}

void CommandButton::Move(int left, int top, int width, int height)
{
    setGeometry(pixelsFromTwips(left), pixelsFromTwips(top), pixelsFromTwips(width), pixelsFromTwips(height));
}

void CommandButton::Refresh()
{
    repaint();
}

void CommandButton::mouseDoubleClickEvent(QMouseEvent *event)
{
    // The second press of a double click still presses the button, as a plain push button's does.
    QPushButton::mouseDoubleClickEvent(event);
    if (event->button() == Qt::LeftButton)
        Q_EMIT DblClick(d->index);
}

void CommandButton::keyPressEvent(QKeyEvent *event)
{
    if (const int code = keyCodes::fromQtKey(event->key()); code != 0) {
        int keyCode = code;
        Q_EMIT KeyDown(d->index, keyCode, keyCodes::shiftState(event->modifiers()));
        if (keyCode == 0) {
            event->accept();
            return;
        }
    }
    QPushButton::keyPressEvent(event);
}

} // namespace zelctl

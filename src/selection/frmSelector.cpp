#include "frmSelector.h"

#include "SelectorLayout.h"
#include "clsGFXSelection.h"

#include "companion/CommandButton.h"
#include "companion/CommandButtonArray.h"
#include "platform/Twips.h"
#include "platform/WindowHandles.h"

#include <QApplication>
#include <QEventLoop>
#include <QLabel>
#include <QPointer>
#include <QTimer>

#include <algorithm>
#include <cmath>

namespace zelctl {

using platform::pixelsFromTwips;
using platform::twipsFromPixels;

namespace {

const QString DisableEvents = QStringLiteral("DISABLE_EVENTS");

int zoomInterval = 15;

constexpr int ZoomSteps = 7;

QRect pixelsOf(const QRect &twips)
{
    return { pixelsFromTwips(twips.left()), pixelsFromTwips(twips.top()), pixelsFromTwips(twips.width()),
        pixelsFromTwips(twips.height()) };
}

QLabel *makeLabel(const QString &name, QWidget *form, int heightTwips, double pointScale, bool bold)
{
    auto *label = new QLabel(form);
    label->setObjectName(name);
    QFont font = label->font();
    font.setPointSizeF(font.pointSizeF() * pointScale);
    font.setBold(bold);
    label->setFont(font);
    label->setIndent(pixelsFromTwips(selectorLayout::Gap));
    label->resize(label->width(), pixelsFromTwips(heightTwips));
    label->hide();
    return label;
}

} // namespace

class frmSelectorPrivate
{
public:
    QPointer<clsGFXSelection> owner;
    bool closeRequest = false;
    QString tag;
    QLabel *lblTITLE = nullptr;
    QLabel *lblSUBTITLE = nullptr;
    CommandButtonArray *btnSelector = nullptr;
    CommandButtonArray *btn_Handle = nullptr;
    gdi::SurfaceWidget *tmpPic = nullptr;
};

frmSelector::frmSelector(QWidget *parent)
    : QDialog(parent)
    , d(std::make_unique<frmSelectorPrivate>())
{
    setObjectName(QStringLiteral("frmSelector"));
    // Modal from the first show: the opening animation shows the form before it is run
    // modally, and modality cannot be added to a window that is already visible.
    setModal(true);

    d->lblTITLE = makeLabel(QStringLiteral("lblTITLE"), this, 450, 1.3, true);
    d->lblSUBTITLE = makeLabel(QStringLiteral("lblSUBTITLE"), this, 300, 1.0, false);

    d->btnSelector = new CommandButtonArray(QStringLiteral("btnSelector"), this, 1);
    CommandButton *model = (*d->btnSelector)(0);
    model->setCaption(QStringLiteral("lblButton"));
    // Items are a single choice; a pressed button shows the current one.
    model->setToggle(true);
    model->hide();
    connect(d->btnSelector, &CommandButtonArray::Click, this, [this](int index) {
        CommandButton *button = (*d->btnSelector)(index);
        send(button, QStringLiteral("Click"), button ? button->Tag().toInt() : 0);
    });
    connect(d->btnSelector, &CommandButtonArray::DblClick, this, [this](int index) {
        CommandButton *button = (*d->btnSelector)(index);
        send(button, QStringLiteral("DoubleClick"), button ? button->Tag().toInt() : 0);
    });
    connect(d->btnSelector, &CommandButtonArray::KeyDown, this, [this](int index, int &keyCode, int shift) {
        send((*d->btnSelector)(index), QStringLiteral("KeyDown"), QStringLiteral("%1,%2").arg(keyCode).arg(shift));
    });

    d->btn_Handle = new CommandButtonArray(QStringLiteral("btn_Handle"), this, 2);
    (*d->btn_Handle)(0)->setCaption(QStringLiteral("&OK"));
    (*d->btn_Handle)(1)->setCaption(QStringLiteral("&Cancelar"));
    for (int index = 0; index < 2; ++index) {
        CommandButton *button = (*d->btn_Handle)(index);
        button->setWidth(1215);
        button->setHeight(375);
        button->hide();
    }
    connect(d->btn_Handle, &CommandButtonArray::Click, this, [this](int index) {
        send((*d->btn_Handle)(index), index == 0 ? QStringLiteral("OK") : QStringLiteral("CANCEL"));
    });

    d->tmpPic = new gdi::SurfaceWidget(this);
    d->tmpPic->setObjectName(QStringLiteral("tmpPic"));
    d->tmpPic->hide();

    resize(pixelsFromTwips(7500), pixelsFromTwips(5400));
}

frmSelector::~frmSelector() = default;

void frmSelector::setOwner(clsGFXSelection *owner)
{
    d->owner = owner;
}

QString frmSelector::Tag() const
{
    return d->tag;
}

void frmSelector::setTag(const QString &tag)
{
    d->tag = tag;
}

bool frmSelector::closeRequested() const
{
    return d->closeRequest;
}

void frmSelector::setCloseRequest(bool close)
{
    d->closeRequest = close;
}

CommandButtonArray &frmSelector::btnSelector() const
{
    return *d->btnSelector;
}

CommandButtonArray &frmSelector::btn_Handle() const
{
    return *d->btn_Handle;
}

gdi::SurfaceWidget &frmSelector::tmpPic() const
{
    return *d->tmpPic;
}

void frmSelector::ReArrange()
{
    if (d->tag == DisableEvents)
        return;
    CommandButton *ok = (*d->btn_Handle)(0);
    CommandButton *cancel = (*d->btn_Handle)(1);
    selectorLayout::Metrics metrics;
    metrics.innerWidth = twipsFromPixels(width());
    metrics.innerHeight = twipsFromPixels(height());
    metrics.okWidth = ok->Width();
    metrics.okHeight = ok->Height();
    metrics.titleVisible = !d->lblTITLE->isHidden();
    metrics.titleHeight = twipsFromPixels(d->lblTITLE->height());
    metrics.subtitleVisible = !d->lblSUBTITLE->isHidden();
    metrics.subtitleHeight = twipsFromPixels(d->lblSUBTITLE->height());
    metrics.itemCount = d->btnSelector->UBound() + 1;

    const selectorLayout::Layout layout = selectorLayout::arrange(metrics);
    d->lblTITLE->setGeometry(pixelsOf(layout.title));
    d->lblSUBTITLE->setGeometry(pixelsOf(layout.subtitle));
    ok->Move(layout.ok.left(), layout.ok.top());
    cancel->Move(layout.cancel.left(), layout.cancel.top());
    if (!layout.itemsPlaced)
        return;
    for (int index = 0; index < layout.items.size(); ++index) {
        CommandButton *button = (*d->btnSelector)(index);
        if (!button)
            continue;
        const QRect &place = layout.items.at(index);
        button->Move(place.left(), place.top(), place.width(), place.height());
        button->Refresh();
    }
}

void frmSelector::ZoomForm(const modFuncs::RECT &from, const modFuncs::RECT &to)
{
    setTag(DisableEvents);
    const double dx = double(to.left - from.left) / ZoomSteps;
    const double dy = double(to.top - from.top) / ZoomSteps;
    const int fromWidth = from.right - from.left;
    const int fromHeight = from.bottom - from.top;
    const int toWidth = to.right - to.left;
    const int toHeight = to.bottom - to.top;
    const QPointer<frmSelector> alive(this);
    for (int k = 0; k <= ZoomSteps && alive; ++k) {
        setGeometry(QRect(from.left + int(std::lround(k * dx)), from.top + int(std::lround(k * dy)),
            std::max(1, fromWidth + (toWidth - fromWidth) * k / ZoomSteps),
            std::max(1, fromHeight + (toHeight - fromHeight) * k / ZoomSteps)));
        modFuncs::MakeWindowTopmost(platform::handleOf(this));
        repaint();
        if (zoomInterval > 0) {
            QEventLoop pause;
            QTimer::singleShot(zoomInterval, &pause, &QEventLoop::quit);
            pause.exec();
        } else {
            QApplication::processEvents();
        }
    }
    if (!alive)
        return;
    setGeometry(QRect(to.left, to.top, std::max(1, toWidth), std::max(1, toHeight)));
    QPalette white = palette();
    white.setColor(QPalette::Window, Qt::white);
    setPalette(white);
    setTag(QString());
}

int frmSelector::zoomStepInterval()
{
    return zoomInterval;
}

void frmSelector::setZoomStepInterval(int milliseconds)
{
    zoomInterval = std::max(milliseconds, 0);
}

void frmSelector::reject()
{
    // Nothing can be chosen yet while the form grows open.
    if (d->tag == DisableEvents)
        return;
    if (d->owner)
        send((*d->btn_Handle)(1), QStringLiteral("CANCEL"));
    else
        QDialog::reject();
}

void frmSelector::resizeEvent(QResizeEvent *event)
{
    QDialog::resizeEvent(event);
    if (d->tag == DisableEvents)
        return;
    ReArrange();
    send(this, QStringLiteral("Resize"));
}

void frmSelector::send(QObject *source, const QString &name, const QVariant &value)
{
    if (d->owner)
        d->owner->OnSelectorEvent(source, name, value);
    if (d->closeRequest) {
        d->closeRequest = false;
        done(d->tag == QLatin1String("OK") ? Accepted : Rejected);
    }
}

} // namespace zelctl

#include "frmSelector.h"

#include "SelectorLayout.h"
#include "clsGFXSelection.h"

#include "companion/CommandButton.h"
#include "companion/CommandButtonArray.h"
#include "companion/KeyCodes.h"
#include "platform/Twips.h"
#include "platform/WindowHandles.h"

#include <QApplication>
#include <QEventLoop>
#include <QKeyEvent>
#include <QLabel>
#include <QLineEdit>
#include <QPointer>
#include <QScrollArea>
#include <QScrollBar>
#include <QStyle>
#include <QTimer>

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <limits>
#include <utility>

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

// A title folded for a search: lower case, without accents ("Federação" → "federacao").
QString folded(const QString &text)
{
    QString plain;
    for (const QChar c : text.normalized(QString::NormalizationForm_D))
        if (c.category() != QChar::Mark_NonSpacing)
            plain.append(c);
    return plain.toCaseFolded();
}

// The width that shows nine captions in ten whole; the longest few are cut short.
int captionWidth(const QList<CommandButton *> &buttons)
{
    if (buttons.isEmpty())
        return 0;
    QList<int> widths;
    for (const CommandButton *button : buttons)
        widths.append(button->sizeHint().width());
    std::sort(widths.begin(), widths.end());
    return twipsFromPixels(widths.at(int(std::ceil(widths.size() * 0.9)) - 1));
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
    QLineEdit *txtFilter = nullptr;
    QScrollArea *grid = nullptr;
    CommandButtonArray *btnSelector = nullptr;
    CommandButtonArray *btn_Handle = nullptr;

    // The item buttons the filter lets through, in index order.
    QList<CommandButton *> shownItems() const
    {
        QList<CommandButton *> shown;
        for (int index = 0; index <= btnSelector->UBound(); ++index)
            if (CommandButton *button = (*btnSelector)(index); button && !button->isHidden())
                shown.append(button);
        return shown;
    }

    // Arrow keys move among the items: Left and Right in their order, Up and Down to the
    // nearest item of the row above or below (from the first row, Up goes to the filter
    // box). True when the key was an arrow; it is spent even at an edge, where it stays.
    bool moveAmongItems(CommandButton *from, int keyCode) const
    {
        const QList<CommandButton *> items = shownItems();
        const qsizetype at = items.indexOf(from);
        if (at < 0)
            return false;
        const bool up = keyCode == keyCodes::fromQtKey(Qt::Key_Up);
        const bool down = keyCode == keyCodes::fromQtKey(Qt::Key_Down);
        QWidget *to = nullptr;
        if (keyCode == keyCodes::fromQtKey(Qt::Key_Left)) {
            to = at > 0 ? items.at(at - 1) : nullptr;
        } else if (keyCode == keyCodes::fromQtKey(Qt::Key_Right)) {
            to = at + 1 < items.size() ? items.at(at + 1) : nullptr;
        } else if (up || down) {
            int best = std::numeric_limits<int>::max();
            for (CommandButton *item : items) {
                const int rows = item->y() - from->y();
                if (up ? rows >= 0 : rows <= 0)
                    continue;
                // A row nearer always wins; within a row, the item nearest the column.
                const int distance = std::abs(rows) * 4096 + std::abs(item->x() - from->x());
                if (distance < best) {
                    best = distance;
                    to = item;
                }
            }
            if (!to && up && !txtFilter->isHidden())
                to = txtFilter;
        } else {
            return false;
        }
        if (to) {
            to->setFocus(Qt::TabFocusReason);
            grid->ensureWidgetVisible(to);
        }
        return true;
    }
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

    d->txtFilter = new QLineEdit(this);
    d->txtFilter->setObjectName(QStringLiteral("txtFilter"));
    d->txtFilter->setPlaceholderText(QStringLiteral("Escreva para procurar"));
    d->txtFilter->setAccessibleName(QStringLiteral("Procurar"));
    d->txtFilter->setClearButtonEnabled(true);
    d->txtFilter->hide();
    d->txtFilter->installEventFilter(this);
    connect(d->txtFilter, &QLineEdit::textChanged, this, &frmSelector::applyFilter);

    // The item buttons lie on a pane that scrolls when they do not all fit.
    d->grid = new QScrollArea(this);
    d->grid->setObjectName(QStringLiteral("grid"));
    d->grid->setFrameShape(QFrame::NoFrame);
    d->grid->setHorizontalScrollBarPolicy(Qt::ScrollBarAlwaysOff);
    // The items take the focus, and the pane scrolls to show the one that has it.
    d->grid->setFocusPolicy(Qt::NoFocus);
    d->grid->viewport()->setAutoFillBackground(false);
    auto *pane = new QWidget;
    pane->setObjectName(QStringLiteral("gridPane"));
    d->grid->setWidget(pane);

    d->btnSelector = new CommandButtonArray(QStringLiteral("btnSelector"), pane, 1);
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
        const QPointer<frmSelector> alive(this);
        send((*d->btnSelector)(index), QStringLiteral("KeyDown"), QStringLiteral("%1,%2").arg(keyCode).arg(shift));
        // A key that closed the dialog has done its work; the button must not act on it too.
        if (!alive || !isVisible() || d->moveAmongItems((*d->btnSelector)(index), keyCode))
            keyCode = 0;
    });

    d->btn_Handle = new CommandButtonArray(QStringLiteral("btn_Handle"), this, 2);
    (*d->btn_Handle)(0)->setCaption(QStringLiteral("&OK"));
    (*d->btn_Handle)(0)->setDefault(true);
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

    setWindowTitle(QStringLiteral("Seleção"));
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

void frmSelector::ReArrange()
{
    if (d->tag == DisableEvents)
        return;
    CommandButton *ok = (*d->btn_Handle)(0);
    CommandButton *cancel = (*d->btn_Handle)(1);
    const QList<CommandButton *> items = d->shownItems();
    d->txtFilter->setVisible(d->btnSelector->Count() > FilterThreshold);

    selectorLayout::Metrics metrics;
    metrics.innerWidth = twipsFromPixels(width());
    metrics.innerHeight = twipsFromPixels(height());
    metrics.okWidth = ok->Width();
    metrics.okHeight = ok->Height();
    metrics.cancelVisible = !cancel->isHidden();
    metrics.titleVisible = !d->lblTITLE->isHidden();
    metrics.titleHeight = twipsFromPixels(d->lblTITLE->height());
    metrics.subtitleVisible = !d->lblSUBTITLE->isHidden();
    metrics.subtitleHeight = twipsFromPixels(d->lblSUBTITLE->height());
    metrics.filterVisible = !d->txtFilter->isHidden();
    metrics.itemCount = int(items.size());
    metrics.captionWidth = captionWidth(items);
    metrics.scrollBarWidth = twipsFromPixels(style()->pixelMetric(QStyle::PM_ScrollBarExtent, nullptr, d->grid));

    const selectorLayout::Layout layout = selectorLayout::arrange(metrics);
    d->lblTITLE->setGeometry(pixelsOf(layout.title));
    d->lblSUBTITLE->setGeometry(pixelsOf(layout.subtitle));
    d->txtFilter->setGeometry(pixelsOf(layout.filter));
    ok->Move(layout.ok.left(), layout.ok.top());
    cancel->Move(layout.cancel.left(), layout.cancel.top());
    d->grid->setGeometry(pixelsOf(layout.grid));
    // Tab goes from the filter box through the items to OK and Cancel, as they read.
    QWidget *previous = d->txtFilter;
    for (CommandButton *item : items)
        setTabOrder(std::exchange(previous, item), item);
    setTabOrder(previous, ok);
    setTabOrder(ok, cancel);
    d->grid->setVerticalScrollBarPolicy(layout.scrolls ? Qt::ScrollBarAlwaysOn : Qt::ScrollBarAlwaysOff);
    if (!layout.itemsPlaced)
        return;
    d->grid->widget()->resize(pixelsFromTwips(layout.content.width()), pixelsFromTwips(layout.content.height()));
    const QPoint origin = layout.grid.topLeft();
    // One paint for the whole pane once every item is in place: painting each item as it
    // moves repaints every item it still overlaps, which for a long list is minutes.
    QWidget *pane = d->grid->widget();
    pane->setUpdatesEnabled(false);
    for (int i = 0; i < items.size(); ++i) {
        const QRect place = layout.items.at(i).translated(-origin);
        items[i]->Move(place.left(), place.top(), place.width(), place.height());
        items[i]->Refresh();
    }
    pane->setUpdatesEnabled(true);
}

void frmSelector::applyFilter(const QString &text)
{
    const QString wanted = folded(text.trimmed());
    for (int index = 0; index <= d->btnSelector->UBound(); ++index)
        if (CommandButton *button = (*d->btnSelector)(index))
            button->setVisible(folded(button->Caption()).contains(wanted));
    d->grid->verticalScrollBar()->setValue(0);
    ReArrange();
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

bool frmSelector::eventFilter(QObject *watched, QEvent *event)
{
    if (watched != d->txtFilter || event->type() != QEvent::KeyPress)
        return QDialog::eventFilter(watched, event);
    const auto *key = static_cast<QKeyEvent *>(event);
    const QList<CommandButton *> items = d->shownItems();
    if ((key->key() == Qt::Key_Return || key->key() == Qt::Key_Enter) && items.size() == 1
        && items.first()->isEnabled()) {
        // The only item left is the one wanted.
        send(items.first(), QStringLiteral("DoubleClick"), items.first()->Tag().toInt());
        return true;
    }
    if (key->key() == Qt::Key_Down && !items.isEmpty()) {
        items.first()->setFocus(Qt::TabFocusReason);
        return true;
    }
    return QDialog::eventFilter(watched, event);
}

void frmSelector::keyPressEvent(QKeyEvent *event)
{
    // Typing on an item searches the list, when it has a filter box.
    const QString text = event->text();
    if (!d->txtFilter->isHidden() && !text.isEmpty() && text.at(0).isPrint()
        && !(event->modifiers() & (Qt::ControlModifier | Qt::AltModifier))) {
        d->txtFilter->setFocus(Qt::ShortcutFocusReason);
        d->txtFilter->insert(text);
        return;
    }
    QDialog::keyPressEvent(event);
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

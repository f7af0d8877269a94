#include "clsGFXSelection.h"

#include "frmSelector.h"

#include "common/modFuncs.h"
#include "companion/CommandButton.h"
#include "companion/CommandButtonArray.h"
#include "frame/ClassRegistry.h"
#include "frame/Picture.h"
#include "platform/ModalPresenter.h"
#include "platform/OleColor.h"
#include "platform/WindowHandles.h"
#include "platform/gdi/Gdi.h"
#include "platform/gdi/Pictures.h"
#include "png/StdPNG.h"

#include <QGuiApplication>
#include <QLabel>
#include <QPointer>
#include <QScreen>

#include <algorithm>

namespace zelctl {

namespace {

constexpr auto EuCountries = "PT,DE,AT,BE,BG,CY,DK,SK,SI,ES,EE,FI,FR,EL,NL,HU,GB,IE,IT,LV,LT,LU,MT,PL,CZ,RO,SE";

const QString Ok = QStringLiteral("OK");
const QString Cancel = QStringLiteral("CANCEL");

// One open dialog: its form, the items it shows and the one pressed now.
struct Session
{
    QPointer<frmSelector> form;
    QList<GFXItem> items;
    int pressed = -1;
    bool closing = false;
    Session *outer = nullptr; // the dialog this one was opened from, if any

    QList<GFXItem> selection() const
    {
        if (pressed < 0)
            return {};
        GFXItem item = items.at(pressed);
        item.Selected = true;
        return { item };
    }
};

// Where the dialog of size (width, height) goes beside the parent's rectangle; all pixels.
QRect placeBeside(const modFuncs::RECT &parent, int width, int height, GFXPositioning relation)
{
    switch (relation) {
    case GFXPositionObjectBelow:
        return { parent.left, parent.bottom, width, height };
    case GFXPositionObjectAbove:
        return { parent.left, parent.top - height, width, height };
    case GFXPositionObjectLeft:
        return { parent.left - width, parent.top, width, height };
    case GFXPositionObjectRight:
        return { parent.right, parent.top, width, height };
    case GFXPositionDefault:
    case GFXPositionCenterObject:
        break;
    }
    // Centred on the parent's top-left corner.
    const int halfWidth = width / 2;
    const int halfHeight = height / 2;
    return QRect(QPoint(parent.left - halfWidth, parent.top - halfHeight),
        QPoint(parent.left + halfWidth - 1, parent.top + halfHeight - 1));
}

// Moves the rectangle onto the screen that shows the parent, as far as it fits.
QRect keptOnScreen(QRect place, const modFuncs::RECT &parent)
{
    const QPoint centre((parent.left + parent.right) / 2, (parent.top + parent.bottom) / 2);
    const QScreen *screen = QGuiApplication::screenAt(centre);
    if (!screen)
        screen = QGuiApplication::primaryScreen();
    if (!screen)
        return place;
    const QRect area = screen->availableGeometry();
    place.moveLeft(std::max(std::min(place.left(), area.right() + 1 - place.width()), area.left()));
    place.moveTop(std::max(std::min(place.top(), area.bottom() + 1 - place.height()), area.top()));
    return place;
}

// The item's image at its own size, with its transparency, so it shows on the button's
// own background whatever that is; null when there is no image or the file is not a PNG
// that can be read.
Picture itemPicture(const QString &path)
{
    if (path.isEmpty())
        return {};
    StdPNG png;
    png.setTransparentStyle(StdPNG::alphaTransparent);
    if (!png.LoadFile(path, true, true, 255) || png.Width() < 1 || png.Height() < 1)
        return {};
    QImage clear(png.Width(), png.Height(), QImage::Format_ARGB32_Premultiplied);
    if (clear.isNull())
        return {};
    clear.fill(Qt::transparent);
    const gdi::HBITMAP bitmap = gdi::createBitmapFromImage(clear);
    const gdi::HDC dc = gdi::CreateCompatibleDC(0);
    const gdi::HGDIOBJ previous = gdi::SelectObject(dc, bitmap);
    png.Paint(dc, 0, 0);
    gdi::SelectObject(dc, previous);
    gdi::DeleteDC(dc);
    const QImage image = gdi::imageFromBitmap(bitmap);
    gdi::DeleteObject(bitmap);
    return image.isNull() ? Picture() : Picture(image);
}

void setBackground(QWidget &form, const QColor &color)
{
    QPalette palette = form.palette();
    palette.setColor(QPalette::Window, color);
    form.setPalette(palette);
    form.setAutoFillBackground(true);
}

} // namespace

class clsGFXSelectionPrivate
{
public:
    LiveObject live;
    Session *session = nullptr;
    QString countryFile;
};

clsGFXSelection::clsGFXSelection(QObject *parent)
    : QObject(parent)
    , d(std::make_unique<clsGFXSelectionPrivate>())
{ }

clsGFXSelection::~clsGFXSelection()
{
    // A host that drops the object while its dialogs are open gets them closed: nobody is
    // left to read their answer.
    for (Session *session = d->session; session; session = session->outer) {
        if (session->form) {
            session->form->setOwner(nullptr);
            session->form->QDialog::done(QDialog::Rejected);
        }
    }
}

GFXResult clsGFXSelection::SelectFrom(const GFXSelection &s, const QList<GFXItem> &Items)
{
    if (Items.isEmpty())
        return {};
    GFXResult result;
    result.ViewType = RecomendedView(s, Items);

    QObject *parentObject = s.ParentObj.data();
    QWidget *parentWindow = nullptr;
    modFuncs::RECT parentRect;
    if (parentObject) {
        parentRect = modFuncs::GetObjectWindowRect(parentObject);
        if (QWidget *widget = platform::widgetOf(parentObject->property("hWnd").value<qint32>()))
            parentWindow = widget->window();
    }

    Session session;
    session.form = new frmSelector(parentWindow);
    session.items = Items;
    session.outer = d->session;
    d->session = &session;
    frmSelector &form = *session.form;
    form.setOwner(this);

    // The host may delete this object from any of its events, or while the dialog is open;
    // then the dialog closes and nothing of the object is touched again.
    const QPointer<clsGFXSelection> alive(this);
    Q_EMIT Opening();

    if (alive && parentObject && session.form) {
        const QRect target
            = keptOnScreen(placeBeside(parentRect, form.width(), form.height(), s.WindowPositionRelation), parentRect);
        const QVariant backColor = parentObject->property("BackColor");
        if (backColor.isValid())
            setBackground(form, platform::toQColor(backColor.value<quint32>()));
        form.ZoomForm(parentRect, { target.left(), target.top(), target.right() + 1, target.bottom() + 1 });
    }

    if (alive && session.form) {
        if (!s.Title.isEmpty())
            form.setWindowTitle(s.Title);
        auto *title = form.findChild<QLabel *>(QStringLiteral("lblTITLE"));
        title->setText(s.Title);
        title->setVisible(!s.Title.isEmpty());
        auto *subtitle = form.findChild<QLabel *>(QStringLiteral("lblSUBTITLE"));
        subtitle->setText(s.Subtitle);
        subtitle->setVisible(!s.Subtitle.isEmpty());

        bool focused = false;
        CommandButton *firstChoice = nullptr;
        for (int index = 0; index < Items.size(); ++index) {
            const GFXItem &item = Items.at(index);
            CommandButton *button = index == 0 ? form.btnSelector()(0) : form.btnSelector().Load(index);
            button->setCaption(item.Title);
            button->setToolTip(item.Tooltip);
            // A single choice: only the first item marked as selected starts pressed.
            const bool pressed = item.Selected && session.pressed < 0;
            button->setValue(pressed);
            if (pressed)
                session.pressed = index;
            button->setEnabled(!item.Disabled);
            button->setTag(QString::number(index));
            // OK stays the dialog's default button while an item has the focus.
            button->setAutoDefault(false);
            button->setPicture(itemPicture(item.Image.toString()));
            button->show();
            // OK stays the default button: the default item starts with the focus, so Enter
            // chooses it.
            if (item.Default && !focused) {
                button->setFocus(Qt::OtherFocusReason);
                focused = true;
            }
            if (!item.Disabled && !firstChoice)
                firstChoice = button;
        }
        // Without a default item the keyboard starts on the chosen item, else on the first; in
        // a list long enough for a filter box, in the box.
        CommandButton *start = session.pressed >= 0 ? form.btnSelector()(session.pressed) : firstChoice;
        if (start && !focused && start->isEnabled() && Items.size() <= frmSelector::FilterThreshold)
            start->setFocus(Qt::OtherFocusReason);
        form.btn_Handle()(0)->show();
        form.btn_Handle()(1)->setVisible(!s.DisableCancel);
        form.ReArrange();
        platform::showModal(form);
    }

    if (!alive) {
        delete session.form.data();
        result.Canceled = true;
        return result;
    }
    d->session = session.outer;
    if (session.form && session.form->Tag() == Ok) {
        result.Accepted = true;
        result.SelectedItems = session.selection();
        result.NumberOfSelectedItems = qint32(result.SelectedItems.size());
        if (!result.SelectedItems.isEmpty())
            result.SelectedItem = result.SelectedItems.first();
    } else {
        result.Canceled = true;
    }
    delete session.form.data();
    Q_EMIT Closed();
    return result;
}

GFXViewTypes clsGFXSelection::RecomendedView(const GFXSelection &, const QList<GFXItem> &) const
{
    return GFXViewButtons;
}

void clsGFXSelection::OnSelectorEvent(QObject *source, const QString &eventName, const QVariant &value)
{
    Session *session = d->session;
    if (!session || !session->form || session->closing)
        return;
    frmSelector &form = *session->form;

    if (eventName == Ok || eventName == Cancel) {
        QList<GFXItem> selected = session->selection();
        qint32 count = qint32(selected.size());
        bool cancelClose = false;
        const QPointer<clsGFXSelection> alive(this);
        Q_EMIT Closing(count, selected, cancelClose);
        if (!alive || cancelClose || d->session != session || !session->form)
            return;
        session->closing = true;
        form.setTag(eventName);
        form.setCloseRequest(true);
        return;
    }

    const bool click = eventName == QLatin1String("Click");
    // Enter on an item chooses it and accepts, as a double click does.
    const bool enter = eventName == QLatin1String("KeyDown")
        && value.toString().section(QLatin1Char(','), 0, 0) == QLatin1String("13");
    const bool doubleClick = eventName == QLatin1String("DoubleClick") || enter;
    if (!click && !doubleClick)
        return;
    auto *sourceButton = qobject_cast<CommandButton *>(source);
    const int index = enter ? (sourceButton ? sourceButton->Tag().toInt() : -1) : value.toInt();
    CommandButton *button = form.btnSelector()(index);
    if (!button || index >= session->items.size() || !button->isEnabled())
        return;
    // A click on the pressed item leaves it pressed.
    button->setValue(true);
    const int previous = session->pressed;
    if (previous != index) {
        if (CommandButton *released = form.btnSelector()(previous))
            released->setValue(false);
        session->pressed = index;
        const QPointer<clsGFXSelection> alive(this);
        if (previous >= 0) {
            GFXItem item = session->items.at(previous);
            item.Selected = false;
            Q_EMIT ItemUnchecked(item);
        }
        GFXItem item = session->items.at(index);
        item.Selected = true;
        if (alive)
            Q_EMIT ItemChecked(item);
        if (alive)
            Q_EMIT ItemChanged(item);
        if (!alive)
            return;
    }
    if (doubleClick && d->session == session)
        OnSelectorEvent(source, Ok, {});
}

QString clsGFXSelection::SelectCountry(const GFXSelection &xListSettings, GSEL_CountryFilterList GS, QString &CFilter)
{
    switch (GS) {
    case GSEL_OnlyPT:
        CFilter = QStringLiteral("PT,");
        return QStringLiteral("PT");
    case GSEL_All:
        CFilter = QStringLiteral("*");
        break;
    case GSEL_OnlyEU:
        CFilter = EU_CountryList();
        break;
    case GSEL_Custom:
        break;
    default:
        return {};
    }

    const QString text = modFuncs::ReadWholeFile(countryFile());
    const bool everyCountry = CFilter == QLatin1String("*");
    QStringList wanted = CFilter.split(QLatin1Char(','));
    for (QString &code : wanted)
        code = code.trimmed();

    const QString flags = modFuncs::GetDataPath() + QStringLiteral("images/flags_iso/16/");
    QList<GFXItem> items;
    for (const QStringView line : modFuncs::textLines(text)) {
        const QList<QStringView> fields = line.split(QLatin1Char('\t'));
        // A line without a code and a name names no country.
        if (fields.size() < 4 || fields.at(1).isEmpty())
            continue;
        const QString code = fields.at(1).toString();
        if (!everyCountry && !wanted.contains(code))
            continue;
        GFXItem item;
        item.Title = fields.at(3).toString();
        item.Image = flags + code + QStringLiteral(".png");
        item.Value = code;
        items.append(item);
    }
    if (items.size() < 2)
        return {};
    return SelectFrom(xListSettings, items).SelectedItem.Value.toString();
}

QString clsGFXSelection::EU_CountryList() const
{
    return QString::fromLatin1(EuCountries);
}

QString clsGFXSelection::QuickSelectFrom(const QString &) const
{
    return {};
}

QString clsGFXSelection::SelectCAErev3() const
{
    return {};
}

QString clsGFXSelection::SelectCTA() const
{
    return {};
}

QString clsGFXSelection::SelectDistrito() const
{
    return {};
}

QString clsGFXSelection::SelectLocalidade(const QString &) const
{
    return {};
}

QString clsGFXSelection::SelectFreguesia(const QString &) const
{
    return {};
}

QString clsGFXSelection::countryFile() const
{
    return d->countryFile.isEmpty() ? modFuncs::GetDataPath() + QStringLiteral("iso3166.txt") : d->countryFile;
}

void clsGFXSelection::setCountryFile(const QString &path)
{
    d->countryFile = path;
}

ZELCTL_REGISTER_CLASS(clsGFXSelection)

} // namespace zelctl

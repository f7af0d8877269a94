#include "cNIF.h"

#include "NifLengthValidator.h"
#include "NifPopupMenu.h"
#include "ShapeWidget.h"
#include "common/InnerCalls.h"
#include "common/modFuncs.h"
#include "companion/Declaration.h"
#include "companion/NIFGrabber.h"
#include "frame/PropertyReaders.h"
#include "frmEditNIF.h"
#include "platform/Accessibility.h"
#include "platform/ModalPresenter.h"
#include "platform/Settings.h"
#include "platform/WindowHandles.h"
#include "selection/PictureBox.h"
#include "selection/frmSelectCountry.h"
#include "selection/mod_CTL.h"
#include "tips/clsBalloonTip.h"
#include "validation/nifValidator.h"

#include <QAction>
#include <QClipboard>
#include <QGuiApplication>
#include <QLineEdit>
#include <QMimeData>
#include <QMouseEvent>
#include <QPointer>

namespace zelctl {

using platform::OleColor;
using platform::rgb;

namespace {

constexpr QLatin1String Portugal("PT");
constexpr int PortugalLength = 9;

constexpr OleColor White = rgb(255, 255, 255);
constexpr OleColor Black = 0;
constexpr OleColor ValidText = rgb(0, 128, 0);
constexpr OleColor InvalidBack = rgb(255, 0, 0);
constexpr OleColor LockedText = rgb(64, 64, 64);
constexpr OleColor DisabledBack = rgb(200, 200, 200);
constexpr OleColor Fetching = rgb(64, 64, 192);
constexpr OleColor NameFound = rgb(0, 255, 0);
constexpr OleColor FrameColour = rgb(128, 128, 128);
// 1935 x 315 twips.
constexpr QSize DefaultSize(129, 21);

// Record ids the control fills from a fetch, with the fetcher keys they come from, in the
// order they are copied.
struct FetchedField
{
    const char16_t *id;
    const char16_t *key;
};
constexpr FetchedField FetchedFields[] = {
    { u"SOURCE", u"SOURCE" },
    { u"nome", u"NAME" },
    { u"servico", u"SERVICO" },
    { u"cae", u"CAE" },
    { u"cta", u"CTA" },
    { u"updated", u"UPDATED" },
    { u"status", u"STATUS" },
    { u"concelho", u"CONCELHO" },
    { u"estadocivil", u"ESTADOCIVIL" },
    { u"conjuge", u"CONJUGE" },
    { u"datanascimento", u"DATANASCIMENTO" },
    { u"nib", u"NIB" },
    { u"territorio", u"TERRITORIO" },
    { u"telefone", u"TELEFONE" },
    { u"email", u"EMAIL" },
    { u"laststatus", u"LASTSTATUS" },
};
// Read by the tip; kept with the record, without events, so the tip of a number looked up
// earlier still shows them once the fetcher has answered for another.
constexpr FetchedField TipFields[] = { { u"codigopostal", u"CODIGOPOSTAL" }, { u"localidade", u"LOCALIDADE" } };

bool isMemberState(const QString &code)
{
    return nifValidator::CountryIndex(code) >= 0;
}

// Blanks at both ends, as a user leaves them.
QString trimBlanks(const QString &text)
{
    qsizetype first = 0;
    qsizetype last = text.size();
    while (first < last && text[first] == u' ')
        ++first;
    while (last > first && text[last - 1] == u' ')
        --last;
    return text.sliced(first, last - first);
}

} // namespace

// Events are raised synchronously and a host may delete the control from any of them:
// after each event, and after each call that may raise one, the code checks its guard
// (a QPointer to the control) and returns at once when the control has gone.
class cNIF::Private
{
public:
    using Guard = QPointer<cNIF>;

    explicit Private(cNIF *q);

    void textChanged();
    bool switchesCountry(const QString &text) const;
    bool switchTypedCountry();
    bool cutToLimit();
    void applyColours();
    void setStateColours(OleColor fore, OleColor back);
    void showNumber();
    void refreshTip();
    QString tipText();
    bool userMayEdit() const;
    companion::KeyedStore *store() const;
    QString storeKey(const QString &varID) const { return q->Value() + u'.' + varID; }
    // Whether the fetcher's last answer is about the number in the box.
    bool fetcherHoldsValue() const;
    QString fetchedField(const QString &varID) const;
    QString recordedName() const;
    void fetchStarting();
    void informationReceived(const QString &id);
    void fetchFinished();
    void layout();
    void uncount();
    void openRecordForm();
    // Tells assistive technology what changed: validity, value, holder, country.
    void announce();

    cNIF *q;
    QLineEdit *nif;
    PictureBox *cPicture;
    ShapeWidget *Shape1;
    ShapeWidget *Shape2;
    QPointer<companion::NIFGrabber> grabber;
    QPointer<companion::Declaration> declaration;
    clsBalloonTip *tip = nullptr;
    NifPopupMenu *popup = nullptr;
    InnerCalls innerCalls;
    platform::AccessibleEcho echo;
    platform::AccessibleEcho flagEcho;

    // The records the control keeps itself, by number (Value): every value let through
    // Information and what fetches answered. They hold the record where the host set no
    // declaration, and keep it whole while the fetcher answers for other numbers.
    QHash<QString, QHash<QString, QString>> records;
    // The number whose holder the name, the tip and the status mark show; "" when none.
    QString shownNumber;

    QString country = QString(Portugal);
    QString lastAppliedCountry;
    bool required = false;
    GSEL_CountryFilterList filter = GSEL_OnlyPT;
    QString customCountryList;
    bool popupDisabled = false;
    QString name;
    OleColor backColor = White;

    OleColor stateFore = Black;
    OleColor stateBack = White;
    bool lockTint = false;
    bool counted = true;
};

cNIF::Private::Private(cNIF *owner)
    : q(owner)
    , nif(new QLineEdit(owner))
    , cPicture(new PictureBox(owner))
    , Shape1(new ShapeWidget(owner))
    , Shape2(new ShapeWidget(owner))
    , grabber(companion::createNIFGrabber(owner))
    , innerCalls(owner)
    , echo(owner)
    , flagEcho(cPicture)
{
    Shape2->setObjectName(QStringLiteral("Shape2"));
    Shape2->setBorderColor(FrameColour);
    Shape1->setObjectName(QStringLiteral("Shape1"));
    Shape1->setBorderColor(White);
    cPicture->setObjectName(QStringLiteral("cPicture"));
    cPicture->setBackColor(White);
    cPicture->setCursor(Qt::PointingHandCursor);
    nif->setObjectName(QStringLiteral("nif"));
    nif->setFrame(false);
    QFont font(QStringLiteral("Tahoma"));
    font.setPointSizeF(8.25);
    nif->setFont(font);
    nif->setValidator(new NifLengthValidator([this] { return country == Portugal ? PortugalLength : 0; },
        [this](const QString &text) { return switchesCountry(text); }, nif));
    // The box lies inside its status mark, which lies inside the frame.
    Shape2->lower();
    Shape1->stackUnder(nif);
    QObject::connect(nif, &QLineEdit::textChanged, owner, [this] {
        const InnerCalls::Scope busy(innerCalls, nif);
        textChanged();
    });

    if (grabber) {
        QObject::connect(grabber, &companion::NIFGrabber::Starting, owner, [this] {
            const InnerCalls::Scope busy(innerCalls, grabber);
            fetchStarting();
        });
        QObject::connect(grabber, &companion::NIFGrabber::ReceivedInformation, owner, [this](const QString &id) {
            const InnerCalls::Scope busy(innerCalls, grabber);
            informationReceived(id);
        });
        QObject::connect(grabber, &companion::NIFGrabber::Finished, owner, [this] {
            const InnerCalls::Scope busy(innerCalls, grabber);
            fetchFinished();
        });
    }
    mod_CTL::nifControlCreated();
}

void cNIF::Private::uncount()
{
    if (counted) {
        counted = false;
        mod_CTL::nifControlTerminated();
    }
}

void cNIF::Private::openRecordForm()
{
    // On the heap and guarded: the host may close the window (and the form with it) or
    // delete this control while the form is up.
    const QPointer<frmEditNIF> form = new frmEditNIF(q->window());
    form->SetNIFControl(q);
    platform::showModal(*form);
    delete form.data();
}

void cNIF::Private::announce()
{
    echo.refresh();
    // The box has the focus and speaks for the control.
    echo.mirrorTo(*nif);
    flagEcho.refresh();
}

void cNIF::Private::layout()
{
    const QRect inner = q->rect();
    Shape2->setGeometry(inner);
    const int flagTop = std::max(2, (inner.height() - mod_CTL::FlagSize) / 2);
    cPicture->setGeometry(2, flagTop, mod_CTL::FlagSize, mod_CTL::FlagSize);
    const int left = 2 + mod_CTL::FlagSize + 2;
    Shape1->setGeometry(left, 1, std::max(0, inner.width() - left - 1), std::max(0, inner.height() - 2));
    nif->setGeometry(left + 1, 2, std::max(0, inner.width() - left - 3), std::max(0, inner.height() - 4));
}

bool cNIF::Private::switchesCountry(const QString &text) const
{
    if (text.size() < 3)
        return false;
    const QString typed = text.first(2).toUpper();
    return !nifValidator::IsNumericFrom(typed, 1, 0) && isMemberState(typed) && typed != country;
}

bool cNIF::Private::switchTypedCountry()
{
    const QString text = nif->text();
    if (!switchesCountry(text))
        return false;
    // The number is taken before the new country applies, so the Portuguese length cut
    // cannot eat into it.
    const QString number = text.sliced(2);
    {
        const QSignalBlocker quiet(nif);
        q->setCountryID(text.first(2).toUpper());
    }
    nif->setText(number);
    return true;
}

bool cNIF::Private::cutToLimit()
{
    // The box refuses keys beyond the Portuguese limit, but a text set whole may still pass
    // it; the cut is a change of its own.
    const QString text = nif->text();
    if (country != Portugal || text.size() <= PortugalLength || switchesCountry(text))
        return false;
    nif->setText(text.first(PortugalLength));
    return true;
}

void cNIF::Private::textChanged()
{
    if (cutToLimit() || switchTypedCountry())
        return;
    const Guard alive(q);
    q->RefreshMe();
    if (!alive)
        return;
    if (nif->text().isEmpty()) {
        Q_EMIT q->Cleared();
        if (!alive)
            return;
    }
    Q_EMIT q->Changed();
}

// Enabling brings back the colour of the number's state, not plain white, so the white text
// of an invalid number stays readable.
void cNIF::Private::applyColours()
{
    QPalette palette = nif->palette();
    palette.setColor(QPalette::Text, platform::toQColor(lockTint ? LockedText : stateFore));
    palette.setColor(QPalette::Base, platform::toQColor(nif->isEnabled() ? stateBack : DisabledBack));
    nif->setPalette(palette);
}

void cNIF::Private::setStateColours(OleColor fore, OleColor back)
{
    stateFore = fore;
    stateBack = back;
    lockTint = false;
    applyColours();
}

void cNIF::Private::showNumber()
{
    // Another number: what the control showed belongs to another holder.
    const QString value = q->Value();
    if (shownNumber == value)
        return;
    shownNumber = value;
    name.clear();
    Shape1->setBorderColor(White);
}

bool cNIF::Private::userMayEdit() const
{
    return !nif->isReadOnly() && nif->isEnabled();
}

companion::KeyedStore *cNIF::Private::store() const
{
    return declaration ? &declaration->DeclarationData().NifInfoStore() : nullptr;
}

bool cNIF::Private::fetcherHoldsValue() const
{
    return grabber && grabber->GetField(QStringLiteral("ID")) == q->Value();
}

QString cNIF::Private::fetchedField(const QString &varID) const
{
    const QString answer = grabber->GetField(varID.toUpper());
    if (!answer.isEmpty())
        return answer;
    for (const FetchedField &field : FetchedFields) {
        if (varID == QStringView(field.id))
            return grabber->GetField(QString::fromUtf16(field.key));
    }
    return {};
}

QString cNIF::Private::recordedName() const
{
    const QString id = QStringLiteral("nome");
    if (companion::KeyedStore *kept = store()) {
        const QString stored = kept->Read(storeKey(id)).toString();
        if (!stored.isEmpty())
            return stored;
    }
    return records.value(q->Value()).value(id);
}

void cNIF::Private::fetchStarting()
{
    Shape1->setBorderColor(Fetching);
    Shape1->show();
}

void cNIF::Private::informationReceived(const QString &id)
{
    // An answer about a number the box no longer holds is dropped.
    const QString value = q->Value();
    if (!grabber || grabber->GetField(QStringLiteral("ID")) != value || id != value)
        return;
    const Guard alive(q);
    // A field the fetcher does not know says nothing about it: what the record holds stays.
    for (const FetchedField &field : FetchedFields) {
        const QString answer = grabber->GetField(QString::fromUtf16(field.key));
        if (!answer.isEmpty())
            q->setInformation(QString::fromUtf16(field.id), answer);
        if (!alive || !grabber)
            return;
    }
    for (const FetchedField &field : TipFields) {
        const QString answer = grabber->GetField(QString::fromUtf16(field.key));
        if (!answer.isEmpty())
            records[value].insert(QString::fromUtf16(field.id), answer);
    }
    const QString holder = grabber->HolderName();
    if (!holder.isEmpty()) {
        q->setNome(holder);
        if (!alive)
            return;
    }
    refreshTip();
}

void cNIF::Private::fetchFinished()
{
    Shape1->setBorderColor(q->Nome().isEmpty() ? White : NameFound);
    Q_EMIT q->DataFinished();
}

QString cNIF::Private::tipText()
{
    const QString lineBreak = QStringLiteral("\r\n");
    QString text = name;
    for (const char16_t *id : { u"codigopostal", u"localidade" }) {
        const QString line = q->Information(QString::fromUtf16(id));
        if (!line.isEmpty())
            text += lineBreak + line;
    }
    text += lineBreak + QStringLiteral("NIF: ") + nif->text();
    text += lineBreak + QStringLiteral("País: ") + q->CountryName(false);
    return text;
}

void cNIF::Private::refreshTip()
{
    if (!tip) {
        tip = new clsBalloonTip(q);
        tip->setObjectName(QStringLiteral("tip"));
        tip->setMvarParentControlhwnd(platform::handleOf(nif));
        tip->setTitle(QStringLiteral("Identificação Fiscal"));
        tip->setStyle(clsBalloonTip::TTBalloon);
        tip->setPopupOnDemand(true);
        tip->setIcon(clsBalloonTip::TTIconInfo);
        tip->Create();
    }
    QString text;
    if (!q->IsEmpty() && !name.isEmpty()) {
        const Guard alive(q);
        const bool valid = q->IsValid();
        if (!alive)
            return;
        if (valid)
            text = tipText();
    }
    if (text != tip->TipText())
        tip->setTipText(text);
}

// --- cNIF ---------------------------------------------------------------------------------

cNIF::cNIF(QWidget *parent)
    : UserControl(parent)
    , d(std::make_unique<Private>(this))
{
    setAutoFillBackground(true);
    QPalette palette = this->palette();
    palette.setColor(QPalette::Window, platform::toQColor(d->backColor));
    setPalette(palette);
    resize(DefaultSize);
    // One line high in any layout; focus given to the control (a label's buddy, a host's
    // setFocus) lands in the number box.
    setSizePolicy(QSizePolicy::Preferred, QSizePolicy::Fixed);
    setFocusPolicy(Qt::StrongFocus);
    setFocusProxy(d->nif);
    d->popup = new NifPopupMenu(*this, *d->nif);
    connect(d->popup->entry("mnu_ficha"), &QAction::triggered, this, [this] { d->openRecordForm(); });
    d->cPicture->installEventFilter(this);
    d->nif->installEventFilter(this);
    setCountryID(QString(Portugal));
    d->applyColours();
}

cNIF::~cNIF()
{
    d->uncount();
    // The box's validator asks this control; the box may outlive it (below) or hear of a
    // focus change while the base class takes it down.
    delete d->nif->validator();
    d->innerCalls.releaseBusy();
}

QSize cNIF::sizeHint() const
{
    return DefaultSize;
}

void cNIF::resizeEvent(QResizeEvent *event)
{
    UserControl::resizeEvent(event);
    d->layout();
}

bool cNIF::eventFilter(QObject *watched, QEvent *event)
{
    if (watched != d->cPicture && watched != d->nif)
        return UserControl::eventFilter(watched, event);
    // The handlers below may run the host's code; a control deleted there is left at once.
    const Private::Guard alive(this);
    switch (event->type()) {
    case QEvent::MouseButtonPress:
        // The right button's menu opens on the context menu event Qt sends right after the
        // press: Qt touches the pressed box no more after that one, so the host may delete
        // the control while its menu is open.
        if (static_cast<QMouseEvent *>(event)->button() == Qt::RightButton)
            return true;
        break;
    case QEvent::MouseButtonRelease: {
        const auto *mouse = static_cast<QMouseEvent *>(event);
        if (watched == d->cPicture && mouse->button() == Qt::LeftButton
            && d->cPicture->rect().contains(mouse->position().toPoint())) {
            // Only the host's code changes the country of a box the user may not change.
            if (d->userMayEdit())
                ShowCountryList();
            return true;
        }
        // X11's middle-click paste reads a country code like every other paste.
        if (watched == d->nif && mouse->button() == Qt::MiddleButton
            && QGuiApplication::clipboard()->supportsSelection()) {
            d->popup->PasteText(QGuiApplication::clipboard()->text(QClipboard::Selection));
            return true;
        }
        break;
    }
    case QEvent::Drop: {
        // Text dropped from elsewhere is pasted; text moved within the box is the box's own.
        auto *drop = static_cast<QDropEvent *>(event);
        if (watched == d->nif && drop->source() != d->nif && drop->mimeData()->hasText()) {
            if (d->userMayEdit()) {
                drop->acceptProposedAction();
                d->popup->PasteText(drop->mimeData()->text());
            } else {
                drop->ignore();
            }
            return true;
        }
        break;
    }
    case QEvent::ContextMenu:
        // The control's own menu replaces the box's, for the right button and the menu key.
        if (isEnabled())
            PopupContextMenu();
        return true;
    case QEvent::FocusIn:
        if (watched == d->nif) {
            d->refreshTip();
            if (!alive)
                return true;
            d->announce();
        }
        break;
    case QEvent::EnabledChange:
        // Also when a parent is enabled or disabled: the box looks as it acts.
        if (watched == d->nif) {
            d->applyColours();
            d->announce();
        }
        break;
    case QEvent::KeyPress: {
        const auto *key = static_cast<QKeyEvent *>(event);
        if (watched != d->nif)
            break;
        if (d->popup->handleShortcut(*key))
            return true;
        // The keyboard's way to the flag, as to a combo box's list: Alt+Down or F4.
        if ((key->key() == Qt::Key_F4 && key->modifiers() == Qt::NoModifier)
            || (key->key() == Qt::Key_Down && key->modifiers() == Qt::AltModifier)) {
            if (d->userMayEdit())
                ShowCountryList();
            return true;
        }
        break;
    }
    default:
        break;
    }
    return UserControl::eventFilter(watched, event);
}

QString cNIF::CountryName(bool fulldesc) const
{
    if (d->country == Portugal)
        return QStringLiteral("Portugal");
    const QString file = modFuncs::ReadWholeFile(modFuncs::GetDataPath() + QStringLiteral("iso3166.txt"), true);
    const auto fieldsOf = [&file](QStringView code) -> QList<QStringView> {
        for (const QStringView line : modFuncs::textLines(file)) {
            const QList<QStringView> fields = line.split(u'\t');
            if (fields.size() >= 2 && fields[1] == code)
                return fields;
        }
        return {};
    };
    QList<QStringView> fields = fieldsOf(d->country);
    // Greece is "EL" in the member-state lists and in the country file; older files know
    // it by its ISO code.
    if (fields.isEmpty() && d->country == QLatin1String("EL"))
        fields = fieldsOf(u"GR");
    if (fields.isEmpty())
        return {};
    const auto field = [&fields](int i) { return i < fields.size() ? fields[i].toString() : QString(); };
    if (!fulldesc)
        return field(3);
    QString text = field(3) + QStringLiteral(" - Código ISO3166: ") + field(0) + QStringLiteral(" (") + field(1) + u','
        + field(2) + u')';
    if (isMemberState(d->country))
        text += QStringLiteral(" - País da União Europeia");
    return text;
}

GSEL_CountryFilterList cNIF::Countries() const
{
    return d->filter;
}

void cNIF::setCountries(GSEL_CountryFilterList filter)
{
    if (filter < GSEL_OnlyPT || filter > GSEL_Custom)
        return;
    if (filter != d->filter) {
        d->filter = filter;
        PropertyChanged(QStringLiteral("Countries"));
    }
    RefreshMe();
}

QString cNIF::CustomCountryList() const
{
    return d->customCountryList;
}

void cNIF::setCustomCountryList(const QString &codes)
{
    if (codes == d->customCountryList)
        return;
    d->customCountryList = codes;
    PropertyChanged(QStringLiteral("CustomCountryList"));
}

OleColor cNIF::BackColor() const
{
    return d->backColor;
}

void cNIF::setBackColor(OleColor color)
{
    if (color != d->backColor) {
        d->backColor = color;
        QPalette palette = this->palette();
        palette.setColor(QPalette::Window, platform::toQColor(color));
        setPalette(palette);
        PropertyChanged(QStringLiteral("BackColor"));
    }
    const Private::Guard alive(this);
    setCountryID(d->country);
    if (alive)
        RefreshMe();
}

QString cNIF::CountryID() const
{
    return d->country;
}

void cNIF::setCountryID(const QString &code)
{
    const QString value = code.isEmpty() ? QString(Portugal) : code;
    if (value == d->lastAppliedCountry)
        return;
    d->lastAppliedCountry = value;
    d->country = value.toUpper();
    d->cPicture->setPicture(mod_CTL::flagOn(*d->cPicture, d->country));
    d->announce();
    PropertyChanged(QStringLiteral("CountryID"));
    // The Portuguese limit holds for what the box already has; the cut is a change of the text.
    if (d->country == Portugal && d->nif->text().size() > PortugalLength)
        d->nif->setText(d->nif->text().first(PortugalLength));
}

bool cNIF::Required() const
{
    return d->required;
}

void cNIF::setRequired(bool required)
{
    if (required != d->required) {
        d->required = required;
        PropertyChanged(QStringLiteral("Required"));
    }
    RefreshMe();
}

bool cNIF::IsEmpty() const
{
    return trimBlanks(d->nif->text()).isEmpty();
}

bool cNIF::IsValid()
{
    const bool valid = nifValidator::CheckTaxNumber(d->nif->text(), nifValidator::CountryIndex(d->country));
    Q_EMIT Validated();
    return valid;
}

bool cNIF::IsAccepted() const
{
    return true;
}

bool cNIF::IsOK()
{
    const Private::Guard alive(this);
    const bool valid = IsValid();
    return valid && alive && IsAccepted() && !IsEmpty();
}

void cNIF::RefreshMe()
{
    const Private::Guard alive(this);
    QAction *ficha = d->popup->entry("mnu_ficha");
    if (IsEmpty()) {
        d->Shape1->setBorderColor(White);
        ficha->setEnabled(false);
        d->shownNumber.clear();
        if (!d->name.isEmpty()) {
            Q_EMIT Cleared();
            if (!alive)
                return;
        }
        d->name.clear();
        d->setStateColours(Black, White);
    } else {
        const bool valid = IsValid();
        if (!alive)
            return;
        if (valid && IsAccepted()) {
            ficha->setEnabled(true);
            d->showNumber();
            Q_EMIT NIFIndicated();
            if (!alive)
                return;
            GetNIFInformation();
            if (!alive)
                return;
            d->setStateColours(ValidText, White);
        } else {
            ficha->setEnabled(false);
            d->shownNumber.clear();
            d->name.clear();
            d->Shape1->setBorderColor(InvalidBack);
            d->setStateColours(White, InvalidBack);
        }
    }
    d->refreshTip();
    if (alive)
        d->announce();
}

void cNIF::ShowCountryList()
{
    const Private::Guard alive(this);
    if (d->filter == GSEL_OnlyPT) {
        if (d->country == Portugal)
            return;
        setCountryID(QString(Portugal));
        if (alive)
            RefreshMe();
        return;
    }
    setCursor(Qt::WaitCursor);
    // On the heap and guarded: the host may close the window (and the form with it) or
    // delete this control while the list is up.
    const QPointer<frmSelectCountry> form = new frmSelectCountry(window());
    form->setFilterMode(d->filter);
    form->setCustomList(d->customCountryList);
    form->RelistCountries();
    if (form && alive)
        platform::showModal(*form);
    const QString chosen = form ? form->Tag() : QString();
    delete form.data();
    if (!alive)
        return;
    if (!chosen.isEmpty()) {
        setCountryID(chosen);
        if (!alive)
            return;
    }
    RefreshMe();
    if (alive)
        unsetCursor();
}

QString cNIF::Value() const
{
    return d->country + d->nif->text();
}

void cNIF::setValue(const QString &value)
{
    const Private::Guard alive(this);
    const QString before = Value();
    const bool bareNumber = !value.isEmpty() && nifValidator::IsNumericFrom(value, 1, 1);
    if (value.isEmpty())
        setCountryID(QString(Portugal));
    else if (value.size() != PortugalLength && !bareNumber)
        setCountryID(value.first(std::min<qsizetype>(2, value.size())));
    if (!alive)
        return;
    if (Value() == value) {
        // The country alone made the new value: the same number is checked by its rules.
        if (before != value)
            RefreshMe();
        return;
    }
    if (bareNumber) {
        d->nif->setText(value);
    } else {
        setCountryID(value.first(std::min<qsizetype>(2, value.size())));
        if (!alive)
            return;
        d->nif->setText(value.size() > 2 ? value.sliced(2) : QString());
    }
    if (alive)
        RefreshMe();
}

bool cNIF::Enabled() const
{
    return d->nif->isEnabledTo(this);
}

void cNIF::setEnabled(bool enabled)
{
    if (enabled == Enabled())
        return;
    // The box's EnabledChange recolours it.
    d->nif->setEnabled(enabled);
}

QString cNIF::Information(const QString &varID)
{
    if (companion::KeyedStore *store = d->store()) {
        const QString stored = store->Read(d->storeKey(varID)).toString();
        if (!stored.isEmpty())
            return stored;
    }
    const auto record = d->records.constFind(Value());
    if (record != d->records.cend()) {
        const auto kept = record->constFind(varID);
        if (kept != record->cend())
            return *kept;
    }
    // The fetcher's answer counts only for the number it was about.
    return d->fetcherHoldsValue() ? d->fetchedField(varID) : QString();
}

void cNIF::setInformation(const QString &varID, const QString &value)
{
    const Private::Guard alive(this);
    const bool valid = IsValid();
    if (!alive || !valid)
        return;
    // A change is a change of what the record held: the declaration's value, else the
    // control's own.
    QHash<QString, QString> &record = d->records[Value()];
    companion::KeyedStore *store = d->store();
    const QString stored = store ? store->Read(d->storeKey(varID)).toString() : QString();
    const bool changed = (stored.isEmpty() ? record.value(varID) : stored) != value;
    record.insert(varID, value);
    // The fetcher keeps the data of the number it fetched; another number's values are
    // not written into them.
    if (d->fetcherHoldsValue() && d->grabber->GetField(varID) != value)
        d->grabber->SetField(varID, value);
    if (store && stored != value)
        store->Write(d->storeKey(varID), value);
    if (varID == QLatin1String("AUTO") || !changed)
        return;
    if (!value.isEmpty()) {
        Q_EMIT UpdatedInformation(varID);
        if (!alive)
            return;
    }
    if (varID == QLatin1String("nome")) {
        d->name = value;
        d->announce();
        Q_EMIT NameUpdated(value);
    }
}

void cNIF::GetNIFInformation()
{
    // A name already recorded needs no fetch, busy fetcher or not.
    const QString known = d->recordedName();
    if (!known.isEmpty()) {
        const Private::Guard alive(this);
        setNome(known);
        if (alive)
            d->fetchFinished();
        return;
    }
    if (d->grabber && d->grabber->IsBusy())
        return;
    if (platform::GetSetting(
            QStringLiteral("ZEL"), QStringLiteral("Config"), QStringLiteral("allowautonif"), QStringLiteral("1"))
        == QLatin1String("0"))
        return;
    if (d->grabber)
        d->grabber->Fetch(Value());
}

QString cNIF::Nome()
{
    return d->name.isEmpty() ? Information(QStringLiteral("nome")) : d->name;
}

void cNIF::setNome(const QString &name)
{
    if (name == d->name)
        return;
    const Private::Guard alive(this);
    const QString value = name;
    d->name = value;
    setInformation(QStringLiteral("nome"), value);
    if (!alive)
        return;
    d->refreshTip();
    if (!alive)
        return;
    d->announce();
    Q_EMIT NameUpdated(QString(d->name));
}

QString cNIF::Description()
{
    return d->name.isEmpty() ? Value() : d->name;
}

QObject *cNIF::IRSClass() const
{
    return d->declaration;
}

void cNIF::setIRSClass(QObject *declaration)
{
    auto *given = qobject_cast<companion::Declaration *>(declaration);
    if (given == d->declaration)
        return;
    // What the user confirmed belongs to the declaration it was confirmed in.
    d->declaration = given;
    d->records.clear();
}

bool cNIF::DisablePopupMenu() const
{
    return d->popupDisabled;
}

void cNIF::setDisablePopupMenu(bool disabled)
{
    if (disabled == d->popupDisabled)
        return;
    d->popupDisabled = disabled;
    PropertyChanged(QStringLiteral("DisablePopupMenu"));
}

bool cNIF::Locked() const
{
    return d->nif->isReadOnly();
}

void cNIF::setLocked(bool locked)
{
    if (locked == d->nif->isReadOnly())
        return;
    d->nif->setReadOnly(locked);
    if (locked) {
        d->lockTint = true;
        d->applyColours();
        d->announce();
    } else {
        RefreshMe();
    }
}

void cNIF::PopupContextMenu()
{
    d->popup->popup();
}

void cNIF::InitProperties()
{
    setCountryID(QString(Portugal));
    d->filter = GSEL_OnlyPT;
}

void cNIF::ReadProperties(const PropertyBag &bag)
{
    setDisablePopupMenu(readBoolean(bag, QStringLiteral("DisablePopupMenu"), false));
    const QString saved = bag.ReadProperty(QStringLiteral("Country"), QString(Portugal)).toString();
    d->required = readBoolean(bag, QStringLiteral("Required"), false);
    d->filter
        = GSEL_CountryFilterList(readLong(bag, QStringLiteral("Countries"), GSEL_OnlyPT, GSEL_OnlyPT, GSEL_Custom));
    d->customCountryList = bag.ReadProperty(QStringLiteral("CustomCountryList"), QString()).toString();
    // The refresh raises events, in which the host may delete the control.
    const Private::Guard alive(this);
    setBackColor(readColor(bag, QStringLiteral("BackColor"), White));
    // "Country" is what a saved control holds; a "CountryID" from the container wins.
    if (alive)
        setCountryID(bag.ReadProperty(QStringLiteral("CountryID"), saved).toString());
}

void cNIF::WriteProperties(PropertyBag &bag)
{
    bag.WriteProperty(QStringLiteral("Countries"), int(d->filter));
    bag.WriteProperty(QStringLiteral("CustomCountryList"), d->customCountryList);
    bag.WriteProperty(QStringLiteral("Required"), d->required, false);
    bag.WriteProperty(QStringLiteral("BackColor"), d->backColor, White);
    bag.WriteProperty(QStringLiteral("Country"), d->country, QString(Portugal));
    bag.WriteProperty(QStringLiteral("DisablePopupMenu"), d->popupDisabled, false);
}

void cNIF::Terminate()
{
    d->uncount();
    d->declaration = nullptr;
    // The fetcher may be the caller (Release from one of its events); it goes with the
    // control, silenced now.
    if (d->grabber) {
        d->grabber->disconnect(this);
        d->grabber = nullptr;
    }
    if (d->tip) {
        d->tip->DestroyTip();
        delete d->tip;
        d->tip = nullptr;
    }
}

ZELCTL_REGISTER_CLASS(cNIF)

} // namespace zelctl

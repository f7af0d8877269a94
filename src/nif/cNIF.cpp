#include "cNIF.h"

#include "NifPopupMenu.h"
#include "ShapeWidget.h"
#include "common/modFuncs.h"
#include "companion/Declaration.h"
#include "companion/NIFGrabber.h"
#include "frmEditNIF.h"
#include "platform/ModalPresenter.h"
#include "platform/Settings.h"
#include "platform/WindowHandles.h"
#include "selection/PictureBox.h"
#include "selection/frmSelectCountry.h"
#include "selection/mod_CTL.h"
#include "tips/clsBalloonTip.h"
#include "validation/nifValidator.h"

#include <QAction>
#include <QContextMenuEvent>
#include <QLineEdit>
#include <QMouseEvent>
#include <QPointer>
#include <QStringTokenizer>

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

// The member states take their tax code "EL" for Greece; the flags and the country file
// know it by its ISO code.
QString isoCode(const QString &country)
{
    return country == QLatin1String("EL") ? QStringLiteral("GR") : country;
}

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

// A saved Boolean may be a real one or the text "True"/"False" (or -1/0).
bool readBoolean(const QVariant &value, bool fallback)
{
    if (value.typeId() == QMetaType::QString) {
        const QString text = value.toString().trimmed();
        if (text.compare(u"true", Qt::CaseInsensitive) == 0 || text == QLatin1String("-1")
            || text == QLatin1String("1"))
            return true;
        if (text.compare(u"false", Qt::CaseInsensitive) == 0 || text == QLatin1String("0"))
            return false;
        return fallback;
    }
    return value.canConvert<bool>() ? value.toBool() : fallback;
}

} // namespace

class cNIF::Private
{
public:
    explicit Private(cNIF *q);

    void textChanged();
    bool switchTypedCountry();
    void applyColours();
    void setStateColours(OleColor fore, OleColor back);
    void refreshTip();
    QString tipText();
    companion::KeyedStore *store() const;
    QString storeKey(const QString &varID) const { return q->Value() + u'.' + varID; }
    // Whether the fetcher's last answer is about the number in the box.
    bool fetcherHoldsValue() const;
    void fetchStarting();
    void informationReceived(const QString &id);
    void fetchFinished();
    void layout();
    void uncount();
    void openRecordForm();

    cNIF *q;
    QLineEdit *nif;
    PictureBox *cPicture;
    ShapeWidget *Shape1;
    ShapeWidget *Shape2;
    QPointer<companion::NIFGrabber> grabber;
    QPointer<companion::Declaration> declaration;
    clsBalloonTip *tip = nullptr;
    NifPopupMenu *popup = nullptr;

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
    // The box lies inside its status mark, which lies inside the frame.
    Shape2->lower();
    Shape1->stackUnder(nif);
    QObject::connect(nif, &QLineEdit::textChanged, owner, [this] { textChanged(); });

    if (grabber) {
        QObject::connect(grabber, &companion::NIFGrabber::Starting, owner, [this] { fetchStarting(); });
        QObject::connect(grabber, &companion::NIFGrabber::ReceivedInformation, owner,
            [this](const QString &id) { informationReceived(id); });
        QObject::connect(grabber, &companion::NIFGrabber::Finished, owner, [this] { fetchFinished(); });
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
    frmEditNIF form(q->window());
    form.SetNIFControl(q);
    platform::showModal(form);
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

bool cNIF::Private::switchTypedCountry()
{
    const QString text = nif->text();
    if (text.size() < 3)
        return false;
    const QString typed = text.first(2).toUpper();
    if (nifValidator::IsNumericFrom(typed, 1, 0) || !isMemberState(typed) || typed == country)
        return false;
    // The number is taken before the new country applies, so the Portuguese length cut
    // cannot eat into it.
    const QString number = text.sliced(2);
    {
        const QSignalBlocker quiet(nif);
        q->setCountryID(typed);
    }
    nif->setText(number);
    nif->end(false);
    return true;
}

void cNIF::Private::textChanged()
{
    if (switchTypedCountry())
        return;
    // The host may delete the control in any of its events.
    const QPointer<cNIF> alive(q);
    q->RefreshMe();
    if (alive && nif->text().isEmpty())
        Q_EMIT q->Cleared();
    if (alive)
        Q_EMIT q->Changed();
}

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

companion::KeyedStore *cNIF::Private::store() const
{
    return declaration ? &declaration->DeclarationData().NifInfoStore() : nullptr;
}

bool cNIF::Private::fetcherHoldsValue() const
{
    return grabber && grabber->GetField(QStringLiteral("ID")) == q->Value();
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
    const QPointer<cNIF> alive(q);
    for (const FetchedField &field : FetchedFields) {
        q->setInformation(QString::fromUtf16(field.id), grabber->GetField(QString::fromUtf16(field.key)));
        if (!alive || !grabber)
            return;
    }
    q->setNome(grabber->HolderName());
    if (alive)
        refreshTip();
}

void cNIF::Private::fetchFinished()
{
    Shape1->setBorderColor(q->Nome().isEmpty() ? White : NameFound);
    Q_EMIT q->DataFinished();
}

QString cNIF::Private::tipText()
{
    // Checked without IsValid: building a tip raises no Validated for the host to act on.
    if (q->IsEmpty() || name.isEmpty()
        || !nifValidator::CheckTaxNumber(nif->text(), nifValidator::CountryIndex(country)))
        return {};
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
    const QString text = tipText();
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
            && d->cPicture->rect().contains(mouse->position().toPoint()))
            ShowCountryList();
        break;
    }
    case QEvent::ContextMenu:
        // The control's own menu replaces the box's, for the right button and the menu key.
        PopupContextMenu();
        return true;
    case QEvent::FocusIn:
        if (watched == d->nif)
            d->refreshTip();
        break;
    case QEvent::KeyPress:
        if (watched == d->nif && d->popup->handleShortcut(*static_cast<QKeyEvent *>(event)))
            return true;
        break;
    default:
        break;
    }
    return UserControl::eventFilter(watched, event);
}

QString cNIF::CountryName(bool fulldesc) const
{
    if (d->country == Portugal)
        return QStringLiteral("Portugal");
    const QString code = isoCode(d->country);
    const QString file = modFuncs::ReadWholeFile(modFuncs::GetDataPath() + QStringLiteral("iso3166.txt"), true);
    for (const QStringView line : QStringTokenizer(file, u"\r\n")) {
        const QList<QStringView> fields = line.split(u'\t');
        if (fields.size() < 2 || fields[1] != code)
            continue;
        const auto field = [&fields](int i) { return i < fields.size() ? fields[i].toString() : QString(); };
        if (!fulldesc)
            return field(3);
        QString text = field(3) + QStringLiteral(" - Código ISO3166: ") + field(0) + QStringLiteral(" (") + field(1)
            + u',' + field(2) + u')';
        if (isMemberState(d->country))
            text += QStringLiteral(" - País da União Europeia");
        return text;
    }
    return {};
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
    setCountryID(d->country);
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
    if (d->country == Portugal) {
        if (d->nif->text().size() > PortugalLength) {
            // The cut raises Changed, in which the host may delete the control.
            const QPointer<cNIF> alive(this);
            d->nif->setText(d->nif->text().first(PortugalLength));
            if (!alive)
                return;
        }
        d->nif->setMaxLength(PortugalLength);
    } else {
        d->nif->setMaxLength(32767);
    }
    d->cPicture->setPicture(mod_CTL::flagOn(*d->cPicture, isoCode(d->country)));
    PropertyChanged(QStringLiteral("CountryID"));
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
    const QPointer<cNIF> alive(this);
    const bool valid = IsValid();
    return valid && alive && IsAccepted() && !IsEmpty();
}

void cNIF::RefreshMe()
{
    // The host may delete the control in any of the events raised here.
    const QPointer<cNIF> alive(this);
    if (IsEmpty()) {
        d->Shape1->setBorderColor(White);
        if (!d->name.isEmpty())
            Q_EMIT Cleared();
        if (!alive)
            return;
        d->name.clear();
        d->setStateColours(Black, White);
    } else if (const bool valid = IsValid(); !alive) {
        return;
    } else if (valid && IsAccepted()) {
        d->popup->entry("mnu_ficha")->setEnabled(true);
        Q_EMIT NIFIndicated();
        if (alive)
            GetNIFInformation();
        if (!alive)
            return;
        d->setStateColours(ValidText, White);
    } else {
        d->popup->entry("mnu_ficha")->setEnabled(false);
        d->name.clear();
        d->Shape1->setBorderColor(InvalidBack);
        d->setStateColours(White, InvalidBack);
    }
    d->refreshTip();
}

void cNIF::ShowCountryList()
{
    if (d->filter == GSEL_OnlyPT) {
        setCountryID(QString(Portugal));
        return;
    }
    setCursor(Qt::WaitCursor);
    frmSelectCountry form(window());
    form.setFilterMode(d->filter);
    form.setCustomList(d->customCountryList);
    form.RelistCountries();
    // The host may delete the control while the form is open.
    const QPointer<cNIF> alive(this);
    platform::showModal(form);
    const QString chosen = form.Tag();
    form.Unload();
    if (!alive)
        return;
    if (!chosen.isEmpty())
        setCountryID(chosen);
    if (!alive)
        return;
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
    const bool bareNumber = !value.isEmpty() && nifValidator::IsNumericFrom(value, 1, 1);
    // Each step may raise events in which the host deletes the control.
    const QPointer<cNIF> alive(this);
    if (value.isEmpty())
        setCountryID(QString(Portugal));
    else if (value.size() != PortugalLength && !bareNumber)
        setCountryID(value.first(std::min<qsizetype>(2, value.size())));
    if (!alive || Value() == value)
        return;
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
    return d->nif->isEnabled();
}

void cNIF::setEnabled(bool enabled)
{
    if (enabled == d->nif->isEnabled())
        return;
    d->nif->setEnabled(enabled);
    // Enabling brings back the colour of the number's state, not plain white, so the white
    // text of an invalid number stays readable.
    d->applyColours();
}

QString cNIF::Information(const QString &varID)
{
    if (companion::KeyedStore *store = d->store()) {
        const QString stored = store->Read(d->storeKey(varID)).toString();
        if (!stored.isEmpty())
            return stored;
    }
    // The fetcher's answer counts only for the number it was about.
    if (!d->fetcherHoldsValue())
        return {};
    const QString answer = d->grabber->GetField(varID.toUpper());
    if (!answer.isEmpty())
        return answer;
    for (const FetchedField &field : FetchedFields) {
        if (varID == QStringView(field.id))
            return d->grabber->GetField(QString::fromUtf16(field.key));
    }
    return {};
}

void cNIF::setInformation(const QString &varID, const QString &value)
{
    // IsValid raises Validated, in which the host may delete the control.
    const QPointer<cNIF> alive(this);
    if (!IsValid() || !alive)
        return;
    bool changed = false;
    // The fetcher keeps the data of the number it fetched; another number's values are
    // not written into them.
    if (d->fetcherHoldsValue() && d->grabber->GetField(varID) != value) {
        d->grabber->SetField(varID, value);
        changed = true;
    }
    if (companion::KeyedStore *store = d->store()) {
        const QString key = d->storeKey(varID);
        if (store->Read(key).toString() != value) {
            store->Write(key, value);
            changed = true;
        }
    }
    if (varID == QLatin1String("AUTO") || !changed)
        return;
    if (!value.isEmpty())
        Q_EMIT UpdatedInformation(varID);
    if (alive && varID == QLatin1String("nome")) {
        d->name = value;
        Q_EMIT NameUpdated(value);
    }
}

void cNIF::GetNIFInformation()
{
    if (d->grabber && d->grabber->IsBusy())
        return;
    if (companion::KeyedStore *store = d->store()) {
        const QString stored = store->Read(d->storeKey(QStringLiteral("nome"))).toString();
        if (!stored.isEmpty()) {
            const QPointer<cNIF> alive(this);
            setNome(stored);
            if (alive)
                d->fetchFinished();
            return;
        }
    }
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
    d->name = name;
    const QPointer<cNIF> alive(this);
    setInformation(QStringLiteral("nome"), name);
    if (!alive)
        return;
    d->refreshTip();
    Q_EMIT NameUpdated(d->name);
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
    d->declaration = qobject_cast<companion::Declaration *>(declaration);
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
    setDisablePopupMenu(readBoolean(bag.ReadProperty(QStringLiteral("DisablePopupMenu"), false), false));
    const QString saved = bag.ReadProperty(QStringLiteral("Country"), QString(Portugal)).toString();
    d->required = readBoolean(bag.ReadProperty(QStringLiteral("Required"), QStringLiteral("False")), false);
    bool known = false;
    const int filter = bag.ReadProperty(QStringLiteral("Countries"), 0).toInt(&known);
    if (known && filter >= GSEL_OnlyPT && filter <= GSEL_Custom)
        d->filter = GSEL_CountryFilterList(filter);
    d->customCountryList = bag.ReadProperty(QStringLiteral("CustomCountryList"), QString()).toString();
    bool isColour = false;
    const OleColor colour = bag.ReadProperty(QStringLiteral("BackColor"), White).toUInt(&isColour);
    setBackColor(isColour ? colour : White);
    // "Country" is what a saved control holds; a "CountryID" from the container wins.
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
    if (d->grabber) {
        d->grabber->disconnect(this);
        delete d->grabber;
    }
    if (d->tip) {
        d->tip->DestroyTip();
        delete d->tip;
        d->tip = nullptr;
    }
}

ZELCTL_REGISTER_CLASS(cNIF)

} // namespace zelctl

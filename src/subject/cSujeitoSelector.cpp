#include "cSujeitoSelector.h"

#include "ListMenuPresenter.h"
#include "common/modFuncs.h"
#include "companion/CommandButton.h"
#include "companion/CommandButtonArray.h"
#include "companion/Declaration.h"
#include "frame/PropertyReaders.h"
#include "platform/Accessibility.h"
#include "platform/Twips.h"

#include <QAction>
#include <QFrame>
#include <QMenu>
#include <QPointer>

#include <algorithm>
#include <array>
#include <limits>
#include <utility>

namespace zelctl {

using platform::pixelsFromTwips;

namespace {

constexpr QStringView kinds = u"ABDSFCH";
constexpr int kindCount = 7;
static_assert(kinds.size() == kindCount);
constexpr int buttonA = 0;
constexpr int buttonB = 1;
constexpr int buttonC = 5;

// Twips.
constexpr int releasedWidth = 500;
constexpr int pressedWidth = 2500;
constexpr int buttonHeight = 375;
constexpr int underlineGap = 30;
constexpr int heightMargin = 60;

const QString defaultPossible = QStringLiteral("ABD");

struct KindTexts
{
    const char16_t *title;
    const char16_t *toolTip;
};

constexpr std::array<KindTexts, kindCount> texts = { {
    { u"Sujeito A", u"Sujeito A" },
    { u"Sujeito B", u"Sujeito B" },
    { u"Dependente", u"Dependente" },
    { u"Ascendente", u"Ascendente" },
    { u"Falecido", u"Falecido" },
    { u"Agregado", u"Sujeitos A e B" },
    { u"Herança", u"Herança" },
} };

// What a screen reader calls each kind's button, where no holder's name is known.
constexpr std::array<const char16_t *, kindCount> spokenKinds = {
    u"Sujeito passivo A",
    u"Sujeito passivo B",
    u"Dependente",
    u"Ascendente",
    u"Falecido",
    u"Agregado",
    u"Herança",
};

// Kinds with several subjects, chosen from a list.
bool isListed(QChar kind)
{
    return kind == u'D' || kind == u'S' || kind == u'H';
}

QString subjectId(QChar kind, int index)
{
    return index >= 1 ? QString(kind) + QString::number(index) : QString(kind);
}

QString normalisedPossible(const QString &value)
{
    if (value.isEmpty())
        return defaultPossible;
    if (value == QStringLiteral("*"))
        return kinds.toString();
    QString result;
    for (const QChar kind : kinds) {
        if (value.contains(kind) && (kind != u'C' || value.contains(u'B')))
            result += kind;
    }
    return result;
}

// The button of the kind whose letter starts the value, or -1.
int buttonOf(const QVariant &value)
{
    const QString text = value.toString();
    return text.isEmpty() ? -1 : int(kinds.indexOf(text.front().toUpper()));
}

} // namespace

class cSujeitoSelector::Private
{
public:
    explicit Private(cSujeitoSelector *q);

    CommandButton *button(int i) const { return (*sujeito_selector)(i); }
    int pressedButton() const;
    QChar kind() const;
    companion::DeclarationData *data() const;
    QString subjectName(const QString &id) const;
    void selectKind(const QString &value);
    void setIndex(qint16 value);
    void refresh();
    void nameButton(int i, int pressed);
    void click(int i);
    void chooseFromList(int i);
    QAction *listItem(int k);

    cSujeitoSelector *q;
    CommandButtonArray *sujeito_selector;
    QFrame *Line1;
    QMenu *mnu_listagem;
    QList<QAction *> mnu_list;
    QString possible = defaultPossible;
    qint16 index = 0;
    bool canSelectNone = false;
    QString lastClickedTag;
    QPointer<companion::Declaration> declaration;
};

cSujeitoSelector::Private::Private(cSujeitoSelector *owner)
    : q(owner)
    , sujeito_selector(new CommandButtonArray(QStringLiteral("sujeito_selector"), owner, kindCount))
    , Line1(new QFrame(owner))
    , mnu_listagem(new QMenu(QStringLiteral("Contribuintes"), owner))
{
    for (int i = 0; i < kindCount; ++i) {
        CommandButton *b = button(i);
        const QString letter(kinds[i]);
        b->setToggle(true);
        b->setTag(letter);
        b->setToolTip(QString::fromUtf16(texts[size_t(i)].toolTip));
        b->setPicture(Picture::fromFile(QStringLiteral(":/zelctl/subject/") + letter + QStringLiteral(".png")));
        b->Move(0, 0, releasedWidth, buttonHeight);
    }
    QObject::connect(sujeito_selector, &CommandButtonArray::Click, owner, [this](int i) { click(i); });

    Line1->setObjectName(QStringLiteral("Line1"));
    Line1->setFrameShape(QFrame::HLine);
    Line1->setFrameShadow(QFrame::Plain);
    Line1->hide();

    mnu_listagem->setObjectName(QStringLiteral("mnu_listagem"));
    listItem(0);
}

int cSujeitoSelector::Private::pressedButton() const
{
    for (int i = 0; i < kindCount; ++i) {
        if (button(i)->Value())
            return i;
    }
    return -1;
}

QChar cSujeitoSelector::Private::kind() const
{
    const int pressed = pressedButton();
    return pressed < 0 ? QChar() : kinds[pressed];
}

companion::DeclarationData *cSujeitoSelector::Private::data() const
{
    return declaration ? &declaration->DeclarationData() : nullptr;
}

QString cSujeitoSelector::Private::subjectName(const QString &id) const
{
    companion::DeclarationData *declared = data();
    if (!declared || id.isEmpty())
        return {};
    // Ascendants are kept by number only; their names live in the NIF information.
    if (id.front() == u'S') {
        const QString nif = declared->SubjectNif(id);
        return nif.isEmpty() ? QString() : declared->NifInfoStore().Read(nif + QStringLiteral(".nome")).toString();
    }
    return declared->SubjectName(id);
}

void cSujeitoSelector::Private::selectKind(const QString &value)
{
    // An empty value means A, as looking "" up in the kinds finds it first.
    const int chosen = value.isEmpty() ? buttonA : int(kinds.indexOf(value.front()));
    for (int i = 0; i < kindCount; ++i) {
        if (button(i)->Value() != (i == chosen))
            button(i)->setValue(i == chosen);
    }
    // Forgotten before the refresh, so the title carries no index of the previous kind.
    index = 0;
    refresh();
}

void cSujeitoSelector::Private::setIndex(qint16 value)
{
    if (isListed(kind()))
        index = value;
    refresh();
}

void cSujeitoSelector::Private::refresh()
{
    const int pressed = pressedButton();
    QString title;
    if (pressed >= 0) {
        title = modFuncs::FormatShortName(subjectName(subjectId(kinds[pressed], index)));
        if (title.isEmpty()) {
            title = QString::fromUtf16(texts[size_t(pressed)].title);
            if (index > 0)
                title += QLatin1Char(' ') + QString::number(index);
        }
    }

    int left = 0;
    CommandButton *focusTarget = nullptr;
    for (int i = 0; i < kindCount; ++i) {
        CommandButton *b = button(i);
        if (!possible.contains(kinds[i])) {
            b->hide();
            b->setEnabled(false);
            continue;
        }
        const int width = i == pressed ? pressedWidth : releasedWidth;
        b->setEnabled(true);
        b->Move(left, 0, width, b->Height());
        b->setCaption(i == pressed ? title : QString());
        nameButton(i, pressed);
        b->show();
        left += width;
        if (!focusTarget || i == pressed)
            focusTarget = b;
    }
    // Focus given to the control (a label's buddy, a host's setFocus) lands on the pressed
    // button, as on the checked one of a group of radio buttons.
    q->setFocusProxy(focusTarget);

    if (pressed >= 0 && !button(pressed)->isHidden()) {
        const CommandButton *b = button(pressed);
        Line1->setGeometry(
            pixelsFromTwips(b->Left()), pixelsFromTwips(b->Height() + underlineGap), pixelsFromTwips(pressedWidth), 1);
        Line1->show();
    } else {
        Line1->hide();
    }
    q->updateGeometry();
}

void cSujeitoSelector::Private::nameButton(int i, int pressed)
{
    // The holder's name, as the pressed button shows it, says most; the kind, then, is the
    // description. A button of a listed kind names its subject only once one is chosen.
    const QChar kind = kinds[i];
    QString spoken = QString::fromUtf16(spokenKinds[size_t(i)]);
    QString holder;
    if (i == pressed) {
        if (index > 0)
            spoken += QLatin1Char(' ') + QString::number(index);
        holder = modFuncs::FormatShortName(subjectName(subjectId(kind, index)));
    } else if (!isListed(kind) && i != buttonC) {
        holder = modFuncs::FormatShortName(subjectName(QString(kind)));
    }
    // "Agregado" says whom it holds: "Sujeitos A e B".
    const QString whom = i == buttonC ? QString::fromUtf16(texts[size_t(i)].toolTip) : QString();
    if (holder.isEmpty())
        platform::setAccessibleTexts(*button(i), spoken, whom);
    else
        platform::setAccessibleTexts(*button(i), holder, spoken);
}

void cSujeitoSelector::Private::click(int i)
{
    CommandButton *clicked = button(i);
    Line1->hide();

    // A toggle button has already flipped when its click arrives: one released now was
    // pressed when the user clicked it.
    const bool wasPressed = !clicked->Value();
    QChar before;
    for (int j = 0; j < kindCount && before.isNull(); ++j) {
        if (j == i ? wasPressed : button(j)->Value())
            before = kinds[j];
    }

    // The host may delete the control in any of its events, or while its list is open.
    const QPointer<cSujeitoSelector> alive(q);
    if (canSelectNone && wasPressed && clicked->Tag() == lastClickedTag) {
        lastClickedTag.clear();
        q->setSelectedSujeito(QString());
        if (alive)
            Q_EMIT q->Changed();
        return;
    }
    lastClickedTag = clicked->Tag();
    Q_EMIT q->Clicked();
    if (!alive)
        return;

    if (clicked->Value()) {
        for (int j = 0; j < kindCount; ++j) {
            // "Agregado" is chosen together with taxpayer B.
            if (j == i || (i == buttonC && j == buttonB))
                continue;
            button(j)->setCaption(QString());
            button(j)->setValue(false);
        }
        const QChar now = kind();
        // An index belongs to the kind it was chosen for: another kind starts without one.
        if (index > 0 && (!isListed(now) || now != before))
            index = 0;
        refresh();
        if (isListed(now) && index == 0) {
            chooseFromList(pressedButton());
            if (!alive)
                return;
            if (index == 0)
                setIndex(1);
        }
        Q_EMIT q->Changed();
    } else {
        // Only the second-click rule above may leave nothing chosen.
        if (pressedButton() < 0)
            clicked->setValue(true);
        refresh();
        Q_EMIT q->Changed();
    }
}

QAction *cSujeitoSelector::Private::listItem(int k)
{
    while (mnu_list.size() <= k) {
        auto *item = mnu_listagem->addAction(QString());
        item->setObjectName(QStringLiteral("mnu_list"));
        item->setProperty("Index", int(mnu_list.size()));
        item->setCheckable(mnu_list.size() > 0);
        mnu_list.append(item);
    }
    return mnu_list.at(k);
}

void cSujeitoSelector::Private::chooseFromList(int pressed)
{
    const QChar listed = kinds[pressed];
    companion::DeclarationData *declared = data();
    int count = 0;
    if (declared) {
        count = listed == u'D' ? declared->Dependants() : listed == u'S' ? declared->Ascendants() : declared->Estates();
    }
    // The index is a 16-bit Integer on the interface.
    count = std::min(count, int(std::numeric_limits<qint16>::max()));

    if (count < 2) {
        setIndex(1);
        if (declared) {
            const QString title = declared->GetSujeitoTitle(subjectId(listed, 1));
            if (!title.isEmpty())
                button(pressed)->setCaption(title);
        }
        return;
    }

    QString caption;
    QString heading;
    switch (listed.unicode()) {
    case u'D':
        caption = QStringLiteral("Dependente ");
        heading = QStringLiteral("=== Listagem de DEPENDENTES ===");
        break;
    case u'S':
        caption = QStringLiteral("Ascendente ");
        heading = QStringLiteral("=== Listagem de ASCENDENTES ===");
        break;
    default:
        caption = QStringLiteral("Herança ");
        heading = QStringLiteral("=== Listagem das HERANÇAS INDIVISAS ===");
        break;
    }
    for (int k = 1; k <= count; ++k) {
        QAction *item = listItem(k);
        const QString id = subjectId(listed, k);
        const QString name = subjectName(id);
        const QString text = name.isEmpty() ? caption + QString::number(k)
                                            : id + QStringLiteral(" - ") + modFuncs::FormatShortName(name);
        // A name's "&" is text, not an access key.
        item->setText(QString(text).replace(QLatin1Char('&'), QStringLiteral("&&")));
        item->setChecked(k == index);
        item->setVisible(true);
        item->setEnabled(true);
    }
    for (int k = count + 1; k < mnu_list.size(); ++k)
        mnu_list.at(k)->setVisible(false);
    // The heading names the list; it is not a choice.
    listItem(0)->setText(heading);
    listItem(0)->setEnabled(false);

    const CommandButton *b = button(pressed);
    const QPointer<cSujeitoSelector> alive(q);
    QAction *chosen = subject::showListMenu(*mnu_listagem, q->mapToGlobal(QPoint(b->x(), b->height())));
    if (!alive)
        return;
    const int k = chosen ? int(mnu_list.indexOf(chosen)) : -1;
    if (k >= 1 && k <= count) {
        index = qint16(k);
        refresh();
        Q_EMIT q->Changed();
    }
}

cSujeitoSelector::cSujeitoSelector(QWidget *parent)
    : UserControl(parent)
    , d(std::make_unique<Private>(this))
{
    setFixedHeight(pixelsFromTwips(buttonHeight + heightMargin));
    setFocusPolicy(Qt::TabFocus);
    d->refresh();
}

cSujeitoSelector::~cSujeitoSelector() = default;

QString cSujeitoSelector::Possible() const
{
    return d->possible;
}

void cSujeitoSelector::setPossible(const QString &value)
{
    const QString normalised = normalisedPossible(value);
    if (normalised == d->possible)
        return;
    d->possible = normalised;
    d->refresh();
    PropertyChanged(QStringLiteral("Possible"));
}

void cSujeitoSelector::setPossible(QString &value)
{
    if (value.isEmpty())
        value = defaultPossible;
    setPossible(std::as_const(value));
}

QString cSujeitoSelector::SujeitoValueType() const
{
    const QChar kind = d->kind();
    return kind.isNull() ? QString() : QString(kind);
}

void cSujeitoSelector::setSujeitoValueType(const QString &value)
{
    d->selectKind(value);
}

QString cSujeitoSelector::SelectedSujeito() const
{
    const QChar kind = d->kind();
    if (kind.isNull())
        return {};
    return isListed(kind) ? subjectId(kind, d->index) : QString(kind);
}

void cSujeitoSelector::setSelectedSujeito(const QString &value)
{
    if (value.isEmpty() && d->canSelectNone) {
        for (int i = 0; i < kindCount; ++i) {
            CommandButton *b = d->button(i);
            b->setValue(false);
            if (!b->Caption().isEmpty())
                b->setCaption(QString());
        }
    } else {
        d->selectKind(value);
    }
    bool numeric = true;
    const qint16 index = value.size() < 2 ? 0 : value.mid(1).trimmed().toShort(&numeric);
    // Text that is no 16-bit number leaves the index as it was.
    if (numeric)
        d->setIndex(index);
    else
        d->refresh();
}

qint16 cSujeitoSelector::SelectedSujeitoIndex() const
{
    return d->index;
}

void cSujeitoSelector::setSelectedSujeitoIndex(qint16 index)
{
    d->setIndex(index);
}

QString cSujeitoSelector::SelectedNIF(const QString &specificsujeito) const
{
    companion::DeclarationData *declared = d->data();
    if (!declared)
        return {};
    return declared->SubjectNif(specificsujeito.isEmpty() ? SelectedSujeito() : specificsujeito);
}

void cSujeitoSelector::setSelectedNIF(const QString &value)
{
    // The number follows from the chosen subject; hosts that write it are not refused.
    Q_UNUSED(value)
}

QObject *cSujeitoSelector::IRSClass() const
{
    return d->declaration.data();
}

void cSujeitoSelector::setIRSClass(QObject *declaration)
{
    d->declaration = qobject_cast<companion::Declaration *>(declaration);
    d->refresh();
}

bool cSujeitoSelector::CanSelectNone() const
{
    return d->canSelectNone;
}

void cSujeitoSelector::setCanSelectNone(bool canSelectNone)
{
    if (d->canSelectNone == canSelectNone)
        return;
    d->canSelectNone = canSelectNone;
    PropertyChanged(QStringLiteral("CanSelectNone"));
}

void cSujeitoSelector::RefreshButtonCaption()
{
    d->refresh();
}

Picture cSujeitoSelector::ImageFile(const QVariant &SujeitoID) const
{
    const int i = buttonOf(SujeitoID);
    return i < 0 ? Picture() : d->button(i)->Picture();
}

void cSujeitoSelector::setImageFile(const QVariant &SujeitoID, const Picture &picture)
{
    if (const int i = buttonOf(SujeitoID); i >= 0)
        d->button(i)->setPicture(picture);
}

QSize cSujeitoSelector::sizeHint() const
{
    int width = 0;
    for (int i = 0; i < kindCount; ++i) {
        if (!d->button(i)->isHidden())
            width = std::max(width, d->button(i)->geometry().right() + 1);
    }
    return { width, pixelsFromTwips(d->button(0)->Height() + heightMargin) };
}

void cSujeitoSelector::ReadProperties(const PropertyBag &bag)
{
    // Kept as the form stored it.
    d->possible = bag.ReadProperty(QStringLiteral("Possible"), defaultPossible).toString();
    d->canSelectNone = readBoolean(bag, QStringLiteral("CanSelectNone"), false);
    d->refresh();
}

void cSujeitoSelector::WriteProperties(PropertyBag &bag)
{
    bag.WriteProperty(QStringLiteral("Possible"), d->possible, defaultPossible);
    bag.WriteProperty(QStringLiteral("CanSelectNone"), d->canSelectNone, false);
}

void cSujeitoSelector::Terminate()
{
    d->declaration.clear();
}

void cSujeitoSelector::resizeEvent(QResizeEvent *event)
{
    UserControl::resizeEvent(event);
    const int wanted = pixelsFromTwips(d->button(0)->Height() + heightMargin);
    if (height() != wanted)
        setFixedHeight(wanted);
    d->refresh();
}

ZELCTL_REGISTER_CLASS(cSujeitoSelector)

} // namespace zelctl

#include "frmEditNIF.h"

#include "cNIF.h"
#include "companion/CommandButton.h"
#include "companion/CommandButtonArray.h"
#include "companion/FieldCollection.h"
#include "platform/Twips.h"

#include <QComboBox>
#include <QDate>
#include <QEvent>
#include <QFrame>
#include <QGridLayout>
#include <QHBoxLayout>
#include <QLabel>
#include <QLineEdit>
#include <QPointer>
#include <QRegularExpression>
#include <QSet>
#include <QVBoxLayout>

namespace zelctl {

namespace {

enum Button { Apply = 0, Ok = 1, Cancel = 2, PublicInformation = 3 };

enum class RowKind { Text, ReadOnlyText, List, Number };

struct RowSetup
{
    const char16_t *id;
    const char16_t *label;
    RowKind kind;
};

// The kinds of the ids the form knows; any other id gets a text box labelled with itself.
constexpr RowSetup KnownRows[] = {
    { u"servico", u"Código SF:", RowKind::Text },
    { u"estadocivil", u"Estado civil:", RowKind::List },
    { u"conjuge", u"NIF conjuge:", RowKind::Number },
    { u"nib", u"NIB:", RowKind::Text },
    { u"email", u"Email:", RowKind::Text },
    { u"telefone", u"Telefone:", RowKind::Text },
    { u"telemovel", u"Telemóvel:", RowKind::Text },
    { u"datanascimento", u"Data nascimento:", RowKind::Text },
    { u"status", u"Status:", RowKind::ReadOnlyText },
};

// The record's rows in order; a repeated id is shown once, at its first place.
constexpr const char16_t *RowIds[] = { u"servico", u"estadocivil", u"conjuge", u"nib", u"email", u"datanascimento",
    u"territorio", u"telefone", u"email", u"datanascimento", u"status" };

constexpr auto MaritalStates = "Solteiro,Casado,Unido de facto,Divorciado,Separado de facto,Viúvo";
constexpr int Married = 1;
constexpr int CivilUnion = 2;
constexpr int TaxOfficeLength = 4;
constexpr int TaxOfficeWidthTwips = 2000;

RowSetup setupOf(const QString &id)
{
    for (const RowSetup &row : KnownRows) {
        if (id == QStringView(row.id))
            return row;
    }
    return { nullptr, nullptr, RowKind::Text };
}

QString tagOf(const QObject *input)
{
    return input->property("Tag").toString();
}

// A two-digit year is the latest year with those digits that is not after this one: a birth
// date lies in the past, so in 2026 "80" is 1980, "26" is 2026 and "27" is 1927.
int fullYear(int twoDigits)
{
    const int thisYear = QDate::currentDate().year();
    const int year = thisYear / 100 * 100 + twoDigits;
    return year > thisYear ? year - 100 : year;
}

// A birth date as a Portuguese user types it: year first ("1980-5-7", "1980/05/07",
// "19800507") or day first ("7/5/1980", "7-5-80", "7.5.80"); invalid when it is none of
// them.
QDate readDate(const QString &text)
{
    static const QRegularExpression yearFirst(QStringLiteral(R"(^(\d{4})[-/.](\d{1,2})[-/.](\d{1,2})$)"));
    static const QRegularExpression dayFirst(QStringLiteral(R"(^(\d{1,2})[-/.](\d{1,2})[-/.](\d{4}|\d{2})$)"));
    static const QRegularExpression compact(QStringLiteral(R"(^(\d{4})(\d{2})(\d{2})$)"));
    const QString trimmed = text.trimmed();
    if (const auto match = yearFirst.match(trimmed); match.hasMatch())
        return QDate(match.captured(1).toInt(), match.captured(2).toInt(), match.captured(3).toInt());
    if (const auto match = compact.match(trimmed); match.hasMatch())
        return QDate(match.captured(1).toInt(), match.captured(2).toInt(), match.captured(3).toInt());
    if (const auto match = dayFirst.match(trimmed); match.hasMatch()) {
        const QString year = match.captured(3);
        return QDate(year.size() == 2 ? fullYear(year.toInt()) : year.toInt(), match.captured(2).toInt(),
            match.captured(1).toInt());
    }
    return {};
}

// An unreadable date is shown as an invalid number is: white on red.
void markUnreadable(QLineEdit &box, bool unreadable)
{
    QPalette palette = box.parentWidget()->palette();
    if (unreadable) {
        palette.setColor(QPalette::Base, Qt::red);
        palette.setColor(QPalette::Text, Qt::white);
    }
    box.setPalette(palette);
}

} // namespace

class frmEditNIFPrivate
{
public:
    explicit frmEditNIFPrivate(frmEditNIF *q);

    void clearRows();
    void buildRows();
    QWidget *createInput(const QString &id, const RowSetup &setup, int index);
    QWidget *rowOf(const QString &id) const;
    void applyMaritalRule();
    static bool isDate(const QObject *box) { return tagOf(box).toLower() == QLatin1String("datanascimento"); }
    void normaliseDate(QLineEdit *box);
    void normaliseDates();
    void buttonClicked(int index);

    frmEditNIF *q;
    QPointer<cNIF> bound;
    cNIF *cNIF1;
    QLineEdit *xNome;
    QFrame *pFrame;
    QGridLayout *rowsLayout;
    CommandButtonArray *buttons;
    // Element 0 of each row array: hidden templates.
    QLabel *tDesc;
    QLineEdit *tField;
    QComboBox *tCombo;
    cNIF *tNIF;
    QList<QLabel *> labels;
    QList<QWidget *> rows;
    bool reloadWhenFetched = false;
};

frmEditNIFPrivate::frmEditNIFPrivate(frmEditNIF *owner)
    : q(owner)
    , cNIF1(new cNIF(owner))
    , xNome(new QLineEdit(owner))
    , pFrame(new QFrame(owner))
    , rowsLayout(new QGridLayout(pFrame))
    , buttons(new CommandButtonArray(QStringLiteral("TRU_CommandButton1"), owner, 4))
    , tDesc(new QLabel(pFrame))
    , tField(new QLineEdit(pFrame))
    , tCombo(new QComboBox(pFrame))
    , tNIF(new cNIF(pFrame))
{
    q->setWindowTitle(QStringLiteral("Editar informação de contribuinte"));
    cNIF1->setObjectName(QStringLiteral("cNIF1"));
    cNIF1->InitNew();
    xNome->setObjectName(QStringLiteral("xNome"));
    pFrame->setObjectName(QStringLiteral("pFrame"));
    pFrame->setFrameShape(QFrame::StyledPanel);

    const std::pair<QWidget *, const char *> templates[]
        = { { tDesc, "tDesc" }, { tField, "tField" }, { tCombo, "tCombo" }, { tNIF, "tNIF" } };
    for (const auto &[widget, name] : templates) {
        widget->setObjectName(QString::fromLatin1(name));
        widget->setProperty("Index", 0);
        widget->hide();
    }

    auto *image = new QLabel(owner);
    image->setObjectName(QStringLiteral("Image1"));
    image->setPixmap(QPixmap(QStringLiteral(":/zelctl/icons/INFO.png")));
    auto *line = new QFrame(owner);
    line->setObjectName(QStringLiteral("Line1"));
    line->setFrameShape(QFrame::HLine);
    line->setFrameShadow(QFrame::Sunken);

    const char *captions[] = { "&Aplicar", "&OK", "&Cancelar", "Informação pública" };
    auto *buttonRow = new QHBoxLayout;
    buttonRow->addStretch();
    for (int index = 0; index < buttons->Count(); ++index) {
        (*buttons)(index)->setCaption(QString::fromUtf8(captions[index]));
        buttonRow->addWidget((*buttons)(index));
    }
    // Enter confirms the record, from whichever box the user is in.
    (*buttons)(Ok)->setDefault(true);

    auto *top = new QHBoxLayout;
    top->addWidget(image);
    top->addWidget(cNIF1);
    top->addStretch();
    auto *name = new QHBoxLayout;
    name->addWidget(new QLabel(QStringLiteral("Nome:"), owner));
    name->addWidget(xNome, 1);
    rowsLayout->setColumnStretch(1, 1);

    auto *form = new QVBoxLayout(owner);
    form->addLayout(top);
    form->addLayout(name);
    form->addWidget(line);
    form->addWidget(pFrame, 1);
    form->addLayout(buttonRow);

    QObject::connect(xNome, &QLineEdit::textChanged, owner, [this](const QString &text) { cNIF1->setNome(text); });
    QObject::connect(buttons, &CommandButtonArray::Click, owner, [this](int index) { buttonClicked(index); });
}

void frmEditNIFPrivate::clearRows()
{
    qDeleteAll(labels);
    labels.clear();
    qDeleteAll(rows);
    rows.clear();
    tDesc->clear();
    tDesc->hide();
    tField->clear();
    tField->hide();
}

QWidget *frmEditNIFPrivate::createInput(const QString &id, const RowSetup &setup, int index)
{
    QWidget *input = nullptr;
    switch (setup.kind) {
    case RowKind::Text:
    case RowKind::ReadOnlyText: {
        auto *box = new QLineEdit(pFrame);
        box->setObjectName(QStringLiteral("tField"));
        box->setProperty("Tag", id);
        box->setReadOnly(setup.kind == RowKind::ReadOnlyText);
        if (id == QLatin1String("servico")) {
            box->setMaxLength(TaxOfficeLength);
            box->setFixedWidth(platform::pixelsFromTwips(TaxOfficeWidthTwips));
        }
        if (isDate(box))
            box->installEventFilter(q);
        input = box;
        break;
    }
    case RowKind::List: {
        auto *list = new QComboBox(pFrame);
        list->setObjectName(QStringLiteral("tCombo"));
        list->addItems(QString::fromUtf8(MaritalStates).split(u','));
        list->setCurrentIndex(-1);
        QObject::connect(list, &QComboBox::currentIndexChanged, q, [this, list] {
            if (tagOf(list) == QLatin1String("estadocivil"))
                applyMaritalRule();
        });
        input = list;
        break;
    }
    case RowKind::Number: {
        auto *number = new cNIF(pFrame);
        number->setObjectName(QStringLiteral("tNIF"));
        number->InitNew();
        number->setEnabled(false);
        number->extender().setTag(id);
        input = number;
        break;
    }
    }
    input->setProperty("Index", index);
    input->setProperty("Tag", id);
    return input;
}

void frmEditNIFPrivate::buildRows()
{
    clearRows();
    if (!bound)
        return;
    // The ids travel in the companion library's list, as the declaration's fields do.
    companion::FieldCollection ids;
    for (const char16_t *id : RowIds)
        ids.Add(QString::fromUtf16(id), QString());
    QSet<QString> shown;
    for (const companion::FieldCollection::Item &item : ids.items()) {
        if (shown.contains(item.id))
            continue;
        shown.insert(item.id);
        const RowSetup setup = setupOf(item.id);
        const int index = int(rows.size()) + 1;
        auto *label = new QLabel(setup.label ? QString::fromUtf16(setup.label) : item.id, pFrame);
        label->setObjectName(QStringLiteral("tDesc"));
        label->setProperty("Index", index);
        QWidget *input = createInput(item.id, setup, index);
        rowsLayout->addWidget(label, index, 0);
        // Boxes of a fixed width keep it; the others take the frame's width.
        const bool fixedWidth = setup.kind == RowKind::Number || input->maximumWidth() < QWIDGETSIZE_MAX;
        rowsLayout->addWidget(input, index, 1, fixedWidth ? Qt::AlignLeft : Qt::Alignment());
        labels.append(label);
        rows.append(input);
        label->show();
        input->show();
    }
    q->LoadValues();
}

QWidget *frmEditNIFPrivate::rowOf(const QString &id) const
{
    for (QWidget *row : rows) {
        if (tagOf(row) == id)
            return row;
    }
    return nullptr;
}

void frmEditNIFPrivate::applyMaritalRule()
{
    auto *list = qobject_cast<QComboBox *>(rowOf(QStringLiteral("estadocivil")));
    auto *spouse = qobject_cast<cNIF *>(rowOf(QStringLiteral("conjuge")));
    if (list && spouse)
        spouse->setEnabled(list->currentIndex() == Married || list->currentIndex() == CivilUnion);
}

void frmEditNIFPrivate::normaliseDate(QLineEdit *box)
{
    // What cannot be read stays as typed, marked, for the user to mend.
    const QDate date = readDate(box->text());
    if (date.isValid())
        box->setText(date.toString(QStringLiteral("yyyy-MM-dd")));
    markUnreadable(*box, !date.isValid() && !box->text().trimmed().isEmpty());
}

void frmEditNIFPrivate::normaliseDates()
{
    for (QWidget *row : std::as_const(rows)) {
        if (auto *box = qobject_cast<QLineEdit *>(row); box && isDate(box))
            normaliseDate(box);
    }
}

void frmEditNIFPrivate::buttonClicked(int index)
{
    // The bound control's events run the host's code, which may delete this form.
    const QPointer<frmEditNIF> alive(q);
    switch (index) {
    case Apply:
        q->ApplyValues();
        break;
    case Ok:
        q->ApplyValues();
        if (alive)
            q->accept();
        break;
    case Cancel:
        q->reject();
        break;
    case PublicInformation:
        if (bound) {
            // A fetch answers later; its values are shown when it ends.
            reloadWhenFetched = true;
            bound->GetNIFInformation();
        }
        if (alive)
            q->LoadValues();
        break;
    default:
        break;
    }
}

frmEditNIF::frmEditNIF(QWidget *parent)
    : QDialog(parent)
    , d(std::make_unique<frmEditNIFPrivate>(this))
{ }

frmEditNIF::~frmEditNIF() = default;

void frmEditNIF::SetNIFControl(cNIF *control)
{
    if (d->bound)
        d->bound->disconnect(this);
    d->bound = control;
    if (!control)
        return;
    connect(control, &cNIF::DataFinished, this, [this] {
        if (std::exchange(d->reloadWhenFetched, false))
            LoadValues();
    });
    d->cNIF1->setValue(control->Value());
    d->cNIF1->setLocked(true);
    d->cNIF1->setDisablePopupMenu(true);
    d->xNome->setText(d->cNIF1->Nome());
    d->buildRows();
}

void frmEditNIF::LoadValues()
{
    if (!d->bound)
        return;
    cNIF &bound = *d->bound;
    d->xNome->setText(bound.Nome());
    for (QWidget *row : std::as_const(d->rows)) {
        const QString value = bound.Information(tagOf(row));
        if (auto *box = qobject_cast<QLineEdit *>(row)) {
            box->setText(value);
            box->setModified(false);
            if (d->isDate(box))
                markUnreadable(*box, !value.trimmed().isEmpty() && !readDate(value).isValid());
        } else if (auto *list = qobject_cast<QComboBox *>(row)) {
            // The record keeps the position; a fetched record may hold the state's name.
            bool number = false;
            const int position = value.toInt(&number);
            list->setCurrentIndex(
                number && position < list->count() ? position : list->findText(value, Qt::MatchFixedString));
        } else if (auto *nif = qobject_cast<cNIF *>(row)) {
            nif->setValue(value);
        }
    }
    d->applyMaritalRule();
}

void frmEditNIF::ApplyValues()
{
    if (!d->bound)
        return;
    // A date typed in the box the user is still in is read as leaving the box reads it.
    d->normaliseDates();
    // The values are taken first: the control's events run the host's code, which may
    // delete the control or this form between two writes.
    QList<std::pair<QString, QString>> values;
    for (QWidget *row : std::as_const(d->rows)) {
        const QString id = tagOf(row);
        if (auto *nif = qobject_cast<cNIF *>(row)) {
            // An empty number is kept as nothing, not as a bare country code.
            values.append({ id, nif->IsEmpty() ? QString() : nif->Value() });
        } else if (auto *list = qobject_cast<QComboBox *>(row)) {
            values.append({ id, QString::number(list->currentIndex()) });
            values.append({ id + QStringLiteral(".text"), list->currentText() });
        } else if (auto *box = qobject_cast<QLineEdit *>(row)) {
            values.append({ id, box->text() });
        }
    }
    const QPointer<cNIF> bound = d->bound;
    bound->setNome(d->xNome->text());
    for (const auto &[id, value] : std::as_const(values)) {
        if (!bound)
            return;
        bound->setInformation(id, value);
    }
}

bool frmEditNIF::eventFilter(QObject *watched, QEvent *event)
{
    if (event->type() == QEvent::FocusOut) {
        if (auto *box = qobject_cast<QLineEdit *>(watched); box && d->rows.contains(box))
            d->normaliseDate(box);
    }
    return QDialog::eventFilter(watched, event);
}

} // namespace zelctl

#include "frmSelectCountry.h"

#include "PictureBox.h"
#include "mod_CTL.h"

#include "common/modFuncs.h"
#include "companion/CommandButton.h"
#include "companion/CommandButtonArray.h"
#include "platform/Twips.h"

#include <QHash>
#include <QHeaderView>
#include <QPixmap>
#include <QTreeWidget>

#include <algorithm>
#include <limits>

namespace zelctl {

namespace {

// The 27 codes the NIF checks know, Greece as "EL".
constexpr auto EuCountries = "AT,BE,BG,CY,CZ,DE,DK,EE,EL,ES,FI,FR,GB,HU,IE,IT,LT,LU,LV,MT,NL,PL,PT,RO,SE,SI,SK";

enum Column { NameColumn = 0, CodeColumn = 1, NumberColumn = 2 };

// The list item's tag: the country's numeric code.
constexpr int NumberRole = Qt::UserRole;

// Between the list, the buttons and the form's edges.
constexpr int Gap = platform::pixelsFromTwips(90);

bool listNames(const QString &list, const QString &code)
{
    const QStringList codes = list.split(QLatin1Char(','));
    return std::any_of(codes.begin(), codes.end(), [&](const QString &entry) { return entry.trimmed() == code; });
}

// The number a text starts with, as a form's number reading takes it: leading blanks
// skipped, digits up to the first other character, 0 when there are none.
qint64 leadingNumber(QStringView text)
{
    text = text.trimmed();
    qint64 value = 0;
    for (const QChar c : text) {
        if (c.unicode() < '0' || c.unicode() > '9')
            break;
        if (value > (std::numeric_limits<qint64>::max() - 9) / 10)
            break;
        value = value * 10 + (c.unicode() - '0');
    }
    return value;
}

} // namespace

class frmSelectCountryPrivate
{
public:
    GSEL_CountryFilterList filterMode = GSEL_All;
    QString customList;
    QString tag;
    QString countryFile;

    QTreeWidget *cList = nullptr;
    // The image list: each flag once, by code.
    QHash<QString, Picture> cIcons;
    QHash<QString, QTreeWidgetItem *> items;
    CommandButtonArray *buttons = nullptr;
    PictureBox *Picture1 = nullptr;
    // Keeps the names in line for a country without a flag.
    QIcon noFlag;

    bool takes(const QString &code) const
    {
        switch (filterMode) {
        case GSEL_All:
            return true;
        case GSEL_OnlyEU:
            return listNames(QString::fromLatin1(EuCountries), code);
        case GSEL_Custom:
            return listNames(customList, code);
        case GSEL_OnlyPT:
            break;
        }
        return false;
    }
};

frmSelectCountry::frmSelectCountry(QWidget *parent)
    : QDialog(parent)
    , d(std::make_unique<frmSelectCountryPrivate>())
{
    setObjectName(QStringLiteral("frmSelectCountry"));
    setWindowTitle(QStringLiteral("Escolha o país"));

    d->cList = new QTreeWidget(this);
    d->cList->setObjectName(QStringLiteral("cList"));
    d->cList->setColumnCount(3);
    d->cList->setHeaderLabels({ QStringLiteral("Nome"), QStringLiteral("Identificação"), QStringLiteral("Código") });
    d->cList->setRootIsDecorated(false);
    d->cList->setUniformRowHeights(true);
    d->cList->setSelectionMode(QAbstractItemView::SingleSelection);
    d->cList->setIconSize(QSize(mod_CTL::FlagSize, mod_CTL::FlagSize));
    d->cList->header()->setStretchLastSection(false);
    d->cList->header()->setSectionResizeMode(NameColumn, QHeaderView::Stretch);
    d->cList->setColumnWidth(CodeColumn, 90);
    d->cList->setColumnWidth(NumberColumn, 60);
    connect(d->cList, &QTreeWidget::itemDoubleClicked, this, [this] { acceptSelected(); });

    // OK and Cancel under the list, at the bottom right; Enter and Escape press them.
    d->buttons = new CommandButtonArray(QStringLiteral("TRU_CommandButton1"), this, 2);
    (*d->buttons)(0)->setCaption(QStringLiteral("&OK"));
    (*d->buttons)(0)->setDefault(true);
    (*d->buttons)(1)->setCaption(QStringLiteral("&Cancelar"));
    for (int index = 0; index < 2; ++index) {
        (*d->buttons)(index)->setWidth(1215);
        (*d->buttons)(index)->setHeight(375);
    }
    connect(d->buttons, &CommandButtonArray::Click, this, [this](int index) {
        if (index == 0)
            acceptSelected();
        else
            cancel();
    });

    d->Picture1 = new PictureBox(this);
    d->Picture1->setObjectName(QStringLiteral("Picture1"));
    d->Picture1->setBackColor(platform::rgb(255, 255, 255));
    d->Picture1->resize(mod_CTL::FlagSize, mod_CTL::FlagSize);
    d->Picture1->hide();

    QPixmap blank(mod_CTL::FlagSize, mod_CTL::FlagSize);
    blank.fill(Qt::transparent);
    d->noFlag = QIcon(blank);

    resize(460, 420);
}

frmSelectCountry::~frmSelectCountry() = default;

GSEL_CountryFilterList frmSelectCountry::filterMode() const
{
    return d->filterMode;
}

void frmSelectCountry::setFilterMode(GSEL_CountryFilterList mode)
{
    d->filterMode = mode;
}

QString frmSelectCountry::customList() const
{
    return d->customList;
}

void frmSelectCountry::setCustomList(const QString &codes)
{
    d->customList = codes;
}

QString frmSelectCountry::Tag() const
{
    return d->tag;
}

void frmSelectCountry::setTag(const QString &tag)
{
    d->tag = tag;
}

QString frmSelectCountry::countryFile() const
{
    return d->countryFile.isEmpty() ? modFuncs::GetDataPath() + QStringLiteral("iso3166.txt") : d->countryFile;
}

void frmSelectCountry::setCountryFile(const QString &path)
{
    d->countryFile = path;
}

void frmSelectCountry::RelistCountries()
{
    d->Picture1->setBackColor(platform::rgb(255, 255, 255));
    d->cList->clear();
    d->items.clear();
    d->cIcons.clear();

    if (d->filterMode != GSEL_Custom)
        AddCountry(QStringLiteral("PT"), QStringLiteral("Portugal"), 0);

    const QString text = modFuncs::ReadWholeFile(countryFile());
    if (d->filterMode == GSEL_OnlyPT)
        return;
    for (const QStringView line : modFuncs::textLines(text)) {
        const QList<QStringView> fields = line.split(QLatin1Char('\t'));
        // A line without a code and a name names no country.
        if (fields.size() < 4 || fields.at(1).isEmpty())
            continue;
        const QString code = fields.at(1).toString();
        if (d->takes(code))
            AddCountry(code, fields.at(3).toString(), leadingNumber(fields.at(0)));
    }
}

void frmSelectCountry::AddCountry(const QString &code, const QString &name, qint64 number)
{
    QTreeWidgetItem *item = d->items.value(code);
    if (!item) {
        if (!d->cIcons.contains(code)) {
            const Picture flag = mod_CTL::flagOn(*d->Picture1, code);
            if (!flag.isNull())
                d->cIcons.insert(code, flag);
        }
        item = new QTreeWidgetItem(d->cList);
        item->setText(CodeColumn, code);
        d->items.insert(code, item);
    }
    const auto flag = d->cIcons.constFind(code);
    item->setIcon(NameColumn, flag == d->cIcons.constEnd() ? d->noFlag : QIcon(flag->pixmap()));
    if (!name.isEmpty())
        item->setText(NameColumn, name);
    if (number > 0) {
        item->setText(NumberColumn, QStringLiteral("%1").arg(number, 3, 10, QLatin1Char('0')));
        item->setData(NameColumn, NumberRole, number);
    }
}

void frmSelectCountry::acceptSelected()
{
    const QList<QTreeWidgetItem *> selected = d->cList->selectedItems();
    if (!selected.isEmpty())
        d->tag = selected.first()->text(CodeColumn);
    done(Accepted);
}

void frmSelectCountry::cancel()
{
    d->tag.clear();
    done(Rejected);
}

void frmSelectCountry::reject()
{
    cancel();
}

void frmSelectCountry::Unload()
{
    d->cList->clear();
    d->items.clear();
    d->cIcons.clear();
    d->Picture1->setPicture({});
    hide();
}

void frmSelectCountry::resizeEvent(QResizeEvent *event)
{
    QDialog::resizeEvent(event);
    CommandButton *ok = (*d->buttons)(0);
    CommandButton *cancelButton = (*d->buttons)(1);
    const int buttonsTop = height() - Gap - ok->height();
    d->cList->setGeometry(0, 0, width(), std::max(buttonsTop - Gap, 0));
    cancelButton->move(width() - Gap - cancelButton->width(), buttonsTop);
    ok->move(cancelButton->x() - Gap / 2 - ok->width(), buttonsTop);
}

} // namespace zelctl

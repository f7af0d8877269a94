#include "cNIB.h"

#include "NibCheckDigits.h"
#include "common/InnerCalls.h"
#include "frame/PropertyReaders.h"
#include "platform/Accessibility.h"
#include "platform/KeyboardFocus.h"
#include "platform/MessageBox.h"
#include "platform/Twips.h"

#include <QApplication>
#include <QKeyEvent>
#include <QLabel>
#include <QLineEdit>
#include <QPainter>
#include <QPointer>

#include <array>

namespace zelctl {

using platform::pixelsFromTwips;

namespace {

struct BoxGeometry
{
    int left; // twips; every part has its top at 0
    int width;
    int first; // offset of the box's first character in the number
    int maxLength;
    const char16_t *part; // what a screen reader calls the box
};

constexpr std::array<BoxGeometry, 4> boxes = { {
    { 0, 465, 0, 4, u"Banco" },
    { 480, 465, 4, 4, u"Balcão" },
    { 960, 1125, 8, 11, u"Conta" },
    { 2100, 285, 19, 2, u"Dígitos de controlo" },
} };
constexpr int boxHeight = 315;
constexpr QRect validMarkTwips(2430, 0, 240, 240);
constexpr QRect errorMarkTwips(2400, 0, 255, 270);
constexpr int fullLength = 21;
constexpr int withoutDigits = 19; // a number typed without its check digits

QRect pixels(const QRect &twips)
{
    return { pixelsFromTwips(twips.x()), pixelsFromTwips(twips.y()), pixelsFromTwips(twips.width()),
        pixelsFromTwips(twips.height()) };
}

const QString ErrorTitle = QStringLiteral("NIB incorrecto");
const QString ErrorText = QStringLiteral("O número de identificação bancário (NIB) não se encontra correcto.\n"
                                         "Por favor verifique o NIB inserido");

// The error mark explains itself when clicked, or pressed with Space or Enter once the
// keyboard has reached it (it is a tab stop while shown).
class ErrorMark : public QLabel
{
public:
    explicit ErrorMark(QWidget *parent)
        : QLabel(parent)
    {
        setFocusPolicy(Qt::TabFocus);
        setAccessibleName(ErrorTitle);
        setAccessibleDescription(ErrorText);
    }

protected:
    void mouseReleaseEvent(QMouseEvent *event) override
    {
        if (event->button() == Qt::LeftButton && rect().contains(event->position().toPoint()))
            explain();
    }

    void keyPressEvent(QKeyEvent *event) override
    {
        if (platform::pressesButton(*event))
            explain();
        else
            QLabel::keyPressEvent(event);
    }

    void paintEvent(QPaintEvent *event) override
    {
        QLabel::paintEvent(event);
        if (platform::showsFocusMark(*this)) {
            QPainter painter(this);
            platform::paintFocusMark(painter, rect());
        }
    }

private:
    static void explain() { platform::messageBox(platform::MsgIcon::Information, ErrorTitle, ErrorText); }
};

} // namespace

class cNIB::Private
{
public:
    explicit Private(cNIB *q);

    QString text() const;
    int indexOf(const QObject *box) const;
    void changed(int index);
    void refreshValidity();
    void showMarks(bool valid, bool error);
    void eraseBack(int index);
    void applyBackColor();

    cNIB *q;
    std::array<QLineEdit *, 4> nib {};
    QLabel *validpic;
    ErrorMark *Image1;
    InnerCalls innerCalls;
    platform::AccessibleEcho echo;
    platform::OleColor backColor = platform::systemColor(platform::COLOR_BTNFACE);
};

cNIB::Private::Private(cNIB *owner)
    : q(owner)
    , validpic(new QLabel(owner))
    , Image1(new ErrorMark(owner))
    , innerCalls(owner)
    , echo(owner)
{
    QFont font(QStringLiteral("Arial"));
    font.setPointSizeF(8.25);
    font.setBold(true);
    for (size_t i = 0; i < boxes.size(); ++i) {
        auto *box = new QLineEdit(owner);
        box->setObjectName(QStringLiteral("nib"));
        box->setProperty("Index", int(i));
        box->setMaxLength(boxes[i].maxLength);
        box->setFont(font);
        box->setAccessibleName(QString::fromUtf16(boxes[i].part));
        box->setAccessibleDescription(QStringLiteral("Parte %1 de 4 do NIB").arg(i + 1));
        box->setGeometry(pixels(QRect(boxes[i].left, 0, boxes[i].width, boxHeight)));
        box->installEventFilter(owner);
        // Changed is raised from inside the box's own editing; a host deleting the control
        // there leaves the box to go later.
        QObject::connect(box, &QLineEdit::textChanged, owner, [this, i] {
            const InnerCalls::Scope busy(innerCalls, nib[i]);
            changed(int(i));
        });
        nib[i] = box;
    }

    validpic->setObjectName(QStringLiteral("validpic"));
    validpic->setGeometry(pixels(validMarkTwips));
    QIcon tick;
    tick.addFile(QStringLiteral(":/zelctl/nib/validpic16.png"));
    tick.addFile(QStringLiteral(":/zelctl/nib/validpic32.png"));
    validpic->setPixmap(tick.pixmap(validpic->size()));

    Image1->setObjectName(QStringLiteral("Image1"));
    Image1->setGeometry(pixels(errorMarkTwips));
    Image1->setPixmap(QPixmap(QStringLiteral(":/zelctl/nib/Image1.png")));
    Image1->setScaledContents(true);
    Image1->setCursor(Qt::PointingHandCursor);
    showMarks(false, false);
}

QString cNIB::Private::text() const
{
    QString result;
    for (const QLineEdit *box : nib)
        result += box->text();
    return result;
}

int cNIB::Private::indexOf(const QObject *box) const
{
    for (size_t i = 0; i < nib.size(); ++i) {
        if (nib[i] == box)
            return int(i);
    }
    return -1;
}

void cNIB::Private::showMarks(bool valid, bool error)
{
    validpic->setVisible(valid);
    Image1->setVisible(error);
}

void cNIB::Private::changed(int index)
{
    // The caret follows the user's typing; a number written by the host moves no focus.
    QLineEdit *box = nib[size_t(index)];
    if (box->text().size() == box->maxLength() && index < int(nib.size()) - 1 && box->hasFocus())
        nib[size_t(index) + 1]->setFocus();

    const qsizetype length = text().size();
    if (length == 0) {
        Image1->hide();
        echo.refresh();
        Q_EMIT q->Changed();
    } else if (length == fullLength) {
        refreshValidity();
        Q_EMIT q->Changed();
    } else {
        showMarks(false, false);
        echo.refresh();
    }
}

void cNIB::Private::refreshValidity()
{
    const QString number = text();
    switch (number.size()) {
    case 0:
        showMarks(false, false);
        break;
    case withoutDigits: {
        // Completing the number raises Changed, whose handler may delete the control.
        const QPointer<cNIB> alive(q);
        nib[3]->setText(CalculateNibCheckDigits(number));
        if (!alive)
            return;
        validpic->setVisible(q->Valid());
        break;
    }
    case fullLength: {
        const bool right = CalculateNibCheckDigits(number) == nib[3]->text();
        showMarks(right, !right);
        break;
    }
    default:
        showMarks(false, true);
        break;
    }
    echo.refresh();
}

void cNIB::Private::eraseBack(int index)
{
    const QPointer<cNIB> alive(q);
    QLineEdit *previous = nib[size_t(index) - 1];
    previous->setFocus();
    QApplication::processEvents();
    if (!alive)
        return;
    QString previousText = previous->text();
    if (!previousText.isEmpty()) {
        previousText.chop(1);
        previous->setText(previousText);
        if (!alive)
            return;
    }
    previous->setCursorPosition(int(previous->text().size()));
}

void cNIB::Private::applyBackColor()
{
    QPalette pal = q->palette();
    pal.setColor(QPalette::Window, platform::toQColor(backColor));
    q->setPalette(pal);
}

cNIB::cNIB(QWidget *parent)
    : UserControl(parent)
    , d(std::make_unique<Private>(this))
{
    setFixedSize(pixelsFromTwips(validMarkTwips.right() + 1 + platform::TwipsPerPixel),
        pixelsFromTwips(boxHeight + platform::TwipsPerPixel));
    setAutoFillBackground(true);
    d->applyBackColor();
    // Focus given to the control (a label's buddy, a host's setFocus) lands in the first box.
    setFocusPolicy(Qt::StrongFocus);
    setFocusProxy(d->nib[0]);
    setText(QString());
}

cNIB::~cNIB()
{
    d->innerCalls.releaseBusy();
}

QString cNIB::Text() const
{
    return d->text();
}

void cNIB::setText(const QString &text)
{
    const bool complete = text.size() >= fullLength;
    // Each box raises Changed, in which the host may delete the control.
    const QPointer<cNIB> alive(this);
    for (size_t i = 0; i < boxes.size() && alive; ++i)
        d->nib[i]->setText(complete ? text.mid(boxes[i].first, boxes[i].maxLength) : QString());
}

bool cNIB::Valid() const
{
    const QString number = d->text();
    if (number.size() != fullLength)
        return false;
    const QString digits = CalculateNibCheckDigits(number);
    return !digits.isEmpty() && d->nib[3]->text() == digits;
}

QString cNIB::CalculateCheckDigits(const QString &mynib) const
{
    return CalculateNibCheckDigits(mynib);
}

platform::OleColor cNIB::BackColor() const
{
    return d->backColor;
}

void cNIB::setBackColor(platform::OleColor color)
{
    if (color == d->backColor)
        return;
    d->backColor = color;
    d->applyBackColor();
    PropertyChanged(QStringLiteral("BackColor"));
}

void cNIB::ReadProperties(const PropertyBag &bag)
{
    setBackColor(readColor(bag, QStringLiteral("BackColor"), d->backColor));
}

void cNIB::WriteProperties(PropertyBag &bag)
{
    bag.WriteProperty(QStringLiteral("BackColor"), d->backColor);
}

bool cNIB::eventFilter(QObject *watched, QEvent *event)
{
    const int index = d->indexOf(watched);
    if (index < 0)
        return UserControl::eventFilter(watched, event);
    QLineEdit *box = d->nib[size_t(index)];
    if (event->type() == QEvent::FocusIn) {
        box->selectAll();
    } else if (event->type() == QEvent::FocusOut) {
        // Leaving the control, not moving between its boxes, refreshes the marks. The box
        // that takes the focus already has it when the one that lost it hears of it.
        if (!isAncestorOf(QApplication::focusWidget())) {
            const QPointer<cNIB> alive(this);
            d->refreshValidity();
            if (!alive)
                return true;
        }
    } else if (event->type() == QEvent::KeyPress && static_cast<QKeyEvent *>(event)->key() == Qt::Key_Backspace
        && index >= 1 && box->text().isEmpty()) {
        d->eraseBack(index);
        return true;
    }
    return UserControl::eventFilter(watched, event);
}

ZELCTL_REGISTER_CLASS(cNIB)

} // namespace zelctl

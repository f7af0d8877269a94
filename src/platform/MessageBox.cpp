#include "MessageBox.h"

#include <QApplication>
#include <QMessageBox>
#include <QPointer>

namespace zelctl::platform {

namespace {

QMessageBox::Icon qtIcon(MsgIcon icon)
{
    switch (icon) {
    case MsgIcon::Information:
        return QMessageBox::Information;
    case MsgIcon::Warning:
        return QMessageBox::Warning;
    case MsgIcon::Critical:
        return QMessageBox::Critical;
    case MsgIcon::Question:
        return QMessageBox::Question;
    case MsgIcon::None:
        break;
    }
    return QMessageBox::NoIcon;
}

QMessageBox::StandardButtons qtButtons(MsgButtons buttons)
{
    switch (buttons) {
    case MsgButtons::OkCancel:
        return QMessageBox::Ok | QMessageBox::Cancel;
    case MsgButtons::YesNo:
        return QMessageBox::Yes | QMessageBox::No;
    case MsgButtons::YesNoCancel:
        return QMessageBox::Yes | QMessageBox::No | QMessageBox::Cancel;
    case MsgButtons::Ok:
        break;
    }
    return QMessageBox::Ok;
}

// What a box answers when it goes without the user's answer: its Escape button's answer.
MsgResult unanswered(MsgButtons buttons)
{
    switch (buttons) {
    case MsgButtons::OkCancel:
    case MsgButtons::YesNoCancel:
        return MsgResult::Cancel;
    case MsgButtons::YesNo:
        return MsgResult::No;
    case MsgButtons::Ok:
        break;
    }
    return MsgResult::Ok;
}

MsgResult showWithQt(const MessageBoxRequest &request)
{
    // On the heap: the host may close the window it belongs to while it is open, which takes
    // the box with it.
    const QPointer<QMessageBox> box = new QMessageBox(
        qtIcon(request.icon), request.title, request.text, qtButtons(request.buttons), QApplication::activeWindow());
    const int answer = box->exec();
    if (!box)
        return unanswered(request.buttons);
    delete box.data();
    switch (answer) {
    case QMessageBox::Cancel:
        return MsgResult::Cancel;
    case QMessageBox::Yes:
        return MsgResult::Yes;
    case QMessageBox::No:
        return MsgResult::No;
    default:
        return MsgResult::Ok;
    }
}

MessageBoxPresenter &presenter()
{
    static MessageBoxPresenter current = showWithQt;
    return current;
}

} // namespace

MsgResult messageBox(MsgIcon icon, const QString &title, const QString &text, MsgButtons buttons)
{
    return presenter()({ icon, title, text, buttons });
}

MessageBoxPresenter setMessageBoxPresenter(MessageBoxPresenter replacement)
{
    MessageBoxPresenter previous = std::move(presenter());
    presenter() = replacement ? std::move(replacement) : MessageBoxPresenter(showWithQt);
    return previous;
}

} // namespace zelctl::platform

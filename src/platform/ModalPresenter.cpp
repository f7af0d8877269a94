#include "ModalPresenter.h"

#include <QDialog>

namespace zelctl::platform {

namespace {

int execDialog(QDialog &dialog)
{
    return dialog.exec();
}

ModalPresenter &presenter()
{
    static ModalPresenter current = execDialog;
    return current;
}

} // namespace

int showModal(QDialog &dialog)
{
    return presenter()(dialog);
}

ModalPresenter setModalPresenter(ModalPresenter replacement)
{
    ModalPresenter previous = std::move(presenter());
    presenter() = replacement ? std::move(replacement) : ModalPresenter(execDialog);
    return previous;
}

} // namespace zelctl::platform

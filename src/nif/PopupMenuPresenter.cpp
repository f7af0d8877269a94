#include "PopupMenuPresenter.h"

#include <QMenu>

namespace zelctl {

namespace {

void execMenu(QMenu &menu, const QPoint &globalPos)
{
    menu.exec(globalPos);
}

PopupMenuPresenter &presenter()
{
    static PopupMenuPresenter current = execMenu;
    return current;
}

} // namespace

void showPopupMenu(QMenu &menu, const QPoint &globalPos)
{
    presenter()(menu, globalPos);
}

PopupMenuPresenter setPopupMenuPresenter(PopupMenuPresenter replacement)
{
    PopupMenuPresenter previous = std::move(presenter());
    presenter() = replacement ? std::move(replacement) : PopupMenuPresenter(execMenu);
    return previous;
}

} // namespace zelctl

#include "ListMenuPresenter.h"

#include <QMenu>

namespace zelctl::subject {

namespace {

QAction *execMenu(QMenu &menu, const QPoint &globalPos)
{
    return menu.exec(globalPos);
}

ListMenuPresenter &presenter()
{
    static ListMenuPresenter current = execMenu;
    return current;
}

} // namespace

QAction *showListMenu(QMenu &menu, const QPoint &globalPos)
{
    return presenter()(menu, globalPos);
}

ListMenuPresenter setListMenuPresenter(ListMenuPresenter replacement)
{
    ListMenuPresenter previous = std::move(presenter());
    presenter() = replacement ? std::move(replacement) : ListMenuPresenter(execMenu);
    return previous;
}

} // namespace zelctl::subject

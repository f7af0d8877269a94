#pragma once

#include "zelctl_export.h"

#include <QPoint>

#include <functional>

class QAction;
class QMenu;

// Pops up the subject selector's list of subjects. The presenter can be replaced, so tests
// and automation choose an item (or none) instead of entering the menu's own event loop.
namespace zelctl::subject {

// Receives the menu and the screen position under the button; returns the chosen action,
// or nullptr when the menu was dismissed.
using ListMenuPresenter = std::function<QAction *(QMenu &menu, const QPoint &globalPos)>;

ZELCTL_EXPORT QAction *showListMenu(QMenu &menu, const QPoint &globalPos);

// Installs a presenter and returns the previous one; an empty presenter restores exec().
ZELCTL_EXPORT ListMenuPresenter setListMenuPresenter(ListMenuPresenter presenter);

} // namespace zelctl::subject

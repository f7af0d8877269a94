#pragma once

#include "zelctl_export.h"

#include <QPoint>

#include <functional>

class QMenu;

// Shows the library's context menus. The presenter can be replaced, so tests choose an
// entry instead of entering the menu's own event loop.
namespace zelctl {

// Shows the menu at a screen position and triggers the chosen entry (or none), as
// QMenu::exec does; returns when the menu has closed.
using PopupMenuPresenter = std::function<void(QMenu &menu, const QPoint &globalPos)>;

ZELCTL_EXPORT void showPopupMenu(QMenu &menu, const QPoint &globalPos);
// Installs a presenter and returns the previous one; an empty presenter restores exec().
ZELCTL_EXPORT PopupMenuPresenter setPopupMenuPresenter(PopupMenuPresenter presenter);

} // namespace zelctl

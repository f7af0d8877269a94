#pragma once

#include "zelctl_export.h"

#include <QString>

#include <functional>

// Shell execution of an action (a document, a folder or an address), opened with the
// desktop's default handler. The hook can be replaced so tests observe what would open.
namespace zelctl::platform {

using ShellOpenHook = std::function<bool(const QString &action)>;

// Opens the action; false when nothing could open it.
ZELCTL_EXPORT bool shellOpen(const QString &action);

// Installs a hook and returns the previous one; an empty hook restores the desktop's handler.
ZELCTL_EXPORT ShellOpenHook setShellOpenHook(ShellOpenHook hook);

} // namespace zelctl::platform

#include "Shell.h"

#include <QDesktopServices>
#include <QFileInfo>
#include <QUrl>

namespace zelctl::platform {

namespace {

bool openWithDesktop(const QString &action)
{
    // A plain path opens as a local file; anything with a scheme as an address.
    const QUrl url = QFileInfo::exists(action) ? QUrl::fromLocalFile(action) : QUrl::fromUserInput(action);
    return url.isValid() && QDesktopServices::openUrl(url);
}

ShellOpenHook &hook()
{
    static ShellOpenHook current = openWithDesktop;
    return current;
}

} // namespace

bool shellOpen(const QString &action)
{
    return hook()(action);
}

ShellOpenHook setShellOpenHook(ShellOpenHook replacement)
{
    ShellOpenHook previous = std::move(hook());
    hook() = replacement ? std::move(replacement) : ShellOpenHook(openWithDesktop);
    return previous;
}

} // namespace zelctl::platform

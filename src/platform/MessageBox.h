#pragma once

#include "zelctl_export.h"

#include <QString>

#include <functional>

// Modal message boxes. Every message to the user goes through messageBox(); the presenter
// that shows it can be replaced, so tests and headless hosts can record or answer it.
namespace zelctl::platform {

enum class MsgIcon { None, Information, Warning, Critical, Question };
enum class MsgButtons { Ok, OkCancel, YesNo, YesNoCancel };
enum class MsgResult { Ok, Cancel, Yes, No };

struct MessageBoxRequest
{
    MsgIcon icon = MsgIcon::None;
    QString title;
    QString text;
    MsgButtons buttons = MsgButtons::Ok;
};

using MessageBoxPresenter = std::function<MsgResult(const MessageBoxRequest &)>;

ZELCTL_EXPORT MsgResult messageBox(
    MsgIcon icon, const QString &title, const QString &text, MsgButtons buttons = MsgButtons::Ok);

// Installs a presenter and returns the previous one; an empty presenter restores QMessageBox.
ZELCTL_EXPORT MessageBoxPresenter setMessageBoxPresenter(MessageBoxPresenter presenter);

} // namespace zelctl::platform

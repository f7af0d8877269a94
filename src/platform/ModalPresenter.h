#pragma once

#include "zelctl_export.h"

#include <functional>

class QDialog;

// Shows the library's own forms modally. The presenter can be replaced, so tests drive a
// form (fill it, press its buttons) instead of entering a nested event loop.
namespace zelctl::platform {

// Receives the dialog, shows it and returns its result (QDialog::Accepted or Rejected).
using ModalPresenter = std::function<int(QDialog &)>;

ZELCTL_EXPORT int showModal(QDialog &dialog);

// Installs a presenter and returns the previous one; an empty presenter restores exec().
ZELCTL_EXPORT ModalPresenter setModalPresenter(ModalPresenter presenter);

} // namespace zelctl::platform

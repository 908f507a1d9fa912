// SPDX-License-Identifier: MIT
#include "ide/signal.h"

#include <QtGlobal>

namespace ide::detail {

void handlerFailed(const std::exception* error) noexcept {
  // The source cannot report to anyone but the log: the IDE never lets a sink's failure abort its own work.
  qWarning("event handler failed: %s", error ? error->what() : "unknown exception");
}

}  // namespace ide::detail

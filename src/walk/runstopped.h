// SPDX-License-Identifier: MIT
// The failure that ends a whole walk, apart from walk.h so that per-line rules can raise it cheaply.
#pragma once

#include "ide/error.h"

namespace walk {

/// A failure that ends the whole run, not only the unit it happened in: it passes the guards of nested
/// walks to the outermost, which reports it and stops the run (a line number past the 32-bit range).
class RunStopped : public ide::Error {
 public:
  using ide::Error::Error;
};

}  // namespace walk

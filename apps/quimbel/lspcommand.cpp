// SPDX-License-Identifier: MIT
// `quimbel lsp`: the language server on standard input and output, for editors.
#include "cli.h"
#include "lsp/server.h"

#include <unistd.h>

namespace cli {

int runLsp() {
  // Standard output carries the protocol alone: nothing else may be printed there.
  return lsp::serve(STDIN_FILENO, STDOUT_FILENO, QStringLiteral(QUIMBEL_VERSION));
}

}  // namespace cli

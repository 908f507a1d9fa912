// SPDX-License-Identifier: MIT
// The add-in's help: HTML pages in the installation directory (help/), opened in the desktop's browser.
#pragma once

#include "ide/platform.h"

#include <QString>

namespace addin {

/// The help page of the contents, or of a context number (4 macros, 5 copy buffers, 11 new procedure,
/// 16 placeholders); empty for a context the help does not have.
QString helpPagePath(const QString& installDir, int context = 0);

/// Opens the contents page; false when the page is missing or cannot be opened.
bool showHelpContents(ide::UserInterface& ui, const QString& installDir);
/// Opens the page of a context number; false when it is missing or cannot be opened.
bool showHelpTopic(ide::UserInterface& ui, const QString& installDir, int context);

}  // namespace addin

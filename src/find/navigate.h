// SPDX-License-Identifier: MIT
// Going from a row of the extended find's list to its occurrence: the code window opened with the
// occurrence selected, half a pane of code above it.
#pragma once

#include "find/itemfound.h"

#include <functional>

namespace find {

/// The top line that shows `startLine` with half of `visibleLines` above it; when that would be above the
/// first line, the occurrence's own line.
int TopLineFor(int startLine, int visibleLines);

/// Opens the code pane of the occurrence's module, scrolls it (TopLineFor) and selects the occurrence.
/// `beforeShow` runs just before the pane is shown (the find window gets out of the way). A project that
/// is no longer open and a module without a code pane are told with the IDE's message boxes; other
/// failures are thrown.
void ShowItemFound(ide::VBE& vbe, const CItemFound& item, const std::function<void()>& beforeShow);

}  // namespace find

// SPDX-License-Identifier: MIT
// The language's keywords: the reserved words, which cannot name a label or a variable, and the words the
// code window shows in the keyword colour. One table answers both.
#pragma once

#include <QStringView>

namespace syntax {

/// A reserved word, in any letter case: "Else:" or "End:" is a statement, not a label.
bool isReservedWord(QStringView word) noexcept;

/// A word the code window colours as a keyword, in any letter case.
bool isColouredKeyword(QStringView word) noexcept;

}  // namespace syntax

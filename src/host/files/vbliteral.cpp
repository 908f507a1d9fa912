// SPDX-License-Identifier: MIT
// Quoting and unquoting of VB string literals in one pass each.
#include "host/files/vbliteral.h"

namespace host {

std::optional<QString> unquoteVbString(QStringView literal) {
  if (literal.size() < 2 || literal.front() != u'"' || literal.back() != u'"') return std::nullopt;
  QString text;
  text.reserve(literal.size() - 2);
  const qsizetype last = literal.size() - 1;
  for (qsizetype i = 1; i < last; ++i) {
    if (literal[i] == u'"') {
      // Inside the literal a quote only appears doubled.
      if (i + 1 >= last || literal[i + 1] != u'"') return std::nullopt;
      ++i;
    }
    text.append(literal[i]);
  }
  return text;
}

QString quoteVbString(QStringView text) {
  QString literal;
  literal.reserve(text.size() + 2);
  literal.append(u'"');
  for (QChar character : text) {
    if (character == u'"') literal.append(u'"');
    literal.append(character);
  }
  literal.append(u'"');
  return literal;
}

}  // namespace host

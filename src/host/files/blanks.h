// SPDX-License-Identifier: MIT
// The blanks of VB source text: a space or a tab, wherever a line is split into words or trimmed.
#pragma once

#include <QChar>
#include <QStringView>

namespace host {

inline bool isBlank(QChar character) {
  return character == u' ' || character == u'\t';
}

/// The first position at or after `from` that is not a blank (the text's size when there is none).
inline qsizetype skipBlanks(QStringView text, qsizetype from) {
  while (from < text.size() && isBlank(text[from]))
    ++from;
  return from;
}

}  // namespace host

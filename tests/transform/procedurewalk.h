// SPDX-License-Identifier: MIT
// The walks of the numbering and indentation commands over one procedure or one declarations section,
// on plain lists of lines: the header first, the End line last, as the code module holds them.
#pragma once

#include "transform/indentation.h"
#include "transform/numbering.h"

#include <QStringList>

#include <span>

namespace transform {

// Index of the last non-blank line (the End line) and of the first line after the header and its
// continuation lines.
struct ProcedureBounds {
  qsizetype first = 0;
  qsizetype last = 0;
};

/// The lines of a text written with "\n".
inline QStringList linesOf(const char* utf8) {
  return QString::fromUtf8(utf8).split(u'\n');
}

inline ProcedureBounds procedureBounds(const QStringList& lines) {
  ProcedureBounds bounds;
  bounds.last = lines.size() - 1;
  while (bounds.last > 0 && syntax::isBlankLine(lines[bounds.last]))
    --bounds.last;
  while (bounds.first < bounds.last && syntax::continues(lines[bounds.first]))
    ++bounds.first;
  ++bounds.first;
  return bounds;
}

inline QStringList numberProcedure(QStringList lines, qint32 start = 10000, qint32 interval = 5) {
  const ProcedureBounds bounds = procedureBounds(lines);
  const JumpTargets targets(lines);
  BodyNumbering numbering(start - interval, interval, targets);
  for (qsizetype i = bounds.first; i < bounds.last; ++i)
    numbering.number(lines[i]);
  return lines;
}

// Removal has no header skipping: it runs from the line after the header line to the line before the End.
inline QStringList unnumberProcedure(QStringList lines) {
  const JumpTargets targets(lines);
  bool continuation = syntax::continues(lines.front());
  for (qsizetype i = 1; i + 1 < lines.size(); ++i)
    UnnumberLine(lines[i], continuation, targets);
  return lines;
}

// Indents the lines after the header up to the End line; returns how many lines were reported changed.
inline int indentProcedure(QStringList& lines, Indenter& indenter) {
  const ProcedureBounds bounds = procedureBounds(lines);
  indenter.beginProcedure(NumberColumnWidth(
      std::span<const QString>(lines.constData() + bounds.first, bounds.last - bounds.first)));
  bool continued = syntax::continues(lines.front());
  int changed = 0;
  for (qsizetype i = 1; i < bounds.last; ++i)
    changed += indenter.IndentLine(lines[i], continued) ? 1 : 0;
  return changed;
}

inline int indentDeclarations(QStringList& lines, Indenter& indenter) {
  indenter.beginDeclarations();
  bool continued = false;
  int changed = 0;
  for (QString& line : lines)
    changed += indenter.IndentDeclarationLine(line, continued) ? 1 : 0;
  return changed;
}

}  // namespace transform

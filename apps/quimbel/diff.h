// SPDX-License-Identifier: MIT
// A unified diff of two versions of a file's lines, as `diff -u` writes it.
#pragma once

#include <QString>
#include <QStringList>

namespace cli {

/// One side of the diff: the file's lines (without their line ends) and whether its last line ends
/// without one.
struct DiffSide {
  QStringList lines;
  bool missingFinalNewline = false;
};

/// The diff's lines: "--- a/<path>", "+++ b/<path>", then hunks with `context` unchanged lines around
/// the changes. Empty when the two sides are the same. The commands only ever replace lines, so when both
/// sides have as many lines line i of one answers line i of the other; otherwise the differing middle
/// (after the common first and last lines) is one change.
QStringList unifiedDiff(const QString& path, const DiffSide& before, const DiffSide& after, int context = 3);

}  // namespace cli

// SPDX-License-Identifier: MIT
// A unified diff of two versions of a file, as `diff -u` writes it, in the file's own bytes: line ends and
// code page as they are, so that `git apply` and `patch` take it.
#pragma once

#include <QByteArray>

namespace cli {

/// The diff: "--- a/<path>", "+++ b/<path>", then hunks with `context` unchanged lines around the changes,
/// each line with its bytes as in the file (a carriage return before the line feed stays in the line) and
/// "\ No newline at end of file" after a last line without one. Empty when the two are the same. The
/// commands only ever replace lines, so when both sides have as many lines line i of one answers line i
/// of the other; otherwise the differing middle (after the common first and last lines) is one change.
QByteArray unifiedDiff(const QByteArray& path, const QByteArray& before, const QByteArray& after,
                       int context = 3);

}  // namespace cli

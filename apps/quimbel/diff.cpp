// SPDX-License-Identifier: MIT
#include "diff.h"

#include <algorithm>
#include <vector>

namespace cli {

namespace {

// Lines [oldStart, oldStart + oldCount) of the old side became [newStart, newStart + newCount) of the new.
struct Change {
  qsizetype oldStart = 0;
  qsizetype oldCount = 0;
  qsizetype newStart = 0;
  qsizetype newCount = 0;
};

std::vector<Change> changesBetween(const QStringList& before, const QStringList& after) {
  std::vector<Change> changes;
  if (before.size() == after.size()) {
    for (qsizetype i = 0; i < before.size(); ++i) {
      if (before[i] == after[i]) continue;
      if (!changes.empty() && changes.back().oldStart + changes.back().oldCount == i) {
        ++changes.back().oldCount;
        ++changes.back().newCount;
      } else {
        changes.push_back({i, 1, i, 1});
      }
    }
    return changes;
  }
  qsizetype prefix = 0;
  while (prefix < before.size() && prefix < after.size() && before[prefix] == after[prefix])
    ++prefix;
  qsizetype suffix = 0;
  while (suffix < before.size() - prefix && suffix < after.size() - prefix &&
         before[before.size() - 1 - suffix] == after[after.size() - 1 - suffix])
    ++suffix;
  changes.push_back({prefix, before.size() - prefix - suffix, prefix, after.size() - prefix - suffix});
  return changes;
}

// "l,s" of a hunk header; an empty range names the line before it, a one-line range drops its count.
QString range(qsizetype start, qsizetype count) {
  if (count == 1) return QString::number(start + 1);
  return QStringLiteral("%1,%2").arg(count == 0 ? start : start + 1).arg(count);
}

}  // namespace

QStringList unifiedDiff(const QString& path, const DiffSide& before, const DiffSide& after, int context) {
  const std::vector<Change> changes = changesBetween(before.lines, after.lines);
  if (changes.empty() && before.missingFinalNewline == after.missingFinalNewline) return {};

  QStringList out{QStringLiteral("--- a/") + path, QStringLiteral("+++ b/") + path};
  const auto emit = [&](QChar mark, const DiffSide& side, qsizetype i) {
    out << mark + side.lines[i];
    if (side.missingFinalNewline && i == side.lines.size() - 1)
      out << QStringLiteral("\\ No newline at end of file");
  };

  size_t next = 0;
  while (next < changes.size()) {
    // Changes closer than two contexts share a hunk.
    size_t last = next;
    while (last + 1 < changes.size() &&
           changes[last + 1].oldStart - (changes[last].oldStart + changes[last].oldCount) <= 2 * context)
      ++last;
    const Change& first = changes[next];
    const Change& end = changes[last];
    const qsizetype lead = std::min<qsizetype>(context, first.oldStart);
    const qsizetype oldStart = first.oldStart - lead;
    const qsizetype newStart = first.newStart - lead;
    const qsizetype trail = std::min<qsizetype>(context, before.lines.size() - (end.oldStart + end.oldCount));
    const qsizetype oldCount = end.oldStart + end.oldCount + trail - oldStart;
    const qsizetype newCount = end.newStart + end.newCount + trail - newStart;
    out << QStringLiteral("@@ -%1 +%2 @@").arg(range(oldStart, oldCount), range(newStart, newCount));

    qsizetype oldLine = oldStart;
    qsizetype newLine = newStart;
    for (size_t c = next; c <= last; ++c) {
      const Change& change = changes[c];
      for (; oldLine < change.oldStart; ++oldLine, ++newLine)
        emit(u' ', before, oldLine);
      for (qsizetype i = 0; i < change.oldCount; ++i)
        emit(u'-', before, oldLine++);
      for (qsizetype i = 0; i < change.newCount; ++i)
        emit(u'+', after, newLine++);
    }
    for (qsizetype i = 0; i < trail; ++i, ++oldLine, ++newLine)
      emit(u' ', before, oldLine);
    next = last + 1;
  }
  return out;
}

}  // namespace cli

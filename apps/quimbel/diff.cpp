// SPDX-License-Identifier: MIT
#include "diff.h"

#include <QByteArrayList>

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

std::vector<Change> changesBetween(const QByteArrayList& before, const QByteArrayList& after) {
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
QByteArray range(qsizetype start, qsizetype count) {
  if (count == 1) return QByteArray::number(start + 1);
  return QByteArray::number(count == 0 ? start : start + 1) + ',' + QByteArray::number(count);
}

/// A file's lines as `diff` sees them: split after each line feed, whatever comes before it.
struct Side {
  QByteArrayList lines;
  bool missingFinalNewline = false;
  explicit Side(const QByteArray& bytes) {
    if (bytes.isEmpty()) return;
    lines = bytes.split('\n');
    if (bytes.endsWith('\n'))
      lines.removeLast();
    else
      missingFinalNewline = true;
  }
};

}  // namespace

QByteArray unifiedDiff(const QByteArray& path, const QByteArray& beforeBytes, const QByteArray& afterBytes,
                       int context) {
  const Side before(beforeBytes);
  const Side after(afterBytes);
  const std::vector<Change> changes = changesBetween(before.lines, after.lines);
  if (changes.empty() && before.missingFinalNewline == after.missingFinalNewline) return {};

  QByteArray out = "--- a/" + path + "\n+++ b/" + path + '\n';
  const auto emit = [&](char mark, const Side& side, qsizetype i) {
    out += mark + side.lines[i] + '\n';
    if (side.missingFinalNewline && i == side.lines.size() - 1) out += "\\ No newline at end of file\n";
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
    out += "@@ -" + range(oldStart, oldCount) + " +" + range(newStart, newCount) + " @@\n";

    qsizetype oldLine = oldStart;
    qsizetype newLine = newStart;
    for (size_t c = next; c <= last; ++c) {
      const Change& change = changes[c];
      for (; oldLine < change.oldStart; ++oldLine, ++newLine)
        emit(' ', before, oldLine);
      for (qsizetype i = 0; i < change.oldCount; ++i)
        emit('-', before, oldLine++);
      for (qsizetype i = 0; i < change.newCount; ++i)
        emit('+', after, newLine++);
    }
    for (qsizetype i = 0; i < trail; ++i, ++oldLine, ++newLine)
      emit(' ', before, oldLine);
    next = last + 1;
  }
  return out;
}

}  // namespace cli

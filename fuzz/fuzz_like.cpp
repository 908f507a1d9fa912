// SPDX-License-Identifier: MIT
// The matcher behind CodeModule.Find and `quimbel find --pattern`: the first line of the input is the
// target, its first byte the options, the rest the text searched. Invariants: every match lies inside the
// limits asked for, is not empty and starts where the search may start; searching again from a match's
// start finds that match; a whole-word match cuts no word.
#include "fuzzcommon.h"

#include "host/code/findmatcher.h"
#include "ide/error.h"
#include "syntax/text.h"

#include <QStringList>

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  if (size < 1 || size > 4096) return 0;
  const bool wholeWord = data[0] & 1;
  const bool matchCase = data[0] & 2;
  const bool pattern = data[0] & 4;
  const QString input = QString::fromLatin1(fuzz::bytesOf(data + 1, size - 1));
  const qsizetype newline = input.indexOf(u'\n');
  if (newline < 0) return 0;
  const QString target = input.left(newline);
  std::optional<host::FindMatcher> matcher;
  try {
    matcher.emplace(target, wholeWord, matchCase, pattern);
  } catch (const ide::Error&) {
    return 0;  // an invalid pattern is refused
  }
  for (const QString& line : input.mid(newline + 1).split(u'\n')) {
    qsizetype from = 0;
    const qsizetype limit = line.size();
    while (from <= limit) {
      const auto found = matcher->findIn(line, from, limit);
      if (!found) break;
      const auto [start, end] = *found;
      fuzz::check(from <= start && start < end && end <= limit, "a match lies inside the limits");
      fuzz::check(matcher->findIn(line, start, limit) == found, "a match is found again from its start");
      if (wholeWord) {
        const auto inWord = [&](qsizetype at) {
          return at > 0 && at < line.size() && syntax::isIdentifierChar(line[at - 1]) &&
                 syntax::isIdentifierChar(line[at]);
        };
        fuzz::check(!inWord(start) && !inWord(end), "a whole-word match does not cut a word");
      }
      if (!pattern && matchCase)
        fuzz::check(QStringView(line).sliced(start, end - start) == target, "a plain match is the target");
      from = start + 1;
    }
  }
  return 0;
}

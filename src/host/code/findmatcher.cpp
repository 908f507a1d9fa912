// SPDX-License-Identifier: MIT
#include "host/code/findmatcher.h"

#include "ide/error.h"
#include "syntax/text.h"

#include <algorithm>

namespace host {
namespace {

inline constexpr long kInvalidPattern = 93;

QChar fold(QChar c) {
  return c.toCaseFolded();
}

/// Simple case folding, with the letters of ASCII (nearly every character of code) done inline.
inline char16_t foldUnit(char16_t c) {
  if (c < 0x80) return c >= u'A' && c <= u'Z' ? char16_t(c + 0x20) : c;
  return QChar(c).toCaseFolded().unicode();
}

[[noreturn]] void invalidPattern() {
  ide::raise(kInvalidPattern, QStringLiteral("Invalid pattern string"));
}

}  // namespace

FindMatcher::FindMatcher(QStringView target, bool wholeWord, bool matchCase, bool patternSearch)
    : m_pattern(patternSearch),
      m_wholeWord(wholeWord),
      m_case(matchCase ? Qt::CaseSensitive : Qt::CaseInsensitive) {
  if (!patternSearch) {
    m_text = target.toString();
    // A text with surrogate pairs is left to QString, which folds pairs as a whole.
    const bool surrogates =
        std::any_of(m_text.cbegin(), m_text.cend(), [](QChar c) { return c.isSurrogate(); });
    if (m_case == Qt::CaseInsensitive && !surrogates && m_text.size() <= 255) {
      for (const QChar c : m_text)
        m_folded.append(QChar(foldUnit(c.unicode())));
      const qsizetype m = m_folded.size();
      m_skip.fill(quint8(m));
      for (qsizetype k = 0; k + 1 < m; ++k)
        m_skip[m_folded[k].unicode() & 0xFF] = quint8(m - 1 - k);
    }
    return;
  }
  for (qsizetype i = 0; i < target.size(); ++i) {
    const QChar c = target[i];
    Token token{TokenKind::Literal, {}};
    if (c == u'?') {
      token.kind = TokenKind::AnyChar;
    } else if (c == u'#') {
      token.kind = TokenKind::Digit;
    } else if (c == u'*') {
      token.kind = TokenKind::AnyRun;
      if (!m_tokens.empty() && m_tokens.back().kind == TokenKind::AnyRun) continue;
    } else if (c == u'[') {
      const qsizetype close = target.indexOf(u']', i + 1);
      if (close < 0) invalidPattern();
      QStringView list = target.sliced(i + 1, close - i - 1);
      i = close;
      if (list.isEmpty()) continue;  // "[]" matches the empty string
      if (list == u"!") {
        // Nothing to exclude: the exclamation mark stands for itself.
        token.literal = u'!';
        m_tokens.push_back(std::move(token));
        continue;
      }
      token.kind = TokenKind::Class;
      if (list.front() == u'!') {
        token.negated = true;
        list = list.sliced(1);
      }
      // A comma is simply one more character of the list, which also gives "[a-z,0-9]" its meaning; a
      // hyphen first or last in the list is a character too.
      for (qsizetype k = 0; k < list.size(); ++k) {
        QChar low = list[k];
        QChar high = low;
        if (k + 2 < list.size() && list[k + 1] == u'-') {
          high = list[k + 2];
          k += 2;
          if (high < low) invalidPattern();
        }
        token.ranges.emplace_back(low, high);
      }
    } else {
      token.literal = m_case == Qt::CaseInsensitive ? fold(c) : c;
    }
    m_tokens.push_back(std::move(token));
  }
}

// Horspool's search over folded characters: lines of code are short and the text is mostly ASCII, where
// QString's case-insensitive search folds every character through its tables.
qsizetype FindMatcher::indexOfFolded(QStringView line, qsizetype from) const {
  const qsizetype m = m_folded.size();
  const auto* needle = reinterpret_cast<const char16_t*>(m_folded.utf16());
  const char16_t* text = line.utf16();
  const char16_t last = needle[m - 1];
  for (qsizetype i = from + m - 1; i < line.size();) {
    const char16_t c = foldUnit(text[i]);
    if (c == last) {
      const char16_t* start = text + i - (m - 1);
      qsizetype k = m - 2;
      while (k >= 0 && foldUnit(start[k]) == needle[k])
        --k;
      if (k < 0) return i - (m - 1);
    }
    i += m_skip[c & 0xFF];
  }
  return -1;
}

bool FindMatcher::charsEqual(QChar a, QChar b) const {
  return m_case == Qt::CaseSensitive ? a == b : fold(a) == b;
}

bool FindMatcher::tokenMatches(const Token& token, QChar c) const {
  switch (token.kind) {
    case TokenKind::Literal:
      return charsEqual(c, token.literal);
    case TokenKind::AnyChar:
      return true;
    case TokenKind::Digit:
      return c >= u'0' && c <= u'9';
    case TokenKind::AnyRun:
      return true;
    case TokenKind::Class: {
      auto inRanges = [&](QChar x) {
        for (const auto& [low, high] : token.ranges)
          if (x >= low && x <= high) return true;
        return false;
      };
      bool inside = inRanges(c);
      if (!inside && m_case == Qt::CaseInsensitive) inside = inRanges(c.toUpper()) || inRanges(c.toLower());
      return inside != token.negated;
    }
  }
  return false;
}

// A side of the match is checked only where the match itself begins or ends with a word character, so
// that ".Foo" still finds the member in "x.Foo".
bool FindMatcher::startAllowed(QStringView line, qsizetype start) const {
  return !m_wholeWord || start == 0 || !syntax::isIdentifierChar(line[start]) ||
         !syntax::isIdentifierChar(line[start - 1]);
}

bool FindMatcher::endAllowed(QStringView line, qsizetype end) const {
  return !m_wholeWord || end >= line.size() || !syntax::isIdentifierChar(line[end - 1]) ||
         !syntax::isIdentifierChar(line[end]);
}

// The pattern as a chain of states, state k meaning "the first k tokens are matched"; a "*" state also
// lets the chain through without taking a character. All starts are followed at once, each state keeping
// the earliest start that reached it: two matches in the same state go on alike, and the earlier start is
// the one a leftmost search wants. Starts a whole-word search refuses are never entered, so the merge loses
// nothing. Once a match is found, only states begun at or before it are followed, to lengthen it or to find
// one further left.
std::optional<std::pair<qsizetype, qsizetype>> FindMatcher::findPattern(QStringView line, qsizetype from,
                                                                        qsizetype limit) const {
  const size_t accept = m_tokens.size();
  std::vector<qsizetype> current(accept + 1, -1);
  std::vector<qsizetype> next(accept + 1, -1);
  const auto enter = [&](std::vector<qsizetype>& states, size_t state, qsizetype start) {
    for (;; ++state) {
      if (states[state] >= 0 && states[state] <= start) return;
      states[state] = start;
      if (state == accept || m_tokens[state].kind != TokenKind::AnyRun) return;
    }
  };
  const Token& first = m_tokens.front();
  std::optional<std::pair<qsizetype, qsizetype>> best;
  bool active = false;
  for (qsizetype p = from;; ++p) {
    if (!best) {
      // Nothing under way: go straight to the next place the first token can match.
      if (!active && first.kind != TokenKind::AnyRun) {
        while (p < limit && !tokenMatches(first, line[p]))
          ++p;
      }
      if (p < limit && startAllowed(line, p)) {
        enter(current, 0, p);
        active = true;
      }
    }
    if (const qsizetype start = current[accept]; start >= 0 && p > start && endAllowed(line, p)) {
      if (!best || start < best->first || (start == best->first && p > best->second)) best.emplace(start, p);
    }
    if (p >= limit) break;
    std::fill(next.begin(), next.end(), -1);
    active = false;
    for (size_t state = 0; state < accept; ++state) {
      const qsizetype start = current[state];
      if (start < 0 || (best && start > best->first)) continue;
      const Token& token = m_tokens[state];
      if (token.kind == TokenKind::AnyRun) {
        enter(next, state, start);
        active = true;
      } else if (tokenMatches(token, line[p])) {
        enter(next, state + 1, start);
        active = true;
      }
    }
    current.swap(next);
    if (!active && best) break;
  }
  return best;
}

std::optional<std::pair<qsizetype, qsizetype>> FindMatcher::findIn(QStringView line, qsizetype from,
                                                                   qsizetype limit) const {
  limit = std::min(limit, line.size());
  if (from < 0) from = 0;
  if (from >= limit) return std::nullopt;
  if (!m_pattern) {
    if (m_text.isEmpty()) return std::nullopt;
    for (qsizetype at = from;;) {
      const qsizetype found = m_folded.isEmpty() ? line.indexOf(m_text, at, m_case) : indexOfFolded(line, at);
      if (found < 0 || found + m_text.size() > limit) return std::nullopt;
      const qsizetype end = found + m_text.size();
      if (startAllowed(line, found) && endAllowed(line, end)) return std::pair(found, end);
      at = found + 1;
    }
  }
  if (m_tokens.empty()) return std::nullopt;
  return findPattern(line, from, limit);
}

}  // namespace host

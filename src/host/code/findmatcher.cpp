// SPDX-License-Identifier: MIT
#include "host/code/findmatcher.h"

#include "host/code/linesyntax.h"
#include "ide/error.h"

namespace host {
namespace {

inline constexpr long kInvalidPattern = 93;

QChar fold(QChar c) {
  return c.toCaseFolded();
}

}  // namespace

FindMatcher::FindMatcher(QStringView target, bool wholeWord, bool matchCase, bool patternSearch)
    : m_pattern(patternSearch),
      m_wholeWord(wholeWord),
      m_case(matchCase ? Qt::CaseSensitive : Qt::CaseInsensitive) {
  if (!patternSearch) {
    m_text = target.toString();
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
      if (close < 0) ide::raise(kInvalidPattern, QStringLiteral("Invalid pattern string"));
      QStringView list = target.sliced(i + 1, close - i - 1);
      i = close;
      if (list.isEmpty()) continue;  // "[]" matches the empty string
      token.kind = TokenKind::Class;
      if (list.front() == u'!') {
        token.negated = true;
        list = list.sliced(1);
      }
      // A comma is simply one more character of the list, which also gives "[a-z,0-9]" its meaning.
      for (qsizetype k = 0; k < list.size(); ++k) {
        QChar low = list[k];
        QChar high = low;
        if (k + 2 < list.size() && list[k + 1] == u'-') {
          high = list[k + 2];
          k += 2;
          if (high < low) ide::raise(kInvalidPattern, QStringLiteral("Invalid pattern string"));
        }
        token.ranges.emplace_back(low, high);
      }
    } else {
      token.literal = m_case == Qt::CaseInsensitive ? fold(c) : c;
    }
    m_tokens.push_back(std::move(token));
  }
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
bool FindMatcher::acceptsBounds(QStringView line, qsizetype start, qsizetype end) const {
  if (!m_wholeWord) return true;
  if (start > 0 && isIdentifierChar(line[start]) && isIdentifierChar(line[start - 1])) return false;
  if (end < line.size() && isIdentifierChar(line[end - 1]) && isIdentifierChar(line[end])) return false;
  return true;
}

std::optional<qsizetype> FindMatcher::longestPatternMatch(QStringView line, qsizetype start,
                                                          qsizetype limit) const {
  // Positions reachable after each token, as a bit per position from `start` to `limit`.
  const qsizetype width = limit - start + 1;
  std::vector<char> reach(static_cast<size_t>(width), 0);
  std::vector<char> next(static_cast<size_t>(width), 0);
  reach[0] = 1;
  for (const Token& token : m_tokens) {
    std::fill(next.begin(), next.end(), 0);
    bool any = false;
    if (token.kind == TokenKind::AnyRun) {
      qsizetype first = 0;
      while (first < width && !reach[static_cast<size_t>(first)])
        ++first;
      for (qsizetype p = first; p < width; ++p)
        next[static_cast<size_t>(p)] = 1;
      any = first < width;
    } else {
      for (qsizetype p = 0; p + 1 < width; ++p) {
        if (reach[static_cast<size_t>(p)] && tokenMatches(token, line[start + p])) {
          next[static_cast<size_t>(p + 1)] = 1;
          any = true;
        }
      }
    }
    if (!any) return std::nullopt;
    reach.swap(next);
  }
  for (qsizetype p = width - 1; p > 0; --p)
    if (reach[static_cast<size_t>(p)] && acceptsBounds(line, start, start + p)) return start + p;
  return std::nullopt;
}

std::optional<std::pair<qsizetype, qsizetype>> FindMatcher::findIn(QStringView line, qsizetype from,
                                                                   qsizetype limit) const {
  limit = std::min(limit, line.size());
  if (from < 0) from = 0;
  if (!m_pattern) {
    if (m_text.isEmpty()) return std::nullopt;
    for (qsizetype at = from;;) {
      const qsizetype found = line.indexOf(m_text, at, m_case);
      if (found < 0 || found + m_text.size() > limit) return std::nullopt;
      if (acceptsBounds(line, found, found + m_text.size())) return std::pair(found, found + m_text.size());
      at = found + 1;
    }
  }
  if (m_tokens.empty()) return std::nullopt;
  const Token& first = m_tokens.front();
  for (qsizetype start = from; start < limit; ++start) {
    if (first.kind != TokenKind::AnyRun && !tokenMatches(first, line[start])) continue;
    if (const auto end = longestPatternMatch(line, start, limit)) return std::pair(start, *end);
  }
  return std::nullopt;
}

}  // namespace host

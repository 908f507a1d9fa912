// SPDX-License-Identifier: MIT
// The matching behind CodeModule.Find: plain text or the IDE's wildcard patterns, which follow VB's Like
// operator (? any character, * any run, # a digit, [list] and [!list] with ranges; "[", "?", "#" and "*"
// stand for themselves inside brackets, "!" and "]" outside them, "[]" matches nothing), case-insensitive
// unless match case, and whole words.
#pragma once

#include <QString>
#include <QStringView>

#include <array>
#include <optional>
#include <utility>
#include <vector>

namespace host {

class FindMatcher {
 public:
  /// Compiles the target. A pattern with an unclosed "[" or a descending range throws ide::Error 93.
  FindMatcher(QStringView target, bool wholeWord, bool matchCase, bool patternSearch);

  /// The leftmost match in `line` that starts at or after `from` and ends at or before `limit` (0-based,
  /// end exclusive); for a pattern, the longest match at that start. Empty matches never count. A pattern
  /// is matched in one pass over the line, so that a long line cannot stall the search.
  std::optional<std::pair<qsizetype, qsizetype>> findIn(QStringView line, qsizetype from,
                                                        qsizetype limit) const;

  bool isEmpty() const { return m_text.isEmpty() && m_tokens.empty(); }

 private:
  enum class TokenKind : quint8 { Literal, AnyChar, Digit, AnyRun, Class };
  struct Token {
    TokenKind kind;
    QChar literal;                                // folded when the search ignores case
    bool negated = false;                         // [!list]
    std::vector<std::pair<QChar, QChar>> ranges;  // [list]: single characters are ranges of one
  };

  /// The next occurrence of the plain text at or after `from`, letter case folded; -1 when there is none.
  qsizetype indexOfFolded(QStringView line, qsizetype from) const;
  bool tokenMatches(const Token& token, QChar c) const;
  bool charsEqual(QChar a, QChar b) const;
  bool startAllowed(QStringView line, qsizetype start) const;
  bool endAllowed(QStringView line, qsizetype end) const;
  std::optional<std::pair<qsizetype, qsizetype>> findPattern(QStringView line, qsizetype from,
                                                             qsizetype limit) const;

  QString m_text;    // plain search
  QString m_folded;  // the plain text folded, when letter case is ignored
  /// Horspool's shifts by the low byte of a folded character (shared bytes take the smaller shift).
  std::array<quint8, 256> m_skip{};
  std::vector<Token> m_tokens;
  bool m_pattern = false;
  bool m_wholeWord = false;
  Qt::CaseSensitivity m_case = Qt::CaseInsensitive;
};

}  // namespace host

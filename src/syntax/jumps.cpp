// SPDX-License-Identifier: MIT
#include "syntax/jumps.h"

#include "syntax/line.h"

#include <algorithm>
#include <utility>

namespace syntax {
namespace {

/// A label's digits as the set holds them: "010" and "10" name the same line.
QString labelKey(QStringView digits) {
  qsizetype i = 0;
  while (i + 1 < digits.size() && digits[i] == u'0')
    ++i;
  return digits.sliced(i).toString();
}

bool isZero(QStringView digits) {
  return std::all_of(digits.begin(), digits.end(), [](QChar c) { return c == u'0'; });
}

/// The leading digits of a line that begins with a numeric label ("10 x", "10: x", "10"), else empty.
QStringView leadingLabel(QStringView trimmed) {
  qsizetype i = 0;
  while (i < trimmed.size() && isDigit(trimmed[i].unicode()))
    ++i;
  if (i < trimmed.size() && !isBlank(trimmed[i]) && trimmed[i] != u':' && trimmed[i] != u'\'') return {};
  return trimmed.first(i);
}

/// `line` after its leading blanks and its numeric label, if it has one.
QStringView withoutLeadingLabel(QStringView line) {
  const QStringView code = line.sliced(leadingBlanks(line).size());
  return code.sliced(leadingLabel(code).size());
}

/// False when a whole statement cannot name a label: it has no digit (but for its own label), or no word
/// that begins like GoTo, GoSub, Resume, Then or Else. Most lines are passed over after this one look.
bool mayNameALabel(QStringView code) noexcept {
  bool digit = false;
  bool keyword = false;
  bool inWord = false;
  for (qsizetype i = 0; i < code.size(); ++i) {
    const char16_t c = code[i].unicode();
    const bool wordChar = (c | 0x20) >= u'a' && (c | 0x20) <= u'z';
    if (isDigit(c)) {
      digit = true;
    } else if (wordChar && !inWord && i + 1 < code.size()) {
      const char16_t pair[2] = {char16_t(c | 0x20), char16_t(code[i + 1].unicode() | 0x20)};
      keyword = keyword || (pair[0] == u'g' && pair[1] == u'o') || (pair[0] == u'r' && pair[1] == u'e') ||
                (pair[0] == u't' && pair[1] == u'h') || (pair[0] == u'e' && pair[1] == u'l');
    }
    inWord = wordChar || isIdentifierChar(c);
  }
  return digit && keyword;
}

/// Reads the labels a procedure jumps to, statement by statement, one physical line at a time.
class JumpReader {
 public:
  explicit JumpReader(QSet<QString>& labels) : m_labels(labels) {}

  void read(QStringView line) {
    const bool continued = continues(line);
    const bool carried = std::exchange(m_carried, continued);
    if (m_inComment) {  // a comment goes on over its continuation marks
      m_inComment = continued;
      return;
    }
    if (!carried && !continued && !mayNameALabel(withoutLeadingLabel(line))) return;
    const QStringView text = withoutContinuationMark(line);
    Tokenizer tokens(text);
    Token token;
    while (tokens.next(token)) {
      const QStringView word = text.sliced(token.start, token.length);
      switch (token.type) {
        case Token::Type::Comment:
          m_inComment = continued;
          endStatement();
          return;
        case Token::Type::Colon:
          endStatement();
          break;
        case Token::Type::Comma:
          m_expect = m_expect == Expect::NextLabel ? Expect::Label : Expect::Nothing;
          break;
        case Token::Type::Number:
          if (token.digitsOnly)
            number(word);
          else
            m_expect = Expect::Nothing;  // 1.5, 1E3: a value, not a label
          break;
        case Token::Type::Word:
          this->word(word);
          break;
        default:
          m_expect = Expect::Nothing;
          break;
      }
    }
    if (!continued) endStatement();
  }

 private:
  enum class Expect {
    Nothing,
    Label,        // after GoTo or GoSub, or after a comma in their list
    NextLabel,    // a label of the list was read: a comma brings the next one
    ResumeLabel,  // after Resume
    IfLabel,      // after Then or Else: a number there is a jump
  };

  void endStatement() {
    m_expect = Expect::Nothing;
    m_words = 0;
    m_on = m_local = m_onError = false;
  }

  void word(QStringView w) {
    const int position = m_words++;
    if (isKeyword(w, u"GoTo") || isKeyword(w, u"GoSub")) {
      m_expect = Expect::Label;
      m_zeroNamesNoLabel = m_onError && isKeyword(w, u"GoTo");  // On Error GoTo 0
      return;
    }
    if (isKeyword(w, u"Resume")) {
      m_expect = Expect::ResumeLabel;
      return;
    }
    if (isKeyword(w, u"Then") || isKeyword(w, u"Else")) {
      m_expect = Expect::IfLabel;
      return;
    }
    if (position == 0 && isKeyword(w, u"On")) {
      m_on = true;
    } else if (m_on && position == 1 && isKeyword(w, u"Local")) {
      m_local = true;
    } else if (m_on && position == (m_local ? 2 : 1) && isKeyword(w, u"Error")) {
      m_onError = true;
    }
    // A named label in a GoTo list: a comma may bring another one.
    m_expect = m_expect == Expect::Label ? Expect::NextLabel : Expect::Nothing;
  }

  void number(QStringView digits) {
    switch (m_expect) {
      case Expect::Label:
        if (!(m_zeroNamesNoLabel && isZero(digits))) m_labels.insert(labelKey(digits));
        m_expect = Expect::NextLabel;
        return;
      case Expect::ResumeLabel:
        if (!isZero(digits)) m_labels.insert(labelKey(digits));  // Resume 0 is Resume
        break;
      case Expect::IfLabel:
        m_labels.insert(labelKey(digits));
        break;
      default:
        break;  // a line's own label, or a value
    }
    m_expect = Expect::Nothing;
  }

  QSet<QString>& m_labels;
  Expect m_expect = Expect::Nothing;
  int m_words = 0;  // words read in the statement so far
  bool m_on = false;
  bool m_local = false;
  bool m_onError = false;
  bool m_zeroNamesNoLabel = false;
  bool m_inComment = false;
  bool m_carried = false;  // the line before ended with the continuation mark
};

}  // namespace

JumpTargets::JumpTargets(std::span<const QString> lines) {
  // Only a line with a numeric label can be a target: most procedures have none, and need no reading.
  if (std::none_of(lines.begin(), lines.end(),
                   [](const QString& line) { return !leadingLabel(trimmedView(line)).isEmpty(); }))
    return;
  JumpReader reader(m_labels);
  for (const QString& line : lines)
    reader.read(line);
}

bool JumpTargets::isTarget(QStringView line) const {
  if (m_labels.isEmpty()) return false;
  const QStringView label = leadingLabel(line.sliced(leadingBlanks(line).size()));
  return !label.isEmpty() && m_labels.contains(labelKey(label));
}

}  // namespace syntax

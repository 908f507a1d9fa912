// SPDX-License-Identifier: MIT
// Line numbering rules. These run on every line of whole projects, so they look at views of the line and
// build a new text only for a line that changes.
#include "transform/numbering.h"

#include <algorithm>
#include <charconv>
#include <iterator>
#include <limits>
#include <utility>

namespace transform {

LineNumberOverflow::LineNumberOverflow() : ide::Error(kOverflowError, QStringLiteral("Overflow")) {}

namespace {

// Statements and reserved words that cannot name a label, so "Else:" or "End:" is a statement followed by
// an empty one. Words that may also be identifiers (Name, Line, Width, Load ...) are left out on purpose:
// taking a real label for a statement would number it and break the line.
constexpr QStringView kReservedWords[] = {
    u"And",     u"As",       u"Beep",   u"Boolean",    u"ByRef",      u"Byte",       u"ByVal",
    u"Call",    u"Case",     u"Close",  u"Const",      u"Currency",   u"Date",       u"Declare",
    u"Dim",     u"Do",       u"Double", u"Each",       u"Else",       u"ElseIf",     u"Empty",
    u"End",     u"EndIf",    u"Enum",   u"Eqv",        u"Erase",      u"Event",      u"Exit",
    u"False",   u"For",      u"Friend", u"Function",   u"Get",        u"Global",     u"GoSub",
    u"GoTo",    u"If",       u"Imp",    u"Implements", u"In",         u"Integer",    u"Is",
    u"Let",     u"Like",     u"Lock",   u"Long",       u"Loop",       u"LSet",       u"Me",
    u"Mod",     u"New",      u"Next",   u"Not",        u"Nothing",    u"Null",       u"Object",
    u"On",      u"Open",     u"Option", u"Optional",   u"Or",         u"ParamArray", u"Preserve",
    u"Private", u"Property", u"Public", u"Put",        u"RaiseEvent", u"Randomize",  u"ReDim",
    u"Rem",     u"Reset",    u"Resume", u"Return",     u"RSet",       u"Seek",       u"Select",
    u"Set",     u"Single",   u"Static", u"Step",       u"Stop",       u"String",     u"Sub",
    u"Then",    u"To",       u"True",   u"Type",       u"TypeOf",     u"Unlock",     u"Until",
    u"Variant", u"Wend",     u"While",  u"With",       u"WithEvents", u"Write",      u"Xor",
};

bool isReservedWord(QStringView word) {
  // Keywords are case-insensitive in the language, whatever case the text happens to have.
  return std::any_of(std::begin(kReservedWords), std::end(kReservedWords),
                     [word](QStringView keyword) { return word.compare(keyword, Qt::CaseInsensitive) == 0; });
}

// True when `t` begins with an identifier label such as "ErrorHandler:".
bool beginsWithLabel(QStringView t) {
  if (t.isEmpty() || !t.front().isLetter()) return false;
  qsizetype i = 1;
  while (i < t.size() && (t[i].isLetterOrNumber() || t[i] == u'_'))
    ++i;
  return i < t.size() && t[i] == u':' && !isReservedWord(t.first(i));
}

// Declarations, directives and Case lines: never numbered, but their continuation lines must not be
// numbered either.
bool isUnnumberedStatement(QStringView t) {
  static constexpr QStringView kPrefixes[] = {
      u"Private ", u"Public ", u"Friend ", u"Case ", u"Event ", u"Sub ", u"Function ", u"Property ", u"#",
  };
  return std::any_of(std::begin(kPrefixes), std::end(kPrefixes),
                     [t](QStringView p) { return t.front() == p.front() && t.startsWith(p); });
}

qint32 nextNumber(qint32 runningNumber, qint32 interval) {
  const qint64 next = qint64(runningNumber) + interval;
  if (next > std::numeric_limits<qint32>::max() || next < std::numeric_limits<qint32>::min()) {
    throw LineNumberOverflow();
  }
  return qint32(next);
}

void appendNumber(QString& out, qint32 number) {
  char digits[16];
  const auto end = std::to_chars(digits, digits + sizeof digits, number).ptr;
  out.append(QLatin1StringView(digits, end - digits));
}

// The number, the separator, the indentation and the rest, in one allocation.
QString numbered(qint32 number, QStringView separator, QStringView indent, QStringView rest) {
  QString out;
  out.reserve(12 + separator.size() + indent.size() + rest.size());
  appendNumber(out, number);
  out.append(separator).append(indent).append(rest);
  return out;
}

// --- Jumps to numeric labels

constexpr bool isDigit(QChar c) noexcept {
  return c >= u'0' && c <= u'9';
}

/// `word` is `keyword` in any letter case (keywords are ASCII letters: setting the case bit cannot make
/// another character equal to one).
bool isKeyword(QStringView word, QStringView keyword) noexcept {
  if (word.size() != keyword.size()) return false;
  for (qsizetype i = 0; i < word.size(); ++i)
    if ((word[i].unicode() | 0x20) != (keyword[i].unicode() | 0x20)) return false;
  return true;
}

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
  while (i < trimmed.size() && isDigit(trimmed[i]))
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
    if (c >= u'0' && c <= u'9') {
      digit = true;
    } else if (wordChar && !inWord && i + 1 < code.size()) {
      const char16_t pair[2] = {char16_t(c | 0x20), char16_t(code[i + 1].unicode() | 0x20)};
      keyword = keyword || (pair[0] == u'g' && pair[1] == u'o') || (pair[0] == u'r' && pair[1] == u'e') ||
                (pair[0] == u't' && pair[1] == u'h') || (pair[0] == u'e' && pair[1] == u'l');
    }
    inWord = wordChar || (c >= u'0' && c <= u'9') || c == u'_' || c > 0x7F;
  }
  return digit && keyword;
}

/// Reads the labels a procedure jumps to, statement by statement, one physical line at a time.
class JumpReader {
 public:
  explicit JumpReader(QSet<QString>& labels) : m_labels(labels) {}

  void read(QStringView line) {
    const bool continues = isContinued(line);
    const bool carried = std::exchange(m_carried, continues);
    if (m_inComment) {  // a comment goes on over its continuation marks
      m_inComment = continues;
      return;
    }
    if (!carried && !continues && !mayNameALabel(withoutLeadingLabel(line))) return;
    const QStringView text = continues ? rightTrimmedView(line).chopped(1) : line;
    const qsizetype n = text.size();
    qsizetype i = 0;
    while (i < n) {
      const QChar c = text[i];
      if (isBlank(c)) {
        ++i;
      } else if (c == u'"') {
        i = text.indexOf(u'"', i + 1);
        i = i < 0 ? n : i + 1;
        m_expect = Expect::Nothing;
      } else if (c == u'\'') {
        m_inComment = continues;
        endStatement();
        return;
      } else if (c == u':' && (i + 1 == n || text[i + 1] != u'=')) {
        endStatement();
        ++i;
      } else if (c == u',') {
        m_expect = m_expect == Expect::NextLabel ? Expect::Label : Expect::Nothing;
        ++i;
      } else if (isDigit(c)) {
        const qsizetype start = i;
        while (i < n && isDigit(text[i]))
          ++i;
        if (i < n && (text[i].isLetterOrNumber() || text[i] == u'_' || text[i] == u'.')) {
          m_expect = Expect::Nothing;  // 1.5, 1E3: a value, not a label
          while (i < n && (text[i].isLetterOrNumber() || text[i] == u'_' || text[i] == u'.'))
            ++i;
        } else {
          number(text.sliced(start, i - start));
        }
      } else if (c.isLetter() || c == u'_') {
        const qsizetype start = i;
        while (i < n && (text[i].isLetterOrNumber() || text[i] == u'_'))
          ++i;
        if (word(text.sliced(start, i - start))) {  // Rem
          m_inComment = continues;
          endStatement();
          return;
        }
      } else {
        m_expect = Expect::Nothing;
        ++i;
      }
    }
    if (!continues) endStatement();
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

  /// Returns true when the word begins a Rem comment.
  bool word(QStringView w) {
    const int position = m_words++;
    if (position == 0 && isKeyword(w, u"Rem")) return true;
    if (isKeyword(w, u"GoTo") || isKeyword(w, u"GoSub")) {
      m_expect = Expect::Label;
      m_zeroNamesNoLabel = m_onError && isKeyword(w, u"GoTo");  // On Error GoTo 0
      return false;
    }
    if (isKeyword(w, u"Resume")) {
      m_expect = Expect::ResumeLabel;
      return false;
    }
    if (isKeyword(w, u"Then") || isKeyword(w, u"Else")) {
      m_expect = Expect::IfLabel;
      return false;
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
    return false;
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

/// `text` without its first character when that is a blank.
QStringView withoutOneBlank(QStringView text) {
  return !text.isEmpty() && isBlank(text.front()) ? text.sliced(1) : text;
}

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

bool NumberLine(QString& line, qint32& runningNumber, bool& continuation, qint32 interval,
                const JumpTargets& targets) {
  const QStringView whole(line);
  const QStringView indent = leadingBlanks(whole);
  const QStringView t = trimmedView(whole.sliced(indent.size()));

  const bool continues = endsWithContinuation(t);
  if (t.isEmpty() || t.front() == u'\'') {
    // A comment ends a continued statement, but one that ends with the mark goes on over the next line
    // as comment text, which takes no number (and whose first word removing numbers must not take).
    continuation = !t.isEmpty() && continues;
    return false;
  }
  if (continuation) {
    // A continuation line never gets a number; the statement ends where the mark stops.
    continuation = continues;
    return false;
  }
  if (targets.isTarget(t)) {
    // A jump's target: a new number would leave the jump without it.
    continuation = continues;
    return false;
  }
  if (isUsableNumber(t)) {
    line.clear();
    return true;
  }
  if (isProcedureEnd(t)) return false;
  if (isUnnumberedStatement(t) || beginsWithLabel(t)) {
    continuation = continues;
    return false;
  }

  qint32 number = runningNumber;
  QString result;
  // Old numbers and labels are looked for only where the line begins like a number.
  const bool numeric = mayBeginNumber(t);
  const qsizetype colon = numeric ? t.indexOf(u':') : -1;
  const qsizetype quote = numeric ? t.indexOf(u'\'') : -1;
  if (colon > 0 && isUsableNumber(t.first(colon))) {
    // An old numeric label "10: x" becomes a line number, in the place of the label and its separator.
    number = nextNumber(runningNumber, interval);
    result = numbered(number, u" ", indent, withoutOneBlank(t.sliced(colon + 1)));
  } else if (quote > 0 && isUsableNumber(t.first(quote))) {
    // A number in front of a comment labels nothing; it is dropped.
    result.reserve(indent.size() + t.size() - quote);
    result.append(indent).append(t.sliced(quote));
  } else {
    number = nextNumber(runningNumber, interval);
    const qsizetype blank = indexOfBlank(t);
    if (blank < 0) {
      // One word (Else, Loop, Next): two spaces keep it clear of the number.
      result = numbered(number, u"  ", {}, whole);
    } else if (numeric && isUsableNumber(t.first(blank))) {
      // The line already carries a number: the new one takes its place and its blank, keeps what
      // followed them, so that numbering again changes nothing.
      result = numbered(number, u" ", indent, t.sliced(blank + 1));
    } else {
      result = numbered(number, u" ", {}, whole);
    }
  }

  continuation = continues;
  runningNumber = number;
  if (result == line) return false;
  line = std::move(result);
  return true;
}

bool UnnumberLine(QString& line) {
  const QStringView whole(line);
  const QStringView indent = leadingBlanks(whole);
  const QStringView t = whole.sliced(indent.size());
  if (!mayBeginNumber(t)) return false;  // blank lines too

  QStringView rest;
  const qsizetype colon = t.indexOf(u": ");
  if (colon > 0 && isUsableNumber(t.first(colon))) {
    rest = t.sliced(colon + 2);
  } else {
    const qsizetype blank = indexOfBlank(t);
    if (blank < 0 || !isUsableNumber(t.first(blank))) return false;
    rest = t.sliced(blank + 1);
    // A one-word line was numbered with two blanks: the second goes too.
    const QStringView word = trimmedView(rest);
    if (rest.startsWith(u' ') && !word.isEmpty() && indexOfBlank(word) < 0) rest = rest.sliced(1);
  }

  QString result;
  result.reserve(indent.size() + rest.size());
  result.append(indent).append(rest);
  line = std::move(result);
  return true;
}

bool UnnumberLine(QString& line, bool& continuation, const JumpTargets& targets) {
  const bool continuationLine = continuation;
  continuation = endsWithContinuation(trimmedView(line));
  return !continuationLine && !targets.isTarget(line) && UnnumberLine(line);
}

}  // namespace transform

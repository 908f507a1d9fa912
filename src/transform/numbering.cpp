// SPDX-License-Identifier: MIT
// Line numbering rules. These run on every line of whole projects, so they look at views of the line and
// build a new text only for a line that changes.
#include "transform/numbering.h"

#include <algorithm>
#include <charconv>
#include <iterator>
#include <limits>

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

}  // namespace

bool NumberLine(QString& line, qint32& runningNumber, bool& continuation, qint32 interval) {
  const QStringView whole(line);
  const QStringView indent = leadingBlanks(whole);
  const QStringView t = trimmedView(whole.sliced(indent.size()));

  if (t.isEmpty() || t.front() == u'\'') {
    continuation = false;
    return false;
  }
  const bool continues = endsWithContinuation(t);
  if (continuation) {
    // A continuation line never gets a number; the statement ends where the mark stops.
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
    // An old numeric label "10: x" becomes a line number.
    number = nextNumber(runningNumber, interval);
    result = numbered(number, u" ", indent, t.sliced(colon + 1));
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
      // The line already carries a number: replace it, keep what followed it.
      result = numbered(number, u" ", indent, t.sliced(blank));
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

  qsizetype cut = 0;
  const qsizetype colon = t.indexOf(u": ");
  if (colon > 0 && isUsableNumber(t.first(colon))) {
    cut = colon + 2;
  } else {
    const qsizetype blank = indexOfBlank(t);
    if (blank < 0 || !isUsableNumber(t.first(blank))) return false;
    cut = blank + 1;
  }

  QString result;
  result.reserve(indent.size() + t.size() - cut);
  result.append(indent).append(t.sliced(cut));
  line = std::move(result);
  return true;
}

bool UnnumberLine(QString& line, bool& continuation) {
  const bool continuationLine = continuation;
  continuation = endsWithContinuation(trimmedView(line));
  return !continuationLine && UnnumberLine(line);
}

}  // namespace transform

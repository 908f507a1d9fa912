// SPDX-License-Identifier: MIT
// Line numbering rules. These run on every line of whole projects, so they look at views of the line and
// build a new text only for a line that changes. What a line is comes from the syntax library.
#include "transform/numbering.h"

#include "syntax/line.h"

#include <charconv>
#include <limits>
#include <utility>

namespace transform {

LineNumberOverflow::LineNumberOverflow() : walk::RunStopped(kOverflowError, QStringLiteral("Overflow")) {}

namespace {

using syntax::Kind;
using syntax::NumberPrefix;

// Declarations, directives, procedure headers and Case lines: never numbered, and their continuation
// lines are not numbered either.
bool takesNoNumber(syntax::Statement statement) {
  if (statement.scoped || syntax::isDirective(statement.kind)) return true;
  switch (statement.kind) {
    case Kind::ProcHeader:
    case Kind::Event:
    case Kind::Declare:
    case Kind::Case:
    case Kind::Attribute:
    case Kind::TypeBegin:
    case Kind::TypeEnd:
    case Kind::EnumBegin:
    case Kind::EnumEnd:
      return true;
    default:
      return false;
  }
}

qint32 nextNumber(qint32 runningNumber, qint32 interval) {
  const qint64 next = qint64(runningNumber) + interval;
  if (next > std::numeric_limits<qint32>::max() || next < std::numeric_limits<qint32>::min()) {
    throw LineNumberOverflow();
  }
  return qint32(next);
}

// A number a kept label already has would label two lines: it is passed over.
qint32 nextFreeNumber(qint32 runningNumber, qint32 interval, const JumpTargets& targets) {
  qint32 number = nextNumber(runningNumber, interval);
  while (targets.names(number))
    number = nextNumber(number, interval);
  return number;
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

/// `text` without its first character when that is a blank.
QStringView withoutOneBlank(QStringView text) {
  return !text.isEmpty() && syntax::isBlank(text.front()) ? text.sliced(1) : text;
}

/// NumberLine, with the line's statement already classified when `known` is given.
bool numberLine(QString& line, qint32& runningNumber, bool& continuation, qint32 interval,
                const JumpTargets& targets, const syntax::Statement* known) {
  const QStringView whole(line);
  const QStringView indent = syntax::leadingBlanks(whole);
  const QStringView code = whole.sliced(indent.size());  // trailing blanks kept: they are the line's own
  const QStringView t = syntax::rightTrimmedView(code);
  const bool continues = syntax::continues(t);

  if (t.isEmpty()) {
    continuation = false;
    return false;
  }
  if (continuation) {
    // A continuation line never gets a number; the statement ends where the mark stops.
    continuation = continues;
    return false;
  }
  const syntax::Statement statement = known ? *known : syntax::classify(t);
  // A comment ends a continued statement, but one that ends with the mark goes on over the next line as
  // comment text, which takes no number. A line holding only the mark has no code to number either.
  if (statement.kind == Kind::Comment || t == u"_") {
    continuation = continues;
    return false;
  }
  if (targets.isTarget(t)) {
    // A jump's target: a new number would leave the jump without it.
    continuation = continues;
    return false;
  }
  const NumberPrefix prefix = syntax::numberPrefix(t);
  // A number alone ("10", "10:") labels nothing that a new number could label.
  if (prefix.form == NumberPrefix::Form::Alone ||
      (prefix.form == NumberPrefix::Form::Colon && syntax::isBlankLine(prefix.rest))) {
    line.clear();
    return true;
  }
  if (statement.kind == Kind::ProcEnd) return false;
  if (takesNoNumber(statement) || syntax::beginsWithLabel(t)) {
    continuation = continues;
    return false;
  }

  qint32 number = runningNumber;
  QString result;
  const QStringView rest = prefix ? code.sliced(prefix.number.size()) : QStringView();
  if (prefix.commentFollows()) {
    // A number in front of a comment labels nothing; it is dropped with the blanks after it.
    const QStringView comment = rest.sliced(syntax::leadingBlanks(rest).size());
    result.reserve(indent.size() + comment.size());
    result.append(indent).append(comment);
  } else if (prefix) {
    // An old number or numeric label: the new number takes its place and its separator (the colon and a
    // blank after it, or one blank) and keeps what followed, so that numbering again changes nothing.
    number = nextFreeNumber(runningNumber, interval, targets);
    const QStringView after = rest.sliced(1);
    result = numbered(number, u" ", indent,
                      prefix.form == NumberPrefix::Form::Colon ? withoutOneBlank(after) : after);
  } else {
    number = nextFreeNumber(runningNumber, interval, targets);
    // One word (Else, Loop): two spaces keep it clear of the number.
    result = numbered(number, syntax::indexOfBlank(t) < 0 ? u"  " : u" ", {}, whole);
  }

  continuation = continues;
  runningNumber = number;
  if (result == line) return false;
  line = std::move(result);
  return true;
}

}  // namespace

bool NumberLine(QString& line, qint32& runningNumber, bool& continuation, qint32 interval,
                const JumpTargets& targets) {
  return numberLine(line, runningNumber, continuation, interval, targets, nullptr);
}

bool BodyNumbering::number(QString& line) {
  if (m_inTypeBlock) {
    const Kind kind = syntax::classify(line).kind;
    m_inTypeBlock = kind != Kind::TypeEnd && kind != Kind::EnumEnd;
    m_continuation = false;
    return false;
  }
  if (m_continuation) return numberLine(line, m_number, m_continuation, m_interval, m_targets, nullptr);
  const syntax::Statement statement = syntax::classify(line);
  m_inTypeBlock = statement.kind == Kind::TypeBegin || statement.kind == Kind::EnumBegin;
  return numberLine(line, m_number, m_continuation, m_interval, m_targets, &statement);
}

bool UnnumberLine(QString& line) {
  const QStringView whole(line);
  const QStringView indent = syntax::leadingBlanks(whole);
  const QStringView t = whole.sliced(indent.size());
  const NumberPrefix prefix = syntax::numberPrefix(t);
  if (!prefix || prefix.form == NumberPrefix::Form::Alone) return false;

  QStringView rest = prefix.rest;
  if (prefix.form == NumberPrefix::Form::Colon) {
    rest = withoutOneBlank(rest);
  } else if (prefix.form == NumberPrefix::Form::Blank) {
    if (syntax::isBlankLine(rest)) return false;  // the number alone, with trailing blanks
    // A one-word line was numbered with two blanks: the second goes too.
    const QStringView word = syntax::trimmedView(rest);
    if (rest.startsWith(u' ') && syntax::indexOfBlank(word) < 0) rest = rest.sliced(1);
  }

  QString result;
  result.reserve(indent.size() + rest.size());
  result.append(indent).append(rest);
  line = std::move(result);
  return true;
}

bool UnnumberLine(QString& line, bool& continuation, const JumpTargets& targets) {
  const bool continuationLine = continuation;
  continuation = syntax::continues(line);
  return !continuationLine && !targets.isTarget(line) && UnnumberLine(line);
}

}  // namespace transform

// SPDX-License-Identifier: MIT
// Per-line rules for adding line numbers to, and removing them from, the executable lines of a procedure.
// Walkers feed the lines of one procedure body in order and replace only the lines reported changed.
#pragma once

#include "ide/error.h"
#include "syntax/jumps.h"
#include "walk/runstopped.h"

#include <QString>
#include <QStringView>

namespace transform {

/// The object model's number for an arithmetic overflow.
inline constexpr long kOverflowError = 6;

/// Thrown by NumberLine when the next line number would leave the 32-bit range. A wrapped number would
/// write negative or duplicate labels into the module, so the run must stop; walkers catch it as any
/// ide::Error and report the failure of their scope.
class LineNumberOverflow : public walk::RunStopped {
 public:
  LineNumberOverflow();
};

using syntax::JumpTargets;

/// Adds a line number to one line of a procedure body (the header, its continuation lines and the End line
/// are never passed in). `runningNumber` is the number of the previous numbered line: a walker starts each
/// procedure with the start number minus `interval`. `continuation` is true while the previous line's
/// statement goes on; a walker starts each procedure with false. Both are updated in place.
///
/// Lines that never get a number: blank and comment lines, continuation lines, declarations and directives
/// (Private, Public, Friend, Event, Sub, Function, Property, "#"), End Sub/Function/Property, Case lines and
/// lines that begin with a label ("ErrorHandler:"), since a line carries only one label. A line that holds
/// only a number is emptied. An existing number in front of code is replaced, together with the blank (or
/// the colon and blank) that separated it, so numbering twice gives the text of once; one in front of a
/// comment is dropped. Otherwise the new number and a space go in front of the line as it was; a one-word
/// line (Else, Loop) gets two spaces. Leading blanks are kept exactly (tabs included). A line that begins
/// with a label one of `targets` names is left as it is and takes no number.
///
/// Returns whether `line` changed. Throws LineNumberOverflow, leaving every argument untouched, when the
/// line would be numbered past the 32-bit range.
bool NumberLine(QString& line, qint32& runningNumber, bool& continuation, qint32 interval,
                const JumpTargets& targets = JumpTargets());

/// NumberLine over the body of one procedure, line after line, with the state the lines pass on: the
/// running number, the continuation flag, and a Type or Enum block that broken code may hold inside a
/// procedure (its lines are declarations, which never get a number: numbering its End line would hide
/// the block's end from every reader of the module).
class BodyNumbering {
 public:
  BodyNumbering(qint32 numberBeforeFirst, qint32 interval, const JumpTargets& targets)
      : m_number(numberBeforeFirst), m_interval(interval), m_targets(targets) {}
  /// Numbers the next line; returns whether it changed. Throws LineNumberOverflow as NumberLine.
  bool number(QString& line);
  /// The next numbered line gets `numberBefore` + the interval.
  void continueFrom(qint32 numberBefore) { m_number = numberBefore; }

 private:
  qint32 m_number;
  qint32 m_interval;
  const JumpTargets& m_targets;
  bool m_continuation = false;
  bool m_inTypeBlock = false;
};

/// Removes the line number from one line: a leading usable number followed by ": " loses the number and
/// those two characters; a leading usable number followed by a blank loses the number and that one blank,
/// so the indentation written after it remains. When what is left is one word after a blank and its own
/// leading blanks, that blank goes too: it is the second of the two that numbering writes after the number
/// of a one-word line, so removing numbers gives back the code as it was before numbering. Leading blanks
/// are kept. Returns whether `line` changed.
bool UnnumberLine(QString& line);

/// As UnnumberLine, but leaves continuation lines alone: a line after one that ends with " _" continues a
/// statement (or a comment) and its first word is an operand, not a line number, so "    2 * b" must not
/// lose its "2". `continuation` says whether the previous line ended with " _"; a walker starts each
/// procedure with false. A line that begins with a label one of `targets` names keeps it. Walkers use this
/// form.
bool UnnumberLine(QString& line, bool& continuation, const JumpTargets& targets = JumpTargets());

}  // namespace transform

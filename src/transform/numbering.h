// SPDX-License-Identifier: MIT
// Per-line rules for adding line numbers to, and removing them from, the executable lines of a procedure.
// Walkers feed the lines of one procedure body in order and replace only the lines reported changed.
#pragma once

#include "ide/error.h"
#include "transform/linetext.h"

#include <QSet>
#include <QString>
#include <QStringView>

#include <span>

namespace transform {

/// The object model's number for an arithmetic overflow.
inline constexpr long kOverflowError = 6;

/// Thrown by NumberLine when the next line number would leave the 32-bit range. A wrapped number would
/// write negative or duplicate labels into the module, so the run must stop; walkers catch it as any
/// ide::Error and report the failure of their scope.
class LineNumberOverflow : public ide::Error {
 public:
  LineNumberOverflow();
};

/// The numeric labels that the statements of one procedure jump to: the labels after GoTo, GoSub and
/// Resume, the lists of On ... GoTo and On ... GoSub, and a number right after Then or Else (a one-line If
/// jumps there). Jumps inside string literals and comments do not count, and On Error GoTo 0 and Resume 0
/// name no label. A line that begins with such a label is the target of a jump: numbering or removing
/// numbers there would leave the jump without its target, so the rules leave the line exactly as it is.
class JumpTargets {
 public:
  /// No jumps.
  JumpTargets() = default;
  /// The jumps of a procedure's lines, continued statements included.
  explicit JumpTargets(std::span<const QString> lines);

  /// True when `line` begins (after its leading blanks) with a numeric label that a jump names.
  bool isTarget(QStringView line) const;

 private:
  QSet<QString> m_labels;  // the label's digits without leading zeros
};

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

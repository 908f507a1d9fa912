// SPDX-License-Identifier: MIT
// Per-line rules that rewrite the leading white space of code: block levels, continuation lines and the
// column that keeps line numbers at the left margin. Walkers drive an Indenter over one procedure body or
// one declarations section at a time and replace only the lines reported changed.
#pragma once

#include "syntax/line.h"

#include <QString>
#include <QStringView>

#include <algorithm>
#include <ranges>
#include <vector>

namespace transform {

/// What opened a level. Only IT_ABSOLUTE and IT_RELATIVE are produced; the other bits are part of the
/// public enumeration and kept for callers that share it.
enum INDENTER_TYPE : qint32 {
  IT_ABSOLUTE = 1,  // a block opened by a keyword (If, For, Select Case, #If, Type ...)
  IT_RELATIVE = 2,  // the extra level of a statement continued with " _"
  IT_META = 4,
  IT_IFLINE = 8,
  IT_CASELINE = 16,
};

/// One level record: what opened it and the indentation of its body lines, counted in output units
/// (spaces in space mode, tabs in tab mode).
struct CIndenter {
  qint32 iType = 0;
  qint32 Indentation = 0;

  CIndenter Copy() const { return *this; }
};

enum class IndentMode { Tabs, Spaces };

/// True when the trimmed `If`/`ElseIf`/`#If`/`#ElseIf` line opens a block: its statement part ends with
/// "Then", or it is continued with " _" (decided later by IfEndsSingleLine).
///
/// The statement part is the text before the comment mark. A "'" inside a string literal ("...", with ""
/// for a quote) is text, not a comment mark, so `If s = "'" Then` and `If x Then MsgBox "it's"` are judged
/// on their code. A blank before "Then" and before the comment may be a tab. String literals need no such
/// care elsewhere: a number prefix is only recognised when everything before its ":", "'" or blank is a
/// number, which a quote never is, and a string cannot run over a line end, so a trailing " _" is always a
/// continuation mark.
bool IsBlockIf(QStringView trimmed);

/// Called on the lines that continue an If header: true when `trimmed` ends the header (does not end with
/// " _") and the If turned out to be single-line, i.e. code follows its Then or there is no Then.
bool IfEndsSingleLine(QStringView trimmed);

/// Length of the line-number prefix of `line` (0 when it has none), as the indenter writes it back:
/// "10:" for a numeric label (the number and its colon), "10 " for a number in front of code or of a
/// comment (the number and one space). Blanks after the number, tabs included, belong to the indentation,
/// so measuring an indented line gives the same width as measuring the line before it was indented.
qsizetype numberPrefixLength(QStringView line);

/// The number column of a procedure: spaces as wide as the widest number prefix of its body lines (the
/// lines after the header and its continuation lines, up to the last line), or an empty text. Continuation
/// lines are passed over: a line number can only stand in front of a statement, and a continuation line
/// that begins with a number ("2 + _") carries an operand, not a label.
template <std::ranges::input_range Lines>
QString NumberColumnWidth(const Lines& bodyLines) {
  qsizetype width = 0;
  bool continued = false;
  for (const auto& line : bodyLines) {
    const QStringView trimmed = syntax::trimmedView(QStringView(line));
    if (trimmed.isEmpty()) continue;
    if (!continued) width = std::max(width, numberPrefixLength(trimmed));
    continued = syntax::continues(trimmed);
  }
  return QString(width, u' ');
}

/// The indentation state of one walk: the current level, the stack of open levels, the unit and mode, the
/// If and Case header continuation flags and the number column.
///
/// A procedure walk: beginProcedure(NumberColumnWidth(body lines)); statementContinued :=
/// isContinued(header line); IndentLine on every line after the header line up to, not including, the last
/// non-blank line (the End line), header continuation lines included. A declarations walk:
/// beginDeclarations(); statementContinued := false; IndentDeclarationLine on every declaration line.
///
/// A line is reported changed only when its text differs, so that walkers replace only those lines through
/// the IDE; rewriting every line would cost a replace per line on code that is already indented.
class Indenter {
 public:
  /// `spaces` is the unit in space mode and must be at least 1 (ide::Error 5 otherwise); tab mode writes
  /// one tab per level whatever `spaces` holds.
  Indenter(IndentMode mode, qint32 spaces);

  /// Start of a procedure body: one unit in, no open level, no pending header continuation.
  void beginProcedure(const QString& numberColumn = {});
  /// Start of a declarations section: column 0, no open level, no number column.
  void beginDeclarations();

  /// Rewrites the leading white space of one body line: its number prefix (padded to the number column)
  /// stays at the margin, then the indentation of the current level, then the trimmed code. Continuation
  /// lines have no number prefix, whatever they begin with. Updates the levels and `statementContinued`
  /// (true while the previous line's statement goes on). Blank lines and the End Sub/Function/Property
  /// line are left as they are; the End line also resets the levels.
  bool IndentLine(QString& line, bool& statementContinued);

  /// As IndentLine for a line of the declarations section: no number prefix; Type and Enum blocks and
  /// directives open and close levels.
  bool IndentDeclarationLine(QString& line, bool& statementContinued);

  /// Closes levels from the newest on, one unit each, up to and including the first whose type has a bit
  /// of `mask`; with no such level the stack empties. The indentation never goes below 0.
  void PopBlock(qint32 mask);

  const CIndenter& current() const { return m_current; }
  const std::vector<CIndenter>& stack() const { return m_stack; }
  qint32 unit() const { return m_unit; }
  IndentMode mode() const { return m_mode; }
  bool ifContinued() const { return m_ifContinued; }
  bool caseContinued() const { return m_caseContinued; }
  const QString& numberColumn() const { return m_numberColumn; }

 private:
  // A line as it will be written: `head` (the number prefix as found), `spaces` spaces (the rest of the
  // number column), the indentation, then `code` (the trimmed statement).
  struct Layout {
    QStringView head;
    qsizetype spaces = 0;
    QStringView code;
  };

  bool indent(QString& line, bool& statementContinued, bool declaration);
  bool opener(QString& line, const Layout& layout, bool& statementContinued, qint32 units = 1);
  bool ordinary(QString& line, const Layout& layout, bool& statementContinued);
  bool write(QString& line, const Layout& layout) const;

  IndentMode m_mode;
  qint32 m_unit;
  CIndenter m_current;
  std::vector<CIndenter> m_stack;
  bool m_ifContinued = false;
  bool m_caseContinued = false;
  // The last non-blank line ended with " _", so the next one cannot carry a line number.
  bool m_lineContinues = false;
  // Between a Type or Enum line and its End in the declarations.
  bool m_inTypeBlock = false;
  QString m_numberColumn;
};

}  // namespace transform

// SPDX-License-Identifier: MIT
// What a physical line of VB code is: whether it goes on on the next line, where its comment begins, what
// its statement declares or which block it opens or closes, the label or line number in front of it, and
// its words and string literals. This is the only place that says so: the file layer, the code engine's
// index, numbering, indentation, the find command and the code window's colours all ask here, so that they
// can never disagree about a line. Keywords are matched without regard to letter case, as the language
// does.
//
// The main entry points read decoded text (QStringView); the ones that take bytes read Windows-1252 text
// as stored in files, for tools that scan large files without decoding them, and give the same answers.
#pragma once

#include "syntax/text.h"

#include <QByteArrayView>
#include <QString>
#include <QStringView>

#include <optional>
#include <vector>

namespace syntax {

// ---------------------------------------------------------------------------------------------------
// Continuation and comments

/// The line ends with the continuation mark: an underscore after a blank (or alone on the line), trailing
/// blanks ignored. Blanks are spaces and tabs alike. A comment that ends with the mark goes on on the next
/// line, as a statement does.
bool continues(QStringView line) noexcept;
bool continues(QByteArrayView line) noexcept;

/// `line` without its continuation mark (the underscore; the blank before it stays), or `line` itself.
QStringView withoutContinuationMark(QStringView line) noexcept;

/// Where the line's comment begins: the first apostrophe outside a string literal, or a Rem statement
/// (Rem at the start of a statement, followed by a blank or the line's end); -1 when there is none. A line
/// that continues a comment (`inComment`) is comment from its first character.
qsizetype commentStart(QStringView line, bool inComment = false);

/// The statement part of a line: the text before its comment, without trailing blanks.
QStringView codePart(QStringView line, bool inComment = false);

/// What one line leaves to the next: its statement or comment goes on there.
struct Carry {
  bool continued = false;  // the line above ended with the continuation mark
  bool inComment = false;  // ... inside a comment: the next line is comment text
};

/// The carry after `line`, read with the carry `before` it.
Carry carryAfter(QStringView line, Carry before);

// ---------------------------------------------------------------------------------------------------
// Statements

/// What a statement is, read from its first words.
enum class Kind : quint8 {
  Blank,
  Comment,       // an apostrophe or Rem
  Code,          // any other statement
  Continuation,  // a line that continues the statement (or comment) above it
  Attribute,
  ProcHeader,  // Sub, Function, Property Get/Let/Set followed by a name
  ProcEnd,     // End Sub, End Function, End Property
  Variable,    // Dim, Static, Public, Private, Friend or Global followed by names
  Const,
  Event,
  Declare,
  TypeBegin,
  TypeEnd,
  EnumBegin,
  EnumEnd,
  // Blocks inside procedures
  If,
  ElseIf,
  Else,
  EndIf,
  SelectCase,
  Case,
  EndSelect,
  With,
  EndWith,
  For,
  Next,
  Do,
  Loop,
  While,
  Wend,
  // Conditional compilation
  DirectiveIf,
  DirectiveElseIf,
  DirectiveElse,
  DirectiveEndIf,
  Directive,  // #Const and anything else after "#"
};

struct Statement {
  Kind kind = Kind::Blank;
  /// The statement begins with Public, Private, Friend or Global.
  bool scoped = false;
};

/// The statement that begins at the first non-blank character of `text` (a line that starts a statement:
/// not one that continues the line above). Sub, Function, Property Get/Let/Set, Type and Enum declare
/// something only when a name follows them (never "As", "=" or "("), so "sUB As Long" or "Function = 2"
/// in a Type or Enum is no header. A leading label or line number is not skipped: a statement after one is
/// Code.
Statement classify(QStringView text) noexcept;
Statement classify(QByteArrayView text) noexcept;

/// Whether classify(text) is Kind::Attribute, told quickly.
bool isAttributeStatement(QStringView text) noexcept;
/// Whether classify(text) is Kind::ProcEnd, told quickly.
bool isProcedureEnd(QStringView text) noexcept;

/// The kind of a physical line: Continuation when the line above continues onto it, else what its
/// statement is.
inline Kind kindOf(QStringView line, bool continuation) noexcept {
  return continuation ? Kind::Continuation : classify(line).kind;
}

/// The lines a module's structure is read from: procedure headers and ends, the Type and Enum blocks whose
/// members may look like them, and the directives of conditional compilation that may hold alternative
/// procedures.
constexpr bool isStructural(Kind kind) noexcept {
  switch (kind) {
    case Kind::ProcHeader:
    case Kind::ProcEnd:
    case Kind::TypeBegin:
    case Kind::TypeEnd:
    case Kind::EnumBegin:
    case Kind::EnumEnd:
    case Kind::DirectiveIf:
    case Kind::DirectiveElseIf:
    case Kind::DirectiveElse:
    case Kind::DirectiveEndIf:
      return true;
    default:
      return false;
  }
}

constexpr bool isDirective(Kind kind) noexcept {
  return kind >= Kind::DirectiveIf && kind <= Kind::Directive;
}

constexpr bool isBlankOrComment(Kind kind) noexcept {
  return kind == Kind::Blank || kind == Kind::Comment;
}

// ---------------------------------------------------------------------------------------------------
// Labels and line numbers

/// A line number (or numeric label) in front of a statement, as found on a line without its leading
/// blanks: a usable number (see isUsableNumber) directly followed by a colon, a blank or an apostrophe.
struct NumberPrefix {
  enum class Form : quint8 {
    None,     // no number in front
    Colon,    // "10: x" or "10:x": `rest` is after the colon
    Blank,    // "10 x": `rest` is after the one blank that ends the number
    Comment,  // "10'x": `rest` is the comment
    Alone,    // "10": the line holds only the number
  };
  Form form = Form::None;
  QStringView number;
  QStringView rest;

  explicit operator bool() const { return form != Form::None; }
  /// Only blanks stand between the number and a comment ("10 ' x", "10'x").
  bool commentFollows() const;
};
NumberPrefix numberPrefix(QStringView trimmed) noexcept;

/// `trimmed` begins with a named label: an identifier directly followed by a colon that is no ":="
/// ("ErrorHandler:"). Reserved words followed by a colon are statements ("Else:", "End:").
bool beginsWithLabel(QStringView trimmed) noexcept;

// ---------------------------------------------------------------------------------------------------
// Attribute lines

/// The parts of an "Attribute <name> = <value>" line: the name ("VB_Name", "Item.VB_UserMemId"), the owner
/// and the attribute of a member attribute (empty when the name has no dot), and the raw value.
struct AttributeLine {
  QStringView name;
  QStringView owner;
  qsizetype ownerStart = -1;  // where the owner begins in the line
  QStringView attribute;
  QStringView value;
};
/// Nothing when `line` is no attribute line (its first word is not "Attribute" followed by a blank).
std::optional<AttributeLine> parseAttribute(QStringView line) noexcept;

/// A module attribute of a file's header: "Attribute VB_...".
bool isModuleAttribute(QStringView line) noexcept;
bool isModuleAttribute(QByteArrayView line) noexcept;

// ---------------------------------------------------------------------------------------------------
// Words, strings and comments, for colouring and for readers of whole statements

struct Token {
  enum class Type : quint8 {
    Word,        // an identifier or keyword
    Number,      // a literal that begins with a digit (1, 10, 1.5, 1E3, 10#)
    String,      // "..." with its quotes ("" inside stands for a quote)
    OpenString,  // a string literal the line ends before closing
    Comment,     // to the end of the line
    Directive,   // "#" and the word after it, at the start of a statement
    Colon,       // the statement separator (":" not followed by "=")
    Comma,
    Other,  // any other character
  };
  Type type = Type::Other;
  qsizetype start = 0;
  qsizetype length = 0;
  /// The token begins a statement: the first on the line, the first after a colon, or the first after a
  /// line number that begins the line.
  bool statementStart = false;
  /// A word right after a dot: a member (obj.Print), never a keyword.
  bool afterDot = false;
  /// A Number of digits only (a line number or label can be one; 1.5 or 1E3 cannot).
  bool digitsOnly = false;
};

/// Reads the tokens of one line in order; blanks are skipped.
class Tokenizer {
 public:
  explicit Tokenizer(QStringView line, bool inComment = false) : m_line(line), m_inComment(inComment) {}
  bool next(Token& token);

 private:
  QStringView m_line;
  qsizetype m_pos = 0;
  bool m_inComment;
  bool m_statementStart = true;
  bool m_first = true;
};

/// Whether a statement after a colon on `line` ends a procedure ("Sub A(): End Sub"): the header on the
/// line is then a whole procedure, with no body below it.
bool endsProcedureAfterColon(QStringView line);

/// The text of a statement spread over several physical lines, joined with the continuation marks
/// removed.
QString joinContinuedLines(const std::vector<QStringView>& lines);

}  // namespace syntax

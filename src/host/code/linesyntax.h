// SPDX-License-Identifier: MIT
// Just enough VB syntax to find a module's structure: what a statement's first line declares (a procedure
// header or end, a module-level variable, constant, event, Declare, Type or Enum), whether a physical line
// continues on the next one, and the names a header or declaration introduces. Keywords are matched without
// regard to case, as the IDE does.
#pragma once

#include "ide/types.h"

#include <QString>
#include <QStringView>

#include <optional>
#include <vector>

namespace host {

/// What a physical line is, as far as the module's structure goes.
enum class LineClass : quint8 {
  Blank,
  Comment,
  Code,          // any other statement
  Continuation,  // continues the statement of the line above
  ProcHeader,    // Sub, Function, Property Get/Let/Set
  ProcEnd,       // End Sub, End Function, End Property
  Variable,      // Dim/Private/Public/Global/Static name ...
  Const,
  Event,
  Declare,
  TypeBegin,
  TypeEnd,
  EnumBegin,
  EnumEnd,
};

/// The lines the module's structure is read from: procedure headers and ends, and the Type and Enum
/// blocks whose members may look like them.
inline bool isStructural(LineClass c) {
  switch (c) {
    case LineClass::ProcHeader:
    case LineClass::ProcEnd:
    case LineClass::TypeBegin:
    case LineClass::TypeEnd:
    case LineClass::EnumBegin:
    case LineClass::EnumEnd:
      return true;
    default:
      return false;
  }
}
inline bool isBlankOrComment(LineClass c) {
  return c == LineClass::Blank || c == LineClass::Comment;
}

/// The class of a line that starts a statement (the line above does not continue onto it), by the
/// statement's shape: Sub, Function, Property Get/Let/Set, Type and Enum declare something only when a name
/// follows them (never "As"), so "sUB As Long" or "Function = 2" in a Type or Enum is no header.
LineClass classifyStatement(QStringView line);

/// The line ends with the continuation mark: a blank and an underscore (trailing blanks ignored).
bool continuesOnNextLine(QStringView line);

/// The text of a statement spread over several physical lines, joined with the continuation marks removed.
QString joinContinuedLines(const std::vector<QStringView>& lines);

struct ProcHeader {
  QString name;
  ide::ProcKind kind = ide::ProcKind::Proc;
  bool isFunction = false;
  ide::Scope scope = ide::Scope::Public;
  bool isStatic = false;
};

/// The procedure a header statement declares; nothing when `statement` is not a header.
std::optional<ProcHeader> parseProcHeader(QStringView statement);

struct Declaration {
  ide::MemberType type = ide::MemberType::Variable;
  ide::Scope scope = ide::Scope::Private;
  bool isStatic = false;
  std::vector<QString> names;
};

/// The members a module-level declaration statement introduces (variables, constants, an event, a Declare).
std::optional<Declaration> parseDeclaration(QStringView statement);

/// True for characters that make up VB identifiers (letters of any script, digits, underscore).
inline bool isIdentifierChar(QChar c) {
  return c.isLetterOrNumber() || c == u'_';
}

}  // namespace host

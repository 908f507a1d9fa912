// SPDX-License-Identifier: MIT
// What the new-procedure wizard writes, without widgets: the choices of its first page, their validation,
// the names VB accepts, and the text of each procedure it generates.
#pragma once

#include "ide/types.h"

#include <QString>
#include <QStringView>

#include <optional>
#include <vector>

namespace newproc {

/// The kind options, in the order of `opType`.
enum class ProcType { Sub = 0, Function = 1, Property = 2 };
/// The scope options, in the order of `opScope`.
enum class ProcScope { Private = 0, Public = 1, Friend = 2 };

/// What the first page of the wizard says about the procedure to write.
struct NewProcChoices {
  QString name;
  ProcType type = ProcType::Function;
  ProcScope scope = ProcScope::Private;
  bool isStatic = false;
  /// The data type (the return type of a Function) as typed or chosen.
  QString dataType;
  /// The type is an object type (`Set` in the assignments).
  bool isObject = false;
  bool get = false;
  bool let = false;
  bool set = false;
  QString memberVariable;
  bool errorHandler = false;
  bool docHeader = false;
  bool isDefault = false;
};

/// The longest name VB takes.
inline constexpr int kMaxIdentifierLength = 255;

/// A name VB takes for a procedure or variable: an ASCII letter first, then letters (those of the Windows
/// code page the modules are written in), digits and underscores, at most 255 characters, and not a
/// reserved word.
bool IsVbIdentifier(QStringView name);
/// A reserved word of the language (letter case does not matter).
bool IsReservedWord(QStringView word);
/// A type VB takes after "As": an intrinsic type, or a class name, possibly qualified by its library
/// ("ADODB.Recordset").
bool IsVbTypeName(QStringView type);

/// "Private ", "Public " or "Friend ", followed by "Static " when it is ticked.
QString ScopeWord(const NewProcChoices& choices);

/// The procedures to write and the kind each is asked for with: Proc for a Sub or Function; the ticked
/// Get, Let and Set, in that order, for a property.
std::vector<ide::ProcKind> KindsToWrite(const NewProcChoices& choices);

/// The text of one procedure: lines joined by CR LF, none after the last.
QString GenerateProcedure(const NewProcChoices& choices, ide::ProcKind kind);

/// The member variable's declaration a property gets after the module's declarations.
QString MemberDeclaration(const NewProcChoices& choices);

/// The control that holds what a failed validation refers to.
enum class Field { ErrorHandler, DocHeader, Name, DataType, MemberVariable, PropertyProcs };

/// Why the wizard will not write the procedure: the message (with its icon) and where the focus goes.
struct Refusal {
  QString message;
  int icon = 0;
  Field field = Field::Name;
};

/// The checks of the OK button, in their order; the first that fails is returned. `errorHandler` and
/// `docHeader` are the two templates as edited.
std::optional<Refusal> Validate(const NewProcChoices& choices, const QString& errorHandler,
                                const QString& docHeader);

}  // namespace newproc

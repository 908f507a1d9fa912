// SPDX-License-Identifier: MIT
// The line-numbering walks over the object model: a project, a module, a member or the procedure at the
// caret, each procedure numbered from the start number, line by line through the code module.
#pragma once

#include "walk/walk.h"

#include <functional>

namespace transform {

/// Adds or removes line numbers. Walks report their failures through the context with their fixed
/// messages (5121 for a project, 5122 for a module, 5123 for a member or the current procedure) and end;
/// a line that cannot be rewritten is passed over. A line number past the 32-bit range stops the run.
class NumberingWalk {
 public:
  /// Every procedure is numbered from `startNumber` in steps of `interval`.
  NumberingWalk(walk::WalkContext& context, qint32 startNumber, qint32 interval);

  /// Every component of `project` with code, related documents passed over.
  void NumberProject(const ide::Ref<ide::VBProject>& project, bool add);
  /// Every member of `module`: methods and properties are numbered, every member advances the bar by one.
  void NumberModule(const ide::Ref<ide::CodeModule>& module, bool add);
  /// The procedures of one member (a property's Get, Let and Set; a method's procedure, where adding
  /// passes over Declare statements); advances the bar by one.
  void NumberMember(const ide::Ref<ide::CodeModule>& module, const ide::Ref<ide::Member>& member, bool add);
  /// The procedure at the start of the active code pane's selection; advances the bar by one.
  void NumberCurrentProcedure(ide::VBE& vbe, bool add);

  /// Numbers the lines after the header and its continuation lines, up to the End line, restarting at the
  /// start number. Quietly does nothing for a procedure the module does not have.
  void NumberProcedure(ide::CodeModule& module, const QString& name, ide::ProcKind kind);
  /// Removes the numbers of the lines between the header line and the End line; the header's
  /// continuation lines and every continuation line of a statement are left alone.
  void UnnumberProcedure(ide::CodeModule& module, const QString& name, ide::ProcKind kind);
  /// The same two for the procedure at its place.
  void NumberProcedure(ide::CodeModule& module, const ide::ProcExtent& extent);
  void UnnumberProcedure(ide::CodeModule& module, const ide::ProcExtent& extent);

  /// Numbers (`add`) or unnumbers a procedure's lines in memory, as the two walks above do in the module:
  /// number-and-indent writes each line once, numbered and indented.
  void numberText(walk::ProcedureText& text, bool add) const;

  /// Gives each numbered line the number `numberOf` returns for its module line, instead of counting from
  /// the start number (the command-line tool's numbers that are the lines of the file).
  void setLineNumbers(std::function<qint32(int moduleLine)> numberOf) { m_numberOf = std::move(numberOf); }

  /// One procedure, adding or removing.
  void numberOrUnnumber(ide::CodeModule& module, const ide::ProcExtent& extent, bool add) {
    add ? NumberProcedure(module, extent) : UnnumberProcedure(module, extent);
  }

 private:
  /// The running number a procedure starts from; a line number overflow when it leaves the 32-bit range.
  qint32 numberBeforeFirst() const;

  walk::WalkContext& m_context;
  qint32 m_startNumber;
  qint32 m_interval;
  std::function<qint32(int)> m_numberOf;
  walk::ProcedureCache m_procedures;
};

}  // namespace transform

// SPDX-License-Identifier: MIT
// The indentation walks over the object model: a project, a module, a member or the procedure at the
// caret, every procedure body and declarations section rewritten line by line through the code module.
#pragma once

#include "transform/indentation.h"
#include "walk/walk.h"

namespace transform {

/// Re-indents code. Walks report their failures through the context with their fixed messages (5130 for
/// a project, 5129 for a module, 5128 for a member or the current procedure) and end; a line that cannot
/// be rewritten is passed over. Progress: every procedure advances the bar by its line count, every
/// declaration line by one.
class IndentationWalk {
 public:
  /// `spaces` is the unit in space mode (at least 1; ide::Error 5 otherwise).
  IndentationWalk(walk::WalkContext& context, IndentMode mode, qint32 spaces);

  void IndentProject(const ide::Ref<ide::VBProject>& project);
  /// The procedures of every method and property, then the declarations (unless cancelled).
  void IndentModule(const ide::Ref<ide::CodeModule>& module);
  /// A property's Get, Let and Set; a method's procedure unless it is a Declare statement.
  void IndentMember(const ide::Ref<ide::CodeModule>& module, const ide::Ref<ide::Member>& member);
  /// The procedure at the start of the active code pane's selection; advances the bar by one.
  void IndentCurrentProcedure(ide::VBE& vbe);

  /// Indents the lines after the header line up to the End line: the header's continuation lines one
  /// unit in, the body by its blocks, line numbers in a column as wide as the widest. The header and the
  /// End line are left as they are. Quietly does nothing for a procedure the module does not have.
  void IndentProcedure(ide::CodeModule& module, const QString& name, ide::ProcKind kind);
  /// The same for the procedure at its place.
  void IndentProcedure(ide::CodeModule& module, const ide::ProcExtent& extent);
  /// Indents a procedure's lines in memory, as IndentProcedure does in the module.
  void indentText(walk::ProcedureText& text);

  /// Indents the declarations section: Type, Enum and #If blocks one unit in, the rest at the margin.
  void IndentDeclarations(ide::CodeModule& module);

 private:
  /// Sets the indenter up for a procedure; returns whether its header goes on on the next line.
  bool beginProcedure(const walk::ProcedureText& text);

  walk::WalkContext& m_context;
  Indenter m_indenter;
  walk::ProcedureCache m_procedures;
};

}  // namespace transform

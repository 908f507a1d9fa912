// SPDX-License-Identifier: MIT
// Number-and-indent: line numbers added (or removed) and the code re-indented in one pass, procedure by
// procedure, so that the indenter sees the new numbers and lines them up in its number column. The dialogs
// hand their runs to CNumIndent when the one-command option is on; the command-line tool runs the walk.
#pragma once

#include "ide/signal.h"
#include "transform/indentwalk.h"
#include "transform/numberwalk.h"

#include <memory>

namespace transform {

/// The walk of number-and-indent. A failure is reported through the context and the walk goes on with
/// the next component or member; a line number past the 32-bit range stops the run.
class NumIndentWalk {
 public:
  NumIndentWalk(walk::WalkContext& context, qint32 startNumber, qint32 interval, IndentMode mode,
                qint32 spaces, bool add);

  void NumIndentProject(const ide::Ref<ide::VBProject>& project);
  /// Every method and property, then the declarations (indented, never numbered).
  void NumIndentModule(const ide::Ref<ide::CodeModule>& module);
  /// Each procedure of the member is numbered (or unnumbered) and then indented; Declare statements,
  /// listed as methods, are passed over. Failures are reported as this walk's.
  void NumIndentMember(const ide::Ref<ide::CodeModule>& module, const ide::Ref<ide::Member>& member);
  /// The procedure at the active code pane's selection; a selection outside every procedure fills the
  /// bar and changes nothing.
  void NumIndentCurrentProcedure(ide::VBE& vbe, qint32 totalUnits);
  /// The numbering step, for its options.
  NumberingWalk& numbering() { return m_numbering; }

 private:
  void memberProcedures(const ide::Ref<ide::CodeModule>& module, const ide::Ref<ide::Member>& member);
  void numIndentProcedure(ide::CodeModule& module, const ide::ProcExtent& extent);

  walk::WalkContext& m_context;
  NumberingWalk m_numbering;
  IndentationWalk m_indentation;
  bool m_add;
  walk::ProcedureCache m_procedures;
};

/// The number-and-indent command: one run over a scope of the IDE, reporting on the caller's progress
/// bar and through its events. It shows nothing itself; the caller shows the Error texts.
class CNumIndent {
 public:
  explicit CNumIndent(ide::Ref<ide::VBE> vbe);
  ~CNumIndent();
  CNumIndent(const CNumIndent&) = delete;
  CNumIndent& operator=(const CNumIndent&) = delete;

  /// Numbers (`add`) or unnumbers, and indents, the active project, the selected component's module or
  /// the procedure at the caret (`Unit`). `Use` chooses spaces (`lngSpaces` per level) over one tab per
  /// level. `Progbar` may be null. Raises Begining, then Error for each failure, then Finished unless
  /// cancelled.
  void DoIt(walk::PROG_MODE Unit, walk::ProgressSink* Progbar, qint32 StartNumber, qint32 lngInterval,
            bool Use, qint32 lngSpaces, bool add);
  /// Ends a run at its next yield. May be called from work the IDE's loop runs during DoIt.
  void Cancel();

  /// The least time between two runs of the IDE's loop during a walk (tests set 0 to yield every time).
  void setYieldInterval(walk::WalkContext::Clock::duration interval) { m_yieldInterval = interval; }

  ide::Signal<> Begining;
  /// The error number, a blank, its description, a line feed and where it happened.
  ide::Signal<const QString& /*strError*/> Error;
  /// The same failure, with the walk, module and line it happened in (raised just before Error).
  ide::Signal<const walk::WalkFailure&> Failed;
  ide::Signal<> Finished;

 private:
  ide::Ref<ide::VBE> m_vbe;
  walk::WalkContext* m_context = nullptr;  // the running walk's context, for Cancel
  bool m_cancel = false;
  walk::WalkContext::Clock::duration m_yieldInterval = std::chrono::milliseconds(5);
};

}  // namespace transform

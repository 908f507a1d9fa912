// SPDX-License-Identifier: MIT
// What the walks over the object model share (numbering, indentation, the extended find): yielding to the
// IDE's loop, the cancel flag, the progress bar, the handing of caught failures to whoever runs the walk,
// and the helpers that find the active project, module and procedure and read a procedure's lines. The
// dialogs, the number-and-indent command, the find window and the command-line tool run their walks each
// with its own context.
#pragma once

#include "ide/error.h"
#include "ide/vbide.h"
#include "walk/progmode.h"
#include "walk/progress.h"
#include "walk/runstopped.h"

#include <QHash>
#include <QString>
#include <QStringView>

#include <chrono>
#include <functional>
#include <optional>
#include <vector>

namespace walk {

/// A failure that a walk caught. The walk that caught a failure ends (its caller goes on with the next
/// unit); a line that cannot be rewritten is passed over and the walk goes on with the next line.
struct WalkFailure {
  /// The walk that caught it ("NumberModule", "IndentLine" ...) and its fixed message (5122 ...), 0 for
  /// walks without one.
  QString operation;
  int messageId = 0;
  /// The code module being walked (empty when the failure came before one was reached) and the line
  /// being processed there (0 outside the lines of a procedure or declarations section).
  QString module;
  int line = 0;
  /// The failure as the error convention recorded it: its location text is the error's source.
  ide::Error error;
  /// The walk stops here: the failure was a RunStopped.
  bool stopsRun = false;
};

/// The state one run of a walk carries through all its levels.
class WalkContext {
 public:
  using Clock = std::chrono::steady_clock;

  /// `owner` names the walks in failure locations ("em <owner>_<operation>, linha: n"). The walk yields to
  /// `loop` (none: never) and shows its progress on `bar` (none: nowhere); both must outlive the context.
  WalkContext(QString owner, ide::EventLoop* loop, ProgressSink* bar);

  // --- Yielding and cancelling

  /// The least time between two runs of the loop. A yield inside it costs a clock read, so walks can yield
  /// before every line. The first yield of a context, and the first after reset(), always runs the loop.
  void setYieldInterval(Clock::duration interval) { m_yieldInterval = interval; }
  void yield();
  /// Yields, then tells whether the walk must end: cancelled (the bar is hidden then) or stopped by a
  /// failure.
  bool yieldAndCheck();

  /// Sets the cancel flag; every walk ends at its next yield. Called from work the loop runs.
  void Cancel() { m_cancel = true; }
  bool cancelled() const { return m_cancel; }
  /// Clears the cancel flag and the stop of the previous run.
  void reset();
  /// True once a failure stopped the run.
  bool stopped() const { return m_stopped; }

  // --- Progress

  void SetProgressRange(qint32 units);
  void AdvanceProgress(qint32 units);
  void showProgress();
  void hideProgress();

  // --- Failures

  /// Told about every failure that ends a walk, in the order they happen.
  std::function<void(const WalkFailure&)> onFailure;
  /// Told about every line passed over because it could not be rewritten (a line grown past the IDE's
  /// length limit, a module that refuses edits).
  std::function<void(const WalkFailure&)> onLineSkipped;

  /// Runs `body` as the walk `operation` on `module` (may be null). A failure ends the body; it is
  /// recorded under `operation` and reported with `messageId`. A RunStopped is not the failure
  /// of one unit: it passes through the guards of nested walks to the outermost one, which reports it and
  /// stops the run.
  template <class Body>
  void guard(QStringView operation, int messageId, ide::CodeModule* module, Body&& body) {
    Nesting nesting(m_depth);
    try {
      body();
    } catch (const std::exception& failure) {
      if (endsRun(failure) && m_depth > 1) throw;
      failed(failure, operation, messageId, module);
    }
  }

  /// Reports a line that could not be rewritten (rethrows a RunStopped, which is never passed
  /// over).
  void lineSkipped(const std::exception& failure, QStringView operation, ide::CodeModule& module, int line);

  /// The line being processed, for failure locations.
  void setLine(int line) { m_line = line; }

 private:
  struct Nesting {
    explicit Nesting(int& depth) : m_depth(depth) { ++m_depth; }
    ~Nesting() { --m_depth; }
    int& m_depth;
  };

  static bool endsRun(const std::exception& failure);
  void failed(const std::exception& failure, QStringView operation, int messageId, ide::CodeModule* module);
  WalkFailure record(const std::exception& failure, QStringView operation, int messageId,
                     ide::CodeModule* module, int line);

  QString m_owner;
  ide::EventLoop* m_loop;
  ProgressSink* m_bar;
  std::optional<ProgressScale> m_scale;
  Clock::duration m_yieldInterval = std::chrono::milliseconds(5);
  std::optional<Clock::time_point> m_lastYield;  // none: the next yield runs the loop
  bool m_cancel = false;
  bool m_stopped = false;
  int m_depth = 0;
  int m_line = 0;
};

// --- Helpers the walks share

/// What a unit of progress is: a member (the numbering dialog) or a line outside the declarations
/// section (the indenter and the number-and-indent command).
enum class ProgressUnit { Members, Lines };

/// Counts the units of a run over `scope` (the active project, the selected component, or 1 for the
/// current procedure; related documents and unreadable components count 0), then sets the bar's range,
/// shows it and yields. Returns the units counted. The cancel flag is left alone: a click on Cancel that
/// the yield lets through must still end the run.
qint32 CountUnits(WalkContext& context, ide::VBE& vbe, PROG_MODE scope, ProgressUnit unit);

/// The IDE's active project, selected component and active code pane; error 91 when there is none.
ide::Ref<ide::VBProject> activeProject(ide::VBE& vbe);
ide::Ref<ide::VBComponent> selectedComponent(ide::VBE& vbe);
ide::Ref<ide::CodePane> activeCodePane(ide::VBE& vbe);

/// A procedure of a code module: its name and kind, and its place when it has one.
struct ProcedureRef {
  ide::Ref<ide::CodeModule> module;
  QString name;
  ide::ProcKind kind = ide::ProcKind::Proc;
  std::optional<ide::ProcExtent> extent;
};

/// The procedure that holds the start of the active code pane's selection; an empty name when the
/// selection is in the declarations. Restores a minimized code window first, as the user is about to see
/// the procedure change.
ProcedureRef currentProcedure(ide::VBE& vbe);

/// Methods and properties: the members that have procedures.
inline bool hasProcedures(ide::MemberType type) {
  return type == ide::MemberType::Method || type == ide::MemberType::Property;
}

/// Calls `visit` with the code module of every component of `project` that has one, yielding before
/// each component and ending on cancel. Related documents are passed over, and so are components that
/// fail to answer.
void forEachCodeModule(WalkContext& context, ide::VBProject& project,
                       const std::function<void(const ide::Ref<ide::CodeModule>&)>& visit);

/// Calls `visit` with every member of `module`, yielding before each; returns false when the walk must
/// end (cancelled, or stopped by a failure). With `guardEach`, each member (fetching it included) runs
/// under that walk's guard, so that a failing member is reported and the next one is walked.
bool forEachMember(WalkContext& context, ide::CodeModule& module,
                   const std::function<void(const ide::Ref<ide::Member>&)>& visit,
                   QStringView guardEach = {});

/// The procedures of one module by name and kind, read once for a walk over its members. Two procedures
/// of one name (alternative branches of conditional compilation) are both here, each at its place.
class ModuleProcedures {
 public:
  explicit ModuleProcedures(ide::CodeModule& module);

  /// Calls `visit` with each procedure a walk visits for `member`: a property's Get, Let and Set in this
  /// order, a method's procedure; procedures that share a name and kind in line order. Declare
  /// statements, other members (variables, constants, events) and members without a name get none.
  void forMember(ide::Member& member, const std::function<void(const ide::ProcExtent&)>& visit) const;
  /// The first procedure of a name and kind, as the lookups by name find it.
  std::optional<ide::ProcExtent> find(QStringView name, ide::ProcKind kind) const;

  bool isFor(ide::CodeModule& module) const {
    return &module == m_module && module.CountOfLines() == m_lines;
  }

 private:
  const ide::CodeModule* m_module;
  int m_lines;
  std::vector<ide::ProcExtent> m_procedures;
  QHash<QString, std::vector<size_t>> m_byName;  // folded name and kind -> indexes in line order
};

/// Reads a module's procedures once for the members of one walk over it; read again for another module or
/// after lines came or went.
class ProcedureCache {
 public:
  const ModuleProcedures& of(ide::CodeModule& module) {
    if (!m_procedures || !m_procedures->isFor(module)) m_procedures.emplace(module);
    return *m_procedures;
  }

 private:
  std::optional<ModuleProcedures> m_procedures;
};

/// The place of a procedure the lookups by name find (the first of its name and kind); error 35 when the
/// module has none.
ide::ProcExtent extentOf(ide::CodeModule& module, const QString& name, ide::ProcKind kind);

/// The lines of one procedure, read once: from its header line to the end of its extent (the last
/// procedure's extent runs to the end of the module, comments after its End line included).
struct ProcedureText {
  int body = 0;   // the module line of the header, lines[0]
  int count = 0;  // the procedure's line count, for the progress bar
  /// Indexes into `lines`: the first line after the header and its continuation lines (and the
  /// alternative headers that conditional compilation gives it); where indentation and the removal of
  /// numbers begin (the line after the header line, or `first` after alternative headers, which stay as
  /// they are); where numbering and indentation stop (the End line, or without one the last line that is
  /// not blank); where removal of numbers stops (the End line, or without one the extent's last line).
  /// Each stop is never walked.
  qsizetype first = 0;
  qsizetype bodyFrom = 1;
  qsizetype stop = 0;
  qsizetype unnumberStop = 0;
  std::vector<QString> lines;

  int moduleLine(qsizetype index) const { return body + int(index); }
};

/// Reads a procedure at its place.
ProcedureText readProcedure(ide::CodeModule& module, const ide::ProcExtent& extent);

/// What the IDE calls a module's declarations section where a procedure name goes: "(Declarations)".
QString declarationsText();

}  // namespace walk

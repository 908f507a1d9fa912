// SPDX-License-Identifier: MIT
// Number-and-indent: the walk and the command object.
#include "transform/numindent.h"

#include "common/errors.h"

namespace transform {

using namespace walk;

NumIndentWalk::NumIndentWalk(WalkContext& context, qint32 startNumber, qint32 interval, IndentMode mode,
                             qint32 spaces, bool add)
    : m_context(context),
      m_numbering(context, startNumber, interval),
      m_indentation(context, mode, spaces),
      m_add(add) {}

void NumIndentWalk::NumIndentProject(const ide::Ref<ide::VBProject>& project) {
  m_context.guard(u"NumIndentProject", 0, nullptr, [&] {
    if (!project) ide::raise(ide::err::ObjectVariableNotSet);
    forEachCodeModule(m_context, *project,
                      [&](const ide::Ref<ide::CodeModule>& module) { NumIndentModule(module); });
  });
}

void NumIndentWalk::NumIndentModule(const ide::Ref<ide::CodeModule>& module) {
  m_context.guard(u"NumIndentModule", 0, module.get(), [&] {
    if (!module) ide::raise(ide::err::ObjectVariableNotSet);
    // A failing member is reported and the walk goes on with the next one.
    const bool walked = forEachMember(
        m_context, *module, [&](const ide::Ref<ide::Member>& member) { memberProcedures(module, member); },
        u"NumIndentModule");
    if (!walked || m_context.yieldAndCheck()) return;
    m_indentation.IndentDeclarations(*module);
  });
}

void NumIndentWalk::NumIndentMember(const ide::Ref<ide::CodeModule>& module,
                                    const ide::Ref<ide::Member>& member) {
  m_context.guard(u"NumIndentMember", 0, module.get(), [&] {
    if (!module || !member) ide::raise(ide::err::ObjectVariableNotSet);
    memberProcedures(module, member);
  });
}

void NumIndentWalk::NumIndentCurrentProcedure(ide::VBE& vbe, qint32 totalUnits) {
  m_context.guard(u"NumIndentCurrentProcedure", 0, nullptr, [&] {
    const ProcedureRef procedure = currentProcedure(vbe);
    if (!procedure.extent) {
      m_context.AdvanceProgress(totalUnits);
      return;
    }
    numIndentProcedure(*procedure.module, *procedure.extent);
  });
}

void NumIndentWalk::memberProcedures(const ide::Ref<ide::CodeModule>& module,
                                     const ide::Ref<ide::Member>& member) {
  m_procedures.of(*module).forMember(
      *member, [&](const ide::ProcExtent& extent) { numIndentProcedure(*module, extent); });
}

void NumIndentWalk::numIndentProcedure(ide::CodeModule& module, const ide::ProcExtent& extent) {
  ProcedureText text = readProcedure(module, extent);
  // Numbered first, so that the indenter lines the new numbers up in its number column; both in memory,
  // so that each line is written once, and not at all when numbering and indenting give it back as it
  // was (renumbering widens a number's blank, which re-indenting takes away again).
  const std::vector<QString> before = text.lines;
  m_numbering.numberText(text, m_add);
  m_indentation.indentText(text);
  const qsizetype end = std::max(text.stop, text.unnumberStop);
  for (qsizetype i = 1; i < end; ++i) {
    if (m_context.yieldAndCheck()) return;
    const QString& code = text.lines[size_t(i)];
    if (code == before[size_t(i)]) continue;
    const int line = text.moduleLine(i);
    m_context.setLine(line);
    try {
      module.ReplaceLine(line, code);
    } catch (const std::exception& failure) {
      m_context.lineSkipped(failure, u"IndentLine", module, line);
    }
  }
  m_context.AdvanceProgress(text.count);
}

// ---------------------------------------------------------------------------------------------------

namespace {

QString errorText(const ide::Error& error, const QString& where) {
  return QStringLiteral("%1 %2\n%3").arg(error.number()).arg(error.description(), where);
}

}  // namespace

CNumIndent::CNumIndent(ide::Ref<ide::VBE> vbe) : m_vbe(std::move(vbe)) {}

CNumIndent::~CNumIndent() = default;

void CNumIndent::Cancel() {
  m_cancel = true;
  if (m_context) m_context->Cancel();
}

void CNumIndent::DoIt(PROG_MODE Unit, ProgressSink* Progbar, qint32 StartNumber, qint32 lngInterval, bool Use,
                      qint32 lngSpaces, bool add) {
  m_cancel = false;
  WalkContext context(QStringLiteral("CNumIndent"), &m_vbe->Platform().loop(), Progbar);
  context.setYieldInterval(m_yieldInterval);
  context.onFailure = [this](const WalkFailure& failure) {
    Failed.fire(failure);
    Error.fire(errorText(failure.error, failure.error.source()));
  };
  context.onLineSkipped = [this](const WalkFailure& failure) {
    // Numbering passes over the lines it cannot rewrite without a word; the indenter tells.
    if (failure.operation.startsWith(u"Indent")) Failed.fire(failure);
    if (failure.operation == u"IndentLine")
      Error.fire(errorText(failure.error, QStringLiteral("IndentLine %1").arg(failure.line)));
    else if (failure.operation == u"IndentDeclarationLine")
      Error.fire(errorText(failure.error,
                           QStringLiteral("Source:  IndentDeclarationLine, line: %1").arg(failure.line)));
  };
  struct Running {
    CNumIndent& command;
    ~Running() { command.m_context = nullptr; }
  } running{*this};
  m_context = &context;

  Begining.fire();
  try {
    if (m_cancel) context.Cancel();  // cancelled while Begining was handled
    const qint32 units = CountUnits(context, *m_vbe, Unit, ProgressUnit::Lines);
    NumIndentWalk walk(context, StartNumber, lngInterval, Use ? IndentMode::Spaces : IndentMode::Tabs,
                       Use ? lngSpaces : 1, add);
    switch (Unit) {
      case PROG_PROJECT:
        walk.NumIndentProject(activeProject(*m_vbe));
        break;
      case PROG_MODULE:
        walk.NumIndentModule(selectedComponent(*m_vbe)->CodeModule());
        break;
      default:
        walk.NumIndentCurrentProcedure(*m_vbe, units);
        break;
    }
  } catch (const std::exception& failure) {
    const ide::Error error =
        common::recordError(failure, QStringLiteral("CNumIndent"), QStringLiteral("DoIt"), 0);
    Failed.fire(WalkFailure{QStringLiteral("DoIt"), 0, {}, 0, error});
    Error.fire(errorText(error, error.source()));
  }
  if (!m_cancel) Finished.fire();
}

}  // namespace transform

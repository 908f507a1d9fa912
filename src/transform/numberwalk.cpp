// SPDX-License-Identifier: MIT
// The line-numbering walks.
#include "transform/numberwalk.h"

#include "syntax/line.h"
#include "transform/numbering.h"
#include "transform/texts.h"

#include <limits>

namespace transform {

using namespace walk;

NumberingWalk::NumberingWalk(WalkContext& context, qint32 startNumber, qint32 interval)
    : m_context(context), m_startNumber(startNumber), m_interval(interval) {}

void NumberingWalk::NumberProject(const ide::Ref<ide::VBProject>& project, bool add) {
  m_context.guard(u"NumberProject", kNumberProjectFailed, nullptr, [&] {
    if (!project) ide::raise(ide::err::ObjectVariableNotSet);
    forEachCodeModule(m_context, *project,
                      [&](const ide::Ref<ide::CodeModule>& module) { NumberModule(module, add); });
  });
}

void NumberingWalk::NumberModule(const ide::Ref<ide::CodeModule>& module, bool add) {
  m_context.guard(u"NumberModule", kNumberModuleFailed, module.get(), [&] {
    if (!module) ide::raise(ide::err::ObjectVariableNotSet);
    forEachMember(m_context, *module, [&](const ide::Ref<ide::Member>& member) {
      if (hasProcedures(member->Type()))
        NumberMember(module, member, add);
      else
        m_context.AdvanceProgress(1);
    });
  });
}

void NumberingWalk::NumberMember(const ide::Ref<ide::CodeModule>& module, const ide::Ref<ide::Member>& member,
                                 bool add) {
  m_context.guard(u"NumberMember", kNumberProcedureFailed, module.get(), [&] {
    if (!module || !member) ide::raise(ide::err::ObjectVariableNotSet);
    // Declare statements, which are listed as methods, have no procedure to number.
    m_procedures.of(*module).forMember(
        *member, [&](const ide::ProcExtent& extent) { numberOrUnnumber(*module, extent, add); });
    m_context.AdvanceProgress(1);
  });
}

void NumberingWalk::NumberCurrentProcedure(ide::VBE& vbe, bool add) {
  m_context.guard(u"NumberCurrentProcedure", kNumberProcedureFailed, nullptr, [&] {
    const ProcedureRef procedure = currentProcedure(vbe);
    if (procedure.extent) numberOrUnnumber(*procedure.module, *procedure.extent, add);
    m_context.AdvanceProgress(1);
  });
}

qint32 NumberingWalk::numberBeforeFirst() const {
  const qint64 before = qint64(m_startNumber) - m_interval;
  if (before < std::numeric_limits<qint32>::min() || before > std::numeric_limits<qint32>::max())
    throw LineNumberOverflow();
  return qint32(before);
}

void NumberingWalk::NumberProcedure(ide::CodeModule& module, const QString& name, ide::ProcKind kind) {
  try {
    NumberProcedure(module, extentOf(module, name, kind));
  } catch (const ide::Error& error) {
    if (error.number() != ide::err::SubOrFunctionNotDefined) throw;  // a kind the property lacks
  }
}

void NumberingWalk::UnnumberProcedure(ide::CodeModule& module, const QString& name, ide::ProcKind kind) {
  try {
    UnnumberProcedure(module, extentOf(module, name, kind));
  } catch (const ide::Error& error) {
    if (error.number() != ide::err::SubOrFunctionNotDefined) throw;
  }
}

void NumberingWalk::NumberProcedure(ide::CodeModule& module, const ide::ProcExtent& extent) {
  ProcedureText text = readProcedure(module, extent);
  const JumpTargets targets(text.lines);
  BodyNumbering numbering(numberBeforeFirst(), m_interval, targets);
  for (qsizetype i = text.first; i < text.stop; ++i) {
    if (m_context.yieldAndCheck()) return;
    const int line = text.moduleLine(i);
    m_context.setLine(line);
    try {
      QString& code = text.lines[size_t(i)];
      if (m_numberOf) numbering.continueFrom(m_numberOf(line) - m_interval);
      if (numbering.number(code)) module.ReplaceLine(line, code);
    } catch (const std::exception& failure) {
      m_context.lineSkipped(failure, u"NumberLine", module, line);
    }
  }
}

void NumberingWalk::UnnumberProcedure(ide::CodeModule& module, const ide::ProcExtent& extent) {
  ProcedureText text = readProcedure(module, extent);
  const JumpTargets targets(text.lines);
  // The header's continuation lines hold parameters, never line numbers.
  bool continuation = syntax::continues(text.lines[size_t(text.bodyFrom - 1)]);
  for (qsizetype i = text.bodyFrom; i < text.unnumberStop; ++i) {
    if (m_context.yieldAndCheck()) return;
    const int line = text.moduleLine(i);
    m_context.setLine(line);
    try {
      QString& code = text.lines[size_t(i)];
      if (UnnumberLine(code, continuation, targets)) module.ReplaceLine(line, code);
    } catch (const std::exception& failure) {
      m_context.lineSkipped(failure, u"UnnumberLine", module, line);
    }
  }
}

void NumberingWalk::numberText(ProcedureText& text, bool add) const {
  const JumpTargets targets(text.lines);
  if (add) {
    BodyNumbering numbering(numberBeforeFirst(), m_interval, targets);
    for (qsizetype i = text.first; i < text.stop; ++i) {
      m_context.setLine(text.moduleLine(i));  // where an overflow is reported
      if (m_numberOf) numbering.continueFrom(m_numberOf(text.moduleLine(i)) - m_interval);
      numbering.number(text.lines[size_t(i)]);
    }
    return;
  }
  bool continuation = syntax::continues(text.lines[size_t(text.bodyFrom - 1)]);
  for (qsizetype i = text.bodyFrom; i < text.unnumberStop; ++i)
    UnnumberLine(text.lines[size_t(i)], continuation, targets);
}

}  // namespace transform

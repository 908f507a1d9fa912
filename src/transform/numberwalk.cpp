// SPDX-License-Identifier: MIT
// The line-numbering walks.
#include "transform/numberwalk.h"

#include "transform/linetext.h"
#include "transform/numbering.h"

#include <limits>

namespace transform {

namespace {
// Message numbers of the walks' failures.
constexpr int kProjectFailed = 5121;
constexpr int kModuleFailed = 5122;
constexpr int kProcedureFailed = 5123;
}  // namespace

NumberingWalk::NumberingWalk(WalkContext& context, qint32 startNumber, qint32 interval)
    : m_context(context), m_startNumber(startNumber), m_interval(interval) {}

void NumberingWalk::NumberProject(const ide::Ref<ide::VBProject>& project, bool add) {
  m_context.guard(u"NumberProject", kProjectFailed, nullptr, [&] {
    if (!project) ide::raise(ide::err::ObjectVariableNotSet);
    forEachCodeModule(m_context, *project,
                      [&](const ide::Ref<ide::CodeModule>& module) { NumberModule(module, add); });
  });
}

void NumberingWalk::NumberModule(const ide::Ref<ide::CodeModule>& module, bool add) {
  m_context.guard(u"NumberModule", kModuleFailed, module.get(), [&] {
    if (!module) ide::raise(ide::err::ObjectVariableNotSet);
    auto members = module->Members();
    const int count = members->Count();
    for (int i = 1; i <= count; ++i) {
      if (m_context.yieldAndCheck()) return;
      auto member = members->Item(i);
      const ide::MemberType type = member->Type();
      if (type == ide::MemberType::Method || type == ide::MemberType::Property)
        NumberMember(module, member, add);
      else
        m_context.AdvanceProgress(1);
    }
  });
}

void NumberingWalk::NumberMember(const ide::Ref<ide::CodeModule>& module, const ide::Ref<ide::Member>& member,
                                 bool add) {
  m_context.guard(u"NumberMember", kProcedureFailed, module.get(), [&] {
    if (!module || !member) ide::raise(ide::err::ObjectVariableNotSet);
    const QString name = member->Name().trimmed();
    if (!name.isEmpty()) {
      // Adding passes over Declare statements, which are listed as methods; removing cannot harm them.
      for (const ide::ProcKind kind : procedureKinds(*module, name, member->Type(), add))
        numberOrUnnumber(*module, name, kind, add);
    }
    m_context.AdvanceProgress(1);
  });
}

void NumberingWalk::NumberCurrentProcedure(ide::VBE& vbe, bool add) {
  m_context.guard(u"NumberCurrentProcedure", kProcedureFailed, nullptr, [&] {
    const ProcedureRef procedure = currentProcedure(vbe);
    if (!procedure.name.isEmpty()) numberOrUnnumber(*procedure.module, procedure.name, procedure.kind, add);
    m_context.AdvanceProgress(1);
  });
}

void NumberingWalk::NumberProcedure(ide::CodeModule& module, const QString& name, ide::ProcKind kind) {
  ProcedureLines lines;
  try {
    lines = procedureLines(module, name, kind);
  } catch (const std::exception&) {
    return;  // a kind the property lacks, or a procedure that is gone
  }
  const qint64 before = qint64(m_startNumber) - m_interval;
  if (before < std::numeric_limits<qint32>::min() || before > std::numeric_limits<qint32>::max())
    throw LineNumberOverflow();
  qint32 number = qint32(before);
  bool continuation = false;
  for (int i = lines.first; i < lines.last; ++i) {
    if (m_context.yieldAndCheck()) return;
    m_context.setLine(i);
    try {
      QString text = module.Lines(i, 1);
      // The last procedure also owns the comments after its End line: they are not its code.
      if (!continuation && isProcedureEnd(trimmedView(text))) break;
      if (NumberLine(text, number, continuation, m_interval)) module.ReplaceLine(i, text);
    } catch (const std::exception& failure) {
      m_context.lineSkipped(failure, u"NumberLine", module, i);
    }
  }
}

void NumberingWalk::UnnumberProcedure(ide::CodeModule& module, const QString& name, ide::ProcKind kind) {
  int body = 0;
  int end = 0;
  bool continuation = false;
  try {
    body = module.ProcBodyLine(name, kind);
    end = module.ProcStartLine(name, kind) + module.ProcCountLines(name, kind) - 1;
    // The header's continuation lines hold parameters, never line numbers.
    continuation = isContinued(module.Lines(body, 1));
  } catch (const std::exception&) {
    return;
  }
  for (int i = body + 1; i < end; ++i) {
    if (m_context.yieldAndCheck()) return;
    m_context.setLine(i);
    try {
      QString text = module.Lines(i, 1);
      if (!continuation && isProcedureEnd(trimmedView(text))) break;
      if (UnnumberLine(text, continuation)) module.ReplaceLine(i, text);
    } catch (const std::exception& failure) {
      m_context.lineSkipped(failure, u"UnnumberLine", module, i);
    }
  }
}

}  // namespace transform

// SPDX-License-Identifier: MIT
// The indentation walks.
#include "transform/indentwalk.h"

#include "syntax/line.h"
#include "transform/texts.h"

#include <span>

namespace transform {

using namespace walk;

IndentationWalk::IndentationWalk(WalkContext& context, IndentMode mode, qint32 spaces)
    : m_context(context), m_indenter(mode, spaces) {}

void IndentationWalk::IndentProject(const ide::Ref<ide::VBProject>& project) {
  m_context.guard(u"IndentProject", kIndentProjectFailed, nullptr, [&] {
    if (!project) ide::raise(ide::err::ObjectVariableNotSet);
    forEachCodeModule(m_context, *project,
                      [&](const ide::Ref<ide::CodeModule>& module) { IndentModule(module); });
  });
}

void IndentationWalk::IndentModule(const ide::Ref<ide::CodeModule>& module) {
  m_context.guard(u"IndentModule", kIndentModuleFailed, module.get(), [&] {
    if (!module) ide::raise(ide::err::ObjectVariableNotSet);
    const bool walked = forEachMember(m_context, *module, [&](const ide::Ref<ide::Member>& member) {
      if (hasProcedures(member->Type())) IndentMember(module, member);
    });
    if (walked) IndentDeclarations(*module);
  });
}

void IndentationWalk::IndentMember(const ide::Ref<ide::CodeModule>& module,
                                   const ide::Ref<ide::Member>& member) {
  m_context.guard(u"IndentMember", kIndentProcedureFailed, module.get(), [&] {
    if (!module || !member) ide::raise(ide::err::ObjectVariableNotSet);
    m_procedures.of(*module).forMember(
        *member, [&](const ide::ProcExtent& extent) { IndentProcedure(*module, extent); });
  });
}

void IndentationWalk::IndentCurrentProcedure(ide::VBE& vbe) {
  m_context.guard(u"IndentCurrentProcedure", kIndentProcedureFailed, nullptr, [&] {
    const ProcedureRef procedure = currentProcedure(vbe);
    if (procedure.extent) IndentProcedure(*procedure.module, *procedure.extent);
    m_context.AdvanceProgress(1);
  });
}

bool IndentationWalk::beginProcedure(const ProcedureText& text) {
  const qsizetype bodyLines = std::max<qsizetype>(0, text.stop - text.first);
  const auto body = std::span<const QString>(text.lines)
                        .subspan(size_t(std::min(text.first, text.stop)), size_t(bodyLines));
  m_indenter.beginProcedure(NumberColumnWidth(body));
  return syntax::continues(text.lines[size_t(text.bodyFrom - 1)]);
}

void IndentationWalk::IndentProcedure(ide::CodeModule& module, const QString& name, ide::ProcKind kind) {
  ide::ProcExtent extent;
  try {
    extent = extentOf(module, name, kind);
  } catch (const std::exception&) {
    return;  // a kind the property lacks, or a procedure that is gone
  }
  IndentProcedure(module, extent);
}

void IndentationWalk::IndentProcedure(ide::CodeModule& module, const ide::ProcExtent& extent) {
  ProcedureText text = readProcedure(module, extent);
  // Header continuation lines are indented like the body, one unit in.
  bool continued = beginProcedure(text);
  for (qsizetype i = text.bodyFrom; i < text.stop; ++i) {
    if (m_context.yieldAndCheck()) return;
    const int line = text.moduleLine(i);
    m_context.setLine(line);
    try {
      QString& code = text.lines[size_t(i)];
      if (m_indenter.IndentLine(code, continued)) module.ReplaceLine(line, code);
    } catch (const std::exception& failure) {
      m_context.lineSkipped(failure, u"IndentLine", module, line);
    }
  }
  m_context.AdvanceProgress(text.count);
}

void IndentationWalk::indentText(ProcedureText& text) {
  bool continued = beginProcedure(text);
  for (qsizetype i = text.bodyFrom; i < text.stop; ++i)
    m_indenter.IndentLine(text.lines[size_t(i)], continued);
}

void IndentationWalk::IndentDeclarations(ide::CodeModule& module) {
  m_indenter.beginDeclarations();
  bool continued = false;
  const int count = module.CountOfDeclarationLines();
  for (int i = 1; i <= count; ++i) {
    if (m_context.yieldAndCheck()) return;
    m_context.setLine(i);
    try {
      QString text = module.Lines(i, 1);
      if (m_indenter.IndentDeclarationLine(text, continued)) module.ReplaceLine(i, text);
    } catch (const std::exception& failure) {
      m_context.lineSkipped(failure, u"IndentDeclarationLine", module, i);
    }
    m_context.AdvanceProgress(1);
  }
}

}  // namespace transform

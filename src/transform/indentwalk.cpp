// SPDX-License-Identifier: MIT
// The indentation walks.
#include "transform/indentwalk.h"

#include "transform/linetext.h"

#include <span>

namespace transform {

namespace {
// Message numbers of the walks' failures.
constexpr int kProjectFailed = 5130;
constexpr int kModuleFailed = 5129;
constexpr int kProcedureFailed = 5128;
}  // namespace

IndentationWalk::IndentationWalk(WalkContext& context, IndentMode mode, qint32 spaces)
    : m_context(context), m_indenter(mode, spaces) {}

void IndentationWalk::IndentProject(const ide::Ref<ide::VBProject>& project) {
  m_context.guard(u"IndentProject", kProjectFailed, nullptr, [&] {
    if (!project) ide::raise(ide::err::ObjectVariableNotSet);
    forEachCodeModule(m_context, *project,
                      [&](const ide::Ref<ide::CodeModule>& module) { IndentModule(module); });
  });
}

void IndentationWalk::IndentModule(const ide::Ref<ide::CodeModule>& module) {
  m_context.guard(u"IndentModule", kModuleFailed, module.get(), [&] {
    if (!module) ide::raise(ide::err::ObjectVariableNotSet);
    auto members = module->Members();
    const int count = members->Count();
    for (int i = 1; i <= count; ++i) {
      if (m_context.yieldAndCheck()) return;
      auto member = members->Item(i);
      const ide::MemberType type = member->Type();
      if (type == ide::MemberType::Method || type == ide::MemberType::Property) IndentMember(module, member);
    }
    IndentDeclarations(*module);
  });
}

void IndentationWalk::IndentMember(const ide::Ref<ide::CodeModule>& module,
                                   const ide::Ref<ide::Member>& member) {
  m_context.guard(u"IndentMember", kProcedureFailed, module.get(), [&] {
    if (!module || !member) ide::raise(ide::err::ObjectVariableNotSet);
    const QString name = member->Name().trimmed();
    if (name.isEmpty()) return;
    for (const ide::ProcKind kind : procedureKinds(*module, name, member->Type(), true))
      IndentProcedure(*module, name, kind);
  });
}

void IndentationWalk::IndentCurrentProcedure(ide::VBE& vbe) {
  m_context.guard(u"IndentCurrentProcedure", kProcedureFailed, nullptr, [&] {
    const ProcedureRef procedure = currentProcedure(vbe);
    if (!procedure.name.isEmpty()) IndentProcedure(*procedure.module, procedure.name, procedure.kind);
    m_context.AdvanceProgress(1);
  });
}

void IndentationWalk::IndentProcedure(ide::CodeModule& module, const QString& name, ide::ProcKind kind) {
  ProcedureLines bounds;
  QString header;
  std::vector<QString> lines;  // the lines after the header line, up to the End line
  try {
    bounds = procedureLines(module, name, kind);
    header = module.Lines(bounds.body, 1);
    bool continuation = isContinued(header);
    lines.reserve(size_t(std::max(0, bounds.last - bounds.body - 1)));
    for (int i = bounds.body + 1; i < bounds.last; ++i) {
      QString text = module.Lines(i, 1);
      const QStringView trimmed = trimmedView(text);
      // The last procedure also owns the comments after its End line: they are not its code.
      if (!continuation && isProcedureEnd(trimmed)) break;
      if (!trimmed.isEmpty()) continuation = endsWithContinuation(trimmed);
      lines.push_back(std::move(text));
    }
  } catch (const std::exception&) {
    return;  // a kind the property lacks, or a procedure that is gone
  }

  const qsizetype headerLines = bounds.first - bounds.body - 1;
  const auto body = std::span<const QString>(lines).subspan(std::min<size_t>(headerLines, lines.size()));
  m_indenter.beginProcedure(NumberColumnWidth(body));
  bool continued = isContinued(header);
  for (size_t k = 0; k < lines.size(); ++k) {
    if (m_context.yieldAndCheck()) return;
    const int i = bounds.body + 1 + int(k);
    m_context.setLine(i);
    try {
      if (m_indenter.IndentLine(lines[k], continued)) module.ReplaceLine(i, lines[k]);
    } catch (const std::exception& failure) {
      m_context.lineSkipped(failure, u"IndentLine", module, i);
    }
  }
  m_context.AdvanceProgress(bounds.count);
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

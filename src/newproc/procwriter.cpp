// SPDX-License-Identifier: MIT
#include "newproc/procwriter.h"

#include "common/errors.h"
#include "common/strings.h"
#include "common/uiutils.h"
#include "textins/textinsertion.h"

#include <algorithm>
#include <set>

namespace newproc {
namespace {

constexpr int kNameInUse = 5117;
constexpr int kMemberVariableInUse = 5118;

bool sameName(const QString& a, const QString& b) {
  return a.compare(b, Qt::CaseInsensitive) == 0;
}

bool procedureExists(ide::CodeModule& module, const QString& name, ide::ProcKind kind) {
  try {
    return module.ProcStartLine(name, kind) > 0;
  } catch (const ide::Error&) {
    return false;  // the IDE's "Sub or Function not defined"
  }
}

// Puts the caret at column 1 of `line` and inserts the template there as whole lines.
void insertTemplate(ide::CodePane& pane, textins::TextInsertion& insertion, int line, const QString& text) {
  pane.SetSelection(line, 1, line, 1);
  insertion.InsertText(text + QStringLiteral("\r\n"));
}

}  // namespace

std::optional<Refusal> CheckNamesFree(ide::CodeModule& module, const NewProcChoices& choices) {
  const QString name = choices.name.trimmed();
  const bool property = choices.type == ProcType::Property;
  const QString member = choices.memberVariable.trimmed();
  for (const auto& existing : module.Members()->items()) {
    const QString existingName = existing->Name();
    if (sameName(existingName, name)) {
      // A property may gain the accessors it lacks; anything else of that name is a duplicate.
      if (!property || existing->Type() != ide::MemberType::Property)
        return Refusal{common::LoadResString(kNameInUse), ide::mb::Exclamation, Field::Name};
      for (const ide::ProcKind kind : KindsToWrite(choices))
        if (procedureExists(module, name, kind))
          return Refusal{common::LoadResString(kNameInUse), ide::mb::Exclamation, Field::Name};
    }
    if (property && sameName(existingName, member))
      return Refusal{common::LoadResString(kMemberVariableInUse), ide::mb::Exclamation,
                     Field::MemberVariable};
  }
  return std::nullopt;
}

int EndLineOf(ide::CodeModule& module, int startLine, const QString& name, ide::ProcKind kind) {
  // The IDE counts the lines from where the procedure starts for it, which can lie above `startLine`
  // (blank lines at the end of the module become the new procedure's): beyond the module's end there is
  // nothing to pass over.
  int line = std::min(startLine + module.ProcCountLines(name, kind) - 1, module.CountOfLines());
  for (; line >= 1; --line)
    if (module.Lines(line, 1).trimmed().size() > 2) return line;
  ide::raise(common::kCancelled);
}

void MakeDefaultMember(ide::CodeModule& module, const QString& name) {
  const auto members = module.Members()->items();
  std::set<int> used;
  for (const auto& member : members)
    if (const auto id = member->ProcedureId()) used.insert(*id);
  int next = 1;
  for (const auto& member : members) {
    if (member->ProcedureId() != 0 || sameName(member->Name(), name)) continue;
    while (used.count(next))
      ++next;
    used.insert(next);
    member->setProcedureId(next);
  }
  module.Members()->Item(name)->setProcedureId(0);
}

int WriteProcedures(ide::VBE& vbe, const ide::Ref<ide::CodePane>& pane, const NewProcChoices& choices,
                    const Templates& templates, textins::TextInsertion& insertion) {
  const auto module = pane->CodeModule();
  const QString name = choices.name.trimmed();
  if (choices.type == ProcType::Property)
    module->InsertLines(module->CountOfDeclarationLines() + 1, MemberDeclaration(choices));

  ide::Platform& platform = vbe.Platform();
  common::CHourGlass hourglass(platform.ui());
  int start = 0;
  {
    common::CLockWindowUpdate painting(platform.windows());
    painting.LockWindow(pane->Window()->hWnd());
    for (const ide::ProcKind kind : KindsToWrite(choices)) {
      start = module->CountOfLines() + 1;
      module->InsertLines(start, GenerateProcedure(choices, kind));
      // The handler goes in first: the header above the procedure would move its End line.
      if (choices.errorHandler)
        insertTemplate(*pane, insertion, EndLineOf(*module, start, name, kind), templates.errorHandler);
      if (choices.docHeader) insertTemplate(*pane, insertion, start, templates.docHeader);
    }
  }
  if (choices.isDefault) MakeDefaultMember(*module, name);
  pane->setTopLine(start);
  return start;
}

}  // namespace newproc

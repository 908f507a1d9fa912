// SPDX-License-Identifier: MIT
#include "newproc/procwriter.h"

#include "common/errors.h"
#include "common/strings.h"
#include "common/uiutils.h"
#include "newproc/texts.h"
#include "textins/textinsertion.h"

#include <QStringList>

#include <algorithm>
#include <set>

namespace newproc {
namespace {

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

// The names the module's declarations give that its Members leave out: each Enum, its members, and each
// Type. VB refuses a procedure or variable of the module named like any of them.
QStringList typeAndEnumNames(ide::CodeModule& module) {
  QStringList names;
  const int count = module.CountOfDeclarationLines();
  const QString text = count > 0 ? module.Lines(1, count) : QString();
  bool inEnum = false;
  bool continued = false;
  for (const QString& line : text.split(QStringLiteral("\r\n"))) {
    const bool statementStart = !continued;
    continued = line.endsWith(QStringLiteral(" _"));
    if (!statementStart) continue;
    QStringList words = line.simplified().split(u' ', Qt::SkipEmptyParts);
    if (words.isEmpty() || words[0].startsWith(u'\'') || sameName(words[0], QStringLiteral("Rem"))) continue;
    if (words.size() >= 2 && sameName(words[0], QStringLiteral("End"))) {
      if (sameName(words[1], QStringLiteral("Enum"))) inEnum = false;
      continue;
    }
    if (inEnum) {
      // A member: its name first, in brackets when it is no plain identifier.
      QString name = words[0].section(u'=', 0, 0);
      if (name.startsWith(u'[')) name = line.trimmed().section(u']', 0, 0).mid(1);
      if (!name.isEmpty()) names << name;
      continue;
    }
    for (const char* scope : {"Public", "Private", "Global"})
      if (words.size() > 1 && sameName(words[0], QLatin1StringView(scope))) words.removeFirst();
    const bool isEnum = sameName(words[0], QStringLiteral("Enum"));
    if (words.size() >= 2 && (isEnum || sameName(words[0], QStringLiteral("Type")))) {
      names << words[1].section(u'\'', 0, 0);
      inEnum = isEnum;
    }
  }
  return names;
}

// The names of the controls on the module's form (or user control ...); none for a module without one.
QStringList controlNames(ide::CodeModule& module) {
  QStringList names;
  try {
    if (const auto designer = module.Parent()->Designer())
      for (const auto& control : designer->VBControls()->items())
        names << control->name();
  } catch (const ide::Error& failure) {
    common::logFailure(failure, QStringLiteral("ProcWriter"), QStringLiteral("controlNames"), __LINE__);
  }
  return names;
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
  const auto inUse = [](int message, Field field) {
    return Refusal{common::LoadResString(message), ide::mb::Exclamation, field};
  };
  // Controls, Enums, Enum members and Types are no members, but VB takes them as names of the module.
  for (const QString& taken : typeAndEnumNames(module) + controlNames(module)) {
    if (sameName(taken, name)) return inUse(kNameInUse, Field::Name);
    if (property && sameName(taken, member)) return inUse(kMemberVariableInUse, Field::MemberVariable);
  }
  for (const auto& existing : module.Members()->items()) {
    const QString existingName = existing->Name();
    if (sameName(existingName, name)) {
      // A property may gain the accessors it lacks; anything else of that name is a duplicate.
      if (!property || existing->Type() != ide::MemberType::Property) return inUse(kNameInUse, Field::Name);
      for (const ide::ProcKind kind : KindsToWrite(choices))
        if (procedureExists(module, name, kind)) return inUse(kNameInUse, Field::Name);
    }
    if (property && sameName(existingName, member)) return inUse(kMemberVariableInUse, Field::MemberVariable);
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

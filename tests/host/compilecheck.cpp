// SPDX-License-Identifier: MIT
// The faults VB's compiler finds in code the add-in writes, read from the module as the IDE model holds it.
#include "host/files/controlevents.h"
#include "ide/vbide.h"
#include "testproject.h"

#include <QHash>
#include <QRegularExpression>

namespace host::test {

QStringList uncompilableLines(ide::VBComponent& component) {
  const auto module = component.CodeModule();
  const QString code = module->Lines(1, module->CountOfLines());
  QHash<QString, ide::Ref<ide::VBControl>> controls;  // by lower-cased name
  if (const auto designer = component.Designer())
    for (const auto& control : designer->VBControls()->items())
      controls.insert(control->name().toLower(), control);
  QStringList taken = controls.keys();  // with the Enums, their members and the Types
  static const QRegularExpression block(u"^(?:\\w+ )?(Enum|Type) (\\w+)\\r\\n([\\s\\S]*?)^End \\1"_qs,
                                        QRegularExpression::MultilineOption);
  for (const auto& match : block.globalMatch(code)) {
    taken << match.captured(2);
    for (const QString& line : match.captured(3).split(u"\r\n"_qs))
      if (match.captured(1) == u"Enum"_qs) taken << line.section(u'=', 0, 0).trimmed();
  }
  QStringList faults;
  for (const auto& member : module->Members()->items()) {
    if (member->Scope() == ide::Scope::Friend && component.Type() == ide::ComponentType::StdModule)
      faults << u"Friend in a standard module: "_qs + member->Name();
    if (taken.contains(member->Name(), Qt::CaseInsensitive)) faults << u"name in use: "_qs + member->Name();
  }
  // A control's focus event procedures and its BackColor, on a class that has them.
  static const QRegularExpression use(
      u"^Private Sub (\\w+)_(?:Got|Lost)Focus\\(|(\\w+)(?:\\(Index\\))?\\.BackColor\\b"_qs,
      QRegularExpression::MultilineOption);
  for (const auto& match : use.globalMatch(code)) {
    const auto control = controls.value((match.captured(1) + match.captured(2)).toLower());
    if (!control) continue;
    const auto events = controlEvents(control->ClassName());
    const bool exists = match.captured(1).isEmpty()
                            ? errorNumberOf([&] { control->Properties()->Item(u"BackColor"_qs); }) == 0
                            : std::any_of(events.begin(), events.end(), [](const EventInfo& e) {
                                return qstrcmp(e.name, "GotFocus") == 0;
                              });
    if (!exists) faults << u"no such member: "_qs + match.captured(0);
  }
  return faults;
}

}  // namespace host::test

// SPDX-License-Identifier: MIT
// `quimbel list`: how the tool reads a project: its components, their members and the extents of every
// procedure, as the IDE's object model answers them.
#include "cli.h"
#include "host/model/vbe.h"

#include <QDir>
#include <QFileInfo>
#include <QHash>

#include <vector>

namespace cli {
namespace {

QString projectTypeName(ide::ProjectType type) {
  switch (type) {
    case ide::ProjectType::ActiveXExe:
      return QStringLiteral("ActiveX EXE");
    case ide::ProjectType::ActiveXDll:
      return QStringLiteral("ActiveX DLL");
    case ide::ProjectType::ActiveXControl:
      return QStringLiteral("ActiveX Control");
    default:
      return QStringLiteral("Standard EXE");
  }
}

QString memberTypeName(ide::MemberType type) {
  switch (type) {
    case ide::MemberType::Method:
      return QStringLiteral("Method");
    case ide::MemberType::Property:
      return QStringLiteral("Property");
    case ide::MemberType::Variable:
      return QStringLiteral("Variable");
    case ide::MemberType::Event:
      return QStringLiteral("Event");
    case ide::MemberType::Const:
      return QStringLiteral("Const");
  }
  return {};
}

QString scopeName(ide::Scope scope) {
  switch (scope) {
    case ide::Scope::Private:
      return QStringLiteral("Private");
    case ide::Scope::Public:
      return QStringLiteral("Public");
    case ide::Scope::Friend:
      return QStringLiteral("Friend");
  }
  return {};
}

QString procedureKeyword(const host::ProcInfo& proc) {
  switch (proc.kind) {
    case ide::ProcKind::Get:
      return QStringLiteral("Property Get");
    case ide::ProcKind::Let:
      return QStringLiteral("Property Let");
    case ide::ProcKind::Set:
      return QStringLiteral("Property Set");
    default:
      return proc.isFunction ? QStringLiteral("Function") : QStringLiteral("Sub");
  }
}

}  // namespace

int runList(const ListOptions& options) {
  auto vbe = host::VbeImpl::create();
  // Module files are listed under the path the user gave; the rest under their path from here.
  QHash<QString, QString> givenPaths;
  for (const QString& file : options.files)
    if (!openInput(*vbe, file, givenPaths)) return kInputError;
  const bool missing = reportMissingFiles(*vbe);
  const QDir here = QDir::current();
  auto shownPath = [&](const QString& path) { return givenPaths.value(path, here.relativeFilePath(path)); };

  for (const auto& project : vbe->projects()) {
    if (!options.tsv) {
      const QString file =
          project->FileName().isEmpty() ? QString() : QStringLiteral("  ") + shownPath(project->FileName());
      printLine(
          QStringLiteral("Project %1 (%2)%3").arg(project->Name(), projectTypeName(project->Type()), file));
    }
    for (const auto& component : project->components()) {
      const QString path = shownPath(component->filePath());
      auto module = component->codeModule();
      if (options.tsv) {
        if (!module) continue;
        auto& text = module->text();
        printLine(
            QStringLiteral("%1\t(declarations)\t0\t0\t0\t%2").arg(path).arg(text.countOfDeclarationLines()));
        for (const ide::ProcExtent& proc : text.procedureExtents()) {
          printLine(QStringLiteral("%1\t%2\t%3\t%4\t%5\t%6")
                        .arg(path, proc.name)
                        .arg(static_cast<int>(proc.kind))
                        .arg(proc.startLine)
                        .arg(proc.bodyLine)
                        .arg(proc.countLines));
        }
        continue;
      }
      printLine(QStringLiteral("  %1 %2  %3")
                    .arg(host::componentTypeName(component->Type()), component->Name(), path));
      if (!module) continue;
      auto& text = module->text();
      printLine(QStringLiteral("    %1 lines, declarations 1-%2")
                    .arg(text.countOfLines())
                    .arg(text.countOfDeclarationLines()));
      // The procedures of each member, found by name once: a member does not search the whole module.
      // Each procedure is listed at its own place, two of one name under #If ... #Else too.
      const std::vector<ide::ProcExtent> extents = text.procedureExtents();
      QHash<QString, std::vector<size_t>> byMember;
      for (size_t i = 0; i < extents.size(); ++i)
        byMember[extents[i].name.toCaseFolded()].push_back(i);
      for (const host::MemberInfo& member : text.members()) {
        printLine(QStringLiteral("    %1 %2 %3")
                      .arg(scopeName(member.scope), memberTypeName(member.type), member.name));
        for (const size_t i : byMember.value(member.name.toCaseFolded())) {
          printLine(QStringLiteral("      %1: start %2, body %3, lines %4")
                        .arg(procedureKeyword(text.procedures()[i]))
                        .arg(extents[i].startLine)
                        .arg(extents[i].bodyLine)
                        .arg(extents[i].countLines));
        }
      }
    }
  }
  return withMissingFiles(kSuccess, missing);
}

}  // namespace cli

// SPDX-License-Identifier: MIT
// `quimbel list`: how the tool reads a project: its components, their members and the extents of every
// procedure, as the IDE's object model answers them.
#include "cli.h"
#include "fileio/parallel.h"
#include "host/model/vbe.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QHash>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QSet>

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

/// The procedures of each member, as indices into `extents`, found by name once: a member does not search
/// the whole module. Each procedure keeps its own place, two of one name under #If ... #Else too.
QHash<QString, std::vector<size_t>> proceduresByMember(const std::vector<ide::ProcExtent>& extents) {
  QHash<QString, std::vector<size_t>> byMember;
  for (size_t i = 0; i < extents.size(); ++i)
    byMember[extents[i].name.toCaseFolded()].push_back(i);
  return byMember;
}

/// A component as a JSON object: kinds by name, and every line both as the code window counts it and as
/// the file does.
QJsonObject componentJson(host::ComponentImpl& component, const QString& path) {
  QJsonObject object{{QStringLiteral("name"), component.Name()},
                     {QStringLiteral("type"), host::componentTypeName(component.Type())},
                     {QStringLiteral("file"), path}};
  auto module = component.codeModule();
  if (!module) return object;
  auto& text = module->text();
  const std::vector<int> fileLines = fileLinesOf(component);
  const auto fileLine = [&](int codeLine) {
    return codeLine >= 1 && size_t(codeLine) <= fileLines.size() ? QJsonValue(fileLines[size_t(codeLine) - 1])
                                                                 : QJsonValue();
  };
  object.insert(QStringLiteral("code_lines"), text.countOfLines());
  object.insert(QStringLiteral("declaration_lines"), text.countOfDeclarationLines());
  const std::vector<ide::ProcExtent> extents = text.procedureExtents();
  const auto byMember = proceduresByMember(extents);
  QJsonArray members;
  for (const host::MemberInfo& member : text.members()) {
    QJsonArray procedures;
    for (const size_t i : byMember.value(member.name.toCaseFolded())) {
      const ide::ProcExtent& extent = extents[i];
      procedures.append(QJsonObject{{QStringLiteral("kind"), procedureKeyword(text.procedures()[i])},
                                    {QStringLiteral("start_code_line"), extent.startLine},
                                    {QStringLiteral("start_file_line"), fileLine(extent.startLine)},
                                    {QStringLiteral("body_code_line"), extent.bodyLine},
                                    {QStringLiteral("body_file_line"), fileLine(extent.bodyLine)},
                                    {QStringLiteral("line_count"), extent.countLines}});
    }
    members.append(QJsonObject{{QStringLiteral("name"), member.name},
                               {QStringLiteral("type"), memberTypeName(member.type)},
                               {QStringLiteral("scope"), scopeName(member.scope)},
                               {QStringLiteral("procedures"), procedures}});
  }
  object.insert(QStringLiteral("members"), members);
  return object;
}

/// What `quimbel list` says of one component: lines of text (or TSV), or a JSON object.
struct Listing {
  QByteArray text;
  QJsonObject json;
};

Listing listComponent(host::ComponentImpl& component, const QString& path, const ListOptions& options) {
  Listing listing;
  if (options.json) {
    listing.json = componentJson(component, path);
    return listing;
  }
  QString out;
  const auto line = [&](const QString& text) {
    out += text;
    out += u'\n';
  };
  auto module = component.codeModule();
  if (options.tsv) {
    if (!module) return listing;
    auto& text = module->text();
    line(QStringLiteral("%1\t(declarations)\t0\t0\t0\t%2").arg(path).arg(text.countOfDeclarationLines()));
    for (const ide::ProcExtent& proc : text.procedureExtents()) {
      line(QStringLiteral("%1\t%2\t%3\t%4\t%5\t%6")
               .arg(path, proc.name)
               .arg(static_cast<int>(proc.kind))
               .arg(proc.startLine)
               .arg(proc.bodyLine)
               .arg(proc.countLines));
    }
    listing.text = out.toLocal8Bit();
    return listing;
  }
  line(QStringLiteral("  %1 %2  %3").arg(host::componentTypeName(component.Type()), component.Name(), path));
  if (module) {
    auto& text = module->text();
    line(QStringLiteral("    %1 lines, declarations 1-%2")
             .arg(text.countOfLines())
             .arg(text.countOfDeclarationLines()));
    const std::vector<ide::ProcExtent> extents = text.procedureExtents();
    const auto byMember = proceduresByMember(extents);
    for (const host::MemberInfo& member : text.members()) {
      line(QStringLiteral("    %1 %2 %3")
               .arg(scopeName(member.scope), memberTypeName(member.type), member.name));
      for (const size_t i : byMember.value(member.name.toCaseFolded())) {
        line(QStringLiteral("      %1: start %2, body %3, lines %4")
                 .arg(procedureKeyword(text.procedures()[i]))
                 .arg(extents[i].startLine)
                 .arg(extents[i].bodyLine)
                 .arg(extents[i].countLines));
      }
    }
  }
  listing.text = out.toLocal8Bit();
  return listing;
}

}  // namespace

int runList(const ListOptions& options) {
  useEncoding(options.input);
  const auto files = expandInputs(options.input);
  if (!files) return kInputError;
  auto vbe = host::VbeImpl::create();
  vbe->setReadsCodeOnDemand(true);
  // Module files are listed under the path the user gave; the rest under their path from here. A module
  // file that an open project holds is listed with that project only.
  QHash<QString, QString> givenPaths;
  QSet<QString> opened;
  for (const QString& file : *files) {
    if (opened.contains(fileIdentity(file))) continue;
    if (!openInput(*vbe, file, givenPaths)) return kInputError;
    for (const auto& project : vbe->projects()) {
      if (!project->FileName().isEmpty()) opened.insert(fileIdentity(project->FileName()));
      for (const auto& component : project->components())
        opened.insert(fileIdentity(component->filePath()));
    }
  }
  const bool missing = reportMissingFiles(*vbe) > 0;
  const QDir here = QDir::current();
  auto shownPath = [&](const QString& path) { return givenPaths.value(path, here.relativeFilePath(path)); };

  QJsonArray projects;
  for (const auto& project : vbe->projects()) {
    const QString projectFile = project->FileName().isEmpty() ? QString() : shownPath(project->FileName());
    if (!options.tsv && !options.json) {
      printLine(QStringLiteral("Project %1 (%2)%3")
                    .arg(project->Name(), projectTypeName(project->Type()),
                         projectFile.isEmpty() ? QString() : QStringLiteral("  ") + projectFile));
    }
    std::vector<std::shared_ptr<host::ComponentImpl>> listed;
    for (const auto& component : project->components())
      if (!options.input.exclusions.excludes(component->filePath())) listed.push_back(component);
    // Each component is read, listed and freed on its own, side by side on every core; the lists are
    // printed in the project's order.
    std::vector<Listing> listings(listed.size());
    std::vector<std::exception_ptr> failures;
    fileio::parallelFor(
        listed.size(),
        [&](size_t i) {
          host::ComponentImpl& component = *listed[i];
          listings[i] = listComponent(component, shownPath(component.filePath()), options);
          component.unloadCode();
        },
        failures);
    for (const std::exception_ptr& failure : failures)
      if (failure) std::rethrow_exception(failure);
    QJsonArray components;
    for (size_t i = 0; i < listed.size(); ++i) {
      if (listed[i]->codeModule() && listed[i]->looksLikeUtf8()) warnUtf8(shownPath(listed[i]->filePath()));
      if (options.json)
        components.append(listings[i].json);
      else
        printBytes(listings[i].text);
    }
    if (options.json)
      projects.append(QJsonObject{
          {QStringLiteral("name"), project->Name()},
          {QStringLiteral("type"), projectTypeName(project->Type())},
          {QStringLiteral("file"), projectFile.isEmpty() ? QJsonValue() : QJsonValue(projectFile)},
          {QStringLiteral("components"), components}});
  }
  if (options.json) printBytes(jsonText(QJsonDocument(QJsonObject{{QStringLiteral("projects"), projects}})));
  return withMissingFiles(kSuccess, missing);
}

}  // namespace cli

// SPDX-License-Identifier: MIT
#include "lsp/projects.h"

#include "fileio/fileio.h"
#include "host/files/ansi.h"
#include "host/files/groupfile.h"
#include "host/files/modulefile.h"
#include "host/files/projectfile.h"
#include "ide/error.h"

#include <QDir>
#include <QFileInfo>

namespace lsp {

namespace {

// How far up from a module's folder its project and group are looked for.
constexpr int kFoldersUp = 4;

}  // namespace

bool sameFile(const QString& a, const QString& b) {
  const QFileInfo left(a);
  const QFileInfo right(b);
  if (left.exists() && right.exists()) return left.canonicalFilePath() == right.canonicalFilePath();
  return QDir::cleanPath(left.absoluteFilePath()) == QDir::cleanPath(right.absoluteFilePath());
}

namespace {

/// The files named *.<suffix> (any letter case) in `folder` and up to kFoldersUp folders above it.
QStringList filesAbove(const QString& folder, const QString& suffix) {
  QStringList found;
  QDir dir(folder);
  for (int up = 0; up <= kFoldersUp; ++up) {
    for (const QFileInfo& file : dir.entryInfoList(QDir::Files | QDir::Readable, QDir::Name))
      if (file.suffix().compare(suffix, Qt::CaseInsensitive) == 0) found << file.absoluteFilePath();
    if (!dir.cdUp()) break;
  }
  return found;
}

}  // namespace

std::variant<ProjectListing, Failure> readProject(const QString& path) {
  try {
    const host::ProjectFile project = host::ProjectFile::parse(fileio::readFileBytes(path), path);
    ProjectListing listing{path, project.name(), {}, {}};
    const QString folder = QFileInfo(path).absolutePath();
    const auto components = project.components();
    for (size_t i = 0; i < components.size(); ++i) {
      const QString file = host::resolveProjectPath(folder, components[i].path);
      if (!QFileInfo::exists(file))
        listing.missing.push_back({int(project.componentLine(int(i))), components[i].path});
      else if (components[i].kind != host::ComponentKind::RelatedDocument &&
               components[i].kind != host::ComponentKind::ResourceFile)
        listing.modules << file;
    }
    return listing;
  } catch (const ide::Error& error) {
    return Failure{kRequestFailed, error.description()};
  }
}

std::variant<ProjectListing, Failure> readGroup(const QString& path) {
  try {
    const host::GroupFile group = host::GroupFile::parse(fileio::readFileBytes(path), path);
    ProjectListing listing{path, QFileInfo(path).completeBaseName(), {}, {}};
    const QString folder = QFileInfo(path).absolutePath();
    const auto projects = group.projects();
    for (size_t i = 0; i < projects.size(); ++i) {
      const QString file = host::resolveProjectPath(folder, projects[i].path);
      if (QFileInfo::exists(file))
        listing.modules << file;
      else
        listing.missing.push_back({int(group.projectLine(int(i))), projects[i].path});
    }
    return listing;
  } catch (const ide::Error& error) {
    return Failure{kRequestFailed, error.description()};
  }
}

QString projectOf(const QString& modulePath) {
  for (const QString& project : filesAbove(QFileInfo(modulePath).absolutePath(), QStringLiteral("vbp"))) {
    const auto listing = readProject(project);
    if (const auto* read = std::get_if<ProjectListing>(&listing))
      for (const QString& module : read->modules)
        if (sameFile(module, modulePath)) return project;
  }
  return {};
}

QString groupOf(const QString& projectPath) {
  for (const QString& group : filesAbove(QFileInfo(projectPath).absolutePath(), QStringLiteral("vbg"))) {
    const auto listing = readGroup(group);
    if (const auto* read = std::get_if<ProjectListing>(&listing))
      for (const QString& project : read->modules)
        if (sameFile(project, projectPath)) return group;
  }
  return {};
}

std::variant<QString, Failure> readModuleText(const QString& path) {
  try {
    return host::decodeAnsi(fileio::readFileBytes(path));
  } catch (const ide::Error& error) {
    return Failure{kRequestFailed, error.description()};
  }
}

std::variant<CodeLayout, Failure> codeLayout(const std::vector<QStringView>& lines, const QString& fileName) {
  std::vector<host::SourceLine> source;
  source.reserve(lines.size());
  for (const QStringView line : lines)
    source.push_back({line.toString(), host::LineEnd::CRLF});
  try {
    const host::ModuleSource module = host::parseModuleLines(source, fileName);
    std::vector<host::SourceLine> form;
    if (module.form) module.form->appendLines(form);
    CodeLayout layout;
    layout.firstCodeLine = int(module.preamble.size() + form.size() + module.moduleAttributes.size());
    layout.fileLineOfCode.reserve(module.code.size());
    int fileLine = layout.firstCodeLine;
    auto attribute = module.memberAttributes.begin();
    for (size_t i = 0; i < module.code.size(); ++i) {
      for (; attribute != module.memberAttributes.end() && attribute->afterCodeLine <= int(i); ++attribute)
        ++fileLine;
      layout.fileLineOfCode.push_back(fileLine++);
    }
    return layout;
  } catch (const ide::Error& error) {
    return Failure{kRequestFailed, error.description()};
  }
}

std::vector<QStringView> splitLines(QStringView text, const LineIndex& index) {
  std::vector<QStringView> lines;
  lines.reserve(size_t(index.count()));
  for (int i = 0; i < index.count(); ++i)
    lines.push_back(index.line(text, i));
  return lines;
}

}  // namespace lsp

// SPDX-License-Identifier: MIT
// The files around a module: the project that lists it and the group that lists that project (found from
// the module's folder up), their entries, and module files read in the code page VB6 writes them in.
#pragma once

#include "lsp/documents.h"
#include "lsp/protocol.h"

#include <QString>
#include <QStringList>

#include <optional>
#include <variant>
#include <vector>

namespace lsp {

/// An entry of a project or group file whose file is missing: the line (0-based) and the path written.
struct MissingEntry {
  int line = 0;
  QString entry;
};

struct ProjectListing {
  QString path;
  QString name;
  /// The module files it lists that exist (absolute paths), in file order.
  QStringList modules;
  std::vector<MissingEntry> missing;
};

/// Reads a project file's entries. A file that cannot be read or parsed is a failure.
std::variant<ProjectListing, Failure> readProject(const QString& path);
/// The project files a group lists (those that exist), and its entries whose file is missing.
std::variant<ProjectListing, Failure> readGroup(const QString& path);

/// The project file that lists `modulePath`, looked for in the module's folder and the folders above it;
/// empty when there is none.
QString projectOf(const QString& modulePath);
/// The group file that lists `projectPath`, looked for in the project's folder and the folders above it.
QString groupOf(const QString& projectPath);

/// The two paths name one file (links followed; paths of files that do not exist compared as written).
bool sameFile(const QString& a, const QString& b);

/// A module file's text in the ANSI code page (Windows-1252).
std::variant<QString, Failure> readModuleText(const QString& path);

/// Where a module's code begins and which file line (0-based) holds each code line (the header and the
/// hidden attribute lines left out), read as the file layer reads a module.
struct CodeLayout {
  int firstCodeLine = 0;
  std::vector<int> fileLineOfCode;
};
std::variant<CodeLayout, Failure> codeLayout(const std::vector<QStringView>& lines, const QString& fileName);

/// The lines of a text, cut as the protocol cuts them.
std::vector<QStringView> splitLines(QStringView text, const LineIndex& index);

}  // namespace lsp

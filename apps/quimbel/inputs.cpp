// SPDX-License-Identifier: MIT
// What the commands take in: the files given on the command line, opened in the IDE model, and the files
// their groups and projects list that are missing.
#include "cli.h"
#include "host/model/vbe.h"

#include <QDir>

namespace cli {

bool openInput(host::VbeImpl& vbe, const QString& file, QHash<QString, QString>& givenPaths) {
  try {
    for (const auto& project : vbe.open(file))
      if (project->FileName().isEmpty())
        for (const auto& component : project->components())
          givenPaths.insert(component->filePath(), file);
    return true;
  } catch (const ide::Error& error) {
    printError(QStringLiteral("%1: %2").arg(file, error.description()));
    return false;
  }
}

bool reportMissingFiles(const host::VbeImpl& vbe) {
  const std::vector<host::MissingFile> missing = vbe.missingFiles();
  const QDir here = QDir::current();
  for (const host::MissingFile& file : missing)
    printError(QStringLiteral("%1, line %2: file not found: %3")
                   .arg(here.relativeFilePath(file.listedIn))
                   .arg(file.line)
                   .arg(file.entry));
  return !missing.empty();
}

int withMissingFiles(int code, bool missing) {
  return missing && (code == kSuccess || code == kWouldChange) ? kMissingFiles : code;
}

}  // namespace cli

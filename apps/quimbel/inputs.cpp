// SPDX-License-Identifier: MIT
// What the commands take in: the files and folders given on the command line, opened in the IDE model,
// and the files their groups and projects list that are missing.
#include "cli.h"
#include "host/files/ansi.h"
#include "host/model/vbe.h"

#include <QDir>
#include <QDirIterator>
#include <QFileInfo>
#include <QSet>

#include <algorithm>

#include <fnmatch.h>

namespace cli {
namespace {

bool isModuleFile(const QString& path) {
  static const QStringList kSuffixes = {QStringLiteral("bas"), QStringLiteral("cls"), QStringLiteral("frm"),
                                        QStringLiteral("ctl"), QStringLiteral("pag"), QStringLiteral("dob"),
                                        QStringLiteral("dsr")};
  return kSuffixes.contains(QFileInfo(path).suffix().toLower());
}

/// The project and module files under `folder`, by path, projects first; hidden folders are passed over,
/// and so are linked folders (which could lead back up).
QStringList filesUnder(const QString& folder) {
  QStringList projects;
  QStringList modules;
  QDirIterator it(folder, QDir::Files, QDirIterator::Subdirectories);
  while (it.hasNext()) {
    const QString path = it.next();
    const QString relative = QDir(folder).relativeFilePath(path);
    if (relative.startsWith(u'.') || relative.contains(QStringLiteral("/."))) continue;
    if (isModuleFile(path))
      modules << path;
    else if (QFileInfo(path).suffix().compare(QStringLiteral("vbp"), Qt::CaseInsensitive) == 0)
      projects << path;
  }
  projects.sort();
  modules.sort();
  return projects + modules;
}

}  // namespace

bool Exclusions::excludes(const QString& path) const {
  if (m_globs.isEmpty()) return false;
  const QString relative =
      QDir::cleanPath(QDir::current().relativeFilePath(QFileInfo(path).absoluteFilePath()));
  QStringList candidates;
  const QStringList parts = relative.split(u'/');
  for (qsizetype i = 0; i < parts.size(); ++i)
    candidates << parts[i] << parts.mid(0, i + 1).join(u'/');
  for (QString glob : m_globs) {
    if (glob.startsWith(QStringLiteral("./"))) glob.remove(0, 2);
    const QByteArray pattern = QFile::encodeName(glob);
    for (const QString& candidate : candidates)
      if (::fnmatch(pattern.constData(), QFile::encodeName(candidate).constData(), 0) == 0) return true;
  }
  return false;
}

QString fileIdentity(const QString& path) {
  const QFileInfo info(path);
  const QString canonical = info.canonicalFilePath();
  return canonical.isEmpty() ? info.absoluteFilePath() : canonical;
}

std::optional<QStringList> expandInputs(const InputOptions& options) {
  QStringList projects;
  QStringList modules;
  QSet<QString> seen;
  bool ok = true;
  const auto add = [&](const QString& file) {
    if (options.exclusions.excludes(file)) return;
    const QString identity = fileIdentity(file);
    if (seen.contains(identity)) return;
    seen.insert(identity);
    (isModuleFile(file) ? modules : projects) << file;
  };
  for (const QString& given : options.files) {
    if (!QFileInfo(given).isDir()) {
      add(given);
      continue;
    }
    const QStringList found = filesUnder(given);
    if (found.isEmpty()) {
      printError(QStringLiteral("%1: no project or module files in this folder").arg(given));
      ok = false;
    }
    for (const QString& file : found)
      add(QDir::cleanPath(file));
  }
  if (!ok) return std::nullopt;
  return projects + modules;
}

void useEncoding(const InputOptions& options) {
  host::setSourceEncoding(options.utf8 ? host::SourceEncoding::Utf8 : host::SourceEncoding::Ansi);
}

void warnUtf8(const QString& shownPath) {
  printError(QStringLiteral("%1: warning: this module is UTF-8, but VB6 modules are in the ANSI code page "
                            "(Windows-1252), in which each of its accented letters reads as two characters; "
                            "--encoding utf-8 reads and writes it as UTF-8")
                 .arg(shownPath));
}

QString namingFileOnce(const QString& file, const QString& description) {
  QString text = description;
  const QString absolute = QFileInfo(file).absoluteFilePath();
  if (absolute != file) text.replace(absolute, file);
  if (text.startsWith(file)) return text;
  text.replace(QStringLiteral(": ") + file, QString());  // "File not found: <file>"
  if (text.contains(file)) return text;
  return file + QStringLiteral(": ") + text;
}

bool openInput(host::VbeImpl& vbe, const QString& file, QHash<QString, QString>& givenPaths,
               const QString& shownAs) {
  const QString shown = shownAs.isEmpty() ? file : shownAs;
  try {
    for (const auto& project : vbe.open(file))
      if (project->FileName().isEmpty())
        for (const auto& component : project->components())
          givenPaths.insert(component->filePath(), shown);
    return true;
  } catch (const ide::Error& error) {
    QString description = error.description();
    if (shown != file) description.replace(QFileInfo(file).absoluteFilePath(), shown).replace(file, shown);
    printError(namingFileOnce(shown, description));
    return false;
  }
}

QString styleErrorText(const codestyle::StyleError& error) {
  const QString file =
      error.file.isEmpty() ? QStringLiteral(".editorconfig") : QDir::current().relativeFilePath(error.file);
  return error.line > 0 ? QStringLiteral("%1, line %2: %3").arg(file).arg(error.line).arg(error.message)
                        : QStringLiteral("%1: %2").arg(file, error.message);
}

int reportMissingFiles(const host::VbeImpl& vbe) {
  const std::vector<host::MissingFile> missing = vbe.missingFiles();
  const QDir here = QDir::current();
  for (const host::MissingFile& file : missing)
    printError(QStringLiteral("%1, line %2: file not found: %3")
                   .arg(here.relativeFilePath(file.listedIn))
                   .arg(file.line)
                   .arg(file.entry));
  return int(missing.size());
}

int withMissingFiles(int code, bool missing) {
  return missing && (code == kSuccess || code == kWouldChange) ? kMissingFiles : code;
}

}  // namespace cli

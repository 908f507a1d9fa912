// SPDX-License-Identifier: MIT
// Writes synthetic VB6 projects of a chosen size for benchmarks: standard modules, classes and forms
// with the shapes real code has (nested blocks, continued lines, comments, Declare statements, properties,
// conditional compilation, error handlers, numbered lines, accented text), in Windows-1252 with CRLF.
#pragma once

#include <QString>
#include <QStringList>
#include <QtGlobal>

#include <memory>

class QTemporaryDir;

namespace gen {

struct GeneratorOptions {
  /// Code lines over all components: the lines a code window shows, i.e. everything after each file's
  /// header. Met exactly when codeLines >= components; otherwise every component gets one line.
  qint64 codeLines = 1'000'000;
  /// Components over all projects, shared out evenly; must be at least `projects`.
  int components = 200;
  int projects = 1;
  /// The same seed and options always give the same bytes.
  quint32 seed = 1;
};

struct GeneratedGroup {
  /// Absolute path of the .vbg; empty when only one project was written (no group file then).
  QString groupFile;
  /// Absolute paths of the .vbp files, the startup project first.
  QStringList projectFiles;
  /// Code lines actually written, and the number of components.
  qint64 codeLines = 0;
  int components = 0;
};

/// Writes the projects under `directory` (created when missing): project N goes to `ProjetoN/ProjetoN.vbp`
/// with its components beside it, and with more than one project a `Grupo.vbg` lists them all. Files of
/// the same names are overwritten; nothing else in the directory is touched.
/// Throws std::invalid_argument for impossible options and std::runtime_error, naming the path, when a
/// directory or file cannot be written.
GeneratedGroup generateProjects(const QString& directory, const GeneratorOptions& options);

/// Generated projects in a temporary directory of their own, removed with the object: what a benchmark
/// program works on for its whole run.
class TemporaryGroup {
 public:
  explicit TemporaryGroup(const GeneratorOptions& options);
  ~TemporaryGroup();
  TemporaryGroup(const TemporaryGroup&) = delete;
  TemporaryGroup& operator=(const TemporaryGroup&) = delete;

  const GeneratedGroup& group() const { return m_group; }
  /// The first (startup) project file.
  const QString& projectFile() const { return m_group.projectFiles.front(); }

 private:
  std::unique_ptr<QTemporaryDir> m_dir;
  GeneratedGroup m_group;
};

}  // namespace gen

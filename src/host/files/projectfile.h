// SPDX-License-Identifier: MIT
// A project file (.vbp): "Key=value" lines, then optional "[Section]" parts. Every line is kept in order and
// written back as read; edits touch only the lines they concern. Also the conversion between the
// backslash paths the file holds (relative to the project's folder) and local paths.
#pragma once

#include "host/files/sourcelines.h"

#include <QByteArray>
#include <QByteArrayView>
#include <QString>
#include <QStringList>
#include <QStringView>

#include <cstddef>
#include <initializer_list>
#include <optional>
#include <vector>

namespace host {

enum class ComponentKind : quint8 {
  Module,           // Module=Name; path
  Class,            // Class=Name; path
  Form,             // Form=path (forms and MDI forms)
  UserControl,      // UserControl=path
  PropertyPage,     // PropertyPage=path
  UserDocument,     // UserDocument=path
  Designer,         // Designer=path
  RelatedDocument,  // RelatedDoc=path
  ResourceFile,     // ResFile32="path"
};

/// The key that introduces the kind's entries: "Module", "RelatedDoc", "ResFile32" ...
QString componentKey(ComponentKind kind);

struct ProjectComponent {
  ComponentKind kind = ComponentKind::Module;
  QString name;  // Module and Class entries only
  QString path;  // as written (backslashes, relative to the project's folder); ResFile32 without its quotes

  friend bool operator==(const ProjectComponent&, const ProjectComponent&) = default;
};

class ProjectFile {
 public:
  /// Reads the lines of a project file. Throws ide::Error 321 "<fileName>, line <n>: ..." for a line of the
  /// main part that is neither blank nor "Key=value", and for a component entry without a file name.
  static ProjectFile parse(const std::vector<SourceLine>& lines, const QString& fileName);
  static ProjectFile parse(QByteArrayView bytes, const QString& fileName);

  /// The lines to write: unchanged lines exactly as read.
  const std::vector<SourceLine>& write() const { return m_lines; }
  QByteArray toBytes(const QString& fileName) const;

  /// The raw text after "Key=" of the first line with the key in the main part (case-insensitive), e.g.
  /// `"Project1"` with its quotes, or `Exe`.
  std::optional<QString> value(QStringView key) const;
  /// The raw values of every line with the key in the main part, in file order.
  QStringList values(QStringView key) const;
  /// Replaces the first line with the key, or appends "Key=value" after the last line of the main part.
  void setValue(const QString& key, const QString& rawValue);
  /// Removes the first line with the key; false when there is none.
  bool removeValue(QStringView key);

  /// The Name="..." key without its quotes.
  QString name() const;
  void setName(const QString& name);

  /// The component entries in file order.
  std::vector<ProjectComponent> components() const;
  /// Adds an entry after the last component entry, else after the last Reference or Object line, else
  /// after the Type line, else at the end of the main part.
  void addComponent(const ProjectComponent& component);
  /// `index` counts components() entries; throws ide::Error 9 when it is out of range.
  void removeComponent(int index);
  void setComponentName(int index, const QString& name);
  void setComponentPath(int index, const QString& path);

  /// The raw values of the Reference= lines: "*\G{guid}#version#lcid#path#description" or "*\Apath".
  QStringList references() const;
  /// Adds a Reference= line after the last one, else after the Type line.
  void addReference(const QString& rawValue);
  void removeReference(int index);

  /// The names of the [Section] parts, in file order.
  QStringList sections() const;
  std::optional<QString> sectionValue(QStringView section, QStringView key) const;
  /// Replaces the key's line in the section, or appends it to the section, or appends the section.
  void setSectionValue(const QString& section, const QString& key, const QString& rawValue);

  /// The line index of the component with the given index among components(); throws when out of range.
  std::size_t componentLine(int index) const;

 private:
  /// The index of the first line of the first section (the end of the main part).
  std::size_t mainPartEnd() const;
  std::optional<std::size_t> findKey(QStringView key, std::size_t from, std::size_t to) const;
  std::size_t referenceLine(int index) const;
  /// After the last line of the main part that is not blank.
  std::size_t endOfMainEntries() const;
  /// After the last main-part line whose key is one of `keys`; nothing when there is none.
  std::optional<std::size_t> afterLastKey(std::initializer_list<QStringView> keys) const;

  std::vector<SourceLine> m_lines;
};

/// The local path of a path written in a project or group file: relative paths are taken from
/// `baseDirectory`, backslashes become slashes, and where the exact name does not exist a file or folder
/// whose name differs only in case is taken instead (projects come from a case-insensitive file system).
/// A drive or network path ("C:\...", "\\server\...") cannot be resolved and comes back with slashes only.
QString resolveProjectPath(const QString& baseDirectory, const QString& writtenPath);

/// How a project or group file writes `localPath`: relative to `baseDirectory`, with backslashes.
QString projectRelativePath(const QString& baseDirectory, const QString& localPath);

}  // namespace host

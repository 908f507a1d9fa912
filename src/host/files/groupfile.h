// SPDX-License-Identifier: MIT
// A project group file (.vbg): the line "VBGROUP 5.0", then one "StartupProject=" or "Project=" line per
// project, with paths relative to the group file's folder. Lines are kept as read, so an unchanged group is
// written back byte for byte.
#pragma once

#include "host/files/sourcelines.h"

#include <QByteArray>
#include <QByteArrayView>
#include <QString>

#include <cstddef>
#include <vector>

namespace host {

struct GroupProject {
  QString path;  // as written: backslashes, relative to the group file's folder
  bool startup = false;

  friend bool operator==(const GroupProject&, const GroupProject&) = default;
};

class GroupFile {
 public:
  /// A new group with no projects.
  explicit GroupFile(LineEnd lineEnd = LineEnd::CRLF);

  /// Reads the lines of a group file. Throws ide::Error 321 "<fileName>, line <n>: ..." when the first line
  /// is not "VBGROUP ..." or another line is neither blank nor "Key=value".
  static GroupFile parse(const std::vector<SourceLine>& lines, const QString& fileName);
  static GroupFile parse(QByteArrayView bytes, const QString& fileName);

  const std::vector<SourceLine>& write() const { return m_lines; }
  QByteArray toBytes(const QString& fileName) const;

  /// The projects in file order.
  std::vector<GroupProject> projects() const;
  /// The index of the first StartupProject= entry among projects(), or -1.
  int startupProject() const;
  /// Marks the project at `index` as the startup project (and no other); -1 leaves none. Throws ide::Error 9
  /// for an index out of range.
  void setStartupProject(int index);
  /// Adds "Project=<path>" after the last project line.
  void addProject(const QString& path);
  void removeProject(int index);
  /// The line index of the project with the given index among projects(); throws when out of range.
  std::size_t projectLine(int index) const;

 private:
  std::vector<SourceLine> m_lines;
};

}  // namespace host

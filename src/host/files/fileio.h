// SPDX-License-Identifier: MIT
// Reading and writing whole files with errors that say what failed, and writes that never damage what is
// already on disk: a file is replaced only once its new content is completely written.
#pragma once

#include <QByteArray>
#include <QString>

#include <sys/types.h>

#include <utility>
#include <vector>

namespace host {

/// The file's bytes. Throws ide::Error: 53 "File not found: <path>", 75 "Cannot read <path>: <reason>";
/// a directory, FIFO, device or socket is refused (75, "it is a FIFO" ...) without being opened.
QByteArray readFileBytes(const QString& path);

/// Writes `bytes` to `path` through a temporary file in the same directory that replaces the old file
/// only after a complete write. Throws ide::Error 75 "Cannot write <path>: <reason>" (read-only
/// directory, disk full ...); the old file is then untouched.
void writeFileAtomically(const QString& path, const QByteArray& bytes);

/// Replaces several files at once, each only after every new content is completely written and on disk.
/// The contents go to temporary files beside their targets as they are added; commit() flushes them to
/// disk together (all waits at once, not one after the other, which is what makes saving a large project
/// slow), then renames each over its target and flushes the directories. A batch that is
/// not committed removes its temporary files and leaves every target as it was.
class FileWriteBatch {
 public:
  FileWriteBatch() = default;
  ~FileWriteBatch();
  FileWriteBatch(const FileWriteBatch&) = delete;
  FileWriteBatch& operator=(const FileWriteBatch&) = delete;

  /// Writes `bytes` to a temporary file for `path`. Throws ide::Error 75 "Cannot write <path>: <reason>";
  /// nothing of the batch is replaced then (the batch is abandoned).
  void add(const QString& path, const QByteArray& bytes);
  /// The same for several files at once, written side by side.
  void addAll(const std::vector<std::pair<QString, QByteArray>>& files);
  /// Flushes and puts every file in place. Throws ide::Error 75 naming the file that failed.
  void commit();
  bool empty() const { return m_files.empty(); }

 private:
  struct Pending {
    QString target;
    QByteArray temporary;  // local 8-bit path
    int descriptor;
  };
  /// Writes one temporary file; `error` is 0 or the reason it failed (the file may exist then).
  static Pending createTemporary(const QString& path, const QByteArray& bytes, mode_t newFileMode,
                                 int& error);
  void abandon();
  std::vector<Pending> m_files;
};

}  // namespace host

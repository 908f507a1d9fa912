// SPDX-License-Identifier: MIT
// Reading and writing whole files with errors that say what failed, and writes that never damage what is
// already on disk: a file is replaced only once its new content is completely written, a save of several
// files replaces all of them or none, and a file changed by another program since it was read is not
// overwritten unasked.
#pragma once

#include "ide/error.h"

#include <QByteArray>
#include <QString>
#include <QStringList>

#include <sys/stat.h>
#include <sys/types.h>

#include <functional>
#include <memory>
#include <optional>
#include <vector>

namespace fileio {

/// What a file was when it was read or written: enough to tell later whether another program has changed,
/// created or deleted it since.
struct FileStamp {
  QString path;  // as it was given
  bool exists = false;
  qint64 size = 0;
  qint64 modified = 0;  // nanoseconds since the epoch
  quint64 device = 0;
  quint64 inode = 0;
  qint64 taken = 0;  // when the content was known, on the clock the file system stamps files with
  size_t hash = 0;   // of the content

  /// The file at `path` as it is now (its content is read for the hash).
  static FileStamp of(const QString& path);
};

/// The file's bytes; `stamp`, when given, is set to what the file was. Throws ide::Error: 53 "File not
/// found: <path>", 75 "Cannot read <path>: <reason>"; a directory, FIFO, device or socket is refused (75,
/// "it is a FIFO" ...) without being opened.
QByteArray readFileBytes(const QString& path, FileStamp* stamp = nullptr);

/// Writes `bytes` to `path` as a batch of one file (see FileWriteBatch).
void writeFileAtomically(const QString& path, const QByteArray& bytes);

/// A save that did not happen: files were changed, created or deleted by another program after they were
/// read. Nothing was written. Error 75.
class FilesChangedOnDisk : public ide::Error {
 public:
  FilesChangedOnDisk(QStringList changed, QStringList deleted);
  QStringList changed;  // changed or created since read
  QStringList deleted;
};

/// A save that failed after replacing files and could not put all of them back: `newText` lists the files
/// that hold their new content; every other file of the save holds its old one. Error 75.
class SaveHalfDone : public ide::Error {
 public:
  SaveHalfDone(const QString& description, QStringList newText);
  QStringList newText;
};

/// Replaces several files at once: all of them, or (as far as the file system allows) none.
///
/// Each content goes to an unnamed temporary file beside its target as it is added, is flushed to disk
/// with the others in bounded groups (so that the number of open files does not grow with the batch), and
/// gets a hidden name `.NAME.quimbel-PID-XXXXXX` once complete. commit() checks that no target was changed
/// by another program since it was read, then renames each temporary over its target, keeping a link to
/// the old file until all are in place: a rename that fails puts back those already replaced. A file the
/// user may not write is refused; links are followed to the file they finally name; mode, owner and group
/// are kept, and a file with several hard links (or one whose owner cannot be kept) is rewritten in place
/// after a copy of its old content is taken. SIGINT, SIGTERM and SIGHUP that arrive while a batch is under
/// way remove its temporaries before the signal takes effect; temporaries left by a process that died are
/// removed by the next save in their folder. A batch that is not committed leaves every target as it was.
class FileWriteBatch {
 public:
  FileWriteBatch();
  ~FileWriteBatch();
  FileWriteBatch(const FileWriteBatch&) = delete;
  FileWriteBatch& operator=(const FileWriteBatch&) = delete;

  struct File {
    QString path;
    QByteArray bytes;
    /// What the file was when read; commit() refuses to replace it when it is no longer that. None: the
    /// file is written whatever is there.
    std::optional<FileStamp> expected;
  };

  /// Writes the content of `file` to a temporary file. Throws ide::Error 75 "Cannot write <path>:
  /// <reason>" or 70 for a read-only file; the batch is abandoned then, and nothing of it is replaced.
  void add(File file);
  /// The same for several files, written side by side.
  void addAll(std::vector<File> files);
  /// Puts every file in place. Throws FilesChangedOnDisk (nothing written), ide::Error 75 naming the file
  /// that failed (every file as it was), or SaveHalfDone.
  void commit();
  bool empty() const;
  /// After commit(), successful or not: the stamp of the i-th file added, or null when it does not hold
  /// its new content.
  const FileStamp* written(size_t i) const;

 private:
  struct State;
  std::unique_ptr<State> m_state;
};

/// Where a test makes the file system fail on demand: the steps of a batch that can be made to fail.
enum class FileStep {
  Write,    // writing a temporary file (or taking the copy of a file rewritten in place)
  Replace,  // putting a new file in place
  Restore,  // putting an old file back after a failure
};
/// Called before each step with the target's path; a non-zero errno makes the step fail with it. For
/// tests; null (the default) fails nothing.
void setFileFaultHook(std::function<int(FileStep step, const QString& path)> hook);

}  // namespace fileio

// SPDX-License-Identifier: MIT
// A compound file on disk, held whole in memory while it is open. Changes are made in memory; commit()
// writes the whole file anew to a temporary file beside it and renames that into place, so that a crash
// leaves either the old file or the new one. A file opened for writing is held exclusively through a lock
// file beside it (".<name>.lock", holding the owner's process, program and host): a second program that
// wants to write it is refused with a message naming the owner, and a lock left by a process that died is
// taken over. The file itself is never locked, so that readers always see the last complete commit.
#pragma once

#include "projinfo/storage/compoundfile.h"

#include <QString>

#include <memory>
#include <optional>

class QLockFile;

namespace ide {
class Error;
}

namespace projinfo {

class DocFile {
 public:
  enum class Access { Read, ReadWrite };

  /// Opens an existing file: read whole and parsed; with ReadWrite the lock is taken first. Raises
  /// ide::Error naming the file: stg::FileNotFound, stg::LockViolation (held by another program),
  /// stg::AccessDenied (unreadable), stg::InvalidHeader or stg::DocFileCorrupt (not written by anyone
  /// since: a file that cannot be read is never touched).
  static std::shared_ptr<DocFile> open(const QString& path, Access access);
  /// A new, empty file, locked and held in memory until its first commit. Raises stg::ElementExists when
  /// a file is there and `overwrite` is false, and stg::LockViolation as open() does.
  static std::shared_ptr<DocFile> create(const QString& path, bool overwrite);
  ~DocFile();
  DocFile(const DocFile&) = delete;
  DocFile& operator=(const DocFile&) = delete;

  const QString& path() const { return m_path; }
  const std::shared_ptr<Element>& root() const { return m_root; }
  bool writable() const { return m_access == Access::ReadWrite; }
  /// Something changed in memory since the last commit.
  bool dirty() const { return m_dirty; }
  void touch() { m_dirty = true; }

  /// Writes the file when it changed. Raises ide::Error stg::AccessDenied or stg::WriteFault naming the
  /// file and the reason (a read-only folder or file, a full disk); what is in memory stays, and the next
  /// commit tries again.
  void commit();
  /// Drops every change since the last commit (or since the file was read). Elements that were open
  /// become unusable.
  void revert();
  /// Puts the file at `newPath` (in another folder, say): written there from memory, locked there, and
  /// removed from its old place. Raises stg::ElementExists when `newPath` exists, or what commit()
  /// raises; the file then stays where it was.
  void moveTo(const QString& newPath);
  /// Removes the file from disk; it stays open in memory.
  void remove();

 private:
  DocFile(QString path, Access access);
  void lock();

  QString m_path;
  Access m_access;
  std::shared_ptr<Element> m_root;
  /// The bytes of the last commit (or as read): what revert() goes back to; empty for a new file.
  QByteArray m_committed;
  std::unique_ptr<QLockFile> m_lock;
  bool m_dirty = false;
};

/// Marks an element and everything under it as no longer usable.
void markGone(Element& element);

}  // namespace projinfo

// SPDX-License-Identifier: MIT
// Whole-file reads and atomic writes on top of QFile and QSaveFile, translating their failures into the
// IDE's error numbers with the path and the system's reason in the description.
#include "host/files/fileio.h"

#include "host/files/parallel.h"
#include "ide/error.h"

#include <QFile>
#include <QFileInfo>

#include <cerrno>
#include <cstring>
#include <set>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace host {

namespace {

/// Why a file of this type is not read: opening a directory succeeds and only the read fails, with a less
/// helpful reason; opening a FIFO waits for a writer; a device may never end. Empty for a regular file.
QString unreadableKind(mode_t mode) {
  if (S_ISREG(mode)) return {};
  if (S_ISDIR(mode)) return QStringLiteral("it is a directory");
  if (S_ISFIFO(mode)) return QStringLiteral("it is a FIFO");
  if (S_ISCHR(mode) || S_ISBLK(mode)) return QStringLiteral("it is a device");
  if (S_ISSOCK(mode)) return QStringLiteral("it is a socket");
  return QStringLiteral("it is not a regular file");
}

}  // namespace

QByteArray readFileBytes(const QString& path) {
  struct stat status {};
  if (::stat(QFile::encodeName(path).constData(), &status) != 0) {
    if (errno == ENOENT || errno == ENOTDIR)
      throw ide::Error(ide::err::FileNotFound, QStringLiteral("File not found: %1").arg(path));
    throw ide::Error(
        ide::err::PathFileAccessError,
        QStringLiteral("Cannot read %1: %2").arg(path, QString::fromLocal8Bit(std::strerror(errno))));
  }
  // Checked before opening: the file is never opened for reading unless it is a regular file.
  if (const QString kind = unreadableKind(status.st_mode); !kind.isEmpty()) {
    throw ide::Error(ide::err::PathFileAccessError, QStringLiteral("Cannot read %1: %2").arg(path, kind));
  }
  QFile file(path);
  if (!file.open(QIODevice::ReadOnly)) {
    throw ide::Error(ide::err::PathFileAccessError,
                     QStringLiteral("Cannot read %1: %2").arg(path, file.errorString()));
  }
  QByteArray bytes = file.readAll();
  if (file.error() != QFileDevice::NoError) {
    throw ide::Error(ide::err::PathFileAccessError,
                     QStringLiteral("Cannot read %1: %2").arg(path, file.errorString()));
  }
  return bytes;
}

void writeFileAtomically(const QString& path, const QByteArray& bytes) {
  FileWriteBatch batch;
  batch.add(path, bytes);
  batch.commit();
}

namespace {

[[noreturn]] void failWrite(const QString& path, int error) {
  throw ide::Error(
      ide::err::PathFileAccessError,
      QStringLiteral("Cannot write %1: %2").arg(path, QString::fromLocal8Bit(std::strerror(error))));
}

bool writeAll(int descriptor, const QByteArray& bytes) {
  const char* data = bytes.constData();
  qsizetype left = bytes.size();
  while (left > 0) {
    const ssize_t written = ::write(descriptor, data, static_cast<size_t>(left));
    if (written < 0) {
      if (errno == EINTR) continue;
      return false;
    }
    data += written;
    left -= written;
  }
  return true;
}

}  // namespace

FileWriteBatch::~FileWriteBatch() {
  abandon();
}

void FileWriteBatch::abandon() {
  for (const Pending& file : m_files) {
    if (file.descriptor >= 0) ::close(file.descriptor);
    ::unlink(file.temporary.constData());
  }
  m_files.clear();
}

FileWriteBatch::Pending FileWriteBatch::createTemporary(const QString& path, const QByteArray& bytes,
                                                        mode_t newFileMode, int& error) {
  error = 0;
  // A link is followed, so that the file it points to gets the new content and the link stays.
  const QFileInfo info(path);
  const QString target = info.isSymLink() && !info.symLinkTarget().isEmpty() ? info.symLinkTarget() : path;
  Pending pending{target, {}, -1};
  if (QFileInfo(target).isDir()) {
    error = EISDIR;
    return pending;
  }
  const QFileInfo targetInfo(target);
  pending.temporary =
      QFile::encodeName(targetInfo.absolutePath() + QStringLiteral("/.") + targetInfo.fileName()) +
      ".quimbel-XXXXXX";
  pending.descriptor = ::mkstemp(pending.temporary.data());
  if (pending.descriptor < 0) {
    error = errno;
    pending.temporary.clear();
    return pending;
  }
  // The new file keeps the old one's permissions (a new file gets what the umask allows).
  struct stat existing {};
  const mode_t mode = ::stat(QFile::encodeName(target).constData(), &existing) == 0
                          ? (existing.st_mode & 07777)
                          : newFileMode;
  if (::fchmod(pending.descriptor, mode) != 0 || !writeAll(pending.descriptor, bytes)) error = errno;
  return pending;
}

void FileWriteBatch::add(const QString& path, const QByteArray& bytes) {
  addAll({{path, bytes}});
}

void FileWriteBatch::addAll(const std::vector<std::pair<QString, QByteArray>>& files) {
  // Read once, before any thread runs: reading the umask means setting it.
  const mode_t mask = ::umask(0);
  ::umask(mask);
  const mode_t newFileMode = static_cast<mode_t>(0666 & ~mask);
  std::vector<Pending> created(files.size());
  std::vector<int> errors(files.size(), 0);
  std::vector<std::exception_ptr> failures;
  parallelFor(
      files.size(),
      [&](size_t i) {
        created[i] = createTemporary(files[i].first, files[i].second, newFileMode, errors[i]);
      },
      failures);
  for (Pending& pending : created)
    if (!pending.temporary.isEmpty()) m_files.push_back(std::move(pending));
  for (size_t i = 0; i < files.size(); ++i) {
    if (errors[i] == 0) continue;
    abandon();
    failWrite(files[i].first, errors[i]);
  }
}

void FileWriteBatch::commit() {
  if (m_files.empty()) return;
  // Each file is flushed, all at once: the file system then writes them in a few journal commits instead
  // of one commit per file, one after the other (for hundreds of files, the difference between a few
  // hundredths of a second and most of a second).
  std::vector<int> errors(m_files.size(), 0);
  std::vector<std::exception_ptr> failures;
  parallelFor(
      m_files.size(),
      [&](size_t i) {
        if (::fdatasync(m_files[i].descriptor) != 0) errors[i] = errno;
      },
      failures, 16);
  for (size_t i = 0; i < m_files.size(); ++i) {
    if (errors[i] == 0) continue;
    const QString target = m_files[i].target;
    abandon();
    failWrite(target, errors[i]);
  }
  std::set<QString> directories;
  for (Pending& file : m_files) {
    if (::close(std::exchange(file.descriptor, -1)) != 0) {
      const int error = errno;
      const QString target = file.target;
      abandon();
      failWrite(target, error);
    }
  }
  for (size_t i = 0; i < m_files.size(); ++i) {
    const Pending& file = m_files[i];
    if (::rename(file.temporary.constData(), QFile::encodeName(file.target).constData()) != 0) {
      const int error = errno;
      const QString target = file.target;
      // What was renamed already stays; the rest keep their old content.
      m_files.erase(m_files.begin(), m_files.begin() + static_cast<std::ptrdiff_t>(i));
      abandon();
      failWrite(target, error);
    }
    directories.insert(QFileInfo(file.target).absolutePath());
  }
  m_files.clear();
  // The renames themselves are on disk once their directories are.
  for (const QString& directory : directories) {
    const int descriptor = ::open(QFile::encodeName(directory).constData(), O_RDONLY | O_DIRECTORY);
    if (descriptor < 0) continue;
    ::fsync(descriptor);
    ::close(descriptor);
  }
}

}  // namespace host

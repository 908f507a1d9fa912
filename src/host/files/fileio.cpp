// SPDX-License-Identifier: MIT
// Whole-file reads and atomic writes on top of QFile and QSaveFile, translating their failures into the
// IDE's error numbers with the path and the system's reason in the description.
#include "host/files/fileio.h"

#include "ide/error.h"

#include <QFile>
#include <QFileInfo>

#include <atomic>
#include <cerrno>
#include <cstring>
#include <set>
#include <thread>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace host {

QByteArray readFileBytes(const QString& path) {
  const QFileInfo info(path);
  if (!info.exists()) {
    throw ide::Error(ide::err::FileNotFound, QStringLiteral("File not found: %1").arg(path));
  }
  // Opening a directory succeeds on Linux and only the read fails, with a less helpful reason.
  if (info.isDir()) {
    throw ide::Error(ide::err::PathFileAccessError,
                     QStringLiteral("Cannot read %1: it is a directory").arg(path));
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

void FileWriteBatch::add(const QString& path, const QByteArray& bytes) {
  // A link is followed, so that the file it points to gets the new content and the link stays.
  const QFileInfo info(path);
  const QString target = info.isSymLink() && !info.symLinkTarget().isEmpty() ? info.symLinkTarget() : path;
  if (QFileInfo(target).isDir()) {
    abandon();
    failWrite(path, EISDIR);
  }
  const QFileInfo targetInfo(target);
  QByteArray temporary =
      QFile::encodeName(targetInfo.absolutePath() + QStringLiteral("/.") + targetInfo.fileName()) +
      ".quimbel-XXXXXX";
  const int descriptor = ::mkstemp(temporary.data());
  if (descriptor < 0) {
    const int error = errno;
    abandon();
    failWrite(path, error);
  }
  m_files.push_back(Pending{target, temporary, descriptor});
  // The new file keeps the old one's permissions (a new file gets what the umask allows).
  struct stat existing {};
  const mode_t mode =
      ::stat(QFile::encodeName(target).constData(), &existing) == 0 ? (existing.st_mode & 07777) : [] {
        const mode_t mask = ::umask(0);
        ::umask(mask);
        return static_cast<mode_t>(0666 & ~mask);
      }();
  if (::fchmod(descriptor, mode) != 0 || !writeAll(descriptor, bytes)) {
    const int error = errno;
    abandon();
    failWrite(path, error);
  }
}

void FileWriteBatch::commit() {
  if (m_files.empty()) return;
  // Each file is flushed, all at once: the file system then writes them in a few journal commits instead
  // of one commit per file, one after the other (for hundreds of files, the difference between a few
  // hundredths of a second and most of a second).
  std::vector<int> errors(m_files.size(), 0);
  {
    std::atomic<size_t> next{0};
    auto flush = [&] {
      for (size_t i = next++; i < m_files.size(); i = next++)
        if (::fdatasync(m_files[i].descriptor) != 0) errors[i] = errno;
    };
    std::vector<std::thread> flushers;
    const size_t threads = std::min<size_t>(m_files.size(), 16);
    for (size_t t = 1; t < threads; ++t)
      flushers.emplace_back(flush);
    flush();
    for (std::thread& flusher : flushers)
      flusher.join();
  }
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

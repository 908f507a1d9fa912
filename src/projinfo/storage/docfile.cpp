// SPDX-License-Identifier: MIT
#include "projinfo/storage/docfile.h"

#include "fileio/fileio.h"
#include "ide/error.h"

#include <QFile>
#include <QFileInfo>
#include <QLockFile>

#include <vector>

namespace projinfo {
namespace {

QString lockPathOf(const QString& path) {
  const QFileInfo info(path);
  return info.absolutePath() + QStringLiteral("/.") + info.fileName() + QStringLiteral(".lock");
}

[[noreturn]] void fail(long number, const QString& path, const QString& reason) {
  throw ide::Error(number, QStringLiteral("%1: %2").arg(path, reason));
}

}  // namespace

void markGone(Element& element) {
  std::vector<Element*> pending{&element};
  while (!pending.empty()) {
    Element* next = pending.back();
    pending.pop_back();
    for (auto& [key, child] : next->children) {
      child->gone = true;
      pending.push_back(child.get());
    }
  }
}

DocFile::DocFile(QString path, Access access) : m_path(std::move(path)), m_access(access) {}

DocFile::~DocFile() = default;

void DocFile::lock() {
  auto lock = std::make_unique<QLockFile>(lockPathOf(m_path));
  // A lock is stale only when its process is gone: an IDE may keep a project open for days.
  lock->setStaleLockTime(0);
  if (lock->tryLock(0)) {
    m_lock = std::move(lock);
    return;
  }
  if (lock->error() == QLockFile::LockFailedError) {
    qint64 pid = 0;
    QString host, program;
    const QString owner = lock->getLockInfo(&pid, &host, &program)
                              ? QStringLiteral("%1 (process %2 on %3)").arg(program).arg(pid).arg(host)
                              : QStringLiteral("another program");
    fail(stg::LockViolation, m_path, QStringLiteral("in use by %1").arg(owner));
  }
  // A folder where no lock can be made is one where the file cannot be written either: nobody can change
  // it, so nothing needs guarding (commit() says why it cannot write).
}

std::shared_ptr<DocFile> DocFile::open(const QString& path, Access access) {
  std::shared_ptr<DocFile> file(new DocFile(QFileInfo(path).absoluteFilePath(), access));
  if (!QFileInfo::exists(file->m_path)) fail(stg::FileNotFound, file->m_path, QStringLiteral("no such file"));
  if (access == Access::ReadWrite) file->lock();
  try {
    file->m_committed = fileio::readFileBytes(file->m_path);
  } catch (const ide::Error& error) {
    throw ide::Error(stg::AccessDenied, error.description());
  }
  try {
    file->m_root = readCompoundFile(file->m_committed);
  } catch (const ide::Error& error) {
    fail(error.number(), file->m_path, error.description());
  }
  return file;
}

std::shared_ptr<DocFile> DocFile::create(const QString& path, bool overwrite) {
  std::shared_ptr<DocFile> file(new DocFile(QFileInfo(path).absoluteFilePath(), Access::ReadWrite));
  if (!overwrite && QFileInfo::exists(file->m_path))
    fail(stg::ElementExists, file->m_path, QStringLiteral("the file exists already"));
  file->lock();
  file->m_root = std::make_shared<Element>();
  file->m_root->kind = ElementKind::Root;
  file->m_root->name = QStringLiteral("Root Entry");
  file->m_dirty = true;
  return file;
}

void DocFile::commit() {
  if (!m_dirty) return;
  if (m_access != Access::ReadWrite)
    fail(stg::AccessDenied, m_path, QStringLiteral("opened for reading only"));
  const QFileInfo info(m_path);
  if (info.exists() && !info.isWritable())
    fail(stg::AccessDenied, m_path, QStringLiteral("the file is read-only"));
  const QByteArray bytes = writeCompoundFile(*m_root);
  try {
    fileio::writeFileAtomically(m_path, bytes);
  } catch (const ide::Error& error) {
    throw ide::Error(QFileInfo(info.absolutePath()).isWritable() ? stg::WriteFault : stg::AccessDenied,
                     error.description());
  }
  m_committed = bytes;
  m_dirty = false;
}

void DocFile::revert() {
  markGone(*m_root);
  if (m_committed.isEmpty()) {
    m_root->children.clear();
  } else {
    auto fresh = readCompoundFile(m_committed);
    m_root->children = std::move(fresh->children);
    m_root->clsid = fresh->clsid;
    m_root->stateBits = fresh->stateBits;
  }
  m_dirty = m_committed.isEmpty();
}

void DocFile::moveTo(const QString& newPath) {
  const QString target = QFileInfo(newPath).absoluteFilePath();
  if (target == m_path) return;
  if (QFileInfo::exists(target))
    fail(stg::ElementExists, target, QStringLiteral("a file of that name is there already"));
  const QString oldPath = m_path;
  std::unique_ptr<QLockFile> oldLock = std::move(m_lock);
  m_path = target;
  try {
    lock();
    m_dirty = true;
    commit();
  } catch (...) {
    m_lock = std::move(oldLock);
    m_path = oldPath;
    throw;
  }
  QFile::remove(oldPath);
}

void DocFile::remove() {
  QFile::remove(m_path);
  m_committed.clear();
}

}  // namespace projinfo

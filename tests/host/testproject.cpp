// SPDX-License-Identifier: MIT
#include "testproject.h"

#include "ide/error.h"

#include <QDir>
#include <QDirIterator>
#include <QFile>
#include <QFileInfo>

#include <stdexcept>

namespace host::test {

ExampleCopy::ExampleCopy() {
  const QDir source(QStringLiteral(QUIMBEL_SOURCE_DIR "/examples/demo"));
  QDirIterator it(source.path(), QDir::Files, QDirIterator::Subdirectories);
  while (it.hasNext()) {
    const QString file = it.next();
    const QString target = m_dir.filePath(source.relativeFilePath(file));
    QDir().mkpath(QFileInfo(target).path());
    if (!QFile::copy(file, target)) throw std::runtime_error("cannot copy the examples");
  }
}

QMap<QString, QByteArray> ExampleCopy::snapshot() const {
  QMap<QString, QByteArray> files;
  QDirIterator it(m_dir.path(), QDir::Files, QDirIterator::Subdirectories);
  while (it.hasNext()) {
    const QString file = it.next();
    files.insert(QDir(m_dir.path()).relativeFilePath(file), readBytes(file));
  }
  return files;
}

QByteArray readBytes(const QString& path) {
  QFile file(path);
  if (!file.open(QIODevice::ReadOnly)) throw std::runtime_error("cannot read " + path.toStdString());
  return file.readAll();
}

void writeBytes(const QString& path, const QByteArray& bytes) {
  QDir().mkpath(QFileInfo(path).path());
  QFile file(path);
  if (!file.open(QIODevice::WriteOnly | QIODevice::Truncate) || file.write(bytes) != bytes.size())
    throw std::runtime_error("cannot write " + path.toStdString());
}

long errorNumberOf(const std::function<void()>& action, QString* description) {
  try {
    action();
  } catch (const ide::Error& error) {
    if (description) *description = error.description();
    return error.number();
  }
  return 0;
}

}  // namespace host::test

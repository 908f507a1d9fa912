// SPDX-License-Identifier: MIT
// Whole-file reads and atomic writes on top of QFile and QSaveFile, translating their failures into the
// IDE's error numbers with the path and the system's reason in the description.
#include "host/files/fileio.h"

#include "ide/error.h"

#include <QFile>
#include <QFileInfo>
#include <QSaveFile>

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
  QSaveFile file(path);
  const auto fail = [&](const QString& reason) {
    file.cancelWriting();
    throw ide::Error(ide::err::PathFileAccessError, QStringLiteral("Cannot write %1: %2").arg(path, reason));
  };
  if (!file.open(QIODevice::WriteOnly)) fail(file.errorString());
  if (file.write(bytes) != bytes.size()) fail(file.errorString());
  if (!file.commit()) fail(file.errorString());
}

}  // namespace host

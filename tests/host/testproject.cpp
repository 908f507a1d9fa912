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
  return test::snapshot(m_dir.path());
}

QMap<QString, QByteArray> snapshot(const QString& directory) {
  QMap<QString, QByteArray> files;
  QDirIterator it(directory, QDir::Files, QDirIterator::Subdirectories);
  while (it.hasNext()) {
    const QString file = it.next();
    files.insert(QDir(directory).relativeFilePath(file), readBytes(file));
  }
  return files;
}

QString writeMessyProject(const QString& dir) {
  writeBytes(dir + u"/Forms/frmLuzNegra.frm"_qs,
             "VERSION 5.00\r\nBegin VB.Form frmLuzNegra \r\n   Caption         =   \"Ilumina\xE7\xE3o\"\r\n"
             "End\r\nAttribute VB_Name = \"frmLuzNegra\"\r\nOption Explicit\r\n");
  writeBytes(dir + u"/Fontes/modEntrada.bas"_qs,
             "Attribute VB_Name = \"modEntrada\"\r\nOption Explicit\r\n' Configura\xE7\xE3o\r\n"
             "Public Sub Principal()\r\n    If Dir$(\"C:\\Dados\") = \"\" Then GoTo 10\r\n"
             "    frmLuzNegra.Show\r\n10  Exit Sub\r\nEnd Sub\r\n");
  writeBytes(
      dir + u"/Fontes/modMisto.bas"_qs,
      "Attribute VB_Name = \"modMisto\"\nOption Explicit\n' Vers\xE3o antiga\rSub Velha()\r    x = 1\r\r"
      "    y = 2\rEnd Sub");
  const QString project = dir + u"/Entrada.vbp"_qs;
  writeBytes(project,
             "Type=Exe\r\nForm=forms\\frmLuzNEGRA.frm\r\nModule=modEntrada; FONTES\\ModEntrada.bas\r\n"
             "Class=clsFalta; Classes\\clsFalta.cls\r\nModule=modMisto; .\\fontes\\modmisto.BAS\r\n"
             "Startup=\"frmLuzNegra\"\r\nName=\"Entrada\"\r\n");
  return project;
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

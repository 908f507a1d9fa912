// SPDX-License-Identifier: MIT
// Shared helpers of the IDE model's tests: a private copy of the example group, file snapshots and error
// expectations.
#pragma once

#include <QByteArray>
#include <QMap>
#include <QString>
#include <QStringList>
#include <QTemporaryDir>

#include <functional>
#include <memory>

namespace ide {
class VBComponent;
}

namespace host::test {

/// A temporary directory holding a copy of examples/demo (the group file is <dir>/Demo.vbg).
class ExampleCopy {
 public:
  ExampleCopy();
  QString path(const QString& relative) const { return m_dir.filePath(relative); }
  QString groupFile() const { return path(u"Demo.vbg"_qs); }
  /// Every file below the directory with its bytes, by relative path.
  QMap<QString, QByteArray> snapshot() const;

 private:
  QTemporaryDir m_dir;
};

/// Entrada.vbp in `dir` as real code leaves it: backslash entries in another case than the disk's, a missing
/// class (line 4), cp1252, CRLF, and modMisto with LF, then lone CRs, and no final line end.
QString writeMessyProject(const QString& dir);

/// Every file below `directory` with its bytes, by relative path.
QMap<QString, QByteArray> snapshot(const QString& directory);

QByteArray readBytes(const QString& path);
void writeBytes(const QString& path, const QByteArray& bytes);

/// What VB's compiler would refuse in the component's code (compilecheck.cpp), one text per fault: a Friend
/// procedure in a standard module, a control's focus events or BackColor on a class without them, a member
/// named like a control, an Enum, an Enum member or a Type of the module.
QStringList uncompilableLines(ide::VBComponent& component);

/// The number of the ide::Error the action throws (0 when it throws none), and its description.
long errorNumberOf(const std::function<void()>& action, QString* description = nullptr);

}  // namespace host::test

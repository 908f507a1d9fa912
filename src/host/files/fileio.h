// SPDX-License-Identifier: MIT
// Reading and writing whole files with errors that say what failed, and writes that never damage what is
// already on disk: a file is replaced only once its new content is completely written.
#pragma once

#include <QByteArray>
#include <QString>

namespace host {

/// The file's bytes. Throws ide::Error: 53 "File not found: <path>", 75 "Cannot read <path>: <reason>".
QByteArray readFileBytes(const QString& path);

/// Writes `bytes` to `path` through a temporary file in the same directory that replaces the old file
/// only after a complete write. Throws ide::Error 75 "Cannot write <path>: <reason>" (read-only
/// directory, disk full ...); the old file is then untouched.
void writeFileAtomically(const QString& path, const QByteArray& bytes);

}  // namespace host

// SPDX-License-Identifier: MIT
// The properties that the .editorconfig files above a file give it, read with libeditorconfig.
#pragma once

#include <QMap>
#include <QString>

#include <variant>

namespace codestyle {

/// An .editorconfig that cannot be read: the file, the line (0 when unknown) and what is wrong.
struct EditorConfigError {
  QString file;
  int line = 0;
  QString message;
};

/// Property names (lower case) and values; the standard properties' values are in lower case, and a
/// property set to "unset" is left out, as if no file had set it.
using EditorConfigValues = QMap<QString, QString>;

/// The properties in force for the file at `path` (which need not exist): the sections of every
/// .editorconfig from the file's folder up to the first one marked root, the closest file winning.
std::variant<EditorConfigValues, EditorConfigError> readEditorConfig(const QString& path);

/// The .editorconfig that gives the file at `path` its value of `name`: the closest file whose matching
/// sections set it. Empty when none does. Reads the files again, one at a time, so it is for reports.
QString editorConfigFileOf(const QString& path, const QString& name);

}  // namespace codestyle

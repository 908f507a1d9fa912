// SPDX-License-Identifier: MIT
// The command-line tool's commands and its exit codes.
#pragma once

#include <QString>
#include <QStringList>

#include <cstdio>
#include <optional>

namespace cli {

/// Exit codes, documented in `quimbel --help` and the README.
enum ExitCode : int {
  kSuccess = 0,
  kWouldChange = 1,  // --check found something to change
  kUsageError = 2,   // bad command line
  kInputError = 3,   // a file could not be read or is not a valid VB6 file
  kOutputError = 4,  // a file could not be written (nothing on disk was damaged)
};

struct ListOptions {
  QStringList files;
  bool tsv = false;
};

int runList(const ListOptions& options);

/// What the numbering and indentation commands take. Options left out come from the user's settings,
/// the ones the dialogs use.
struct TransformOptions {
  QStringList files;
  /// The scope: every project of the files, one module (--module) or one procedure (--procedure
  /// MODULE.NAME, every kind of a property).
  QString module;
  QString procedure;
  std::optional<qint32> start;
  std::optional<qint32> interval;
  bool tabs = false;
  std::optional<qint32> spaces;
  /// numindent: remove the numbers instead of adding them.
  bool remove = false;
  /// Write nothing: exit 1 when something would change (--check), print what would change (--diff).
  bool check = false;
  bool diff = false;
};

int runNumber(const TransformOptions& options);
int runUnnumber(const TransformOptions& options);
int runIndent(const TransformOptions& options);
int runNumIndent(const TransformOptions& options);

/// Writes a line to standard output / standard error, in the terminal's encoding.
void printLine(const QString& text);
void printError(const QString& text);

}  // namespace cli

// SPDX-License-Identifier: MIT
// The command-line tool's commands and its exit codes.
#pragma once

#include <QString>
#include <QStringList>

#include <cstdio>

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

/// Writes a line to standard output / standard error, in the terminal's encoding.
void printLine(const QString& text);
void printError(const QString& text);

}  // namespace cli

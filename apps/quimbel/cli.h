// SPDX-License-Identifier: MIT
// The command-line tool's commands and its exit codes.
#pragma once

#include <QHash>
#include <QString>
#include <QStringList>

#include <cstdio>
#include <optional>

namespace host {
class VbeImpl;
}

namespace cli {

/// Exit codes, documented in `quimbel --help` and the README.
enum ExitCode : int {
  kSuccess = 0,
  kWouldChange = 1,    // --check found something to change
  kNothingFound = 1,   // find found no occurrence
  kUsageError = 2,     // bad command line
  kInputError = 3,     // a file could not be read or is not a valid VB6 file
  kOutputError = 4,    // a file could not be written (nothing on disk was damaged), or standard output
  kMissingFiles = 5,   // files a group or project lists are missing: each was named, the rest was done
  kPartlyWritten = 6,  // a save failed half way and could not be undone (the message lists the files)
  kNoInfoFile = 7,     // tasks, favorites: the project has no info file (no identifier module, or no file)
};

/// Opens a group, project or module file given on the command line in `vbe`; module files given on their
/// own are noted in `givenPaths` under the path the user gave. What cannot be opened is named on standard
/// error, and false returned.
bool openInput(host::VbeImpl& vbe, const QString& file, QHash<QString, QString>& givenPaths);

/// Names on standard error each file that the group and projects open in `vbe` list but that is missing;
/// returns whether there was one.
bool reportMissingFiles(const host::VbeImpl& vbe);

/// The exit code of a run that ended with `code`: missing files turn success and --check's 1 into
/// kMissingFiles, so that scripts notice what was left out.
int withMissingFiles(int code, bool missing);

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

/// What `tasks` and `favorites` take: the project, and for tasks what to change (empty: list them).
struct TaskOptions {
  QString project;
  /// "add", "done", "undone", "remove" or empty.
  QString action;
  QString name;
  QString text;
  qint32 id = 0;
};

int runTasks(const TaskOptions& options);
int runFavorites(const TaskOptions& options);

/// What `quimbel find` takes.
struct FindCommandOptions {
  QString text;
  QStringList files;
  bool wholeWord = false;
  bool matchCase = false;
  bool pattern = false;
  bool tsv = false;
  /// Only the modules (components) of this name.
  QString module;
};

int runFind(const FindCommandOptions& options);

/// Writes a line to standard output / standard error, in the terminal's encoding.
void printLine(const QString& text);
void printError(const QString& text);

}  // namespace cli

// SPDX-License-Identifier: MIT
// The command-line tool's commands and its exit codes.
#pragma once

#include "codestyle/codestyle.h"

#include <QByteArray>
#include <QHash>
#include <QJsonDocument>
#include <QString>
#include <QStringList>

#include <cstdio>
#include <optional>
#include <vector>

namespace host {
class ComponentImpl;
class VbeImpl;
}  // namespace host

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
  kNoSuchTask = 8,     // tasks: the task named does not exist
};

/// Leaves out the files whose name, path from the current directory, or any folder on that path matches
/// one of the globs (as the shell matches, `*` crossing folders).
class Exclusions {
 public:
  explicit Exclusions(QStringList globs = {}) : m_globs(std::move(globs)) {}
  bool excludes(const QString& path) const;

 private:
  QStringList m_globs;
};

/// What every command that reads groups, projects and modules takes.
struct InputOptions {
  /// As given: files, or folders standing for the project and module files under them.
  QStringList files;
  Exclusions exclusions;
  /// The modules are UTF-8, not the ANSI code page (--encoding utf-8).
  bool utf8 = false;
};

/// The files to read: each folder replaced by the project files and then the module files under it (by
/// path, hidden folders left out), the excluded ones left out, each file once, group and project files
/// before module files. Names what is wrong on standard error and returns nothing when a folder holds
/// nothing to read.
std::optional<QStringList> expandInputs(const InputOptions& options);

/// Applies --encoding for the whole run.
void useEncoding(const InputOptions& options);

/// Warns on standard error that a module read in the ANSI code page is UTF-8 (as its component or the
/// fast scan found it).
void warnUtf8(const QString& shownPath);

/// The same file as another path (links followed), for running over each file once.
QString fileIdentity(const QString& path);

/// `description` of a failure with `file`, naming the file once: where the description names it already
/// (in full or as given) it is not put in front again.
QString namingFileOnce(const QString& file, const QString& description);

/// Opens a group, project or module file given on the command line in `vbe`; module files given on their
/// own are noted in `givenPaths` under the path the user gave. What cannot be opened is named on standard
/// error, and false returned.
bool openInput(host::VbeImpl& vbe, const QString& file, QHash<QString, QString>& givenPaths,
               const QString& shownAs = {});

/// Names on standard error each file that the group and projects open in `vbe` list but that is missing;
/// returns how many there were.
int reportMissingFiles(const host::VbeImpl& vbe);

/// The exit code of a run that ended with `code`: missing files turn success and --check's 1 into
/// kMissingFiles, so that scripts notice what was left out.
int withMissingFiles(int code, bool missing);

/// The line of the module's file that holds each code line (index 0: code line 1), as saving writes it:
/// below the header, with the hidden attribute lines in between.
std::vector<int> fileLinesOf(host::ComponentImpl& component);

struct ListOptions {
  InputOptions input;
  bool tsv = false;
  bool json = false;
};

int runList(const ListOptions& options);

/// What the numbering and indentation commands take. Options left out come from the .editorconfig files
/// that apply to each module, else from the user's settings, the ones the dialogs use.
struct TransformOptions {
  /// "-" alone: one module from standard input, the result to standard output.
  InputOptions input;
  /// The name standard input stands for: its kind of module and the .editorconfig that applies.
  QString stdinName;
  /// The scope: every project of the files, one module (--module) or one procedure (--procedure
  /// MODULE.NAME, every kind of a property).
  QString module;
  QString procedure;
  codestyle::CommandLine style;
  /// numindent: remove the numbers instead of adding them.
  bool remove = false;
  /// Each numbered line gets the number of its line in the file.
  bool fileLines = false;
  /// Write nothing: exit 1 when something would change (--check), print what would change (--diff).
  bool check = false;
  bool diff = false;
};

enum class TransformKind { Number, Unnumber, Indent, NumIndent };

int runTransform(const TransformOptions& options, TransformKind kind);

/// "FILE, line N: what is wrong" for an .editorconfig that cannot be used.
QString styleErrorText(const codestyle::StyleError& error);

/// `quimbel config`: the values in force for a file and where each came from.
int runConfig(const QString& file, const codestyle::CommandLine& style);

/// What `tasks` and `favorites` take: the project, and for tasks what to change (empty: list them).
struct TaskOptions {
  QString project;
  /// "add", "done", "undone", "remove" or empty.
  QString action;
  QString name;
  QString text;
  qint32 id = 0;
  bool json = false;
};

int runTasks(const TaskOptions& options);
int runFavorites(const TaskOptions& options);

/// What `quimbel find` takes.
struct FindCommandOptions {
  QString text;
  InputOptions input;
  bool wholeWord = false;
  bool matchCase = false;
  bool pattern = false;
  bool tsv = false;
  bool json = false;
  /// Print nothing: only the exit code tells (-q).
  bool quiet = false;
  /// Only the modules (components) of this name.
  QString module;
};

int runFind(const FindCommandOptions& options);

/// `quimbel lsp`: the language server on standard input and output until the client sends exit.
int runLsp();

/// Writes a line to standard output / standard error, in the terminal's encoding.
void printLine(const QString& text);
void printError(const QString& text);
/// Writes what a run found, beside its output, to standard error.
void printSummary(const QString& text);
/// A JSON document on one line, for --json.
QByteArray jsonText(const QJsonDocument& document);
/// Writes bytes to standard output as they are.
void printBytes(QByteArrayView bytes);

}  // namespace cli

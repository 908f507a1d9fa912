// SPDX-License-Identifier: MIT
// quimbel: the add-in's batch features from the command line. One table names the commands and the
// options each takes; every command lives in a file of its own.
#include "cli.h"
#include "ide/error.h"

#include <CLI/CLI.hpp>

#include <QCoreApplication>

#include <cerrno>
#include <cstring>
#include <iostream>
#include <limits>

#include <fcntl.h>
#include <unistd.h>

namespace cli {
namespace {

// The first failure to write standard output (an errno value), reported when the tool ends.
int outputError = 0;

}  // namespace

void printLine(const QString& text) {
  const QByteArray bytes = text.toLocal8Bit() + '\n';
  if (std::fwrite(bytes.constData(), 1, static_cast<size_t>(bytes.size()), stdout) !=
          static_cast<size_t>(bytes.size()) &&
      outputError == 0)
    outputError = errno;
}

void printError(const QString& text) {
  const QByteArray bytes = (QStringLiteral("quimbel: ") + text).toLocal8Bit();
  std::fwrite(bytes.constData(), 1, static_cast<size_t>(bytes.size()), stderr);
  std::fputc('\n', stderr);
}

namespace {

QStringList toQStrings(const std::vector<std::string>& values) {
  QStringList list;
  for (const std::string& value : values)
    list << QString::fromLocal8Bit(value);
  return list;
}

// Everything any command can be given; each command reads the part it declared.
struct CommandLine {
  std::vector<std::string> files;
  std::string text;
  bool wholeWord = false;
  bool matchCase = false;
  bool pattern = false;
  bool tsv = false;
  std::string module;
  std::string procedure;
  qint32 start = 0;
  qint32 interval = 0;
  bool tabs = false;
  qint32 spaces = 0;
  bool remove = false;
  bool check = false;
  bool diff = false;
  // tasks and favorites.
  std::string project;
  std::string taskAction;
  std::string taskName;
  std::string taskText;
  qint32 taskId = 0;
  // Which of the numeric options the user gave.
  bool startGiven = false;
  bool intervalGiven = false;
  bool spacesGiven = false;

  void noteGiven(const CLI::App& command) {
    const auto given = [&](const char* name) {
      const CLI::Option* option = command.get_option_no_throw(name);
      return option && option->count() > 0;
    };
    startGiven = given("--start");
    intervalGiven = given("--interval");
    spacesGiven = given("--spaces");
  }

  TransformOptions transformOptions() const {
    TransformOptions options;
    options.files = toQStrings(files);
    options.module = QString::fromLocal8Bit(module);
    options.procedure = QString::fromLocal8Bit(procedure);
    if (startGiven) options.start = start;
    if (intervalGiven) options.interval = interval;
    options.tabs = tabs;
    if (spacesGiven) options.spaces = spaces;
    options.remove = remove;
    options.check = check;
    options.diff = diff;
    return options;
  }

  TaskOptions taskOptions() const {
    return {QString::fromLocal8Bit(project), QString::fromLocal8Bit(taskAction),
            QString::fromLocal8Bit(taskName), QString::fromLocal8Bit(taskText), taskId};
  }
};

// The option groups a command takes.
enum Takes : unsigned {
  kTsv = 1,
  kScope = 2,        // --module, --procedure
  kNumbering = 4,    // --start, --interval
  kIndentation = 8,  // --tabs, --spaces
  kRemove = 16,      // --remove
  kOutput = 32,      // --check, --diff
  kProject = 64,     // one project file instead of files
  kTaskActions = 128,
  kSearch = 256,  // TEXT, --whole-word, --match-case, --pattern, --module
};

struct Command {
  const char* name;
  const char* description;
  unsigned takes;
  int (*run)(const CommandLine&);
};

constexpr unsigned kTransform = kScope | kOutput;

const Command kCommands[] = {
    {"list",
     "Show how the tool reads a group, project or module file: components, members and every "
     "procedure's extent.",
     kTsv,
     [](const CommandLine& c) {
       return runList({toQStrings(c.files), c.tsv});
     }},
    {"find",
     "List every occurrence of TEXT in the code, as the add-in's extended find does: one "
     "\"path:line:column: text\" row each (or tab-separated rows with --tsv). Exit 0 when something "
     "was found, 1 when nothing was.",
     kTsv | kSearch,
     [](const CommandLine& c) {
       return runFind({QString::fromLocal8Bit(c.text), toQStrings(c.files), c.wholeWord, c.matchCase,
                       c.pattern, c.tsv, QString::fromLocal8Bit(c.module)});
     }},
    {"number", "Add line numbers to the executable lines of every procedure, restarting in each.",
     kTransform | kNumbering, [](const CommandLine& c) { return runNumber(c.transformOptions()); }},
    {"unnumber", "Remove the line numbers of every procedure.", kTransform,
     [](const CommandLine& c) { return runUnnumber(c.transformOptions()); }},
    {"indent", "Re-indent procedures and declarations with tabs or spaces.", kTransform | kIndentation,
     [](const CommandLine& c) { return runIndent(c.transformOptions()); }},
    {"numindent",
     "Number (or with --remove unnumber) and re-indent in one pass, the numbers in a column of their "
     "own.",
     kTransform | kNumbering | kIndentation | kRemove,
     [](const CommandLine& c) { return runNumIndent(c.transformOptions()); }},
    {"tasks",
     "List the project's tasks, or change them: add NAME [--text TEXT], done ID, undone ID, remove ID "
     "(the info file the add-in keeps beside the project).",
     kProject | kTaskActions, [](const CommandLine& c) { return runTasks(c.taskOptions()); }},
    {"favorites", "List the project's favorites: module, procedure and line.", kProject,
     [](const CommandLine& c) { return runFavorites(c.taskOptions()); }},
};

void addTaskActions(CLI::App& app, CommandLine& line) {
  app.require_subcommand(0, 1);
  auto* add = app.add_subcommand("add", "Add a task");
  add->add_option("name", line.taskName, "The task's name")->required();
  add->add_option("--text", line.taskText, "Its description");
  add->callback([&line] { line.taskAction = "add"; });
  const std::pair<const char*, const char*> kActions[] = {
      {"done", "Tick a task off"}, {"undone", "Mark a task as not done"}, {"remove", "Remove a task"}};
  for (const auto& [action, description] : kActions) {
    auto* sub = app.add_subcommand(action, description);
    sub->add_option("id", line.taskId, "The task's number, as the list shows it")->required();
    sub->callback([&line, action] { line.taskAction = action; });
  }
}

void addOptions(CLI::App& app, unsigned takes, CommandLine& line) {
  if (takes & kProject) {
    app.add_option("project", line.project, "Project file (.vbp)")->required();
    if (takes & kTaskActions) addTaskActions(app, line);
    return;
  }
  if (takes & kSearch) {
    app.add_option("text", line.text, "The text to look for")->required();
    app.add_flag("--whole-word", line.wholeWord, "Only whole words");
    auto* matchCase = app.add_flag("--match-case", line.matchCase, "Letter case must match");
    app.add_flag("--pattern", line.pattern, "TEXT holds wildcards: ? * # [list] [!list]")
        ->excludes(matchCase);
    app.add_option("--module", line.module, "Only the module (component) of this name");
  }
  app.add_option("files", line.files, "Group (.vbg), project (.vbp) or module files")->required();
  if (takes & kTsv)
    app.add_flag("--tsv", line.tsv,
                 (takes & kSearch) ? "One tab-separated row per occurrence: project, module, procedure, "
                                     "line:column, text"
                                   : "One tab-separated row per component and per procedure, for scripts");
  if (takes & kScope) {
    auto* module = app.add_option("--module", line.module, "Only the module (component) of this name");
    auto* procedure = app.add_option("--procedure", line.procedure, "Only this procedure, as MODULE.NAME")
                          ->type_name("MODULE.NAME");
    module->excludes(procedure);
  }
  constexpr qint32 kLargest = std::numeric_limits<qint32>::max();
  if (takes & kNumbering) {
    app.add_option("--start", line.start,
                   "The first number of each procedure (default: the "
                   "numbering dialog's)")
        ->check(CLI::Range(0, kLargest));
    app.add_option("--interval", line.interval,
                   "The step between numbers (default: the "
                   "numbering dialog's)")
        ->check(CLI::Range(1, kLargest));
  }
  if (takes & kIndentation) {
    auto* tabs = app.add_flag("--tabs", line.tabs, "Indent with one tab per level");
    auto* spaces = app.add_option("--spaces", line.spaces,
                                  "Indent with N spaces per level (default: the "
                                  "indentation dialog's choice)")
                       ->type_name("N")
                       ->check(CLI::Range(1, 1000));
    tabs->excludes(spaces);
  }
  if (takes & kRemove)
    app.add_flag("--remove", line.remove, "Remove the line numbers instead of adding them");
  if (takes & kOutput) {
    app.add_flag("--check", line.check, "Write nothing; exit 1 when a file would change");
    app.add_flag("--diff", line.diff, "Write nothing; print a unified diff of what would change");
  }
}

/// A standard stream that was closed gets /dev/null opened the wrong way round: writing to it then fails
/// (and is reported) instead of reaching the first file the tool opens, which would take its number.
void keepStandardStreamsOpen() {
  for (const int descriptor : {STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO}) {
    if (::fcntl(descriptor, F_GETFD) != -1 || errno != EBADF) continue;
    const int opened = ::open("/dev/null", descriptor == STDIN_FILENO ? O_WRONLY : O_RDONLY);
    if (opened >= 0 && opened != descriptor) {
      ::dup2(opened, descriptor);
      ::close(opened);
    }
  }
}

/// What was written to standard output must have got there (a full disk, a closed stream), as with
/// coreutils: otherwise the run fails with kOutputError.
int checkOutput(int code) {
  if (std::fflush(stdout) != 0 && outputError == 0) outputError = errno;
  if (outputError == 0 && std::ferror(stdout)) outputError = EIO;
  if (outputError == 0) return code;
  printError(QStringLiteral("write error: %1").arg(QString::fromLocal8Bit(std::strerror(outputError))));
  return kOutputError;
}

}  // namespace
}  // namespace cli

static int runTool(int argc, char** argv) {
  QCoreApplication app(argc, argv);
  CLI::App parser{
      "quimbel: the Quimbel add-in's batch features for VB6 projects.\n\n"
      "Files are rewritten in place, and only where a line changed. Options left out take the values\n"
      "last chosen in the numbering and indentation dialogs.\n\n"
      "Exit codes: 0 done, 1 --check found changes (find: nothing found), 2 bad command line, 3 unreadable "
      "or invalid\n"
      "input, or code the command cannot rewrite (nothing is written then), 4 a file could not be\n"
      "written, is read-only or was changed by another program since it was read (what was on disk is\n"
      "kept) or standard output failed, 5 files that a group or project lists are missing (each is\n"
      "named; the rest was done), 6 a save failed half way and could not be undone (the message names\n"
      "the files), 7 tasks or favorites: the project has no info file."};
  parser.require_subcommand(1);
  parser.set_version_flag("--version", "quimbel " QUIMBEL_VERSION, "Print the version and exit");

  cli::CommandLine line;
  std::vector<std::pair<CLI::App*, const cli::Command*>> subcommands;
  for (const cli::Command& command : cli::kCommands) {
    CLI::App* sub = parser.add_subcommand(command.name, command.description);
    cli::addOptions(*sub, command.takes, line);
    subcommands.emplace_back(sub, &command);
  }

  try {
    parser.parse(argc, argv);
  } catch (const CLI::CallForHelp&) {
    std::cout << parser.help();
    return cli::kSuccess;
  } catch (const CLI::CallForVersion& version) {
    std::cout << version.what() << "\n";
    return cli::kSuccess;
  } catch (const CLI::ParseError& error) {
    std::cerr << "quimbel: " << error.what() << "\n"
              << "Run 'quimbel --help' for usage.\n";
    return cli::kUsageError;
  }

  try {
    for (const auto& [sub, command] : subcommands) {
      if (!sub->parsed()) continue;
      line.noteGiven(*sub);
      return command->run(line);
    }
  } catch (const ide::Error& error) {
    cli::printError(error.description());
    return error.number() == ide::err::PathFileAccessError ? cli::kOutputError : cli::kInputError;
  }
  return cli::kUsageError;
}

int main(int argc, char** argv) {
  cli::keepStandardStreamsOpen();
  return cli::checkOutput(runTool(argc, argv));
}

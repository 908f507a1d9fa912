// SPDX-License-Identifier: MIT
// quimbel: the add-in's batch features from the command line. One table names the commands and the
// options each takes; every command lives in a file of its own.
#include "cli.h"
#include "ide/error.h"

#include <CLI/CLI.hpp>

#include <QCoreApplication>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <iostream>
#include <iterator>
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

void printSummary(const QString& text) {
  const QByteArray bytes = text.toLocal8Bit() + '\n';
  std::fwrite(bytes.constData(), 1, static_cast<size_t>(bytes.size()), stderr);
}

QByteArray jsonText(const QJsonDocument& document) {
  return document.toJson(QJsonDocument::Compact) + '\n';
}

void printBytes(QByteArrayView bytes) {
  if (std::fwrite(bytes.data(), 1, size_t(bytes.size()), stdout) != size_t(bytes.size()) && outputError == 0)
    outputError = errno;
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
  std::vector<std::string> excludes;
  std::string encoding = "ansi";
  std::string stdinName;
  std::string text;
  bool wholeWord = false;
  bool matchCase = false;
  bool ignoreCase = false;
  bool pattern = false;
  bool tsv = false;
  bool json = false;
  bool quiet = false;
  std::string module;
  std::string procedure;
  qint32 start = 0;
  qint32 interval = 0;
  bool tabs = false;
  qint32 spaces = 0;
  bool numIndent = false;
  bool remove = false;
  bool fileLines = false;
  bool check = false;
  bool diff = false;
  bool stdio = false;
  // config, tasks and favorites.
  std::string file;
  std::string project;
  std::string taskAction;
  std::string taskName;
  std::string taskText;
  qint32 taskId = 0;
  // Which of the options that override a style the user gave.
  codestyle::CommandLine style;

  void noteGiven(const CLI::App& command) {
    const auto given = [&](const char* name) {
      const CLI::Option* option = command.get_option_no_throw(name);
      return option && option->count() > 0;
    };
    style = {};
    if (given("--start")) style.numberStart = start;
    if (given("--interval")) style.numberInterval = interval;
    if (tabs) style.indentStyle = transform::IndentMode::Tabs;
    if (given("--spaces")) {
      style.indentStyle = transform::IndentMode::Spaces;
      style.indentSize = spaces;
    }
    if (given("--numindent")) style.numIndent = numIndent;
  }

  InputOptions inputOptions() const {
    return {toQStrings(files), Exclusions(toQStrings(excludes)), encoding == "utf-8"};
  }

  TransformOptions transformOptions() const {
    TransformOptions options;
    options.input = inputOptions();
    options.stdinName = QString::fromLocal8Bit(stdinName);
    options.module = QString::fromLocal8Bit(module);
    options.procedure = QString::fromLocal8Bit(procedure);
    options.style = style;
    options.remove = remove;
    options.fileLines = fileLines;
    options.check = check;
    options.diff = diff;
    return options;
  }

  TaskOptions taskOptions() const {
    return {QString::fromLocal8Bit(project),
            QString::fromLocal8Bit(taskAction),
            QString::fromLocal8Bit(taskName),
            QString::fromLocal8Bit(taskText),
            taskId,
            json};
  }
};

// The option groups a command takes.
enum Takes : unsigned {
  kTsv = 1,
  kScope = 2,        // --module, --procedure
  kNumbering = 4,    // --start, --interval
  kIndentation = 8,  // --tabs, --spaces
  kRemove = 16,      // --remove
  kOutput = 32,      // --check, --diff, --stdin-filename
  kProject = 64,     // one project file instead of files
  kTaskActions = 128,
  kSearch = 256,  // TEXT, -w, -s, -i, --pattern, --module, -q
  kJson = 512,
  kFileLines = 1024,  // --file-lines
  kNumIndent = 2048,  // --numindent, --no-numindent
  kOneFile = 4096,    // one file of any kind instead of files
  kNoFiles = 8192,    // no files: the command talks over standard input and output
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
     "Show how the tool reads groups, projects, modules or folders: components, members and every "
     "procedure's extent (lines counted in the code window).",
     kTsv | kJson,
     [](const CommandLine& c) {
       return runList({c.inputOptions(), c.tsv, c.json});
     }},
    {"find",
     "List every occurrence of TEXT in the code, as the add-in's extended find does: one "
     "\"path:line:column: text\" row each, the line counted in the file (with --tsv, tab-separated rows "
     "whose line is counted in the code window; with --json, both). Exit 0 when something was found, 1 "
     "when nothing was.",
     kTsv | kSearch | kJson,
     [](const CommandLine& c) {
       FindCommandOptions options;
       options.text = QString::fromLocal8Bit(c.text);
       options.input = c.inputOptions();
       options.wholeWord = c.wholeWord;
       options.matchCase = c.matchCase;
       options.pattern = c.pattern;
       options.tsv = c.tsv;
       options.json = c.json;
       options.quiet = c.quiet;
       options.module = QString::fromLocal8Bit(c.module);
       return runFind(options);
     }},
    {"number", "Add line numbers to the executable lines of every procedure, restarting in each.",
     kTransform | kNumbering | kFileLines | kNumIndent,
     [](const CommandLine& c) { return runTransform(c.transformOptions(), TransformKind::Number); }},
    {"unnumber", "Remove the line numbers of every procedure.", kTransform | kNumIndent,
     [](const CommandLine& c) { return runTransform(c.transformOptions(), TransformKind::Unnumber); }},
    {"indent", "Re-indent procedures and declarations with tabs or spaces.",
     kTransform | kIndentation | kNumIndent,
     [](const CommandLine& c) { return runTransform(c.transformOptions(), TransformKind::Indent); }},
    {"numindent",
     "Number (or with --remove unnumber) and re-indent in one pass, the numbers in a column of their "
     "own.",
     kTransform | kNumbering | kIndentation | kRemove | kFileLines,
     [](const CommandLine& c) { return runTransform(c.transformOptions(), TransformKind::NumIndent); }},
    {"config",
     "Print the numbering and indentation values in force for FILE and where each came from: the "
     "command line, an .editorconfig, the personal settings or the defaults.",
     kOneFile | kNumbering | kIndentation | kNumIndent,
     [](const CommandLine& c) { return runConfig(QString::fromLocal8Bit(c.file), c.style); }},
    {"tasks",
     "List the project's tasks, or change them: add NAME [--text TEXT], done ID, undone ID, remove ID "
     "(the info file the add-in keeps beside the project).",
     kProject | kTaskActions | kJson, [](const CommandLine& c) { return runTasks(c.taskOptions()); }},
    {"favorites", "List the project's favorites: module, procedure and the line they open at.",
     kProject | kJson, [](const CommandLine& c) { return runFavorites(c.taskOptions()); }},
    {"lsp",
     "Serve editors as a language server on standard input and output: formatting, numbering code "
     "actions, symbols, folding, references and diagnostics. Files are never written; edits go to the "
     "editor.",
     kNoFiles, [](const CommandLine&) { return runLsp(); }},
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
  CLI::Option* json = nullptr;
  if (takes & kJson)
    json = app.add_flag("--json", line.json, "Print one JSON document (UTF-8) instead of text, for scripts");
  if (takes & kProject) {
    app.add_option("project", line.project, "Project file (.vbp)")->required();
    if (takes & kTaskActions) addTaskActions(app, line);
    return;
  }
  if (takes & kNoFiles) {
    // Clients that start servers with --stdio (VS Code's stdio transport, many editor configurations).
    app.add_flag("--stdio", line.stdio,
                 "Talk over standard input and output (the only way; accepted for clients that say so)");
    return;
  }
  if (takes & kSearch) {
    app.add_option("text", line.text, "The text to look for")->required();
    app.add_flag("-w,--whole-word", line.wholeWord, "Only whole words");
    auto* matchCase = app.add_flag("-s,--match-case", line.matchCase, "Letter case must match");
    app.add_flag("-i,--ignore-case", line.ignoreCase, "Letter case does not matter (the default)")
        ->excludes(matchCase);
    app.add_flag("--pattern", line.pattern, "TEXT holds wildcards: ? * # [list] [!list]")
        ->excludes(matchCase);
    app.add_option("--module", line.module, "Only the module (component) of this name");
    app.add_flag("-q,--quiet", line.quiet, "Print nothing; only the exit code tells whether TEXT was found");
  }
  if (takes & kOneFile) {
    app.add_option("file", line.file,
                   "A module file (it need not exist): the .editorconfig files above it apply")
        ->required();
  } else {
    app.add_option("files", line.files,
                   (takes & kOutput) ? "Group (.vbg), project (.vbp) or module files, or folders; - alone "
                                       "for one module on standard input, the result on standard output"
                                     : "Group (.vbg), project (.vbp) or module files, or folders")
        ->required();
    app.add_option("--exclude", line.excludes,
                   "Leave out the files whose name, folder or path matches this glob (repeatable)")
        ->type_name("GLOB");
    app.add_option("--encoding", line.encoding,
                   "How modules are written: ansi (Windows-1252, as VB6 writes them; the default) or utf-8")
        ->check(CLI::IsMember({"ansi", "utf-8"}));
  }
  if (takes & kTsv) {
    auto* tsv = app.add_flag("--tsv", line.tsv,
                             (takes & kSearch)
                                 ? "One tab-separated row per occurrence: project, module, procedure, "
                                   "line:column in the code window, text"
                                 : "One tab-separated row per component and per procedure, for scripts");
    if (json) tsv->excludes(json);
  }
  if (takes & kScope) {
    auto* module = app.add_option("--module", line.module, "Only the module (component) of this name");
    auto* procedure = app.add_option("--procedure", line.procedure, "Only this procedure, as MODULE.NAME")
                          ->type_name("MODULE.NAME");
    module->excludes(procedure);
  }
  constexpr qint32 kLargest = std::numeric_limits<qint32>::max();
  CLI::Option* start = nullptr;
  CLI::Option* interval = nullptr;
  if (takes & kNumbering) {
    start = app.add_option("--start", line.start, "The first number of each procedure")
                ->check(CLI::Range(0, kLargest));
    interval = app.add_option("--interval", line.interval, "The step between numbers")
                   ->check(CLI::Range(1, kLargest));
  }
  if (takes & kIndentation) {
    auto* tabs = app.add_flag("--tabs", line.tabs, "Indent with one tab per level");
    auto* spaces = app.add_option("--spaces", line.spaces, "Indent with N spaces per level")
                       ->type_name("N")
                       ->check(CLI::Range(1, int(codestyle::kMostSpaces)));
    tabs->excludes(spaces);
  }
  if (takes & kNumIndent)
    app.add_flag("--numindent,!--no-numindent", line.numIndent,
                 "Number and indent in one pass, as numindent does (or not)");
  CLI::Option* remove = nullptr;
  if (takes & kRemove)
    remove = app.add_flag("--remove", line.remove, "Remove the line numbers instead of adding them");
  if (takes & kFileLines) {
    auto* fileLines = app.add_flag("--file-lines", line.fileLines,
                                   "Number each line with its line in the file, so that Erl names it");
    fileLines->excludes(start)->excludes(interval);
    if (remove) fileLines->excludes(remove);
  }
  if (takes & kOutput) {
    auto* check = app.add_flag("--check", line.check, "Write nothing; exit 1 when a file would change");
    app.add_flag("--diff", line.diff, "Write nothing; print a unified diff of what would change")
        ->excludes(check);
    app.add_option("--stdin-filename", line.stdinName,
                   "The file standard input stands for: its kind of module, and the .editorconfig that "
                   "applies (default: stdin.bas here)")
        ->type_name("NAME");
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
      "Files are rewritten in place, and only where a line changed. A folder stands for the project and\n"
      "module files under it. Options left out take the values of the .editorconfig files that apply to\n"
      "each module, else the values last chosen in the numbering and indentation dialogs (quimbel config\n"
      "FILE shows them).\n\n"
      "Exit codes: 0 done, 1 --check found changes (find: nothing found), 2 bad command line, 3 unreadable\n"
      "or invalid input, or code the command cannot rewrite (nothing is written then), 4 a file could not\n"
      "be written, is read-only or was changed by another program since it was read (what was on disk is\n"
      "kept) or standard output failed, 5 files that a group or project lists are missing (each is named;\n"
      "the rest was done, and a line on standard error tells its result), 6 a save failed half way and\n"
      "could not be undone (the message names the files), 7 tasks or favorites: the project has no info\n"
      "file, 8 the task named does not exist.",
      "quimbel"};
  parser.require_subcommand(1);
  parser.set_version_flag("--version", "quimbel " QUIMBEL_VERSION, "Print the version and exit");

  cli::CommandLine line;
  std::vector<std::pair<CLI::App*, const cli::Command*>> subcommands;
  for (const cli::Command& command : cli::kCommands) {
    CLI::App* sub = parser.add_subcommand(command.name, command.description);
    cli::addOptions(*sub, command.takes, line);
    subcommands.emplace_back(sub, &command);
  }

  // A word where the command belongs that names none: say so, rather than that a command is missing.
  if (argc > 1 && argv[1][0] != '-' &&
      std::none_of(std::begin(cli::kCommands), std::end(cli::kCommands),
                   [&](const cli::Command& command) { return std::strcmp(command.name, argv[1]) == 0; })) {
    std::cerr << "quimbel: unknown command '" << argv[1] << "'\n"
              << "Run 'quimbel --help' for the commands.\n";
    return cli::kUsageError;
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

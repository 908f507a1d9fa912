// SPDX-License-Identifier: MIT
// The command-line tool end to end: the built binary, run on copies of the example group and on small
// modules, with settings of its own. Bytes on disk, standard output and error, and exit codes.
#include "common/settings.h"
#include "find/findwalk.h"
#include "generator.h"
#include "host/files/ansi.h"
#include "host/model/vbe.h"
#include "printers.h"
#include "testproject.h"

#include <gtest/gtest.h>

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QProcess>
#include <QRegularExpression>
#include <QStandardPaths>
#include <QTemporaryDir>

#include <sys/stat.h>
#include <unistd.h>

namespace {

using host::test::ExampleCopy;
using host::test::readBytes;
using host::test::writeBytes;

struct Result {
  int code = -1;
  QString out;
  QString err;
  QByteArray bytes;  // standard output as written
};

// The tool with a settings directory of its own.
class Tool {
 public:
  Result run(const QStringList& arguments, const QString& directory = {}, const QByteArray& input = {}) {
    return runProgram(QStringLiteral(QUIMBEL_BINARY), arguments, directory, input);
  }

  /// Runs another program with the tool's environment (the built tool first on its path).
  Result runProgram(const QString& program, const QStringList& arguments, const QString& directory = {},
                    const QByteArray& input = {}) {
    QProcess process;
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.insert(u"QUIMBEL_CONFIG_DIR"_qs, m_home.filePath(u"config"_qs));
    environment.insert(u"QUIMBEL_DATA_DIR"_qs, m_home.filePath(u"data"_qs));
    environment.insert(u"LC_ALL"_qs, u"C.UTF-8"_qs);
    environment.insert(u"PATH"_qs,
                       QFileInfo(QUIMBEL_BINARY).absolutePath() + u':' + environment.value(u"PATH"_qs));
    process.setProcessEnvironment(environment);
    if (!directory.isEmpty()) process.setWorkingDirectory(directory);
    process.start(program, arguments);
    process.write(input);
    process.closeWriteChannel();
    EXPECT_TRUE(process.waitForFinished(120000));
    const QByteArray out = process.readAllStandardOutput();
    return {process.exitStatus() == QProcess::NormalExit ? process.exitCode() : -1, QString::fromUtf8(out),
            QString::fromUtf8(process.readAllStandardError()), out};
  }

  /// The settings the dialogs would have left.
  void setSetting(const common::setting::Key& key, const QString& value) {
    common::SettingsStore(m_home.filePath(u"config/Quimbel.ini"_qs)).setValue(key, value);
  }

 private:
  QTemporaryDir m_home;
};

// A small module in Windows-1252 with CRLF line ends (the accents are written as their code-page bytes).
const QByteArray kCalculo =
    "Attribute VB_Name = \"Calculo\"\r\n"
    "Option Explicit\r\n"
    "' C\xE1lculo de pre\xE7os\r\n"
    "Public Function Preco(ByVal x As Currency) As Currency\r\n"
    "    If x > 0 Then\r\n"
    "        Preco = x * 1.1 ' acr\xE9scimo\r\n"
    "    Else\r\n"
    "        Preco = 0\r\n"
    "    End If\r\n"
    "End Function\r\n";

// A directory holding Calculo.bas.
struct Workspace {
  QTemporaryDir dir;
  QString file = dir.filePath(u"Calculo.bas"_qs);
  explicit Workspace(const QByteArray& bytes = kCalculo) { writeBytes(file, bytes); }
  QByteArray bytes() const { return readBytes(file); }
};

// ---------------------------------------------------------------------------------------------------
// The command line

TEST(CommandLine, BadCommandLinesExitWithTwoAndSayWhy) {
  Workspace work;
  Tool tool;
  const std::pair<QStringList, QString> bad[] = {
      {{}, {}},
      {{u"renumber"_qs, work.file}, {}},
      {{u"number"_qs}, {}},
      {{u"number"_qs, u"--bogus"_qs, work.file}, {}},
      {{u"number"_qs, u"--start"_qs, u"dez"_qs, work.file}, {}},
      {{u"number"_qs, u"--start"_qs, u"-5"_qs, work.file}, {}},
      {{u"number"_qs, u"--interval"_qs, u"0"_qs, work.file}, {}},
      {{u"number"_qs, u"--start"_qs, u"99999999999"_qs, work.file}, {}},
      {{u"number"_qs, u"--tabs"_qs, work.file}, {}},
      {{u"indent"_qs, u"--spaces"_qs, u"0"_qs, work.file}, {}},
      {{u"indent"_qs, u"--tabs"_qs, u"--spaces"_qs, u"2"_qs, work.file}, {}},
      {{u"indent"_qs, u"--remove"_qs, work.file}, {}},
      {{u"unnumber"_qs, u"--module"_qs, u"Calculo"_qs, u"--procedure"_qs, u"Calculo.Preco"_qs, work.file},
       {}},
      // A scope that names nothing.
      {{u"number"_qs, u"--module"_qs, u"Nada"_qs, work.file}, u"no module 'Nada'"_qs},
      {{u"number"_qs, u"--procedure"_qs, u"Calculo.Nada"_qs, work.file}, u"no procedure 'Calculo.Nada'"_qs},
      {{u"number"_qs, u"--procedure"_qs, u"Preco"_qs, work.file}, u"MODULE.NAME"_qs},
  };
  for (const auto& [arguments, message] : bad) {
    const Result result = tool.run(arguments);
    EXPECT_EQ(result.code, 2) << arguments.join(u' ').toStdString();
    EXPECT_TRUE(result.err.startsWith(u"quimbel: "_qs)) << result.err.toStdString();
    EXPECT_TRUE(result.err.contains(message)) << result.err.toStdString();
  }
  EXPECT_EQ(work.bytes(), kCalculo);
}

TEST(CommandLine, HelpListsTheCommandsAndTheirOptions) {
  Tool tool;
  Result result = tool.run({u"--help"_qs});
  EXPECT_EQ(result.code, 0);
  for (const char* command : {"list", "number", "unnumber", "indent", "numindent"})
    EXPECT_TRUE(result.out.contains(QString::fromLatin1(command))) << command;
  result = tool.run({u"numindent"_qs, u"--help"_qs});
  EXPECT_EQ(result.code, 0);
  for (const char* option : {"--module", "--procedure", "--start", "--interval", "--tabs", "--spaces",
                             "--remove", "--check", "--diff"})
    EXPECT_TRUE(result.out.contains(QString::fromLatin1(option))) << option;
}

TEST(CommandLine, MessagesNameWhatIsWrongOnceAndUsageNamesTheTool) {
  Workspace work;
  Tool tool;
  const std::tuple<QStringList, int, QString> runs[] = {
      {{u"frobnicate"_qs}, 2, u"quimbel: unknown command 'frobnicate'\n"_qs},
      {{u"list"_qs, u"Nada.bas"_qs}, 3, u"quimbel: Nada.bas: File not found\n"_qs},
      {{u"tasks"_qs, u"Calculo.bas"_qs},
       2,
       u"quimbel: Calculo.bas: tasks and favorites belong to a project; give its project file (.vbp)\n"_qs},
      {{u"number"_qs, u"--file-lines"_qs, u"--start"_qs, u"5"_qs, u"Calculo.bas"_qs}, 2, {}},
      {{u"number"_qs, u"-"_qs, u"--stdin-filename"_qs, u"Leiame.txt"_qs}, 3, {}}};
  for (const auto& [arguments, code, message] : runs) {
    const Result result = tool.run(arguments, work.dir.path());
    EXPECT_EQ(result.code, code) << arguments.join(u' ').toStdString();
    if (!message.isEmpty()) {
      EXPECT_EQ(result.err.section(u'\n', 0, 0) + u'\n', message);
    }
  }
  EXPECT_TRUE(tool.run({u"number"_qs, u"--help"_qs}).out.contains(u"Usage: quimbel number"_qs));
}

// ---------------------------------------------------------------------------------------------------
// Input that cannot be read

TEST(UnreadableInput, ExitsWithThreeNamingTheFileAndWritesNothing) {
  Workspace work;
  Tool tool;
  Result result = tool.run({u"indent"_qs, work.dir.filePath(u"Falta.bas"_qs)});
  EXPECT_EQ(result.code, 3);
  EXPECT_TRUE(result.err.contains(u"Falta.bas"_qs)) << result.err.toStdString();

  // A good file given with a bad one is not written either.
  const QString binary = work.dir.filePath(u"Binario.bas"_qs);
  writeBytes(binary, QByteArray("Attribute VB_Name = \"B\"\r\n\0\1\2", 28));
  result = tool.run({u"indent"_qs, u"--spaces"_qs, u"2"_qs, work.file, binary});
  EXPECT_EQ(result.code, 3);
  EXPECT_TRUE(result.err.contains(u"Binario.bas"_qs)) << result.err.toStdString();
  EXPECT_EQ(work.bytes(), kCalculo);
}

TEST(UnreadableInput, CodeTheCommandCannotRewriteStopsItAndNothingIsWritten) {
  // Numbering would take this line past the IDE's 1023 characters, or the numbers past the largest.
  const QByteArray longLine = "s = \"" + QByteArray(1015, 'a') + "\"";
  const std::tuple<QByteArray, QStringList, QString> runs[] = {
      {"Attribute VB_Name = \"Longo\"\r\nSub A()\r\nAttribute A.VB_Description = \"x\"\r\nx = 1\r\n" +
           longLine + "\r\nEnd Sub\r\n",
       {},
       u"Calculo.bas, line 5: Longo, line 3: Line too long"_qs},
      {kCalculo,
       {u"--start"_qs, u"2147483647"_qs, u"--interval"_qs, u"1"_qs},
       u"line numbers would pass 2147483647"_qs},
  };
  Tool tool;
  for (const auto& [module, options, message] : runs) {
    Workspace work(module);
    const Result result = tool.run(QStringList{u"number"_qs} + options + QStringList{work.file});
    EXPECT_EQ(result.code, 3);
    EXPECT_TRUE(result.err.contains(message)) << result.err.toStdString();
    EXPECT_TRUE(result.err.contains(u"nothing was written"_qs)) << result.err.toStdString();
    EXPECT_EQ(work.bytes(), module);
  }
}

// ---------------------------------------------------------------------------------------------------
// Rewriting files

TEST(Rewriting, OnlyTheFilesOfTheScopeChangeAndOnlyInTheirCode) {
  ExampleCopy copy;
  const auto before = copy.snapshot();
  Tool tool;
  const Result result = tool.run({u"numindent"_qs, u"--module"_qs, u"clsPedido"_qs, copy.groupFile()});
  EXPECT_EQ(result.code, 0) << result.err.toStdString();
  const auto after = copy.snapshot();
  for (auto it = before.cbegin(); it != before.cend(); ++it) {
    if (it.key() == u"Loja/clsPedido.cls"_qs) continue;
    EXPECT_EQ(after.value(it.key()), it.value()) << it.key().toStdString();
  }
  const QList<QByteArray> oldLines = before.value(u"Loja/clsPedido.cls"_qs).split('\n');
  const QList<QByteArray> newLines = after.value(u"Loja/clsPedido.cls"_qs).split('\n');
  ASSERT_EQ(newLines.size(), oldLines.size());
  int changed = 0;
  for (qsizetype i = 0; i + 1 < newLines.size(); ++i) {
    EXPECT_TRUE(newLines[i].endsWith('\r')) << "line " << i + 1;
    if (newLines[i] == oldLines[i]) continue;
    ++changed;
    // The class header and its attributes are never touched.
    EXPECT_FALSE(oldLines[i].startsWith("Attribute ")) << "line " << i + 1;
    EXPECT_FALSE(oldLines[i].startsWith("VERSION ")) << "line " << i + 1;
  }
  EXPECT_GT(changed, 10);
}

TEST(Rewriting, AProcedureScopeTakesEveryKindOfAProperty) {
  Workspace work(
      "Attribute VB_Name = \"Prop\"\r\n"
      "Private mValor As Long\r\n"
      "Public Property Get Valor() As Long\r\n"
      "Valor = mValor\r\n"
      "End Property\r\n"
      "Public Property Let Valor(ByVal v As Long)\r\n"
      "mValor = v\r\n"
      "End Property\r\n"
      "Public Sub Outro()\r\n"
      "x = 1\r\n"
      "End Sub\r\n");
  Tool tool;
  const Result result = tool.run({u"number"_qs, u"--procedure"_qs, u"prop.valor"_qs, work.file});
  EXPECT_EQ(result.code, 0) << result.err.toStdString();
  EXPECT_EQ(work.bytes(), QByteArray("Attribute VB_Name = \"Prop\"\r\n"
                                     "Private mValor As Long\r\n"
                                     "Public Property Get Valor() As Long\r\n"
                                     "10000 Valor = mValor\r\n"
                                     "End Property\r\n"
                                     "Public Property Let Valor(ByVal v As Long)\r\n"
                                     "10000 mValor = v\r\n"
                                     "End Property\r\n"
                                     "Public Sub Outro()\r\n"
                                     "x = 1\r\n"
                                     "End Sub\r\n"));
}

TEST(Rewriting, OptionsLeftOutComeFromTheDialogsSettings) {
  Tool tool;
  tool.setSetting(common::setting::InitialNumber, u"500"_qs);
  tool.setSetting(common::setting::Interval, u"50"_qs);
  tool.setSetting(common::setting::Indentation, u"2"_qs);
  tool.setSetting(common::setting::UseOption, u"1"_qs);
  const QByteArray module =
      "Attribute VB_Name = \"M\"\r\nSub A()\r\nIf x Then\r\ny = 1\r\nEnd If\r\nEnd Sub\r\n";

  Workspace numbered(module);
  const Result result = tool.run({u"number"_qs, numbered.file});
  EXPECT_EQ(result.code, 0);
  EXPECT_TRUE(result.out.isEmpty()) << "a rewrite prints nothing";
  EXPECT_EQ(
      numbered.bytes(),
      QByteArray(
          "Attribute VB_Name = \"M\"\r\nSub A()\r\n500 If x Then\r\n550 y = 1\r\n600 End If\r\nEnd Sub\r\n"));

  Workspace indented(module);
  EXPECT_EQ(tool.run({u"indent"_qs, indented.file}).code, 0);
  EXPECT_EQ(
      indented.bytes(),
      QByteArray(
          "Attribute VB_Name = \"M\"\r\nSub A()\r\n  If x Then\r\n    y = 1\r\n  End If\r\nEnd Sub\r\n"));

  Workspace both(module);
  EXPECT_EQ(tool.run({u"numindent"_qs, both.file}).code, 0);
  EXPECT_EQ(both.bytes(),
            QByteArray("Attribute VB_Name = \"M\"\r\nSub A()\r\n500   If x Then\r\n550     y = 1\r\n"
                       "600   End If\r\nEnd Sub\r\n"));

  // Given options win.
  Workspace given(module);
  EXPECT_EQ(tool.run({u"numindent"_qs, u"--start"_qs, u"1"_qs, u"--tabs"_qs, given.file}).code, 0);
  EXPECT_EQ(given.bytes(),
            QByteArray("Attribute VB_Name = \"M\"\r\nSub A()\r\n1   \tIf x Then\r\n51  \t\ty = 1\r\n"
                       "101 \tEnd If\r\nEnd Sub\r\n"));

  // Removing with numindent re-indents with an empty number column.
  EXPECT_EQ(tool.run({u"numindent"_qs, u"--remove"_qs, given.file}).code, 0);
  EXPECT_EQ(given.bytes(), indented.bytes());
}

TEST(Rewriting, AReadOnlyFileIsRefusedWithFourAndNothingIsWritten) {
  Workspace work;
  Tool tool;
  const QString other = work.dir.filePath(u"Outro.bas"_qs);
  writeBytes(other, QByteArray(kCalculo).replace("Calculo", "Outro"));
  QFile::setPermissions(work.file, QFile::ReadOwner | QFile::ReadGroup | QFile::ReadOther);
  const Result result = tool.run({u"number"_qs, other, work.file});
  EXPECT_EQ(result.code, 4);
  EXPECT_TRUE(result.err.contains(work.file + u": the file is read-only"_qs)) << result.err.toStdString();
  EXPECT_EQ(work.bytes(), kCalculo);
  EXPECT_EQ(readBytes(other), QByteArray(kCalculo).replace("Calculo", "Outro"));
}

// ---------------------------------------------------------------------------------------------------
// Checking and diffs: nothing is written

TEST(CheckAndDiff, CheckExitsWithOneWhenSomethingWouldChange) {
  Workspace work;
  Tool tool;
  Result result = tool.run({u"number"_qs, u"--check"_qs, u"Calculo.bas"_qs}, work.dir.path());
  EXPECT_EQ(result.code, 1);
  EXPECT_EQ(result.out, u"would change Calculo.bas\n"_qs);
  EXPECT_EQ(work.bytes(), kCalculo);
  // Nothing to remove: nothing would change.
  result = tool.run({u"unnumber"_qs, u"--check"_qs, work.file});
  EXPECT_EQ(result.code, 0);
  EXPECT_TRUE(result.out.isEmpty());
}

TEST(CheckAndDiff, DiffPrintsTheChangedLinesWithThreeLinesOfContext) {
  Workspace work;
  Tool tool;
  const Result result = tool.run(
      {u"number"_qs, u"--start"_qs, u"10"_qs, u"--interval"_qs, u"10"_qs, u"--diff"_qs, u"Calculo.bas"_qs},
      work.dir.path());
  EXPECT_EQ(result.code, 0) << result.err.toStdString();
  // The file's own bytes: code page and line ends as they are.
  EXPECT_EQ(result.bytes, QByteArray("--- a/Calculo.bas\n"
                                     "+++ b/Calculo.bas\n"
                                     "@@ -2,9 +2,9 @@\n"
                                     " Option Explicit\r\n"
                                     " ' C\xE1lculo de pre\xE7os\r\n"
                                     " Public Function Preco(ByVal x As Currency) As Currency\r\n"
                                     "-    If x > 0 Then\r\n"
                                     "-        Preco = x * 1.1 ' acr\xE9scimo\r\n"
                                     "-    Else\r\n"
                                     "-        Preco = 0\r\n"
                                     "-    End If\r\n"
                                     "+10     If x > 0 Then\r\n"
                                     "+20         Preco = x * 1.1 ' acr\xE9scimo\r\n"
                                     "+30      Else\r\n"
                                     "+40         Preco = 0\r\n"
                                     "+50     End If\r\n"
                                     " End Function\r\n"));
  EXPECT_EQ(work.bytes(), kCalculo);
}

TEST(CheckAndDiff, DistantChangesMakeSeparateHunks) {
  QByteArray module = "Attribute VB_Name = \"Dois\"\nSub A()\nx = 1\nEnd Sub\n";
  for (int i = 1; i <= 8; ++i)
    module += "' " + QByteArray::number(i) + "\n";
  module += "Sub B()\n    y = 2\nz = 3\nEnd Sub";  // no line end after the last line
  Workspace work(module);
  Tool tool;
  const Result result =
      tool.run({u"indent"_qs, u"--spaces"_qs, u"4"_qs, u"--diff"_qs, u"Calculo.bas"_qs}, work.dir.path());
  EXPECT_EQ(result.code, 0) << result.err.toStdString();
  EXPECT_EQ(result.out, QStringLiteral("--- a/Calculo.bas\n"
                                       "+++ b/Calculo.bas\n"
                                       "@@ -1,6 +1,6 @@\n"
                                       " Attribute VB_Name = \"Dois\"\n"
                                       " Sub A()\n"
                                       "-x = 1\n"
                                       "+    x = 1\n"
                                       " End Sub\n"
                                       " ' 1\n"
                                       " ' 2\n"
                                       "@@ -12,5 +12,5 @@\n"
                                       " ' 8\n"
                                       " Sub B()\n"
                                       "     y = 2\n"
                                       "-z = 3\n"
                                       "+    z = 3\n"
                                       " End Sub\n"
                                       "\\ No newline at end of file\n"));
  EXPECT_EQ(work.bytes(), module);
}

// ---------------------------------------------------------------------------------------------------
// Messy projects and input that is not VB6 code

TEST(MessyInput, MissingFilesAreNamedAndWhatIsNotVb6CodeOrOutputThatFailsIsRefused) {
  QTemporaryDir dir;
  const QString project = host::test::writeMessyProject(dir.path());
  const QByteArray before = readBytes(project);
  ASSERT_EQ(::mkfifo(QFile::encodeName(dir.filePath(u"Fila.bas"_qs)).constData(), 0600), 0);
  ASSERT_TRUE(QDir(dir.path()).mkdir(u"Pasta.bas"_qs));
  ASSERT_TRUE(QFile::link(u"/dev/zero"_qs, dir.filePath(u"Zero.bas"_qs)));
  writeBytes(dir.filePath(u"Leiame.txt"_qs), "Attribute VB_Name = \"Leiame\"\r\n");
  writeBytes(dir.filePath(u"Pasta.vbp"_qs), "Type=Exe\r\nModule=modPasta; PASTA.bas\r\n");
  const std::tuple<const char*, int, const char*> runs[] = {
      {"list Entrada.vbp > /dev/full", 4, "write error: No space left on device"},
      {"indent --diff Entrada.vbp >&-", 4, "write error: Bad file descriptor"},
      {"indent Leiame.txt", 3, "not a project group, project or module file"},
      {"list Fila.bas", 3, "it is a FIFO"},
      {"list Zero.bas", 3, "it is a device"},
      {"list Pasta.bas", 3, "Pasta.bas: no project or module files in this folder"},
      {"number --check Pasta.bas", 3, "Pasta.bas: no project or module files in this folder"},
      {"number Pasta.vbp", 3, "Pasta.vbp, line 2: Cannot read"},
      {"list Entrada.vbp", 5, "Entrada.vbp, line 4: file not found: Classes\\clsFalta.cls"},
      {"number Entrada.vbp", 5, "Entrada.vbp, line 4: file not found: Classes\\clsFalta.cls"}};
  Tool tool;
  for (const auto& [arguments, code, message] : runs) {
    const QStringList shell = {u"-c"_qs, u"'%1' %2"_qs.arg(QUIMBEL_BINARY, arguments)};
    const Result result = tool.runProgram(u"/bin/sh"_qs, shell, dir.path());
    EXPECT_EQ(result.code, code) << arguments;
    EXPECT_TRUE(result.err.contains(QString::fromLatin1(message))) << result.err.toStdString();
  }
  EXPECT_TRUE(readBytes(dir.filePath(u"Fontes/modEntrada.bas"_qs)).contains("\r\n10000 "));
  EXPECT_EQ(readBytes(project), before);
}

// ---------------------------------------------------------------------------------------------------
// The progress bar

TEST(ProgressBar, ALongRunOnATerminalShowsABarOnStandardErrorAndClearsIt) {
  const QString script = QStandardPaths::findExecutable(u"script"_qs);
  if (script.isEmpty()) GTEST_SKIP() << "no script(1) to give the tool a terminal";
  QTemporaryDir dir;
  // Long enough for the bar to be drawn more than once.
  const QString project = gen::generateProjects(dir.path(), {.codeLines = 200'000}).projectFiles.front();
  Tool tool;

  // Without a terminal there is no bar.
  Result result = tool.run({u"indent"_qs, u"--check"_qs, project});
  EXPECT_EQ(result.code, 1);
  EXPECT_TRUE(result.err.isEmpty()) << result.err.toStdString();

  const QString command = u"QUIMBEL_PROGRESS_AFTER_MS=0 '%1' indent --check '%2' > /dev/null"_qs.arg(
      QStringLiteral(QUIMBEL_BINARY), project);
  result = tool.runProgram(script, {u"-qec"_qs, command, u"/dev/null"_qs});
  EXPECT_EQ(result.code, 1);
  EXPECT_TRUE(result.out.contains(u"\rquimbel: ["_qs)) << result.out.toStdString();
  EXPECT_TRUE(result.out.contains(u"%"_qs)) << result.out.toStdString();
  // The last thing written takes the bar off the line again.
  EXPECT_TRUE(result.out.endsWith(u'\r')) << result.out.toStdString();
}

// ---------------------------------------------------------------------------------------------------
// Find

/// What the add-in's search lists over the IDE model, as `find --tsv` rows.
QStringList modelRows(const QString& file, const find::FindOptions& options) {
  struct Rows final : find::FindReport {
    QStringList rows;
    void status(const QString&) override {}
    void resultsLabel(const QString&) override {}
    void found(find::FoundRow row) override {
      rows << u"%1\t%2\t%3\t%4:%5\t%6"_qs.arg(row.project, row.module, row.procedure)
                  .arg(row.item.startline)
                  .arg(row.item.startcol)
                  .arg(row.text.replace(u'\t', u' '));
    }
  } report;
  auto vbe = host::VbeImpl::create();
  vbe->open(file);
  walk::WalkContext context(u"test"_qs, nullptr, nullptr);
  find::FindWalk(context, *vbe, report).Search(find::SearchScope::AllProjects, options);
  return report.rows;
}

QStringList lines(const QString& output) {
  return output.split(u'\n', Qt::SkipEmptyParts);
}

TEST(FindCommand, ListsWhatTheAddInListsInTheSameOrder) {
  ExampleCopy example;
  QTemporaryDir generated;
  const QString group =
      gen::generateProjects(generated.path(), {.codeLines = 6000, .components = 8, .projects = 2}).groupFile;
  const find::FindOptions searches[] = {
      {u"cliente"_qs, true, false, false}, {u"Nome"_qs, false, true, false},
      {u"aa"_qs, false, false, false},     {u"Valor*"_qs, true, false, true},
      {u"ação"_qs, false, false, false},   {u"Boolean"_qs, true, false, false},
      {u"End Sub"_qs, false, false, false}};
  // Line feeds, a lone carriage return, a hidden attribute, labels and line numbers.
  const QString mixed = generated.filePath(u"Misto.bas"_qs);
  writeBytes(mixed,
             "Attribute VB_Name = \"Misto\"\nOption Explicit\nPublic Function Nome() As String\r"
             "Attribute Nome.VB_UserMemId = 0\r\n10 Nome = \"A\xE7\xE3o\" ' Nome\n20 GoTo Fim\n"
             "Fim:\nEnd Function\n' Nome no fim");
  Tool tool;
  for (const QString& file : {example.groupFile(), group, mixed}) {
    for (const find::FindOptions& search : searches) {
      QStringList arguments{u"find"_qs, u"--tsv"_qs, search.text, file};
      if (search.wholeWord) arguments << u"--whole-word"_qs;
      if (search.matchCase) arguments << u"--match-case"_qs;
      if (search.patternSearch) arguments << u"--pattern"_qs;
      const Result result = tool.run(arguments);
      const QStringList expected = modelRows(file, search);
      EXPECT_EQ(lines(result.out), expected) << arguments.join(u' ').toStdString();
      EXPECT_EQ(result.code, expected.isEmpty() ? 1 : 0);
      EXPECT_EQ(result.err,
                u"%1 occurrence%2 found\n"_qs.arg(expected.size()).arg(expected.size() == 1 ? "" : "s"));
    }
  }
}

TEST(FindCommand, RowsPointAtTheLineAndColumnInTheFile) {
  ExampleCopy example;
  Tool tool;
  const Result result = tool.run({u"find"_qs, u"cliente"_qs, u"Demo.vbg"_qs}, example.path({}));
  ASSERT_EQ(result.code, 0);
  for (const QString& row : lines(result.out)) {
    // path:line:column: text, the line counted in the file (headers and hidden attributes included)
    const QStringList place = row.section(u": "_qs, 0, 0).split(u':');
    ASSERT_EQ(place.size(), 3) << row.toStdString();
    const QString line =
        host::decodeAnsi(readBytes(example.path(place[0])).split('\n').value(place[1].toInt() - 1))
            .chopped(1);
    EXPECT_EQ(line.trimmed(), row.section(u": "_qs, 1)) << row.toStdString();
    EXPECT_EQ(line.mid(place[2].toInt() - 1, 7).toLower(), u"cliente"_qs) << row.toStdString();
  }
  EXPECT_TRUE(result.out.contains(u"Loja/frmCliente.frm:"_qs)) << result.out.toStdString();
}

TEST(FindCommand, AMissingFileIsNamedAndTheRestIsSearched) {
  ExampleCopy example;
  QFile::remove(example.path(u"Loja/clsPedido.cls"_qs));
  QFile::remove(example.path(u"Utilitarios/Utilitarios.vbp"_qs));
  Tool tool;
  const find::FindOptions search{u"pedido"_qs};
  const Result result = tool.run({u"find"_qs, u"--tsv"_qs, search.text, u"Demo.vbg"_qs}, example.path({}));
  EXPECT_EQ(result.code, 5);
  EXPECT_EQ(lines(result.out), modelRows(example.groupFile(), search));
  EXPECT_TRUE(result.err.contains(u"Demo.vbg, line 3: file not found: Utilitarios\\Utilitarios.vbp"_qs))
      << result.err.toStdString();
  EXPECT_TRUE(result.err.contains(u"Loja/Loja.vbp, line 9: file not found: clsPedido.cls"_qs))
      << result.err.toStdString();
}

TEST(FindCommand, BadSearchesAndBadInput) {
  Workspace work;
  Tool tool;
  const QString find = u"find"_qs;
  Result result = tool.run({find, u"Nada"_qs, work.file});
  EXPECT_EQ(result.code, 1);
  EXPECT_EQ(result.err, u"0 occurrences found\n"_qs);
  for (const QStringList& arguments :
       {QStringList{find, u"--pattern"_qs, u"--match-case"_qs, u"P*"_qs, work.file},
        QStringList{find, QString(), work.file}, QStringList{find, u"--pattern"_qs, u"[abc"_qs, work.file},
        QStringList{find, u"--module"_qs, u"Nada"_qs, u"x"_qs, work.file}}) {
    result = tool.run(arguments);
    EXPECT_EQ(result.code, 2) << arguments.join(u' ').toStdString();
    EXPECT_TRUE(result.err.startsWith(u"quimbel: "_qs)) << result.err.toStdString();
  }
  EXPECT_TRUE(
      tool.run({find, u"--pattern"_qs, u"[abc"_qs, work.file}).err.contains(u"Invalid pattern string"_qs));

  const QString binary = work.dir.filePath(u"Binario.bas"_qs);
  writeBytes(binary, QByteArray("Attribute VB_Name = \"B\"\r\nSub A()\r\n\0\1\2", 37));
  result = tool.run({find, u"Preco"_qs, work.file, binary});
  EXPECT_EQ(result.code, 3);
  EXPECT_TRUE(result.err.contains(u"Binario.bas, line 3: not a text file"_qs)) << result.err.toStdString();
  EXPECT_TRUE(result.out.isEmpty());
}

// ---------------------------------------------------------------------------------------------------
// Where VB6 teams keep their code: git, pre-commit, editors, pipelines

/// A git repository over a copy of the example group (Windows-1252, CRLF), everything committed.
struct Repository {
  ExampleCopy copy;
  Tool& tool;
  QString root = copy.path({});

  explicit Repository(Tool& user, const QByteArray& editorConfig = {}) : tool(user) {
    if (!editorConfig.isEmpty()) writeBytes(copy.path(u".editorconfig"_qs), editorConfig);
    for (const QStringList& arguments : {QStringList{u"init"_qs, u"-q"_qs},
                                         {u"config"_qs, u"user.name"_qs, u"Teste"_qs},
                                         {u"config"_qs, u"user.email"_qs, u"teste@example.invalid"_qs},
                                         {u"config"_qs, u"core.autocrlf"_qs, u"false"_qs}})
      git(arguments);
  }
  Result git(const QStringList& arguments, const QByteArray& input = {}) {
    const Result result = tool.runProgram(u"git"_qs, arguments, root, input);
    EXPECT_EQ(result.code, 0) << arguments.join(u' ').toStdString() << result.err.toStdString();
    return result;
  }
  void commitAll() {
    git({u"add"_qs, u"-A"_qs});
    git({u"commit"_qs, u"-qm"_qs, u"fontes"_qs});
  }
};

TEST(Git, DiffsApplyWithGitAndPatch) {
  Tool tool;
  Repository repository(tool);
  repository.commitAll();
  QTemporaryDir patches;
  for (const QStringList& command : {QStringList{u"number"_qs, u"--start"_qs, u"10"_qs},
                                     {u"indent"_qs, u"--spaces"_qs, u"2"_qs},
                                     {u"numindent"_qs, u"--file-lines"_qs}}) {
    const QString patch = patches.filePath(command.front());
    const Result diff = tool.run(command + QStringList{u"--diff"_qs, u"Demo.vbg"_qs}, repository.root);
    ASSERT_EQ(diff.code, 0) << diff.err.toStdString();
    EXPECT_TRUE(diff.bytes.contains("\r\n")) << "line ends as in the files";
    writeBytes(patch, diff.bytes);
    repository.git({u"apply"_qs, u"--check"_qs, patch});
  }
  // Applied with patch, the diff gives what the command writes.
  const Result applied = tool.runProgram(
      u"patch"_qs, {u"-s"_qs, u"-p1"_qs, u"-i"_qs, patches.filePath(u"number"_qs)}, repository.root);
  ASSERT_EQ(applied.code, 0) << applied.out.toStdString();
  const auto patched = repository.copy.snapshot();
  repository.git({u"checkout"_qs, u"-q"_qs, u"--"_qs, u"."_qs});
  ASSERT_EQ(tool.run({u"number"_qs, u"--start"_qs, u"10"_qs, u"Demo.vbg"_qs}, repository.root).code, 0);
  EXPECT_EQ(repository.copy.snapshot(), patched);
}

TEST(Git, AFilterKeepsNumbersOutOfTheRepositoryAndInTheWorkingTree) {
  Tool tool;
  // The numbering comes from the project, not from whoever checks it out.
  tool.setSetting(common::setting::InitialNumber, u"7"_qs);
  Repository repository(tool, "root = true\n[*]\nquimbel_number_start = 100\nquimbel_number_interval = 10\n");
  repository.git({u"config"_qs, u"filter.vbnumbers.clean"_qs, u"quimbel unnumber --stdin-filename %f -"_qs});
  repository.git({u"config"_qs, u"filter.vbnumbers.smudge"_qs, u"quimbel number --stdin-filename %f -"_qs});
  repository.git({u"config"_qs, u"filter.vbnumbers.required"_qs, u"true"_qs});
  writeBytes(repository.copy.path(u".gitattributes"_qs),
             "*.bas filter=vbnumbers -text\n*.cls filter=vbnumbers -text\n*.frm filter=vbnumbers -text\n"
             "*.ctl filter=vbnumbers -text\n");
  ASSERT_EQ(tool.run({u"number"_qs, u"Demo.vbg"_qs}, repository.root).code, 0);
  const auto numbered = repository.copy.snapshot();
  repository.commitAll();

  const QString module = u"Loja/modPrincipal.bas"_qs;
  const QByteArray stored = repository.git({u"show"_qs, u"HEAD:"_qs + module}).bytes;
  const Result unnumbered = tool.run({u"unnumber"_qs, u"-"_qs}, repository.root, numbered.value(module));
  EXPECT_EQ(stored, unnumbered.bytes);
  EXPECT_NE(stored, numbered.value(module));
  EXPECT_TRUE(numbered.value(module).contains("\r\n100 ")) << "numbered from the .editorconfig's start";

  for (const QString& file : numbered.keys())
    if (!file.startsWith(u'.')) QFile::remove(repository.copy.path(file));
  repository.git({u"checkout"_qs, u"-q"_qs, u"--"_qs, u"."_qs});
  EXPECT_EQ(repository.copy.snapshot(), numbered);
}

TEST(Git, ThePreCommitHooksCheckFixAndUnnumberTheFilesGiven) {
  // The hooks as the repository offers them: id, entry, and the file pattern.
  QMap<QString, QPair<QString, QRegularExpression>> hooks;
  QString id;
  for (const QByteArray& line : readBytes(QUIMBEL_SOURCE_DIR "/.pre-commit-hooks.yaml").split('\n')) {
    const QString text = QString::fromUtf8(line).trimmed();
    if (text.startsWith(u"- id:"_qs)) id = text.section(u':', 1).trimmed();
    if (text.startsWith(u"entry:"_qs)) hooks[id].first = text.section(u':', 1).trimmed();
    if (text.startsWith(u"files:"_qs))
      hooks[id].second = QRegularExpression(text.section(u':', 1).trimmed().remove(u'\''));
  }
  ASSERT_EQ(hooks.keys(), (QStringList{u"quimbel-indent"_qs, u"quimbel-unnumber"_qs}));
  for (const auto& [entry, files] : hooks) {
    EXPECT_TRUE(files.match(u"Fontes/MODULO.BAS"_qs).hasMatch());
    EXPECT_TRUE(files.match(u"frmA.frm"_qs).hasMatch());
    EXPECT_FALSE(files.match(u"frmA.frx"_qs).hasMatch());
  }

  Tool tool;
  Repository repository(tool);
  const QString file = u"Loja/modPersistencia.bas"_qs;
  repository.commitAll();
  const auto run = [&](const QString& hook, const QStringList& arguments) {
    return tool.runProgram(u"/bin/sh"_qs,
                           QStringList{u"-c"_qs, hooks[hook].first + u" \"$@\""_qs, u"hook"_qs} + arguments,
                           repository.root);
  };
  const QByteArray before = readBytes(repository.copy.path(file));
  EXPECT_EQ(run(u"quimbel-indent"_qs, {u"--check"_qs, file}).code, 1);
  EXPECT_EQ(readBytes(repository.copy.path(file)), before);
  EXPECT_EQ(run(u"quimbel-indent"_qs, {file}).code, 0);
  EXPECT_EQ(run(u"quimbel-indent"_qs, {u"--check"_qs, file}).code, 0);
  EXPECT_EQ(run(u"quimbel-unnumber"_qs, {file}).code, 0);
  EXPECT_FALSE(QRegularExpression(u"\\n\\s*\\d+ "_qs)
                   .match(QString::fromLatin1(readBytes(repository.copy.path(file))))
                   .hasMatch());
  EXPECT_NE(repository.git({u"status"_qs, u"--porcelain"_qs}).out, QString());
}

TEST(Style, AnEditorConfigGivesEveryoneTheSameResultAndConfigSaysWhereEachValueCameFrom) {
  Tool alice;
  Tool bob;
  bob.setSetting(common::setting::InitialNumber, u"100"_qs);
  bob.setSetting(common::setting::UseOption, u"1"_qs);
  const QStringList numIndent{u"numindent"_qs, u"--diff"_qs, u"Calculo.bas"_qs};
  Workspace work;
  EXPECT_NE(alice.run(numIndent, work.dir.path()).out, bob.run(numIndent, work.dir.path()).out);

  writeBytes(work.dir.filePath(u".editorconfig"_qs),
             "root = true\n[*.bas]\nindent_style = space\nindent_size = 4\nquimbel_number_start = 10\n");
  const Result shared = alice.run(numIndent, work.dir.path());
  EXPECT_EQ(bob.run(numIndent, work.dir.path()).out, shared.out);
  EXPECT_TRUE(shared.out.contains(u"+10     If x > 0 Then"_qs)) << shared.out.toStdString();

  const Result config =
      bob.run({u"config"_qs, u"--interval"_qs, u"7"_qs, u"Calculo.bas"_qs}, work.dir.path());
  EXPECT_EQ(config.code, 0) << config.err.toStdString();
  EXPECT_EQ(config.out.simplified(),
            u"indent_style = space .editorconfig (.editorconfig) "
            "indent_size = 4 .editorconfig (.editorconfig) "
            "quimbel_number_start = 10 .editorconfig (.editorconfig) "
            "quimbel_number_interval = 7 command line "
            "quimbel_numindent = false default"_qs);
  EXPECT_TRUE(bob.run({u"config"_qs, u"Outro.cls"_qs}, work.dir.path())
                  .out.contains(u"quimbel_number_start = 100          personal settings ("_qs));

  // The one-command option: numbering indents too.
  writeBytes(work.dir.filePath(u"Sub/.editorconfig"_qs),
             "[*]\nquimbel_numindent = true\nindent_size = tab\ntab_width = 2\n");
  writeBytes(work.dir.filePath(u"Sub/Calculo.bas"_qs), kCalculo);
  const Result both = alice.run({u"number"_qs, u"--diff"_qs, u"Sub/Calculo.bas"_qs}, work.dir.path());
  EXPECT_EQ(both.out, alice.run({u"numindent"_qs, u"--diff"_qs, u"Sub/Calculo.bas"_qs}, work.dir.path()).out);
  EXPECT_TRUE(both.out.contains(u"+10   If x > 0 Then"_qs)) << both.out.toStdString();

  writeBytes(work.dir.filePath(u"Sub/.editorconfig"_qs), "[*.bas]\nquimbel_number_interval = 0\n");
  const Result bad = alice.run({u"number"_qs, u"Sub/Calculo.bas"_qs}, work.dir.path());
  EXPECT_EQ(bad.code, 3);
  EXPECT_TRUE(bad.err.startsWith(u"quimbel: Sub/.editorconfig: quimbel_number_interval = 0 is not"_qs))
      << bad.err.toStdString();
  EXPECT_EQ(readBytes(work.dir.filePath(u"Sub/Calculo.bas"_qs)), kCalculo);
}

TEST(StandardInput, OneModuleInTheResultOutNothingWritten) {
  Workspace work;
  writeBytes(work.dir.filePath(u".editorconfig"_qs),
             "[*.frm]\nquimbel_number_start = 1\nquimbel_number_interval = 1\n");
  Tool tool;
  const QStringList form{u"number"_qs, u"--stdin-filename"_qs, u"Telas/frmA.frm"_qs, u"-"_qs};
  Result result = tool.run(form, work.dir.path(), kCalculo);
  EXPECT_EQ(result.code, 0) << result.err.toStdString();
  EXPECT_TRUE(result.bytes.contains("\r\n1     If x")) << result.bytes.toStdString();
  EXPECT_EQ(tool.run({u"unnumber"_qs, u"-"_qs}, {}, result.bytes).bytes, kCalculo);
  EXPECT_EQ(tool.run({u"unnumber"_qs, u"-"_qs}, {}, kCalculo).bytes, kCalculo) << "unchanged, still written";
  result = tool.run({u"number"_qs, u"--check"_qs, u"-"_qs}, {}, kCalculo);
  EXPECT_EQ(result.code, 1);
  EXPECT_EQ(result.out, u"would change stdin.bas\n"_qs);
  result = tool.run({u"number"_qs, u"--stdin-filename"_qs, u"Mau.bas"_qs, u"-"_qs}, {},
                    QByteArray("Sub A()\r\n\0", 10));
  EXPECT_EQ(result.code, 3);
  EXPECT_TRUE(result.err.startsWith(u"quimbel: Mau.bas, line 2: not a text file"_qs))
      << result.err.toStdString();
  EXPECT_TRUE(result.bytes.isEmpty());
  EXPECT_EQ(work.bytes(), kCalculo);
}

TEST(Json, ListAndFindParseBackWithEveryLineNamedForWhatItCounts) {
  ExampleCopy example;
  Tool tool;
  const QJsonDocument list =
      QJsonDocument::fromJson(tool.run({u"list"_qs, u"--json"_qs, u"Demo.vbg"_qs}, example.path({})).bytes);
  QStringList rows;
  for (const QJsonValue project : list[u"projects"_qs].toArray())
    for (const QJsonValue component : project[u"components"_qs].toArray()) {
      if (!component[u"members"_qs].isArray()) continue;
      const QString path = component[u"file"_qs].toString();
      rows << u"%1\t(declarations)\t0\t0\t0\t%2"_qs.arg(path).arg(component[u"declaration_lines"_qs].toInt());
      for (const QJsonValue member : component[u"members"_qs].toArray())
        for (const QJsonValue procedure : member[u"procedures"_qs].toArray()) {
          const QByteArray line =
              readBytes(example.path(path)).split('\n').value(procedure[u"body_file_line"_qs].toInt() - 1);
          EXPECT_TRUE(line.contains(member[u"name"_qs].toString().toLatin1())) << line.toStdString();
          rows << u"%1\t%2\t%3\t%4"_qs
                      .arg(path, member[u"name"_qs].toString(), procedure[u"kind"_qs].toString())
                      .arg(procedure[u"start_code_line"_qs].toInt());
        }
    }
  EXPECT_GT(rows.size(), 40);
  // Every declarations row of --tsv, in the same order.
  const QStringList tsv = lines(tool.run({u"list"_qs, u"--tsv"_qs, u"Demo.vbg"_qs}, example.path({})).out);
  EXPECT_EQ(rows.filter(u"(declarations)"_qs), tsv.filter(u"(declarations)"_qs));

  const QStringList search{u"find"_qs, u"cliente"_qs, u"Demo.vbg"_qs};
  const QJsonArray found =
      QJsonDocument::fromJson(tool.run(search + QStringList{u"--json"_qs}, example.path({})).bytes).array();
  QStringList tsvRows;
  QStringList plainRows;
  for (const QJsonValue hit : found) {
    tsvRows << u"%1\t%2\t%3\t%4:%5\t%6"_qs
                   .arg(hit[u"project"_qs].toString(), hit[u"module"_qs].toString(),
                        hit[u"procedure"_qs].toString())
                   .arg(hit[u"code_line"_qs].toInt())
                   .arg(hit[u"column"_qs].toInt())
                   .arg(hit[u"text"_qs].toString());
    plainRows << u"%1:%2:%3: %4"_qs.arg(hit[u"path"_qs].toString())
                     .arg(hit[u"file_line"_qs].toInt())
                     .arg(hit[u"column"_qs].toInt())
                     .arg(hit[u"text"_qs].toString());
  }
  EXPECT_EQ(tsvRows, lines(tool.run(search + QStringList{u"--tsv"_qs}, example.path({})).out));
  EXPECT_EQ(plainRows, lines(tool.run(search, example.path({})).out));
  const Result quiet = tool.run(search + QStringList{u"-q"_qs}, example.path({}));
  EXPECT_EQ(quiet.code, 0);
  EXPECT_TRUE(quiet.out.isEmpty() && quiet.err.isEmpty());
}

TEST(FileLines, EachNewNumberIsTheLineOfTheFileThatHoldsIt) {
  ExampleCopy copy;
  QTemporaryDir generated;
  const QString group =
      gen::generateProjects(generated.path(), {.codeLines = 8'000, .components = 6, .projects = 2}).groupFile;
  Tool tool;
  for (const auto& [file, directory] :
       {std::pair(copy.groupFile(), copy.path(QString())), std::pair(group, generated.path())}) {
    SCOPED_TRACE(file.toStdString());
    ASSERT_EQ(tool.run({u"unnumber"_qs, file}).code, 0);
    const auto before = host::test::snapshot(directory);
    for (const QString& command : {u"number"_qs, u"numindent"_qs}) {
      ASSERT_EQ(tool.run({command, u"--file-lines"_qs, file}).code, 0);
      int numbered = 0;
      for (auto it = before.cbegin(); it != before.cend(); ++it) {
        const QList<QByteArray> old = it.value().split('\n');
        const QList<QByteArray> now = readBytes(QDir(directory).filePath(it.key())).split('\n');
        ASSERT_EQ(now.size(), old.size()) << it.key().toStdString();
        for (qsizetype i = 0; i < now.size(); ++i) {
          if (now[i] == old[i] || (command != u"number"_qs && !std::isdigit(now[i].front()))) continue;
          bool isNumber = false;
          EXPECT_EQ(now[i].left(now[i].indexOf(' ')).toInt(&isNumber), i + 1) << now[i].toStdString();
          numbered += isNumber;
        }
      }
      EXPECT_GT(numbered, 100);
      ASSERT_EQ(tool.run({u"unnumber"_qs, file}).code, 0);
      if (command == u"number"_qs) {
        EXPECT_EQ(host::test::snapshot(directory), before);
      }
    }
  }
}

TEST(Inputs, FoldersStandForTheirFilesEachFileIsDoneOnceAndMissingFilesLeaveTheResultVisible) {
  ExampleCopy copy;
  Tool tool;
  const QStringList named{u"."_qs,
                          u"Loja/Loja.vbp"_qs,
                          u"Loja/modPersistencia.bas"_qs,
                          u"Loja/../Loja/clsPedido.cls"_qs,
                          u"--exclude"_qs,
                          u"Utilitarios"_qs,
                          u"--exclude"_qs,
                          u"frm*.frm"_qs};
  const Result check = tool.run(QStringList{u"number"_qs, u"--check"_qs} + named, copy.path({}));
  EXPECT_EQ(check.code, 1);
  const QStringList changing = lines(check.out);
  EXPECT_EQ(changing.size(), QSet<QString>(changing.begin(), changing.end()).size())
      << check.out.toStdString();
  EXPECT_TRUE(changing.contains(u"would change Loja/clsPedido.cls"_qs)) << check.out.toStdString();
  EXPECT_EQ(changing.filter(u"Utilitarios"_qs).size() + changing.filter(u"/frm"_qs).size(), 0);
  EXPECT_EQ(tool.run(QStringList{u"number"_qs} + named, copy.path({})).code, 0);
  EXPECT_EQ(tool.run(QStringList{u"number"_qs, u"--check"_qs} + named, copy.path({})).code, 0);

  QFile::remove(copy.path(u"Loja/clsPedido.cls"_qs));
  const Result missing =
      tool.run({u"indent"_qs, u"--spaces"_qs, u"8"_qs, u"--check"_qs, u"Demo.vbg"_qs}, copy.path({}));
  EXPECT_EQ(missing.code, 5);
  EXPECT_TRUE(missing.err.endsWith(u"\n%1 files would change, 1 missing\n"_qs.arg(lines(missing.out).size())))
      << missing.err.toStdString();
  EXPECT_TRUE(tool.run({u"find"_qs, u"Sub"_qs, u"Demo.vbg"_qs}, copy.path({}))
                  .err.contains(QRegularExpression(u"\n\\d+ occurrences found, 1 missing\n$"_qs)));
}

TEST(Encoding, AUtf8ModuleIsNamedAndUtf8ReadsAndWritesItByteForByte) {
  const QByteArray utf8 = host::decodeAnsi(kCalculo).toUtf8();
  Workspace work(utf8);
  Tool tool;
  Result result = tool.run({u"find"_qs, u"preços"_qs, u"Calculo.bas"_qs}, work.dir.path());
  EXPECT_EQ(result.code, 1);
  EXPECT_TRUE(result.err.startsWith(u"quimbel: Calculo.bas: warning: this module is UTF-8"_qs))
      << result.err.toStdString();
  for (const QStringList& other : {QStringList{u"list"_qs}, QStringList{u"indent"_qs, u"--check"_qs}})
    EXPECT_EQ(tool.run(other + QStringList{u"Calculo.bas"_qs}, work.dir.path()).err.count(u"is UTF-8"_qs), 1)
        << other.join(u' ').toStdString();
  result =
      tool.run({u"find"_qs, u"--encoding"_qs, u"utf-8"_qs, u"preços"_qs, u"Calculo.bas"_qs}, work.dir.path());
  EXPECT_EQ(result.out, u"Calculo.bas:3:14: ' Cálculo de preços\n"_qs);
  EXPECT_EQ(result.err, u"1 occurrence found\n"_qs);
  // A byte that is not UTF-8 survives as well.
  const QByteArray mixed = QByteArray(utf8).replace("acr", "\xFF\xFE");
  writeBytes(work.file, mixed);
  for (const QString& command : {u"number"_qs, u"unnumber"_qs})
    EXPECT_EQ(tool.run({command, u"--encoding"_qs, u"utf-8"_qs, work.file}).err, QString());
  EXPECT_EQ(work.bytes(), mixed);
}

}  // namespace

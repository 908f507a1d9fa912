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
#include <QProcess>
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
};

// The tool with a settings directory of its own.
class Tool {
 public:
  Result run(const QStringList& arguments, const QString& directory = {}) {
    return runProgram(QStringLiteral(QUIMBEL_BINARY), arguments, directory);
  }

  /// Runs another program with the tool's environment.
  Result runProgram(const QString& program, const QStringList& arguments, const QString& directory = {}) {
    QProcess process;
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.insert(u"QUIMBEL_CONFIG_DIR"_qs, m_home.filePath(u"config"_qs));
    environment.insert(u"QUIMBEL_DATA_DIR"_qs, m_home.filePath(u"data"_qs));
    environment.insert(u"LC_ALL"_qs, u"C.UTF-8"_qs);
    process.setProcessEnvironment(environment);
    if (!directory.isEmpty()) process.setWorkingDirectory(directory);
    process.start(program, arguments);
    EXPECT_TRUE(process.waitForFinished(120000));
    return {process.exitStatus() == QProcess::NormalExit ? process.exitCode() : -1,
            QString::fromUtf8(process.readAllStandardOutput()),
            QString::fromUtf8(process.readAllStandardError())};
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

const QByteArray kCalculoNumbered =
    "Attribute VB_Name = \"Calculo\"\r\n"
    "Option Explicit\r\n"
    "' C\xE1lculo de pre\xE7os\r\n"
    "Public Function Preco(ByVal x As Currency) As Currency\r\n"
    "10     If x > 0 Then\r\n"
    "20         Preco = x * 1.1 ' acr\xE9scimo\r\n"
    "30      Else\r\n"
    "40         Preco = 0\r\n"
    "50     End If\r\n"
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
  const QList<QStringList> bad = {
      {},
      {u"renumber"_qs, work.file},
      {u"number"_qs},
      {u"number"_qs, u"--bogus"_qs, work.file},
      {u"number"_qs, u"--start"_qs, u"dez"_qs, work.file},
      {u"number"_qs, u"--start"_qs, u"-5"_qs, work.file},
      {u"number"_qs, u"--interval"_qs, u"0"_qs, work.file},
      {u"number"_qs, u"--start"_qs, u"99999999999"_qs, work.file},
      {u"number"_qs, u"--tabs"_qs, work.file},
      {u"indent"_qs, u"--spaces"_qs, u"0"_qs, work.file},
      {u"indent"_qs, u"--tabs"_qs, u"--spaces"_qs, u"2"_qs, work.file},
      {u"indent"_qs, u"--remove"_qs, work.file},
      {u"unnumber"_qs, u"--module"_qs, u"Calculo"_qs, u"--procedure"_qs, u"Calculo.Preco"_qs, work.file},
  };
  for (const QStringList& arguments : bad) {
    const Result result = tool.run(arguments);
    EXPECT_EQ(result.code, 2) << arguments.join(u' ').toStdString();
    EXPECT_TRUE(result.err.startsWith(u"quimbel: "_qs)) << result.err.toStdString();
  }
  EXPECT_EQ(work.bytes(), kCalculo);
}

TEST(CommandLine, AScopeThatNamesNothingIsAUsageError) {
  Workspace work;
  Tool tool;
  Result result = tool.run({u"number"_qs, u"--module"_qs, u"Nada"_qs, work.file});
  EXPECT_EQ(result.code, 2);
  EXPECT_TRUE(result.err.contains(u"no module 'Nada'"_qs)) << result.err.toStdString();
  result = tool.run({u"number"_qs, u"--procedure"_qs, u"Calculo.Nada"_qs, work.file});
  EXPECT_EQ(result.code, 2);
  EXPECT_TRUE(result.err.contains(u"no procedure 'Calculo.Nada'"_qs)) << result.err.toStdString();
  result = tool.run({u"number"_qs, u"--procedure"_qs, u"Preco"_qs, work.file});
  EXPECT_EQ(result.code, 2);
  EXPECT_TRUE(result.err.contains(u"MODULE.NAME"_qs)) << result.err.toStdString();
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
  // Numbering would take this line past the IDE's 1023 characters.
  const QByteArray longLine = "s = \"" + QByteArray(1015, 'a') + "\"";
  Workspace work(
      "Attribute VB_Name = \"Longo\"\r\nSub A()\r\nAttribute A.VB_Description = \"x\"\r\nx = 1\r\n" +
      longLine + "\r\nEnd Sub\r\n");
  const QByteArray before = work.bytes();
  Tool tool;
  const Result result = tool.run({u"number"_qs, work.file});
  EXPECT_EQ(result.code, 3);
  EXPECT_TRUE(result.err.contains(u"Calculo.bas, line 5: Longo, line 3: Line too long"_qs))
      << result.err.toStdString();
  EXPECT_TRUE(result.err.contains(u"nothing was written"_qs)) << result.err.toStdString();
  EXPECT_EQ(work.bytes(), before);
}

TEST(UnreadableInput, NumbersPastTheLargestStopTheRun) {
  Workspace work;
  Tool tool;
  const Result result =
      tool.run({u"number"_qs, u"--start"_qs, u"2147483647"_qs, u"--interval"_qs, u"1"_qs, work.file});
  EXPECT_EQ(result.code, 3);
  EXPECT_TRUE(result.err.contains(u"line numbers would pass 2147483647"_qs)) << result.err.toStdString();
  EXPECT_EQ(work.bytes(), kCalculo);
}

// ---------------------------------------------------------------------------------------------------
// Rewriting files

TEST(Rewriting, NumbersAModuleKeepingItsCodePageAndLineEnds) {
  Workspace work;
  Tool tool;
  const Result result =
      tool.run({u"number"_qs, u"--start"_qs, u"10"_qs, u"--interval"_qs, u"10"_qs, work.file});
  EXPECT_EQ(result.code, 0) << result.err.toStdString();
  EXPECT_TRUE(result.out.isEmpty());
  EXPECT_EQ(work.bytes(), kCalculoNumbered);

  // Numbering again changes nothing, and removing the numbers gives the module back byte for byte.
  EXPECT_EQ(
      tool.run({u"number"_qs, u"--start"_qs, u"10"_qs, u"--interval"_qs, u"10"_qs, u"--check"_qs, work.file})
          .code,
      0);
  EXPECT_EQ(tool.run({u"unnumber"_qs, work.file}).code, 0);
  EXPECT_EQ(work.bytes(), kCalculo);
}

TEST(Rewriting, LineFeedsAndAMissingLastLineEndStayAsTheyWere) {
  Workspace work("Attribute VB_Name = \"Lf\"\nSub A()\nx = 1\nEnd Sub");
  Tool tool;
  EXPECT_EQ(tool.run({u"indent"_qs, u"--tabs"_qs, work.file}).code, 0);
  EXPECT_EQ(work.bytes(), QByteArray("Attribute VB_Name = \"Lf\"\nSub A()\n\tx = 1\nEnd Sub"));
}

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
  EXPECT_EQ(tool.run({u"number"_qs, numbered.file}).code, 0);
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

TEST(Rewriting, RunningTwiceChangesNothingAndRemovingTheNumbersGivesTheCodeBack) {
  ExampleCopy copy;
  QTemporaryDir generated;
  const QString group =
      gen::generateProjects(generated.path(), {.codeLines = 20'000, .components = 16, .projects = 2})
          .groupFile;
  for (const auto& [file, directory] :
       {std::pair(copy.groupFile(), copy.path(QString())), std::pair(group, generated.path())}) {
    SCOPED_TRACE(file.toStdString());
    Tool tool;
    // The code without numbers of its own (the examples and the generator write some).
    ASSERT_EQ(tool.run({u"unnumber"_qs, file}).code, 0);
    const auto code = host::test::snapshot(directory);
    ASSERT_EQ(tool.run({u"number"_qs, file}).code, 0);
    EXPECT_NE(host::test::snapshot(directory), code);
    const Result again = tool.run({u"number"_qs, u"--check"_qs, file});
    EXPECT_EQ(again.code, 0) << again.out.toStdString();
    ASSERT_EQ(tool.run({u"unnumber"_qs, file}).code, 0);
    EXPECT_EQ(host::test::snapshot(directory), code);
    // Numbering and indenting a second time changes nothing either.
    const QStringList numIndent{u"numindent"_qs, u"--spaces"_qs, u"4"_qs, file};
    ASSERT_EQ(tool.run(numIndent).code, 0);
    const auto once = host::test::snapshot(directory);
    const Result unchanged = tool.run({u"numindent"_qs, u"--spaces"_qs, u"4"_qs, u"--check"_qs, file});
    EXPECT_EQ(unchanged.code, 0) << unchanged.out.toStdString();
    ASSERT_EQ(tool.run(numIndent).code, 0);
    EXPECT_EQ(host::test::snapshot(directory), once);
  }
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
  EXPECT_EQ(result.out, QStringLiteral("--- a/Calculo.bas\n"
                                       "+++ b/Calculo.bas\n"
                                       "@@ -2,9 +2,9 @@\n"
                                       " Option Explicit\n"
                                       " ' Cálculo de preços\n"
                                       " Public Function Preco(ByVal x As Currency) As Currency\n"
                                       "-    If x > 0 Then\n"
                                       "-        Preco = x * 1.1 ' acréscimo\n"
                                       "-    Else\n"
                                       "-        Preco = 0\n"
                                       "-    End If\n"
                                       "+10     If x > 0 Then\n"
                                       "+20         Preco = x * 1.1 ' acréscimo\n"
                                       "+30      Else\n"
                                       "+40         Preco = 0\n"
                                       "+50     End If\n"
                                       " End Function\n"));
  EXPECT_EQ(work.bytes(), kCalculo);
}

TEST(CheckAndDiff, DistantChangesMakeSeparateHunks) {
  QByteArray module = "Attribute VB_Name = \"Dois\"\r\nSub A()\r\nx = 1\r\nEnd Sub\r\n";
  for (int i = 1; i <= 8; ++i)
    module += "' " + QByteArray::number(i) + "\r\n";
  module += "Sub B()\r\n    y = 2\r\nz = 3\r\nEnd Sub";  // no line end after the last line
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

TEST(CheckAndDiff, GroupPathsAreShownFromTheCurrentDirectory) {
  ExampleCopy copy;
  Tool tool;
  const Result result = tool.run({u"indent"_qs, u"--tabs"_qs, u"--diff"_qs, u"--procedure"_qs,
                                  u"modApi.NomeDoUsuario"_qs, u"Demo.vbg"_qs},
                                 copy.path(QString()));
  EXPECT_EQ(result.code, 0) << result.err.toStdString();
  EXPECT_TRUE(result.out.startsWith(u"--- a/Utilitarios/modApi.bas\n+++ b/Utilitarios/modApi.bas\n@@ "_qs))
      << result.out.toStdString();
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
      {"list Pasta.bas", 3, "it is a directory"},
      {"number --check Pasta.bas", 3, "it is a directory"},
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
  transform::WalkContext context(u"test"_qs, nullptr, nullptr);
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
      EXPECT_EQ(result.err, u"Pesquisa completada ... %1 linhas localizadas\n"_qs.arg(expected.size()));
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
  EXPECT_EQ(result.err, u"Pesquisa completada ... 0 linhas localizadas\n"_qs);
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

}  // namespace

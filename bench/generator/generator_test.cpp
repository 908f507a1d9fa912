// SPDX-License-Identifier: MIT
// The synthetic project generator: determinism, exact size, bytes on disk, block structure, and the
// project and group files that tie the components together.
#include "generator.h"
#include "vbcheck.h"

#include <gtest/gtest.h>

#include <QDir>
#include <QDirIterator>
#include <QFile>
#include <QFileInfo>
#include <QRegularExpression>
#include <QSet>
#include <QTemporaryDir>

#include <map>
#include <stdexcept>

namespace {

using vbcheck::FileKind;

QByteArray readAll(const QString& path) {
  QFile file(path);
  if (!file.open(QIODevice::ReadOnly)) {
    ADD_FAILURE() << "cannot read " << path.toStdString();
    return {};
  }
  return file.readAll();
}

// Every file under `root`, by path relative to it.
std::map<QString, QByteArray> filesUnder(const QString& root) {
  std::map<QString, QByteArray> files;
  QDirIterator it(root, QDir::Files, QDirIterator::Subdirectories);
  while (it.hasNext()) {
    const QString path = it.next();
    files[QDir(root).relativeFilePath(path)] = readAll(path);
  }
  return files;
}

bool isSource(const QString& path, FileKind* kind = nullptr) {
  FileKind found;
  if (path.endsWith(".bas")) {
    found = FileKind::Module;
  } else if (path.endsWith(".cls")) {
    found = FileKind::Class;
  } else if (path.endsWith(".frm")) {
    found = FileKind::Form;
  } else {
    return false;
  }
  if (kind) *kind = found;
  return true;
}

// The code lines (what a code window shows) of a source file.
QStringList codeOf(const QString& path, const QByteArray& bytes) {
  FileKind kind;
  if (!isSource(path, &kind)) return {};
  const QStringList lines = vbcheck::decodeLines(bytes);
  const int header = vbcheck::headerLineCount(lines, kind);
  if (header < 0) {
    ADD_FAILURE() << path.toStdString() << ": malformed header";
    return {};
  }
  return lines.mid(header);
}

class GeneratorTest : public ::testing::Test {
 protected:
  gen::GeneratedGroup generate(const gen::GeneratorOptions& options, const QString& subdir = "out") {
    m_root = m_temp.filePath(subdir);
    return gen::generateProjects(m_root, options);
  }

  QTemporaryDir m_temp;
  QString m_root;
};

gen::GeneratorOptions options(qint64 lines, int components, int projects = 1, quint32 seed = 1) {
  return {.codeLines = lines, .components = components, .projects = projects, .seed = seed};
}

TEST_F(GeneratorTest, TheSeedAloneDecidesTheBytes) {
  generate(options(40'000, 30, 2, 42), "a");
  const auto first = filesUnder(m_root);
  generate(options(40'000, 30, 2, 42), "b");
  ASSERT_EQ(first.size(), 33u);  // 30 components, 2 projects, 1 group
  EXPECT_TRUE(first == filesUnder(m_root));
  generate(options(40'000, 30, 2, 43), "c");
  const auto other = filesUnder(m_root);
  int differing = 0;
  for (const auto& [path, bytes] : first) {
    const auto found = other.find(path);
    if (found == other.end() || found->second != bytes) ++differing;
  }
  EXPECT_GE(differing, 30);  // every component differs
}

// The stated tolerance is none: the code lines over all components equal the request exactly.
TEST_F(GeneratorTest, WritesExactlyTheRequestedCodeLines) {
  struct Case {
    qint64 lines;
    int components;
    int projects;
  };
  for (const Case c : {Case{1'000, 10, 1}, Case{57'123, 61, 2}, Case{250'001, 37, 3}, Case{400, 400, 4}}) {
    SCOPED_TRACE(QString("%1 lines, %2 components").arg(c.lines).arg(c.components).toStdString());
    const auto group = generate(options(c.lines, c.components, c.projects, 7), QString::number(c.lines));
    qint64 counted = 0;
    int sources = 0;
    for (const auto& [path, bytes] : filesUnder(m_root)) {
      if (!isSource(path)) continue;
      ++sources;
      const QStringList code = codeOf(path, bytes);
      EXPECT_GE(code.size(), 1) << path.toStdString();
      counted += code.size();
    }
    EXPECT_EQ(counted, c.lines);
    EXPECT_EQ(group.codeLines, c.lines);
    EXPECT_EQ(sources, c.components);
    EXPECT_EQ(group.components, c.components);
  }
}

TEST_F(GeneratorTest, FewerLinesThanComponentsGiveEachComponentOneLine) {
  const auto group = generate(options(3, 8));
  EXPECT_EQ(group.codeLines, 8);
  for (const auto& [path, bytes] : filesUnder(m_root)) {
    if (isSource(path)) {
      EXPECT_EQ(codeOf(path, bytes), QStringList{"Option Explicit"}) << path.toStdString();
    }
  }
}

// One mid-sized group: its bytes, its block structure, its procedure lengths and the shapes benchmarks need
// to meet.
TEST_F(GeneratorTest, CodeHasTheBytesStructureAndShapesOfRealProjects) {
  generate(options(300'000, 80, 2, 9));
  const std::vector<std::pair<QString, QRegularExpression>> shapes = {
      {"Declare", QRegularExpression(R"(^Private Declare (Function|Sub) \w+ Lib )")},
      {"continued Declare", QRegularExpression(R"(^Private Declare .* _$)")},
      {"#Const", QRegularExpression(R"(^#Const \w+ = )")},
      {"#If", QRegularExpression(R"(^\s*#If \w+ Then$)")},
      {"#Else", QRegularExpression(R"(^\s*#Else$)")},
      {"error handler", QRegularExpression(R"(^(\d+)?\s+On Error GoTo Erro$)")},
      {"label", QRegularExpression(R"(^Erro:$)")},
      {"numbered line", QRegularExpression(R"(^\d+ +\S)")},
      {"continued header", QRegularExpression(R"(^(Public|Private|Friend) (Sub|Function) \w+\(.*, _$)")},
      {"continued statement", QRegularExpression(R"(^\s+\w+ = ".*" & _$)")},
      {"comment", QRegularExpression(R"(^\s*' )")},
      {"blank", QRegularExpression(R"(^$)")},
      {"Select Case", QRegularExpression(R"(^\s+(\d+\s+)?Select Case )")},
      {"Case Else", QRegularExpression(R"(^\s+Case Else$)")},
      {"ElseIf", QRegularExpression(R"(^\s+ElseIf .* Then$)")},
      {"For", QRegularExpression(R"(^\s+(\d+\s+)?For \w+ = )")},
      {"For Each", QRegularExpression(R"(^\s+(\d+\s+)?For Each )")},
      {"Do loop", QRegularExpression(R"(^\s+Loop (Until|While) )")},
      {"With", QRegularExpression(R"(^\s+(\d+\s+)?With )")},
      {"Sub Main", QRegularExpression(R"(^Public Sub Main\(\)$)")},
      {"control array event", QRegularExpression(R"(^Private Sub cmdAcao_Click\(Index As Integer\)$)")},
  };
  std::map<QString, int> seen;
  std::map<QString, int> kinds;
  std::vector<int> lengths;
  int accented = 0;
  int deepest = 0;
  int forms = 0;
  for (const auto& [path, bytes] : filesUnder(m_root)) {
    SCOPED_TRACE(path.toStdString());
    EXPECT_EQ(vbcheck::lineEndProblem(bytes), QString());
    EXPECT_EQ(vbcheck::codePageProblem(bytes), QString());
    EXPECT_EQ(vbcheck::utf8Problem(bytes), QString());
    const QStringList lines = vbcheck::decodeLines(bytes);
    const QString text = lines.join('\n');
    if (text.contains(QChar(0xE7)) || text.contains(QChar(0xE3)) || text.contains(QChar(0xE9))) ++accented;
    if (!isSource(path)) continue;
    const QStringList code = codeOf(path, bytes);
    const vbcheck::Structure structure = vbcheck::checkStructure(code);
    EXPECT_EQ(structure.problems.join('\n'), QString());
    deepest = std::max(deepest, structure.maxBlockDepth);
    for (const vbcheck::Procedure& procedure : structure.procedures) {
      ++kinds[procedure.kind];
      int end = procedure.headerLine;
      while (end < code.size() && !code[end].startsWith("End "))
        ++end;
      lengths.push_back(end - procedure.headerLine + 1);
    }
    for (const QString& line : code)
      for (const auto& [name, pattern] : shapes)
        if (pattern.match(line).hasMatch()) ++seen[name];
    if (path.endsWith(".frm")) {
      ++forms;
      // A control array of three buttons, inside a description in VB's layout.
      EXPECT_EQ(lines.filter(QRegularExpression(R"(^   Begin VB\.CommandButton cmdAcao $)")).size(), 3);
      for (const char* index : {"0", "1", "2"})
        EXPECT_TRUE(lines.contains(QString("      Index           =   ") + index));
    }
  }
  EXPECT_GE(accented, 20);
  for (const char* kind : {"Sub", "Function", "Property Get", "Property Let", "Property Set"})
    EXPECT_GT(kinds[kind], 0) << kind;
  EXPECT_GE(deepest, 4);
  EXPECT_LE(deepest, 5);
  ASSERT_GT(lengths.size(), 1000u);
  std::sort(lengths.begin(), lengths.end());
  EXPECT_LE(lengths.front(), 5);
  EXPECT_GT(lengths.back(), 200);
  EXPECT_GE(lengths[lengths.size() / 2], 8);
  EXPECT_LE(lengths[lengths.size() / 2], 60);
  EXPECT_GT(forms, 0);
  for (const auto& [name, pattern] : shapes)
    EXPECT_GT(seen[name], 0) << name.toStdString();
}

TEST_F(GeneratorTest, ProjectFileListsEveryFileItWrote) {
  const auto group = generate(options(30'000, 100, 1, 4));
  ASSERT_EQ(group.projectFiles.size(), 1);
  EXPECT_TRUE(group.groupFile.isEmpty()) << "one project needs no group";
  EXPECT_TRUE(QDir(m_root).entryList({"*.vbg"}, QDir::Files).isEmpty());
  const QString vbp = group.projectFiles.first();
  ASSERT_TRUE(QFileInfo(vbp).isAbsolute());
  const QStringList lines = vbcheck::decodeLines(readAll(vbp));
  EXPECT_EQ(lines.value(0), "Type=Exe");
  EXPECT_EQ(vbcheck::keyValue(lines, "Name"), "\"Projeto1\"");

  const QString dir = QFileInfo(vbp).absolutePath();
  QSet<QString> listed;
  std::map<QString, int> kinds;
  for (const vbcheck::ProjectEntry& entry : vbcheck::projectEntries(lines)) {
    SCOPED_TRACE(entry.file.toStdString());
    const QString path = vbcheck::resolve(dir, entry.file);
    ASSERT_TRUE(QFileInfo::exists(path));
    EXPECT_FALSE(listed.contains(path)) << "listed twice";
    listed.insert(path);
    ++kinds[entry.kind];
    const QString name = vbcheck::vbName(vbcheck::decodeLines(readAll(path)));
    if (entry.kind == "Form") {
      EXPECT_EQ(name + ".frm", entry.file);
    } else {
      EXPECT_EQ(name, entry.name);
    }
  }
  QSet<QString> onDisk;
  for (const QFileInfo& info : QDir(dir).entryInfoList({"*.bas", "*.cls", "*.frm"}, QDir::Files)) {
    onDisk.insert(info.absoluteFilePath());
  }
  EXPECT_EQ(listed, onDisk);
  // 60% modules, 25% classes, 15% forms.
  EXPECT_EQ(kinds["Module"], 60);
  EXPECT_EQ(kinds["Class"], 25);
  EXPECT_EQ(kinds["Form"], 15);

  // Startup names Sub Main, and the first module has it.
  EXPECT_EQ(vbcheck::keyValue(lines, "Startup"), "\"Sub Main\"");
  const QString firstModule = vbcheck::resolve(dir, vbcheck::projectEntries(lines).front().file);
  EXPECT_TRUE(vbcheck::decodeLines(readAll(firstModule)).contains("Public Sub Main()"));
}

TEST_F(GeneratorTest, GroupFileListsEveryProject) {
  const auto group = generate(options(50'000, 31, 4, 8));
  ASSERT_FALSE(group.groupFile.isEmpty());
  ASSERT_EQ(group.projectFiles.size(), 4);
  const QStringList lines = vbcheck::decodeLines(readAll(group.groupFile));
  ASSERT_EQ(lines.size(), 5);
  EXPECT_EQ(lines[0], "VBGROUP 5.0");
  EXPECT_TRUE(lines[1].startsWith("StartupProject="));
  const QString dir = QFileInfo(group.groupFile).absolutePath();
  QStringList listed;
  for (const QString& line : lines.mid(1)) {
    const QString value = line.section('=', 1);
    EXPECT_TRUE(value.contains('\\')) << "VB writes backslashes: " << line.toStdString();
    listed << vbcheck::resolve(dir, value);
  }
  EXPECT_EQ(listed, group.projectFiles);
  int components = 0;
  for (const QString& vbp : group.projectFiles) {
    ASSERT_TRUE(QFileInfo::exists(vbp)) << vbp.toStdString();
    components += int(vbcheck::projectEntries(vbcheck::decodeLines(readAll(vbp))).size());
  }
  EXPECT_EQ(components, 31);
}

TEST_F(GeneratorTest, ImpossibleOptionsAreRejected) {
  EXPECT_THROW(generate(options(100, 2, 3)), std::invalid_argument);
  EXPECT_THROW(generate(options(100, 2, 0)), std::invalid_argument);
  EXPECT_THROW(generate(options(-1, 2, 1)), std::invalid_argument);
}

TEST_F(GeneratorTest, UnwritableDirectoryThrowsNamingThePath) {
  QFile blocker(m_temp.filePath("blocker"));
  ASSERT_TRUE(blocker.open(QIODevice::WriteOnly));
  blocker.close();
  const QString target = m_temp.filePath("blocker/out");
  try {
    gen::generateProjects(target, options(100, 2));
    FAIL() << "no exception";
  } catch (const std::runtime_error& error) {
    EXPECT_TRUE(QString(error.what()).contains(m_temp.filePath("blocker"))) << error.what();
  }
}

}  // namespace

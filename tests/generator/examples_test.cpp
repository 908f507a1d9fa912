// SPDX-License-Identifier: MIT
// The hand-written example group in examples/demo: its bytes are what VB6 writes, the project and group
// files name exactly the files that exist, the code is well formed, and the constructs that other tests
// rely on are still there.
#include "vbcheck.h"

#include <gtest/gtest.h>

#include <QDir>
#include <QDirIterator>
#include <QFile>
#include <QFileInfo>
#include <QRegularExpression>
#include <QSet>

#include <map>

namespace {

using vbcheck::FileKind;

const QString kDemoDir = QStringLiteral(QUIMBEL_SOURCE_DIR "/examples/demo");

QByteArray readAll(const QString& path) {
  QFile file(path);
  if (!file.open(QIODevice::ReadOnly)) {
    ADD_FAILURE() << "cannot read " << path.toStdString();
    return {};
  }
  return file.readAll();
}

QStringList linesOf(const QString& path) {
  return vbcheck::decodeLines(readAll(path));
}

QStringList allFiles() {
  QStringList files;
  QDirIterator it(kDemoDir, QDir::Files, QDirIterator::Subdirectories);
  while (it.hasNext())
    files << it.next();
  files.sort();
  return files;
}

FileKind kindOf(const QString& path) {
  if (path.endsWith(".cls")) return FileKind::Class;
  if (path.endsWith(".frm")) return FileKind::Form;
  return FileKind::Module;
}

bool isSource(const QString& path) {
  return path.endsWith(".bas") || path.endsWith(".cls") || path.endsWith(".frm");
}

QStringList codeOf(const QString& path) {
  const QStringList lines = linesOf(path);
  const int header = vbcheck::headerLineCount(lines, kindOf(path));
  if (header < 0) {
    ADD_FAILURE() << path.toStdString() << ": malformed header";
    return {};
  }
  return lines.mid(header);
}

QString demoFile(const QString& relative) {
  return kDemoDir + '/' + relative;
}

// The code of every source file, by path relative to the demo folder.
std::map<QString, QStringList> allCode() {
  std::map<QString, QStringList> code;
  for (const QString& path : allFiles()) {
    if (isSource(path)) code[QDir(kDemoDir).relativeFilePath(path)] = codeOf(path);
  }
  return code;
}

int countMatching(const QStringList& lines, const QString& pattern) {
  return int(lines.filter(QRegularExpression(pattern)).size());
}

TEST(ExamplesTest, EveryFileIsCrlfWindows1252) {
  const QStringList files = allFiles();
  ASSERT_GE(files.size(), 16);
  for (const QString& path : files) {
    SCOPED_TRACE(path.toStdString());
    const QByteArray bytes = readAll(path);
    EXPECT_EQ(vbcheck::lineEndProblem(bytes), QString());
    EXPECT_EQ(vbcheck::codePageProblem(bytes), QString());
    EXPECT_EQ(vbcheck::utf8Problem(bytes), QString());
  }
}

TEST(ExamplesTest, AccentedLettersAreWindows1252Bytes) {
  QByteArray everything;
  for (const QString& path : allFiles())
    everything += readAll(path);
  // ç ã é õ á ê as single Windows-1252 bytes.
  for (const char byte : {'\xE7', '\xE3', '\xE9', '\xF5', '\xE1', '\xEA'}) {
    EXPECT_TRUE(everything.contains(byte)) << "missing byte " << int(quint8(byte));
  }
}

TEST(ExamplesTest, GroupListsBothProjects) {
  const QStringList lines = linesOf(demoFile("Demo.vbg"));
  ASSERT_EQ(lines.size(), 3);
  EXPECT_EQ(lines[0], "VBGROUP 5.0");
  EXPECT_EQ(lines[1], "StartupProject=Loja\\Loja.vbp");
  EXPECT_EQ(lines[2], "Project=Utilitarios\\Utilitarios.vbp");
  for (const QString& line : lines.mid(1)) {
    EXPECT_TRUE(QFileInfo::exists(vbcheck::resolve(kDemoDir, line.section('=', 1)))) << line.toStdString();
  }
}

TEST(ExamplesTest, ProjectFilesListExactlyTheFilesBesideThem) {
  for (const QString& vbp : {demoFile("Loja/Loja.vbp"), demoFile("Utilitarios/Utilitarios.vbp")}) {
    SCOPED_TRACE(vbp.toStdString());
    const QStringList lines = linesOf(vbp);
    const QString dir = QFileInfo(vbp).absolutePath();
    QSet<QString> listed;
    for (const vbcheck::ProjectEntry& entry : vbcheck::projectEntries(lines)) {
      const QString path = vbcheck::resolve(dir, entry.file);
      ASSERT_TRUE(QFileInfo::exists(path)) << entry.file.toStdString();
      listed.insert(path);
      const QString name = vbcheck::vbName(linesOf(path));
      EXPECT_EQ(entry.kind == "Form" ? name + ".frm" : name, entry.kind == "Form" ? entry.file : entry.name);
    }
    QSet<QString> onDisk;
    for (const QFileInfo& info : QDir(dir).entryInfoList({"*.bas", "*.cls", "*.frm"}, QDir::Files)) {
      onDisk.insert(info.absoluteFilePath());
    }
    EXPECT_EQ(listed, onDisk);
    EXPECT_EQ(
        lines
            .filter(QRegularExpression(
                R"(^Reference=\*\\G\{00020430-0000-0000-C000-000000000046\}#2\.0#0#.*stdole2\.tlb#OLE Automation$)"))
            .size(),
        1);
    for (const char* key : {"Type", "Startup", "Name", "HelpContextID", "ExeName32", "Title", "MajorVer"}) {
      EXPECT_FALSE(vbcheck::keyValue(lines, key).isNull()) << key;
    }
  }
  EXPECT_EQ(vbcheck::keyValue(linesOf(demoFile("Loja/Loja.vbp")), "Type"), "Exe");
  const QStringList dll = linesOf(demoFile("Utilitarios/Utilitarios.vbp"));
  EXPECT_EQ(vbcheck::keyValue(dll, "Type"), "OleDll");
  EXPECT_TRUE(dll.contains("[MS Transaction Server]"));
}

TEST(ExamplesTest, EveryProcedureEndsAndEveryBlockCloses) {
  int procedures = 0;
  for (const auto& [path, code] : allCode()) {
    SCOPED_TRACE(path.toStdString());
    const vbcheck::Structure structure = vbcheck::checkStructure(code);
    EXPECT_EQ(structure.problems.join('\n'), QString());
    procedures += int(structure.procedures.size());
  }
  EXPECT_GT(procedures, 100);
}

TEST(ExamplesTest, SizeIsModerate) {
  int total = 0;
  for (const QString& path : allFiles())
    total += int(linesOf(path).size());
  EXPECT_GE(total, 1500);
  EXPECT_LE(total, 3000);
}

TEST(ExamplesTest, ClassesHaveTheRealHeaderAndMemberAttributes) {
  for (const auto& [path, code] : allCode()) {
    if (path.endsWith(".cls")) {
      const QStringList lines = linesOf(demoFile(path));
      EXPECT_EQ(lines.mid(0, 2), (QStringList{"VERSION 1.0 CLASS", "BEGIN"})) << path.toStdString();
      EXPECT_TRUE(lines.contains("  MultiUse = -1  'True")) << path.toStdString();
    }
  }
  const QStringList code = codeOf(demoFile("Loja/clsClientes.cls"));
  const int item = int(code.indexOf(QRegularExpression(R"(^Public Property Get Item\(.*)")));
  ASSERT_GE(item, 0);
  EXPECT_EQ(code.value(item + 1), "Attribute Item.VB_UserMemId = 0");
  const int newEnum =
      int(code.indexOf(QRegularExpression(R"(^Public Property Get NewEnum\(\) As IUnknown$)")));
  ASSERT_GE(newEnum, 0);
  EXPECT_EQ(code.value(newEnum + 1), "Attribute NewEnum.VB_UserMemId = -4");
  EXPECT_EQ(code.value(newEnum + 2), "Attribute NewEnum.VB_MemberFlags = \"40\"");
}

TEST(ExamplesTest, FormDescriptionsUseVbLayout) {
  static const QRegularExpression property(R"(^((?:   )+)(\w+) *=   (.*)$)");
  int forms = 0;
  for (const QString& path : allFiles()) {
    if (!path.endsWith(".frm")) continue;
    ++forms;
    SCOPED_TRACE(path.toStdString());
    const QStringList lines = linesOf(path);
    const int header = vbcheck::headerLineCount(lines, FileKind::Form);
    ASSERT_GT(header, 0);
    for (const QString& line : lines.mid(1, header - 1)) {
      const QString trimmed = line.trimmed();
      if (trimmed.startsWith("Attribute ") || trimmed == "End" || trimmed == "EndProperty") continue;
      if (trimmed.startsWith("Begin")) {
        EXPECT_TRUE(line.endsWith(' ')) << "no blank after the name: " << line.toStdString();
        continue;
      }
      const auto m = property.match(line);
      ASSERT_TRUE(m.hasMatch()) << line.toStdString();
      EXPECT_EQ(line.indexOf('='), m.capturedLength(1) + 16) << line.toStdString();
      const QString value = m.captured(3);
      if (value.endsWith("'True")) {
        EXPECT_EQ(value, "-1  'True");
      } else if (value.endsWith("'False")) {
        EXPECT_EQ(value, "0   'False");
      }
    }
  }
  EXPECT_EQ(forms, 3);
}

TEST(ExamplesTest, FormsHaveControlsArraysFramesAndMenus) {
  const QStringList cliente = linesOf(demoFile("Loja/frmCliente.frm"));
  for (const char* type :
       {"TextBox", "Label", "CommandButton", "ComboBox", "Frame", "CheckBox", "OptionButton"}) {
    EXPECT_GT(countMatching(cliente, QString(R"(^\s+Begin VB\.%1 \w+ $)").arg(type)), 0) << type;
  }
  // cmdAcao(0..2) is a control array.
  EXPECT_EQ(countMatching(cliente, R"(^   Begin VB\.CommandButton cmdAcao $)"), 3);
  // The option buttons sit inside the frame (one level deeper).
  EXPECT_EQ(countMatching(cliente, R"(^      Begin VB\.OptionButton optTipo $)"), 2);
  EXPECT_GT(countMatching(cliente, R"(^   BeginProperty Font $)"), 0);

  const QStringList principal = linesOf(demoFile("Loja/frmPrincipal.frm"));
  EXPECT_GT(countMatching(principal, R"(^\s+Begin VB\.ListBox \w+ $)"), 0);
  EXPECT_GT(countMatching(principal, R"(^   Begin VB\.Menu \w+ $)"), 0);
  EXPECT_GT(countMatching(principal, R"(^      Begin VB\.Menu \w+ $)"), 0);
  EXPECT_GT(countMatching(principal, R"(^         Begin VB\.Menu \w+ $)"), 0);
}

TEST(ExamplesTest, CodeHasTheConstructsTestsRelyOn) {
  std::map<QString, int> seen;
  const std::vector<std::pair<QString, QString>> constructs = {
      {"Public Declare Sub", R"(^Public Declare Sub \w+ Lib )"},
      {"Public Declare Function", R"(^Public Declare Function \w+ Lib )"},
      {"Private Declare Sub", R"(^Private Declare Sub \w+ Lib )"},
      {"Private Declare Function", R"(^Private Declare Function \w+ Lib )"},
      {"continued Declare", R"(^Private Declare Function .* _$)"},
      {"Property Let", R"(^Public Property Let )"},
      {"Property Set", R"(^Public Property Set )"},
      {"#If", R"(^#If \w+ Then$)"},
      {"#Else", R"(^#Else$)"},
      {"#Const", R"(^#Const \w+ = )"},
      {"Select Case", R"(^\s+Select Case )"},
      {"Case Else", R"(^\s+Case Else)"},
      {"ElseIf", R"(^\s+ElseIf .* Then$)"},
      {"single-line If", R"(^\s+If .* Then \S)"},
      {"For", R"(^\s+For \w+ = )"},
      {"For Each", R"(^\s+For Each )"},
      {"Do While", R"(^\s+Do While )"},
      {"Loop Until", R"(^\s+Loop Until )"},
      {"With", R"(^\s+With \w+)"},
      {"On Error GoTo", R"(^\s+(\d+\s+)?On Error GoTo Erro$)"},
      {"label", R"(^Erro:$)"},
      {"numbered line", R"(^\d+ +\S)"},
      {"continued statement", R"(^\s+\S.* _$)"},
      {"WithEvents", R"(^Private WithEvents \w+ As \w+$)"},
  };
  for (const auto& [path, code] : allCode()) {
    for (const QString& line : code) {
      for (const auto& [name, pattern] : constructs) {
        if (QRegularExpression(pattern).match(line).hasMatch()) ++seen[name];
      }
    }
  }
  for (const auto& [name, pattern] : constructs)
    EXPECT_GT(seen[name], 0) << name.toStdString();
}

TEST(ExamplesTest, HeadersContinuedOverTwoAndThreeLines) {
  std::map<int, int> byLength;
  for (const auto& [path, code] : allCode()) {
    for (const vbcheck::Procedure& procedure : vbcheck::checkStructure(code).procedures) {
      ++byLength[procedure.headerPhysicalLines];
    }
  }
  EXPECT_GT(byLength[2], 0);
  EXPECT_GT(byLength[3], 0);
}

// The extents rules need these shapes: a module without procedures, comments directly above procedures,
// a first procedure preceded by comments, and trailing blank and comment lines after the last one.
TEST(ExamplesTest, ModulesHaveTheShapesProcedureExtentsNeed) {
  const QStringList constants = codeOf(demoFile("Loja/modConstantes.bas"));
  EXPECT_TRUE(vbcheck::checkStructure(constants).procedures.empty());
  EXPECT_GT(constants.size(), 20);

  const QStringList persistence = codeOf(demoFile("Loja/modPersistencia.bas"));
  const auto procedures = vbcheck::checkStructure(persistence).procedures;
  ASSERT_FALSE(procedures.empty());
  const int firstHeader = procedures.front().headerLine;
  EXPECT_TRUE(persistence.value(firstHeader - 1).startsWith("'"));
  EXPECT_EQ(persistence.value(firstHeader - 2), "");
  EXPECT_TRUE(persistence.value(firstHeader - 3).startsWith("'"));

  const QStringList principal = codeOf(demoFile("Loja/modPrincipal.bas"));
  const int lastEnd = int(principal.lastIndexOf(QRegularExpression("^End (Sub|Function|Property)$")));
  ASSERT_GT(lastEnd, 0);
  const QStringList trailing = principal.mid(lastEnd + 1);
  EXPECT_TRUE(trailing.contains(""));
  EXPECT_GT(trailing.filter(QRegularExpression("^'")).size(), 0);
  EXPECT_EQ(trailing.filter(QRegularExpression(R"(^(?!'|$))")).size(), 0) << "only blanks and comments";

  // A #Const with its comment directly above a procedure header.
  const QStringList order = codeOf(demoFile("Loja/clsPedido.cls"));
  const int total = int(order.indexOf(QRegularExpression(R"(^Public Property Get Total\(.*)")));
  ASSERT_GT(total, 1);
  EXPECT_TRUE(order[total - 1].startsWith("#Const "));
  EXPECT_TRUE(order[total - 2].startsWith("'"));
}

}  // namespace

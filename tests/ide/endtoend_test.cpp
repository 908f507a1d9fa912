// SPDX-License-Identifier: MIT
// The program itself in script mode, as a user would run it: under Xvfb when it is installed (else on the
// offscreen platform), on a copy of the example group. The session opens the group, is refused a broken
// project, adds and types a module, uses the add-in's toolbar and popup menu (numbering, indentation, the
// extended find) when the add-in is built, and saves; the test then reads the files.
#include "testproject.h"

#include <gtest/gtest.h>

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QImage>
#include <QProcess>
#include <QRegularExpression>
#include <QStandardPaths>
#include <QTemporaryDir>

namespace {

using host::test::ExampleCopy;
using host::test::readBytes;
using host::test::writeBytes;

struct Session {
  int exitCode = -1;
  QString out;
  QString err;
  QString platform;
};

/// Runs quimbel-ide on a script with the given environment additions.
Session runIde(const QString& script, const QProcessEnvironment& extra, const QStringList& options) {
  QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
  for (const QString& key : extra.keys())
    environment.insert(key, extra.value(key));
  QString program = QStringLiteral(QUIMBEL_IDE_PROGRAM);
  QStringList arguments = options;
  arguments << u"--script"_qs << script;
  Session session;
  const QString xvfb = QStandardPaths::findExecutable(u"xvfb-run"_qs);
  if (!xvfb.isEmpty() && qEnvironmentVariable("QUIMBEL_E2E_PLATFORM") != QLatin1StringView("offscreen")) {
    arguments.prepend(program);
    arguments.prepend(u"-a"_qs);
    program = xvfb;
    environment.insert(u"QT_QPA_PLATFORM"_qs, u"xcb"_qs);
    session.platform = u"xcb (Xvfb)"_qs;
  } else {
    environment.insert(u"QT_QPA_PLATFORM"_qs, u"offscreen"_qs);
    session.platform = u"offscreen"_qs;
  }
  QProcess process;
  process.setProcessEnvironment(environment);
  process.start(program, arguments);
  if (!process.waitForFinished(180000)) {
    process.kill();
    process.waitForFinished();
  }
  session.exitCode = process.exitStatus() == QProcess::NormalExit ? process.exitCode() : -1;
  session.out = QString::fromUtf8(process.readAllStandardOutput());
  session.err = QString::fromUtf8(process.readAllStandardError());
  return session;
}

bool hasAddIn() {
#ifdef QUIMBEL_ADDIN_LIBRARY
  return QFileInfo::exists(QStringLiteral(QUIMBEL_ADDIN_LIBRARY));
#else
  return false;
#endif
}

TEST(EndToEnd, AMessageBoxTheAddInShowsAtStartUpIsTheScriptsToAnswer) {
#ifdef QUIMBEL_ADDIN_LIBRARY
  // A database the add-in cannot use: it says so in a box as it starts.
  QTemporaryDir work;
  QDir(work.path()).mkpath(u"install/help"_qs);
  writeBytes(work.filePath(u"install/Quimbel.inf"_qs), "não é um banco de dados");
  writeBytes(work.filePath(u"quimbel.conf"_qs), "InstallationPath=" + work.filePath(u"install"_qs).toUtf8());
  QProcessEnvironment environment;
  environment.insert(u"QUIMBEL_CONFIG_DIR"_qs, work.filePath(u"config"_qs));
  environment.insert(u"QUIMBEL_DATA_DIR"_qs, work.filePath(u"data"_qs));
  environment.insert(u"QUIMBEL_MACHINE_CONFIG"_qs, work.filePath(u"quimbel.conf"_qs));
  const struct {
    const char* script;
    int exitCode;
    const char* told;
  } kCases[] = {
      {"answer OK\nexpect message \"banco de dados\"\n", 0, ""},
      {"echo sem resposta\n", 1, "a message box is open: Quimbel: Não foi possível abrir o banco de dados"},
  };
  for (const auto& c : kCases) {
    writeBytes(work.filePath(u"s.qis"_qs), c.script);
    const Session session = runIde(work.filePath(u"s.qis"_qs), environment,
                                   {u"--addin"_qs, QStringLiteral(QUIMBEL_ADDIN_LIBRARY)});
    EXPECT_EQ(session.exitCode, c.exitCode) << c.script << session.err.toStdString();
    EXPECT_TRUE(session.out.contains(u"msgbox: Quimbel: Não foi possível abrir o banco de dados"_qs))
        << session.out.toStdString();
    EXPECT_TRUE(session.err.contains(QString::fromUtf8(c.told))) << session.err.toStdString();
  }
#else
  GTEST_SKIP() << "the add-in is not built";
#endif
}

TEST(EndToEnd, AScriptedSessionWorksOnTheExampleGroupAndSavesIt) {
  ExampleCopy copy;
  QTemporaryDir work;
  const auto before = copy.snapshot();
  writeBytes(copy.path(u"Broken.vbp"_qs), "Type=Exe\r\nName=\"Broken\"\r\nForm=\r\n");

  QString script = QStringLiteral(
      "# The example group, a broken project, a new module typed in, saved.\n"
      "open \"${DEMO}/Demo.vbg\"\n"
      "expect projects 2\n"
      "answer OK\n"
      "open \"${DEMO}/Broken.vbp\"\n"
      "expect message \"line 3\"\n"
      "expect projects 2\n"
      "select Loja.modPrincipal\n"
      "click \"Menu Bar\" Project \"Add Module\"\n"
      "type \"Public Function Dobro(ByVal n As Long) As Long\\n    Dobro = n * 2\\nEnd Function\"\n"
      "expect line 3 \"End Function\"\n"
      "screenshot \"${OUT}/typed.png\"\n");
  if (hasAddIn())
    script += QStringLiteral(
        "# The add-in's toolbar numbers the module, its popup menu indents it.\n"
        "code Loja.modPrincipal\n"
        "click \"Quimbel 2.2\" \"Numerar Linhas\"\n"
        "wait dialog\n"
        "set opNumbers1 true\n"
        "set txtInitial 100\n"
        "set txtInterval 10\n"
        "screenshot dialog \"${OUT}/numbering.png\"\n"
        "press cmdAdd\n"
        "wait closed\n"
        "click \"Menu Bar\" Quimbel \"Indentar Código\"\n"
        "wait dialog\n"
        "set opIndent1 true\n"
        "press cmdIndent\n"
        "wait closed\n"
        "# A macro written in its editor, then its key pressed in the code window.\n"
        "click \"Menu Bar\" Quimbel \"Definir Macros de Teclado\"\n"
        "wait dialog\n"
        "set lstMacros Ctrl+Alt+D\n"
        "set txtTexto \"' {ModuleName}: {C}\\n\"\n"
        "press Save\n"
        "key Escape\n"
        "wait closed\n"
        "caret 1 1\n"
        "wait 300\n"
        "key Ctrl+Alt+D\n"
        "type Revisado\n"
        "expect line 1 \"' modPrincipal: Revisado\"\n"

        "# Its extended find lists the new module's lines too, and opens the code window at one of them.\n"
        "click \"Menu Bar\" Quimbel \"Localizar Estendido\"\n"
        "wait dialog\n"
        "set txtSearch Dobro\n"
        "press cmdFind\n"
        "wait 300\n"
        "screenshot dialog \"${OUT}/find.png\"\n"
        "doubleclick lvList \"Dobro = n * 2\"\n"
        "expect line 2 \"    Dobro = n * 2\"\n"
        "press cmdClose\n");
  else
    script += u"expect no-control \"Menu Bar\" Quimbel\n"_qs;
  script += QStringLiteral(
      "save\n"
      "screenshot main \"${OUT}/saved.png\"\n");
  const QString scriptPath = work.filePath(u"session.qis"_qs);
  writeBytes(scriptPath, script.toUtf8());

  QProcessEnvironment environment;
  environment.insert(u"DEMO"_qs, QDir(copy.path(u"."_qs)).absolutePath());
  environment.insert(u"OUT"_qs, work.filePath(u"shots"_qs));
  environment.insert(u"QUIMBEL_CONFIG_DIR"_qs, work.filePath(u"config"_qs));
  environment.insert(u"QUIMBEL_DATA_DIR"_qs, work.filePath(u"data"_qs));
  QStringList options;
  if (hasAddIn()) {
#ifdef QUIMBEL_ADDIN_LIBRARY
    QDir(work.path()).mkpath(u"install/help"_qs);
    writeBytes(work.filePath(u"quimbel.conf"_qs),
               "InstallationPath=" + work.filePath(u"install"_qs).toUtf8() + "\n");
    environment.insert(u"QUIMBEL_MACHINE_CONFIG"_qs, work.filePath(u"quimbel.conf"_qs));
    options << u"--addin"_qs << QStringLiteral(QUIMBEL_ADDIN_LIBRARY);
#endif
  } else {
    options << u"--no-addin"_qs;
  }
  const Session session = runIde(scriptPath, environment, options);
  ASSERT_EQ(session.exitCode, 0) << "platform " << session.platform.toStdString() << "\nstdout:\n"
                                 << session.out.toStdString() << "\nstderr:\n"
                                 << session.err.toStdString();

  // The refused project was told once, with its file and line, and nothing else was.
  const QStringList boxes = session.out.split(u'\n').filter(u"msgbox: "_qs);
  ASSERT_EQ(boxes.size(), 1) << session.out.toStdString();
  EXPECT_TRUE(boxes.front().contains(u"Broken.vbp"_qs)) << boxes.front().toStdString();
  EXPECT_TRUE(boxes.front().contains(u"line 3"_qs)) << boxes.front().toStdString();

  // The new module and its entry in the project.
  EXPECT_EQ(
      readBytes(copy.path(u"Loja/Module1.bas"_qs)),
      QByteArray("Attribute VB_Name = \"Module1\"\r\n"
                 "Public Function Dobro(ByVal n As Long) As Long\r\n    Dobro = n * 2\r\nEnd Function\r\n"));
  EXPECT_TRUE(readBytes(copy.path(u"Loja/Loja.vbp"_qs)).contains("Module=Module1; Module1.bas\r\n"));

  const auto after = copy.snapshot();
  QStringList changed;
  for (auto it = before.cbegin(); it != before.cend(); ++it)
    if (after.value(it.key()) != it.value()) changed << it.key();
  if (hasAddIn()) {
    // The add-in gave each project its identifier module, saved with it.
    EXPECT_EQ(changed, (QStringList{u"Loja/Loja.vbp"_qs, u"Loja/modPrincipal.bas"_qs,
                                    u"Utilitarios/Utilitarios.vbp"_qs}));
    EXPECT_TRUE(after.contains(u"Loja/basQMInf000001.bas"_qs));
    EXPECT_TRUE(after.contains(u"Utilitarios/basQMInf000002.bas"_qs));
    const QStringList lines = QString::fromLatin1(after.value(u"Loja/modPrincipal.bas"_qs)).split(u"\r\n"_qs);
    // Indenting renumbers too (numbering and indenting run as one command by default), from 10000 in steps
    // of 5, and indents with tabs.
    EXPECT_FALSE(lines.filter(QRegularExpression(u"^10000 \\t\\S"_qs)).isEmpty());
    EXPECT_FALSE(lines.filter(QRegularExpression(u"^10005 \\t\\S"_qs)).isEmpty());
    EXPECT_EQ(lines[1], u"' modPrincipal: Revisado"_qs);
    EXPECT_TRUE(QFileInfo::exists(work.filePath(u"shots/numbering.png"_qs)));
    EXPECT_TRUE(QFileInfo::exists(work.filePath(u"shots/find.png"_qs)));
  } else {
    EXPECT_EQ(changed, QStringList{u"Loja/Loja.vbp"_qs});
  }
  for (const char* shot : {"shots/typed.png", "shots/saved.png"}) {
    const QImage image(work.filePath(QLatin1StringView(shot)));
    EXPECT_GE(image.width(), 1000) << shot;
    EXPECT_GE(image.height(), 600) << shot;
  }
}

TEST(EndToEnd, WithoutItsAddInTheIdeStartsAndSaysSo) {
  QTemporaryDir work;
  const QString scriptPath = work.filePath(u"noaddin.qis"_qs);
  writeBytes(scriptPath,
             "expect status \"add-in was not found at /nonexistent/libquimbel-addin.so\"\n"
             "expect no-control \"Menu Bar\" Quimbel\n"
             "expect control \"Menu Bar\" \"Add-Ins\" \"Add-In Manager...\"\n");
  QProcessEnvironment environment;
  environment.insert(u"QUIMBEL_CONFIG_DIR"_qs, work.filePath(u"config"_qs));
  const Session session =
      runIde(scriptPath, environment, {u"--addin"_qs, u"/nonexistent/libquimbel-addin.so"_qs});
  EXPECT_EQ(session.exitCode, 0) << session.err.toStdString();
  EXPECT_FALSE(session.out.contains(u"msgbox:"_qs)) << "said in the status bar, not in a box";
}

TEST(EndToEnd, AScriptMistakeIsReportedWithItsLineBeforeAnythingRuns) {
  QTemporaryDir work;
  const QString scriptPath = work.filePath(u"bad.qis"_qs);
  writeBytes(scriptPath, "open x.vbp\npress\n");
  const Session session = runIde(scriptPath, {}, {u"--no-addin"_qs});
  EXPECT_EQ(session.exitCode, 2);
  EXPECT_TRUE(session.err.contains(scriptPath + u":2: \"press\" takes 1 argument, not 0"_qs))
      << session.err.toStdString();
}

/// The environment of a session with the add-in on the example copy: settings, data and installation in
/// `work`.
QProcessEnvironment addInEnvironment(ExampleCopy& copy, QTemporaryDir& work) {
  QProcessEnvironment environment;
  environment.insert(u"DEMO"_qs, QDir(copy.path(u"."_qs)).absolutePath());
  environment.insert(u"QUIMBEL_CONFIG_DIR"_qs, work.filePath(u"config"_qs));
  environment.insert(u"QUIMBEL_DATA_DIR"_qs, work.filePath(u"data"_qs));
  environment.insert(u"TMPDIR"_qs, work.path());
  QDir(work.path()).mkpath(u"install"_qs);
  writeBytes(work.filePath(u"quimbel.conf"_qs),
             "InstallationPath=" + work.filePath(u"install"_qs).toUtf8() + "\n");
  environment.insert(u"QUIMBEL_MACHINE_CONFIG"_qs, work.filePath(u"quimbel.conf"_qs));
  return environment;
}

TEST(EndToEnd, AFormDesignedWithTheAddInGetsItsPropertiesAndProceduresSaved) {
  if (!hasAddIn()) GTEST_SKIP() << "the add-in is not built";
  ExampleCopy copy;
  QTemporaryDir work;
  const QString script = work.filePath(u"design.qis"_qs);
  // A new form, a text box from the toolbox with its property dialog, a label, a rename in the properties
  // window (carried into the code once the option is on).
  writeBytes(script,
             "open \"${DEMO}/Loja/Loja.vbp\"\n"
             "click \"Menu Bar\" Quimbel Op\xc3\xa7\xc3\xb5"
             "es\n"
             "set ckControlRenamed true\n"
             "press cmdOK\n"
             "wait closed\n"
             "click \"Menu Bar\" Project \"Add Form\"\n"
             "expect property StartUpPosition \"2 - CenterScreen\"\n"
             "tool TextBox\n"
             "wait dialog\n"
             "set txtValor0 txtNome\n"
             "set txtValor3 30\n"
             "set ckBackColor true\n"
             "set txtCor &HC0FFFF&\n"
             "press cmdOK\n"
             "wait closed\n"
             "expect property MaxLength 30\n"
             "expect property Text \"\"\n"
             "tool Label\n"
             "wait dialog\n"
             "key Escape\n"
             "wait closed\n"
             "expect property BackStyle \"0 - Transparent\"\n"
             "control txtNome\n"
             "property Name txtCliente\n"
             "save\n");
  const Session run =
      runIde(script, addInEnvironment(copy, work), {u"--addin"_qs, QStringLiteral(QUIMBEL_ADDIN_LIBRARY)});
  ASSERT_EQ(run.exitCode, 0) << run.out.toStdString() << run.err.toStdString();
  const QString form = QString::fromLatin1(readBytes(copy.path(u"Loja/Form1.frm"_qs)));
  for (const char* line :
       {"   BorderStyle     =   1  'Fixed Single\r\n", "   StartUpPosition =   2  'CenterScreen\r\n",
        "   Begin VB.TextBox txtCliente \r\n", "      MaxLength       =   30\r\n",
        "      Text            =   \"\"\r\n", "      BackStyle       =   0  'Transparent\r\n",
        "Private Sub txtCliente_GotFocus()\r\n   On Error Resume Next\r\n   txtCliente.BackColor = "
        "&HC0FFFF&\r\n"
        "   txtCliente.SelStart = 0\r\n   txtCliente.SelLength = Len(txtCliente.Text)\r\nEnd Sub\r\n"
        "Private Sub txtCliente_LostFocus()\r\n   txtCliente.BackColor = &H80000005&\r\nEnd Sub\r\n"
        "Private Sub txtCliente_KeyPress(KeyAscii As Integer)\r\n"})
    EXPECT_TRUE(form.contains(QString::fromLatin1(line))) << line << "\n" << form.toStdString();
  EXPECT_FALSE(form.contains(u"txtNome"_qs));
  EXPECT_FALSE(form.contains(u"ToolTipText"_qs)) << "the dialog wrote only what changed";
}

}  // namespace

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
  arguments << QStringLiteral("--script") << script;
  Session session;
  const QString xvfb = QStandardPaths::findExecutable(QStringLiteral("xvfb-run"));
  if (!xvfb.isEmpty() && qEnvironmentVariable("QUIMBEL_E2E_PLATFORM") != QLatin1StringView("offscreen")) {
    arguments.prepend(program);
    arguments.prepend(QStringLiteral("-a"));
    program = xvfb;
    environment.insert(QStringLiteral("QT_QPA_PLATFORM"), QStringLiteral("xcb"));
    session.platform = QStringLiteral("xcb (Xvfb)");
  } else {
    environment.insert(QStringLiteral("QT_QPA_PLATFORM"), QStringLiteral("offscreen"));
    session.platform = QStringLiteral("offscreen");
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

TEST(EndToEnd, AScriptedSessionWorksOnTheExampleGroupAndSavesIt) {
  ExampleCopy copy;
  QTemporaryDir work;
  const auto before = copy.snapshot();
  writeBytes(copy.path(QStringLiteral("Broken.vbp")), "Type=Exe\r\nName=\"Broken\"\r\nForm=\r\n");

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
    script += QStringLiteral("expect no-control \"Menu Bar\" Quimbel\n");
  script += QStringLiteral(
      "save\n"
      "screenshot main \"${OUT}/saved.png\"\n");
  const QString scriptPath = work.filePath(QStringLiteral("session.qis"));
  writeBytes(scriptPath, script.toUtf8());

  QProcessEnvironment environment;
  environment.insert(QStringLiteral("DEMO"), QDir(copy.path(QStringLiteral("."))).absolutePath());
  environment.insert(QStringLiteral("OUT"), work.filePath(QStringLiteral("shots")));
  environment.insert(QStringLiteral("QUIMBEL_CONFIG_DIR"), work.filePath(QStringLiteral("config")));
  environment.insert(QStringLiteral("QUIMBEL_DATA_DIR"), work.filePath(QStringLiteral("data")));
  QStringList options;
  if (hasAddIn()) {
#ifdef QUIMBEL_ADDIN_LIBRARY
    QDir(work.path()).mkpath(QStringLiteral("install/help"));
    writeBytes(work.filePath(QStringLiteral("quimbel.conf")),
               "InstallationPath=" + work.filePath(QStringLiteral("install")).toUtf8() + "\n");
    environment.insert(QStringLiteral("QUIMBEL_MACHINE_CONFIG"),
                       work.filePath(QStringLiteral("quimbel.conf")));
    options << QStringLiteral("--addin") << QStringLiteral(QUIMBEL_ADDIN_LIBRARY);
#endif
  } else {
    options << QStringLiteral("--no-addin");
  }
  const Session session = runIde(scriptPath, environment, options);
  ASSERT_EQ(session.exitCode, 0) << "platform " << session.platform.toStdString() << "\nstdout:\n"
                                 << session.out.toStdString() << "\nstderr:\n"
                                 << session.err.toStdString();

  // The refused project was told once, with its file and line, and nothing else was.
  const QStringList boxes = session.out.split(u'\n').filter(QStringLiteral("msgbox: "));
  ASSERT_EQ(boxes.size(), 1) << session.out.toStdString();
  EXPECT_TRUE(boxes.front().contains(QStringLiteral("Broken.vbp"))) << boxes.front().toStdString();
  EXPECT_TRUE(boxes.front().contains(QStringLiteral("line 3"))) << boxes.front().toStdString();

  // The new module and its entry in the project.
  EXPECT_EQ(
      readBytes(copy.path(QStringLiteral("Loja/Module1.bas"))),
      QByteArray("Attribute VB_Name = \"Module1\"\r\n"
                 "Public Function Dobro(ByVal n As Long) As Long\r\n    Dobro = n * 2\r\nEnd Function\r\n"));
  EXPECT_TRUE(
      readBytes(copy.path(QStringLiteral("Loja/Loja.vbp"))).contains("Module=Module1; Module1.bas\r\n"));

  const auto after = copy.snapshot();
  QStringList changed;
  for (auto it = before.cbegin(); it != before.cend(); ++it)
    if (after.value(it.key()) != it.value()) changed << it.key();
  if (hasAddIn()) {
    // The add-in gave each project its identifier module, saved with it.
    EXPECT_EQ(changed, (QStringList{QStringLiteral("Loja/Loja.vbp"), QStringLiteral("Loja/modPrincipal.bas"),
                                    QStringLiteral("Utilitarios/Utilitarios.vbp")}));
    EXPECT_TRUE(after.contains(QStringLiteral("Loja/basQMInf000001.bas")));
    EXPECT_TRUE(after.contains(QStringLiteral("Utilitarios/basQMInf000002.bas")));
    const QStringList lines = QString::fromLatin1(after.value(QStringLiteral("Loja/modPrincipal.bas")))
                                  .split(QStringLiteral("\r\n"));
    // Indenting renumbers too (numbering and indenting run as one command by default), from 10000 in steps
    // of 5, and indents with tabs.
    EXPECT_FALSE(lines.filter(QRegularExpression(QStringLiteral("^10000 \\t\\S"))).isEmpty());
    EXPECT_FALSE(lines.filter(QRegularExpression(QStringLiteral("^10005 \\t\\S"))).isEmpty());
    EXPECT_EQ(lines[1], QStringLiteral("' modPrincipal: Revisado"));
    EXPECT_TRUE(QFileInfo::exists(work.filePath(QStringLiteral("shots/numbering.png"))));
    EXPECT_TRUE(QFileInfo::exists(work.filePath(QStringLiteral("shots/find.png"))));
  } else {
    EXPECT_EQ(changed, QStringList{QStringLiteral("Loja/Loja.vbp")});
  }
  for (const char* shot : {"shots/typed.png", "shots/saved.png"}) {
    const QImage image(work.filePath(QLatin1StringView(shot)));
    EXPECT_GE(image.width(), 1000) << shot;
    EXPECT_GE(image.height(), 600) << shot;
  }
}

TEST(EndToEnd, WithoutItsAddInTheIdeStartsAndSaysSo) {
  QTemporaryDir work;
  const QString scriptPath = work.filePath(QStringLiteral("noaddin.qis"));
  writeBytes(scriptPath,
             "expect status \"add-in was not found at /nonexistent/libquimbel-addin.so\"\n"
             "expect no-control \"Menu Bar\" Quimbel\n"
             "expect control \"Menu Bar\" \"Add-Ins\" \"Add-In Manager...\"\n");
  QProcessEnvironment environment;
  environment.insert(QStringLiteral("QUIMBEL_CONFIG_DIR"), work.filePath(QStringLiteral("config")));
  const Session session =
      runIde(scriptPath, environment,
             {QStringLiteral("--addin"), QStringLiteral("/nonexistent/libquimbel-addin.so")});
  EXPECT_EQ(session.exitCode, 0) << session.err.toStdString();
  EXPECT_FALSE(session.out.contains(QStringLiteral("msgbox:"))) << "said in the status bar, not in a box";
}

TEST(EndToEnd, AScriptMistakeIsReportedWithItsLineBeforeAnythingRuns) {
  QTemporaryDir work;
  const QString scriptPath = work.filePath(QStringLiteral("bad.qis"));
  writeBytes(scriptPath, "open x.vbp\npress\n");
  const Session session = runIde(scriptPath, {}, {QStringLiteral("--no-addin")});
  EXPECT_EQ(session.exitCode, 2);
  EXPECT_TRUE(session.err.contains(scriptPath + QStringLiteral(":2: \"press\" takes 1 argument, not 0")))
      << session.err.toStdString();
}

/// The environment of a session with the add-in on the example copy: settings, data and installation in
/// `work`.
QProcessEnvironment addInEnvironment(ExampleCopy& copy, QTemporaryDir& work) {
  QProcessEnvironment environment;
  environment.insert(QStringLiteral("DEMO"), QDir(copy.path(QStringLiteral("."))).absolutePath());
  environment.insert(QStringLiteral("QUIMBEL_CONFIG_DIR"), work.filePath(QStringLiteral("config")));
  environment.insert(QStringLiteral("QUIMBEL_DATA_DIR"), work.filePath(QStringLiteral("data")));
  environment.insert(QStringLiteral("TMPDIR"), work.path());
  QDir(work.path()).mkpath(QStringLiteral("install"));
  writeBytes(work.filePath(QStringLiteral("quimbel.conf")),
             "InstallationPath=" + work.filePath(QStringLiteral("install")).toUtf8() + "\n");
  environment.insert(QStringLiteral("QUIMBEL_MACHINE_CONFIG"), work.filePath(QStringLiteral("quimbel.conf")));
  return environment;
}

TEST(EndToEnd, TasksAndFavouritesLastFromOneSessionToTheNextAndFollowASaveAs) {
  if (!hasAddIn()) GTEST_SKIP() << "the add-in is not built";
  ExampleCopy copy;
  QTemporaryDir work;
  const QProcessEnvironment environment = addInEnvironment(copy, work);
  auto session = [&](const QByteArray& script) {
    const QString path = work.filePath(QStringLiteral("session.qis"));
    writeBytes(path, script);
    const Session run =
        runIde(path, environment, {QStringLiteral("--addin"), QStringLiteral(QUIMBEL_ADDIN_LIBRARY)});
    EXPECT_EQ(run.exitCode, 0) << run.out.toStdString() << run.err.toStdString();
    return run;
  };
  // A task and a favourite; the project closed (and saved) and opened again; the favourite opened.
  session(
      "open \"${DEMO}/Loja/Loja.vbp\"\n"
      "click \"Quimbel 2.2\" \"Lista de Tarefas\"\n"
      "press cmdAdd\n"
      "set txtName \"Conferir o frete (urgente)\"\n"
      "press cmdOK\n"
      "press cmdClose\n"
      "wait closed\n"
      "code Loja.modPrincipal\n"
      "caret 31 1\n"
      "wait 300\n"
      "click \"Code Window\" \"Adicionar aos Favoritos\"\n"
      "answer Yes\n"
      "click \"Menu Bar\" File \"Remove Project\"\n"
      "expect projects 0\n"
      "open \"${DEMO}/Loja/Loja.vbp\"\n"
      "click \"Quimbel 2.2\" Favoritos\n"
      "set lvFavorites Main\n"
      "key Return\n"
      "wait closed\n"
      "saveas \"${DEMO}/Copia/Loja.vbp\"\n");
  EXPECT_TRUE(QFileInfo::exists(copy.path(QStringLiteral("Copia/qm000001.qmi"))));
  EXPECT_FALSE(QFileInfo::exists(copy.path(QStringLiteral("Loja/qm000001.qmi"))));
  // The next session, and the command-line tool, find both beside the saved copy.
  session(
      "open \"${DEMO}/Copia/Loja.vbp\"\n"
      "click \"Quimbel 2.2\" \"Lista de Tarefas\"\n"
      "set lvTasks \"Conferir o frete (urgente)\"\n"
      "press cmdClose\n"
      "wait closed\n"
      "click \"Quimbel 2.2\" Favoritos\n"
      "set lvFavorites Main\n"
      "key Escape\n");
  QProcess tool;
  tool.start(QStringLiteral(QUIMBEL_BINARY),
             {QStringLiteral("tasks"), copy.path(QStringLiteral("Copia/Loja.vbp"))});
  ASSERT_TRUE(tool.waitForFinished(60000));
  EXPECT_TRUE(QString::fromUtf8(tool.readAllStandardOutput())
                  .contains(QStringLiteral("[ ]  Conferir o frete (urgente)")));
}

TEST(EndToEnd, AFormDesignedWithTheAddInGetsItsPropertiesAndProceduresSaved) {
  if (!hasAddIn()) GTEST_SKIP() << "the add-in is not built";
  ExampleCopy copy;
  QTemporaryDir work;
  const QString script = work.filePath(QStringLiteral("design.qis"));
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
  const Session run = runIde(script, addInEnvironment(copy, work),
                             {QStringLiteral("--addin"), QStringLiteral(QUIMBEL_ADDIN_LIBRARY)});
  ASSERT_EQ(run.exitCode, 0) << run.out.toStdString() << run.err.toStdString();
  const QString form = QString::fromLatin1(readBytes(copy.path(QStringLiteral("Loja/Form1.frm"))));
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
  EXPECT_FALSE(form.contains(QStringLiteral("txtNome")));
  EXPECT_FALSE(form.contains(QStringLiteral("ToolTipText"))) << "the dialog wrote only what changed";
}

}  // namespace

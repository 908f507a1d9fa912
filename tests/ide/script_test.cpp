// SPDX-License-Identifier: MIT
// Script mode inside the test process: the language is checked before anything runs (with the script line
// in every error), and a running script drives the IDE, dialogs included.
#include "codebinding.h"
#include "codewindow.h"
#include "host/model/addins.h"
#include "idefixture.h"
#include "scriptrunner.h"
#include "windowmanager.h"

#include <gtest/gtest.h>

#include <QFileInfo>
#include <QImage>
#include <QTemporaryDir>

namespace desktop {
namespace {

using test::waitFor;

class ScriptTest : public test::IdeTest {
 protected:
  /// Runs a script to its end; returns its exit code (-1 when it did not end).
  int run(const QString& text) {
    activate();
    ScriptRunner runner(*m_window, *m_ide.ui);
    runner.setExitOnFinish(false);
    runner.setPatience(3000);
    QString error;
    if (!runner.parse(text, u"test.qis"_qs, &error)) {
      m_error = error;
      return 2;
    }
    int code = -1;
    QObject::connect(&runner, &ScriptRunner::finished, [&](int exitCode) { code = exitCode; });
    runner.start();
    if (!waitFor([&] { return code >= 0; }, 20000)) return -1;
    m_error = runner.error();
    return code;
  }
  QString parseError(const QString& text) {
    ScriptRunner runner(*m_window, *m_ide.ui);
    QString error;
    runner.parse(text, u"s.qis"_qs, &error);
    return error;
  }
  QString m_error;
};

TEST_F(ScriptTest, MistakesAreFoundBeforeRunningAndNameTheLine) {
  EXPECT_EQ(parseError(u"# comment\n\nclik Standard Save\n"_qs), u"s.qis:3: unknown command \"clik\""_qs);
  EXPECT_EQ(parseError(u"caret 1\n"_qs), u"s.qis:1: \"caret\" takes 2 arguments, not 1"_qs);
  EXPECT_EQ(parseError(u"save\ntype \"abc\n"_qs), u"s.qis:2: unclosed quote"_qs);
  EXPECT_EQ(parseError(u"open ${NO_SUCH_VARIABLE_HERE}/x.vbp\n"_qs),
            u"s.qis:1: unknown variable ${NO_SUCH_VARIABLE_HERE}"_qs);
  EXPECT_EQ(parseError(u"answer Maybe\n"_qs),
            u"s.qis:1: \"Maybe\" is not an answer (OK, Cancel, Yes, No, Abort, Retry, Ignore)"_qs);
}

TEST_F(ScriptTest, WordsAreSplitWithQuotesEscapesAndVariables) {
  qputenv("QUIMBEL_SCRIPT_TEST_DIR", "/tmp/x y");
  ScriptRunner runner(*m_window, *m_ide.ui);
  QString error;
  ASSERT_TRUE(runner.parse(
      QStringLiteral("type \"a \\\"b\\\"\\nc\" # comment\nopen ${QUIMBEL_SCRIPT_TEST_DIR}/p.vbp\n"
                     "click \"Menu Bar\" \"&File\" Save#1\n"),
      u"s"_qs, &error))
      << error.toStdString();
  qunsetenv("QUIMBEL_SCRIPT_TEST_DIR");
  ASSERT_EQ(runner.steps().size(), 3u);
  EXPECT_EQ(runner.steps()[0].arguments, QStringList{u"a \"b\"\nc"_qs});
  EXPECT_EQ(runner.steps()[1].arguments, QStringList{u"/tmp/x y/p.vbp"_qs});
  EXPECT_EQ(runner.steps()[2].arguments, (QStringList{u"Menu Bar"_qs, u"&File"_qs, u"Save#1"_qs}));
  EXPECT_EQ(runner.steps()[2].line, 3);
}

TEST_F(ScriptTest, AScriptEditsCodeThroughTheEditor) {
  const int code =
      run(QStringLiteral("code Loja.modPrincipal\n"
                         "caret 1 1\n"
                         "type \"' primeira\\n\"\n"
                         "expect line 1 \"' primeira\"\n"
                         "expect line 2 \"Option Explicit\"\n"
                         "key Ctrl+Z\n"
                         "expect line 1 \"' primeiraOption Explicit\"\n"
                         "key Ctrl+Z\n"
                         "expect line 1 \"Option Explicit\"\n"
                         "expect line 2 \"\"\n"));
  EXPECT_EQ(code, 0) << m_error.toStdString();
}

TEST_F(ScriptTest, TheBoxesOfTheActiveCodeWindowAreFilledBeforeUse) {
  // Two code windows: the boxes are the active one's, and an event not yet listed can be chosen.
  const int code =
      run(QStringLiteral("code Loja.modPrincipal\n"
                         "code Loja.frmSobre\n"
                         "expect value objectList (General)\n"
                         "set objectList cmdOk\n"
                         "expect value procedureList Click\n"
                         "set procedureList KeyPress\n"
                         "expect value procedureList KeyPress\n"
                         "expect value objectList cmdOk\n"));
  EXPECT_EQ(code, 0) << m_error.toStdString();
  auto module = component(u"Loja"_qs, u"frmSobre"_qs)->codeModule();
  EXPECT_EQ(module->Lines(module->CountOfLines() - 2, 1),
            u"Private Sub cmdOk_KeyPress(KeyAscii As Integer)"_qs);
}

TEST_F(ScriptTest, AMessyProjectOpensWithoutItsMissingFileAndKeepsItsLineEnds) {
  QTemporaryDir dir;
  const QString project = host::test::writeMessyProject(dir.path());
  const QByteArray before = host::test::readBytes(project);
  const int code = run(QStringLiteral("answer OK\nopen \"%1\"\nexpect message \"Classes\\\\clsFalta.cls    "
                                      "(Entrada.vbp, line 4)\"\ncode Entrada.modMisto\ncaret 4 1\n"
                                      "key End Return\ncaret 8 1\nkey End Return\nsave\nsave\n")
                           .arg(project));
  EXPECT_EQ(code, 0) << m_error.toStdString();
  EXPECT_EQ(host::test::readBytes(project), before);
  EXPECT_EQ(host::test::readBytes(dir.filePath(u"Fontes/modMisto.bas"_qs)),
            QByteArray("Attribute VB_Name = \"modMisto\"\nOption Explicit\n' Vers\xE3o antiga\rSub Velha()\r"
                       "    x = 1\r\r\r    y = 2\rEnd Sub\n\n"));
}

TEST_F(ScriptTest, AFailingStepEndsTheScriptWithItsLine) {
  EXPECT_EQ(run(u"echo one\nselect Loja.naoExiste\necho never\n"_qs), 1);
  EXPECT_EQ(m_error, u"test.qis:2: no component \"Loja.naoExiste\" is open"_qs);
  EXPECT_EQ(run(u"code Loja.modPrincipal\nexpect line 1 \"Outra coisa\"\n"_qs), 1);
  EXPECT_EQ(m_error, u"test.qis:2: line 1 is \"Option Explicit\", not \"Outra coisa\""_qs);
}

TEST_F(ScriptTest, AModalDialogIsDrivenWhileItIsOpen) {
  auto addIn = m_ide.vbe->addIns().registerLibrary(QStringLiteral(QUIMBEL_TEST_ADDIN), false);
  QTemporaryDir dir;
  const QString shot = dir.filePath(u"manager.png"_qs);
  const int code = run(QStringLiteral("click \"Menu Bar\" \"Add-Ins\" \"Add-In Manager...\"\n"
                                      "set addInList \"Add-in of the IDE model's tests\"\n"
                                      "set loadedCheck true\n"
                                      "screenshot dialog \"%1\"\n"
                                      "press OK\n"
                                      "expect control \"Add-Ins\" \"Test Add-In\"\n")
                           .arg(shot));
  EXPECT_EQ(code, 0) << m_error.toStdString();
  EXPECT_TRUE(addIn->Connect());
  QImage image(shot);
  EXPECT_FALSE(image.isNull());
  EXPECT_GT(image.width(), 300);
  addIn->setConnect(false);
  waitFor([&] { return !addIn->Connect(); });
}

TEST_F(ScriptTest, MessageBoxesAreAnsweredAndRemembered) {
  const int code =
      run(QStringLiteral("answer OK\n"
                         "click \"Menu Bar\" Help \"About Quimbel IDE...\"\n"
                         "expect message \"Quimbel IDE\"\n"));
  EXPECT_EQ(code, 0) << m_error.toStdString();
  ASSERT_EQ(m_messages.size(), 1);
  EXPECT_TRUE(m_messages.front().startsWith(u"About Quimbel IDE: Quimbel IDE "_qs));
}

TEST_F(ScriptTest, TheFindDialogSelectsWhatItFinds) {
  const int code =
      run(QStringLiteral("code Loja.modPrincipal\n"
                         "caret 1 1\n"
                         "click \"Menu Bar\" Edit Find...\n"
                         "set findWhat gettickcount\n"
                         "set wholeWord true\n"
                         "press findNextButton\n"
                         "wait closed\n"));
  ASSERT_EQ(code, 0) << m_error.toStdString();
  auto pane = component(u"Loja"_qs, u"modPrincipal"_qs)->codeModule()->pane();
  const auto& s = pane->selection();
  auto module = component(u"Loja"_qs, u"modPrincipal"_qs)->codeModule();
  EXPECT_EQ(s.startLine, s.endLine);
  EXPECT_EQ(module->Lines(s.startLine, 1).mid(s.startColumn - 1, s.endColumn - s.startColumn),
            u"GetTickCount"_qs);
}

TEST_F(ScriptTest, AScriptThatLeavesADialogOpenFails) {
  EXPECT_EQ(run(u"click \"Menu Bar\" \"Add-Ins\" \"Add-In Manager...\"\n"_qs), 1);
  EXPECT_TRUE(m_error.contains(u"Add-In Manager"_qs)) << m_error.toStdString();
}

}  // namespace
}  // namespace desktop

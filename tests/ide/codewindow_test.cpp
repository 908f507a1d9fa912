// SPDX-License-Identifier: MIT
// The code window's Object and Procedure boxes: the module's objects and their events, existing procedures
// in bold, the empty procedure an event without one gets, and the boxes following the caret.
#include "codewindow.h"
#include "codebinding.h"
#include "idefixture.h"
#include "windowmanager.h"

#include <gtest/gtest.h>

#include <QComboBox>
#include <QMdiSubWindow>

namespace desktop {
namespace {

QStringList itemsOf(const QComboBox* box) {
  QStringList items;
  for (int i = 0; i < box->count(); ++i)
    items << box->itemText(i) + (box->itemData(i, Qt::FontRole).value<QFont>().bold() ? u"*"_qs : QString());
  return items;
}

class CodeWindowTest : public test::IdeTest {
 protected:
  CodeWindow* open(const char* name) {
    QMdiSubWindow* sub = openCode(u"Loja"_qs, QString::fromLatin1(name));
    return sub ? qobject_cast<CodeWindow*>(sub->widget()) : nullptr;
  }
  QString line(CodeWindow* window, int n) { return window->binding()->module()->Lines(n, 1); }
};

TEST_F(CodeWindowTest, TheBoxesListObjectsAndTheirEventsWithExistingProceduresInBold) {
  CodeWindow* window = open("frmSobre");
  ASSERT_NE(window, nullptr);
  window->fillLists();
  EXPECT_EQ(itemsOf(window->objectList()),
            (QStringList{"(General)", "Form", "cboIdioma", "chkDicas", "cmdOk", "cmdSistema", "ctlPainel1",
                         "imgLogo", "lblIdioma", "lblTitulo", "lblVersao", "txtLicenca"}));
  window->chooseObject(u"cmdOk"_qs);
  EXPECT_EQ(window->objectList()->currentText(), u"cmdOk"_qs);
  EXPECT_EQ(window->procedureList()->currentText(), u"Click"_qs);
  EXPECT_EQ(line(window, window->pane()->selection().startLine), u"Private Sub cmdOk_Click()"_qs);
  const QStringList events = itemsOf(window->procedureList());
  EXPECT_TRUE(events.contains(u"Click*"_qs));
  EXPECT_TRUE(events.contains(u"KeyPress"_qs));
  EXPECT_FALSE(events.contains(u"Change"_qs));

  // A class: its own object; a module: only (General), with its procedures and the declarations.
  CodeWindow* classWindow = open("clsPedido");
  classWindow->fillLists();
  EXPECT_EQ(itemsOf(classWindow->objectList()), (QStringList{"(General)", "Class"}));
  CodeWindow* module = open("modPrincipal");
  module->fillLists();
  EXPECT_EQ(itemsOf(module->objectList()), QStringList{"(General)"});
  EXPECT_EQ(itemsOf(module->procedureList()).first(), u"(Declarations)"_qs);
  EXPECT_TRUE(itemsOf(module->procedureList()).contains(u"Main"_qs));
}

TEST_F(CodeWindowTest, ChoosingAnEventWithoutAProcedureWritesItAndPutsTheCaretInIt) {
  CodeWindow* window = open("frmSobre");
  ASSERT_NE(window, nullptr);
  auto module = window->binding()->module();
  const int before = module->CountOfLines();
  window->fillLists();
  window->chooseObject(u"txtLicenca"_qs);  // no procedure yet: its default event, Change
  window->chooseProcedure(u"KeyPress"_qs);
  EXPECT_EQ(module->Lines(before + 1, 8).split(u"\r\n"_qs),
            (QStringList{"", "Private Sub txtLicenca_Change()", "", "End Sub", "",
                         "Private Sub txtLicenca_KeyPress(KeyAscii As Integer)", "", "End Sub"}))
      << module->Lines(before + 1, module->CountOfLines() - before).toStdString();
  const auto caret = window->pane()->selection();
  EXPECT_EQ(caret.startLine, before + 7);
  EXPECT_EQ(caret.startColumn, 1);
  EXPECT_EQ(window->procedureList()->currentText(), u"KeyPress"_qs);
  EXPECT_TRUE(itemsOf(window->procedureList()).contains(u"KeyPress*"_qs));
  // An element of a control array takes its Index first.
  CodeWindow* cliente = open("frmCliente");
  cliente->fillLists();
  cliente->chooseObject(u"cmdAcao"_qs);
  cliente->chooseProcedure(u"MouseUp"_qs);
  EXPECT_EQ(
      cliente->binding()->module()->Lines(cliente->pane()->selection().startLine - 1, 1),
      QStringLiteral("Private Sub cmdAcao_MouseUp(Index As Integer, Button As Integer, Shift As Integer, "
                     "X As Single, Y As Single)"));
}

TEST_F(CodeWindowTest, TwoProceduresOfOneNameInConditionalBranchesAreTwoEntries) {
  CodeWindow* window = open("modPrincipal");
  ASSERT_NE(window, nullptr);
  auto module = window->binding()->module();
  module->InsertLines(module->CountOfLines() + 1,
                      u"#If DEBUG Then\r\nSub Conecta()\r\n    x = 1\r\nEnd Sub\r\n#Else\r\nSub Conecta()\r\n"
                      "    x = 2\r\nEnd Sub\r\n#End If"_qs);
  window->fillLists();
  const QStringList items = itemsOf(window->procedureList());
  ASSERT_EQ(items.count(u"Conecta"_qs), 2) << items.join(u',').toStdString();
  window->chooseProcedure(u"Conecta"_qs, int(items.lastIndexOf(u"Conecta"_qs)));
  EXPECT_EQ(line(window, window->pane()->selection().startLine + 1), u"    x = 2"_qs);
  window->chooseProcedure(u"Conecta"_qs, int(items.indexOf(u"Conecta"_qs)));
  EXPECT_EQ(line(window, window->pane()->selection().startLine + 1), u"    x = 1"_qs);
}

}  // namespace
}  // namespace desktop

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
    items << box->itemText(i) +
                 (box->itemData(i, Qt::FontRole).value<QFont>().bold() ? QStringLiteral("*") : QString());
  return items;
}

class CodeWindowTest : public test::IdeTest {
 protected:
  CodeWindow* open(const char* name) {
    QMdiSubWindow* sub = openCode(QStringLiteral("Loja"), QString::fromLatin1(name));
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
  window->chooseObject(QStringLiteral("cmdOk"));
  EXPECT_EQ(window->objectList()->currentText(), QStringLiteral("cmdOk"));
  EXPECT_EQ(window->procedureList()->currentText(), QStringLiteral("Click"));
  EXPECT_EQ(line(window, window->pane()->selection().startLine), QStringLiteral("Private Sub cmdOk_Click()"));
  const QStringList events = itemsOf(window->procedureList());
  EXPECT_TRUE(events.contains(QStringLiteral("Click*")));
  EXPECT_TRUE(events.contains(QStringLiteral("KeyPress")));
  EXPECT_FALSE(events.contains(QStringLiteral("Change")));

  // A class: its own object; a module: only (General), with its procedures and the declarations.
  CodeWindow* classWindow = open("clsPedido");
  classWindow->fillLists();
  EXPECT_EQ(itemsOf(classWindow->objectList()), (QStringList{"(General)", "Class"}));
  CodeWindow* module = open("modPrincipal");
  module->fillLists();
  EXPECT_EQ(itemsOf(module->objectList()), QStringList{"(General)"});
  EXPECT_EQ(itemsOf(module->procedureList()).first(), QStringLiteral("(Declarations)"));
  EXPECT_TRUE(itemsOf(module->procedureList()).contains(QStringLiteral("Main")));
}

TEST_F(CodeWindowTest, ChoosingAnEventWithoutAProcedureWritesItAndPutsTheCaretInIt) {
  CodeWindow* window = open("frmSobre");
  ASSERT_NE(window, nullptr);
  auto module = window->binding()->module();
  const int before = module->CountOfLines();
  window->fillLists();
  window->chooseObject(QStringLiteral("txtLicenca"));  // no procedure yet: its default event, Change
  window->chooseProcedure(QStringLiteral("KeyPress"));
  EXPECT_EQ(module->Lines(before + 1, 8).split(QStringLiteral("\r\n")),
            (QStringList{"", "Private Sub txtLicenca_Change()", "", "End Sub", "",
                         "Private Sub txtLicenca_KeyPress(KeyAscii As Integer)", "", "End Sub"}))
      << module->Lines(before + 1, module->CountOfLines() - before).toStdString();
  const auto caret = window->pane()->selection();
  EXPECT_EQ(caret.startLine, before + 7);
  EXPECT_EQ(caret.startColumn, 1);
  EXPECT_EQ(window->procedureList()->currentText(), QStringLiteral("KeyPress"));
  EXPECT_TRUE(itemsOf(window->procedureList()).contains(QStringLiteral("KeyPress*")));
  // An element of a control array takes its Index first.
  CodeWindow* cliente = open("frmCliente");
  cliente->fillLists();
  cliente->chooseObject(QStringLiteral("cmdAcao"));
  cliente->chooseProcedure(QStringLiteral("MouseUp"));
  EXPECT_EQ(
      cliente->binding()->module()->Lines(cliente->pane()->selection().startLine - 1, 1),
      QStringLiteral("Private Sub cmdAcao_MouseUp(Index As Integer, Button As Integer, Shift As Integer, "
                     "X As Single, Y As Single)"));
}

}  // namespace
}  // namespace desktop

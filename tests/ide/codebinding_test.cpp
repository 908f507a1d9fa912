// SPDX-License-Identifier: MIT
// The code window's editor bound to a code module and its pane: model edits reach the editor as undoable
// edits, typing reaches the model, selection, TopLine and the visible height map both ways.
#include "codebinding.h"
#include "codeeditor.h"
#include "idefixture.h"

#include <gtest/gtest.h>

#include <QScrollBar>
#include <QTest>
#include <QTextBlock>
#include <QTextCursor>

namespace desktop {
namespace {

using test::settle;
using test::waitFor;

class Binding : public ::testing::Test {
 protected:
  void SetUp() override {
    auto project = m_ide.vbe->newProject();
    m_module = std::static_pointer_cast<host::ComponentImpl>(project->Add(ide::ComponentType::StdModule))
                   ->codeModule();
    QString text =
        QStringLiteral("Option Explicit\r\n\r\nPublic Sub One()\r\n    Debug.Print \"one\"\r\nEnd Sub");
    for (int n = 6; n <= 105; ++n)
      text += QStringLiteral("\r\n' filler %1").arg(n);
    m_module->AddFromString(text);
    m_pane = m_module->pane();
    m_editor = std::make_unique<CodeEditor>();
    m_editor->resize(600, 300);
    m_editor->show();
    m_binding = new CodeBinding(m_module, m_editor.get());
    m_editor->setBeforeInput([this] { m_binding->flush(); });
    settle();
  }

  QString block(int line) const { return m_editor->document()->findBlockByNumber(line - 1).text(); }
  int position(int line, int column) const {
    return m_editor->document()->findBlockByNumber(line - 1).position() + column - 1;
  }
  void select(int fromLine, int fromColumn, int toLine, int toColumn) {
    QTextCursor cursor(m_editor->document());
    cursor.setPosition(position(fromLine, fromColumn));
    cursor.setPosition(position(toLine, toColumn), QTextCursor::KeepAnchor);
    m_editor->setTextCursor(cursor);
  }
  std::array<int, 4> selection() const {
    std::array<int, 4> s{};
    m_pane->GetSelection(s[0], s[1], s[2], s[3]);
    return s;
  }

  test::DesktopVbe m_ide;
  std::shared_ptr<host::CodeModuleImpl> m_module;
  std::shared_ptr<host::CodePaneImpl> m_pane;
  std::unique_ptr<CodeEditor> m_editor;
  CodeBinding* m_binding = nullptr;
};

// ---------------------------------------------------------------------------------------------------
// Model to editor

TEST_F(Binding, ShowsTheLinesOfTheModule) {
  EXPECT_EQ(m_editor->document()->blockCount(), 105);
  EXPECT_EQ(block(1), QStringLiteral("Option Explicit"));
  EXPECT_EQ(block(4), QStringLiteral("    Debug.Print \"one\""));
  EXPECT_EQ(block(105), QStringLiteral("' filler 105"));
}

TEST_F(Binding, ModelEditsReachTheEditorAsOneUndoableEdit) {
  m_module->InsertLines(4, QStringLiteral("    x = 1\r\n    y = 2"));
  m_module->ReplaceLine(3, QStringLiteral("Public Sub Uno()"));
  m_module->DeleteLines(8, 1);
  EXPECT_TRUE(m_binding->hasPendingEdits());
  EXPECT_EQ(block(3), QStringLiteral("Public Sub One()")) << "applied from the event loop, not at once";
  m_binding->flush();
  EXPECT_EQ(m_editor->document()->blockCount(), 106);
  EXPECT_EQ(block(3), QStringLiteral("Public Sub Uno()"));
  EXPECT_EQ(block(4), QStringLiteral("    x = 1"));
  EXPECT_EQ(block(5), QStringLiteral("    y = 2"));
  EXPECT_EQ(block(6), QStringLiteral("    Debug.Print \"one\""));
  EXPECT_EQ(block(7), QStringLiteral("End Sub"));
  EXPECT_EQ(block(8), QStringLiteral("' filler 7"));

  m_editor->undo();
  EXPECT_EQ(m_module->CountOfLines(), 105);
  EXPECT_EQ(m_module->Lines(3, 1), QStringLiteral("Public Sub One()"));
  EXPECT_EQ(m_module->Lines(4, 1), QStringLiteral("    Debug.Print \"one\""));
  EXPECT_EQ(m_module->Lines(6, 1), QStringLiteral("' filler 6"));
  m_editor->redo();
  EXPECT_EQ(m_module->CountOfLines(), 106);
  EXPECT_EQ(m_module->Lines(3, 1), QStringLiteral("Public Sub Uno()"));
}

TEST_F(Binding, ALongRunOfModelEditsIsShownPartByPart) {
  QStringList more;
  for (int line = 106; line <= 5000; ++line)
    more << QStringLiteral("' filler %1").arg(line);
  m_module->InsertLines(106, more.join(QStringLiteral("\r\n")));
  m_binding->flush();
  for (int line = 1; line <= 5000; ++line)
    m_module->ReplaceLine(line, QStringLiteral("' linha %1").arg(line));
  QCoreApplication::processEvents();
  EXPECT_EQ(block(1), QStringLiteral("' linha 1")) << "the first part is shown after one pass of the loop";
  EXPECT_EQ(block(5000), QStringLiteral("' filler 5000")) << "the rest waits for the next passes";
  ASSERT_TRUE(waitFor([&] { return !m_binding->hasPendingEdits(); }));
  EXPECT_EQ(m_editor->document()->blockCount(), 5000);
  EXPECT_EQ(block(2500), QStringLiteral("' linha 2500"));
  EXPECT_EQ(block(5000), QStringLiteral("' linha 5000"));
}

TEST_F(Binding, ModelEditsAreShownFromTheEventLoop) {
  m_module->ReplaceLine(105, QStringLiteral("' last"));
  m_module->InsertLines(106, QStringLiteral("' appended"));
  ASSERT_TRUE(waitFor([&] { return !m_binding->hasPendingEdits(); }));
  EXPECT_EQ(block(105), QStringLiteral("' last"));
  EXPECT_EQ(block(106), QStringLiteral("' appended"));
  m_module->DeleteLines(100, 7);
  ASSERT_TRUE(waitFor([&] { return !m_binding->hasPendingEdits(); }));
  EXPECT_EQ(m_editor->document()->blockCount(), 99);
  EXPECT_EQ(block(99), QStringLiteral("' filler 99"));
}

TEST_F(Binding, AnEmptyModuleShowsEmptyAndTakesNewLines) {
  m_module->DeleteLines(1, m_module->CountOfLines());
  m_binding->flush();
  EXPECT_TRUE(m_editor->document()->isEmpty());
  m_module->InsertLines(1, QStringLiteral("Sub A()\r\nEnd Sub"));
  m_binding->flush();
  EXPECT_EQ(m_editor->toPlainText(), QStringLiteral("Sub A()\nEnd Sub"));
}

// ---------------------------------------------------------------------------------------------------
// Editor to model

TEST_F(Binding, TypingChangesTheModuleLine) {
  m_pane->SetSelection(4, 22, 4, 22);
  QTest::keyClicks(m_editor.get(), QStringLiteral(" ' two"));
  EXPECT_EQ(m_module->Lines(4, 1), QStringLiteral("    Debug.Print \"one\" ' two"));
  EXPECT_EQ(m_module->CountOfLines(), 105);
}

TEST_F(Binding, EnterSplitsALineAndBackspaceJoinsItAgain) {
  m_pane->SetSelection(3, 11, 3, 11);
  QTest::keyClick(m_editor.get(), Qt::Key_Return);
  EXPECT_EQ(m_module->CountOfLines(), 106);
  EXPECT_EQ(m_module->Lines(3, 1), QStringLiteral("Public Sub"));
  EXPECT_EQ(m_module->Lines(4, 1), QStringLiteral(" One()"));
  QTest::keyClick(m_editor.get(), Qt::Key_Backspace);
  EXPECT_EQ(m_module->CountOfLines(), 105);
  EXPECT_EQ(m_module->Lines(3, 1), QStringLiteral("Public Sub One()"));
}

TEST_F(Binding, InsertedTextOfSeveralLinesBecomesModuleLines) {
  QTextCursor cursor(m_editor->document());
  cursor.setPosition(position(2, 1));
  cursor.insertText(QStringLiteral("' a\n' b\n' c"));
  EXPECT_EQ(m_module->CountOfLines(), 107);
  EXPECT_EQ(m_module->Lines(2, 3), QStringLiteral("' a\r\n' b\r\n' c"));
  EXPECT_EQ(m_module->Lines(5, 1), QStringLiteral("Public Sub One()"));
}

TEST_F(Binding, DeletingLinesInTheEditorDeletesThemInTheModule) {
  select(6, 1, 9, 1);
  m_editor->textCursor().removeSelectedText();
  EXPECT_EQ(m_module->CountOfLines(), 102);
  EXPECT_EQ(m_module->Lines(6, 1), QStringLiteral("' filler 9"));
}

TEST_F(Binding, AnEmptiedEditorLeavesAnEmptyModule) {
  m_editor->selectAll();
  m_editor->textCursor().removeSelectedText();
  EXPECT_EQ(m_module->CountOfLines(), 0);
  QTest::keyClicks(m_editor.get(), QStringLiteral("x"));
  EXPECT_EQ(m_module->CountOfLines(), 1);
  EXPECT_EQ(m_module->Lines(1, 1), QStringLiteral("x"));
}

TEST_F(Binding, ALineTooLongIsRefusedAndTheEditorShowsTheModuleAgain) {
  QString refused;
  QObject::connect(m_binding, &CodeBinding::editRejected, [&](const QString& message) { refused = message; });
  QTextCursor cursor(m_editor->document());
  cursor.setPosition(position(1, 16));
  cursor.insertText(QString(1100, u'x'));
  EXPECT_FALSE(refused.isEmpty());
  EXPECT_EQ(m_module->Lines(1, 1), QStringLiteral("Option Explicit"));
  EXPECT_EQ(block(1), QStringLiteral("Option Explicit"));
  EXPECT_EQ(m_editor->document()->blockCount(), 105);
}

TEST_F(Binding, AKeyThatEditsFirstTakesInThePendingModelEdits) {
  m_pane->SetSelection(3, 1, 3, 1);
  m_module->InsertLines(1, QStringLiteral("' novo"));
  ASSERT_TRUE(m_binding->hasPendingEdits());
  QTest::keyClicks(m_editor.get(), QStringLiteral("x"));
  EXPECT_FALSE(m_binding->hasPendingEdits());
  // The caret went down with its line (now line 4), and the key landed there.
  EXPECT_EQ(m_module->Lines(4, 1), QStringLiteral("xPublic Sub One()"));
  EXPECT_EQ(m_module->Lines(1, 1), QStringLiteral("' novo"));
}

TEST_F(Binding, AKeyThatOnlyMovesNeitherWaitsForNorMisreportsPendingEdits) {
  m_pane->SetSelection(3, 1, 3, 1);
  m_module->InsertLines(1, QStringLiteral("' novo"));
  QTest::keyClick(m_editor.get(), Qt::Key_Right);
  EXPECT_TRUE(m_binding->hasPendingEdits());
  EXPECT_EQ(selection(), (std::array<int, 4>{4, 1, 4, 1})) << "the editor's stale position is not the pane's";
}

// ---------------------------------------------------------------------------------------------------
// Selection, scrolling, height

TEST_F(Binding, TheEditorSelectionIsThePaneSelection) {
  select(4, 5, 4, 16);
  EXPECT_EQ(selection(), (std::array<int, 4>{4, 5, 4, 16}));
  select(7, 3, 4, 5);  // made backwards: start still comes first
  EXPECT_EQ(selection(), (std::array<int, 4>{4, 5, 7, 3}));
  select(3, 1, 4, 1);  // a whole line ends at the start of the next one
  EXPECT_EQ(selection(), (std::array<int, 4>{3, 1, 4, 1}));
}

TEST_F(Binding, SetSelectionSelectsInTheEditor) {
  m_pane->SetSelection(4, 5, 4, 16);
  EXPECT_EQ(m_editor->textCursor().selectedText(), QStringLiteral("Debug.Print"));
  m_pane->SetSelection(3, 8, 3, 8);
  EXPECT_FALSE(m_editor->textCursor().hasSelection());
  EXPECT_EQ(m_editor->textCursor().position(), position(3, 8));
}

TEST_F(Binding, AColumnPastTheLineEndStopsAtTheEnd) {
  m_pane->SetSelection(5, 40, 5, 40);
  EXPECT_EQ(m_editor->textCursor().position(), position(5, 8));
  EXPECT_EQ(selection(), (std::array<int, 4>{5, 8, 5, 8}));
}

TEST_F(Binding, TopLineFollowsBothWays) {
  m_pane->setTopLine(50);
  EXPECT_EQ(m_editor->verticalScrollBar()->value(), 49);
  m_editor->verticalScrollBar()->setValue(19);
  EXPECT_EQ(m_pane->TopLine(), 20);
}

TEST_F(Binding, CountOfVisibleLinesIsWhatTheEditorShows) {
  m_editor->resize(600, 300);
  settle();
  const int small = m_pane->CountOfVisibleLines();
  const int top = m_pane->TopLine();
  const int height = m_editor->viewport()->height();
  auto bottomOf = [&](int line) {
    QTextCursor cursor(m_editor->document()->findBlockByNumber(line - 1));
    return m_editor->cursorRect(cursor).bottom();
  };
  EXPECT_LE(bottomOf(top + small - 1), height) << "the last counted line is fully visible";
  EXPECT_GT(bottomOf(top + small), height) << "the line after it is not";
  m_editor->resize(600, 600);
  settle();
  EXPECT_GT(m_pane->CountOfVisibleLines(), small);
}

TEST_F(Binding, ACaretStaysOnItsTextWhenTheModuleInsertsAbove) {
  m_pane->SetSelection(10, 3, 10, 3);
  m_module->InsertLines(1, QStringLiteral("' top"));
  m_binding->flush();
  EXPECT_EQ(selection(), (std::array<int, 4>{11, 3, 11, 3}));
  EXPECT_EQ(m_editor->textCursor().position(), position(11, 3));
}

}  // namespace
}  // namespace desktop

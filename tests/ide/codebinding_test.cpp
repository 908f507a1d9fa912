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
    QString text = u"Option Explicit\r\n\r\nPublic Sub One()\r\n    Debug.Print \"one\"\r\nEnd Sub"_qs;
    for (int n = 6; n <= 105; ++n)
      text += u"\r\n' filler %1"_qs.arg(n);
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
  EXPECT_EQ(block(1), u"Option Explicit"_qs);
  EXPECT_EQ(block(4), u"    Debug.Print \"one\""_qs);
  EXPECT_EQ(block(105), u"' filler 105"_qs);
}

TEST_F(Binding, ModelEditsReachTheEditorAsOneUndoableEdit) {
  m_module->InsertLines(4, u"    x = 1\r\n    y = 2"_qs);
  m_module->ReplaceLine(3, u"Public Sub Uno()"_qs);
  m_module->DeleteLines(8, 1);
  EXPECT_TRUE(m_binding->hasPendingEdits());
  EXPECT_EQ(block(3), u"Public Sub One()"_qs) << "applied from the event loop, not at once";
  m_binding->flush();
  EXPECT_EQ(m_editor->document()->blockCount(), 106);
  EXPECT_EQ(block(3), u"Public Sub Uno()"_qs);
  EXPECT_EQ(block(4), u"    x = 1"_qs);
  EXPECT_EQ(block(5), u"    y = 2"_qs);
  EXPECT_EQ(block(6), u"    Debug.Print \"one\""_qs);
  EXPECT_EQ(block(7), u"End Sub"_qs);
  EXPECT_EQ(block(8), u"' filler 7"_qs);

  m_editor->undo();
  EXPECT_EQ(m_module->CountOfLines(), 105);
  EXPECT_EQ(m_module->Lines(3, 1), u"Public Sub One()"_qs);
  EXPECT_EQ(m_module->Lines(4, 1), u"    Debug.Print \"one\""_qs);
  EXPECT_EQ(m_module->Lines(6, 1), u"' filler 6"_qs);
  m_editor->redo();
  EXPECT_EQ(m_module->CountOfLines(), 106);
  EXPECT_EQ(m_module->Lines(3, 1), u"Public Sub Uno()"_qs);
}

TEST_F(Binding, ALongRunOfModelEditsIsShownPartByPart) {
  QStringList more;
  for (int line = 106; line <= 5000; ++line)
    more << u"' filler %1"_qs.arg(line);
  m_module->InsertLines(106, more.join(u"\r\n"_qs));
  m_binding->flush();
  for (int line = 1; line <= 5000; ++line)
    m_module->ReplaceLine(line, u"' linha %1"_qs.arg(line));
  QCoreApplication::processEvents();
  EXPECT_EQ(block(1), u"' linha 1"_qs) << "the first part is shown after one pass of the loop";
  EXPECT_EQ(block(5000), u"' filler 5000"_qs) << "the rest waits for the next passes";
  ASSERT_TRUE(waitFor([&] { return !m_binding->hasPendingEdits(); }));
  EXPECT_EQ(m_editor->document()->blockCount(), 5000);
  EXPECT_EQ(block(2500), u"' linha 2500"_qs);
  EXPECT_EQ(block(5000), u"' linha 5000"_qs);
}

TEST_F(Binding, ModelEditsAreShownFromTheEventLoop) {
  m_module->ReplaceLine(105, u"' last"_qs);
  m_module->InsertLines(106, u"' appended"_qs);
  ASSERT_TRUE(waitFor([&] { return !m_binding->hasPendingEdits(); }));
  EXPECT_EQ(block(105), u"' last"_qs);
  EXPECT_EQ(block(106), u"' appended"_qs);
  m_module->DeleteLines(100, 7);
  ASSERT_TRUE(waitFor([&] { return !m_binding->hasPendingEdits(); }));
  EXPECT_EQ(m_editor->document()->blockCount(), 99);
  EXPECT_EQ(block(99), u"' filler 99"_qs);
}

TEST_F(Binding, AnEmptyModuleShowsEmptyAndTakesNewLines) {
  m_module->DeleteLines(1, m_module->CountOfLines());
  m_binding->flush();
  EXPECT_TRUE(m_editor->document()->isEmpty());
  m_module->InsertLines(1, u"Sub A()\r\nEnd Sub"_qs);
  m_binding->flush();
  EXPECT_EQ(m_editor->toPlainText(), u"Sub A()\nEnd Sub"_qs);
}

// ---------------------------------------------------------------------------------------------------
// Editor to model

TEST_F(Binding, TypingChangesTheModuleLine) {
  m_pane->SetSelection(4, 22, 4, 22);
  QTest::keyClicks(m_editor.get(), u" ' two"_qs);
  EXPECT_EQ(m_module->Lines(4, 1), u"    Debug.Print \"one\" ' two"_qs);
  EXPECT_EQ(m_module->CountOfLines(), 105);
}

TEST_F(Binding, EnterSplitsALineAndBackspaceJoinsItAgain) {
  m_pane->SetSelection(3, 11, 3, 11);
  QTest::keyClick(m_editor.get(), Qt::Key_Return);
  EXPECT_EQ(m_module->CountOfLines(), 106);
  EXPECT_EQ(m_module->Lines(3, 1), u"Public Sub"_qs);
  EXPECT_EQ(m_module->Lines(4, 1), u" One()"_qs);
  QTest::keyClick(m_editor.get(), Qt::Key_Backspace);
  EXPECT_EQ(m_module->CountOfLines(), 105);
  EXPECT_EQ(m_module->Lines(3, 1), u"Public Sub One()"_qs);
}

TEST_F(Binding, InsertedTextOfSeveralLinesBecomesModuleLines) {
  QTextCursor cursor(m_editor->document());
  cursor.setPosition(position(2, 1));
  cursor.insertText(u"' a\n' b\n' c"_qs);
  EXPECT_EQ(m_module->CountOfLines(), 107);
  EXPECT_EQ(m_module->Lines(2, 3), u"' a\r\n' b\r\n' c"_qs);
  EXPECT_EQ(m_module->Lines(5, 1), u"Public Sub One()"_qs);
}

TEST_F(Binding, DeletingLinesInTheEditorDeletesThemInTheModule) {
  select(6, 1, 9, 1);
  m_editor->textCursor().removeSelectedText();
  EXPECT_EQ(m_module->CountOfLines(), 102);
  EXPECT_EQ(m_module->Lines(6, 1), u"' filler 9"_qs);
}

TEST_F(Binding, AnEmptiedEditorLeavesAnEmptyModule) {
  m_editor->selectAll();
  m_editor->textCursor().removeSelectedText();
  EXPECT_EQ(m_module->CountOfLines(), 0);
  QTest::keyClicks(m_editor.get(), u"x"_qs);
  EXPECT_EQ(m_module->CountOfLines(), 1);
  EXPECT_EQ(m_module->Lines(1, 1), u"x"_qs);
}

TEST_F(Binding, ALineTooLongIsRefusedAndTheEditorShowsTheModuleAgain) {
  QString refused;
  QObject::connect(m_binding, &CodeBinding::editRejected, [&](const QString& message) { refused = message; });
  QTextCursor cursor(m_editor->document());
  cursor.setPosition(position(1, 16));
  cursor.insertText(QString(1100, u'x'));
  EXPECT_FALSE(refused.isEmpty());
  EXPECT_EQ(m_module->Lines(1, 1), u"Option Explicit"_qs);
  EXPECT_EQ(block(1), u"Option Explicit"_qs);
  EXPECT_EQ(m_editor->document()->blockCount(), 105);
}

TEST_F(Binding, AKeyThatEditsFirstTakesInThePendingModelEdits) {
  m_pane->SetSelection(3, 1, 3, 1);
  m_module->InsertLines(1, u"' novo"_qs);
  ASSERT_TRUE(m_binding->hasPendingEdits());
  QTest::keyClicks(m_editor.get(), u"x"_qs);
  EXPECT_FALSE(m_binding->hasPendingEdits());
  // The caret went down with its line (now line 4), and the key landed there.
  EXPECT_EQ(m_module->Lines(4, 1), u"xPublic Sub One()"_qs);
  EXPECT_EQ(m_module->Lines(1, 1), u"' novo"_qs);
}

TEST_F(Binding, AKeyThatOnlyMovesNeitherWaitsForNorMisreportsPendingEdits) {
  m_pane->SetSelection(3, 1, 3, 1);
  m_module->InsertLines(1, u"' novo"_qs);
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

TEST_F(Binding, SetSelectionSelectsInTheEditorUpToTheLineEnd) {
  m_pane->SetSelection(4, 5, 4, 16);
  EXPECT_EQ(m_editor->textCursor().selectedText(), u"Debug.Print"_qs);
  m_pane->SetSelection(3, 8, 3, 8);
  EXPECT_FALSE(m_editor->textCursor().hasSelection());
  EXPECT_EQ(m_editor->textCursor().position(), position(3, 8));
  // A column past the line's end stops at the end.
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
  m_module->InsertLines(1, u"' top"_qs);
  m_binding->flush();
  EXPECT_EQ(selection(), (std::array<int, 4>{11, 3, 11, 3}));
  EXPECT_EQ(m_editor->textCursor().position(), position(11, 3));
}

}  // namespace
}  // namespace desktop

// SPDX-License-Identifier: MIT
#include "codebinding.h"

#include <QPlainTextEdit>
#include <QScrollBar>
#include <QTextBlock>
#include <QTextCursor>
#include <QTextDocument>
#include <QTimer>

namespace desktop {
namespace {

/// Line `n` (1-based) of the module as the editor's block separator joins them.
QString joinedLines(host::CodeText& text, int first, int count) {
  qsizetype size = 0;
  for (int n = first; n < first + count; ++n)
    size += text.line(n).size() + 1;
  QString joined;
  joined.reserve(size);
  for (int n = first; n < first + count; ++n) {
    if (n > first) joined += u'\n';
    joined += text.line(n);
  }
  return joined;
}

}  // namespace

CodeBinding::CodeBinding(std::shared_ptr<host::CodeModuleImpl> module, QPlainTextEdit* editor)
    : QObject(editor), m_module(std::move(module)), m_pane(m_module->pane()), m_editor(editor) {
  host::CodeText& text = m_module->text();
  QTextDocument* document = editor->document();
  document->setUndoRedoEnabled(false);
  editor->setPlainText(joinedLines(text, 1, text.countOfLines()));
  document->setUndoRedoEnabled(true);
  m_editorLines = text.countOfLines();
  m_revision = document->revision();
  text.addListener(this);

  connect(document, &QTextDocument::contentsChange, this, &CodeBinding::documentChanged);
  connect(editor, &QPlainTextEdit::cursorPositionChanged, this, &CodeBinding::reportSelection);
  connect(editor, &QPlainTextEdit::selectionChanged, this, &CodeBinding::reportSelection);
  connect(editor->verticalScrollBar(), &QScrollBar::valueChanged, this, &CodeBinding::reportScroll);
  m_viewRequest = m_pane->viewRequest.connect([this](host::CodePaneImpl*) { followViewRequest(); });
  editor->viewport()->installEventFilter(this);
  updateVisibleLines();
  // The editor opens where the pane was left.
  followViewRequest();
}

CodeBinding::~CodeBinding() {
  m_module->text().removeListener(this);
}

// ---------------------------------------------------------------------------------------------------
// Model to editor

void CodeBinding::linesChanged(int firstLine, int removed, int inserted) {
  if (m_toModel) return;  // the editor made this change itself
  if (!m_pending) {
    m_pending = Pending{firstLine, removed, inserted};
  } else {
    // Merge with the region still to apply. Lines before the region are the same in the editor and the
    // module; lines after it are shifted by (newCount - oldCount).
    Pending& p = *m_pending;
    const int regionEnd = p.first + p.newCount;  // in module lines before this change
    const int editEnd = firstLine + removed;
    const int first = std::min(p.first, firstLine);
    const int end = std::max(regionEnd, editEnd);
    const int editorEnd = std::max(p.first + p.oldCount, editEnd - (p.newCount - p.oldCount));
    p = Pending{first, editorEnd - first, end + inserted - removed - first};
  }
  scheduleFlush();
}

void CodeBinding::scheduleFlush() {
  if (m_flushPosted) return;
  m_flushPosted = true;
  // A posted call rather than a zero timer: posted work runs on every pass of the loop (a walk's every
  // yield), while timers wait for an idle moment that a busy walk seldom leaves.
  QMetaObject::invokeMethod(
      this,
      [this] {
        m_flushPosted = false;
        flushSome();
      },
      Qt::QueuedConnection);
}

void CodeBinding::flushSome() {
  if (!m_pending || !m_editor) return;
  // A walk over a large module changes lines faster than the editor takes them in: a bounded part per pass
  // of the loop keeps the IDE answering. Lines replaced pair by pair leave the rest of the region in step.
  Pending& p = *m_pending;
  if (std::min(p.oldCount, p.newCount) > kLinesPerPass) {
    replaceEditorLines(p.first, kLinesPerPass, kLinesPerPass);
    p.first += kLinesPerPass;
    p.oldCount -= kLinesPerPass;
    p.newCount -= kLinesPerPass;
    // The rest comes with the module's next change, or from a timer once the loop has let everything
    // else run: work posted from posted work would run in this same pass.
    QTimer::singleShot(1, this, [this] { scheduleFlush(); });
    return;
  }
  flush();
}

void CodeBinding::flush() {
  if (!m_pending || !m_editor) return;
  const Pending p = *m_pending;
  m_pending.reset();
  replaceEditorLines(p.first, p.oldCount, p.newCount);
  // The pane moved its selection with the edit; the editor follows it.
  followViewRequest();
}

void CodeBinding::replaceEditorLines(int first, int oldCount, int newCount) {
  host::CodeText& text = m_module->text();
  QTextDocument* document = m_editor->document();
  const bool wasToEditor = m_toEditor;
  m_toEditor = true;
  QTextCursor cursor(document);
  cursor.beginEditBlock();
  const int n = m_editorLines;
  if (oldCount > 0 && newCount > 0) {
    cursor.setPosition(document->findBlockByNumber(first - 1).position());
    const QTextBlock last = document->findBlockByNumber(first - 1 + oldCount - 1);
    cursor.setPosition(last.position() + last.length() - 1, QTextCursor::KeepAnchor);
    cursor.insertText(joinedLines(text, first, newCount));
  } else if (newCount > 0) {  // insertion before editor line `first`
    const QString lines = joinedLines(text, first, newCount);
    if (n == 0) {
      cursor.insertText(lines);
    } else if (first <= n) {
      cursor.setPosition(document->findBlockByNumber(first - 1).position());
      cursor.insertText(lines + u'\n');
    } else {
      cursor.movePosition(QTextCursor::End);
      cursor.insertText(u'\n' + lines);
    }
  } else if (oldCount > 0) {  // deletion of editor lines [first, first + oldCount)
    if (oldCount >= n) {
      cursor.select(QTextCursor::Document);
    } else if (first - 1 + oldCount < n) {
      cursor.setPosition(document->findBlockByNumber(first - 1).position());
      cursor.setPosition(document->findBlockByNumber(first - 1 + oldCount).position(),
                         QTextCursor::KeepAnchor);
    } else {
      const QTextBlock before = document->findBlockByNumber(first - 2);
      cursor.setPosition(before.position() + before.length() - 1);
      cursor.movePosition(QTextCursor::End, QTextCursor::KeepAnchor);
    }
    cursor.removeSelectedText();
  }
  cursor.endEditBlock();
  m_editorLines = n - oldCount + newCount;
  m_revision = document->revision();
  m_toEditor = wasToEditor;
}

void CodeBinding::followViewRequest() {
  if (!m_editor) return;
  flush();
  const bool wasToEditor = m_toEditor;
  m_toEditor = true;
  const auto& s = m_pane->selection();
  QTextCursor cursor(m_editor->document());
  cursor.setPosition(positionOf(s.startLine, s.startColumn));
  cursor.setPosition(positionOf(s.endLine, s.endColumn), QTextCursor::KeepAnchor);
  m_editor->setTextCursor(cursor);
  m_editor->verticalScrollBar()->setValue(m_pane->TopLine() - 1);
  m_toEditor = wasToEditor;
  // What the editor could do is what the pane reports from now on (a column past a line's end, a top line
  // the editor cannot scroll to).
  reportSelection();
  reportScroll(m_editor->verticalScrollBar()->value());
}

int CodeBinding::positionOf(int line, int column) const {
  QTextDocument* document = m_editor->document();
  QTextBlock block = document->findBlockByNumber(line - 1);
  if (!block.isValid()) block = document->lastBlock();
  return block.position() + std::clamp(column - 1, 0, block.length() - 1);
}

// ---------------------------------------------------------------------------------------------------
// Editor to model

void CodeBinding::documentChanged(int position, int /*charsRemoved*/, int charsAdded) {
  if (m_toEditor || !m_editor) return;
  // Highlighting marks blocks dirty without changing their text; only a new revision is an edit.
  const int revision = m_editor->document()->revision();
  if (revision == m_revision) return;
  m_revision = revision;
  if (m_pending) {
    // Input is held back until the model's edits are shown, so this cannot happen; if it does, the editor
    // is rebuilt from the module rather than let the two drift apart.
    qWarning("Quimbel IDE: an edit arrived before the module's own edits were shown; reloading the editor");
    m_pending.reset();
    m_editorLines = m_editor->document()->blockCount();
    replaceEditorLines(1, m_editorLines, m_module->text().countOfLines());
    return;
  }
  host::CodeText& text = m_module->text();
  QTextDocument* document = m_editor->document();
  const int blocks = document->blockCount();
  const int oldBlocks = std::max(1, m_editorLines);
  const int delta = blocks - oldBlocks;
  const int firstBlock = document->findBlock(position).blockNumber();
  QTextBlock lastBlock = document->findBlock(position + charsAdded);
  const int lastNew = lastBlock.isValid() ? lastBlock.blockNumber() : blocks - 1;
  const int lastOld = std::max(firstBlock, lastNew - delta);
  const int oldCount = lastOld - firstBlock + 1;
  const int newCount = lastNew - firstBlock + 1;
  const int linesBefore = text.countOfLines();

  m_toModel = true;
  try {
    if (m_editorLines == 0) {
      // The module was empty: the editor's one empty block stood for no line at all.
      if (document->characterCount() > 1) {
        QStringList lines;
        for (QTextBlock block = document->begin(); block.isValid(); block = block.next())
          lines << block.text();
        m_module->InsertLines(1, lines.join(u'\n'));
      }
    } else {
      const int common = std::min(oldCount, newCount);
      QTextBlock block = document->findBlockByNumber(firstBlock);
      for (int k = 0; k < common; ++k, block = block.next()) {
        const int line = firstBlock + 1 + k;
        const QString typed = block.text();
        if (text.line(line) != typed) m_module->ReplaceLine(line, typed);
      }
      if (newCount > oldCount) {
        QStringList lines;
        for (int k = common; k < newCount; ++k, block = block.next())
          lines << block.text();
        m_module->InsertLines(firstBlock + 1 + common, lines.join(u'\n'));
      } else if (oldCount > newCount) {
        m_module->DeleteLines(firstBlock + 1 + common, oldCount - newCount);
      }
      // An editor emptied by the user leaves an empty module, not one blank line.
      if (document->characterCount() <= 1 && text.countOfLines() == 1) m_module->DeleteLines(1, 1);
    }
    m_toModel = false;
    m_editorLines = text.countOfLines();
  } catch (const ide::Error& error) {
    m_toModel = false;
    // Put the editor's touched region back to what the module holds there (it may have taken part of the
    // edit before it refused the rest).
    m_editorLines = blocks;
    if (linesBefore == 0)
      replaceEditorLines(1, blocks, text.countOfLines());
    else
      replaceEditorLines(firstBlock + 1, newCount, oldCount + (text.countOfLines() - linesBefore));
    Q_EMIT editRejected(error.description());
  }
}

void CodeBinding::reportSelection() {
  // While the module's own edits are still on their way to the editor, the editor's positions are not the
  // module's: the pane keeps the selection it moved with those edits, and the editor takes it afterwards.
  if (m_toEditor || !m_editor || m_pending) return;
  const QTextCursor cursor = m_editor->textCursor();
  QTextDocument* document = m_editor->document();
  auto lineColumn = [&](int position) {
    const QTextBlock block = document->findBlock(position);
    return std::pair(block.blockNumber() + 1, position - block.position() + 1);
  };
  const auto [startLine, startColumn] = lineColumn(cursor.selectionStart());
  const auto [endLine, endColumn] = lineColumn(cursor.selectionEnd());
  m_pane->viewSelectionChanged(host::CodePaneImpl::Selection{startLine, startColumn, endLine, endColumn});
  const auto [caretLine, caretColumn] = lineColumn(cursor.position());
  Q_EMIT caretMoved(caretLine, caretColumn);
}

void CodeBinding::reportScroll(int value) {
  if (m_toEditor || m_pending) return;
  m_pane->viewScrolled(value + 1);
}

int CodeBinding::visibleLines() const {
  if (!m_editor) return 1;
  const QTextBlock first = m_editor->document()->findBlockByNumber(m_editor->verticalScrollBar()->value());
  const QFontMetricsF metrics(m_editor->font());
  qreal lineHeight = metrics.lineSpacing();
  if (first.isValid() && first.layout() && first.layout()->lineCount() > 0)
    lineHeight = first.layout()->lineAt(0).height();
  // The lines start below the document's margin: only those that fit below it count.
  const int top = first.isValid() ? std::max(0, m_editor->cursorRect(QTextCursor(first)).top()) : 0;
  return std::max(1, static_cast<int>((m_editor->viewport()->height() - top) / lineHeight));
}

bool CodeBinding::eventFilter(QObject* watched, QEvent* event) {
  if (event->type() == QEvent::Resize && m_editor && watched == m_editor->viewport()) updateVisibleLines();
  return QObject::eventFilter(watched, event);
}

void CodeBinding::updateVisibleLines() {
  const int lines = visibleLines();
  if (lines == m_lastVisibleLines) return;
  m_lastVisibleLines = lines;
  m_pane->setCountOfVisibleLines(lines);
}

}  // namespace desktop

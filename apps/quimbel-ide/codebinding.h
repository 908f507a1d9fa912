// SPDX-License-Identifier: MIT
// Binds a code module and its pane to a text editor, both ways. The model is the source of truth:
// - edits made through the object model reach the editor as undoable edits. They are gathered and applied
//   from the event loop (or before the editor handles input), so that a walk that rewrites every line of
//   a large module costs one editor edit per yield, not one per line;
// - what the user types becomes ReplaceLine, InsertLines and DeleteLines on the module at once;
// - caret and selection map to the pane's selection (1-based lines and columns, end column exclusive),
//   scrolling to TopLine, the editor's height to CountOfVisibleLines, and the object model's requests
//   (TopLine, SetSelection) move the editor.
// An empty module (no lines) shows as an empty editor; an editor emptied by the user empties the module.
#pragma once

#include "host/code/codetext.h"
#include "host/model/objects.h"
#include "ide/signal.h"

#include <QObject>
#include <QPointer>

#include <memory>
#include <optional>

class QPlainTextEdit;

namespace desktop {

class CodeBinding final : public QObject, private host::CodeText::Listener {
  Q_OBJECT

 public:
  CodeBinding(std::shared_ptr<host::CodeModuleImpl> module, QPlainTextEdit* editor);
  ~CodeBinding() override;

  const std::shared_ptr<host::CodeModuleImpl>& module() const { return m_module; }
  const std::shared_ptr<host::CodePaneImpl>& pane() const { return m_pane; }
  /// Applies the model's pending edits to the editor now.
  void flush();
  bool hasPendingEdits() const { return m_pending.has_value(); }
  /// The editor's height in whole lines (told to the pane whenever it changes).
  int visibleLines() const;

 Q_SIGNALS:
  /// The module refused what was typed (a line too long, a module that cannot be edited); the editor was
  /// put back to what the module holds.
  void editRejected(const QString& message);
  /// The caret moved (1-based line and column).
  void caretMoved(int line, int column);

 protected:
  bool eventFilter(QObject* watched, QEvent* event) override;

 private:
  struct Pending {
    int first = 1;     // first line of the region (1-based)
    int oldCount = 0;  // lines the editor still shows there
    int newCount = 0;  // lines the module holds there now
  };

  /// Lines the editor takes in per pass of the event loop while the module is changed faster than that.
  static constexpr int kLinesPerPass = 1500;

  // host::CodeText::Listener: the module changed.
  void linesChanged(int firstLine, int removed, int inserted) override;
  void scheduleFlush();
  void flushSome();
  void documentChanged(int position, int charsRemoved, int charsAdded);
  /// Replaces the editor's lines [first, first + oldCount) by the module's [first, first + newCount).
  void replaceEditorLines(int first, int oldCount, int newCount);
  void reportSelection();
  void reportScroll(int value);
  void followViewRequest();
  void updateVisibleLines();
  int positionOf(int line, int column) const;

  std::shared_ptr<host::CodeModuleImpl> m_module;
  std::shared_ptr<host::CodePaneImpl> m_pane;
  QPointer<QPlainTextEdit> m_editor;
  /// The number of module lines the editor shows (0 for an empty module, which shows as one empty block).
  int m_editorLines = 0;
  /// The document revision last seen, so that changes of formats alone are not taken for edits.
  int m_revision = 0;
  std::optional<Pending> m_pending;
  bool m_flushPosted = false;
  bool m_toModel = false;
  bool m_toEditor = false;
  int m_lastVisibleLines = -1;
  ide::Connection m_viewRequest;
};

}  // namespace desktop

// SPDX-License-Identifier: MIT
// The text editor of a code window: a plain-text editor with the IDE's margin bar, VB colours, and the
// keyboard handed to the IDE's window system first, so that a hotkey registered on the code window reaches
// the window's procedure chain. A combination nobody registered, or one the chain passes on, reaches the
// editor unchanged.
#pragma once

#include "ide/types.h"

#include <QPlainTextEdit>

#include <functional>
#include <utility>
#include <vector>

namespace host {
class WindowSystemImpl;
}

namespace desktop {

class VbHighlighter;

class CodeEditor final : public QPlainTextEdit {
  Q_OBJECT

 public:
  explicit CodeEditor(QWidget* parent = nullptr);
  ~CodeEditor() override;

  /// The window system that receives the key combinations, and the code window they are pressed in.
  void setHotKeyTarget(host::WindowSystemImpl* windows, std::function<ide::HWnd()> window);
  /// Called before the editor handles input, so that it works on the module's latest text.
  void setBeforeInput(std::function<void()> hook) { m_beforeInput = std::move(hook); }
  VbHighlighter* highlighter() const { return m_highlighter; }
  int marginWidth() const { return kMarginWidth; }
  /// Takes the normal and selection colours of the code colour scheme.
  void applyColours();
  /// The lines (1-based) with a procedure separator above them, as the full module view draws.
  void setSeparators(std::vector<int> lines);
  const std::vector<int>& separators() const { return m_separators; }
  /// Shows only lines `first` to `last` (1-based), as the procedure view does; (0, 0) shows every line.
  void showLines(int first, int last);
  /// The lines shown: (0, 0) when every line is.
  std::pair<int, int> shownLines() const { return m_shown; }

 Q_SIGNALS:
  void contextMenuWanted(const QPoint& globalPosition);

 protected:
  bool event(QEvent* event) override;
  void keyPressEvent(QKeyEvent* event) override;
  void contextMenuEvent(QContextMenuEvent* event) override;
  void resizeEvent(QResizeEvent* event) override;
  void paintEvent(QPaintEvent* event) override;
  void inputMethodEvent(QInputMethodEvent* event) override;
  void insertFromMimeData(const QMimeData* source) override;

 private:
  static constexpr int kMarginWidth = 18;
  friend class MarginBar;
  void paintMargin(QPaintEvent* event);
  bool isRegisteredHotKey(QKeyEvent* event) const;

  QWidget* m_margin;
  VbHighlighter* m_highlighter;
  host::WindowSystemImpl* m_windows = nullptr;
  std::function<ide::HWnd()> m_window;
  std::function<void()> m_beforeInput;
  std::vector<int> m_separators;  // sorted
  std::pair<int, int> m_shown{0, 0};
};

}  // namespace desktop

// SPDX-License-Identifier: MIT
// A code window: the procedure list above the editor, the editor bound to the pane of its code module.
#pragma once

#include "host/model/objects.h"

#include <QTimer>
#include <QWidget>

#include <memory>

class QComboBox;

namespace desktop {

class CodeBinding;
class CodeEditor;

class CodeWindow final : public QWidget {
  Q_OBJECT

 public:
  /// A view of the pane of `window` (a code window of the model).
  explicit CodeWindow(const std::shared_ptr<host::WindowImpl>& window, QWidget* parent = nullptr);
  ~CodeWindow() override;

  CodeEditor* editor() const { return m_editor; }
  CodeBinding* binding() const { return m_binding; }
  const std::shared_ptr<host::WindowImpl>& window() const { return m_window; }
  std::shared_ptr<host::CodePaneImpl> pane() const;

 Q_SIGNALS:
  void caretMoved(int line, int column);
  void contextMenuWanted(const QPoint& globalPosition);
  void editRejected(const QString& message);

 private:
  void fillProcedures();
  void showProcedureOfCaret();
  void jumpToProcedure(int index);

  std::shared_ptr<host::WindowImpl> m_window;
  QComboBox* m_procedures;
  CodeEditor* m_editor;
  CodeBinding* m_binding;
  QTimer m_caretTimer;
  bool m_filling = false;
  int m_shownRevision = -1;
};

}  // namespace desktop

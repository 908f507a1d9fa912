// SPDX-License-Identifier: MIT
// A code window: the Object and Procedure boxes above the editor, the editor bound to the pane of its code
// module. The Object box lists "(General)" and the module's objects: the form (or user control, class ...)
// and its controls, a control array once. The Procedure box lists, for "(General)", "(Declarations)" and
// the procedures that are no object's event procedures; for an object, its events, those that have a
// procedure in bold. Choosing an event without a procedure writes its empty procedure at the end of the
// module and puts the caret in it; choosing an object goes to its first event procedure, or writes the
// procedure of its default event, as the IDE does. Both boxes show where the caret is. The Procedure View
// and Full Module View buttons left of the horizontal scroll bar show the procedure at the caret alone, or
// the whole module with a line above each procedure.
#pragma once

#include "host/model/objects.h"

#include <QTimer>
#include <QWidget>

#include <memory>
#include <vector>

class QComboBox;
class QToolButton;

namespace desktop {

class CodeBinding;
class CodeEditor;

/// An object of the Object box.
struct CodeObject {
  QString name;       // "Form", "cmdOk", "Class"
  QString className;  // "VB.Form", "VB.CommandButton", "Class"
  bool controlArray = false;
};

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
  QComboBox* objectList() const { return m_objects; }
  QComboBox* procedureList() const { return m_procedures; }
  QToolButton* procedureViewButton() const { return m_procedureViewButton; }
  QToolButton* fullModuleViewButton() const { return m_fullModuleViewButton; }
  /// Shows the procedure at the caret alone, or the whole module.
  void setProcedureView(bool procedureView);

  /// The objects of the module, in the Object box's order (without "(General)").
  std::vector<CodeObject> objects() const;
  /// Fills both boxes with what the module and its form hold now. They are otherwise filled when they
  /// open, so that typing stays cheap.
  void fillLists();
  /// What choosing an item of each box does.
  void chooseObject(const QString& object);
  void chooseProcedure(const QString& item, int index = -1);

 Q_SIGNALS:
  void caretMoved(int line, int column);
  void contextMenuWanted(const QPoint& globalPosition);
  void editRejected(const QString& message);

 private:
  void fillObjects();
  void fillProcedures(const QString& object);
  void showProcedureOfCaret();
  /// The separators of the module's procedures, and the lines the procedure view shows.
  void updateView();
  /// The object and event a procedure belongs to; an empty object for a general procedure.
  std::pair<QString, QString> ownerOf(const QString& procedure, const std::vector<CodeObject>& objects) const;
  /// Puts the caret at the start of the body of a procedure (an event procedure written first when missing).
  void goToProcedure(const QString& name, ide::ProcKind kind);
  void writeEventProcedure(const CodeObject& object, const QString& event);

  std::shared_ptr<host::WindowImpl> m_window;
  QComboBox* m_objects;
  QComboBox* m_procedures;
  CodeEditor* m_editor;
  CodeBinding* m_binding;
  QTimer m_caretTimer;
  QString m_proceduresOf;  // the object whose procedures the Procedure box holds
  bool m_filling = false;
  int m_shownRevision = -1;
  int m_separatorsRevision = -1;
  bool m_procedureView = false;
  QToolButton* m_procedureViewButton;
  QToolButton* m_fullModuleViewButton;
};

}  // namespace desktop

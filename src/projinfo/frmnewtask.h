// SPDX-License-Identifier: MIT
// The dialog that adds a task (mode 0) or edits one (mode 1): its name, which may not be blank, and a
// description in which Tab types a tab. Closing it with changes by its close box asks whether to save.
#pragma once

#include "projinfo/tasklist.h"

#include <QDialog>

class QLabel;
class QLineEdit;
class QPlainTextEdit;
class QPushButton;

namespace projinfo {

class frmTasks;

class frmNewTask final : public QDialog {
  Q_OBJECT

 public:
  enum Mode { NewTask = 0, EditTask = 1 };

  /// `task` is the task to edit (mode 1); `tasks` is refilled after a save.
  frmNewTask(CTaskList& list, frmTasks* tasks, Mode mode, std::shared_ptr<CTaskItem> task,
             QWidget* parent = nullptr);

  /// Captions and, for an edit, the task's texts.
  void Initialize();

  QLineEdit* txtName() const { return m_txtName; }
  QPlainTextEdit* txtDescription() const { return m_txtDescription; }
  QPushButton* cmdOK() const { return m_cmdOK; }
  QPushButton* cmdCancel() const { return m_cmdCancel; }
  bool changed() const { return m_changed; }

 protected:
  void closeEvent(QCloseEvent* event) override;
  /// Escape is Cancel.
  void reject() override;
  bool eventFilter(QObject* watched, QEvent* event) override;

 private:
  void cmdOK_Click();
  bool validate();
  /// Saves the task; false (reported) when writing it failed.
  bool save();
  ide::UserInterface& ui() const;

  CTaskList* m_list;
  frmTasks* m_tasks;
  Mode m_mode;
  std::shared_ptr<CTaskItem> m_task;
  QLineEdit* m_txtName;
  QPlainTextEdit* m_txtDescription;
  QLabel* m_lblTaskName;
  QLabel* m_lblDescription;
  QPushButton* m_cmdOK;
  QPushButton* m_cmdCancel;
  bool m_changed = false;
  bool m_cancelled = false;
  bool m_closing = false;
};

}  // namespace projinfo

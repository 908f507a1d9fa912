// SPDX-License-Identifier: MIT
// The task-list window of a project: one checkable row per task (the check is the done mark, written at
// once), newest first; Add and Edit open frmNewTask, Remove and the Delete key remove the selected tasks.
#pragma once

#include "projinfo/tasklist.h"

#include <QDialog>
#include <QPoint>

class QPushButton;
class QTreeWidget;
class QTreeWidgetItem;

namespace projinfo {

class frmTasks final : public QDialog {
  Q_OBJECT

 public:
  frmTasks(CTaskList& list, QWidget* parent = nullptr);

  QTreeWidget* lvTasks() const { return m_lvTasks; }
  QPushButton* cmdAdd() const { return m_cmdAdd; }
  QPushButton* cmdRemove() const { return m_cmdRemove; }
  QPushButton* cmdEdit() const { return m_cmdEdit; }
  QPushButton* cmdClose() const { return m_cmdClose; }

  /// Fills the list from the tasks, the last one first.
  void Initialize();
  /// Edit needs exactly one selected row, Remove at least one.
  void ItemChanged();

 protected:
  bool eventFilter(QObject* watched, QEvent* event) override;

 private:
  void lvTasks_ItemCheck(QTreeWidgetItem* row);
  void cmdAdd_Click();
  void cmdEdit_Click();
  void cmdRemove_Click();
  void cmdClose_Click();
  void edit(QTreeWidgetItem* row);
  std::shared_ptr<CTaskItem> taskOf(QTreeWidgetItem* row) const;
  ide::UserInterface& ui() const;

  CTaskList* m_list;
  QTreeWidget* m_lvTasks;
  QPushButton* m_cmdAdd;
  QPushButton* m_cmdRemove;
  QPushButton* m_cmdEdit;
  QPushButton* m_cmdClose;
  QPoint m_lastMouseDown;
  bool m_filling = false;
};

/// Opens the task-list window modally over `parent` (or over the IDE).
void showTaskList(CTaskList& list, QWidget* parent = nullptr);

}  // namespace projinfo

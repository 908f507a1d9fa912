// SPDX-License-Identifier: MIT
// The task list of a project: tasks with a name, a description and a done mark, kept in the project's
// info file (one record per task, written at once on every change) and shown in frmTasks.
#pragma once

#include "ide/vbide.h"
#include "projinfo/collection.h"
#include "projinfo/projinfo.h"

#include <QString>

#include <memory>

namespace projinfo {

class CTaskList;

class CTaskItem final : public InfoRecord {
 public:
  /// The list the task belongs to; set when it is loaded or added.
  CTaskList* owner = nullptr;
  QString Name;
  /// The description; may be empty or span several lines.
  QString Text;
  bool Done = false;

  QString Serialization() const override;
  /// Fills the task from a record text; raises when the record cannot be read.
  void setSerialization(const QString& text);
};

class CTaskList final : public InfoRecordList {
 public:
  /// `projInfo` owns the list and outlives it.
  explicit CTaskList(CProjInfo& projInfo) : m_projInfo(&projInfo) {}

  ide::Ref<ide::VBProject> Project;
  /// Keyed "Task" + identifier, in the order they were loaded or added.
  KeyedCollection<CTaskItem> Tasks;

  /// Removes the task's record and its entry.
  void DeleteTask(qint32 ItemId);
  void InitializeFromFile() override;
  /// Stores a new task, giving it its identifier.
  std::shared_ptr<CTaskItem> AddTask(std::shared_ptr<CTaskItem> task);
  /// Opens the task-list window on this list.
  void Show();
  /// Writes the task's record again.
  void UpdateTask(const CTaskItem& task);
  CProjInfo& projInfo() const { return *m_projInfo; }

  void insertRecord(const QString& key, std::shared_ptr<InfoRecord> item) override;
  void removeRecord(const QString& key) override { Tasks.Remove(key); }

 private:
  CProjInfo* m_projInfo;
};

}  // namespace projinfo

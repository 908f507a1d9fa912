// SPDX-License-Identifier: MIT
#include "projinfo/tasklist.h"

#include "common/errors.h"
#include "projinfo/records.h"

namespace projinfo {

QString CTaskItem::Serialization() const {
  return TaskRecord{Name, Text, Done, ItemId}.toText();
}

void CTaskItem::setSerialization(const QString& text) {
  const TaskRecord record = TaskRecord::fromText(text);
  Name = record.Name;
  Text = record.Text;
  Done = record.Done;
  ItemId = record.ItemId;
}

void CTaskList::InitializeFromFile() {
  Project = m_projInfo->Project();
  if (!m_projInfo->taskListStorage()) return;
  for (const VBSTATSTG& element : m_projInfo->taskListStorage()->Elements()) {
    // A record that cannot be read is left out, and left in the file as it is.
    try {
      auto task = std::make_shared<CTaskItem>();
      task->owner = this;
      task->setSerialization(m_projInfo->GetTaskListItem(element.Name()));
      Tasks.Add(QLatin1StringView(kTaskPrefix) + QString::number(task->ItemId), task);
    } catch (const std::exception& failure) {
      common::logFailure(failure, QStringLiteral("CTaskList"), QStringLiteral("InitializeFromFile"),
                         __LINE__);
    }
  }
}

void CTaskList::insertRecord(const QString& key, std::shared_ptr<InfoRecord> item) {
  auto task = std::dynamic_pointer_cast<CTaskItem>(item);
  if (!task) ide::raise(ide::err::InvalidProcedureCall);
  Tasks.Add(key, task);
}

std::shared_ptr<CTaskItem> CTaskList::AddTask(std::shared_ptr<CTaskItem> task) {
  task->owner = this;
  m_projInfo->AddTaskListItem(task);
  return task;
}

void CTaskList::DeleteTask(qint32 ItemId) {
  m_projInfo->DeleteTask(ItemId);
}

void CTaskList::UpdateTask(const CTaskItem& task) {
  m_projInfo->WriteTaskListItem(QLatin1StringView(kTaskPrefix) + QString::number(task.ItemId),
                                task.Serialization());
}

void CTaskList::Show() {
  if (m_projInfo->services().showTasks) m_projInfo->services().showTasks(*this);
}

}  // namespace projinfo

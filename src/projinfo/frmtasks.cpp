// SPDX-License-Identifier: MIT
#include "projinfo/frmtasks.h"

#include "common/errors.h"
#include "common/strings.h"
#include "projinfo/frmnewtask.h"
#include "projinfo/texts.h"

#include <QHBoxLayout>
#include <QHeaderView>
#include <QKeyEvent>
#include <QPushButton>
#include <QTreeWidget>
#include <QVBoxLayout>

namespace projinfo {
namespace {

constexpr int kKeyRole = Qt::UserRole;
constexpr int kTagRole = Qt::UserRole + 1;

}  // namespace

frmTasks::frmTasks(CTaskList& list, QWidget* parent)
    : QDialog(parent),
      m_list(&list),
      m_lvTasks(new QTreeWidget(this)),
      m_cmdAdd(new QPushButton(common::LoadResString(kAddTask), this)),
      m_cmdRemove(new QPushButton(common::LoadResString(kRemoveTask), this)),
      m_cmdEdit(new QPushButton(common::LoadResString(kEditTask), this)),
      m_cmdClose(new QPushButton(common::LoadResString(kCloseTasks), this)) {
  setObjectName(QStringLiteral("frmTasks"));
  const QString project = list.Project ? list.Project->Name() : QString();
  setWindowTitle(common::title() + QStringLiteral(": ") + project + QStringLiteral(" - ") +
                 common::LoadResString(kTasksCaption));
  m_lvTasks->setObjectName(QStringLiteral("lvTasks"));
  m_cmdAdd->setObjectName(QStringLiteral("cmdAdd"));
  m_cmdRemove->setObjectName(QStringLiteral("cmdRemove"));
  m_cmdEdit->setObjectName(QStringLiteral("cmdEdit"));
  m_cmdClose->setObjectName(QStringLiteral("cmdClose"));

  m_lvTasks->setColumnCount(1);
  m_lvTasks->setHeaderLabels({common::LoadResString(kTasksHeader)});
  m_lvTasks->header()->setStretchLastSection(true);
  m_lvTasks->setRootIsDecorated(false);
  m_lvTasks->setSelectionMode(QAbstractItemView::ExtendedSelection);
  m_lvTasks->viewport()->installEventFilter(this);
  m_lvTasks->installEventFilter(this);

  auto* buttons = new QVBoxLayout;
  for (QPushButton* button : {m_cmdAdd, m_cmdRemove, m_cmdEdit, m_cmdClose}) {
    button->setAutoDefault(false);
    buttons->addWidget(button);
  }
  buttons->addStretch();
  auto* layout = new QHBoxLayout(this);
  layout->addWidget(m_lvTasks, 1);
  layout->addLayout(buttons);
  resize(520, 320);

  connect(m_lvTasks, &QTreeWidget::itemChanged, this, [this](QTreeWidgetItem* row) {
    if (!m_filling) lvTasks_ItemCheck(row);
  });
  connect(m_lvTasks, &QTreeWidget::itemSelectionChanged, this, &frmTasks::ItemChanged);
  connect(m_lvTasks, &QTreeWidget::itemDoubleClicked, this,
          [this] { edit(m_lvTasks->itemAt(m_lastMouseDown)); });
  connect(m_cmdAdd, &QPushButton::clicked, this, &frmTasks::cmdAdd_Click);
  connect(m_cmdEdit, &QPushButton::clicked, this, &frmTasks::cmdEdit_Click);
  connect(m_cmdRemove, &QPushButton::clicked, this, &frmTasks::cmdRemove_Click);
  connect(m_cmdClose, &QPushButton::clicked, this, &frmTasks::cmdClose_Click);

  Initialize();
  // The window's focus rests on its list, also when it comes back from the task dialog.
  setFocusProxy(m_lvTasks);
  m_lvTasks->setFocus();
}

ide::UserInterface& frmTasks::ui() const {
  return m_list->projInfo().services().vbe->Platform().ui();
}

void frmTasks::Initialize() {
  m_filling = true;
  m_lvTasks->clear();
  for (int i = m_list->Tasks.Count(); i >= 1; --i) {
    const auto task = m_list->Tasks.Item(i);
    auto* row = new QTreeWidgetItem(m_lvTasks, {task->Name});
    row->setFlags(Qt::ItemIsEnabled | Qt::ItemIsSelectable | Qt::ItemIsUserCheckable);
    row->setData(0, kKeyRole, QLatin1StringView(kTaskPrefix) + QString::number(task->ItemId));
    row->setData(0, kTagRole, task->ItemId);
    row->setCheckState(0, task->Done ? Qt::Checked : Qt::Unchecked);
  }
  m_filling = false;
  ItemChanged();
}

void frmTasks::ItemChanged() {
  const auto selected = m_lvTasks->selectedItems().size();
  m_cmdEdit->setEnabled(selected == 1);
  m_cmdRemove->setEnabled(selected >= 1);
}

std::shared_ptr<CTaskItem> frmTasks::taskOf(QTreeWidgetItem* row) const {
  return row ? m_list->Tasks.Item(row->data(0, kKeyRole).toString()) : nullptr;
}

void frmTasks::lvTasks_ItemCheck(QTreeWidgetItem* row) {
  const auto task = taskOf(row);
  if (!task) return;
  const bool done = row->checkState(0) == Qt::Checked;
  if (task->Done == done) return;
  task->Done = done;
  try {
    m_list->UpdateTask(*task);
  } catch (const std::exception& failure) {
    common::recordError(failure, QStringLiteral("frmTasks"), QStringLiteral("lvTasks_ItemCheck"), __LINE__);
    common::ShowErrorReport(ui());
  }
}

void frmTasks::cmdAdd_Click() {
  frmNewTask dialog(*m_list, this, frmNewTask::NewTask, nullptr, this);
  dialog.Initialize();
  dialog.exec();
}

void frmTasks::cmdEdit_Click() {
  const auto rows = m_lvTasks->selectedItems();
  if (rows.size() == 1) edit(rows.front());
}

void frmTasks::edit(QTreeWidgetItem* row) {
  const auto task = taskOf(row);
  if (!task) return;
  frmNewTask dialog(*m_list, this, frmNewTask::EditTask, task, this);
  dialog.Initialize();
  dialog.exec();
}

void frmTasks::cmdRemove_Click() {
  for (int i = 0; i < m_lvTasks->topLevelItemCount();) {
    QTreeWidgetItem* row = m_lvTasks->topLevelItem(i);
    if (!row->isSelected()) {
      ++i;
      continue;
    }
    try {
      m_list->DeleteTask(row->data(0, kTagRole).toInt());
    } catch (const std::exception& failure) {
      common::recordErrorNumber(failure);
      ui().MsgBox(common::LoadResString(kRemoveFailed), ide::mb::Information, common::title());
    }
    delete row;  // the next row moves up to this index
  }
  ItemChanged();
}

void frmTasks::cmdClose_Click() {
  accept();
}

bool frmTasks::eventFilter(QObject* watched, QEvent* event) {
  if (watched == m_lvTasks->viewport() && event->type() == QEvent::MouseButtonPress)
    m_lastMouseDown = static_cast<QMouseEvent*>(event)->position().toPoint();
  if (watched == m_lvTasks && event->type() == QEvent::KeyPress &&
      static_cast<QKeyEvent*>(event)->key() == Qt::Key_Delete) {
    cmdRemove_Click();
    return true;
  }
  return QDialog::eventFilter(watched, event);
}

void showTaskList(CTaskList& list, QWidget* parent) {
  if (!parent)
    parent = qobject_cast<QWidget*>(list.projInfo().services().vbe->Platform().ui().dialogParent());
  frmTasks dialog(list, parent);
  dialog.exec();
}

}  // namespace projinfo

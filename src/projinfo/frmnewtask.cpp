// SPDX-License-Identifier: MIT
#include "projinfo/frmnewtask.h"

#include "common/errors.h"
#include "common/strings.h"
#include "projinfo/frmtasks.h"
#include "projinfo/texts.h"

#include <QCloseEvent>
#include <QGridLayout>
#include <QLabel>
#include <QLineEdit>
#include <QPlainTextEdit>
#include <QPushButton>
#include <QTimer>
#include <QTreeWidget>
#include <QVBoxLayout>

namespace projinfo {

frmNewTask::frmNewTask(CTaskList& list, frmTasks* tasks, Mode mode, std::shared_ptr<CTaskItem> task,
                       QWidget* parent)
    : QDialog(parent),
      m_list(&list),
      m_tasks(tasks),
      m_mode(mode),
      m_task(std::move(task)),
      m_txtName(new QLineEdit(this)),
      m_txtDescription(new QPlainTextEdit(this)),
      m_lblTaskName(new QLabel(common::LoadResString(kTaskNameLabel), this)),
      m_lblDescription(new QLabel(common::LoadResString(kTaskDescriptionLabel), this)),
      m_cmdOK(new QPushButton(QStringLiteral("OK"), this)),
      m_cmdCancel(new QPushButton(common::LoadResString(kTaskCancel), this)) {
  setObjectName(QStringLiteral("frmNewTask"));
  m_txtName->setObjectName(QStringLiteral("txtName"));
  m_txtDescription->setObjectName(QStringLiteral("txtDescription"));
  m_lblTaskName->setObjectName(QStringLiteral("lblTaskName"));
  m_lblDescription->setObjectName(QStringLiteral("lblDescription"));
  m_cmdOK->setObjectName(QStringLiteral("cmdOK"));
  m_cmdCancel->setObjectName(QStringLiteral("cmdCancel"));
  m_lblTaskName->setBuddy(m_txtName);
  m_lblDescription->setBuddy(m_txtDescription);
  // Tab types a tab in the description, as a note in a task may well be indented.
  m_txtDescription->setTabChangesFocus(false);
  m_cmdOK->setDefault(true);

  auto* buttons = new QVBoxLayout;
  buttons->addWidget(m_cmdOK);
  buttons->addWidget(m_cmdCancel);
  buttons->addStretch();
  auto* fields = new QVBoxLayout;
  fields->addWidget(m_lblTaskName);
  fields->addWidget(m_txtName);
  fields->addWidget(m_lblDescription);
  fields->addWidget(m_txtDescription, 1);
  auto* layout = new QHBoxLayout(this);
  layout->addLayout(fields, 1);
  layout->addLayout(buttons);
  resize(480, 280);

  connect(m_txtName, &QLineEdit::textChanged, this, [this] { m_changed = true; });
  connect(m_txtDescription, &QPlainTextEdit::textChanged, this, [this] { m_changed = true; });
  connect(m_cmdOK, &QPushButton::clicked, this, &frmNewTask::cmdOK_Click);
  connect(m_cmdCancel, &QPushButton::clicked, this, &frmNewTask::reject);
  m_txtName->installEventFilter(this);
}

ide::UserInterface& frmNewTask::ui() const {
  return m_list->projInfo().services().vbe->Platform().ui();
}

void frmNewTask::Initialize() {
  const QString project = m_list->Project ? m_list->Project->Name() : QString();
  const int caption = m_mode == NewTask ? 5060 : 5154;
  setWindowTitle(common::title() + QStringLiteral(": ") + project + QStringLiteral(" - ") +
                 common::LoadResString(caption));
  if (m_mode == EditTask && m_task) {
    m_txtName->setText(m_task->Name);
    m_txtDescription->setPlainText(m_task->Text);
  }
  m_changed = false;
  m_txtName->setFocus();
}

bool frmNewTask::eventFilter(QObject* watched, QEvent* event) {
  // The whole name is selected when the box gets the focus, whichever way it gets it.
  if (watched == m_txtName && event->type() == QEvent::FocusIn)
    QTimer::singleShot(0, m_txtName, [box = m_txtName] { box->selectAll(); });
  return QDialog::eventFilter(watched, event);
}

bool frmNewTask::validate() {
  if (!m_txtName->text().trimmed().isEmpty()) return true;
  ui().MsgBox(common::LoadResString(kEmptyName), ide::mb::Exclamation, common::title());
  m_txtName->setFocus();
  return false;
}

bool frmNewTask::save() {
  try {
    if (m_mode == NewTask) {
      auto task = std::make_shared<CTaskItem>();
      task->owner = m_list;
      task->Name = m_txtName->text();
      task->Text = m_txtDescription->toPlainText();
      m_list->AddTask(task);
    } else if (m_task) {
      m_task->Name = m_txtName->text();
      m_task->Text = m_txtDescription->toPlainText();
      m_list->UpdateTask(*m_task);
    }
  } catch (const std::exception& failure) {
    common::recordError(failure, QStringLiteral("frmNewTask"), QStringLiteral("Save"), __LINE__);
    common::ShowErrorReport(ui());
    return false;
  }
  m_changed = false;
  if (m_tasks) {
    m_tasks->lvTasks()->setUpdatesEnabled(false);
    m_tasks->Initialize();
    m_tasks->lvTasks()->setUpdatesEnabled(true);
  }
  return true;
}

void frmNewTask::cmdOK_Click() {
  if (m_changed && !(validate() && save())) return;
  m_closing = true;
  accept();
}

void frmNewTask::reject() {
  m_cancelled = true;
  m_closing = true;
  QDialog::reject();
}

void frmNewTask::closeEvent(QCloseEvent* event) {
  if (!m_closing && m_changed && !m_cancelled) {
    const int answer =
        ui().MsgBox(common::LoadResString(kSaveChanges), ide::mb::YesNo | ide::mb::Question, common::title());
    if (answer == ide::mb::Yes && !(validate() && save())) {
      event->ignore();
      return;
    }
  }
  m_closing = true;
  event->accept();
  QDialog::done(Accepted);
}

}  // namespace projinfo

// SPDX-License-Identifier: MIT
#include "addinmanager.h"

#include <QCheckBox>
#include <QDialogButtonBox>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QHeaderView>
#include <QLabel>
#include <QPushButton>
#include <QTreeWidget>
#include <QVBoxLayout>

namespace desktop {

AddInManagerDialog::AddInManagerDialog(host::AddInsImpl& addIns, QWidget* parent)
    : QDialog(parent), m_addIns(addIns) {
  setObjectName(QStringLiteral("addInManager"));
  setWindowTitle(QStringLiteral("Add-In Manager"));
  for (const auto& addIn : addIns.addIns())
    m_choices.push_back(Choice{addIn, addIn->Connect(), addIn->loadOnStartup()});

  m_list = new QTreeWidget(this);
  m_list->setObjectName(QStringLiteral("addInList"));
  m_list->setHeaderLabels({QStringLiteral("Available Add-Ins"), QStringLiteral("Load Behavior")});
  m_list->setRootIsDecorated(false);
  m_list->header()->setSectionResizeMode(0, QHeaderView::Stretch);
  m_list->header()->setStretchLastSection(false);
  m_list->header()->resizeSection(1, 170);
  for (const Choice& choice : m_choices) {
    auto* item = new QTreeWidgetItem(m_list);
    item->setText(
        0, choice.addIn->Description().isEmpty() ? choice.addIn->ProgId() : choice.addIn->Description());
    item->setText(1, behaviour(choice));
    item->setToolTip(0, choice.addIn->libraryPath());
  }
  m_description = new QLabel(this);
  m_description->setObjectName(QStringLiteral("addInDescription"));
  m_description->setWordWrap(true);
  m_description->setMinimumHeight(40);
  m_loaded = new QCheckBox(QStringLiteral("&Loaded/Unloaded"), this);
  m_loaded->setObjectName(QStringLiteral("loadedCheck"));
  m_onStartup = new QCheckBox(QStringLiteral("Load on &Startup"), this);
  m_onStartup->setObjectName(QStringLiteral("startupCheck"));
  auto* behaviourBox = new QGroupBox(QStringLiteral("Load Behavior"), this);
  auto* behaviourLayout = new QVBoxLayout(behaviourBox);
  behaviourLayout->addWidget(m_loaded);
  behaviourLayout->addWidget(m_onStartup);
  auto* descriptionBox = new QGroupBox(QStringLiteral("Description"), this);
  auto* descriptionLayout = new QVBoxLayout(descriptionBox);
  descriptionLayout->addWidget(m_description);
  auto* bottom = new QHBoxLayout;
  bottom->addWidget(descriptionBox, 1);
  bottom->addWidget(behaviourBox);
  auto* buttons = new QDialogButtonBox(QDialogButtonBox::Ok | QDialogButtonBox::Cancel, this);
  buttons->button(QDialogButtonBox::Ok)->setObjectName(QStringLiteral("okButton"));
  buttons->button(QDialogButtonBox::Cancel)->setObjectName(QStringLiteral("cancelButton"));
  auto* layout = new QVBoxLayout(this);
  layout->addWidget(m_list);
  layout->addLayout(bottom);
  layout->addWidget(buttons);
  resize(560, 380);

  connect(buttons, &QDialogButtonBox::accepted, this, &QDialog::accept);
  connect(buttons, &QDialogButtonBox::rejected, this, &QDialog::reject);
  connect(m_list, &QTreeWidget::currentItemChanged, this, [this] { showChoice(); });
  connect(m_loaded, &QCheckBox::toggled, this, [this] { takeChoice(); });
  connect(m_onStartup, &QCheckBox::toggled, this, [this] { takeChoice(); });
  if (m_list->topLevelItemCount() > 0) m_list->setCurrentItem(m_list->topLevelItem(0));
  showChoice();
}

QString AddInManagerDialog::behaviour(const Choice& choice) {
  QString text = choice.loaded ? QStringLiteral("Loaded") : QString();
  if (choice.onStartup) text += text.isEmpty() ? QStringLiteral("Startup") : QStringLiteral("/Startup");
  return text;
}

void AddInManagerDialog::showChoice() {
  const int row = m_list->currentItem() ? m_list->indexOfTopLevelItem(m_list->currentItem()) : -1;
  const bool valid = row >= 0 && row < static_cast<int>(m_choices.size());
  m_loaded->setEnabled(valid);
  m_onStartup->setEnabled(valid);
  if (!valid) {
    m_description->setText(QStringLiteral("No add-in is registered."));
    return;
  }
  const Choice& choice = m_choices[static_cast<size_t>(row)];
  const QSignalBlocker blockLoaded(m_loaded);
  const QSignalBlocker blockStartup(m_onStartup);
  m_loaded->setChecked(choice.loaded);
  m_onStartup->setChecked(choice.onStartup);
  m_description->setText(choice.addIn->details());
}

void AddInManagerDialog::takeChoice() {
  QTreeWidgetItem* item = m_list->currentItem();
  const int row = item ? m_list->indexOfTopLevelItem(item) : -1;
  if (row < 0 || row >= static_cast<int>(m_choices.size())) return;
  Choice& choice = m_choices[static_cast<size_t>(row)];
  choice.loaded = m_loaded->isChecked();
  choice.onStartup = m_onStartup->isChecked();
  item->setText(1, behaviour(choice));
}

void AddInManagerDialog::apply(const std::function<void(const QString&)>& report) {
  for (const Choice& choice : m_choices) {
    choice.addIn->setLoadOnStartup(choice.onStartup);
    if (m_store) m_store(choice.addIn->ProgId(), choice.onStartup);
    if (choice.loaded == choice.addIn->Connect()) continue;
    try {
      choice.addIn->setConnect(choice.loaded);
    } catch (const ide::Error& error) {
      if (report) report(error.description());
    }
  }
}

}  // namespace desktop

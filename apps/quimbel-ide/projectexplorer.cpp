// SPDX-License-Identifier: MIT
#include "projectexplorer.h"

#include "host/model/events.h"
#include "icons.h"

#include <QAction>
#include <QContextMenuEvent>
#include <QFileInfo>
#include <QHeaderView>
#include <QScrollBar>
#include <QTimer>
#include <QToolBar>
#include <QVBoxLayout>

#include <set>

namespace desktop {
namespace {

enum Role { KindRole = Qt::UserRole + 1, PointerRole };
enum Kind { ProjectNode = 1, FolderNode, ComponentNode };

struct Folder {
  const char* title;
  std::vector<ide::ComponentType> types;
};

const std::vector<Folder>& folders() {
  using T = ide::ComponentType;
  static const std::vector<Folder> list = {
      {"Forms", {T::VBForm, T::VBMDIForm}},
      {"Modules", {T::StdModule}},
      {"Class Modules", {T::ClassModule}},
      {"User Controls", {T::UserControl}},
      {"Property Pages", {T::PropPage}},
      {"User Documents", {T::DocObject}},
      {"Designers", {T::ActiveXDesigner, T::MSForm}},
      {"Related Documents", {T::RelatedDocument, T::ResFile}},
  };
  return list;
}

QString fileLabel(const QString& name, const QString& path) {
  return path.isEmpty() ? name : QStringLiteral("%1 (%2)").arg(name, QFileInfo(path).fileName());
}

}  // namespace

ProjectExplorer::ProjectExplorer(std::shared_ptr<host::VbeImpl> vbe, QWidget* parent)
    : QTreeWidget(parent), m_vbe(std::move(vbe)) {
  setObjectName(QStringLiteral("projectExplorer"));
  setHeaderHidden(true);
  setColumnCount(1);
  setIconSize(QSize(16, 16));
  setUniformRowHeights(true);
  setExpandsOnDoubleClick(false);
  auto& events = m_vbe->events();
  auto refreshLater = [this](auto&&...) { scheduleRefresh(); };
  m_connections.push_back(events.projects->ItemAdded.connect(refreshLater));
  m_connections.push_back(events.projects->ItemRemoved.connect(refreshLater));
  m_connections.push_back(events.projects->ItemRenamed.connect(refreshLater));
  m_connections.push_back(events.projects->ItemActivated.connect(refreshLater));
  m_connections.push_back(events.components->ItemAdded.connect(refreshLater));
  m_connections.push_back(events.components->ItemRemoved.connect(refreshLater));
  m_connections.push_back(events.components->ItemRenamed.connect(refreshLater));
  m_connections.push_back(events.components->ItemSelected.connect([this](auto&&...) { followSelection(); }));
  m_connections.push_back(events.files->AfterChangeFileName.connect(refreshLater));
  connect(this, &QTreeWidget::currentItemChanged, this,
          [this](QTreeWidgetItem* item) { currentChanged(item); });
  connect(this, &QTreeWidget::itemActivated, this, [this](QTreeWidgetItem* item) {
    if (auto component = componentOf(item))
      Q_EMIT openWanted(component, !component->hasDesigner());
    else if (item)
      item->setExpanded(!item->isExpanded());
  });
  refresh();
}

ProjectExplorer::~ProjectExplorer() = default;

void ProjectExplorer::scheduleRefresh() {
  if (m_refreshPending) return;
  m_refreshPending = true;
  QTimer::singleShot(0, this, [this] {
    if (m_refreshPending) refresh();
  });
}

void ProjectExplorer::refresh() {
  m_refreshPending = false;
  // Keep what the user folded away.
  std::set<QString> collapsed;
  for (QTreeWidgetItemIterator it(this); *it; ++it)
    if ((*it)->childCount() > 0 && !(*it)->isExpanded())
      collapsed.insert((*it)->data(0, Qt::UserRole).toString());

  m_syncing = true;
  clear();
  auto active = m_vbe->ActiveVBProject();
  for (const auto& project : m_vbe->projects()) {
    auto* projectItem = new QTreeWidgetItem(this);
    projectItem->setText(0, fileLabel(project->Name(), project->FileName()));
    projectItem->setIcon(0, icon(Glyph::Project));
    projectItem->setData(0, KindRole, ProjectNode);
    projectItem->setData(0, PointerRole,
                         QVariant::fromValue<quintptr>(reinterpret_cast<quintptr>(project.get())));
    projectItem->setData(0, Qt::UserRole, project->Name());
    if (project == active) {
      QFont bold = font();
      bold.setBold(true);
      projectItem->setFont(0, bold);
    }
    const auto addComponent = [&](QTreeWidgetItem* parent,
                                  const std::shared_ptr<host::ComponentImpl>& component) {
      auto* item = new QTreeWidgetItem(parent);
      item->setText(0, fileLabel(component->Name(), component->filePath()));
      item->setIcon(0, componentIcon(component->Type()));
      item->setData(0, KindRole, ComponentNode);
      item->setData(0, PointerRole,
                    QVariant::fromValue<quintptr>(reinterpret_cast<quintptr>(component.get())));
      item->setData(0, Qt::UserRole, project->Name() + u'.' + component->Name());
    };
    if (!m_showFolders) {
      auto components = project->components();
      std::sort(components.begin(), components.end(), [](const auto& a, const auto& b) {
        return a->Name().compare(b->Name(), Qt::CaseInsensitive) < 0;
      });
      for (const auto& component : components)
        addComponent(projectItem, component);
    }
    for (const Folder& folder : m_showFolders ? folders() : std::vector<Folder>{}) {
      QTreeWidgetItem* folderItem = nullptr;
      for (const auto& component : project->components()) {
        if (std::find(folder.types.begin(), folder.types.end(), component->Type()) == folder.types.end())
          continue;
        if (!folderItem) {
          folderItem = new QTreeWidgetItem(projectItem);
          folderItem->setText(0, QString::fromLatin1(folder.title));
          folderItem->setIcon(0, icon(Glyph::Folder));
          folderItem->setData(0, KindRole, FolderNode);
          folderItem->setData(0, Qt::UserRole, project->Name() + u'/' + QString::fromLatin1(folder.title));
        }
        addComponent(folderItem, component);
      }
      if (folderItem) folderItem->setExpanded(!collapsed.count(folderItem->data(0, Qt::UserRole).toString()));
    }
    projectItem->setExpanded(!collapsed.count(projectItem->data(0, Qt::UserRole).toString()));
  }
  m_syncing = false;
  followSelection();
  keepRootInView();
}

void ProjectExplorer::setShowFolders(bool show) {
  if (show == m_showFolders) return;
  m_showFolders = show;
  refresh();
}

QString ProjectExplorer::title() const {
  QString name;
  if (!m_vbe->groupFileName().isEmpty())
    name = QFileInfo(m_vbe->groupFileName()).completeBaseName();
  else if (auto active = m_vbe->ActiveVBProject())
    name = active->Name();
  return name.isEmpty() ? QStringLiteral("Project") : QStringLiteral("Project - ") + name;
}

void ProjectExplorer::keepRootInView() {
  QTreeWidgetItem* item = currentItem();
  if (!item || topLevelItemCount() == 0) return;
  // The current item's place below the first row, measured on the rows the tree shows.
  const int rowHeight = std::max(1, visualItemRect(topLevelItem(0)).height());
  int rows = 0;
  for (QTreeWidgetItemIterator it(this, QTreeWidgetItemIterator::NotHidden); *it && *it != item; ++it) {
    bool shown = true;
    for (QTreeWidgetItem* parent = (*it)->parent(); parent; parent = parent->parent())
      shown = shown && parent->isExpanded();
    rows += shown ? 1 : 0;
  }
  if ((rows + 1) * rowHeight <= viewport()->height()) verticalScrollBar()->setValue(0);
}

std::shared_ptr<host::ComponentImpl> ProjectExplorer::componentOf(const QTreeWidgetItem* item) const {
  if (!item || item->data(0, KindRole).toInt() != ComponentNode) return nullptr;
  const quintptr pointer = item->data(0, PointerRole).value<quintptr>();
  for (const auto& project : m_vbe->projects())
    for (const auto& component : project->components())
      if (reinterpret_cast<quintptr>(component.get()) == pointer) return component;
  return nullptr;
}

std::shared_ptr<host::ProjectImpl> ProjectExplorer::projectOf(const QTreeWidgetItem* item) const {
  while (item && item->data(0, KindRole).toInt() != ProjectNode)
    item = item->parent();
  if (!item) return nullptr;
  const quintptr pointer = item->data(0, PointerRole).value<quintptr>();
  for (const auto& project : m_vbe->projects())
    if (reinterpret_cast<quintptr>(project.get()) == pointer) return project;
  return nullptr;
}

QTreeWidgetItem* ProjectExplorer::itemOf(const host::ComponentImpl* component) const {
  for (QTreeWidgetItemIterator it(const_cast<ProjectExplorer*>(this)); *it; ++it)
    if ((*it)->data(0, KindRole).toInt() == ComponentNode &&
        (*it)->data(0, PointerRole).value<quintptr>() == reinterpret_cast<quintptr>(component))
      return *it;
  return nullptr;
}

QTreeWidgetItem* ProjectExplorer::itemOf(const host::ProjectImpl* project) const {
  for (int i = 0; i < topLevelItemCount(); ++i)
    if (topLevelItem(i)->data(0, PointerRole).value<quintptr>() == reinterpret_cast<quintptr>(project))
      return topLevelItem(i);
  return nullptr;
}

void ProjectExplorer::selectComponent(const std::shared_ptr<host::ComponentImpl>& component) {
  if (m_refreshPending) refresh();
  if (QTreeWidgetItem* item = itemOf(component.get())) {
    setCurrentItem(item);
    scrollToItem(item);
    keepRootInView();
  }
}

void ProjectExplorer::followSelection() {
  if (m_syncing || m_refreshPending) return;
  auto selected = std::dynamic_pointer_cast<host::ComponentImpl>(m_vbe->SelectedVBComponent());
  QTreeWidgetItem* item = selected ? itemOf(selected.get()) : nullptr;
  if (!item) {
    if (auto active = std::dynamic_pointer_cast<host::ProjectImpl>(m_vbe->ActiveVBProject()))
      item = itemOf(active.get());
  }
  if (!item || item == currentItem()) return;
  m_syncing = true;
  setCurrentItem(item);
  m_syncing = false;
  keepRootInView();
}

void ProjectExplorer::currentChanged(QTreeWidgetItem* item) {
  if (m_syncing || !item) return;
  m_syncing = true;
  if (auto component = componentOf(item)) {
    m_vbe->selectComponent(component);
  } else if (auto project = projectOf(item)) {
    m_vbe->setActiveVBProject(project);
  }
  m_syncing = false;
}

void ProjectExplorer::contextMenuEvent(QContextMenuEvent* event) {
  if (QTreeWidgetItem* item = itemAt(viewport()->mapFromGlobal(event->globalPos()))) setCurrentItem(item);
  Q_EMIT contextMenuWanted(event->globalPos());
}

// ---------------------------------------------------------------------------------------------------

ProjectWindow::ProjectWindow(ProjectExplorer* explorer, QWidget* parent)
    : QWidget(parent), m_explorer(explorer) {
  setObjectName(QStringLiteral("projectWindow"));
  auto* bar = new QToolBar(this);
  bar->setObjectName(QStringLiteral("projectWindowBar"));
  bar->setIconSize(QSize(16, 16));
  m_viewCode = bar->addAction(icon(Glyph::ViewCode), QStringLiteral("View Code"));
  m_viewObject = bar->addAction(icon(Glyph::ViewObject), QStringLiteral("View Object"));
  m_toggleFolders = bar->addAction(icon(Glyph::Folder), QStringLiteral("Toggle Folders"));
  m_toggleFolders->setCheckable(true);
  m_toggleFolders->setChecked(explorer->showFolders());
  auto* layout = new QVBoxLayout(this);
  layout->setContentsMargins(0, 0, 0, 0);
  layout->setSpacing(0);
  layout->addWidget(bar);
  layout->addWidget(explorer);
  const auto open = [this](bool code) {
    if (auto component = m_explorer->componentOf(m_explorer->currentItem()))
      Q_EMIT m_explorer->openWanted(component, code || !component->hasDesigner());
  };
  connect(m_viewCode, &QAction::triggered, this, [open] { open(true); });
  connect(m_viewObject, &QAction::triggered, this, [open] { open(false); });
  connect(m_toggleFolders, &QAction::toggled, explorer, &ProjectExplorer::setShowFolders);
  connect(explorer, &QTreeWidget::currentItemChanged, this, [this] { updateButtons(); });
  updateButtons();
}

void ProjectWindow::updateButtons() {
  auto component = m_explorer->componentOf(m_explorer->currentItem());
  m_viewCode->setEnabled(component && component->codeModule());
  m_viewObject->setEnabled(component && component->hasDesigner());
}

}  // namespace desktop

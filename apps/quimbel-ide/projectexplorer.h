// SPDX-License-Identifier: MIT
// The project window: the open projects with their components in folders by type (or, with the folders
// toggled off, sorted by name right under their project). Selecting a component makes it the IDE's
// selected component (which fires the selection event); double-clicking opens its designer, or its code
// when it has none. The tree is rebuilt from the model after project and component events, from the event
// loop, since those events fire while the model is still changing. The first project stays in view
// whenever the selected item leaves room for it. ProjectWindow puts the window's toolbar above the tree.
#pragma once

#include "host/model/vbe.h"
#include "ide/signal.h"

#include <QTreeWidget>
#include <QWidget>

#include <memory>
#include <vector>

namespace desktop {

class ProjectExplorer final : public QTreeWidget {
  Q_OBJECT

 public:
  explicit ProjectExplorer(std::shared_ptr<host::VbeImpl> vbe, QWidget* parent = nullptr);
  ~ProjectExplorer() override;

  /// Rebuilds the tree now (it is otherwise rebuilt from the event loop after a change).
  void refresh();
  QTreeWidgetItem* itemOf(const host::ComponentImpl* component) const;
  QTreeWidgetItem* itemOf(const host::ProjectImpl* project) const;
  std::shared_ptr<host::ComponentImpl> componentOf(const QTreeWidgetItem* item) const;
  std::shared_ptr<host::ProjectImpl> projectOf(const QTreeWidgetItem* item) const;
  /// Selects a component's item, which selects the component in the IDE.
  void selectComponent(const std::shared_ptr<host::ComponentImpl>& component);
  /// Components in folders by their type (the IDE's default), or right under their project.
  void setShowFolders(bool show);
  bool showFolders() const { return m_showFolders; }
  /// The window's title: "Project - " and the group's name, or the project's when there is no group.
  QString title() const;

 Q_SIGNALS:
  void openWanted(const std::shared_ptr<host::ComponentImpl>& component, bool code);
  void contextMenuWanted(const QPoint& globalPosition);

 protected:
  void contextMenuEvent(QContextMenuEvent* event) override;

 private:
  void scheduleRefresh();
  void followSelection();
  void currentChanged(QTreeWidgetItem* item);
  /// Scrolls to the top when the current item is still seen there.
  void keepRootInView();

  std::shared_ptr<host::VbeImpl> m_vbe;
  std::vector<ide::Connection> m_connections;
  bool m_refreshPending = false;
  bool m_syncing = false;
  bool m_showFolders = true;
};

/// The project window: its View Code, View Object and Toggle Folders buttons above the tree.
class ProjectWindow final : public QWidget {
  Q_OBJECT

 public:
  ProjectWindow(ProjectExplorer* explorer, QWidget* parent = nullptr);
  QAction* viewCode() const { return m_viewCode; }
  QAction* viewObject() const { return m_viewObject; }
  QAction* toggleFolders() const { return m_toggleFolders; }

 private:
  void updateButtons();

  ProjectExplorer* m_explorer;
  QAction* m_viewCode;
  QAction* m_viewObject;
  QAction* m_toggleFolders;
};

}  // namespace desktop

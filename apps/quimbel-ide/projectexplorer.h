// SPDX-License-Identifier: MIT
// The project window: the open projects with their components in folders by type. Selecting a component
// makes it the IDE's selected component (which fires the selection event); double-clicking opens its
// designer, or its code when it has none. The tree is rebuilt from the model after project and component
// events, from the event loop, since those events fire while the model is still changing.
#pragma once

#include "host/model/vbe.h"
#include "ide/signal.h"

#include <QTreeWidget>

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

 Q_SIGNALS:
  void openWanted(const std::shared_ptr<host::ComponentImpl>& component, bool code);
  void contextMenuWanted(const QPoint& globalPosition);

 protected:
  void contextMenuEvent(QContextMenuEvent* event) override;

 private:
  void scheduleRefresh();
  void followSelection();
  void currentChanged(QTreeWidgetItem* item);

  std::shared_ptr<host::VbeImpl> m_vbe;
  std::vector<ide::Connection> m_connections;
  bool m_refreshPending = false;
  bool m_syncing = false;
};

}  // namespace desktop

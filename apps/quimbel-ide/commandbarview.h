// SPDX-License-Identifier: MIT
// The command bars drawn live: the "Menu Bar" as the window's menu bar, every other visible top-level bar
// as a toolbar, and the popup bars ("Code Window" ...) as context menus built when they open. Changes of the
// model are applied from the event loop, coalesced, by reconciling the actions in place, so that a menu the
// user has open, or an action whose click is still running, survives the change. A click goes to the
// control's Execute().
#pragma once

#include "host/model/commandbars.h"
#include "ide/signal.h"

#include <QHash>
#include <QIcon>
#include <QObject>
#include <QPointer>

#include <functional>
#include <map>
#include <memory>
#include <set>
#include <vector>

class QAction;
class QMainWindow;
class QMenu;
class QToolBar;
class QWidget;

namespace desktop {

class CommandBarView final : public QObject {
  Q_OBJECT

 public:
  CommandBarView(std::shared_ptr<host::CommandBarsImpl> bars, QMainWindow* window);
  ~CommandBarView() override;

  /// Where a failed click is reported (a message box in the IDE).
  void setErrorReporter(std::function<void(const QString&)> reporter) { m_report = std::move(reporter); }
  /// Brings the menus and toolbars up to date now.
  void syncNow();
  /// Fills a context menu with the controls of a popup bar; the actions belong to the menu.
  void fillMenu(QMenu* menu, const std::shared_ptr<host::CommandBarImpl>& bar);
  /// The action showing a control in the menu bar or on a toolbar; null when it is not shown.
  QAction* actionOf(const host::CommandBarControlImpl* control) const;
  QToolBar* toolBarOf(const QString& barName) const;
  std::vector<QToolBar*> toolBars() const;
  /// Clicks a control the way the user does: through its toolbar button when it has one, else its action.
  void click(const std::shared_ptr<host::CommandBarControlImpl>& control);

 private:
  struct Entry {
    std::shared_ptr<host::CommandBarControlImpl> control;
    QPointer<QAction> action;
    QPointer<QMenu> submenu;
  };
  struct Container {
    std::shared_ptr<host::CommandBarImpl> bar;
    QPointer<QWidget> widget;
    std::vector<Entry> entries;
    std::vector<QPointer<QAction>> separators;
    bool toolBar = false;
    bool menuTree = false;
  };

  void scheduleSync();
  void sync();
  void reconcile(Container& container, std::set<const host::CommandBarImpl*>& seen);
  void update(Entry& entry, Container& container, std::set<const host::CommandBarImpl*>& seen);
  QAction* createAction(const std::shared_ptr<host::CommandBarControlImpl>& control, QObject* parent);
  void dropContainer(const host::CommandBarImpl* bar);
  QToolBar* ensureToolBar(const std::shared_ptr<host::CommandBarImpl>& bar);
  QIcon iconOf(host::CommandBarControlImpl& control);
  void execute(const std::weak_ptr<host::CommandBarControlImpl>& control);

  std::shared_ptr<host::CommandBarsImpl> m_bars;
  QMainWindow* m_window;
  std::map<const host::CommandBarImpl*, Container> m_containers;
  QHash<QByteArray, QIcon> m_faces;
  std::set<host::BuiltinCommand> m_shortcutsGiven;
  std::function<void(const QString&)> m_report;
  bool m_syncPending = false;
  ide::Connection m_changed;
};

/// Whether a bar is drawn as a toolbar (top-level, not the menu bar, not a popup).
bool isToolBarBar(host::CommandBarImpl& bar);

}  // namespace desktop

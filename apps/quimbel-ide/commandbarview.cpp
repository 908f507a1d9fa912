// SPDX-License-Identifier: MIT
#include "commandbarview.h"

#include "icons.h"

#include <QAction>
#include <QMainWindow>
#include <QMenu>
#include <QMenuBar>
#include <QPixmap>
#include <QTimer>
#include <QToolBar>
#include <QToolButton>

namespace desktop {
namespace {

QKeySequence shortcutOf(host::BuiltinCommand command) {
  using B = host::BuiltinCommand;
  switch (command) {
    case B::NewProject:
      return QKeySequence(Qt::CTRL | Qt::Key_N);
    case B::OpenProject:
      return QKeySequence(Qt::CTRL | Qt::Key_O);
    case B::SaveProject:
      return QKeySequence(Qt::CTRL | Qt::Key_S);
    case B::Exit:
      return QKeySequence(Qt::ALT | Qt::Key_Q);
    case B::Undo:
      return QKeySequence(Qt::CTRL | Qt::Key_Z);
    case B::Redo:
      return QKeySequence(Qt::CTRL | Qt::Key_Y);
    case B::Cut:
      return QKeySequence(Qt::CTRL | Qt::Key_X);
    case B::Copy:
      return QKeySequence(Qt::CTRL | Qt::Key_C);
    case B::Paste:
      return QKeySequence(Qt::CTRL | Qt::Key_V);
    case B::Find:
      return QKeySequence(Qt::CTRL | Qt::Key_F);
    case B::ViewCode:
      return QKeySequence(Qt::Key_F7);
    case B::ViewObject:
      return QKeySequence(Qt::SHIFT | Qt::Key_F7);
    case B::ViewProjectExplorer:
      return QKeySequence(Qt::CTRL | Qt::Key_R);
    case B::ViewProperties:
      return QKeySequence(Qt::Key_F4);
    // Start and Continue share F5: only one of them is enabled at a time.
    case B::Start:
    case B::Continue:
      return QKeySequence(Qt::Key_F5);
    case B::Break:
      return QKeySequence(Qt::CTRL | Qt::Key_Pause);
    default:
      return {};
  }
}

Qt::ToolBarArea areaOf(ide::BarPosition position) {
  switch (position) {
    case ide::BarPosition::Left:
      return Qt::LeftToolBarArea;
    case ide::BarPosition::Right:
      return Qt::RightToolBarArea;
    case ide::BarPosition::Bottom:
      return Qt::BottomToolBarArea;
    default:
      return Qt::TopToolBarArea;
  }
}

QString plainCaption(QString caption) {
  caption.remove(u'&');
  if (caption.endsWith(QLatin1StringView("..."))) caption.chop(3);
  return caption;
}

}  // namespace

bool isToolBarBar(host::CommandBarImpl& bar) {
  return !bar.deleted() && bar.Position() != ide::BarPosition::MenuBar &&
         bar.Position() != ide::BarPosition::Popup;
}

CommandBarView::CommandBarView(std::shared_ptr<host::CommandBarsImpl> bars, QMainWindow* window)
    : QObject(window), m_bars(std::move(bars)), m_window(window) {
  m_changed = m_bars->changed.connect([this](host::CommandBarImpl*) { scheduleSync(); });
  sync();
}

CommandBarView::~CommandBarView() = default;

void CommandBarView::scheduleSync() {
  if (m_syncPending) return;
  m_syncPending = true;
  QTimer::singleShot(0, this, [this] {
    if (m_syncPending) sync();
  });
}

void CommandBarView::syncNow() {
  sync();
}

void CommandBarView::sync() {
  m_syncPending = false;
  m_shortcutsGiven.clear();
  std::set<const host::CommandBarImpl*> seen;
  for (const auto& bar : m_bars->bars()) {
    if (bar->deleted()) continue;
    if (bar->Position() == ide::BarPosition::MenuBar) {
      // The IDE has one menu bar; custom bars placed as menu bars are not drawn.
      if (bar->Name().compare(QLatin1StringView("Menu Bar"), Qt::CaseInsensitive) != 0) continue;
      Container& container = m_containers[bar.get()];
      container.bar = bar;
      container.widget = m_window->menuBar();
      container.menuTree = true;
      reconcile(container, seen);
    } else if (isToolBarBar(*bar) && bar->Visible()) {
      QToolBar* toolBar = ensureToolBar(bar);
      Container& container = m_containers[bar.get()];
      container.bar = bar;
      container.widget = toolBar;
      container.toolBar = true;
      reconcile(container, seen);
      toolBar->setVisible(true);
    }
  }
  std::vector<const host::CommandBarImpl*> gone;
  for (const auto& [key, container] : m_containers)
    if (!seen.count(key)) gone.push_back(key);
  for (const auto* key : gone)
    dropContainer(key);
}

QToolBar* CommandBarView::ensureToolBar(const std::shared_ptr<host::CommandBarImpl>& bar) {
  const auto it = m_containers.find(bar.get());
  if (it != m_containers.end() && it->second.widget) return static_cast<QToolBar*>(it->second.widget.data());
  auto* toolBar = new QToolBar(bar->Name(), m_window);
  toolBar->setObjectName(QStringLiteral("toolbar:") + bar->Name());
  toolBar->setIconSize(QSize(16, 16));
  toolBar->setToolButtonStyle(Qt::ToolButtonIconOnly);
  m_window->addToolBar(areaOf(bar->Position()), toolBar);
  return toolBar;
}

void CommandBarView::dropContainer(const host::CommandBarImpl* bar) {
  const auto it = m_containers.find(bar);
  if (it == m_containers.end()) return;
  Container container = std::move(it->second);
  m_containers.erase(it);
  for (Entry& entry : container.entries) {
    if (auto popup = entry.control->popupBar()) dropContainer(popup.get());
    if (entry.action) entry.action->deleteLater();
    if (entry.submenu) entry.submenu->deleteLater();
  }
  for (auto& separator : container.separators)
    if (separator) separator->deleteLater();
  if (container.toolBar && container.widget) {
    auto* toolBar = static_cast<QToolBar*>(container.widget.data());
    m_window->removeToolBar(toolBar);
    toolBar->deleteLater();
  }
}

QAction* CommandBarView::createAction(const std::shared_ptr<host::CommandBarControlImpl>& control,
                                      QObject* parent) {
  auto* action = new QAction(parent);
  std::weak_ptr<host::CommandBarControlImpl> weak = control;
  connect(action, &QAction::triggered, this, [this, weak] { execute(weak); });
  return action;
}

void CommandBarView::reconcile(Container& container, std::set<const host::CommandBarImpl*>& seen) {
  seen.insert(container.bar.get());
  std::vector<Entry> previous = std::move(container.entries);
  std::vector<Entry> next;
  QList<QAction*> order;
  size_t separatorsUsed = 0;
  bool first = true;
  for (const auto& control : container.bar->controls()) {
    Entry entry;
    const auto found = std::find_if(previous.begin(), previous.end(),
                                    [&](const Entry& e) { return e.control == control && e.action; });
    if (found != previous.end()) {
      entry = std::move(*found);
      previous.erase(found);
    } else {
      entry.control = control;
      entry.action = createAction(control, container.widget);
    }
    update(entry, container, seen);
    if (control->Visible()) {
      if (control->BeginGroup() && !first) {
        if (separatorsUsed == container.separators.size() || !container.separators[separatorsUsed]) {
          auto* separator = new QAction(container.widget);
          separator->setSeparator(true);
          if (separatorsUsed == container.separators.size())
            container.separators.push_back(separator);
          else
            container.separators[separatorsUsed] = separator;
        }
        order << container.separators[separatorsUsed++];
      }
      order << entry.action;
      first = false;
    }
    next.push_back(std::move(entry));
  }
  for (Entry& stale : previous) {
    if (auto popup = stale.control->popupBar()) dropContainer(popup.get());
    if (stale.action) stale.action->deleteLater();
    if (stale.submenu) stale.submenu->deleteLater();
  }
  while (container.separators.size() > separatorsUsed) {
    if (container.separators.back()) container.separators.back()->deleteLater();
    container.separators.pop_back();
  }
  container.entries = std::move(next);

  QWidget* widget = container.widget;
  if (widget->actions() != order) {
    for (QAction* action : widget->actions())
      widget->removeAction(action);
    widget->addActions(order);
  }
  if (container.toolBar) {
    auto* toolBar = static_cast<QToolBar*>(widget);
    for (const Entry& entry : container.entries) {
      auto* button = qobject_cast<QToolButton*>(toolBar->widgetForAction(entry.action));
      if (!button) continue;
      const bool hasIcon = !entry.action->icon().isNull();
      Qt::ToolButtonStyle style = hasIcon ? Qt::ToolButtonIconOnly : Qt::ToolButtonTextOnly;
      switch (entry.control->Style()) {
        case ide::ButtonStyle::Icon:
          style = Qt::ToolButtonIconOnly;
          break;
        case ide::ButtonStyle::Caption:
          style = Qt::ToolButtonTextOnly;
          break;
        case ide::ButtonStyle::IconAndCaption:
          style = hasIcon ? Qt::ToolButtonTextBesideIcon : Qt::ToolButtonTextOnly;
          break;
        case ide::ButtonStyle::Automatic:
          break;
      }
      button->setToolButtonStyle(style);
      if (entry.submenu) button->setPopupMode(QToolButton::InstantPopup);
    }
  }
}

void CommandBarView::update(Entry& entry, Container& container, std::set<const host::CommandBarImpl*>& seen) {
  host::CommandBarControlImpl& control = *entry.control;
  QAction* action = entry.action;
  const QString caption = control.Caption();
  const QString tip = control.TooltipText().isEmpty() ? plainCaption(caption) : control.TooltipText();
  // A toolbar button added by an add-in often has only a tooltip; it names the action then.
  action->setText(caption.isEmpty() ? tip : caption);
  action->setToolTip(tip);
  action->setEnabled(control.Enabled());
  const QIcon icon = iconOf(control);
  action->setIcon(icon);
  action->setIconVisibleInMenu(!icon.isNull() && control.Style() != ide::ButtonStyle::Caption);
  if (container.menuTree && control.builtin() != host::BuiltinCommand::None &&
      !m_shortcutsGiven.count(control.builtin())) {
    // One action per command carries the shortcut: two enabled actions with one key would cancel out.
    m_shortcutsGiven.insert(control.builtin());
    action->setShortcut(shortcutOf(control.builtin()));
  }
  if (auto popup = control.popupBar()) {
    if (!entry.submenu) {
      entry.submenu = new QMenu(container.widget);
      action->setMenu(entry.submenu);
    }
    entry.submenu->setTitle(action->text());
    Container& sub = m_containers[popup.get()];
    sub.bar = popup;
    sub.widget = entry.submenu;
    sub.menuTree = container.menuTree;
    reconcile(sub, seen);
  }
}

QIcon CommandBarView::iconOf(host::CommandBarControlImpl& control) {
  const QByteArray face = control.Face();
  if (!face.isEmpty()) {
    auto it = m_faces.find(face);
    if (it == m_faces.end()) {
      QPixmap pixmap;
      pixmap.loadFromData(face);
      it = m_faces.insert(face, pixmap.isNull() ? QIcon() : QIcon(pixmap));
    }
    if (!it->isNull()) return *it;
  }
  return commandIcon(control.builtin());
}

void CommandBarView::fillMenu(QMenu* menu, const std::shared_ptr<host::CommandBarImpl>& bar) {
  bool first = true;
  for (const auto& control : bar->controls()) {
    if (!control->Visible()) continue;
    if (control->BeginGroup() && !first) menu->addSeparator();
    first = false;
    if (auto popup = control->popupBar()) {
      QMenu* sub = menu->addMenu(iconOf(*control), control->Caption());
      sub->setEnabled(control->Enabled());
      fillMenu(sub, popup);
      continue;
    }
    QAction* action = createAction(control, menu);
    action->setText(control->Caption().isEmpty() ? plainCaption(control->TooltipText()) : control->Caption());
    action->setEnabled(control->Enabled());
    action->setIcon(iconOf(*control));
    action->setIconVisibleInMenu(control->Style() != ide::ButtonStyle::Caption);
    menu->addAction(action);
  }
}

QAction* CommandBarView::actionOf(const host::CommandBarControlImpl* control) const {
  for (const auto& [key, container] : m_containers)
    for (const Entry& entry : container.entries)
      if (entry.control.get() == control && entry.action && entry.control->Visible()) return entry.action;
  return nullptr;
}

QToolBar* CommandBarView::toolBarOf(const QString& barName) const {
  for (const auto& [key, container] : m_containers)
    if (container.toolBar && container.bar->Name().compare(barName, Qt::CaseInsensitive) == 0)
      return static_cast<QToolBar*>(container.widget.data());
  return nullptr;
}

std::vector<QToolBar*> CommandBarView::toolBars() const {
  std::vector<QToolBar*> result;
  for (const auto& [key, container] : m_containers)
    if (container.toolBar && container.widget)
      result.push_back(static_cast<QToolBar*>(container.widget.data()));
  return result;
}

void CommandBarView::click(const std::shared_ptr<host::CommandBarControlImpl>& control) {
  QAction* action = actionOf(control.get());
  if (action) {
    for (const auto& [key, container] : m_containers) {
      if (!container.toolBar || container.bar != control->Parent()) continue;
      if (auto* button = qobject_cast<QToolButton*>(
              static_cast<QToolBar*>(container.widget.data())->widgetForAction(action))) {
        button->click();
        return;
      }
    }
    action->trigger();
    return;
  }
  // Controls that are not drawn (context menus, hidden bars) are clicked directly.
  execute(control);
}

void CommandBarView::execute(const std::weak_ptr<host::CommandBarControlImpl>& weak) {
  auto control = weak.lock();
  if (!control || control->deleted() || !control->Enabled()) return;
  try {
    control->Execute();
  } catch (const ide::Error& error) {
    if (m_report) m_report(error.description());
  } catch (const std::exception& error) {
    if (m_report) m_report(QString::fromLocal8Bit(error.what()));
  }
}

}  // namespace desktop

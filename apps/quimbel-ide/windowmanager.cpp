// SPDX-License-Identifier: MIT
#include "windowmanager.h"

#include "codeeditor.h"
#include "codewindow.h"
#include "designerview.h"
#include "icons.h"

#include <QCloseEvent>
#include <QMdiArea>
#include <QMdiSubWindow>

namespace desktop {
namespace {

/// Runs `work` with `flag` set, restoring it afterwards (also when `work` throws).
template <class Work>
void guarded(bool& flag, Work&& work) {
  const bool previous = std::exchange(flag, true);
  try {
    work();
  } catch (...) {
    flag = previous;
    throw;
  }
  flag = previous;
}

}  // namespace

WindowManager::WindowManager(std::shared_ptr<host::VbeImpl> vbe, QMdiArea* area)
    : QObject(area), m_vbe(std::move(vbe)), m_area(area) {
  m_opened = m_vbe->childWindowOpened.connect([this](host::WindowImpl* window) { windowOpened(window); });
  m_activated = m_vbe->windowActivated.connect([this](host::WindowImpl* window) { windowActivated(window); });
  connect(m_area, &QMdiArea::subWindowActivated, this, &WindowManager::subWindowActivated);
}

WindowManager::~WindowManager() = default;

WindowManager::Entry* WindowManager::entryOf(const QMdiSubWindow* sub) {
  for (auto& [key, entry] : m_entries)
    if (entry.sub == sub) return &entry;
  return nullptr;
}

QMdiSubWindow* WindowManager::subWindowOf(const host::WindowImpl* window) const {
  const auto it = m_entries.find(window);
  return it == m_entries.end() ? nullptr : it->second.sub.data();
}

CodeWindow* WindowManager::codeWindowOf(const host::WindowImpl* window) const {
  QMdiSubWindow* sub = subWindowOf(window);
  return sub ? qobject_cast<CodeWindow*>(sub->widget()) : nullptr;
}

DesignerWindow* WindowManager::designerOf(const host::WindowImpl* window) const {
  QMdiSubWindow* sub = subWindowOf(window);
  return sub ? qobject_cast<DesignerWindow*>(sub->widget()) : nullptr;
}

CodeWindow* WindowManager::activeCodeWindow() const {
  QMdiSubWindow* sub = m_area->activeSubWindow();
  return sub ? qobject_cast<CodeWindow*>(sub->widget()) : nullptr;
}

DesignerWindow* WindowManager::activeDesigner() const {
  QMdiSubWindow* sub = m_area->activeSubWindow();
  return sub ? qobject_cast<DesignerWindow*>(sub->widget()) : nullptr;
}

std::vector<CodeWindow*> WindowManager::codeWindows() const {
  std::vector<CodeWindow*> result;
  for (const auto& [key, entry] : m_entries)
    if (entry.sub)
      if (auto* view = qobject_cast<CodeWindow*>(entry.sub->widget())) result.push_back(view);
  return result;
}

void WindowManager::refreshCaptions() {
  for (auto& [key, entry] : m_entries)
    if (entry.sub) entry.sub->setWindowTitle(entry.window->Caption());
}

void WindowManager::setCodeReadOnly(bool readOnly) {
  m_codeReadOnly = readOnly;
  for (CodeWindow* code : codeWindows())
    code->editor()->setReadOnly(readOnly);
}

void WindowManager::windowOpened(host::WindowImpl* window) {
  if (m_entries.count(window)) return;
  auto shared = window->shared_from_this();
  auto component = window->component();
  if (!component) return;
  QWidget* view = nullptr;
  QSize size;
  if (window->Type() == ide::WindowType::CodeWindow) {
    auto* code = new CodeWindow(shared);
    connect(code, &CodeWindow::caretMoved, this, [this, code](int line, int column) {
      if (activeCodeWindow() == code) Q_EMIT caretMoved(line, column);
    });
    connect(code, &CodeWindow::contextMenuWanted, this,
            [this, code](const QPoint& position) { Q_EMIT codeContextMenuWanted(code, position); });
    connect(code, &CodeWindow::editRejected, this, &WindowManager::statusMessage);
    code->editor()->setHotKeyTarget(&m_vbe->windowSystem(), [weak = std::weak_ptr(shared)] {
      auto w = weak.lock();
      return w ? w->hWnd() : ide::HWnd(0);
    });
    code->editor()->setReadOnly(m_codeReadOnly);
    view = code;
    const QSize area = m_area->viewport()->size();
    size = QSize(std::clamp(area.width() * 3 / 4, 480, 1000), std::clamp(area.height() * 17 / 20, 320, 900));
  } else if (window->Type() == ide::WindowType::Designer && component->form()) {
    auto* designer = new DesignerWindow(shared);
    designer->canvas()->setErrorReporter([this](const QString& message) {
      if (m_report) m_report(message);
    });
    connect(designer, &DesignerWindow::selectionChanged, this,
            [this, designer] { Q_EMIT designerSelectionChanged(designer); });
    connect(designer, &DesignerWindow::codeWanted, this,
            [this, designer] { Q_EMIT codeOfDesignerWanted(designer); });
    view = designer;
    const QSize form = designer->canvas()->sizeHint() + QSize(28, 48);
    const QSize area = m_area->viewport()->size() - QSize(40, 40);
    size = QSize(std::clamp(form.width(), 240, std::max(240, area.width())),
                 std::clamp(form.height(), 180, std::max(180, area.height())));
  } else {
    return;
  }
  view->setProperty(kWindowHandleProperty, QVariant::fromValue<quintptr>(window->hWnd()));

  auto* sub = new QMdiSubWindow;
  sub->setWidget(view);
  sub->setAttribute(Qt::WA_DeleteOnClose);
  sub->setWindowTitle(window->Caption());
  sub->setWindowIcon(window->Type() == ide::WindowType::CodeWindow ? icon(Glyph::ViewCode)
                                                                   : componentIcon(component->Type()));
  sub->installEventFilter(this);
  Entry& entry = m_entries[window];
  entry.window = shared;
  entry.sub = sub;
  entry.changed = window->changed.connect([this](host::WindowImpl* w) { windowChanged(w); });
  connect(sub, &QMdiSubWindow::windowStateChanged, this,
          [this, sub](Qt::WindowStates, Qt::WindowStates state) { subWindowStateChanged(sub, state); });
  // New windows cascade from the top left corner, as the IDE's do.
  const int cascade = static_cast<int>(m_area->subWindowList().size() % 8) * 24;
  guarded(m_syncing, [&] {
    m_area->addSubWindow(sub);
    sub->resize(size);
    sub->move(cascade, cascade);
    if (window->WindowState() == ide::WindowState::Minimize)
      sub->showMinimized();
    else if (window->WindowState() == ide::WindowState::Maximize)
      sub->showMaximized();
    else
      sub->show();
  });
}

void WindowManager::windowChanged(host::WindowImpl* window) {
  const auto it = m_entries.find(window);
  if (it == m_entries.end()) return;
  QPointer<QMdiSubWindow> sub = it->second.sub;
  if (!window->isOpen()) {
    // Closed by the model: the view goes (the entry first, so that closing the sub-window does not ask the
    // model to close it again).
    m_entries.erase(it);
    if (sub) guarded(m_syncing, [&] { sub->close(); });
    Q_EMIT activeViewChanged();
    return;
  }
  if (!sub) return;
  guarded(m_syncing, [&] {
    const Qt::WindowStates state = sub->windowState();
    switch (window->WindowState()) {
      case ide::WindowState::Minimize:
        if (!(state & Qt::WindowMinimized)) sub->showMinimized();
        break;
      case ide::WindowState::Maximize:
        if (!(state & Qt::WindowMaximized)) sub->showMaximized();
        break;
      case ide::WindowState::Normal:
        if (state & (Qt::WindowMinimized | Qt::WindowMaximized)) sub->showNormal();
        break;
    }
    sub->setWindowTitle(window->Caption());
  });
}

void WindowManager::windowActivated(host::WindowImpl* window) {
  if (m_syncing) return;
  QMdiSubWindow* sub = subWindowOf(window);
  if (!sub) return;
  guarded(m_syncing, [&] {
    if (sub->windowState() & Qt::WindowMinimized) sub->showNormal();
    m_area->setActiveSubWindow(sub);
    if (QWidget* view = sub->widget()) view->setFocus(Qt::OtherFocusReason);
  });
  Q_EMIT activeViewChanged();
}

void WindowManager::subWindowActivated(QMdiSubWindow* sub) {
  // A null activation is the whole frame losing the activation (a dialog opened): the IDE's active window
  // stays what it was.
  if (!sub) return;
  if (!m_syncing) {
    if (Entry* entry = entryOf(sub); entry && entry->window->isOpen()) {
      auto window = entry->window;
      guarded(m_syncing, [&] { m_vbe->activateWindow(window); });
    }
  }
  Q_EMIT activeViewChanged();
}

void WindowManager::subWindowStateChanged(QMdiSubWindow* sub, Qt::WindowStates state) {
  if (m_syncing) return;
  Entry* entry = entryOf(sub);
  if (!entry || !entry->window->isOpen()) return;
  const ide::WindowState modelState = (state & Qt::WindowMinimized)   ? ide::WindowState::Minimize
                                      : (state & Qt::WindowMaximized) ? ide::WindowState::Maximize
                                                                      : ide::WindowState::Normal;
  auto window = entry->window;
  guarded(m_syncing, [&] { window->setWindowState(modelState); });
}

bool WindowManager::eventFilter(QObject* watched, QEvent* event) {
  if (event->type() == QEvent::Close) {
    auto* sub = qobject_cast<QMdiSubWindow*>(watched);
    if (Entry* entry = sub ? entryOf(sub) : nullptr; entry && !m_syncing) {
      // Closed by the user: the model closes the window, which takes the entry away.
      auto window = entry->window;
      guarded(m_syncing, [&] { window->Close(); });
      m_entries.erase(window.get());
      Q_EMIT activeViewChanged();
    }
  }
  return QObject::eventFilter(watched, event);
}

}  // namespace desktop

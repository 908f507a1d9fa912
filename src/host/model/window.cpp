// SPDX-License-Identifier: MIT
// Windows of the IDE and the code panes shown in code windows.
#include "host/model/objects.h"
#include "host/model/vbe.h"

namespace host {

// ---------------------------------------------------------------------------------------------------
// Windows

WindowImpl::WindowImpl(const std::shared_ptr<VbeImpl>& vbe, ide::WindowType type,
                       std::function<QString()> caption, QString className)
    : m_vbe(vbe), m_type(type), m_caption(std::move(caption)), m_className(std::move(className)) {}

WindowImpl::~WindowImpl() = default;

void WindowImpl::open() {
  if (m_hwnd) return;
  auto vbe = m_vbe.lock();
  if (!vbe) ide::raise(ide::err::ObjectVariableNotSet);
  ide::HWnd parent = 0;
  if (m_type == ide::WindowType::CodeWindow || m_type == ide::WindowType::Designer)
    parent = vbe->childWindowParent();
  else if (m_type != ide::WindowType::MainWindow && vbe->mainWindow())
    parent = vbe->mainWindow()->hWnd();
  std::weak_ptr<WindowImpl> weak = weak_from_this();
  m_hwnd = vbe->windowSystem().createWindow(
      m_className,
      [weak] {
        auto w = weak.lock();
        return w ? w->Caption() : QString();
      },
      parent,
      [weak](ide::HWnd hwnd, unsigned message, quintptr wParam, qintptr lParam) -> qintptr {
        auto w = weak.lock();
        return w ? w->ownProc(hwnd, message, wParam, lParam) : 0;
      });
  m_visible = true;
  vbe->windowOpened(shared_from_this());
  changed.fire(this);
}

qintptr WindowImpl::ownProc(ide::HWnd /*hwnd*/, unsigned message, quintptr /*wParam*/, qintptr /*lParam*/) {
  if (message == ide::msg::Close) Close();
  return 0;
}

void WindowImpl::setWindowState(ide::WindowState state) {
  if (m_state == state) return;
  m_state = state;
  changed.fire(this);
}

void WindowImpl::setVisible(bool visible) {
  if (visible) {
    open();
    m_visible = true;
  } else if (m_type == ide::WindowType::CodeWindow || m_type == ide::WindowType::Designer) {
    Close();
    return;
  } else {
    m_visible = false;
  }
  changed.fire(this);
}

void WindowImpl::SetFocus() {
  auto vbe = m_vbe.lock();
  if (!vbe) ide::raise(ide::err::ObjectVariableNotSet);
  open();
  vbe->activateWindow(shared_from_this());
}

void WindowImpl::Close() {
  if (!m_hwnd || m_type == ide::WindowType::MainWindow) return;
  auto self = shared_from_this();
  auto vbe = m_vbe.lock();
  const ide::HWnd hwnd = m_hwnd;
  if (vbe) vbe->windowSystem().destroyWindow(hwnd);
  m_hwnd = 0;
  if (vbe) vbe->windowClosed(*this);
  changed.fire(this);
}

// ---------------------------------------------------------------------------------------------------
// Code panes

CodePaneImpl::CodePaneImpl(const std::shared_ptr<CodeModuleImpl>& module) : m_module(module) {}

ide::Ref<ide::CodeModule> CodePaneImpl::CodeModule() {
  return m_module.lock();
}

std::shared_ptr<WindowImpl> CodePaneImpl::window() {
  if (!m_window) {
    auto module = m_module.lock();
    auto component = module ? module->component() : nullptr;
    auto project = component ? component->project() : nullptr;
    auto vbe = project ? project->vbe() : nullptr;
    if (!vbe) ide::raise(ide::err::ObjectVariableNotSet);
    std::weak_ptr<ComponentImpl> weakComponent = component;
    m_window = std::make_shared<WindowImpl>(
        vbe, ide::WindowType::CodeWindow,
        [weakComponent] {
          auto c = weakComponent.lock();
          auto p = c ? c->project() : nullptr;
          return c && p ? QStringLiteral("%1 - %2 (Code)").arg(p->Name(), c->Name()) : QString();
        },
        QStringLiteral("VbaWindow"));
    m_window->setComponent(component);
    m_window->setPane(shared_from_this());
  }
  return m_window;
}

ide::Ref<ide::Window> CodePaneImpl::Window() {
  return window();
}

namespace {
int lineCount(const std::weak_ptr<CodeModuleImpl>& module) {
  auto m = module.lock();
  return m ? std::max(1, m->text().countOfLines()) : 1;
}
}  // namespace

void CodePaneImpl::setTopLine(int line) {
  if (line < 1) ide::raise(ide::err::InvalidProcedureCall);
  m_topLine = std::min(line, lineCount(m_module));
  viewRequest.fire(this);
}

void CodePaneImpl::GetSelection(int& startLine, int& startColumn, int& endLine, int& endColumn) {
  startLine = m_selection.startLine;
  startColumn = m_selection.startColumn;
  endLine = m_selection.endLine;
  endColumn = m_selection.endColumn;
}

void CodePaneImpl::SetSelection(int startLine, int startColumn, int endLine, int endColumn) {
  if (startLine < 1 || startColumn < 1 || endLine < 1 || endColumn < 1)
    ide::raise(ide::err::InvalidProcedureCall);
  const int last = lineCount(m_module);
  Selection s{std::min(startLine, last), startColumn, std::min(endLine, last), endColumn};
  if (s.endLine < s.startLine || (s.endLine == s.startLine && s.endColumn < s.startColumn)) {
    std::swap(s.startLine, s.endLine);
    std::swap(s.startColumn, s.endColumn);
  }
  m_selection = s;
  // Scroll only when the selection's start is out of sight, as an editor does.
  if (s.startLine < m_topLine || s.startLine >= m_topLine + m_visibleLines)
    m_topLine = std::max(1, s.startLine - m_visibleLines / 2);
  viewRequest.fire(this);
}

void CodePaneImpl::Show() {
  auto w = window();
  w->open();
  if (w->WindowState() == ide::WindowState::Minimize) w->setWindowState(ide::WindowState::Normal);
  auto module = m_module.lock();
  auto component = module ? module->component() : nullptr;
  auto project = component ? component->project() : nullptr;
  if (auto vbe = project ? project->vbe() : nullptr) vbe->activateWindow(w);
}

void CodePaneImpl::viewScrolled(int topLine) {
  m_topLine = std::max(1, topLine);
}

void CodePaneImpl::viewSelectionChanged(const Selection& selection) {
  m_selection = selection;
}

void CodePaneImpl::setCountOfVisibleLines(int lines) {
  m_visibleLines = std::max(1, lines);
}

void CodePaneImpl::linesChanged(int firstLine, int removed, int inserted) {
  if (removed == inserted) return;
  const int delta = inserted - removed;
  auto follow = [&](int& line, int& column) {
    if (line >= firstLine + removed) {
      line += delta;
    } else if (line >= firstLine && removed > 0) {  // the line itself was deleted
      line = firstLine;
      column = 1;
    }
    line = std::clamp(line, 1, lineCount(m_module));
  };
  follow(m_selection.startLine, m_selection.startColumn);
  follow(m_selection.endLine, m_selection.endColumn);
  int column = 1;
  follow(m_topLine, column);
}

}  // namespace host

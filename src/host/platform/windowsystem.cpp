// SPDX-License-Identifier: MIT
#include "host/platform/windowsystem.h"

#include <algorithm>

namespace host {

WindowSystemImpl::WindowSystemImpl(ide::EventLoop& loop) : m_loop(loop) {}

WindowSystemImpl::Window* WindowSystemImpl::find(ide::HWnd window) {
  const auto it = m_windows.find(window);
  return it == m_windows.end() ? nullptr : &it->second;
}

ide::HWnd WindowSystemImpl::createWindow(const QString& className, std::function<QString()> caption,
                                         ide::HWnd parent, ide::WndProc ownProc) {
  const ide::HWnd handle = m_nextHandle;
  m_nextHandle += 0x10;
  Window window;
  window.className = className;
  window.caption = std::move(caption);
  window.parent = parent;
  window.proc = std::make_shared<const ide::WndProc>(
      [this, own = std::move(ownProc)](ide::HWnd h, unsigned message, quintptr wParam,
                                       qintptr lParam) -> qintptr {
        if (message == ide::msg::HotKey) m_hotKeyReachedOwnProc = true;
        return own ? own(h, message, wParam, lParam) : 0;
      });
  m_windows.emplace(handle, std::move(window));
  return handle;
}

void WindowSystemImpl::destroyWindow(ide::HWnd window) {
  if (!find(window)) return;
  // Children go first, as the system destroys them.
  std::vector<ide::HWnd> children;
  for (const auto& [handle, w] : m_windows)
    if (w.parent == window) children.push_back(handle);
  for (const ide::HWnd child : children)
    destroyWindow(child);

  if (m_focus == window) m_focus = 0;
  SendMessage(window, ide::msg::Destroy, 0, 0);
  std::erase_if(m_hotKeys, [window](const HotKey& key) { return key.window == window; });
  if (m_locked == window) m_locked = 0;
  m_windows.erase(window);
}

void WindowSystemImpl::setFocus(ide::HWnd window) {
  if (window != 0 && !find(window)) return;
  if (window == m_focus) return;
  const ide::HWnd previous = m_focus;
  m_focus = window;
  if (previous && find(previous)) SendMessage(previous, ide::msg::KillFocus, window, 0);
  if (window) SendMessage(window, ide::msg::SetFocus, previous, 0);
}

bool WindowSystemImpl::deliverHotKey(ide::HWnd window, unsigned modifiers, unsigned virtualKey) {
  if (window == 0 || window != m_focus) return false;
  const auto key = std::find_if(m_hotKeys.begin(), m_hotKeys.end(), [&](const HotKey& k) {
    return k.window == window && k.modifiers == modifiers && k.virtualKey == virtualKey;
  });
  if (key == m_hotKeys.end()) return false;
  // The window's own procedure is the end of the chain: reaching it means nobody took the key.
  m_hotKeyReachedOwnProc = false;
  SendMessage(window, ide::msg::HotKey, static_cast<quintptr>(key->id),
              static_cast<qintptr>((virtualKey << 16) | modifiers));
  return !m_hotKeyReachedOwnProc;
}

int WindowSystemImpl::hotKeyCount(ide::HWnd window) const {
  return static_cast<int>(std::count_if(m_hotKeys.begin(), m_hotKeys.end(),
                                        [window](const HotKey& k) { return k.window == window; }));
}

bool WindowSystemImpl::hasHotKey(ide::HWnd window, unsigned modifiers, unsigned virtualKey) const {
  return std::any_of(m_hotKeys.begin(), m_hotKeys.end(), [&](const HotKey& k) {
    return k.window == window && k.modifiers == modifiers && k.virtualKey == virtualKey;
  });
}

bool WindowSystemImpl::IsWindow(ide::HWnd window) {
  return find(window) != nullptr;
}

QString WindowSystemImpl::GetClassName(ide::HWnd window) {
  const Window* w = find(window);
  return w ? w->className : QString();
}

QString WindowSystemImpl::GetWindowText(ide::HWnd window) {
  const Window* w = find(window);
  return w && w->caption ? w->caption() : QString();
}

ide::HWnd WindowSystemImpl::FindWindowEx(ide::HWnd parent, ide::HWnd childAfter, const QString& className,
                                         const QString& caption) {
  auto it = childAfter ? m_windows.upper_bound(childAfter) : m_windows.begin();
  for (; it != m_windows.end(); ++it) {
    const Window& w = it->second;
    if (w.parent != parent) continue;
    if (!className.isEmpty() && w.className.compare(className, Qt::CaseInsensitive) != 0) continue;
    if (!caption.isEmpty() && (!w.caption || w.caption().compare(caption, Qt::CaseInsensitive) != 0))
      continue;
    return it->first;
  }
  return 0;
}

ide::WndProcRef WindowSystemImpl::GetWindowProc(ide::HWnd window) {
  const Window* w = find(window);
  return w ? w->proc : nullptr;
}

ide::WndProcRef WindowSystemImpl::SetWindowProc(ide::HWnd window, ide::WndProcRef proc) {
  Window* w = find(window);
  if (!w || !proc) return nullptr;
  return std::exchange(w->proc, std::move(proc));
}

qintptr WindowSystemImpl::CallWindowProc(const ide::WndProcRef& proc, ide::HWnd window, unsigned message,
                                         quintptr wParam, qintptr lParam) {
  if (!proc || !*proc) return 0;
  return (*proc)(window, message, wParam, lParam);
}

qintptr WindowSystemImpl::SendMessage(ide::HWnd window, unsigned message, quintptr wParam, qintptr lParam) {
  const Window* w = find(window);
  if (!w) return 0;
  const ide::WndProcRef proc = w->proc;  // keep it alive while it runs, even if it unhooks itself
  return (*proc)(window, message, wParam, lParam);
}

bool WindowSystemImpl::PostMessage(ide::HWnd window, unsigned message, quintptr wParam, qintptr lParam) {
  if (!find(window)) return false;
  m_loop.post([this, window, message, wParam, lParam] {
    if (find(window)) SendMessage(window, message, wParam, lParam);
  });
  return true;
}

unsigned WindowSystemImpl::RegisterWindowMessage(const QString& name) {
  if (name.isEmpty()) return 0;
  const QString key = name.toCaseFolded();
  const auto it = m_messages.constFind(key);
  if (it != m_messages.cend()) return *it;
  const unsigned number = 0xC000 + static_cast<unsigned>(m_messages.size());
  m_messages.insert(key, number);
  return number;
}

bool WindowSystemImpl::SetProp(ide::HWnd window, const QString& name, std::any value) {
  Window* w = find(window);
  if (!w) return false;
  w->properties[name.toCaseFolded()] = std::move(value);
  return true;
}

std::any WindowSystemImpl::GetProp(ide::HWnd window, const QString& name) {
  Window* w = find(window);
  if (!w) return {};
  const auto it = w->properties.find(name.toCaseFolded());
  return it == w->properties.end() ? std::any() : it->second;
}

std::any WindowSystemImpl::RemoveProp(ide::HWnd window, const QString& name) {
  Window* w = find(window);
  if (!w) return {};
  const auto it = w->properties.find(name.toCaseFolded());
  if (it == w->properties.end()) return {};
  std::any value = std::move(it->second);
  w->properties.erase(it);
  return value;
}

bool WindowSystemImpl::RegisterHotKey(ide::HWnd window, int id, unsigned modifiers, unsigned virtualKey) {
  if (!find(window)) return false;
  // A combination belongs to one registration at a time, as system-wide hotkeys do.
  for (const HotKey& key : m_hotKeys) {
    if (key.modifiers == modifiers && key.virtualKey == virtualKey)
      return key.window == window && key.id == id;
  }
  std::erase_if(m_hotKeys, [&](const HotKey& key) { return key.window == window && key.id == id; });
  m_hotKeys.push_back(HotKey{window, id, modifiers, virtualKey});
  return true;
}

bool WindowSystemImpl::UnregisterHotKey(ide::HWnd window, int id) {
  return std::erase_if(m_hotKeys, [&](const HotKey& key) { return key.window == window && key.id == id; }) >
         0;
}

quint16 WindowSystemImpl::GlobalAddAtom(const QString& name) {
  for (auto& [atom, entry] : m_atoms) {
    if (entry.name.compare(name, Qt::CaseInsensitive) == 0) {
      ++entry.references;
      return atom;
    }
  }
  quint16 atom = 0xC000;
  while (m_atoms.contains(atom))
    ++atom;
  m_atoms.emplace(atom, Atom{name, 1});
  return atom;
}

quint16 WindowSystemImpl::GlobalDeleteAtom(quint16 atom) {
  const auto it = m_atoms.find(atom);
  if (it == m_atoms.end()) return atom;  // failure returns the atom, as the system does
  if (--it->second.references == 0) m_atoms.erase(it);
  return 0;
}

bool WindowSystemImpl::LockWindowUpdate(ide::HWnd window) {
  if (window == 0) {
    m_locked = 0;
    return true;
  }
  if (m_locked != 0 || !find(window)) return false;
  m_locked = window;
  return true;
}

bool WindowSystemImpl::SetForegroundWindow(ide::HWnd window) {
  if (!find(window)) return false;
  if (m_activate) m_activate(window);
  return true;
}

}  // namespace host

// SPDX-License-Identifier: MIT
#include "addin/hotkeys.h"

#include "common/errors.h"

namespace addin {
namespace {

const QString& codeWindowClass() {
  static const QString name = QStringLiteral("VbaWindow");
  return name;
}

bool isOneOf(unsigned key, const char* letters) {
  for (const char* letter = letters; *letter; ++letter)
    if (key == static_cast<unsigned>(*letter)) return true;
  return false;
}

}  // namespace

HotKeyRoute routeHotKey(unsigned virtualKey, unsigned modifiers) {
  const unsigned ctrlShift = ide::mod::Control | ide::mod::Shift;
  const unsigned ctrlAlt = ide::mod::Control | ide::mod::Alt;
  const bool digit = virtualKey >= '0' && virtualKey <= '9';
  const bool letter = virtualKey >= 'A' && virtualKey <= 'Z';
  if (digit && (modifiers == ide::mod::Control || modifiers == ctrlShift)) return HotKeyRoute::CopyBuffers;
  // The excluded letters are the editor's own: copy, paste, cut, find, the member lists.
  if (letter && modifiers == ctrlAlt && !isOneOf(virtualKey, "ICJVX")) return HotKeyRoute::Macros;
  if (letter && modifiers == ctrlShift && !isOneOf(virtualKey, "FCIJVX")) return HotKeyRoute::Macros;
  return HotKeyRoute::PassOn;
}

ide::HWnd FindActiveCodeWindow(ide::VBE& vbe, ide::DisplayModel startDisplayModel) {
  auto pane = vbe.ActiveCodePane();
  if (!pane) return 0;
  auto window = pane->Window();
  if (!window) return 0;
  const QString caption = window->Caption();
  ide::WindowSystem& windows = vbe.Platform().windows();
  if (startDisplayModel != ide::DisplayModel::MDI)
    return windows.FindWindowEx(0, 0, codeWindowClass(), caption);
  const ide::HWnd mdiClient =
      windows.FindWindowEx(vbe.MainWindow()->hWnd(), 0, QStringLiteral("MDIClient"), QString());
  return mdiClient ? windows.FindWindowEx(mdiClient, 0, codeWindowClass(), caption) : 0;
}

// ---------------------------------------------------------------------------------------------------

namespace {
void logIgnored(const std::exception& failure, const char* procedure, int line) {
  common::logFailure(failure, QStringLiteral("HotKeyWindow"), QString::fromLatin1(procedure), line);
}

/// The hotkeys of both clients registered on one window while this lives.
class HotKeyRegistrations {
 public:
  HotKeyRegistrations(ide::HWnd window, HotKeyClient* copyBuffers, HotKeyClient* macros)
      : m_window(window), m_copyBuffers(copyBuffers), m_macros(macros) {
    if (m_copyBuffers) m_copyBuffers->registerHotKeys(m_window);
    if (m_macros) m_macros->registerHotKeys(m_window);
  }
  ~HotKeyRegistrations() {
    // Each client lets its hotkeys go whatever the other's did.
    try {
      if (m_copyBuffers) m_copyBuffers->unregisterHotKeys(m_window);
    } catch (const std::exception& failure) {
      logIgnored(failure, "HotKeyRegistrations", __LINE__);
    }
    try {
      if (m_macros) m_macros->unregisterHotKeys(m_window);
    } catch (const std::exception& failure) {
      logIgnored(failure, "HotKeyRegistrations", __LINE__);
    }
  }
  HotKeyRegistrations(const HotKeyRegistrations&) = delete;
  HotKeyRegistrations& operator=(const HotKeyRegistrations&) = delete;

 private:
  ide::HWnd m_window;
  HotKeyClient* m_copyBuffers;
  HotKeyClient* m_macros;
};
}  // namespace

/// The procedure on one window with the hotkeys registered there; the hotkeys go first when it is released.
class HotKeyWindow::Carrier {
 public:
  Carrier(std::unique_ptr<SubclassedWindow> subclass, HotKeyClient* copyBuffers, HotKeyClient* macros)
      : m_subclass(std::move(subclass)), m_hotKeys(m_subclass->window(), copyBuffers, macros) {}
  ide::HWnd window() const { return m_subclass->window(); }

 private:
  std::unique_ptr<SubclassedWindow> m_subclass;
  HotKeyRegistrations m_hotKeys;
};

HotKeyWindow::HotKeyWindow(ide::VBE& vbe, ide::DisplayModel startDisplayModel, HotKeyClient* copyBuffers,
                           HotKeyClient* macros, std::function<void()> windowDestroyed)
    : m_vbe(vbe),
      m_windows(vbe.Platform().windows()),
      m_displayModel(startDisplayModel),
      m_copyBuffers(copyBuffers),
      m_macros(macros),
      m_windowDestroyed(std::move(windowDestroyed)),
      m_ownProc(std::make_shared<const ide::WndProc>(
          [this](ide::HWnd window, unsigned message, quintptr wParam, qintptr lParam) {
            return procedure(window, message, wParam, lParam);
          })) {}

HotKeyWindow::~HotKeyWindow() {
  remove();
}

ide::HWnd HotKeyWindow::SubclassedWnd() const {
  return m_carrier ? m_carrier->window() : 0;
}

void HotKeyWindow::remove() {
  m_carrier.reset();
}

void HotKeyWindow::install(ide::HWnd window) {
  auto subclass = SubclassedWindow::install(m_windows, window, m_ownProc);
  if (!subclass) return;
  m_isSubclassed = true;
  m_carrier = std::make_unique<Carrier>(std::move(subclass), m_copyBuffers, m_macros);
}

ide::HWnd HotKeyWindow::focusedCodeWindow() {
  const ide::HWnd focus = m_windows.GetFocus();
  // Only a code window can be the active code window; asking the IDE for its caption costs more.
  if (focus == 0 || m_windows.GetClassName(focus).compare(codeWindowClass(), Qt::CaseInsensitive) != 0)
    return 0;
  return FindActiveCodeWindow(m_vbe, m_displayModel) == focus ? focus : 0;
}

void HotKeyWindow::followFocus() {
  try {
    const ide::HWnd focus = m_windows.GetFocus();
    if (m_carrier && m_carrier->window() != focus) remove();
    if (m_carrier) return;
    if (const ide::HWnd window = focusedCodeWindow()) install(window);
  } catch (const std::exception& failure) {
    // The next tick tries again.
    logIgnored(failure, "followFocus", __LINE__);
  }
}

void HotKeyWindow::moveToFocusedCodeWindow() {
  try {
    const ide::HWnd window = focusedCodeWindow();
    remove();
    if (window) install(window);
  } catch (const std::exception& failure) {
    // The timer puts it right.
    logIgnored(failure, "moveToFocusedCodeWindow", __LINE__);
  }
}

qintptr HotKeyWindow::procedure(ide::HWnd window, unsigned message, quintptr wParam, qintptr lParam) {
  if (message == ide::msg::Destroy) {
    m_isSubclassed = false;
    if (m_windowDestroyed) m_windowDestroyed();
    const qintptr result = callOldWindowProc(m_windows, window, message, wParam, lParam);
    if (m_carrier && m_carrier->window() == window) remove();
    return result;
  }
  if (message == ide::msg::HotKey) {
    const auto virtualKey = static_cast<unsigned>((lParam >> 16) & 0xFFFF);
    const auto modifiers = static_cast<unsigned>(lParam & 0xFFFF);
    HotKeyClient* client = nullptr;
    switch (routeHotKey(virtualKey, modifiers)) {
      case HotKeyRoute::CopyBuffers:
        client = m_copyBuffers;
        break;
      case HotKeyRoute::Macros:
        client = m_macros;
        break;
      case HotKeyRoute::PassOn:
        break;
    }
    if (client) {
      try {
        client->HandleHotKey(static_cast<int>(wParam));
      } catch (const std::exception& failure) {
        // The client reports its own failures; the key is taken either way.
        logIgnored(failure, "procedure", __LINE__);
      }
      return 0;
    }
  }
  return callOldWindowProc(m_windows, window, message, wParam, lParam);
}

}  // namespace addin

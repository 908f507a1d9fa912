// SPDX-License-Identifier: MIT
// The add-in's hotkeys live on the code window that has the keyboard focus: that window carries the
// add-in's window procedure, which routes hotkey messages to the copy buffers or the keyboard macros. The
// hotkeys are registered only while the focus is there, so that the key combinations stay free for other
// programs; when the focus moves away they are unregistered and the window's procedure restored.
#pragma once

#include "addin/subclass.h"
#include "ide/vbide.h"

#include <functional>
#include <memory>

namespace addin {

/// What the copy buffers and the keyboard macros offer the hotkey procedure.
class HotKeyClient {
 public:
  virtual ~HotKeyClient() = default;
  /// Registers the enabled hotkeys on `window`.
  virtual void registerHotKeys(ide::HWnd window) = 0;
  /// Unregisters them from `window` again.
  virtual void unregisterHotKeys(ide::HWnd window) = 0;
  /// A hotkey with the identifier `id` was pressed.
  virtual void HandleHotKey(int id) = 0;
};

enum class HotKeyRoute { CopyBuffers, Macros, PassOn };

/// Where a hotkey message goes, by its virtual key and modifier set (mod::Alt | Control | Shift): digits
/// with Ctrl or Ctrl+Shift to the copy buffers; letters with Ctrl+Alt (but not I, C, J, V, X) or Ctrl+Shift
/// (but not F, C, I, J, V, X) to the macros; everything else on to the window's own procedure, so that the
/// editor's own combinations keep working.
HotKeyRoute routeHotKey(unsigned virtualKey, unsigned modifiers);

/// The window of the active code pane, found by its caption among the code windows ("VbaWindow"): top-level
/// windows in SDI display, children of the main window's "MDIClient" in MDI display. 0 when there is none.
ide::HWnd FindActiveCodeWindow(ide::VBE& vbe, ide::DisplayModel startDisplayModel);

/// Keeps the hotkey procedure on the focused code window (SubclassedWnd) and routes its hotkey messages.
class HotKeyWindow {
 public:
  /// `copyBuffers` and `macros` may be null (not there yet); they must outlive this object.
  /// `windowDestroyed` runs when the carrying window is destroyed.
  HotKeyWindow(ide::VBE& vbe, ide::DisplayModel startDisplayModel, HotKeyClient* copyBuffers,
               HotKeyClient* macros, std::function<void()> windowDestroyed);
  ~HotKeyWindow();
  HotKeyWindow(const HotKeyWindow&) = delete;
  HotKeyWindow& operator=(const HotKeyWindow&) = delete;

  /// The timer's rule: leaves a window that lost the focus, and moves onto the active code window once it
  /// has the focus. Failures are ignored.
  void followFocus();
  /// The component events' rule: onto the active code window when it has the focus (from wherever the
  /// procedure was), else off. Failures are ignored.
  void moveToFocusedCodeWindow();
  /// Takes the procedure off and unregisters the hotkeys.
  void remove();

  /// The window that carries the procedure; 0 = none.
  ide::HWnd SubclassedWnd() const;
  /// Set whenever the procedure is installed; cleared only when its window is destroyed.
  bool IsSubclassed() const { return m_isSubclassed; }
  /// The hotkey window procedure itself.
  const ide::WndProcRef& OwnProcAddress() const { return m_ownProc; }

 private:
  class Carrier;
  qintptr procedure(ide::HWnd window, unsigned message, quintptr wParam, qintptr lParam);
  void install(ide::HWnd window);
  ide::HWnd focusedCodeWindow();

  ide::VBE& m_vbe;
  ide::WindowSystem& m_windows;
  ide::DisplayModel m_displayModel;
  HotKeyClient* m_copyBuffers;
  HotKeyClient* m_macros;
  std::function<void()> m_windowDestroyed;
  ide::WndProcRef m_ownProc;
  bool m_isSubclassed = false;
  std::unique_ptr<Carrier> m_carrier;  // released before the procedure it installed
};

}  // namespace addin

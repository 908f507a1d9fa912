// SPDX-License-Identifier: MIT
// The IDE's windows as a window system: handles, classes, captions, parent windows, the keyboard focus,
// replaceable window procedures (each window's own procedure is the bottom of its chain), window
// properties, posted messages on the IDE's loop, per-window hotkeys and atoms. The IDE model creates and
// destroys the windows; the desktop host reports focus changes and key presses into it.
#pragma once

#include "ide/platform.h"

#include <QHash>
#include <QString>

#include <functional>
#include <map>
#include <vector>

namespace host {

class WindowSystemImpl final : public ide::WindowSystem {
 public:
  explicit WindowSystemImpl(ide::EventLoop& loop);

  /// Creates a window. `ownProc` handles what reaches the bottom of the window's procedure chain.
  ide::HWnd createWindow(const QString& className, std::function<QString()> caption, ide::HWnd parent,
                         ide::WndProc ownProc);
  /// Sends Destroy through the window's procedures, then forgets the window, its properties and hotkeys.
  void destroyWindow(ide::HWnd window);
  /// The keyboard focus moved (0: to no IDE window). Sends KillFocus and SetFocus.
  void setFocus(ide::HWnd window);
  /// A key combination pressed in `window`. When the window has the focus and holds a hotkey for it, the
  /// HotKey message goes through its procedures; returns true when a procedure took it (the key then does
  /// not reach the editor).
  bool deliverHotKey(ide::HWnd window, unsigned modifiers, unsigned virtualKey);
  ide::HWnd lockedWindow() const { return m_locked; }
  /// Called when something asks for a window to come to the front (SetForegroundWindow).
  void setActivateHandler(std::function<void(ide::HWnd)> handler) { m_activate = std::move(handler); }
  int hotKeyCount(ide::HWnd window) const;
  /// Whether `window` holds a hotkey for the combination (an editor lets such keys pass its shortcuts).
  bool hasHotKey(ide::HWnd window, unsigned modifiers, unsigned virtualKey) const;

  bool IsWindow(ide::HWnd window) override;
  ide::HWnd GetFocus() override { return m_focus; }
  QString GetClassName(ide::HWnd window) override;
  QString GetWindowText(ide::HWnd window) override;
  ide::HWnd FindWindowEx(ide::HWnd parent, ide::HWnd childAfter, const QString& className,
                         const QString& caption) override;
  ide::WndProcRef GetWindowProc(ide::HWnd window) override;
  ide::WndProcRef SetWindowProc(ide::HWnd window, ide::WndProcRef proc) override;
  qintptr CallWindowProc(const ide::WndProcRef& proc, ide::HWnd window, unsigned message, quintptr wParam,
                         qintptr lParam) override;
  qintptr SendMessage(ide::HWnd window, unsigned message, quintptr wParam, qintptr lParam) override;
  bool PostMessage(ide::HWnd window, unsigned message, quintptr wParam, qintptr lParam) override;
  unsigned RegisterWindowMessage(const QString& name) override;
  bool SetProp(ide::HWnd window, const QString& name, std::any value) override;
  std::any GetProp(ide::HWnd window, const QString& name) override;
  std::any RemoveProp(ide::HWnd window, const QString& name) override;
  bool RegisterHotKey(ide::HWnd window, int id, unsigned modifiers, unsigned virtualKey) override;
  bool UnregisterHotKey(ide::HWnd window, int id) override;
  quint16 GlobalAddAtom(const QString& name) override;
  quint16 GlobalDeleteAtom(quint16 atom) override;
  bool LockWindowUpdate(ide::HWnd window) override;
  bool SetForegroundWindow(ide::HWnd window) override;

 private:
  struct Window {
    QString className;
    std::function<QString()> caption;
    ide::HWnd parent = 0;
    ide::WndProcRef proc;
    std::map<QString, std::any> properties;
  };
  struct HotKey {
    ide::HWnd window;
    int id;
    unsigned modifiers;
    unsigned virtualKey;
  };
  Window* find(ide::HWnd window);

  ide::EventLoop& m_loop;
  std::map<ide::HWnd, Window> m_windows;  // ordered by handle, which is creation order
  ide::HWnd m_nextHandle = 0x10010;
  ide::HWnd m_focus = 0;
  ide::HWnd m_locked = 0;
  std::vector<HotKey> m_hotKeys;
  QHash<QString, unsigned> m_messages;
  struct Atom {
    QString name;
    int references;
  };
  std::map<quint16, Atom> m_atoms;
  std::function<void(ide::HWnd)> m_activate;
  bool m_hotKeyReachedOwnProc = false;
};

}  // namespace host

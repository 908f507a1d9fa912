// SPDX-License-Identifier: MIT
// What the IDE's host platform offers an add-in besides the object model: the message loop and its clock,
// the IDE's windows with their window procedures and hotkeys, and the user-interface services (message
// boxes, cursor, splash window, help). The headless model implements all of it; the desktop host drives
// the same implementation from real widgets, so an add-in cannot tell the two apart.
#pragma once

#include "ide/types.h"

#include <QString>

#include <any>
#include <functional>
#include <memory>

class QObject;

namespace ide {

/// The IDE's single user-interface thread: timers, posted work and yielding, on one clock.
class EventLoop {
 public:
  virtual ~EventLoop() = default;

  /// Starts a periodic timer; returns its identifier (never 0), or 0 when it cannot be started.
  virtual int SetTimer(int intervalMs, std::function<void()> callback) = 0;
  virtual bool KillTimer(int timerId) = 0;

  /// Runs `work` once, after the work that is running now, from the loop.
  virtual void post(std::function<void()> work) = 0;

  /// Yields to the loop: pending posted work, due timers and (in the desktop host) input run now. Cheap
  /// when called in a tight walk: the loop itself runs at most every few milliseconds.
  virtual void DoEvents() = 0;

  /// Milliseconds on the loop's clock (the headless model's clock only moves when told to).
  virtual qint64 tickCount() = 0;
};

/// Window messages and constants the add-in handles (their Win32 numbers).
namespace msg {
inline constexpr unsigned Destroy = 0x0002;
inline constexpr unsigned Activate = 0x0006;
inline constexpr unsigned SetFocus = 0x0007;
inline constexpr unsigned KillFocus = 0x0008;
inline constexpr unsigned Close = 0x0010;
inline constexpr unsigned ContextMenu = 0x007B;
inline constexpr unsigned NcActivate = 0x0086;
inline constexpr unsigned KeyDown = 0x0100;
inline constexpr unsigned HotKey = 0x0312;
inline constexpr unsigned User = 0x0400;
}  // namespace msg

/// Hotkey modifier bits.
namespace mod {
inline constexpr unsigned Alt = 1;
inline constexpr unsigned Control = 2;
inline constexpr unsigned Shift = 4;
}  // namespace mod

/// A window procedure: returns the message's result. Procedures are compared by identity.
using WndProc = std::function<qintptr(HWnd, unsigned message, quintptr wParam, qintptr lParam)>;
using WndProcRef = std::shared_ptr<const WndProc>;

/// The IDE's windows as the window system sees them: classes, captions, focus, window procedures that can
/// be replaced (and so chained), window properties, posted messages and per-window hotkeys.
class WindowSystem {
 public:
  virtual ~WindowSystem() = default;

  virtual bool IsWindow(HWnd window) = 0;
  /// The window with the keyboard focus, or 0.
  virtual HWnd GetFocus() = 0;
  virtual QString GetClassName(HWnd window) = 0;
  virtual QString GetWindowText(HWnd window) = 0;
  /// Children of `parent` (0: top-level windows) after `childAfter`, matched by class and caption; an empty
  /// text matches any.
  virtual HWnd FindWindowEx(HWnd parent, HWnd childAfter, const QString& className,
                            const QString& caption) = 0;

  virtual WndProcRef GetWindowProc(HWnd window) = 0;
  /// Installs `proc` and returns the procedure it replaced; nullptr (and nothing changed) on failure.
  virtual WndProcRef SetWindowProc(HWnd window, WndProcRef proc) = 0;
  virtual qintptr CallWindowProc(const WndProcRef& proc, HWnd window, unsigned message, quintptr wParam,
                                 qintptr lParam) = 0;
  virtual qintptr SendMessage(HWnd window, unsigned message, quintptr wParam, qintptr lParam) = 0;
  virtual bool PostMessage(HWnd window, unsigned message, quintptr wParam, qintptr lParam) = 0;
  /// The same number for the same name for the whole session (0xC000 and up).
  virtual unsigned RegisterWindowMessage(const QString& name) = 0;

  virtual bool SetProp(HWnd window, const QString& name, std::any value) = 0;
  /// An empty value when the window has no such property.
  virtual std::any GetProp(HWnd window, const QString& name) = 0;
  virtual std::any RemoveProp(HWnd window, const QString& name) = 0;

  /// A hotkey registered on a window reaches that window's procedure as a HotKey message (wParam = id,
  /// lParam = virtual key << 16 | modifiers) while the window has the keyboard focus.
  virtual bool RegisterHotKey(HWnd window, int id, unsigned modifiers, unsigned virtualKey) = 0;
  virtual bool UnregisterHotKey(HWnd window, int id) = 0;
  /// Global atoms (0xC000 and up): the same name gives the same atom while it is added.
  virtual quint16 GlobalAddAtom(const QString& name) = 0;
  virtual quint16 GlobalDeleteAtom(quint16 atom) = 0;

  /// Freezes the painting of one window (0 releases it). Only one window can be locked at a time.
  virtual bool LockWindowUpdate(HWnd window) = 0;
  virtual bool SetForegroundWindow(HWnd window) = 0;
};

/// VB message-box styles and answers.
namespace mb {
inline constexpr int OKOnly = 0;
inline constexpr int OKCancel = 1;
inline constexpr int AbortRetryIgnore = 2;
inline constexpr int YesNoCancel = 3;
inline constexpr int YesNo = 4;
inline constexpr int RetryCancel = 5;
inline constexpr int Critical = 16;
inline constexpr int Question = 32;
inline constexpr int Exclamation = 48;
inline constexpr int Information = 64;
inline constexpr int DefaultButton2 = 256;

inline constexpr int OK = 1;
inline constexpr int Cancel = 2;
inline constexpr int Abort = 3;
inline constexpr int Retry = 4;
inline constexpr int Ignore = 5;
inline constexpr int Yes = 6;
inline constexpr int No = 7;

inline constexpr int buttonsOf(int style) {
  return style & 0x0F;
}
inline constexpr int iconOf(int style) {
  return style & 0xF0;
}
}  // namespace mb

enum class Cursor : int { Default = 0, Hourglass = 11, ArrowHourglass = 13 };

/// User-interface services of the host.
class UserInterface {
 public:
  virtual ~UserInterface() = default;

  /// Shows a message box (`style`: buttons + icon + default button, see mb) and returns the answer.
  virtual int MsgBox(const QString& prompt, int style, const QString& title) = 0;

  /// Sets the application's cursor; returns the one it replaced.
  virtual Cursor setCursor(Cursor cursor) = 0;

  /// Shows a splash window without waiting (empty text closes it).
  virtual void showSplash(const QString& text) = 0;

  /// Opens a local document (help page) in the desktop's browser; false when that cannot be done.
  virtual bool openDocument(const QString& path) = 0;

  /// The widget that the add-in's dialogs are shown over (a QWidget in the desktop host; nullptr when the
  /// IDE runs headless, where dialogs are top-level).
  virtual QObject* dialogParent() = 0;
};

/// Everything above, reached through VBE::Platform().
class Platform {
 public:
  virtual ~Platform() = default;
  virtual EventLoop& loop() = 0;
  virtual WindowSystem& windows() = 0;
  virtual UserInterface& ui() = 0;
  /// The computer's and the user's names as the operating system reports them.
  virtual QString computerName() = 0;
  virtual QString userName() = 0;
};

}  // namespace ide

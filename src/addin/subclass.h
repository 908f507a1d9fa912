// SPDX-License-Identifier: MIT
// Replacing a window's procedure (subclassing). The procedure that was there before is kept in the window's
// "OldWndProc" property, and an object the new procedure may call back in "ObjectPtr", so that no table of
// subclassed windows is needed: whoever handles a message can pass it on to the procedure below.
#pragma once

#include "ide/platform.h"

#include <any>
#include <memory>

namespace addin {

inline constexpr char kOldWndProcProperty[] = "OldWndProc";
inline constexpr char kObjectPtrProperty[] = "ObjectPtr";

enum class SubClassResult { Installed, AlreadySubclassed, Failed };

/// Installs `proc` on a window that has no "OldWndProc" yet. A window that has one is left alone.
SubClassResult subClassWindow(ide::WindowSystem& windows, ide::HWnd window, const ide::WndProcRef& proc,
                              std::any object = {});
/// True when the window ends up subclassed, or was subclassed already.
bool SubClass(ide::WindowSystem& windows, ide::HWnd window, const ide::WndProcRef& proc,
              std::any object = {});
/// Puts the "OldWndProc" procedure back and removes both properties; false when there was none or the
/// window refused it.
bool UnSubClass(ide::WindowSystem& windows, ide::HWnd window);
/// The procedure below a subclassed window's procedure, or nullptr.
ide::WndProcRef oldWindowProc(ide::WindowSystem& windows, ide::HWnd window);
/// Passes a message on to the procedure below (0 when there is none).
qintptr callOldWindowProc(ide::WindowSystem& windows, ide::HWnd window, unsigned message, quintptr wParam,
                          qintptr lParam);

/// A procedure this add-in installed on a window; taken off again when released.
class SubclassedWindow {
 public:
  /// Subclasses the window; empty when the window was subclassed already or could not be.
  static std::unique_ptr<SubclassedWindow> install(ide::WindowSystem& windows, ide::HWnd window,
                                                   const ide::WndProcRef& proc, std::any object = {});
  ~SubclassedWindow();
  SubclassedWindow(const SubclassedWindow&) = delete;
  SubclassedWindow& operator=(const SubclassedWindow&) = delete;

  ide::HWnd window() const { return m_window; }

 private:
  SubclassedWindow(ide::WindowSystem& windows, ide::HWnd window) : m_windows(windows), m_window(window) {}

  ide::WindowSystem& m_windows;
  ide::HWnd m_window;
};

}  // namespace addin

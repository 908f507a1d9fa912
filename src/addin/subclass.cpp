// SPDX-License-Identifier: MIT
#include "addin/subclass.h"

#include "common/errors.h"

namespace addin {
namespace {
QString property(const char* name) {
  return QString::fromLatin1(name);
}
}  // namespace

SubClassResult subClassWindow(ide::WindowSystem& windows, ide::HWnd window, const ide::WndProcRef& proc,
                              std::any object) {
  if (windows.GetProp(window, property(kOldWndProcProperty)).has_value())
    return SubClassResult::AlreadySubclassed;
  const ide::WndProcRef old = windows.SetWindowProc(window, proc);
  if (!old) return SubClassResult::Failed;
  bool stored = windows.SetProp(window, property(kOldWndProcProperty), old);
  if (stored && object.has_value()) stored = windows.SetProp(window, property(kObjectPtrProperty), object);
  if (!stored) {
    windows.SetWindowProc(window, old);
    windows.RemoveProp(window, property(kOldWndProcProperty));
    return SubClassResult::Failed;
  }
  return SubClassResult::Installed;
}

bool SubClass(ide::WindowSystem& windows, ide::HWnd window, const ide::WndProcRef& proc, std::any object) {
  return subClassWindow(windows, window, proc, std::move(object)) != SubClassResult::Failed;
}

ide::WndProcRef oldWindowProc(ide::WindowSystem& windows, ide::HWnd window) {
  const std::any value = windows.GetProp(window, property(kOldWndProcProperty));
  const auto* proc = std::any_cast<ide::WndProcRef>(&value);
  return proc ? *proc : nullptr;
}

bool UnSubClass(ide::WindowSystem& windows, ide::HWnd window) {
  const ide::WndProcRef old = oldWindowProc(windows, window);
  if (!old) return false;
  if (!windows.SetWindowProc(window, old)) return false;
  windows.RemoveProp(window, property(kOldWndProcProperty));
  windows.RemoveProp(window, property(kObjectPtrProperty));
  return true;
}

qintptr callOldWindowProc(ide::WindowSystem& windows, ide::HWnd window, unsigned message, quintptr wParam,
                          qintptr lParam) {
  const ide::WndProcRef old = oldWindowProc(windows, window);
  return old ? windows.CallWindowProc(old, window, message, wParam, lParam) : 0;
}

std::unique_ptr<SubclassedWindow> SubclassedWindow::install(ide::WindowSystem& windows, ide::HWnd window,
                                                            const ide::WndProcRef& proc, std::any object) {
  if (subClassWindow(windows, window, proc, std::move(object)) != SubClassResult::Installed) return nullptr;
  return std::unique_ptr<SubclassedWindow>(new SubclassedWindow(windows, window));
}

SubclassedWindow::~SubclassedWindow() {
  try {
    UnSubClass(m_windows, m_window);
  } catch (const std::exception& failure) {
    // A window that is gone has nothing left to restore.
    common::logFailure(failure, QStringLiteral("SubclassedWindow"), QStringLiteral("Release"), __LINE__);
  }
}

}  // namespace addin

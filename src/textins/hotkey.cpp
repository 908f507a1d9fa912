// SPDX-License-Identifier: MIT
#include "textins/hotkey.h"

#include "common/errors.h"

#include <algorithm>

namespace textins {

void addAtom(ide::WindowSystem& windows, CHotKey& hk) {
  hk.Id = windows.GlobalAddAtom(hk.StrId);
}

void registerHotKey(ide::WindowSystem& windows, ide::HWnd window, CHotKey& hk) {
  if (hk.Registered && hk.RegisteredOn == window) return;
  if (hk.Registered) unregisterHotKey(windows, hk);
  windows.RegisterHotKey(window, hk.Id, static_cast<unsigned>(hk.Modifiers),
                         static_cast<unsigned>(hk.VirtualKey));
  hk.Registered = true;
  hk.RegisteredOn = window;
}

void unregisterHotKey(ide::WindowSystem& windows, CHotKey& hk) {
  if (!hk.Registered) return;
  if (hk.RegisteredOn != 0) windows.UnregisterHotKey(hk.RegisteredOn, hk.Id);
  hk.Registered = false;
  hk.RegisteredOn = 0;
}

void releaseHotKey(ide::WindowSystem& windows, CHotKey& hk) noexcept {
  // The atom goes whatever the unregistering did.
  try {
    unregisterHotKey(windows, hk);
  } catch (const std::exception& failure) {
    common::logFailure(failure, QStringLiteral("CHotKey"), QStringLiteral("Release"), __LINE__);
  }
  try {
    if (hk.Id != 0) windows.GlobalDeleteAtom(static_cast<quint16>(hk.Id));
  } catch (const std::exception& failure) {
    common::logFailure(failure, QStringLiteral("CHotKey"), QStringLiteral("Release"), __LINE__);
  }
  hk.Id = 0;
}

CHotKey* findHotKey(std::vector<CHotKey>& records, int id) {
  const auto it =
      std::find_if(records.begin(), records.end(), [id](const CHotKey& hk) { return hk.Id == id; });
  return it == records.end() ? nullptr : &*it;
}

void reraisingAt(const char* module, const char* procedure, int line, const std::function<void()>& work) {
  try {
    work();
  } catch (const std::exception& failure) {
    throw common::recordError(failure, QLatin1StringView(module), QLatin1StringView(procedure), line);
  }
}

}  // namespace textins

// SPDX-License-Identifier: MIT
// One hotkey of the keyboard macros or the copy buffers, and its registration with the window system.
// Each hotkey's identifier is the global atom of its name, so that two IDEs on one machine hand the
// system the same numbers for the same keys.
#pragma once

#include "ide/platform.h"

#include <QString>

#include <functional>
#include <vector>

namespace textins {

/// What an editor window changed of a record and has not been saved yet (bit flags).
enum HOTKEY_CHANGE_TYPE : qint32 { HK_CHANGE_TEXT = 1, HK_CHANGE_STATE = 2 };

class CHotKey {
 public:
  /// The global atom of StrId, also the identifier the hotkey is registered with.
  qint32 Id = 0;
  /// The macro's text (empty for the keys of a copy buffer).
  QString Text;
  /// The name shown to the user and the atom's name ("Ctrl+Alt+A", "CtrlShift3"); a macro's database key.
  QString StrId;
  /// ide::mod flags: 3 Ctrl+Alt, 6 Ctrl+Shift, 2 Ctrl.
  qint32 Modifiers = 0;
  /// The upper-case letter's or the digit's character code.
  qint32 VirtualKey = 0;
  bool Enabled = false;
  bool Registered = false;
  /// HOTKEY_CHANGE_TYPE flags.
  qint32 Changed = 0;
  /// Copy buffers: 1 copies into the buffer, anything else pastes it.
  qint32 Operation = 0;
  /// The window the hotkey is registered on while Registered (0: none known).
  ide::HWnd RegisteredOn = 0;
};

/// Adds the global atom of `hk.StrId` into `hk.Id`.
void addAtom(ide::WindowSystem& windows, CHotKey& hk);

/// Registers `hk` on `window` unless it is registered there already; one registered on another window is
/// moved. The system's answer is not examined: a combination that another program holds still counts as
/// registered, as the hotkey is ours once that program lets it go.
void registerHotKey(ide::WindowSystem& windows, ide::HWnd window, CHotKey& hk);
/// Unregisters `hk` from the window it was registered on, whatever window the caller names: a hotkey left
/// on a window would take its key away from the editor for good.
void unregisterHotKey(ide::WindowSystem& windows, CHotKey& hk);

/// At the end of a hotkey's life: unregisters it and deletes its atom; failures are ignored.
void releaseHotKey(ide::WindowSystem& windows, CHotKey& hk) noexcept;

/// The record with this identifier, or null.
CHotKey* findHotKey(std::vector<CHotKey>& records, int id);

/// Runs `work`; a failure is recorded in the last-error record as having happened in module_procedure at
/// `line` (unless it carries an inner location already) and raised again with that location.
void reraisingAt(const char* module, const char* procedure, int line, const std::function<void()>& work);

}  // namespace textins

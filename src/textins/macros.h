// SPDX-License-Identifier: MIT
// The keyboard macros: 41 texts, one per hotkey (Ctrl+Alt+letter and Ctrl+Shift+letter, without the
// letters the editor keeps for itself), each pasted at the caret through InsertText when its key is
// pressed in a code window. A macro's hotkey is registered only while the macro is enabled. Texts and
// enabled flags live in the application database, keyed by the hotkey's name.
#pragma once

#include "textins/hotkey.h"
#include "textins/textinsertion.h"

#include <functional>
#include <vector>

namespace appdata {
class CAppInfoFile;
}

namespace textins {

class CMacros {
 public:
  /// Builds the set (each hotkey's identifier is the global atom of its name) and loads it from
  /// `appInfo`, raising what the database raised. `findActiveCodeWindow` gives the window of the active
  /// code pane (0 when there is none), where Save() registers a macro that was switched on. Everything
  /// given must outlive the object.
  CMacros(ide::WindowSystem& windows, appdata::CAppInfoFile& appInfo, TextInsertion& insertion,
          std::function<ide::HWnd()> findActiveCodeWindow);
  /// Unregisters what is registered and deletes the atoms.
  ~CMacros();
  CMacros(const CMacros&) = delete;
  CMacros& operator=(const CMacros&) = delete;

  /// «Ctrl+Alt+A» to «Ctrl+Alt+Z» without C, I, J, V, X, then «Ctrl+Shift+A» to «Ctrl+Shift+Z» without C,
  /// F, I, J, V, X.
  const std::vector<CHotKey>& Macros() const { return m_macros; }

  /// Reloads every macro's text and enabled flag; raises a database failure with its location.
  void InitializeFromFile();
  /// Pastes the macro whose identifier is `IdMacro` when it is enabled. Reports nothing: an unknown
  /// identifier only records the last error.
  void HandleHotKey(int IdMacro);
  void RegMacrosHotKey(ide::HWnd hWnd, CHotKey& hk);
  void UnregMacrosHotKey(ide::HWnd hWnd, CHotKey& hk);
  /// Registers every enabled macro on `hWnd` (one still registered elsewhere is moved).
  void RegisterEnabledHotKeys(ide::HWnd hWnd);
  void UnregisterEnabledHotKeys(ide::HWnd hWnd);
  /// A working copy for an editor window.
  std::vector<CHotKey> CopyCol() const { return m_macros; }

  /// What Show() opens after reloading the macros: the editor window, modally, over this object.
  void setEditor(std::function<void(CMacros&)> editor) { m_editor = std::move(editor); }
  /// Reloads the macros and opens the editor; raises a database failure with its location.
  void Show();

  /// Writes what changed to the database and brings the registrations in line with the enabled flags:
  /// a macro switched on is registered on the active code window (when there is one), one switched off
  /// is unregistered. Raises a database failure with its location; what was written stays written.
  void Save();
  /// Takes an editor's working copy (text, enabled flag and unsaved changes of each macro), then
  /// Save(). The registrations stay as they are now: the copy's may be stale, since the hotkeys came off
  /// the code window while the editor had the focus.
  void SaveEdits(const std::vector<CHotKey>& working);

 private:
  ide::WindowSystem& m_windows;
  appdata::CAppInfoFile& m_appInfo;
  TextInsertion& m_insertion;
  std::function<ide::HWnd()> m_findActiveCodeWindow;
  std::function<void(CMacros&)> m_editor;
  std::vector<CHotKey> m_macros;
};

}  // namespace textins

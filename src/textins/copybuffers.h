// SPDX-License-Identifier: MIT
// The copy buffers: ten more clipboards for code, 0 to 9. Ctrl+Shift+digit copies the selection of the
// active code window into buffer "digit" (and stores it at once), Ctrl+digit pastes the buffer at the
// caret through InsertText, so placeholders and cursor markers work as in a macro. A buffer switched off
// has neither key registered. Texts and enabled flags live in the application database.
#pragma once

#include "textins/hotkey.h"
#include "textins/textinsertion.h"

#include <functional>
#include <vector>

namespace appdata {
class CAppInfoFile;
}

namespace textins {

class CBuffer {
 public:
  /// "Ctrl+" and the digit: the paste key's name, and the buffer's database key.
  QString IdBuffer;
  QString Text;
  bool Enabled = false;
  /// Ctrl+Shift+digit (atom "CtrlShift<digit>", Operation 1).
  CHotKey HotKeyCopy;
  /// Ctrl+digit (atom "Ctrl<digit>", Operation 0).
  CHotKey HotKeyPaste;
  /// HOTKEY_CHANGE_TYPE flags.
  qint32 Changed = 0;
  /// Both keys are registered; they never are one without the other.
  bool Registered = false;
};

class CCopyBuffers {
 public:
  /// Builds the ten buffers with their two keys each and loads them from `appInfo`, raising what the
  /// database raised. `GetSelectedText` gives the text selected in the active code pane (empty when
  /// nothing is); `findActiveCodeWindow` the window of the active code pane (0 when there is none).
  /// Everything given must outlive the object.
  CCopyBuffers(ide::WindowSystem& windows, appdata::CAppInfoFile& appInfo, TextInsertion& insertion,
               std::function<QString()> GetSelectedText, std::function<ide::HWnd()> findActiveCodeWindow);
  /// Unregisters what is registered and deletes the atoms.
  ~CCopyBuffers();
  CCopyBuffers(const CCopyBuffers&) = delete;
  CCopyBuffers& operator=(const CCopyBuffers&) = delete;

  /// The twenty keys: the ten copy keys for 0 to 9, then the ten paste keys.
  std::vector<const CHotKey*> HotKeys() const;
  /// "Ctrl+0" to "Ctrl+9".
  const std::vector<CBuffer>& Buffers() const { return m_buffers; }

  /// Reloads every buffer's text and enabled flag; raises a database failure with its location.
  void InitializeFromFile();
  /// Copies into or pastes from the buffer of the key with identifier `IdHotKey`, when the buffer is
  /// enabled. A copy stores the text in the database at once (with nothing selected it empties the
  /// buffer). Reports nothing to the user: failures are recorded as the last error and logged.
  void HandleHotKey(int IdHotKey);
  /// Registers both keys of every enabled buffer on `hWnd` (keys still registered elsewhere are moved).
  void RegEnabledCopyBuffersHotKeys(ide::HWnd hWnd);
  /// Unregisters both keys of every buffer that has them registered.
  void UnregEnabledCopyBuffersHotKeys();
  void RegCopyBuffersHotKey(ide::HWnd hWnd, CHotKey& hk);
  void UnregCopyBuffersHotKey(ide::HWnd hWnd, CHotKey& hk);
  /// A working copy for an editor window.
  std::vector<CBuffer> CopyCol() const { return m_buffers; }

  /// What Show() opens after reloading the buffers: the window, modally, over this object.
  void setEditor(std::function<void(CCopyBuffers&)> editor) { m_editor = std::move(editor); }
  /// Reloads the buffers and opens the window; raises a database failure with its location.
  void Show();

  /// Writes what changed and brings the registrations in line with the enabled flags (a buffer switched
  /// on is registered on the active code window, when there is one). Raises a database failure with its
  /// location; what was written stays written.
  void Save();
  /// Takes a window's working copy (text, enabled flag and unsaved changes of each buffer, not its stale
  /// registrations), then Save().
  void SaveEdits(const std::vector<CBuffer>& working);

 private:
  void registerBuffer(ide::HWnd hWnd, CBuffer& buffer);
  void unregisterBuffer(CBuffer& buffer);

  ide::WindowSystem& m_windows;
  appdata::CAppInfoFile& m_appInfo;
  TextInsertion& m_insertion;
  std::function<QString()> m_selectedText;
  std::function<ide::HWnd()> m_findActiveCodeWindow;
  std::function<void(CCopyBuffers&)> m_editor;
  std::vector<CBuffer> m_buffers;
};

}  // namespace textins

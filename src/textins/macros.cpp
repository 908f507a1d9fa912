// SPDX-License-Identifier: MIT
#include "textins/macros.h"

#include "appdata/appinfofile.h"
#include "common/errors.h"

namespace textins {
namespace {

constexpr char kModule[] = "CMacros";

struct MacroKeys {
  qint32 modifiers;
  const char* prefix;
  /// The editor's own combinations: copy, paste, cut, find and the member lists.
  const char* excluded;
};

constexpr MacroKeys kMacroKeys[] = {
    {ide::mod::Control | ide::mod::Alt, "Ctrl+Alt+", "CIJVX"},
    {ide::mod::Control | ide::mod::Shift, "Ctrl+Shift+", "CFIJVX"},
};

}  // namespace

CMacros::CMacros(ide::WindowSystem& windows, appdata::CAppInfoFile& appInfo, TextInsertion& insertion,
                 std::function<ide::HWnd()> findActiveCodeWindow)
    : m_windows(windows),
      m_appInfo(appInfo),
      m_insertion(insertion),
      m_findActiveCodeWindow(std::move(findActiveCodeWindow)) {
  for (const MacroKeys& keys : kMacroKeys) {
    for (char letter = 'A'; letter <= 'Z'; ++letter) {
      if (QByteArrayView(keys.excluded).contains(letter)) continue;
      CHotKey hk;
      hk.VirtualKey = letter;
      hk.Modifiers = keys.modifiers;
      hk.StrId = QLatin1StringView(keys.prefix) + QLatin1Char(letter);
      try {
        addAtom(m_windows, hk);
      } catch (const std::exception& failure) {
        // A macro without an atom still keeps its text; its key just cannot be registered.
        common::logFailure(failure, QLatin1StringView(kModule), QStringLiteral("Class_Initialize"), __LINE__);
      }
      m_macros.push_back(std::move(hk));
    }
  }
  try {
    InitializeFromFile();
  } catch (...) {
    for (CHotKey& hk : m_macros)
      releaseHotKey(m_windows, hk);
    throw;
  }
}

CMacros::~CMacros() {
  for (CHotKey& hk : m_macros)
    releaseHotKey(m_windows, hk);
}

void CMacros::InitializeFromFile() {
  reraisingAt(kModule, "InitializeFromFile", __LINE__, [this] {
    for (CHotKey& hk : m_macros) {
      hk.Text = m_appInfo.GetMacroText(hk.StrId);
      hk.Enabled = m_appInfo.GetMacroState(hk.StrId);
    }
  });
}

void CMacros::HandleHotKey(int IdMacro) {
  const CHotKey* hk = findHotKey(m_macros, IdMacro);
  if (!hk) {
    common::recordError(ide::Error(ide::err::InvalidProcedureCall, ide::standardDescription(5)),
                        QLatin1StringView(kModule), QStringLiteral("HandleHotKey"), __LINE__);
    return;
  }
  if (hk->Enabled) m_insertion.InsertText(hk->Text);
}

void CMacros::RegMacrosHotKey(ide::HWnd hWnd, CHotKey& hk) {
  registerHotKey(m_windows, hWnd, hk);
}

void CMacros::UnregMacrosHotKey(ide::HWnd, CHotKey& hk) {
  unregisterHotKey(m_windows, hk);
}

void CMacros::RegisterEnabledHotKeys(ide::HWnd hWnd) {
  for (CHotKey& hk : m_macros)
    if (hk.Enabled) RegMacrosHotKey(hWnd, hk);
}

void CMacros::UnregisterEnabledHotKeys(ide::HWnd hWnd) {
  // Disabled ones too: another IDE may have switched a registered macro off before a reload.
  for (CHotKey& hk : m_macros)
    if (hk.Registered) UnregMacrosHotKey(hWnd, hk);
}

void CMacros::Show() {
  InitializeFromFile();
  if (m_editor) m_editor(*this);
}

void CMacros::Save() {
  reraisingAt(kModule, "Save", __LINE__, [this] {
    const ide::HWnd hWnd = m_findActiveCodeWindow ? m_findActiveCodeWindow() : 0;
    for (CHotKey& hk : m_macros) {
      if (hk.Changed <= 0) continue;
      if (hk.Changed & HK_CHANGE_STATE) {
        if (hk.Enabled && !hk.Registered && hWnd != 0)
          RegMacrosHotKey(hWnd, hk);
        else if (!hk.Enabled && hk.Registered)
          UnregMacrosHotKey(hWnd, hk);
        m_appInfo.WriteMacroState(hk.StrId, hk.Enabled);
      }
      if (hk.Changed & HK_CHANGE_TEXT) m_appInfo.WriteMacroText(hk.StrId, hk.Text);
      hk.Changed = 0;
    }
  });
}

void CMacros::SaveEdits(const std::vector<CHotKey>& working) {
  for (const CHotKey& edited : working) {
    for (CHotKey& hk : m_macros) {
      if (hk.StrId != edited.StrId) continue;
      hk.Text = edited.Text;
      hk.Enabled = edited.Enabled;
      hk.Changed = edited.Changed;
    }
  }
  Save();
}

}  // namespace textins

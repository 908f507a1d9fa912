// SPDX-License-Identifier: MIT
#include "textins/copybuffers.h"

#include "appdata/appinfofile.h"
#include "common/errors.h"

namespace textins {
namespace {

constexpr char kModule[] = "CCopyBuffers";
constexpr qint32 kCopy = 1;
constexpr qint32 kPaste = 0;

CHotKey bufferKey(ide::WindowSystem& windows, char digit, bool copy) {
  CHotKey hk;
  hk.StrId = QLatin1StringView(copy ? "CtrlShift" : "Ctrl") + QLatin1Char(digit);
  hk.Modifiers = copy ? ide::mod::Control | ide::mod::Shift : ide::mod::Control;
  hk.VirtualKey = digit;
  hk.Operation = copy ? kCopy : kPaste;
  try {
    addAtom(windows, hk);
  } catch (const std::exception& failure) {
    // The buffer keeps its text; this key just cannot be registered.
    common::logFailure(failure, QLatin1StringView(kModule), QStringLiteral("Class_Initialize"), __LINE__);
  }
  return hk;
}

}  // namespace

CCopyBuffers::CCopyBuffers(ide::WindowSystem& windows, appdata::CAppInfoFile& appInfo,
                           TextInsertion& insertion, std::function<QString()> GetSelectedText,
                           std::function<ide::HWnd()> findActiveCodeWindow)
    : m_windows(windows),
      m_appInfo(appInfo),
      m_insertion(insertion),
      m_selectedText(std::move(GetSelectedText)),
      m_findActiveCodeWindow(std::move(findActiveCodeWindow)) {
  for (char digit = '0'; digit <= '9'; ++digit) {
    CBuffer buffer;
    buffer.IdBuffer = QStringLiteral("Ctrl+") + QLatin1Char(digit);
    buffer.HotKeyCopy = bufferKey(m_windows, digit, true);
    buffer.HotKeyPaste = bufferKey(m_windows, digit, false);
    m_buffers.push_back(std::move(buffer));
  }
  try {
    InitializeFromFile();
  } catch (...) {
    for (CBuffer& buffer : m_buffers) {
      releaseHotKey(m_windows, buffer.HotKeyCopy);
      releaseHotKey(m_windows, buffer.HotKeyPaste);
    }
    throw;
  }
}

CCopyBuffers::~CCopyBuffers() {
  for (CBuffer& buffer : m_buffers) {
    releaseHotKey(m_windows, buffer.HotKeyCopy);
    releaseHotKey(m_windows, buffer.HotKeyPaste);
  }
}

std::vector<const CHotKey*> CCopyBuffers::HotKeys() const {
  std::vector<const CHotKey*> keys;
  for (const CBuffer& buffer : m_buffers)
    keys.push_back(&buffer.HotKeyCopy);
  for (const CBuffer& buffer : m_buffers)
    keys.push_back(&buffer.HotKeyPaste);
  return keys;
}

void CCopyBuffers::InitializeFromFile() {
  reraisingAt(kModule, "InitializeFromFile", __LINE__, [this] {
    for (CBuffer& buffer : m_buffers) {
      buffer.Text = m_appInfo.GetCopyBufferText(buffer.IdBuffer);
      buffer.Enabled = m_appInfo.GetCopyBufferState(buffer.IdBuffer);
    }
  });
}

void CCopyBuffers::HandleHotKey(int IdHotKey) {
  for (CBuffer& buffer : m_buffers) {
    for (const CHotKey* hk : {&buffer.HotKeyCopy, &buffer.HotKeyPaste}) {
      if (hk->Id != IdHotKey) continue;
      if (!buffer.Enabled) return;
      if (hk->Operation != kCopy) {
        m_insertion.InsertText(buffer.Text);
        return;
      }
      try {
        buffer.Text = m_selectedText ? m_selectedText() : QString();
        m_appInfo.WriteCopyBufferText(buffer.IdBuffer, buffer.Text);
      } catch (const std::exception& failure) {
        // The buffer still pastes what was copied in this session; the log says why it was not stored.
        common::recordError(failure, QLatin1StringView(kModule), QStringLiteral("HandleHotKey"), __LINE__);
        common::logLastError();
      }
      return;
    }
  }
  common::recordError(ide::Error(ide::err::InvalidProcedureCall, ide::standardDescription(5)),
                      QLatin1StringView(kModule), QStringLiteral("HandleHotKey"), __LINE__);
}

void CCopyBuffers::RegCopyBuffersHotKey(ide::HWnd hWnd, CHotKey& hk) {
  registerHotKey(m_windows, hWnd, hk);
}

void CCopyBuffers::UnregCopyBuffersHotKey(ide::HWnd, CHotKey& hk) {
  unregisterHotKey(m_windows, hk);
}

void CCopyBuffers::registerBuffer(ide::HWnd hWnd, CBuffer& buffer) {
  RegCopyBuffersHotKey(hWnd, buffer.HotKeyCopy);
  RegCopyBuffersHotKey(hWnd, buffer.HotKeyPaste);
  buffer.Registered = true;
}

void CCopyBuffers::unregisterBuffer(CBuffer& buffer) {
  UnregCopyBuffersHotKey(buffer.HotKeyCopy.RegisteredOn, buffer.HotKeyCopy);
  UnregCopyBuffersHotKey(buffer.HotKeyPaste.RegisteredOn, buffer.HotKeyPaste);
  buffer.Registered = false;
}

void CCopyBuffers::RegEnabledCopyBuffersHotKeys(ide::HWnd hWnd) {
  for (CBuffer& buffer : m_buffers)
    if (buffer.Enabled) registerBuffer(hWnd, buffer);
}

void CCopyBuffers::UnregEnabledCopyBuffersHotKeys() {
  // Disabled ones too: another IDE may have switched a registered buffer off before a reload.
  for (CBuffer& buffer : m_buffers)
    if (buffer.Registered) unregisterBuffer(buffer);
}

void CCopyBuffers::Show() {
  InitializeFromFile();
  if (m_editor) m_editor(*this);
}

void CCopyBuffers::Save() {
  reraisingAt(kModule, "Save", __LINE__, [this] {
    const ide::HWnd hWnd = m_findActiveCodeWindow ? m_findActiveCodeWindow() : 0;
    for (CBuffer& buffer : m_buffers) {
      if (buffer.Changed <= 0) continue;
      if (buffer.Changed & HK_CHANGE_STATE) {
        if (buffer.Enabled && !buffer.Registered && hWnd != 0)
          registerBuffer(hWnd, buffer);
        else if (!buffer.Enabled && buffer.Registered)
          unregisterBuffer(buffer);
        m_appInfo.WriteCopyBufferState(buffer.IdBuffer, buffer.Enabled);
      }
      if (buffer.Changed & HK_CHANGE_TEXT) m_appInfo.WriteCopyBufferText(buffer.IdBuffer, buffer.Text);
      buffer.Changed = 0;
    }
  });
}

void CCopyBuffers::SaveEdits(const std::vector<CBuffer>& working) {
  for (const CBuffer& edited : working) {
    for (CBuffer& buffer : m_buffers) {
      if (buffer.IdBuffer != edited.IdBuffer) continue;
      buffer.Text = edited.Text;
      buffer.Enabled = edited.Enabled;
      buffer.Changed = edited.Changed;
    }
  }
  Save();
}

}  // namespace textins

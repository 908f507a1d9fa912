// SPDX-License-Identifier: MIT
// The keyboard macros and the copy buffers as the add-in reaches them: their commands open their windows,
// and their hotkeys are the hotkey procedure's clients. Both keep their texts in the application
// database; without it they are not created, and their commands say why.
#pragma once

#include "addin/envutils.h"
#include "addin/features.h"
#include "textins/copybuffers.h"
#include "textins/macros.h"

#include <optional>

namespace addin {

class TextTools {
 public:
  /// Creates the copy buffers, then the macros, when the database is there; raises what loading them
  /// raised.
  explicit TextTools(const FeatureServices& services);
  /// Releases the copy buffers, then the macros.
  ~TextTools();
  TextTools(const TextTools&) = delete;
  TextTools& operator=(const TextTools&) = delete;

  /// Open their windows; without the database they show why they cannot.
  void showMacros();
  void showCopyBuffers();
  /// Null without the database.
  HotKeyClient* macros() { return m_macros ? &m_macroKeys : nullptr; }
  HotKeyClient* copyBuffers() { return m_copyBuffers ? &m_bufferKeys : nullptr; }

 private:
  class MacroKeys final : public HotKeyClient {
   public:
    explicit MacroKeys(TextTools& tools) : m_tools(tools) {}
    void registerHotKeys(ide::HWnd window) override { m_tools.m_macros->RegisterEnabledHotKeys(window); }
    void unregisterHotKeys(ide::HWnd window) override { m_tools.m_macros->UnregisterEnabledHotKeys(window); }
    void HandleHotKey(int id) override { m_tools.m_macros->HandleHotKey(id); }

   private:
    TextTools& m_tools;
  };
  class BufferKeys final : public HotKeyClient {
   public:
    explicit BufferKeys(TextTools& tools) : m_tools(tools) {}
    void registerHotKeys(ide::HWnd window) override {
      m_tools.m_copyBuffers->RegEnabledCopyBuffersHotKeys(window);
    }
    void unregisterHotKeys(ide::HWnd) override { m_tools.m_copyBuffers->UnregEnabledCopyBuffersHotKeys(); }
    void HandleHotKey(int id) override { m_tools.m_copyBuffers->HandleHotKey(id); }

   private:
    TextTools& m_tools;
  };

  /// Runs a window command; a failure is shown as the outermost handler shows it.
  void command(const char* procedure, const std::function<void()>& show);
  bool available();

  ide::Ref<ide::VBE> m_vbe;
  ide::UserInterface& m_ui;
  QString m_unavailable;
  CEnvUtils m_envUtils;
  MacroKeys m_macroKeys{*this};
  BufferKeys m_bufferKeys{*this};
  std::optional<textins::CMacros> m_macros;
  std::optional<textins::CCopyBuffers> m_copyBuffers;  // released first
};

}  // namespace addin

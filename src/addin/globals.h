// SPDX-License-Identifier: MIT
// The add-in's global state for one connection, in one object. Constructing it runs the start-up (reading
// the settings to starting the timer); destroying it is the shut-down. The members are declared so that
// C++ releases them in the shut-down order: the timer, the hotkey procedure, the command-bar controls
// (menu items, popup, context-menu items, toolbar), the event sinks (clicks, then the IDE's), the
// utilities, the history and the application database. A start-up that fails half-way therefore takes
// apart exactly what it built.
#pragma once

#include "addin/envutils.h"
#include "addin/features.h"
#include "addin/hotkeys.h"
#include "addin/machineconfig.h"
#include "addin/vbevents.h"
#include "appdata/appinfofile.h"
#include "common/commandstate.h"
#include "common/options.h"
#include "common/settings.h"
#include "navigation/browsesampler.h"
#include "navigation/histories.h"
#include "textins/textinsertion.h"

#include <array>
#include <functional>
#include <memory>
#include <optional>
#include <vector>

namespace addin {

/// What the start-up reads before the global state is built.
struct StartupValues {
  /// The display model when the add-in started (the code-window search follows it until reloaded).
  ide::DisplayModel StartDisplayModel = ide::DisplayModel::MDI;
  /// The installation directory, ending in "/".
  QString InstallDir;
};

/// The platform stand-ins the add-in uses; empty members get the real ones.
struct Environment {
  std::shared_ptr<MachineConfig> machineConfig;
  std::function<std::unique_ptr<Features>(const FeatureServices&)> createFeatures;
};

/// The add-in's controls in the IDE's command bars. Released in this order: the menu items (in table
/// order), the popup, the two context-menu items, the toolbar.
class AddInControls {
 public:
  AddInControls() = default;
  ~AddInControls();
  AddInControls(const AddInControls&) = delete;
  AddInControls& operator=(const AddInControls&) = delete;

  void setContextItemsEnabled(bool enabled);

  OwnedBar toolbar;
  /// On "Code Window" and "Code Window (Break)".
  std::array<OwnedControl, 2> contextItems;
  OwnedControl popup;
  /// One per popup command, in table order.
  std::vector<OwnedControl> menuItems;
};

/// A timer of the IDE's loop, killed when released.
class ScopedTimer {
 public:
  /// Raises an error when the timer cannot be started.
  ScopedTimer(ide::EventLoop& loop, int intervalMs, std::function<void()> callback);
  ~ScopedTimer();
  ScopedTimer(const ScopedTimer&) = delete;
  ScopedTimer& operator=(const ScopedTimer&) = delete;
  int id() const { return m_id; }

 private:
  ide::EventLoop& m_loop;
  int m_id;
};

class Globals {
 public:
  static constexpr int kTimerIntervalMs = 100;

  /// The start-up once the installation directory is known: settings, idle message, machine configuration,
  /// names, history, feature areas, command bars, event sinks and timer. Raises the failure of any of them
  /// (what was built is released).
  Globals(ide::Ref<ide::VBE> vbe, ide::Ref<ide::AddIn> addIn, StartupValues values, Environment& environment);
  ~Globals();
  Globals(const Globals&) = delete;
  Globals& operator=(const Globals&) = delete;

  /// The 100 ms timer's tick; failures are swallowed (their number is recorded).
  void onTimer();
  /// The command-state update of the timer: `codeWindowActive` enables new procedure and the context-menu
  /// items; with no project left, the history is cleared and the project commands are disabled.
  void updateCommandState(bool codeWindowActive);

  ide::VBE& vbe() const { return *m_vbe; }
  const ide::Ref<ide::VBE>& VBInstance() const { return m_vbe; }
  const StartupValues& values() const { return m_values; }
  const QString& ComputerName() const { return m_computerName; }
  const QString& UserName() const { return m_userName; }
  unsigned IdleMessage() const { return m_idleMessage; }
  common::SettingsStore& settings() { return m_settings; }
  /// The option globals (the options dialog sets them).
  common::Options& options() { return m_options; }
  common::CommandState& CommandState() { return m_commandState; }
  int LastWindowType() const { return m_lastWindowType; }
  /// The application database; null when it could not be opened (the add-in runs on without it).
  appdata::CAppInfoFile* AppInfo() { return m_appInfo && m_appInfo->IsOpen() ? &*m_appInfo : nullptr; }
  /// What the user was told when the database could not be opened; empty while it is open.
  const QString& AppInfoUnavailable() const { return m_appInfo->UnavailableMessage(); }
  textins::TextInsertion& TextInsertion() { return *m_textInsertion; }
  navigation::CHistories& Histories() { return *m_histories; }
  navigation::BrowseSampler& sampler() { return *m_sampler; }
  CEnvUtils& EnvUtils() { return *m_envUtils; }
  Features& features() { return *m_features; }
  CVBEvents& VBEvents() { return *m_vbEvents; }
  AddInControls& controls() { return *m_controls; }
  HotKeyWindow& hotKeyWindow() { return *m_hotKeyWindow; }
  int TimerId() const { return m_timer ? m_timer->id() : 0; }

 private:
  void buildCommandBars();
  /// The tick's window tracking: notes the active window's type; true when a code window is active.
  bool trackActiveWindow(const ide::Ref<ide::Window>& active);

  ide::Ref<ide::VBE> m_vbe;      // VBInstance
  ide::Ref<ide::AddIn> m_addIn;  // AddInInstance
  StartupValues m_values;
  QString m_computerName;
  QString m_userName;
  unsigned m_idleMessage = 0;
  common::SettingsStore m_settings;
  common::Options m_options;
  common::CommandState m_commandState;
  int m_lastWindowType = -1;

  // Released last: the project info objects will sit here; then the application database, after the
  // history.
  std::optional<appdata::CAppInfoFile> m_appInfo;
  std::optional<textins::TextInsertion> m_textInsertion;
  std::optional<navigation::CHistories> m_histories;
  std::optional<navigation::BrowseSampler> m_sampler;
  std::optional<CEnvUtils> m_envUtils;
  std::unique_ptr<Features> m_features;
  std::optional<CVBEvents> m_vbEvents;
  std::optional<AddInControls> m_controls;
  // The keyboard macros, the copy buffers and the extended find window will sit here, released after the
  // hotkey procedure.
  std::optional<HotKeyWindow> m_hotKeyWindow;
  std::optional<ScopedTimer> m_timer;  // released first
};

}  // namespace addin

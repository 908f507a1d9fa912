// SPDX-License-Identifier: MIT
// Shared helpers of the add-in's tests: a private environment (settings, error log, machine
// configuration and installation directory in a temporary directory), the add-in loaded through the IDE
// model either as the real library or as the linked core with stand-ins, and projects to work on.
#pragma once

#include "addin/connect.h"
#include "addin/features.h"
#include "common/commandstate.h"
#include "host/model/addins.h"
#include "host/model/vbe.h"
#include "host/platform/headlessui.h"
#include "host/platform/manualloop.h"
#include "printers.h"

#include <QString>
#include <QStringList>
#include <QTemporaryDir>

#include <map>
#include <memory>
#include <vector>

namespace addin::test {

/// Points the add-in's configuration, error log and machine configuration into a temporary directory for
/// the lifetime of the object. The installation directory holds a help/index.html.
class AddInEnvironment {
 public:
  AddInEnvironment();
  ~AddInEnvironment();
  AddInEnvironment(const AddInEnvironment&) = delete;
  AddInEnvironment& operator=(const AddInEnvironment&) = delete;

  QString path(const QString& relative) const { return m_dir.filePath(relative); }
  /// The installation directory, without a trailing "/".
  QString installDir() const { return path(u"install"_qs); }
  QString machineConfigPath() const { return path(u"quimbel.conf"_qs); }
  /// Rewrites the machine configuration with these lines.
  void writeMachineConfig(const QString& text) const;
  /// The error log's lines so far.
  QStringList errorLog() const;

 private:
  QTemporaryDir m_dir;
};

/// Every command bar of the IDE with its controls (caption, tag, type, position), as one text.
QString commandBarsSnapshot(ide::CommandBars& bars);

/// The "Quimbel" popups in the menu bar.
int quimbelPopups(ide::VBE& vbe);
/// The command bars named "Quimbel 2.2".
int quimbelToolBars(ide::VBE& vbe);

/// Loads the real add-in library into the IDE model and drives it.
host::AddInImpl& registerRealAddIn(host::VbeImpl& vbe, bool loadAtStartup);

/// The IDE's add-in object for a linked Connect: records what the add-in asks of it.
class FakeAddIn final : public ide::AddIn {
 public:
  explicit FakeAddIn(std::shared_ptr<host::VbeImpl> vbe) : m_vbe(std::move(vbe)) {}
  QString ProgId() override { return u"Quimbel.Connect"_qs; }
  QString Description() override { return u"Quimbel 2.2 Add-In"_qs; }
  bool Connect() override { return m_connected; }
  void setConnect(bool connect) override {
    m_connected = connect;
    requests.push_back(connect);
  }
  ide::Ref<ide::VBE> VBE() override { return m_vbe; }

  std::vector<bool> requests;

 private:
  std::shared_ptr<host::VbeImpl> m_vbe;
  bool m_connected = true;
};

/// Hotkeys a test client registers: identifier -> (modifiers, virtual key).
struct TestHotKey {
  int id;
  unsigned modifiers;
  unsigned virtualKey;
};

/// A copy-buffers or macros client that registers its hotkeys with the window system and logs every call.
class RecordingHotKeyClient final : public HotKeyClient {
 public:
  RecordingHotKeyClient(ide::WindowSystem& windows, QString name, std::vector<TestHotKey> keys)
      : m_windows(windows), m_name(std::move(name)), m_keys(std::move(keys)) {}
  void registerHotKeys(ide::HWnd window) override;
  void unregisterHotKeys(ide::HWnd window) override;
  void HandleHotKey(int id) override { log << u"%1 hotkey %2"_qs.arg(m_name).arg(id); }

  QStringList log;
  /// The window the hotkeys are registered on; 0 when none.
  ide::HWnd registeredOn = 0;

 private:
  ide::WindowSystem& m_windows;
  QString m_name;
  std::vector<TestHotKey> m_keys;
};

/// Feature areas that record every call instead of acting.
class RecordingFeatures final : public Features {
 public:
  RecordingFeatures(QStringList& log, const QString& failing) : m_log(log), m_failing(failing) {}
  void showFavorites() override { note(u"favorites"_qs); }
  void showMacros() override { note(u"macros"_qs); }
  void showCopyBuffers() override { note(u"copy buffers"_qs); }
  void showLineNumbering() override { note(u"numbering"_qs); }
  void showIndentation() override { note(u"indentation"_qs); }
  void showExtendedFind() override { note(u"find"_qs); }
  void showTaskList() override { note(u"tasks"_qs); }
  void showNewProcedure() override { note(u"new procedure"_qs); }
  void showOptions() override { note(u"options"_qs); }
  void addFavorite(const FavoritePlace& place) override;
  void projectAdded(const ide::Ref<ide::VBProject>& p) override { note(u"project added "_qs + p->Name()); }
  void projectRemoved(const ide::Ref<ide::VBProject>& p) override {
    note(u"project removed "_qs + p->Name());
  }
  void projectRenamed(const ide::Ref<ide::VBProject>& p, const QString& old) override {
    note(u"project renamed "_qs + old + u" "_qs + p->Name());
  }
  void projectFileMoved(const ide::Ref<ide::VBProject>& p, const QString&, const QString&) override {
    note(u"project moved "_qs + p->Name());
  }
  bool isIdentityModule(const ide::Ref<ide::VBComponent>&) override { return false; }
  void allProjectsClosed() override {}
  void componentAdded(const ide::Ref<ide::VBComponent>& c) override {
    note(u"component added "_qs + c->Name());
  }
  void componentRemoved(const ide::Ref<ide::VBComponent>& c) override {
    note(u"component removed "_qs + c->Name());
  }
  void componentRenamed(const ide::Ref<ide::VBComponent>& c, const QString& old) override {
    note(u"component renamed "_qs + old + u" "_qs + c->Name());
  }
  void controlAdded(const ide::Ref<ide::VBControl>& c) override { note(u"control added "_qs + c->name()); }
  void controlRenamed(const ide::Ref<ide::VBControl>& c, const QString& old, int) override {
    note(u"control renamed "_qs + old + u" "_qs + c->name());
  }
  void findWindowProjectRemoved(const ide::Ref<ide::VBProject>&) override {}
  void findWindowComponentRemoved(const ide::Ref<ide::VBComponent>&) override {}
  HotKeyClient* copyBuffers() override { return copyBuffersClient; }
  HotKeyClient* macros() override { return macrosClient; }

  HotKeyClient* copyBuffersClient = nullptr;
  HotKeyClient* macrosClient = nullptr;

 private:
  /// Records a call, or fails it when it is the one the test wants to fail.
  void note(const QString& call) {
    if (!m_failing.isEmpty() && call.startsWith(m_failing)) ide::raise(ide::err::InvalidProcedureCall);
    m_log << call;
  }

  QStringList& m_log;
  const QString& m_failing;
};

/// The add-in's core linked into the test, connected to a headless IDE with recording feature areas.
class LinkedAddIn {
 public:
  explicit LinkedAddIn(ide::DisplayModel displayModel = ide::DisplayModel::MDI);
  ~LinkedAddIn();

  /// Connects as the add-in manager does after the IDE's start-up (the start-up runs at once).
  void connect();
  void disconnect();

  std::shared_ptr<host::VbeImpl> vbe;
  std::shared_ptr<FakeAddIn> addIn;
  std::unique_ptr<addin::Connect> connection;
  QStringList featureLog;
  /// The feature call that fails (the start of what it records); empty: none.
  QString failingFeature;
  /// Set before connect() to give the features hotkey clients.
  HotKeyClient* copyBuffers = nullptr;
  HotKeyClient* macros = nullptr;

  Globals& globals() { return *connection->globals(); }
  host::ManualEventLoop& loop() { return *vbe->manualLoop(); }
  host::HeadlessUi& ui() { return *vbe->headlessUi(); }
  /// Clicks the toolbar button or popup item of `command`.
  void clickToolBar(common::CommandId command);
  void clickMenu(common::CommandId command);
  /// The features called since the last take.
  QStringList takeFeatureLog();
};

/// A standard module named `name` in `project` with `procedures` Subs of `linesEach` lines each, named
/// Proc1, Proc2 ..., after two declaration lines.
std::shared_ptr<host::ComponentImpl> addModule(const std::shared_ptr<host::ProjectImpl>& project,
                                               const QString& name, int procedures, int linesEach);
/// Shows the module's code pane (active, focused) with `topLine` as its first visible line.
ide::Ref<ide::CodePane> showAt(const std::shared_ptr<host::ComponentImpl>& component, int topLine);

}  // namespace addin::test

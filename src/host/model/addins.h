// SPDX-License-Identifier: MIT
// Add-ins: shared libraries registered with the IDE, loaded and connected through their connection object,
// and disconnected again. The library stays mapped once loaded: widgets and callbacks it created may be
// released by Qt after the disconnection, and a later connection reuses it.
#pragma once

#include "ide/extensibility.h"
#include "ide/vbide.h"

#include <QLibrary>
#include <QString>

#include <memory>
#include <vector>

namespace host {

class VbeImpl;

class AddInImpl final : public ide::AddIn, public std::enable_shared_from_this<AddInImpl> {
 public:
  AddInImpl(const std::shared_ptr<VbeImpl>& vbe, QString libraryPath, QString progId, QString description,
            bool loadOnStartup, QString details = {});
  ~AddInImpl() override;

  QString ProgId() override { return m_progId; }
  QString Description() override { return m_description; }
  bool Connect() override { return m_connection != nullptr && !m_disconnectPending; }
  /// true connects at once (mode AfterStartup); false disconnects once the current work is done, so that
  /// an add-in may unload itself from inside its own code.
  void setConnect(bool connect) override;
  ide::Ref<ide::VBE> VBE() override;

  QString libraryPath() const { return m_libraryPath; }
  /// What the add-in says it does (its description when it says nothing more).
  QString details() const { return m_details.isEmpty() ? m_description : m_details; }
  bool loadOnStartup() const { return m_loadOnStartup; }
  void setLoadOnStartup(bool load) { m_loadOnStartup = load; }
  /// Loads the library (once) and connects a new connection object.
  void connect(ide::ConnectMode mode);
  void startupComplete();
  void addInsUpdate();
  /// Disconnects and destroys the connection object now.
  void disconnect(ide::DisconnectMode mode);
  /// How many times the add-in has been connected in this session.
  int connectionCount() const { return m_connectionCount; }

 private:
  std::weak_ptr<VbeImpl> m_vbe;
  QString m_libraryPath;
  QString m_progId;
  QString m_description;
  QString m_details;
  bool m_loadOnStartup;
  QLibrary m_library;
  std::unique_ptr<ide::IDTExtensibility> m_connection;
  bool m_disconnectPending = false;
  int m_connectionCount = 0;
};

class AddInsImpl final : public ide::AddIns {
 public:
  explicit AddInsImpl(const std::shared_ptr<VbeImpl>& vbe);
  ~AddInsImpl() override;

  int Count() override { return static_cast<int>(m_addIns.size()); }
  ide::Ref<ide::AddIn> Item(int index) override;
  ide::Ref<ide::AddIn> Item(const QString& progId) override;

  /// Registers the add-in library at `path` (its description is read from it). Registering the same
  /// ProgId again updates its path. Throws ide::Error 48 when the library cannot be loaded or is not an
  /// add-in.
  std::shared_ptr<AddInImpl> registerLibrary(const QString& path, bool loadOnStartup);
  const std::vector<std::shared_ptr<AddInImpl>>& addIns() const { return m_addIns; }
  /// Tells every connected add-in that the list of connected add-ins changed.
  void notifyUpdate();

 private:
  std::weak_ptr<VbeImpl> m_vbe;
  std::vector<std::shared_ptr<AddInImpl>> m_addIns;
};

}  // namespace host

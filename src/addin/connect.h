// SPDX-License-Identifier: MIT
// The add-in's connection object: the IDE creates it and drives its life cycle. Loaded with the IDE, the
// add-in starts when the IDE's start-up is complete; loaded later, at once. A start-up that fails tells
// the user and unloads the add-in; the disconnection takes everything the add-in put into the IDE away.
#pragma once

#include "addin/globals.h"
#include "ide/extensibility.h"
#include "ide/vbide.h"

#include <memory>

namespace addin {

class Connect final : public ide::IDTExtensibility {
 public:
  explicit Connect(Environment environment = {});
  ~Connect() override;

  void OnConnection(const ide::Ref<ide::VBE>& application, ide::ConnectMode mode,
                    const ide::Ref<ide::AddIn>& addInInst, QVariantList& custom) override;
  void OnDisconnection(ide::DisconnectMode mode, QVariantList& custom) override;
  void OnAddInsUpdate(QVariantList& custom) override;
  void OnStartupComplete(QVariantList& custom) override;

  /// The running add-in's state; null before the start-up and after the disconnection.
  Globals* globals() const { return m_globals.get(); }

 private:
  void startup();
  std::unique_ptr<Globals> startupRoutine();
  /// Asks the IDE to unload the add-in (it does so once the current work is done).
  void unload();

  Environment m_environment;
  ide::Ref<ide::VBE> m_vbInstance;
  ide::Ref<ide::AddIn> m_addInInstance;
  std::unique_ptr<Globals> m_globals;
};

}  // namespace addin

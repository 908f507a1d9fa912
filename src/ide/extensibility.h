// SPDX-License-Identifier: MIT
// The contract between the IDE and an add-in library.
//
// An add-in is a shared library that exports two C functions (see below). The IDE reads the add-in's
// description, creates its connection object and drives its life cycle:
//   OnConnection(mode Startup)  -> OnStartupComplete            when loaded while the IDE starts;
//   OnConnection(mode AfterStartup)                              when loaded later (add-in manager);
//   OnAddInsUpdate                                               whenever the list of loaded add-ins changes;
//   OnDisconnection                                              when unloaded or when the IDE closes.
// After OnDisconnection the IDE destroys the connection object; it may load the add-in again later in the
// same session.
#pragma once

#include "ide/types.h"

#include <QVariantList>

namespace ide {

class VBE;
class AddIn;

class IDTExtensibility {
 public:
  virtual ~IDTExtensibility() = default;
  virtual void OnConnection(const Ref<VBE>& application, ConnectMode mode, const Ref<AddIn>& addInInst,
                            QVariantList& custom) = 0;
  virtual void OnDisconnection(DisconnectMode mode, QVariantList& custom) = 0;
  virtual void OnAddInsUpdate(QVariantList& custom) = 0;
  virtual void OnStartupComplete(QVariantList& custom) = 0;
};

/// What an add-in library says about itself.
struct AddInDescription {
  const char* progId;             // "Quimbel.Connect"
  const char* description;        // the name the add-in manager lists
  const char* details = nullptr;  // what it does, shown under the list (UTF-8); none: the name again
};

}  // namespace ide

/// Exported by every add-in library (C linkage, so the IDE finds them by name).
extern "C" {
using IdeAddInDescribeFn = const ide::AddInDescription* (*)();
using IdeAddInCreateFn = ide::IDTExtensibility* (*)();
}
inline constexpr const char kIdeAddInDescribeSymbol[] = "ideAddInDescribe";
inline constexpr const char kIdeAddInCreateSymbol[] = "ideAddInCreate";

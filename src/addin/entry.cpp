// SPDX-License-Identifier: MIT
// The two functions the IDE looks for in an add-in library.
#include "addin/connect.h"
#include "addin/texts.h"
#include "ide/extensibility.h"

namespace {
const ide::AddInDescription kAddIn{addin::kProgId, addin::kDescription, addin::kDetails};
}  // namespace

extern "C" Q_DECL_EXPORT const ide::AddInDescription* ideAddInDescribe() {
  return &kAddIn;
}

extern "C" Q_DECL_EXPORT ide::IDTExtensibility* ideAddInCreate() {
  return new addin::Connect();
}

// SPDX-License-Identifier: MIT
// One occurrence the extended find listed: the project searched, the module that holds it and its place,
// exactly as the code module's Find returned it.
#pragma once

#include "ide/vbide.h"

namespace find {

struct CItemFound {
  ide::Ref<ide::VBProject> Project;
  ide::Ref<ide::VBComponent> Component;
  qint32 startline = 0;
  qint32 startcol = 0;
  qint32 endline = 0;
  /// Just after the last character.
  qint32 endcol = 0;
};

}  // namespace find

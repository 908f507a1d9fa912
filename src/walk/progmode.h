// SPDX-License-Identifier: MIT
// The scope of a walk: the active project, the selected module, the procedure at the caret.
#pragma once

#include <QtGlobal>

namespace walk {

enum PROG_MODE : qint32 {
  PROG_PROJECT = 1,    // every module of the active project
  PROG_MODULE = 2,     // the selected component's code module
  PROG_PROCEDURE = 3,  // the procedure at the caret
};

}  // namespace walk

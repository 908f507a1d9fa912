// SPDX-License-Identifier: MIT
// The scope of a numbering or indentation run, shared by the dialogs, the number-and-indent command and
// the command-line tool.
#pragma once

#include <QtGlobal>

namespace transform {

enum PROG_MODE : qint32 {
  PROG_PROJECT = 1,    // every module of the active project
  PROG_MODULE = 2,     // the selected component's code module
  PROG_PROCEDURE = 3,  // the procedure at the caret
};

}  // namespace transform

// SPDX-License-Identifier: MIT
#include "addin/commandtable.h"

#include "addin/vbevents.h"

#include <array>

namespace addin {
namespace {

constexpr unsigned kBar = OnToolBar | OnPopup;

// clang-format off
constexpr std::array<CommandEntry, 14> kCommands{{
    // number, picture, tag, placement, state entry, handler
    {1, 2, "MVBackward", kBar, 0, &CVBEvents::EvButtonBrowseBackward_Click},
    {2, 3, "MVForward", kBar, 1, &CVBEvents::EvButtonBrowseForward_Click},
    {3, 4, "MVDirectAccess", kBar, 2, &CVBEvents::EvButtonFavorites_Click},
    {4, 5, "MVMacros", kBar, 3, &CVBEvents::EvButtonMacros_Click},
    {5, 6, "MVCopyBuffers", kBar, 4, &CVBEvents::EvButtonCopyBuffers_Click},
    {6, 7, "MVLinesNumbering", kBar, 5, &CVBEvents::EvButtonLinesNumbering_Click},
    {7, 8, "MVIndentation", kBar, 6, &CVBEvents::EvButtonIndentation_Click},
    {8, 9, "MVCloseWindows", kBar, 7, &CVBEvents::EvButtonCloseWindows_Click},
    {9, 10, "MVExtendedFind", kBar, 8, &CVBEvents::EvButtonExtendedFind_Click},
    {10, 11, "MVNotes", kBar, 9, &CVBEvents::EvButtonTaskList_Click},
    {11, 12, "MVNewProcedure", kBar, 10, &CVBEvents::EvButtonNewProcedure_Click},
    {12, 13, "MVOptions", kBar, kUngated, &CVBEvents::EvButtonOptions_Click},
    {14, 15, nullptr, OnPopup, 13, &CVBEvents::EvMnuQMHelpHandler_Click},
    // The context-menu item follows its state through its Enabled property instead of a gate.
    {20, 4, nullptr, OnCodeWindowMenus, kUngated, &CVBEvents::EvMnuAddToFavoritesDsg_Click},
}};
// clang-format on

}  // namespace

std::span<const CommandEntry> commandTable() {
  return kCommands;
}

}  // namespace addin

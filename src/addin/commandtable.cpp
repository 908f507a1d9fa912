// SPDX-License-Identifier: MIT
#include "addin/commandtable.h"

#include "addin/vbevents.h"

#include <array>

namespace addin {
namespace {

constexpr unsigned kBar = OnToolBar | OnPopup;
using Id = common::CommandId;

// clang-format off
constexpr std::array<CommandEntry, 14> kCommands{{
    // command, picture, tag, placement, gated, handler
    {Id::BrowseBackward, 2, "MVBackward", kBar, true, &CVBEvents::EvButtonBrowseBackward_Click},
    {Id::BrowseForward, 3, "MVForward", kBar, true, &CVBEvents::EvButtonBrowseForward_Click},
    {Id::Favorites, 4, "MVDirectAccess", kBar, true, &CVBEvents::EvButtonFavorites_Click},
    {Id::Macros, 5, "MVMacros", kBar, true, &CVBEvents::EvButtonMacros_Click},
    {Id::CopyBuffers, 6, "MVCopyBuffers", kBar, true, &CVBEvents::EvButtonCopyBuffers_Click},
    {Id::LinesNumbering, 7, "MVLinesNumbering", kBar, true, &CVBEvents::EvButtonLinesNumbering_Click},
    {Id::Indentation, 8, "MVIndentation", kBar, true, &CVBEvents::EvButtonIndentation_Click},
    {Id::CloseWindows, 9, "MVCloseWindows", kBar, true, &CVBEvents::EvButtonCloseWindows_Click},
    {Id::ExtendedFind, 10, "MVExtendedFind", kBar, true, &CVBEvents::EvButtonExtendedFind_Click},
    {Id::TaskList, 11, "MVNotes", kBar, true, &CVBEvents::EvButtonTaskList_Click},
    {Id::NewProcedure, 12, "MVNewProcedure", kBar, true, &CVBEvents::EvButtonNewProcedure_Click},
    {Id::Options, 13, "MVOptions", kBar, false, &CVBEvents::EvButtonOptions_Click},
    {Id::Help, 15, nullptr, OnPopup, true, &CVBEvents::EvMnuQMHelpHandler_Click},
    // The context-menu item follows its state through its Enabled property instead of a gate.
    {Id::AddToFavorites, 4, nullptr, OnCodeWindowMenus, false, &CVBEvents::EvMnuAddToFavoritesDsg_Click},
}};
// clang-format on

}  // namespace

std::span<const CommandEntry> commandTable() {
  return kCommands;
}

}  // namespace addin

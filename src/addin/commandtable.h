// SPDX-License-Identifier: MIT
// The add-in's commands in one table: what each puts into the IDE (toolbar button, popup menu item,
// code-window context-menu item), with which caption, tag and picture, whether its command state gates it,
// and which handler of CVBEvents runs it. The toolbar and the popup list the commands in table order.
#pragma once

#include "common/commandstate.h"

#include <span>

namespace addin {

class CVBEvents;

/// Where a command appears.
enum Placement : unsigned {
  OnToolBar = 1,
  OnPopup = 2,
  /// The top of both code-window context menus ("Code Window" and "Code Window (Break)").
  OnCodeWindowMenus = 4,
};

struct CommandEntry {
  /// The command; its caption (and tooltip) is the string resource of its number.
  common::CommandId id;
  /// The picture: bitmap resource number.
  int picture;
  /// The toolbar button's tag (toolbar commands only).
  const char* tag;
  unsigned placement;
  /// Whether a click does anything only while the command's state is true.
  bool gated;
  void (CVBEvents::*handler)();

  int captionResource() const { return static_cast<int>(id); }
};

/// Every command, toolbar order first.
std::span<const CommandEntry> commandTable();

/// The toolbar's twelve buttons hold table rows 1 to 12; the popup the thirteen rows with OnPopup.
inline constexpr int kToolBarButtons = 12;
inline constexpr int kPopupItems = 13;

}  // namespace addin

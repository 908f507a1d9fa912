// SPDX-License-Identifier: MIT
// The options of the "Settings" section, read at start-up into the add-in's option globals and again
// after the options dialog saved them. The designer actions and the numbering and indentation dialogs read
// these globals, not the settings.
#pragma once

#include "common/settings.h"

#include <QString>

namespace common {

struct Options {
  bool OneCommandNumIndent = true;
  bool ShowProperties = true;
  QString ColorOnFocus;
  bool LabelsTransparent = true;
  bool ClearTextProperty = true;
  bool FormsPosition = true;
  bool FormsBorder = true;
  bool SelectTextBoxOnFocus = true;
  bool TextBoxUpperCase = true;
  bool RenameInCodeOnControlRenamed = false;
};

/// Reads the "Settings" section with its defaults and the Boolean rule (true unless "0"). A failure is
/// raised with this procedure's location.
Options GetOptionsFromRegistry(const SettingsStore& settings);

}  // namespace common

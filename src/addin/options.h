// SPDX-License-Identifier: MIT
// The options of the "Settings" section, read once at start-up into the add-in's option globals (the
// options dialog writes them back and sets them at the same time).
#pragma once

#include "common/settings.h"

#include <QString>

namespace addin {

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
Options GetOptionsFromRegistry(const common::SettingsStore& settings);

}  // namespace addin

// SPDX-License-Identifier: MIT
#include "common/options.h"

#include "common/errors.h"

namespace common {

Options GetOptionsFromRegistry(const SettingsStore& settings) {
  namespace key = setting;
  try {
    Options options;
    options.OneCommandNumIndent = settings.flag(key::OneCommandNumIndent);
    options.ShowProperties = settings.flag(key::ShowProperties);
    options.ColorOnFocus = settings.value(key::ColorOnFocus);
    options.LabelsTransparent = settings.flag(key::LabelsTransparent);
    options.ClearTextProperty = settings.flag(key::ClearTextProperty);
    options.FormsPosition = settings.flag(key::FormsPosition);
    options.FormsBorder = settings.flag(key::FormsBorder);
    options.SelectTextBoxOnFocus = settings.flag(key::SelectTextBoxOnFocus);
    options.TextBoxUpperCase = settings.flag(key::TextBoxUpperCase);
    options.RenameInCodeOnControlRenamed = settings.flag(key::RenameInCodeOnControlRenamed);
    return options;
  } catch (const std::exception& failure) {
    throw recordError(failure, QStringLiteral("basGlobals"), QStringLiteral("GetOptionsFromRegistry"),
                      __LINE__);
  }
}

}  // namespace common

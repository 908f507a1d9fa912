// SPDX-License-Identifier: MIT
#include "addin/options.h"

#include "common/errors.h"

namespace addin {

Options GetOptionsFromRegistry(const common::SettingsStore& settings) {
  namespace key = common::setting;
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
    throw common::recordError(failure, QStringLiteral("basGlobals"), QStringLiteral("GetOptionsFromRegistry"),
                              __LINE__);
  }
}

}  // namespace addin

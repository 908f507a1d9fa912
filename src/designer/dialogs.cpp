// SPDX-License-Identifier: MIT
#include "designer/dialogs.h"

#include "common/errors.h"
#include "designer/frmoptions.h"
#include "designer/frmprops.h"

#include <optional>

namespace designer {

void showOptionsDialog(common::SettingsStore& settings, common::Options& options, ide::UserInterface& ui,
                       QWidget* parent) {
  frmOptions dialog(settings, options, ui, parent);
  dialog.exec();
}

PropsChoice showPropsDialog(const ide::Ref<ide::VBControl>& control, const common::Options& options,
                            ide::UserInterface& ui, QWidget* parent) {
  std::optional<frmProps> dialog;
  try {
    dialog.emplace(control, options, ui, parent);
  } catch (const std::exception& failure) {
    common::recordError(failure, QStringLiteral("frmProps"), QStringLiteral("Form_Load"), __LINE__);
    common::ShowErrorReport(ui);
    return {};
  }
  dialog->exec();
  PropsChoice choice;
  choice.Cancelled = dialog->Cancelled();
  choice.EnterAsTab = dialog->EnterAsTab();
  choice.BackColorOnFocus = dialog->BackColorOnFocus();
  choice.FocusColor = dialog->FocusColor();
  return choice;
}

}  // namespace designer

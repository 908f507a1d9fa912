// SPDX-License-Identifier: MIT
#include "transform/dialogs.h"

#include "common/errors.h"
#include "common/strings.h"
#include "transform/frmindenter.h"
#include "transform/frmlinnumbers.h"
#include "transform/texts.h"

#include <optional>

namespace transform {

namespace {

// Without a parent of its own a dialog is shown over the IDE's window (none when the IDE runs headless).
QWidget* ownerOf(ide::VBE& vbe, QWidget* parent) {
  return parent ? parent : qobject_cast<QWidget*>(vbe.Platform().ui().dialogParent());
}

}  // namespace

void showLineNumberingDialog(const ide::Ref<ide::VBE>& vbe, common::SettingsStore& settings,
                             const common::Options& options, QWidget* parent) {
  frmLinNumbers dialog(vbe, settings, options, ownerOf(*vbe, parent));
  dialog.exec();
}

void showIndentationDialog(const ide::Ref<ide::VBE>& vbe, common::SettingsStore& settings,
                           const common::Options& options, QWidget* parent) {
  std::optional<frmIndenter> dialog;
  try {
    dialog.emplace(vbe, settings, options, ownerOf(*vbe, parent));
  } catch (const std::exception& failure) {
    common::logFailure(failure, QStringLiteral("frmIndenter"), QStringLiteral("Form_Load"), __LINE__);
    vbe->Platform().ui().MsgBox(common::LoadResString(kIndenterLoadFailed), ide::mb::Exclamation,
                                common::title());
    return;
  }
  dialog->exec();
}

}  // namespace transform

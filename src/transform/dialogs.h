// SPDX-License-Identifier: MIT
// How the add-in opens the numbering and indentation dialogs.
#pragma once

#include "common/options.h"
#include "common/settings.h"
#include "ide/vbide.h"

class QWidget;

namespace transform {

/// Opens the line-numbering dialog modally (over `parent`, may be null) and returns when it closes.
void showLineNumberingDialog(const ide::Ref<ide::VBE>& vbe, common::SettingsStore& settings,
                             const common::Options& options, QWidget* parent);

/// Opens the indentation dialog modally (over `parent`, may be null) and returns when it closes.
void showIndentationDialog(const ide::Ref<ide::VBE>& vbe, common::SettingsStore& settings,
                           const common::Options& options, QWidget* parent);

}  // namespace transform

// SPDX-License-Identifier: MIT
// How the add-in opens the options and property defaults dialogs.
#pragma once

#include "common/options.h"
#include "common/settings.h"
#include "designer/actions.h"
#include "ide/vbide.h"

class QWidget;

namespace designer {

/// Opens the options dialog modally over `parent` (may be null); after OK the option globals hold what
/// was saved.
void showOptionsDialog(common::SettingsStore& settings, common::Options& options, ide::UserInterface& ui,
                       QWidget* parent);

/// Opens the property defaults dialog modally for the control and returns the choices made there
/// (Cancelled unless it was closed with OK).
PropsChoice showPropsDialog(const ide::Ref<ide::VBControl>& control, const common::Options& options,
                            ide::UserInterface& ui, QWidget* parent);

}  // namespace designer

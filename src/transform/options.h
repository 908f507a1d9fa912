// SPDX-License-Identifier: MIT
// The numbering and indentation choices the user last made in the dialogs, as kept in the settings:
// where the dialogs start from and what the command-line tool uses when not told otherwise.
#pragma once

#include "common/settings.h"
#include "transform/indentation.h"

#include <QStringView>

#include <optional>

namespace transform {

/// The 32-bit value of a plain decimal number (blanks around it ignored), rounded to a whole number with
/// halves to even. Nothing for an empty text, a text that is not a number or a value outside 32 bits.
std::optional<qint32> wholeNumber(QStringView text);

/// A numeric setting, or its default where the stored text is not a 32-bit number.
qint32 storedNumber(const common::SettingsStore& settings, const common::setting::Key& key);

struct NumberingOptions {
  qint32 startNumber = 10000;
  qint32 interval = 5;
};

struct IndentationOptions {
  IndentMode mode = IndentMode::Tabs;
  qint32 spaces = 3;
};

/// The start number and interval of the numbering dialog.
NumberingOptions storedNumbering(const common::SettingsStore& settings);

/// Tabs or spaces ("UseOption": "0" or empty for tabs) and the spaces per level of the indentation
/// dialog; a count below 1 gives the default.
IndentationOptions storedIndentation(const common::SettingsStore& settings);

}  // namespace transform

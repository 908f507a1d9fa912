// SPDX-License-Identifier: MIT
// The add-in's string table: its user-interface texts, looked up by their resource number.
#pragma once

#include <QString>

namespace common {

/// The add-in's title: the settings' application name, the popup's caption, message-box captions.
inline constexpr char kTitle[] = "Quimbel";

/// The text with resource number `id`, or an empty text for a number the table does not hold.
QString LoadResString(int id);

/// The title as a QString.
inline QString title() {
  return QString::fromLatin1(kTitle);
}

}  // namespace common

// SPDX-License-Identifier: MIT
// VB string literals as they appear in source files: in quotes, with each quote inside doubled.
#pragma once

#include <QString>
#include <QStringView>

#include <optional>

namespace host {

/// A VB string literal's text: the quotes removed and doubled quotes undone; nothing when `literal` is not
/// exactly one quoted string.
std::optional<QString> unquoteVbString(QStringView literal);

/// `text` as a VB string literal, with its quotes doubled.
QString quoteVbString(QStringView text);

}  // namespace host

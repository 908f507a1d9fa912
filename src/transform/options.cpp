// SPDX-License-Identifier: MIT
#include "transform/options.h"

#include "syntax/text.h"

#include <cmath>
#include <limits>

namespace transform {

std::optional<qint32> wholeNumber(QStringView text) {
  const QStringView trimmed = syntax::trimmedView(text);
  if (!syntax::isNumeric(trimmed)) return std::nullopt;
  bool ok = false;
  const double value = trimmed.toDouble(&ok);
  if (!ok) return std::nullopt;
  const double whole = std::nearbyint(value);  // the default rounding mode takes halves to even
  if (whole < std::numeric_limits<qint32>::min() || whole > std::numeric_limits<qint32>::max())
    return std::nullopt;
  return qint32(whole);
}

qint32 storedNumber(const common::SettingsStore& settings, const common::setting::Key& key) {
  if (const auto value = wholeNumber(settings.value(key))) return *value;
  return *wholeNumber(QString::fromLatin1(key.defaultValue));
}

NumberingOptions storedNumbering(const common::SettingsStore& settings) {
  return {storedNumber(settings, common::setting::InitialNumber),
          storedNumber(settings, common::setting::Interval)};
}

IndentationOptions storedIndentation(const common::SettingsStore& settings) {
  IndentationOptions options;
  const QString use = settings.value(common::setting::UseOption).trimmed();
  options.mode = use.isEmpty() || use == u"0" ? IndentMode::Tabs : IndentMode::Spaces;
  const qint32 spaces = storedNumber(settings, common::setting::Indentation);
  options.spaces =
      spaces >= 1 ? spaces : *wholeNumber(QString::fromLatin1(common::setting::Indentation.defaultValue));
  return options;
}

}  // namespace transform

// SPDX-License-Identifier: MIT
// `quimbel config FILE`: the numbering and indentation values in force for a module file and where each
// came from, under the .editorconfig names that set them.
#include "cli.h"

#include <QDir>

namespace cli {
namespace {

template <class T>
void printValue(const char* name, const QString& value, const codestyle::Value<T>& setting) {
  QString source = codestyle::sourceName(setting.source);
  if (!setting.file.isEmpty())
    source += QStringLiteral(" (%1)").arg(QDir::current().relativeFilePath(setting.file));
  printLine(QStringLiteral("%1 = %2").arg(QLatin1StringView(name), value).leftJustified(36) + source);
}

}  // namespace

int runConfig(const QString& file, const codestyle::CommandLine& commandLine) {
  const common::SettingsStore settings(common::SettingsStore::userStorePath());
  const auto resolved = codestyle::Resolver(commandLine, &settings).styleFor(file, true);
  if (const auto* error = std::get_if<codestyle::StyleError>(&resolved)) {
    printError(styleErrorText(*error));
    return kInputError;
  }
  const codestyle::Style& style = std::get<codestyle::Style>(resolved);
  const bool tabs = style.indentStyle.value == transform::IndentMode::Tabs;
  printValue(codestyle::kIndentStyle, tabs ? QStringLiteral("tab") : QStringLiteral("space"),
             style.indentStyle);
  printValue(codestyle::kIndentSize, QString::number(style.indentSize.value), style.indentSize);
  printValue(codestyle::kNumberStart, QString::number(style.numberStart.value), style.numberStart);
  printValue(codestyle::kNumberInterval, QString::number(style.numberInterval.value), style.numberInterval);
  printValue(codestyle::kNumIndent, style.numIndent.value ? QStringLiteral("true") : QStringLiteral("false"),
             style.numIndent);
  return kSuccess;
}

}  // namespace cli

// SPDX-License-Identifier: MIT
#include "codestyle/codestyle.h"

#include "codestyle/editorconfig.h"

#include <limits>

namespace codestyle {
namespace {

template <class T>
void take(Value<T>& value, const std::optional<T>& given, Source source, const QString& file = {}) {
  if (given) value = {*given, source, file};
}

/// A setting's whole number when it holds one within [least, most].
std::optional<qint32> storedWithin(const common::SettingsStore& settings, const common::setting::Key& key,
                                   qint32 least, qint32 most) {
  const auto number = transform::wholeNumber(
      settings.value(QString::fromLatin1(key.section), QString::fromLatin1(key.key), QString()));
  if (!number || *number < least || *number > most) return std::nullopt;
  return number;
}

/// Reads an .editorconfig value into `value`; an error for a value that is not one of its kind.
class EditorConfigReader {
 public:
  EditorConfigReader(const EditorConfigValues& values, const QString& path, bool nameFiles)
      : m_values(values), m_path(path), m_nameFiles(nameFiles) {}

  std::optional<StyleError> error;

  template <class T, class Parse>
  void read(Value<T>& value, const char* name, const char* expected, Parse parse) {
    const QString key = QString::fromLatin1(name);
    const auto found = m_values.constFind(key);
    if (found == m_values.constEnd() || error) return;
    const std::optional<T> parsed = parse(*found);
    if (!parsed) {
      error = StyleError{editorConfigFileOf(m_path, key), 0,
                         QStringLiteral("%1 = %2 is not %3").arg(key, *found, QLatin1StringView(expected))};
      return;
    }
    take(value, parsed, Source::EditorConfig, m_nameFiles ? editorConfigFileOf(m_path, key) : QString());
  }

 private:
  const EditorConfigValues& m_values;
  const QString& m_path;
  bool m_nameFiles;
};

std::optional<qint32> integerWithin(const QString& text, qint32 least, qint32 most) {
  bool ok = false;
  const qlonglong number = text.trimmed().toLongLong(&ok);
  if (!ok || number < least || number > most) return std::nullopt;
  return qint32(number);
}

}  // namespace

Resolver::Resolver(const CommandLine& commandLine, const common::SettingsStore* settings)
    : m_commandLine(commandLine) {
  if (!settings) return;
  namespace setting = common::setting;
  const QString file = settings->path();
  take(m_base.numberStart,
       storedWithin(*settings, setting::InitialNumber, std::numeric_limits<qint32>::min(), kLargestNumber),
       Source::Settings, file);
  take(m_base.numberInterval,
       storedWithin(*settings, setting::Interval, std::numeric_limits<qint32>::min(), kLargestNumber),
       Source::Settings, file);
  take(m_base.indentSize, storedWithin(*settings, setting::Indentation, 1, kLargestNumber), Source::Settings,
       file);
  // As the indentation dialog reads it: "0" is tabs, anything else spaces; empty is not a choice.
  const QString use = settings
                          ->value(QString::fromLatin1(setting::UseOption.section),
                                  QString::fromLatin1(setting::UseOption.key), QString())
                          .trimmed();
  if (!use.isEmpty())
    m_base.indentStyle = {use == u"0" ? transform::IndentMode::Tabs : transform::IndentMode::Spaces,
                          Source::Settings, file};
}

std::variant<Style, StyleError> Resolver::styleFor(const QString& path, bool nameFiles) const {
  Style style = m_base;
  const auto config = readEditorConfig(path);
  if (const auto* failure = std::get_if<EditorConfigError>(&config))
    return StyleError{failure->file, failure->line, failure->message};
  EditorConfigValues values = std::get<EditorConfigValues>(config);
  // indent_size "tab" means the tab width, as for any editor.
  if (values.value(QString::fromLatin1(kIndentSize)) == u"tab") {
    values.remove(QString::fromLatin1(kIndentSize));
    if (values.contains(QString::fromLatin1(kTabWidth)))
      values.insert(QString::fromLatin1(kIndentSize), values.value(QString::fromLatin1(kTabWidth)));
  }

  EditorConfigReader reader(values, path, nameFiles);
  reader.read(style.indentStyle, kIndentStyle, "tab or space", [](const QString& text) {
    return text == u"tab"     ? std::optional(transform::IndentMode::Tabs)
           : text == u"space" ? std::optional(transform::IndentMode::Spaces)
                              : std::nullopt;
  });
  const auto size = [](const QString& text) { return integerWithin(text, 1, kMostSpaces); };
  reader.read(style.indentSize, kIndentSize, "a number of spaces from 1 to 1000", size);
  reader.read(style.numberStart, kNumberStart, "a whole number from 0 to 2147483647",
              [](const QString& text) { return integerWithin(text, 0, kLargestNumber); });
  reader.read(style.numberInterval, kNumberInterval, "a whole number from 1 to 2147483647",
              [](const QString& text) { return integerWithin(text, 1, kLargestNumber); });
  reader.read(style.numIndent, kNumIndent, "true or false", [](const QString& text) {
    const QString word = text.toLower();
    return word == u"true" ? std::optional(true) : word == u"false" ? std::optional(false) : std::nullopt;
  });
  if (reader.error) return *reader.error;

  take(style.numberStart, m_commandLine.numberStart, Source::CommandLine);
  take(style.numberInterval, m_commandLine.numberInterval, Source::CommandLine);
  take(style.indentStyle, m_commandLine.indentStyle, Source::CommandLine);
  take(style.indentSize, m_commandLine.indentSize, Source::CommandLine);
  take(style.numIndent, m_commandLine.numIndent, Source::CommandLine);
  return style;
}

QString sourceName(Source source) {
  switch (source) {
    case Source::Default:
      return QStringLiteral("default");
    case Source::Settings:
      return QStringLiteral("personal settings");
    case Source::EditorConfig:
      return QStringLiteral(".editorconfig");
    case Source::CommandLine:
      return QStringLiteral("command line");
  }
  return {};
}

}  // namespace codestyle

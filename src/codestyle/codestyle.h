// SPDX-License-Identifier: MIT
// The code style in force for a module file, value by value: what the command line gave, else what the
// .editorconfig files above the file give it, else the personal settings the dialogs keep, else the
// defaults. Each value says where it came from, so that a team can see why two runs differ.
#pragma once

#include "common/settings.h"
#include "transform/options.h"

#include <QString>

#include <optional>
#include <variant>

namespace codestyle {

/// The .editorconfig properties read: the standard ones for the indentation, and our own.
inline constexpr char kIndentStyle[] = "indent_style";          // tab | space
inline constexpr char kIndentSize[] = "indent_size";            // spaces per level, or "tab"
inline constexpr char kTabWidth[] = "tab_width";                // the level when indent_size is "tab"
inline constexpr char kNumberStart[] = "quimbel_number_start";  // the first number of each procedure
inline constexpr char kNumberInterval[] = "quimbel_number_interval";
inline constexpr char kNumIndent[] = "quimbel_numindent";  // true: number and indent go together

enum class Source { Default, Settings, EditorConfig, CommandLine };

template <class T>
struct Value {
  T value{};
  Source source = Source::Default;
  /// The settings file or the .editorconfig that gave the value (for an .editorconfig only when asked).
  QString file;
};

struct Style {
  Value<qint32> numberStart{10000};
  Value<qint32> numberInterval{5};
  Value<transform::IndentMode> indentStyle{transform::IndentMode::Tabs};
  Value<qint32> indentSize{3};
  /// Numbering re-indents and indenting numbers, as the dialogs do with their one-command option on.
  Value<bool> numIndent{false};

  transform::NumberingOptions numbering() const { return {numberStart.value, numberInterval.value}; }
  transform::IndentationOptions indentation() const { return {indentStyle.value, indentSize.value}; }
};

/// The values the command line gave.
struct CommandLine {
  std::optional<qint32> numberStart;
  std::optional<qint32> numberInterval;
  std::optional<transform::IndentMode> indentStyle;
  std::optional<qint32> indentSize;
  std::optional<bool> numIndent;
};

/// An .editorconfig that cannot be read, or a value in one that is not valid: the file, its line when
/// known, what is wrong.
struct StyleError {
  QString file;
  int line = 0;
  QString message;
};

/// The largest line number and the most spaces per level.
inline constexpr qint32 kLargestNumber = 2147483647;
inline constexpr qint32 kMostSpaces = 1000;

class Resolver {
 public:
  /// `settings` (may be null: none) is read once, here.
  Resolver(const CommandLine& commandLine, const common::SettingsStore* settings);

  /// The style for the module file at `path` (which need not exist). With `nameFiles`, values from an
  /// .editorconfig name the file that gave them.
  std::variant<Style, StyleError> styleFor(const QString& path, bool nameFiles = false) const;

 private:
  Style m_base;  // the defaults, under the personal settings
  CommandLine m_commandLine;
};

/// "default", "personal settings", ".editorconfig", "command line".
QString sourceName(Source source);

}  // namespace codestyle

// SPDX-License-Identifier: MIT
// The add-in's per-user settings: string values addressed by section and key under the application
// "Quimbel", kept in an INI file in the user's configuration directory. Every change is written at once.
#pragma once

#include <QString>

#include <memory>

class QSettings;

namespace common {

/// Sections and keys with their defaults.
namespace setting {
struct Key {
  const char* section;
  const char* key;
  const char* defaultValue;
};
inline constexpr Key OneCommandNumIndent{"Settings", "OneCommamdNumIndent", "1"};
inline constexpr Key ShowProperties{"Settings", "ShowProperties", "1"};
inline constexpr Key ColorOnFocus{"Settings", "ColorOnFocus", "&HFFFF&"};
inline constexpr Key LabelsTransparent{"Settings", "LabelsTransparentes", "1"};
inline constexpr Key ClearTextProperty{"Settings", "LimparTextProperty", "1"};
inline constexpr Key FormsPosition{"Settings", "FormsPosition", "1"};
inline constexpr Key FormsBorder{"Settings", "FormsBorder", "1"};
inline constexpr Key SelectTextBoxOnFocus{"Settings", "SelTextBoxOnFocus", "1"};
inline constexpr Key TextBoxUpperCase{"Settings", "TextBoxUcase", "1"};
inline constexpr Key RenameInCodeOnControlRenamed{"Settings", "AjuCodeOnControlRenamed", "0"};
inline constexpr Key InitialNumber{"LinesNumbering", "InitialNumber", "10000"};
inline constexpr Key Interval{"LinesNumbering", "Interval", "5"};
inline constexpr Key Indentation{"IndentCode", "Indentation", "3"};
inline constexpr Key UseOption{"IndentCode", "UseOption", "0"};
inline constexpr Key ErrorHandlerOnNewProc{"GeneralOptions", "ErrorHandlerOnNewProc", "-1"};
inline constexpr Key ErrorDocHeaderOnNewProc{"GeneralOptions", "ErrorDocHeaderOnNewProc", "-1"};
}  // namespace setting

class SettingsStore {
 public:
  /// The store at `iniPath` (created on the first change).
  explicit SettingsStore(const QString& iniPath);
  ~SettingsStore();
  SettingsStore(const SettingsStore&) = delete;
  SettingsStore& operator=(const SettingsStore&) = delete;

  /// The user's store: $QUIMBEL_CONFIG_DIR/Quimbel.ini when that variable is set, else Quimbel/Quimbel.ini in
  /// the user's configuration directory.
  static QString userStorePath();

  QString value(const QString& section, const QString& key, const QString& defaultValue) const;
  QString value(const setting::Key& key) const;
  /// A setting read as a Boolean: true unless the value is "0".
  bool flag(const setting::Key& key) const;
  void setValue(const QString& section, const QString& key, const QString& value);
  void setValue(const setting::Key& key, const QString& value);
  void setFlag(const setting::Key& key, bool on) {
    setValue(key, on ? QStringLiteral("1") : QStringLiteral("0"));
  }
  QString path() const { return m_path; }

  /// The Boolean rule of the settings: anything but "0" is true.
  static bool isTrue(const QString& value) { return value != QLatin1StringView("0"); }

 private:
  QString m_path;
  std::unique_ptr<QSettings> m_settings;
};

}  // namespace common

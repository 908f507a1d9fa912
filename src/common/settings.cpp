// SPDX-License-Identifier: MIT
#include "common/settings.h"

#include "common/strings.h"

#include <QDir>
#include <QSettings>
#include <QStandardPaths>

namespace common {

SettingsStore::SettingsStore(const QString& iniPath)
    : m_path(iniPath), m_settings(std::make_unique<QSettings>(iniPath, QSettings::IniFormat)) {}

SettingsStore::~SettingsStore() = default;

QString SettingsStore::userStorePath() {
  const QString overridden = qEnvironmentVariable("QUIMBEL_CONFIG_DIR");
  const QString dir =
      !overridden.isEmpty()
          ? overridden
          : QStandardPaths::writableLocation(QStandardPaths::GenericConfigLocation) + u'/' + title();
  return QDir(dir).filePath(title() + QStringLiteral(".ini"));
}

namespace {
// QSettings keeps a group named "General" apart ([%General]); the sections here are written as named.
QString settingsKey(const QString& section, const QString& key) {
  return section + u'/' + key;
}
}  // namespace

QString SettingsStore::value(const QString& section, const QString& key, const QString& defaultValue) const {
  const QVariant value = m_settings->value(settingsKey(section, key));
  return value.isValid() ? value.toString() : defaultValue;
}

QString SettingsStore::value(const setting::Key& key) const {
  return value(QLatin1StringView(key.section), QLatin1StringView(key.key),
               QLatin1StringView(key.defaultValue));
}

bool SettingsStore::flag(const setting::Key& key) const {
  return isTrue(value(key));
}

void SettingsStore::setValue(const QString& section, const QString& key, const QString& value) {
  m_settings->setValue(settingsKey(section, key), value);
  m_settings->sync();
}

void SettingsStore::setValue(const setting::Key& key, const QString& value) {
  setValue(QLatin1StringView(key.section), QLatin1StringView(key.key), value);
}

}  // namespace common

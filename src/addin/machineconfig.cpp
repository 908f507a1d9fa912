// SPDX-License-Identifier: MIT
#include "addin/machineconfig.h"

#include <QFile>

#ifndef QUIMBEL_MACHINE_CONFIG_FILE
#define QUIMBEL_MACHINE_CONFIG_FILE "/etc/quimbel/quimbel.conf"
#endif

namespace addin {

QString MachineConfigFile::defaultPath() {
  const QString overridden = qEnvironmentVariable("QUIMBEL_MACHINE_CONFIG");
  return overridden.isEmpty() ? QStringLiteral(QUIMBEL_MACHINE_CONFIG_FILE) : overridden;
}

QString MachineConfigFile::installationPath() {
  // Read as plain "key=value" lines rather than through QSettings, which would take commas and
  // backslashes in a path for list separators and escapes.
  QFile file(m_path);
  if (!file.open(QIODevice::ReadOnly | QIODevice::Text)) return {};
  while (!file.atEnd()) {
    const QString line = QString::fromUtf8(file.readLine()).trimmed();
    if (line.startsWith(u'#') || line.startsWith(u';') || line.startsWith(u'[')) continue;
    const qsizetype equals = line.indexOf(u'=');
    if (equals < 0) continue;
    if (line.left(equals).trimmed().compare(QLatin1StringView("InstallationPath"), Qt::CaseInsensitive) == 0)
      return line.mid(equals + 1);
  }
  return {};
}

bool MachineConfigFile::canRead() {
  QFile file(m_path);
  const bool opened = file.open(QIODevice::ReadOnly);
  file.close();
  return opened;
}

std::shared_ptr<MachineConfig> systemMachineConfig() {
  return std::make_shared<MachineConfigFile>(MachineConfigFile::defaultPath());
}

QString installationDirectory(MachineConfig& config) {
  QString directory = config.installationPath().trimmed();
  if (directory.isEmpty()) return {};
  if (!directory.endsWith(u'/')) directory += u'/';
  return directory;
}

}  // namespace addin

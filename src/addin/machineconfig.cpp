// SPDX-License-Identifier: MIT
#include "addin/machineconfig.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>

#include <dlfcn.h>

#ifndef QUIMBEL_MACHINE_CONFIG_FILE
#define QUIMBEL_MACHINE_CONFIG_FILE "/etc/quimbel/quimbel.conf"
#endif
#ifndef QUIMBEL_MACHINE_CONFIG_FROM_ADDIN
#define QUIMBEL_MACHINE_CONFIG_FROM_ADDIN "../../etc/quimbel/quimbel.conf"
#endif

namespace addin {
namespace {

/// The folder of the library (or program) this code is linked into.
QString ownFolder() {
  Dl_info info{};
  if (dladdr(reinterpret_cast<const void*>(&ownFolder), &info) == 0 || !info.dli_fname) return {};
  return QFileInfo(QString::fromLocal8Bit(info.dli_fname)).absolutePath();
}

}  // namespace

QString MachineConfigFile::defaultPath() {
  const QString overridden = qEnvironmentVariable("QUIMBEL_MACHINE_CONFIG");
  if (!overridden.isEmpty()) return overridden;
  // An installation into another prefix keeps its configuration at the same place relative to the add-in.
  if (const QString folder = ownFolder(); !folder.isEmpty()) {
    const QString beside =
        QDir::cleanPath(QDir(folder).filePath(QStringLiteral(QUIMBEL_MACHINE_CONFIG_FROM_ADDIN)));
    if (QFileInfo::exists(beside)) return beside;
  }
  return QStringLiteral(QUIMBEL_MACHINE_CONFIG_FILE);
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

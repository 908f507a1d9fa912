// SPDX-License-Identifier: MIT
// The machine-wide configuration that the installation writes: a file of "key=value" lines whose
// InstallationPath value is the directory holding the add-in's shared files (help pages). It lives at
// <sysconfdir>/quimbel/quimbel.conf, found from the installed add-in's own folder first, so that an
// installation moved to another prefix finds its own. $QUIMBEL_MACHINE_CONFIG names another file, so that a
// build tree runs without installing (the build writes <build>/etc/quimbel/quimbel.conf for that).
#pragma once

#include <QString>

#include <memory>
#include <utility>

namespace addin {

class MachineConfig {
 public:
  virtual ~MachineConfig() = default;
  /// The InstallationPath value as written (empty when the file or the value is missing).
  virtual QString installationPath() = 0;
  /// Whether the configuration can be opened for reading. Only read access is asked for: ordinary users
  /// cannot write machine-wide files, and the add-in never writes them.
  virtual bool canRead() = 0;
  /// Where the configuration comes from, for messages and logs.
  virtual QString location() const = 0;
};

/// The configuration in an INI file at `path`.
class MachineConfigFile final : public MachineConfig {
 public:
  explicit MachineConfigFile(QString path) : m_path(std::move(path)) {}
  QString installationPath() override;
  bool canRead() override;
  QString location() const override { return m_path; }

  /// $QUIMBEL_MACHINE_CONFIG when set, else the installed file beside the add-in, else the configured one.
  static QString defaultPath();

 private:
  QString m_path;
};

/// The configuration the add-in uses unless told otherwise.
std::shared_ptr<MachineConfig> systemMachineConfig();

/// The installation directory: InstallationPath trimmed, ending in "/"; empty when there is none.
QString installationDirectory(MachineConfig& config);

}  // namespace addin

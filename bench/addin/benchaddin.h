// SPDX-License-Identifier: MIT
// What the benchmarks that connect the add-in to the IDE model share: the IDE's add-in object for a linked
// Connect, and an installation directory, settings and logs of their own.
#pragma once

#include "ide/vbide.h"

#include <QFile>
#include <QString>

namespace bench {

class BenchAddIn final : public ide::AddIn {
 public:
  explicit BenchAddIn(ide::Ref<ide::VBE> vbe) : m_vbe(std::move(vbe)) {}
  QString ProgId() override { return QStringLiteral("Quimbel.Connect"); }
  QString Description() override { return QStringLiteral("Quimbel 2.2 Add-In"); }
  bool Connect() override { return true; }
  void setConnect(bool) override {}
  ide::Ref<ide::VBE> VBE() override { return m_vbe; }

 private:
  ide::Ref<ide::VBE> m_vbe;
};

/// Makes `dir` the installation directory (and the home of the settings and the error log) of the add-ins
/// connected from now on.
inline void installAddInIn(const QString& dir) {
  QFile config(dir + QStringLiteral("/quimbel.conf"));
  config.open(QIODevice::WriteOnly);
  config.write("InstallationPath=" + dir.toUtf8() + "\n");
  config.close();
  qputenv("QUIMBEL_MACHINE_CONFIG", config.fileName().toLocal8Bit());
  qputenv("QUIMBEL_CONFIG_DIR", (dir + QStringLiteral("/config")).toLocal8Bit());
  qputenv("QUIMBEL_DATA_DIR", (dir + QStringLiteral("/data")).toLocal8Bit());
}

}  // namespace bench

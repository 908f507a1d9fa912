// SPDX-License-Identifier: MIT
// The machine configuration and the help pages.
#include "addin/help.h"
#include "addin/machineconfig.h"
#include "addinfixture.h"

#include <gtest/gtest.h>

#include <QDir>
#include <QFile>
#include <QFileInfo>

#include <unistd.h>

namespace addin::test {
namespace {

TEST(MachineConfig, TheInstallationPathIsTrimmedAndEndsInASlash) {
  AddInEnvironment environment;
  MachineConfigFile config(environment.machineConfigPath());
  environment.writeMachineConfig(
      u"# Quimbel\n[Quimbel]\nOther=1\n  InstallationPath =  /opt/quim,bel  \n"_qs);
  EXPECT_EQ(installationDirectory(config), u"/opt/quim,bel/"_qs);
  environment.writeMachineConfig(u"InstallationPath=/opt/quimbel/\n"_qs);
  EXPECT_EQ(installationDirectory(config), u"/opt/quimbel/"_qs);
  environment.writeMachineConfig(u"InstallationPath=\n"_qs);
  EXPECT_EQ(installationDirectory(config), QString());
  EXPECT_TRUE(config.canRead());
  EXPECT_EQ(MachineConfigFile::defaultPath(), environment.machineConfigPath()) << "the variable overrides";
}

TEST(MachineConfig, OnlyReadAccessIsAskedFor) {
  AddInEnvironment environment;
  MachineConfigFile config(environment.machineConfigPath());
  QFile before(environment.machineConfigPath());
  ASSERT_TRUE(before.open(QIODevice::ReadOnly));
  const QByteArray contents = before.readAll();
  before.close();
  QFile::setPermissions(environment.machineConfigPath(),
                        QFile::ReadOwner | QFile::ReadGroup | QFile::ReadOther);
  EXPECT_TRUE(config.canRead());
  QFile after(environment.machineConfigPath());
  ASSERT_TRUE(after.open(QIODevice::ReadOnly));
  EXPECT_EQ(after.readAll(), contents) << "the check leaves the file as it was";
  MachineConfigFile missing(environment.path(u"nowhere.conf"_qs));
  EXPECT_FALSE(missing.canRead());
  EXPECT_EQ(installationDirectory(missing), QString());
  if (::geteuid() != 0) {
    QFile::setPermissions(environment.machineConfigPath(), QFile::WriteOwner);
    EXPECT_FALSE(config.canRead());
  }
}

// ---------------------------------------------------------------------------------------------------
// Help

TEST(Help, TheBuildHasAPageForEveryHelpContext) {
  const QString share = QStringLiteral(QUIMBEL_BUILD_SHARE_DIR) + u'/';
  for (const int context : {0, 4, 5, 11, 16})
    EXPECT_TRUE(QFileInfo(helpPagePath(share, context)).isFile()) << context;
  EXPECT_EQ(helpPagePath(share, 99), QString());
  EXPECT_TRUE(QFileInfo(helpPagePath(share)).isFile());
}

TEST(Help, APageThatIsMissingOrCannotBeOpenedIsReported) {
  AddInEnvironment environment;
  host::HeadlessUi ui;
  const QString install = environment.installDir() + u'/';
  EXPECT_FALSE(showHelpContents(ui, install)) << "the desktop cannot open documents";
  ui.setCanOpenDocuments(true);
  EXPECT_TRUE(showHelpContents(ui, install));
  EXPECT_FALSE(showHelpTopic(ui, install, 4)) << "no such page in this installation";
  EXPECT_FALSE(showHelpTopic(ui, install, 3)) << "no such context";
  EXPECT_EQ(ui.openedDocuments().size(), 1u);
}

}  // namespace
}  // namespace addin::test

// SPDX-License-Identifier: MIT
// The options read at start-up, the machine configuration, the error convention and the help pages.
#include "addin/help.h"
#include "addin/machineconfig.h"
#include "addinfixture.h"
#include "common/errors.h"
#include "common/options.h"

#include <gtest/gtest.h>

#include <QDir>
#include <QFile>
#include <QFileInfo>

#include <unistd.h>

namespace addin::test {
namespace {

TEST(Options, AFreshUserHasEveryOptionOnButRenamingInCode) {
  AddInEnvironment environment;
  common::SettingsStore store(common::SettingsStore::userStorePath());
  const common::Options options = common::GetOptionsFromRegistry(store);
  EXPECT_TRUE(options.OneCommandNumIndent);
  EXPECT_TRUE(options.ShowProperties);
  EXPECT_EQ(options.ColorOnFocus, u"&HFFFF&"_qs);
  EXPECT_TRUE(options.LabelsTransparent);
  EXPECT_TRUE(options.ClearTextProperty);
  EXPECT_TRUE(options.FormsPosition);
  EXPECT_TRUE(options.FormsBorder);
  EXPECT_TRUE(options.SelectTextBoxOnFocus);
  EXPECT_TRUE(options.TextBoxUpperCase);
  EXPECT_FALSE(options.RenameInCodeOnControlRenamed);
}

TEST(Options, OnlyZeroTurnsAnOptionOff) {
  AddInEnvironment environment;
  common::SettingsStore store(common::SettingsStore::userStorePath());
  store.setValue(u"Settings"_qs, u"ShowProperties"_qs, u"0"_qs);
  store.setValue(u"Settings"_qs, u"FormsBorder"_qs, u"false"_qs);
  store.setValue(u"Settings"_qs, u"AjuCodeOnControlRenamed"_qs, u"1"_qs);
  store.setValue(u"Settings"_qs, u"ColorOnFocus"_qs, u"&HC0FFFF&"_qs);
  const common::Options options =
      common::GetOptionsFromRegistry(common::SettingsStore(common::SettingsStore::userStorePath()));
  EXPECT_FALSE(options.ShowProperties);
  EXPECT_TRUE(options.FormsBorder);
  EXPECT_TRUE(options.RenameInCodeOnControlRenamed);
  EXPECT_EQ(options.ColorOnFocus, u"&HC0FFFF&"_qs);
}

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
// The error convention

void innermost() {
  try {
    ide::raise(ide::err::SubscriptOutOfRange);
  } catch (const std::exception& failure) {
    throw common::recordError(failure, u"basUm"_qs, u"Innermost"_qs, 30);
  }
}
void middle() {
  try {
    innermost();
  } catch (const std::exception& failure) {
    throw common::recordError(failure, u"basUm"_qs, u"Middle"_qs, 20);
  }
}
void outermost(ide::UserInterface& ui) {
  try {
    middle();
  } catch (const std::exception& failure) {
    common::recordError(failure, u"basUm"_qs, u"Outermost"_qs, 10);
    common::ShowErrorReport(ui);
  }
}

TEST(ErrorConvention, AFailureThreeCallsDeepIsShownOnceWithTheInnermostLocation) {
  AddInEnvironment environment;
  host::HeadlessUi ui;
  outermost(ui);
  ASSERT_EQ(ui.messageBoxes().size(), 1u);
  EXPECT_EQ(ui.messageBoxes().front().prompt, u"9 "_qs + ide::standardDescription(9));
  EXPECT_EQ(ui.messageBoxes().front().style, ide::mb::OKOnly);
  EXPECT_EQ(common::lastError().place.text(), u"em basUm_Innermost, linha: 30"_qs);
  const QStringList log = environment.errorLog();
  ASSERT_EQ(log.size(), 1);
  EXPECT_TRUE(log.front().endsWith(u"\tem basUm_Innermost, linha: 30"_qs));
}

TEST(ErrorConvention, TheCancelCodesEndSilently) {
  AddInEnvironment environment;
  host::HeadlessUi ui;
  for (const long number : {9999L, 32755L}) {
    try {
      throw ide::Error(number, u"cancelado"_qs);
    } catch (const std::exception& failure) {
      common::recordError(failure, u"frmOpcoes"_qs, u"cmdCor_Click"_qs, 1);
      common::ShowErrorReport(ui);
    }
  }
  EXPECT_TRUE(ui.messageBoxes().empty());
  EXPECT_TRUE(environment.errorLog().empty());
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

// SPDX-License-Identifier: MIT
// What the add-in's subsystems share: the options read at start-up, the command state and the error
// convention with its log.
#include "common/commandstate.h"
#include "common/errors.h"
#include "common/options.h"
#include "host/platform/headlessui.h"
#include "printers.h"

#include <gtest/gtest.h>

#include <QFile>
#include <QTemporaryDir>

#include <stdexcept>

namespace common {
namespace {

/// The settings and the error log in a temporary directory for the lifetime of the object.
struct Environment {
  QTemporaryDir dir;
  Environment() {
    qputenv("QUIMBEL_CONFIG_DIR", dir.filePath(u"config"_qs).toLocal8Bit());
    qputenv("QUIMBEL_DATA_DIR", dir.filePath(u"data"_qs).toLocal8Bit());
    lastError() = {};
  }
  ~Environment() {
    qunsetenv("QUIMBEL_CONFIG_DIR");
    qunsetenv("QUIMBEL_DATA_DIR");
  }
  QStringList errorLog() const {
    QFile file(dir.filePath(u"data/errors.log"_qs));
    if (!file.open(QIODevice::ReadOnly)) return {};
    return QString::fromUtf8(file.readAll()).split(u'\n', Qt::SkipEmptyParts);
  }
};

TEST(Options, AFreshUserHasEveryOptionOnButRenamingInCodeAndOnlyZeroTurnsOneOff) {
  Environment environment;
  SettingsStore store(SettingsStore::userStorePath());
  Options options = GetOptionsFromRegistry(store);
  EXPECT_EQ(QList<bool>({options.OneCommandNumIndent, options.ShowProperties, options.LabelsTransparent,
                         options.ClearTextProperty, options.FormsPosition, options.FormsBorder,
                         options.SelectTextBoxOnFocus, options.TextBoxUpperCase}),
            QList<bool>(8, true));
  EXPECT_EQ(options.ColorOnFocus, u"&HFFFF&"_qs);
  EXPECT_FALSE(options.RenameInCodeOnControlRenamed);

  store.setValue(u"Settings"_qs, u"ShowProperties"_qs, u"0"_qs);
  store.setValue(u"Settings"_qs, u"FormsBorder"_qs, u"false"_qs);
  store.setValue(u"Settings"_qs, u"AjuCodeOnControlRenamed"_qs, u"1"_qs);
  store.setValue(u"Settings"_qs, u"ColorOnFocus"_qs, u"&HC0FFFF&"_qs);
  options = GetOptionsFromRegistry(SettingsStore(SettingsStore::userStorePath()));
  EXPECT_FALSE(options.ShowProperties);
  EXPECT_TRUE(options.FormsBorder);
  EXPECT_TRUE(options.RenameInCodeOnControlRenamed);
  EXPECT_EQ(options.ColorOnFocus, u"&HC0FFFF&"_qs);
}

TEST(CommandState, EntriesOutsideTheTableAreNeitherReadNorWritten) {
  CommandState state;
  state.setRange(CommandId::Favorites, CommandId::Help, true);
  EXPECT_FALSE(state[CommandId::BrowseForward]);
  EXPECT_TRUE(state[CommandId::Options]);
  EXPECT_TRUE(state[CommandId(13)]) << "the entry without a command is set with the range around it";
  EXPECT_TRUE(state[CommandId::Help]);
  state.set(CommandId::AddToFavorites, true);
  state.setRange(CommandId(0), CommandId(40), true);
  EXPECT_FALSE(state[CommandId::AddToFavorites]);
  EXPECT_TRUE(state[CommandId::BrowseBackward]);
}

// ---------------------------------------------------------------------------------------------------
// The error convention

void innermost() {
  try {
    ide::raise(ide::err::SubscriptOutOfRange);
  } catch (const std::exception& failure) {
    throw recordError(failure, u"basUm"_qs, u"Innermost"_qs, 30);
  }
}
void middle() {
  try {
    innermost();
  } catch (const std::exception& failure) {
    throw recordError(failure, u"basUm"_qs, u"Middle"_qs, 20);
  }
}
void outermost(ide::UserInterface& ui) {
  try {
    middle();
  } catch (const std::exception& failure) {
    recordError(failure, u"basUm"_qs, u"Outermost"_qs, 10);
    ShowErrorReport(ui);
  }
}

TEST(ErrorConvention, AFailureThreeCallsDeepIsShownOnceWithTheInnermostLocation) {
  Environment environment;
  host::HeadlessUi ui;
  outermost(ui);
  ASSERT_EQ(ui.messageBoxes().size(), 1u);
  EXPECT_EQ(ui.messageBoxes().front().prompt, u"9 "_qs + ide::standardDescription(9));
  EXPECT_EQ(ui.messageBoxes().front().style, ide::mb::OKOnly);
  EXPECT_EQ(lastError().place.text(), u"em basUm_Innermost, linha: 30"_qs);
  const QStringList log = environment.errorLog();
  ASSERT_EQ(log.size(), 1);
  EXPECT_TRUE(log.front().endsWith(u"\tem basUm_Innermost, linha: 30"_qs));
}

TEST(ErrorConvention, TheCancelCodesEndSilently) {
  Environment environment;
  host::HeadlessUi ui;
  for (const long number : {9999L, 32755L}) {
    try {
      throw ide::Error(number, u"cancelado"_qs);
    } catch (const std::exception& failure) {
      recordError(failure, u"frmOpcoes"_qs, u"cmdCor_Click"_qs, 1);
      ShowErrorReport(ui);
    }
  }
  EXPECT_TRUE(ui.messageBoxes().empty());
  EXPECT_TRUE(environment.errorLog().empty());
}

TEST(ErrorConvention, AFailureFromOutsideTheIdeIsAnInvalidCallWithItsOwnText) {
  Environment environment;
  const LocatedError error = recordError(std::runtime_error("disco cheio"), u"basDois"_qs, u"Grava"_qs, 7);
  EXPECT_EQ(error.number(), ide::err::InvalidProcedureCall);
  EXPECT_EQ(error.description(), u"disco cheio"_qs);
  EXPECT_EQ(error.source(), u"em basDois_Grava, linha: 7"_qs);
  // A swallowed failure changes only the record's number.
  recordErrorNumber(ide::Error(ide::err::FileNotFound, u"x"_qs));
  EXPECT_EQ(lastError().number, ide::err::FileNotFound);
  EXPECT_EQ(lastError().description, u"disco cheio"_qs);
  EXPECT_EQ(lastError().place.text(), u"em basDois_Grava, linha: 7"_qs);
  EXPECT_EQ(Place{}.text(), QString());
}

TEST(ErrorConvention, AFailureRepeatedAtOnePlaceIsLoggedOnceAndTheRecordIsLeftAlone) {
  Environment environment;
  const ide::Error failure(ide::err::SubscriptOutOfRange, u"fora"_qs);
  for (int tick = 0; tick < 3; ++tick)
    logFailure(failure, u"CTimer"_qs, u"Tick"_qs, 5);
  logFailure(failure, u"CTimer"_qs, u"Tick"_qs, 6);
  logFailure(failure, u"CTimer"_qs, u"Tick"_qs, 5);
  const QStringList log = environment.errorLog();
  ASSERT_EQ(log.size(), 3);
  EXPECT_TRUE(log[0].endsWith(u"\t9\tfora\tem CTimer_Tick, linha: 5"_qs)) << log[0].toStdString();
  EXPECT_TRUE(log[1].endsWith(u"linha: 6"_qs));
  EXPECT_EQ(lastError().number, 0);
}

}  // namespace
}  // namespace common

// SPDX-License-Identifier: MIT
// The add-in as the IDE loads it: the real library, connected, started, failing and unloaded through the
// headless IDE model.
#include "addinfixture.h"
#include "common/strings.h"
#include "host/model/commandbars.h"

#include <gtest/gtest.h>

#include <QClipboard>
#include <QFile>
#include <QGuiApplication>
#include <QImage>

namespace addin::test {
namespace {

constexpr int kExclamation = ide::mb::Exclamation;

QStringList boxTexts(const host::HeadlessUi& ui) {
  QStringList texts;
  for (const auto& box : ui.messageBoxes())
    texts << box.prompt;
  return texts;
}

struct RealAddIn {
  AddInEnvironment environment;
  std::shared_ptr<host::VbeImpl> vbe = host::VbeImpl::create();
  QString barsBefore = commandBarsSnapshot(*vbe->CommandBars());

  host::AddInImpl& registerAddIn(bool loadAtStartup) { return registerRealAddIn(*vbe, loadAtStartup); }
  host::HeadlessUi& ui() { return *vbe->headlessUi(); }
  host::ManualEventLoop& loop() { return *vbe->manualLoop(); }
  QString bars() { return commandBarsSnapshot(*vbe->CommandBars()); }
};

TEST(LifeCycle, StartUpPutsTheCommandsIntoTheIdeAndShutDownTakesThemAllAway) {
  RealAddIn ide;
  auto& addIn = ide.registerAddIn(true);
  EXPECT_EQ(addIn.ProgId(), u"Quimbel.Connect"_qs);
  EXPECT_EQ(addIn.Description(), u"Quimbel 2.2 Add-In"_qs);
  ide.vbe->startup();
  ASSERT_TRUE(addIn.Connect());
  EXPECT_TRUE(ide.ui().messageBoxes().empty()) << boxTexts(ide.ui()).join(u'|').toStdString();

  // The popup stands before the eleventh menu, which is then the Add-Ins menu at position 12.
  auto menuBar = ide.vbe->CommandBars()->Item(u"Menu Bar"_qs)->Controls();
  auto popup = menuBar->Item(11);
  EXPECT_EQ(popup->Caption(), u"Quimbel"_qs);
  EXPECT_EQ(popup->Type(), ide::ControlType::Popup);
  EXPECT_TRUE(popup->Temporary());
  EXPECT_EQ(menuBar->Item(12)->Caption(), u"&Add-Ins"_qs);
  // Every command has its menu item and, but for help, its toolbar button with the same caption and
  // picture: a 16 by 16 image.
  auto items = popup->CommandBar()->Controls();
  ASSERT_EQ(items->Count(), 13);
  for (int i = 1; i <= 13; ++i) {
    auto item = items->Item(i);
    EXPECT_EQ(item->Style(), ide::ButtonStyle::IconAndCaption);
    EXPECT_TRUE(item->Temporary());
    EXPECT_TRUE(item->Enabled());
    EXPECT_FALSE(QImage::fromData(item->Face()).isNull()) << i;
  }
  EXPECT_EQ(items->Item(13)->Caption(), u"Ajuda"_qs);

  auto toolbar = ide.vbe->CommandBars()->Item(u"Quimbel 2.2"_qs);
  EXPECT_TRUE(toolbar->Visible());
  EXPECT_EQ(toolbar->Position(), ide::BarPosition::Top);
  auto buttons = toolbar->Controls();
  ASSERT_EQ(buttons->Count(), 12);
  QStringList tags;
  for (int i = 1; i <= 12; ++i) {
    auto button = buttons->Item(i);
    tags << button->Tag();
    EXPECT_EQ(button->TooltipText(), items->Item(i)->Caption());
    EXPECT_TRUE(button->Temporary());
    EXPECT_TRUE(button->Visible());
    EXPECT_EQ(QImage::fromData(button->Face()).size(), QSize(16, 16)) << i;
    EXPECT_EQ(button->Face(), items->Item(i)->Face());
  }
  EXPECT_EQ(tags.join(u' '),
            u"MVBackward MVForward MVDirectAccess MVMacros MVCopyBuffers MVLinesNumbering "
            u"MVIndentation MVCloseWindows MVExtendedFind MVNotes MVNewProcedure MVOptions");

  for (const char* name : {"Code Window", "Code Window (Break)"}) {
    auto first = ide.vbe->CommandBars()->Item(QLatin1StringView(name))->Controls()->Item(1);
    EXPECT_EQ(first->Caption(), u"Adicionar aos Favoritos"_qs);
    EXPECT_EQ(first->Style(), ide::ButtonStyle::IconAndCaption);
    EXPECT_EQ(first->Face(), items->Item(3)->Face()) << "the favourites picture";
  }
  EXPECT_EQ(ide.loop().activeTimers(), 1);

  ide.vbe->shutdown();
  EXPECT_EQ(ide.bars(), ide.barsBefore);
  EXPECT_EQ(ide.loop().activeTimers(), 0);
}

TEST(LifeCycle, UnloadingAndLoadingAgainLeavesOnePopupOneToolBarAndOneTimer) {
  RealAddIn ide;
  auto& addIn = ide.registerAddIn(false);
  addIn.setConnect(true);
  ASSERT_TRUE(addIn.Connect());
  const QString loaded = ide.bars();
  addIn.setConnect(false);
  ide.loop().DoEvents();
  EXPECT_EQ(ide.bars(), ide.barsBefore);
  EXPECT_EQ(ide.loop().activeTimers(), 0);

  addIn.setConnect(true);
  EXPECT_EQ(quimbelPopups(*ide.vbe), 1);
  EXPECT_EQ(quimbelToolBars(*ide.vbe), 1);
  EXPECT_EQ(ide.loop().activeTimers(), 1);
  EXPECT_EQ(ide.bars(), loaded);
  addIn.setConnect(false);
  ide.loop().DoEvents();
  EXPECT_EQ(ide.bars(), ide.barsBefore);
  EXPECT_EQ(addIn.connectionCount(), 2);
}

TEST(LifeCycle, LoadedWithTheIdeItStartsOnlyWhenTheIdesStartUpIsComplete) {
  RealAddIn ide;
  auto& addIn = ide.registerAddIn(true);
  addIn.connect(ide::ConnectMode::Startup);
  EXPECT_EQ(quimbelPopups(*ide.vbe), 0);
  EXPECT_EQ(ide.loop().activeTimers(), 0);
  addIn.startupComplete();
  EXPECT_EQ(quimbelPopups(*ide.vbe), 1);
  EXPECT_EQ(ide.loop().activeTimers(), 1);
  // A second notice of the same start-up builds nothing twice.
  addIn.startupComplete();
  ide.vbe->startup();
  EXPECT_EQ(quimbelPopups(*ide.vbe), 1);
  EXPECT_EQ(quimbelToolBars(*ide.vbe), 1);
  EXPECT_EQ(ide.loop().activeTimers(), 1);
  ide.vbe->shutdown();
}

TEST(LifeCycle, TheStartUpShowsTheSplashAndTheHourglassOnlyWhileItRuns) {
  RealAddIn ide;
  auto& addIn = ide.registerAddIn(false);
  addIn.setConnect(true);
  ASSERT_EQ(ide.ui().splashHistory().size(), 2u);
  EXPECT_EQ(ide.ui().splashHistory().front(), u"Quimbel 2.2"_qs);
  EXPECT_TRUE(ide.ui().splashText().isEmpty());
  EXPECT_EQ(ide.ui().cursor(), ide::Cursor::Default);
  ide.vbe->shutdown();
}

TEST(LifeCycle, StartUpLeavesTheClipboardAlone) {
  static int argc = 1;
  static char name[] = "addin_test";
  static char* argv[] = {name, nullptr};
  if (!QGuiApplication::instance()) new QGuiApplication(argc, argv);  // kept: Qt is not set up twice
  QGuiApplication::clipboard()->setText(u"texto do usuário"_qs);
  RealAddIn ide;
  ide.registerAddIn(true);
  ide.vbe->startup();
  ASSERT_EQ(quimbelPopups(*ide.vbe), 1);
  EXPECT_EQ(QGuiApplication::clipboard()->text(), u"texto do usuário"_qs);
  ide.vbe->shutdown();
  EXPECT_EQ(QGuiApplication::clipboard()->text(), u"texto do usuário"_qs);
}

TEST(LifeCycle, AToolBarLeftBehindByAnEarlierConnectionIsReplaced) {
  RealAddIn ide;
  ide.vbe->CommandBars()->Add(u"Quimbel 2.2"_qs, ide::BarPosition::Top, false, false);
  auto& addIn = ide.registerAddIn(false);
  addIn.setConnect(true);
  EXPECT_TRUE(addIn.Connect());
  EXPECT_EQ(quimbelToolBars(*ide.vbe), 1);
  EXPECT_EQ(ide.vbe->CommandBars()->Item(u"Quimbel 2.2"_qs)->Controls()->Count(), 12);
  ide.vbe->shutdown();
  EXPECT_EQ(quimbelToolBars(*ide.vbe), 0);
}

// ---------------------------------------------------------------------------------------------------
// Failures

TEST(StartUpFailures, WithoutAnInstallationPathTheAddInSaysSoAndUnloadsItself) {
  const QStringList configurations{QString(), u"# nothing\n"_qs, u"InstallationPath=   \n"_qs};
  for (const QString& configuration : configurations) {
    RealAddIn ide;
    if (configuration.isNull())
      QFile::remove(ide.environment.machineConfigPath());
    else
      ide.environment.writeMachineConfig(configuration);
    auto& addIn = ide.registerAddIn(true);
    ide.vbe->startup();
    ide.loop().DoEvents();
    EXPECT_FALSE(addIn.Connect());
    ASSERT_EQ(ide.ui().messageBoxes().size(), 1u) << configuration.toStdString();
    const auto& box = ide.ui().messageBoxes().front();
    EXPECT_EQ(box.prompt, u"Erro: não foi possível detectar o diretório de instalação."_qs);
    EXPECT_EQ(ide::mb::iconOf(box.style), kExclamation);
    EXPECT_EQ(box.title, u"Quimbel"_qs);
    EXPECT_TRUE(ide.ui().splashHistory().empty());
    EXPECT_EQ(ide.bars(), ide.barsBefore);
    EXPECT_EQ(ide.loop().activeTimers(), 0);
  }
}

TEST(StartUpFailures, AReadOnlyMachineConfigurationIsEnough) {
  RealAddIn ide;
  QFile::setPermissions(ide.environment.machineConfigPath(),
                        QFile::ReadOwner | QFile::ReadGroup | QFile::ReadOther);
  auto& addIn = ide.registerAddIn(false);
  addIn.setConnect(true);
  EXPECT_TRUE(addIn.Connect());
  EXPECT_TRUE(ide.ui().messageBoxes().empty());
  ide.vbe->shutdown();
}

TEST(StartUpFailures, WithoutAnAddInsMenuTheStartUpFailsAndTakesApartWhatItBuilt) {
  RealAddIn ide;
  // An IDE without the Add-Ins menu.
  ide.vbe->CommandBars()->Item(u"Menu Bar"_qs)->Controls()->Item(u"&Add-Ins"_qs)->Delete();
  const QString before = ide.bars();
  auto& addIn = ide.registerAddIn(true);
  ide.vbe->startup();
  ide.loop().DoEvents();
  EXPECT_FALSE(addIn.Connect());
  ASSERT_EQ(boxTexts(ide.ui()), QStringList{u"Erro de inicialização."_qs});
  EXPECT_EQ(ide::mb::iconOf(ide.ui().messageBoxes().front().style), kExclamation);
  EXPECT_EQ(ide.bars(), before);
  EXPECT_EQ(ide.loop().activeTimers(), 0);
  EXPECT_TRUE(ide.ui().splashText().isEmpty());
  EXPECT_EQ(ide.ui().cursor(), ide::Cursor::Default);
  // The log names the number (0x80040C81 as a 32-bit number), the text and where it failed.
  const QStringList log = ide.environment.errorLog();
  ASSERT_EQ(log.size(), 1);
  EXPECT_TRUE(log.front().contains(u"\t-2147218303\tNão há menu de Add-Ins.\t"_qs))
      << log.front().toStdString();
  EXPECT_TRUE(log.front().contains(u"em CVBEvents_ConnectMenus, linha: "_qs)) << log.front().toStdString();
}

TEST(StartUpFailures, AnUnusableDatabaseIsNamedAndTheAddInStartsWithoutIt) {
  AddInEnvironment environment;
  const QString file = environment.installDir() + u"/Quimbel.inf"_qs;
  {
    LinkedAddIn ide;
    ide.connect();
    ASSERT_NE(ide.globals().AppInfo(), nullptr) << "a missing database is created";
    EXPECT_TRUE(ide.ui().messageBoxes().empty());
  }
  const QByteArray notADatabase = "VERSION 1.0 CLASS\r\nBEGIN\r\n  MultiUse = -1  'True\r\nEND\r\n";
  QFile bad(file);
  ASSERT_TRUE(bad.open(QIODevice::WriteOnly | QIODevice::Truncate));
  bad.write(notADatabase);
  bad.close();
  LinkedAddIn ide;
  ide.connect();
  EXPECT_TRUE(ide.addIn->Connect());
  EXPECT_EQ(ide.globals().AppInfo(), nullptr);
  ASSERT_EQ(boxTexts(ide.ui()), QStringList{ide.globals().AppInfoUnavailable()});
  EXPECT_TRUE(ide.globals().AppInfoUnavailable().contains(file));
  EXPECT_EQ(ide::mb::iconOf(ide.ui().messageBoxes().front().style), kExclamation);
  ASSERT_TRUE(bad.open(QIODevice::ReadOnly));
  EXPECT_EQ(bad.readAll(), notADatabase);
}

TEST(StartUpFailures, AFailureThreeCallsDeepShowsOneMessageNamingTheInnermostProcedure) {
  RealAddIn ide;
  auto& addIn = ide.registerAddIn(true);
  ide.vbe->startup();
  auto project = ide.vbe->newProject();
  auto module = addModule(project, u"modUm"_qs, 1, 5);
  ide.loop().DoEvents();
  ide.ui().clearMessageBoxes();
  // Without the "Continue" button the IDE's mode cannot be read: selecting a component fails in the mode
  // test (the handler asks CEnvUtils_IdeMode, which asks CEnvUtils_IsStandardControlEnabled).
  ide.vbe->CommandBars()->Item(u"Standard"_qs)->Controls()->Item(u"Continue"_qs)->Delete();
  ide.vbe->selectComponent(nullptr);
  ide.vbe->selectComponent(module);
  ASSERT_EQ(ide.ui().messageBoxes().size(), 1u) << boxTexts(ide.ui()).join(u'|').toStdString();
  const auto& box = ide.ui().messageBoxes().front();
  EXPECT_EQ(box.prompt, u"5 "_qs + ide::standardDescription(5));
  EXPECT_EQ(ide::mb::buttonsOf(box.style), ide::mb::OKOnly);
  const QStringList log = ide.environment.errorLog();
  ASSERT_EQ(log.size(), 1);
  EXPECT_TRUE(log.front().contains(u"em CEnvUtils_IsStandardControlEnabled, linha: "_qs))
      << log.front().toStdString();
  EXPECT_TRUE(addIn.Connect()) << "a failing handler does not unload the add-in";
  ide.vbe->shutdown();
}

}  // namespace
}  // namespace addin::test

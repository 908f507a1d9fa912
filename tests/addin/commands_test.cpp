// SPDX-License-Identifier: MIT
// Commands and IDE events through the linked add-in core with recording feature areas: the command-state
// gate, menu items doing what their buttons do, the IDE-mode rule, the enabling rules, closing windows,
// help and the idle notification after a project is added.
#include "addin/texts.h"
#include "addinfixture.h"
#include "common/errors.h"
#include "host/model/commandbars.h"
#include "host/model/designer.h"
#include "host/model/objects.h"

#include <gtest/gtest.h>

namespace addin::test {
namespace {

using common::CommandId;

// The commands from favourites to options and what the recording features note for each (close windows
// acts itself).
const std::map<CommandId, QString>& featureOfCommand() {
  static const std::map<CommandId, QString> map{
      {CommandId::Favorites, u"favorites"_qs},      {CommandId::Macros, u"macros"_qs},
      {CommandId::CopyBuffers, u"copy buffers"_qs}, {CommandId::LinesNumbering, u"numbering"_qs},
      {CommandId::Indentation, u"indentation"_qs},  {CommandId::ExtendedFind, u"find"_qs},
      {CommandId::TaskList, u"tasks"_qs},           {CommandId::NewProcedure, u"new procedure"_qs},
      {CommandId::Options, u"options"_qs}};
  return map;
}

/// The linked add-in, connected, in an environment of its own.
class ConnectedAddIn : public ::testing::Test {
 protected:
  ConnectedAddIn() { addIn.connect(); }
  AddInEnvironment environment;
  LinkedAddIn addIn;
};
class CommandState : public ConnectedAddIn {};
class Commands : public ConnectedAddIn {};
class Connection : public ConnectedAddIn {};
class IdeEvents : public ConnectedAddIn {};

/// Clicks the toolbar buttons of those commands and returns what reached the feature areas.
QStringList clickAll(LinkedAddIn& addIn) {
  addIn.takeFeatureLog();
  for (const auto& [number, feature] : featureOfCommand())
    addIn.clickToolBar(number);
  return addIn.takeFeatureLog();
}

bool contextItemsEnabled(ide::VBE& vbe) {
  bool enabled = true;
  for (const char* name : {"Code Window", "Code Window (Break)"})
    enabled = enabled && vbe.CommandBars()->Item(QLatin1StringView(name))->Controls()->Item(1)->Enabled();
  return enabled;
}

TEST_F(CommandState, WithNoProjectOnlyBackForwardOptionsAndHelpCanRun) {
  addIn.loop().advance(100);
  EXPECT_EQ(clickAll(addIn), QStringList{u"options"_qs});
  EXPECT_FALSE(contextItemsEnabled(*addIn.vbe));
  auto& state = addIn.globals().CommandState();
  for (int command = int(CommandId::Favorites); command <= int(CommandId::NewProcedure); ++command)
    EXPECT_FALSE(state[CommandId(command)]) << command;
  EXPECT_TRUE(state[CommandId::Options]);
  EXPECT_TRUE(state[CommandId::Help]);
  // Back and forward with an empty history do nothing (and fail nothing).
  addIn.clickToolBar(CommandId::BrowseBackward);
  addIn.clickToolBar(CommandId::BrowseForward);
  EXPECT_TRUE(addIn.ui().messageBoxes().empty());
}

TEST_F(CommandState, AfterTheFirstProjectTheProjectCommandsWorkAtOnceAndNewProcedureWithACodeWindow) {
  addIn.loop().advance(100);
  auto project = addIn.vbe->newProject();
  auto module = addModule(project, u"modUm"_qs, 2, 10);
  QStringList expected{u"favorites"_qs,   u"macros"_qs, u"copy buffers"_qs, u"numbering"_qs,
                       u"indentation"_qs, u"find"_qs,   u"tasks"_qs,        u"options"_qs};
  EXPECT_EQ(clickAll(addIn), expected) << "before any tick";
  EXPECT_TRUE(contextItemsEnabled(*addIn.vbe));

  addIn.loop().advance(100);
  EXPECT_EQ(clickAll(addIn), expected) << "no code window: no new procedure";
  EXPECT_FALSE(contextItemsEnabled(*addIn.vbe));

  showAt(module, 1);
  addIn.loop().advance(100);
  expected.insert(7, u"new procedure"_qs);
  EXPECT_EQ(clickAll(addIn), expected);
  EXPECT_TRUE(contextItemsEnabled(*addIn.vbe));

  // A minimised code window does not count.
  addIn.vbe->ActiveWindow()->setWindowState(ide::WindowState::Minimize);
  addIn.loop().advance(100);
  EXPECT_FALSE(addIn.globals().CommandState()[CommandId::NewProcedure]);
  addIn.vbe->ActiveWindow()->setWindowState(ide::WindowState::Normal);

  // A tool window in front: no code window.
  addIn.vbe->activateWindow(addIn.vbe->projectWindow());
  addIn.loop().advance(100);
  EXPECT_FALSE(addIn.globals().CommandState()[CommandId::NewProcedure]);
  EXPECT_FALSE(contextItemsEnabled(*addIn.vbe));
  EXPECT_EQ(addIn.globals().LastWindowType(), static_cast<int>(ide::WindowType::ProjectWindow));

  // The last project closing disables the project commands again at the next tick.
  addIn.vbe->removeProject(project);
  addIn.loop().advance(100);
  EXPECT_EQ(clickAll(addIn), QStringList{u"options"_qs});
  EXPECT_EQ(addIn.globals().LastWindowType(), -1);
}

TEST_F(Connection, TheStartUpReadsTheNamesAndTheIdleMessage) {
  Globals& globals = addIn.globals();
  EXPECT_EQ(globals.ComputerName(), addIn.vbe->Platform().computerName().left(255));
  EXPECT_EQ(globals.UserName(), addIn.vbe->Platform().userName().left(255));
  EXPECT_FALSE(globals.UserName().isEmpty());
  EXPECT_EQ(globals.IdleMessage(), addIn.vbe->windowSystem().RegisterWindowMessage(u"QM_ONIDLE_MSG"_qs));
  EXPECT_EQ(globals.values().InstallDir, environment.installDir() + u'/');
  EXPECT_EQ(globals.LastWindowType(), -1);
  EXPECT_NE(globals.TimerId(), 0);
  EXPECT_EQ(addIn.ui().messageBoxes().size(), 0u);
}

TEST_F(CommandState, AMenuItemDoesWhatItsToolBarButtonDoes) {
  auto project = addIn.vbe->newProject();
  showAt(addModule(project, u"modUm"_qs, 1, 10), 1);
  addIn.loop().advance(100);
  addIn.takeFeatureLog();
  for (const auto& [number, feature] : featureOfCommand()) {
    addIn.clickMenu(number);
    EXPECT_EQ(addIn.takeFeatureLog(), QStringList{feature}) << int(number);
  }
}

TEST_F(CommandState, ClickingLeavesTheIdesClickFlagsAsTheyAre) {
  auto button = addIn.vbe->CommandBars()->Item(u"Quimbel 2.2"_qs)->Controls()->Item(12);
  bool handled = false;
  bool cancel = false;
  auto source = addIn.vbe->Events()->CommandBarEvents(button);
  source->Click.fire(button, handled, cancel);
  EXPECT_EQ(addIn.takeFeatureLog(), QStringList{u"options"_qs});
  EXPECT_FALSE(handled);
  EXPECT_FALSE(cancel);
}

TEST_F(Commands, CloseWindowsClosesCodeAndDesignerWindowsAndLeavesToolWindows) {
  auto project = addIn.vbe->newProject();
  showAt(addModule(project, u"modUm"_qs, 1, 10), 1);
  showAt(addModule(project, u"modDois"_qs, 1, 10), 1);
  auto form = std::dynamic_pointer_cast<host::ComponentImpl>(
      project->VBComponents()->Add(ide::ComponentType::VBForm));
  form->designerWindow()->SetFocus();
  auto countOf = [&](ide::WindowType type) {
    int count = 0;
    for (const auto& window : addIn.vbe->Windows()->items())
      if (window->Type() == type) ++count;
    return count;
  };
  ASSERT_EQ(countOf(ide::WindowType::CodeWindow), 2);
  ASSERT_EQ(countOf(ide::WindowType::Designer), 1);
  const int tools = addIn.vbe->Windows()->Count() - 3;
  addIn.loop().advance(100);
  addIn.clickToolBar(CommandId::CloseWindows);
  EXPECT_EQ(countOf(ide::WindowType::CodeWindow), 0);
  EXPECT_EQ(countOf(ide::WindowType::Designer), 0);
  EXPECT_EQ(addIn.vbe->Windows()->Count(), tools);
  EXPECT_EQ(countOf(ide::WindowType::ProjectWindow), 1);
  EXPECT_EQ(countOf(ide::WindowType::PropertyWindow), 1);
}

TEST(Help, TheMenuItemOpensTheContentsPageOrSaysItCannot) {
  AddInEnvironment environment;
  environment.writeMachineConfig(u"InstallationPath = "_qs + environment.installDir() + u'\n');
  LinkedAddIn addIn;
  addIn.ui().setCanOpenDocuments(true);
  addIn.connect();
  addIn.clickMenu(CommandId::Help);
  ASSERT_EQ(addIn.ui().openedDocuments().size(), 1u);
  EXPECT_EQ(addIn.ui().openedDocuments().front(), environment.installDir() + u"/help/index.html"_qs);
  EXPECT_TRUE(addIn.ui().messageBoxes().empty());

  QFile::remove(environment.installDir() + u"/help/index.html"_qs);
  addIn.clickMenu(CommandId::Help);
  ASSERT_EQ(addIn.ui().messageBoxes().size(), 1u);
  EXPECT_EQ(addIn.ui().messageBoxes().front().prompt, u"Não foi possível localizar o arquivo de ajuda."_qs);
  EXPECT_EQ(ide::mb::iconOf(addIn.ui().messageBoxes().front().style), ide::mb::Information);
  EXPECT_EQ(addIn.ui().openedDocuments().size(), 1u);
}

TEST_F(Commands, AddToFavoritesHandsTheProcedureAtTheCaretToTheFavorites) {
  auto project = addIn.vbe->newProject();
  auto module = addModule(project, u"modUm"_qs, 2, 10);
  module->CodeModule()->AddFromString(
      QStringLiteral("Public Property Get Valor() As Long\r\n    Valor = m\r\nEnd Property\r\n"
                     "Public Property Let Valor(ByVal v As Long)\r\n    m = v\r\nEnd Property"));
  auto pane = showAt(module, 1);
  auto favoriteAt = [&](int line) {
    pane->SetSelection(line, 1, line, 1);
    addIn.takeFeatureLog();
    addIn.vbe->CommandBars()->Item(u"Code Window"_qs)->Controls()->Item(1)->Execute();
    return addIn.takeFeatureLog();
  };
  EXPECT_EQ(favoriteAt(1), QStringList{u"favorite modUm.General Declarations kind 0 line 1"_qs});
  EXPECT_EQ(favoriteAt(15), QStringList{u"favorite modUm.Proc2 kind 0 line 15"_qs});
  EXPECT_EQ(favoriteAt(24), QStringList{u"favorite modUm.Valor kind 3 line 24"_qs});
  EXPECT_EQ(favoriteAt(26), QStringList{u"favorite modUm.Valor kind 1 line 26"_qs});
  // The break-mode menu's item does the same.
  pane->SetSelection(15, 1, 15, 1);
  addIn.vbe->CommandBars()->Item(u"Code Window (Break)"_qs)->Controls()->Item(1)->Execute();
  EXPECT_EQ(addIn.takeFeatureLog(), QStringList{u"favorite modUm.Proc2 kind 0 line 15"_qs});
}

TEST_F(Commands, FailuresTheHandlersEndOnSilentlyAreLoggedOnceWithTheirPlace) {
  auto project = addIn.vbe->newProject();
  addIn.loop().DoEvents();
  common::lastError() = {};
  const struct {
    const char* failing;
    std::function<void()> act;
    const char* location;
  } cases[] = {
      {"options", [&] { addIn.clickToolBar(CommandId::Options); }, "em CVBEvents_runCommand, linha: "},
      {"options", [&] { addIn.clickMenu(CommandId::Options); }, nullptr},  // the same again: no new line
      {"project renamed", [&] { project->setName(u"Vendas"_qs); },
       "em CVBEvents_EvProjectsHandler_ItemRenamed"},
  };
  int lines = 0;
  for (const auto& c : cases) {
    addIn.failingFeature = QString::fromLatin1(c.failing);
    c.act();
    const QStringList log = environment.errorLog();
    ASSERT_EQ(log.size(), c.location ? ++lines : lines) << c.failing;
    if (c.location) {
      EXPECT_TRUE(log.back().contains(QLatin1StringView(c.location))) << log.back().toStdString();
    }
  }
  EXPECT_TRUE(addIn.ui().messageBoxes().empty());
  EXPECT_EQ(common::lastError().number, 0) << "the record of reported failures is left alone";
}

// ---------------------------------------------------------------------------------------------------
// IDE events

TEST_F(IdeEvents, WhileTheProgramRunsComponentsAndControlsAreLeftAloneExceptForRenames) {
  auto project = addIn.vbe->newProject();
  addIn.loop().DoEvents();
  auto form = std::dynamic_pointer_cast<host::ComponentImpl>(
      project->VBComponents()->Add(ide::ComponentType::VBForm));
  form->designerWindow()->SetFocus();
  addIn.takeFeatureLog();

  addIn.vbe->setMode(ide::IdeMode::Run);
  auto module = project->VBComponents()->Add(ide::ComponentType::StdModule);
  module->setName(u"modNovo"_qs);
  auto label = form->Designer()->VBControls()->Add(u"VB.Label"_qs);
  label->Properties()->Item(u"Name"_qs)->setValue(u"lblNome"_qs);
  project->VBComponents()->Remove(module);
  EXPECT_EQ(addIn.takeFeatureLog(),
            (QStringList{u"component renamed Module1 modNovo"_qs, u"control renamed Label1 lblNome"_qs}));

  addIn.vbe->setMode(ide::IdeMode::Design);
  auto second = project->VBComponents()->Add(ide::ComponentType::StdModule);
  auto box = form->Designer()->VBControls()->Add(u"VB.TextBox"_qs);
  project->VBComponents()->Remove(second);
  EXPECT_EQ(addIn.takeFeatureLog(), (QStringList{u"component added Module1"_qs, u"control added Text1"_qs,
                                                 u"component removed Module1"_qs}));
}

TEST_F(IdeEvents, ProjectsAreAnnouncedAndTheComponentEventsFollowTheActiveProject) {
  auto& windows = addIn.vbe->windowSystem();
  const ide::HWnd main = addIn.vbe->MainWindow()->hWnd();
  const ide::WndProcRef ownProc = windows.GetWindowProc(main);

  auto first = addIn.vbe->newProject();
  // The idle procedure waits on the main window until the IDE is idle, then takes itself off.
  EXPECT_TRUE(windows.GetProp(main, u"OldWndProc"_qs).has_value());
  EXPECT_NE(windows.GetWindowProc(main), ownProc);
  addIn.loop().DoEvents();
  EXPECT_FALSE(windows.GetProp(main, u"OldWndProc"_qs).has_value());
  EXPECT_EQ(windows.GetWindowProc(main), ownProc);

  auto second = addIn.vbe->newProject();
  addIn.loop().DoEvents();
  EXPECT_EQ(addIn.takeFeatureLog(),
            (QStringList{u"project added Project1"_qs, u"project added Project2"_qs}));
  second->VBComponents()->Add(ide::ComponentType::StdModule);
  first->VBComponents()->Add(ide::ComponentType::StdModule);
  EXPECT_EQ(addIn.takeFeatureLog(), QStringList{u"component added Module1"_qs})
      << "only the active project's";

  addIn.vbe->setActiveVBProject(first);
  first->VBComponents()->Add(ide::ComponentType::StdModule);
  EXPECT_EQ(addIn.takeFeatureLog(), QStringList{u"component added Module2"_qs});

  second->setName(u"Biblioteca"_qs);
  addIn.vbe->removeProject(second);
  EXPECT_EQ(addIn.takeFeatureLog(),
            (QStringList{u"project renamed Project2 Biblioteca"_qs, u"project removed Biblioteca"_qs}));
  EXPECT_TRUE(contextItemsEnabled(*addIn.vbe)) << "a project is left";
  addIn.vbe->removeProject(first);
  EXPECT_FALSE(contextItemsEnabled(*addIn.vbe));
}

TEST_F(IdeEvents, AFailingProjectHandlerShowsTheUndeterminedErrorMessage) {
  auto project = addIn.vbe->newProject();
  addIn.loop().DoEvents();
  // The removal handler reads the IDE's mode; without "Continue" on the "Standard" bar that fails.
  auto module = addModule(project, u"modUm"_qs, 1, 5);
  addIn.vbe->CommandBars()->Item(u"Standard"_qs)->Controls()->Item(u"Continue"_qs)->Delete();
  addIn.ui().clearMessageBoxes();
  project->VBComponents()->Remove(module);
  ASSERT_EQ(addIn.ui().messageBoxes().size(), 1u);
  EXPECT_EQ(addIn.ui().messageBoxes().front().prompt, u"Erro indeterminado."_qs);
  EXPECT_EQ(ide::mb::iconOf(addIn.ui().messageBoxes().front().style), ide::mb::Critical);
  EXPECT_EQ(addIn.ui().messageBoxes().front().title, u"Quimbel"_qs);
}

TEST_F(IdeEvents, AProjectFileMovingToAnotherDirectoryIsAnnounced) {
  auto project = addIn.vbe->newProject();
  addIn.loop().DoEvents();
  addIn.takeFeatureLog();
  addIn.vbe->fireFileNameChanged(project, ide::FileType::Project, environment.path(u"a/P.vbp"_qs),
                                 environment.path(u"b/P.vbp"_qs));
  addIn.vbe->fireFileNameChanged(project, ide::FileType::Project, environment.path(u"a/Q.vbp"_qs),
                                 environment.path(u"a/P.vbp"_qs));
  addIn.vbe->fireFileNameChanged(project, ide::FileType::Module, environment.path(u"c/M.bas"_qs),
                                 environment.path(u"a/M.bas"_qs));
  EXPECT_EQ(addIn.takeFeatureLog(), QStringList{u"project moved Project1"_qs});
}

}  // namespace
}  // namespace addin::test

// SPDX-License-Identifier: MIT
// The main window over the model: the project explorer and the selected component, code windows in the MDI
// area following the model's active window and window state, the keyboard focus, hotkeys delivered to the
// code window's procedures before the editor, the IDE mode and the code window's context menu.
#include "codebinding.h"
#include "codeeditor.h"
#include "codewindow.h"
#include "commandbarview.h"
#include "designerview.h"
#include "host/model/events.h"
#include "idecommands.h"
#include "idefixture.h"
#include "projectexplorer.h"
#include "propertiesview.h"
#include "windowmanager.h"

#include <gtest/gtest.h>

#include <QComboBox>
#include <QDockWidget>
#include <QLabel>
#include <QMdiArea>
#include <QMdiSubWindow>
#include <QMenu>
#include <QPlainTextEdit>
#include <QStatusBar>
#include <QTabBar>
#include <QTableWidget>
#include <QTemporaryDir>
#include <QTest>
#include <QTextBlock>
#include <QToolButton>
#include <QTreeWidgetItem>

namespace desktop {
namespace {

using test::settle;
using test::waitFor;

class MainWindowTest : public test::IdeTest {};

// ---------------------------------------------------------------------------------------------------
// Explorer and selection

TEST_F(MainWindowTest, TheExplorerListsProjectsAndComponentsByType) {
  ProjectExplorer& explorer = m_window->explorer();
  explorer.refresh();
  ASSERT_EQ(explorer.topLevelItemCount(), 2);
  QTreeWidgetItem* loja = explorer.topLevelItem(0);
  EXPECT_EQ(loja->text(0), u"Loja (Loja.vbp)"_qs);
  QStringList folders;
  for (int i = 0; i < loja->childCount(); ++i)
    folders << loja->child(i)->text(0);
  EXPECT_EQ(folders, (QStringList{u"Forms"_qs, u"Modules"_qs, u"Class Modules"_qs, u"User Controls"_qs}));
  QTreeWidgetItem* forms = loja->child(0);
  ASSERT_EQ(forms->childCount(), 4);
  EXPECT_EQ(forms->child(0)->text(0), u"frmPrincipal (frmPrincipal.frm)"_qs);
}

TEST_F(MainWindowTest, SelectingAComponentSelectsItInTheIdeAndFiresTheEvent) {
  QStringList selected;
  auto connection = m_ide.vbe->events().components->ItemSelected.connect(
      [&](const ide::Ref<ide::VBComponent>& c) { selected << c->Name(); });
  auto clientes = component(u"Loja"_qs, u"clsClientes"_qs);
  m_window->explorer().refresh();
  m_window->explorer().setCurrentItem(m_window->explorer().itemOf(clientes.get()));
  EXPECT_EQ(m_ide.vbe->SelectedVBComponent(), clientes);
  EXPECT_EQ(selected, QStringList{u"clsClientes"_qs});
}

TEST_F(MainWindowTest, TheExplorerFollowsTheSelectionOfTheModel) {
  auto api = component(u"Utilitarios"_qs, u"modApi"_qs);
  m_ide.vbe->selectComponent(api);
  settle();
  EXPECT_EQ(m_window->explorer().componentOf(m_window->explorer().currentItem()), api);
}

TEST_F(MainWindowTest, AddedAndRemovedComponentsAppearAndVanish) {
  auto project = m_ide.vbe->project(u"Utilitarios"_qs);
  auto added = std::static_pointer_cast<host::ComponentImpl>(project->Add(ide::ComponentType::ClassModule));
  settle();
  ASSERT_NE(m_window->explorer().itemOf(added.get()), nullptr);
  EXPECT_EQ(m_window->explorer().itemOf(added.get())->text(0), u"Class1"_qs);
  project->Remove(added);
  settle();
  EXPECT_EQ(m_window->explorer().itemOf(added.get()), nullptr);
}

// ---------------------------------------------------------------------------------------------------
// Windows

TEST_F(MainWindowTest, DoubleClickingAModuleOpensItsCodeWindow) {
  QMdiSubWindow* sub = openCode(u"Loja"_qs, u"modPrincipal"_qs);
  ASSERT_NE(sub, nullptr);
  EXPECT_EQ(sub->windowTitle(), u"Loja - modPrincipal (Code)"_qs);
  auto pane = component(u"Loja"_qs, u"modPrincipal"_qs)->codeModule()->pane();
  EXPECT_EQ(m_ide.vbe->ActiveCodePane(), pane);
  EXPECT_EQ(m_ide.vbe->ActiveWindow(), pane->window());
  EXPECT_EQ(m_window->mdiArea()->activeSubWindow(), sub);
}

TEST_F(MainWindowTest, ActivationFollowsBothWays) {
  QMdiSubWindow* principal = openCode(u"Loja"_qs, u"modPrincipal"_qs);
  QMdiSubWindow* api = openCode(u"Utilitarios"_qs, u"modApi"_qs);
  ASSERT_TRUE(principal && api);
  auto principalPane = component(u"Loja"_qs, u"modPrincipal"_qs)->codeModule()->pane();
  auto apiPane = component(u"Utilitarios"_qs, u"modApi"_qs)->codeModule()->pane();
  EXPECT_EQ(m_ide.vbe->ActiveCodePane(), apiPane);
  m_window->mdiArea()->setActiveSubWindow(principal);
  EXPECT_EQ(m_ide.vbe->ActiveCodePane(), principalPane);
  EXPECT_EQ(m_ide.vbe->ActiveVBProject()->Name(), u"Loja"_qs);
  apiPane->Show();
  EXPECT_EQ(m_window->mdiArea()->activeSubWindow(), api);
}

TEST_F(MainWindowTest, MinimisedStateFollowsBothWays) {
  QMdiSubWindow* sub = openCode(u"Loja"_qs, u"modPrincipal"_qs);
  ASSERT_NE(sub, nullptr);
  auto window = component(u"Loja"_qs, u"modPrincipal"_qs)->codeModule()->pane()->window();
  window->setWindowState(ide::WindowState::Minimize);
  EXPECT_TRUE(sub->isMinimized());
  window->setWindowState(ide::WindowState::Normal);
  EXPECT_FALSE(sub->isMinimized());
  sub->showMinimized();
  EXPECT_EQ(window->WindowState(), ide::WindowState::Minimize);
  sub->showNormal();
  EXPECT_EQ(window->WindowState(), ide::WindowState::Normal);
}

TEST_F(MainWindowTest, ClosingWorksFromEitherSide) {
  QMdiSubWindow* sub = openCode(u"Loja"_qs, u"modPrincipal"_qs);
  ASSERT_NE(sub, nullptr);
  auto window = component(u"Loja"_qs, u"modPrincipal"_qs)->codeModule()->pane()->window();
  QPointer<QMdiSubWindow> guard = sub;
  window->Close();
  settle();
  EXPECT_TRUE(guard.isNull());
  EXPECT_TRUE(m_window->mdiArea()->subWindowList().isEmpty());

  sub = openCode(u"Loja"_qs, u"modPrincipal"_qs);
  ASSERT_NE(sub, nullptr);
  EXPECT_TRUE(window->isOpen());
  sub->close();
  settle();
  EXPECT_FALSE(window->isOpen());
  EXPECT_EQ(m_ide.vbe->ActiveCodePane(), nullptr);
}

TEST_F(MainWindowTest, TheKeyboardFocusIsTheWindowOfTheFocusedWidget) {
  activate();
  QMdiSubWindow* sub = openCode(u"Loja"_qs, u"modPrincipal"_qs);
  ASSERT_NE(sub, nullptr);
  auto* code = qobject_cast<CodeWindow*>(sub->widget());
  auto window = code->window();
  code->editor()->setFocus();
  ASSERT_TRUE(waitFor([&] { return code->editor()->hasFocus(); }));
  EXPECT_EQ(m_ide.vbe->windowSystem().GetFocus(), window->hWnd());
  m_window->explorer().setFocus();
  ASSERT_TRUE(waitFor([&] { return m_window->explorer().hasFocus(); }));
  EXPECT_EQ(m_ide.vbe->windowSystem().GetFocus(), m_ide.vbe->projectWindow()->hWnd());
}

TEST_F(MainWindowTest, EditCommandsWorkOnTheFocusedEditor) {
  activate();
  QMdiSubWindow* sub = openCode(u"Loja"_qs, u"modPrincipal"_qs);
  ASSERT_NE(sub, nullptr);
  auto* code = qobject_cast<CodeWindow*>(sub->widget());
  code->editor()->setFocus();
  ASSERT_TRUE(waitFor([&] { return code->editor()->hasFocus(); }));
  auto module = component(u"Loja"_qs, u"modPrincipal"_qs)->codeModule();
  code->pane()->SetSelection(1, 1, 1, 7);  // "Option"
  m_window->commands().run(host::BuiltinCommand::Copy);
  code->pane()->SetSelection(2, 1, 2, 1);
  m_window->commands().run(host::BuiltinCommand::Paste);
  if (module->Lines(2, 1).isEmpty()) GTEST_SKIP() << "no clipboard on this platform";
  EXPECT_EQ(module->Lines(2, 1), u"Option"_qs);
  m_window->commands().run(host::BuiltinCommand::Undo);
  EXPECT_EQ(module->Lines(2, 1), QString());
  m_window->commands().run(host::BuiltinCommand::Redo);
  EXPECT_EQ(module->Lines(2, 1), u"Option"_qs);
}

// ---------------------------------------------------------------------------------------------------
// Hotkeys

/// A window procedure put in front of the code window's own, as an add-in does: it takes the hotkeys it
/// is told to and passes everything else on.
struct HotKeyHook {
  HotKeyHook(host::WindowSystemImpl& windows, ide::HWnd window, bool take)
      : windows(windows), window(window) {
    old = windows.GetWindowProc(window);
    windows.SetWindowProc(window,
                          std::make_shared<const ide::WndProc>(
                              [this, take](ide::HWnd h, unsigned message, quintptr wParam, qintptr lParam) {
                                if (message == ide::msg::HotKey) {
                                  received.push_back(static_cast<int>(wParam));
                                  if (take) return qintptr(0);
                                }
                                return this->windows.CallWindowProc(old, h, message, wParam, lParam);
                              }));
  }
  ~HotKeyHook() { windows.SetWindowProc(window, old); }
  host::WindowSystemImpl& windows;
  ide::HWnd window;
  ide::WndProcRef old;
  std::vector<int> received;
};

class HotKeys : public test::IdeTest {
 protected:
  void SetUp() override {
    IdeTest::SetUp();
    activate();
    QMdiSubWindow* sub = openCode(u"Loja"_qs, u"modPrincipal"_qs);
    ASSERT_NE(sub, nullptr);
    m_code = qobject_cast<CodeWindow*>(sub->widget());
    m_code->editor()->setFocus();
    ASSERT_TRUE(waitFor([&] { return m_code->editor()->hasFocus(); }));
    m_hwnd = m_code->window()->hWnd();
  }
  host::WindowSystemImpl& windows() { return m_ide.vbe->windowSystem(); }
  bool allSelected() const { return m_code->editor()->textCursor().selectedText().size() > 100; }

  CodeWindow* m_code = nullptr;
  ide::HWnd m_hwnd = 0;
};

TEST_F(HotKeys, ARegisteredHotKeyReachesTheProcedureAndNotTheEditor) {
  HotKeyHook hook(windows(), m_hwnd, true);
  ASSERT_TRUE(windows().RegisterHotKey(m_hwnd, 0xC101, ide::mod::Control | ide::mod::Alt, 'A'));
  const QString before = m_code->editor()->toPlainText();
  QTest::keyClick(m_code->editor(), Qt::Key_A, Qt::ControlModifier | Qt::AltModifier);
  EXPECT_EQ(hook.received, std::vector<int>{0xC101});
  EXPECT_EQ(m_code->editor()->toPlainText(), before);
}

TEST_F(HotKeys, AHotKeyTheChainPassesOnReachesTheEditor) {
  HotKeyHook hook(windows(), m_hwnd, false);
  ASSERT_TRUE(windows().RegisterHotKey(m_hwnd, 0xC102, ide::mod::Control, 'A'));
  QTest::keyClick(m_code->editor(), Qt::Key_A, Qt::ControlModifier);
  EXPECT_EQ(hook.received, std::vector<int>{0xC102});
  EXPECT_TRUE(allSelected()) << "Ctrl+A went on to the editor, which selected everything";
}

TEST_F(HotKeys, ARegisteredHotKeyGoesBeforeAMenuShortcut) {
  // Ctrl+R is the menu's Project Explorer shortcut, which moves the focus to the explorer.
  {
    HotKeyHook hook(windows(), m_hwnd, true);
    ASSERT_TRUE(windows().RegisterHotKey(m_hwnd, 0xC104, ide::mod::Control, 'R'));
    QTest::keyClick(m_code->editor(), Qt::Key_R, Qt::ControlModifier);
    settle();
    EXPECT_EQ(hook.received, std::vector<int>{0xC104});
    EXPECT_TRUE(m_code->editor()->hasFocus());
    windows().UnregisterHotKey(m_hwnd, 0xC104);
  }
  QTest::keyClick(m_code->editor(), Qt::Key_R, Qt::ControlModifier);
  ASSERT_TRUE(waitFor([&] { return m_window->explorer().hasFocus(); }));
}

TEST(MainWindowSettings, TheWindowRemembersItsGeometry) {
  QTemporaryDir dir;
  const QString settings = dir.filePath(u"quimbel-ide.ini"_qs);
  test::DesktopVbe first;
  {
    MainWindowOptions options;
    options.settingsPath = settings;
    MainWindow window(first.vbe, *first.ui, options);
    window.show();
    window.resize(900, 640);
    settle();
    window.close();
  }
  test::DesktopVbe second;
  MainWindowOptions options;
  options.settingsPath = settings;
  MainWindow window(second.vbe, *second.ui, options);
  window.restoreLayout();
  EXPECT_EQ(window.size(), QSize(900, 640));
}

// ---------------------------------------------------------------------------------------------------
// Mode and context menus

TEST_F(MainWindowTest, RunCommandsSwitchTheModeAndTheTitle) {
  auto run = [&](const QString& caption) {
    m_window->commandBars().syncNow();
    auto control = m_ide.vbe->commandBars()->bar(u"Run"_qs)->findControl(caption);
    ASSERT_TRUE(control);
    m_window->commandBars().click(control);
    settle();
  };
  QMdiSubWindow* sub = openCode(u"Loja"_qs, u"modPrincipal"_qs);
  ASSERT_NE(sub, nullptr);
  CodeEditor* editor = qobject_cast<CodeWindow*>(sub->widget())->editor();
  EXPECT_TRUE(m_window->windowTitle().endsWith(u"[design]"_qs));
  run(u"Start"_qs);
  EXPECT_EQ(m_ide.vbe->mode(), ide::IdeMode::Run);
  EXPECT_TRUE(m_window->windowTitle().endsWith(u"[run]"_qs));
  EXPECT_TRUE(editor->isReadOnly()) << "running code is not typed into";
  run(u"Break"_qs);
  EXPECT_EQ(m_ide.vbe->mode(), ide::IdeMode::Break);
  EXPECT_FALSE(editor->isReadOnly()) << "in break mode it is";
  EXPECT_EQ(m_window->codeWindowMenuName(), u"Code Window (Break)"_qs);
  run(u"End"_qs);
  EXPECT_EQ(m_ide.vbe->mode(), ide::IdeMode::Design);
  EXPECT_EQ(m_window->codeWindowMenuName(), u"Code Window"_qs);
}

TEST_F(MainWindowTest, TheTitleNamesTheActiveProject) {
  EXPECT_EQ(m_window->windowTitle(), u"Utilitarios - Quimbel IDE [design]"_qs);
  m_ide.vbe->setActiveVBProject(m_ide.vbe->project(u"Loja"_qs));
  settle();
  EXPECT_EQ(m_window->windowTitle(), u"Loja - Quimbel IDE [design]"_qs);
}

TEST_F(MainWindowTest, AContextMenuHoldsTheControlsOfItsBar) {
  auto bar = m_ide.vbe->commandBars()->bar(u"Code Window (Break)"_qs);
  QMenu menu;
  m_window->commandBars().fillMenu(&menu, bar);
  QStringList captions;
  for (QAction* action : menu.actions())
    if (!action->isSeparator()) captions << action->text();
  EXPECT_EQ(captions, (QStringList{u"Cu&t"_qs, u"&Copy"_qs, u"&Paste"_qs, u"Add &Watch..."_qs}));
  EXPECT_FALSE(menu.actions().last()->isEnabled());
}

// ---------------------------------------------------------------------------------------------------
// The IDE's windows

TEST_F(MainWindowTest, TheProjectWindowIsTitledByTheGroupAndTogglesItsFolders) {
  EXPECT_EQ(m_window->findChild<QDockWidget*>(u"projectDock"_qs)->windowTitle(), u"Project - Demo"_qs);
  EXPECT_EQ(m_window->statusBar()->currentMessage(), QString()) << "opened by the fixture, not the menu";
  ASSERT_TRUE(m_window->commands().open(m_copy.groupFile(), true));
  EXPECT_EQ(m_window->statusBar()->currentMessage(), u"Opened Demo.vbg"_qs)
      << "the file name, never its folder";
  settle();
  auto* window = m_window->findChild<ProjectWindow*>(u"projectWindow"_qs);
  ASSERT_TRUE(window);
  ProjectExplorer& explorer = m_window->explorer();
  // The buttons follow the selection: a module has code only, a form both.
  explorer.setCurrentItem(explorer.itemOf(component(u"Loja"_qs, u"modPrincipal"_qs).get()));
  EXPECT_TRUE(window->viewCode()->isEnabled());
  EXPECT_FALSE(window->viewObject()->isEnabled());
  explorer.setCurrentItem(explorer.itemOf(component(u"Loja"_qs, u"frmSobre"_qs).get()));
  EXPECT_TRUE(window->viewObject()->isEnabled());
  window->viewObject()->trigger();
  settle();
  ASSERT_TRUE(m_window->windows().activeDesigner());
  // Without folders the components stand under their project, by name.
  window->toggleFolders()->trigger();
  QTreeWidgetItem* loja = explorer.topLevelItem(0);
  EXPECT_EQ(loja->child(0)->childCount(), 0) << "no folder";
  for (int i = 1; i < loja->childCount(); ++i)
    EXPECT_LT(loja->child(i - 1)->text(0).compare(loja->child(i)->text(0), Qt::CaseInsensitive), 0);
  window->toggleFolders()->trigger();
  EXPECT_EQ(explorer.topLevelItem(0)->child(0)->text(0), u"Forms"_qs);
  // The first project stays in view while the selected item leaves room for it.
  m_window->show();
  explorer.setCurrentItem(explorer.itemOf(component(u"Loja"_qs, u"ctlPainel"_qs).get()));
  explorer.refresh();
  EXPECT_EQ(explorer.visualItemRect(explorer.topLevelItem(0)).isValid(),
            explorer.visualItemRect(explorer.currentItem()).bottom() < explorer.viewport()->height());
}

TEST_F(MainWindowTest, ThePropertiesWindowHasItsObjectBoxTabsAndDescription) {
  auto form = component(u"Loja"_qs, u"frmSobre"_qs);
  m_ide.vbe->activateWindow(form->designerWindow());
  settle();
  PropertiesView& properties = m_window->properties();
  QComboBox* objects = properties.objectBox();
  ASSERT_GT(objects->count(), 3);
  EXPECT_EQ(objects->itemText(0), u"frmSobre Form"_qs);
  EXPECT_EQ(objects->currentIndex(), 0);
  for (int i = 2; i < objects->count(); ++i)
    EXPECT_LT(objects->itemText(i - 1).compare(objects->itemText(i), Qt::CaseInsensitive), 0);
  // Choosing a control in the box selects it in the designer.
  const int ok = objects->findText(u"cmdOk CommandButton"_qs);
  ASSERT_GE(ok, 0);
  Q_EMIT objects->activated(ok);
  settle();
  EXPECT_EQ(m_window->windows().activeDesigner()->selectedControl()->name(), u"cmdOk"_qs);
  EXPECT_EQ(properties.shownValue(u"Caption"_qs), u"OK"_qs.left(properties.shownValue(u"Caption"_qs).size()));

  // Categorized: each category's title row, then its properties; the values are those of the Alphabetic tab.
  const QString caption = properties.shownValue(u"Caption"_qs);
  properties.tabs()->setCurrentIndex(1);
  QTableWidget* grid = properties.table();
  QStringList categories;
  for (int row = 0; row < grid->rowCount(); ++row)
    if (grid->columnSpan(row, 0) == 2) categories << grid->item(row, 0)->text();
  EXPECT_TRUE(categories.contains(u"Appearance"_qs) && categories.contains(u"Position"_qs))
      << categories.join(u',').toStdString();
  EXPECT_EQ(properties.shownValue(u"Caption"_qs), caption);
  // The description pane names the current property and says what it is.
  for (int row = 0; row < grid->rowCount(); ++row)
    if (grid->item(row, 0)->text() == u"Caption"_qs) grid->setCurrentCell(row, 1);
  EXPECT_TRUE(properties.description()->text().contains(u"<b>Caption</b>"_qs));
  EXPECT_GT(properties.description()->text().size(), 30);
  properties.tabs()->setCurrentIndex(0);
  EXPECT_EQ(grid->item(0, 0)->text(), u"(Name)"_qs);
}

TEST_F(MainWindowTest, CodeWindowsPartProceduresAndShowOneInProcedureView) {
  QMdiSubWindow* sub = openCode(u"Loja"_qs, u"modPrincipal"_qs);
  ASSERT_TRUE(sub);
  auto* code = qobject_cast<CodeWindow*>(sub->widget());
  ASSERT_TRUE(code);
  auto module = component(u"Loja"_qs, u"modPrincipal"_qs)->codeModule();
  // A separator above each procedure: at the line where its extent starts.
  std::vector<int> starts;
  for (const auto& procedure : module->text().procedures())
    starts.push_back(module->ProcStartLine(procedure.name, procedure.kind));
  EXPECT_EQ(code->editor()->separators(), starts);
  EXPECT_TRUE(code->fullModuleViewButton()->isChecked());
  // Procedure view shows the lines of the procedure at the caret only.
  const auto& main = module->text().procedures().front();
  const int start = module->ProcStartLine(main.name, main.kind);
  module->pane()->SetSelection(start + 1, 1, start + 1, 1);
  code->procedureViewButton()->click();
  settle();
  EXPECT_EQ(code->editor()->shownLines(),
            std::pair(start, start + module->ProcCountLines(main.name, main.kind) - 1));
  QTextDocument* document = code->editor()->document();
  EXPECT_FALSE(document->findBlockByNumber(start - 2).isVisible());
  EXPECT_TRUE(document->findBlockByNumber(start).isVisible());
  code->fullModuleViewButton()->click();
  EXPECT_TRUE(document->findBlockByNumber(start - 2).isVisible());
  // The Immediate window is there, empty, in the code font.
  ASSERT_TRUE(m_window->immediate());
  EXPECT_TRUE(m_window->immediate()->toPlainText().isEmpty());
}

}  // namespace
}  // namespace desktop

// SPDX-License-Identifier: MIT
// Subclassing, the hotkey procedure's routing, and the procedure following the focus between code windows
// and other windows, through the timer and the component events.
#include "addin/hotkeys.h"
#include "addin/subclass.h"
#include "addinfixture.h"
#include "host/model/objects.h"

#include <gtest/gtest.h>

namespace addin::test {
namespace {

constexpr unsigned kCtrl = ide::mod::Control;
constexpr unsigned kAlt = ide::mod::Alt;
constexpr unsigned kShift = ide::mod::Shift;

TEST(HotKeyRouting, DigitsWithCtrlOrCtrlShiftGoToTheCopyBuffers) {
  for (unsigned key = '0'; key <= '9'; ++key) {
    EXPECT_EQ(routeHotKey(key, kCtrl), HotKeyRoute::CopyBuffers) << key;
    EXPECT_EQ(routeHotKey(key, kCtrl | kShift), HotKeyRoute::CopyBuffers) << key;
    EXPECT_EQ(routeHotKey(key, kCtrl | kAlt), HotKeyRoute::PassOn) << key;
    EXPECT_EQ(routeHotKey(key, kShift), HotKeyRoute::PassOn) << key;
    EXPECT_EQ(routeHotKey(key, kCtrl | kAlt | kShift), HotKeyRoute::PassOn) << key;
  }
}

TEST(HotKeyRouting, LettersGoToTheMacrosExceptTheEditorsOwnCombinations) {
  const QString ctrlAltExcluded = u"ICJVX"_qs;
  const QString ctrlShiftExcluded = u"FCIJVX"_qs;
  for (char letter = 'A'; letter <= 'Z'; ++letter) {
    const auto key = static_cast<unsigned>(letter);
    EXPECT_EQ(routeHotKey(key, kCtrl | kAlt),
              ctrlAltExcluded.contains(QChar(letter)) ? HotKeyRoute::PassOn : HotKeyRoute::Macros)
        << letter;
    EXPECT_EQ(routeHotKey(key, kCtrl | kShift),
              ctrlShiftExcluded.contains(QChar(letter)) ? HotKeyRoute::PassOn : HotKeyRoute::Macros)
        << letter;
    EXPECT_EQ(routeHotKey(key, kCtrl), HotKeyRoute::PassOn) << letter;
    EXPECT_EQ(routeHotKey(key, kAlt | kShift), HotKeyRoute::PassOn) << letter;
  }
  // Ctrl+Alt+F is a macro; Ctrl+Shift+F is the editor's.
  EXPECT_EQ(routeHotKey('F', kCtrl | kAlt), HotKeyRoute::Macros);
  EXPECT_EQ(routeHotKey('F', kCtrl | kShift), HotKeyRoute::PassOn);
  // Keys that are neither digits nor letters.
  EXPECT_EQ(routeHotKey(0x70 /* F1 */, kCtrl), HotKeyRoute::PassOn);
  EXPECT_EQ(routeHotKey('a', kCtrl | kAlt), HotKeyRoute::PassOn);
}

TEST(Subclassing, TheOldProcedureIsKeptOnTheWindowAndPutBack) {
  auto vbe = host::VbeImpl::create();
  auto& windows = vbe->windowSystem();
  const ide::HWnd main = vbe->MainWindow()->hWnd();
  const ide::WndProcRef original = windows.GetWindowProc(main);
  QStringList seen;
  auto proc = std::make_shared<const ide::WndProc>([&](ide::HWnd w, unsigned m, quintptr wp, qintptr lp) {
    seen << QString::number(m);
    return callOldWindowProc(windows, w, m, wp, lp);
  });
  int object = 7;
  EXPECT_TRUE(SubClass(windows, main, proc, &object));
  EXPECT_EQ(windows.GetWindowProc(main), proc);
  EXPECT_EQ(std::any_cast<ide::WndProcRef>(windows.GetProp(main, u"OldWndProc"_qs)), original);
  EXPECT_EQ(std::any_cast<int*>(windows.GetProp(main, u"ObjectPtr"_qs)), &object);
  windows.SendMessage(main, ide::msg::User, 0, 0);
  EXPECT_EQ(seen, QStringList{QString::number(ide::msg::User)});

  // A second subclassing of the same window changes nothing and reports success.
  auto other = std::make_shared<const ide::WndProc>([](ide::HWnd, unsigned, quintptr, qintptr) { return 0; });
  EXPECT_EQ(subClassWindow(windows, main, other), SubClassResult::AlreadySubclassed);
  EXPECT_TRUE(SubClass(windows, main, other));
  EXPECT_EQ(windows.GetWindowProc(main), proc);
  EXPECT_EQ(SubclassedWindow::install(windows, main, other), nullptr);

  EXPECT_TRUE(UnSubClass(windows, main));
  EXPECT_EQ(windows.GetWindowProc(main), original);
  EXPECT_FALSE(windows.GetProp(main, u"OldWndProc"_qs).has_value());
  EXPECT_FALSE(windows.GetProp(main, u"ObjectPtr"_qs).has_value());
  EXPECT_FALSE(UnSubClass(windows, main)) << "nothing left to put back";
  EXPECT_FALSE(SubClass(windows, 0x1, proc)) << "no such window";

  {
    auto scoped = SubclassedWindow::install(windows, main, proc);
    ASSERT_NE(scoped, nullptr);
    EXPECT_EQ(windows.GetWindowProc(main), proc);
  }
  EXPECT_EQ(windows.GetWindowProc(main), original);
}

/// An IDE with two code windows and the hotkey procedure's keeper, with recording clients.
struct HotKeyIde {
  static std::shared_ptr<host::VbeImpl> makeVbe(ide::DisplayModel model) {
    host::IdeOptions options;
    options.displayModel = model;
    return host::VbeImpl::create(std::move(options));
  }
  explicit HotKeyIde(ide::DisplayModel model = ide::DisplayModel::MDI) : vbe(makeVbe(model)) {
    auto project = vbe->newProject();
    one = addModule(project, u"modUm"_qs, 1, 10);
    two = addModule(project, u"modDois"_qs, 1, 10);
    keeper = std::make_unique<HotKeyWindow>(*vbe, model, &copyBuffers, &macros, [this] { ++destroyed; });
  }
  ide::HWnd show(const std::shared_ptr<host::ComponentImpl>& component) {
    showAt(component, 1);
    return component->CodeModule()->CodePane()->Window()->hWnd();
  }
  host::WindowSystemImpl& windows() { return vbe->windowSystem(); }

  std::shared_ptr<host::VbeImpl> vbe;
  std::shared_ptr<host::ComponentImpl> one;
  std::shared_ptr<host::ComponentImpl> two;
  RecordingHotKeyClient copyBuffers{
      vbe->windowSystem(), u"copy"_qs, {{1, kCtrl, '1'}, {2, kCtrl | kShift, '2'}}};
  RecordingHotKeyClient macros{vbe->windowSystem(),
                               u"macro"_qs,
                               {{10, kCtrl | kAlt, 'A'}, {11, kCtrl | kShift, 'B'}, {12, kCtrl | kAlt, 'C'}}};
  std::unique_ptr<HotKeyWindow> keeper;
  int destroyed = 0;
};

TEST(HotKeyWindow, TheProcedureAndTheHotKeysFollowTheFocusInAndOutOfCodeWindows) {
  HotKeyIde ide;
  ide.keeper->followFocus();
  EXPECT_EQ(ide.keeper->SubclassedWnd(), 0u) << "no code window";

  const ide::HWnd first = ide.show(ide.one);
  ide.keeper->followFocus();
  EXPECT_EQ(ide.keeper->SubclassedWnd(), first);
  EXPECT_TRUE(ide.keeper->IsSubclassed());
  EXPECT_EQ(ide.windows().GetWindowProc(first), ide.keeper->OwnProcAddress());
  EXPECT_EQ(ide.copyBuffers.registeredOn, first);
  EXPECT_EQ(ide.macros.registeredOn, first);
  EXPECT_EQ(ide.windows().hotKeyCount(first), 5);

  // Into the properties window: everything off; back: on again.
  ide.windows().setFocus(ide.vbe->propertiesWindow()->hWnd());
  ide.keeper->followFocus();
  EXPECT_EQ(ide.keeper->SubclassedWnd(), 0u);
  EXPECT_EQ(ide.windows().hotKeyCount(first), 0);
  EXPECT_NE(ide.windows().GetWindowProc(first), ide.keeper->OwnProcAddress());
  EXPECT_FALSE(ide.windows().GetProp(first, u"OldWndProc"_qs).has_value());
  EXPECT_TRUE(ide.keeper->IsSubclassed()) << "cleared only when the window is destroyed";
  ide.windows().setFocus(first);
  ide.keeper->followFocus();
  EXPECT_EQ(ide.keeper->SubclassedWnd(), first);
  EXPECT_EQ(ide.windows().hotKeyCount(first), 5);

  // Another code window.
  const ide::HWnd second = ide.show(ide.two);
  ide.keeper->followFocus();
  EXPECT_EQ(ide.keeper->SubclassedWnd(), second);
  EXPECT_EQ(ide.windows().hotKeyCount(first), 0);
  EXPECT_EQ(ide.windows().hotKeyCount(second), 5);
  EXPECT_EQ(ide.copyBuffers.log, (QStringList{u"copy register"_qs, u"copy unregister"_qs, u"copy register"_qs,
                                              u"copy unregister"_qs, u"copy register"_qs}));

  // A focused window that is not the active code pane's gets nothing.
  ide.windows().setFocus(first);
  ide.keeper->followFocus();
  EXPECT_EQ(ide.keeper->SubclassedWnd(), 0u);
  EXPECT_EQ(ide.windows().hotKeyCount(first), 0);
}

TEST(HotKeyWindow, HotKeysReachTheirClientsAndTheEditorsCombinationsGoOn) {
  HotKeyIde ide;
  const ide::HWnd window = ide.show(ide.one);
  ide.keeper->followFocus();
  EXPECT_TRUE(ide.windows().deliverHotKey(window, kCtrl, '1'));
  EXPECT_TRUE(ide.windows().deliverHotKey(window, kCtrl | kShift, '2'));
  EXPECT_TRUE(ide.windows().deliverHotKey(window, kCtrl | kAlt, 'A'));
  EXPECT_TRUE(ide.windows().deliverHotKey(window, kCtrl | kShift, 'B'));
  // Registered, but Ctrl+Alt+C is the editor's: the window's own procedure gets it.
  EXPECT_FALSE(ide.windows().deliverHotKey(window, kCtrl | kAlt, 'C'));
  EXPECT_EQ(ide.copyBuffers.log.filter(u"hotkey"_qs),
            (QStringList{u"copy hotkey 1"_qs, u"copy hotkey 2"_qs}));
  EXPECT_EQ(ide.macros.log.filter(u"hotkey"_qs), (QStringList{u"macro hotkey 10"_qs, u"macro hotkey 11"_qs}));
}

TEST(HotKeyWindow, ClosingTheCarryingCodeWindowUnregistersTheHotKeys) {
  HotKeyIde ide;
  const ide::HWnd window = ide.show(ide.one);
  ide.keeper->followFocus();
  ASSERT_EQ(ide.keeper->SubclassedWnd(), window);
  ide.one->CodeModule()->CodePane()->Window()->Close();
  EXPECT_EQ(ide.keeper->SubclassedWnd(), 0u);
  EXPECT_FALSE(ide.keeper->IsSubclassed());
  EXPECT_EQ(ide.destroyed, 1);
  EXPECT_EQ(ide.copyBuffers.registeredOn, 0u);
  EXPECT_EQ(ide.macros.registeredOn, 0u);
  EXPECT_EQ(ide.copyBuffers.log.back(), u"copy unregister"_qs);
}

TEST(HotKeyWindow, TheComponentRuleMovesTheProcedureOntoTheFocusedCodeWindowOrTakesItOff) {
  HotKeyIde ide;
  const ide::HWnd first = ide.show(ide.one);
  ide.keeper->moveToFocusedCodeWindow();
  EXPECT_EQ(ide.keeper->SubclassedWnd(), first);
  // Always moved, even onto the same window: unregistered first.
  ide.keeper->moveToFocusedCodeWindow();
  EXPECT_EQ(ide.keeper->SubclassedWnd(), first);
  EXPECT_EQ(ide.macros.log,
            (QStringList{u"macro register"_qs, u"macro unregister"_qs, u"macro register"_qs}));
  ide.windows().setFocus(ide.vbe->projectWindow()->hWnd());
  ide.keeper->moveToFocusedCodeWindow();
  EXPECT_EQ(ide.keeper->SubclassedWnd(), 0u);
  EXPECT_EQ(ide.windows().hotKeyCount(first), 0);
}

TEST(HotKeyWindow, InSdiDisplayCodeWindowsAreFoundAtTheTopLevel) {
  HotKeyIde ide(ide::DisplayModel::SDI);
  const ide::HWnd window = ide.show(ide.two);
  EXPECT_EQ(FindActiveCodeWindow(*ide.vbe, ide::DisplayModel::SDI), window);
  // Searched as MDI, the window is not among the MDI client's children.
  EXPECT_EQ(FindActiveCodeWindow(*ide.vbe, ide::DisplayModel::MDI), 0u);
  ide.keeper->followFocus();
  EXPECT_EQ(ide.keeper->SubclassedWnd(), window);
}

TEST(HotKeyWindow, TheAddInsTimerAndComponentEventsKeepTheProcedureOnTheFocusedCodeWindow) {
  AddInEnvironment environment;
  LinkedAddIn addIn;
  RecordingHotKeyClient copyBuffers{addIn.vbe->windowSystem(), u"copy"_qs, {{1, kCtrl, '1'}}};
  RecordingHotKeyClient macros{addIn.vbe->windowSystem(), u"macro"_qs, {{10, kCtrl | kAlt, 'A'}}};
  addIn.copyBuffers = &copyBuffers;
  addIn.macros = &macros;
  addIn.connect();
  auto project = addIn.vbe->newProject();
  auto one = addModule(project, u"modUm"_qs, 1, 10);
  addIn.loop().DoEvents();
  const ide::HWnd window = showAt(one, 1)->Window()->hWnd();
  auto& keeper = addIn.globals().hotKeyWindow();
  EXPECT_EQ(keeper.SubclassedWnd(), 0u) << "the component events arrive before the window has the focus";
  addIn.loop().advance(100);
  EXPECT_EQ(keeper.SubclassedWnd(), window);
  EXPECT_TRUE(addIn.vbe->windowSystem().deliverHotKey(window, kCtrl, '1'));
  EXPECT_EQ(copyBuffers.log.back(), u"copy hotkey 1"_qs);

  addIn.vbe->activateWindow(addIn.vbe->propertiesWindow());
  addIn.loop().advance(100);
  EXPECT_EQ(keeper.SubclassedWnd(), 0u);
  EXPECT_EQ(addIn.vbe->windowSystem().hotKeyCount(window), 0);

  // Selecting the module (the focus still on its window) moves the procedure at once.
  addIn.vbe->windowSystem().setFocus(window);
  addIn.vbe->selectComponent(nullptr);
  addIn.vbe->selectComponent(one);
  EXPECT_EQ(keeper.SubclassedWnd(), window);

  // Unloading takes the procedure off and unregisters before the clients go.
  addIn.disconnect();
  EXPECT_EQ(addIn.vbe->windowSystem().hotKeyCount(window), 0);
  EXPECT_FALSE(addIn.vbe->windowSystem().GetProp(window, u"OldWndProc"_qs).has_value());
  EXPECT_EQ(macros.log.back(), u"macro unregister"_qs);
}

}  // namespace
}  // namespace addin::test

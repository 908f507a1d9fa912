// SPDX-License-Identifier: MIT
// The IDE's platform on Qt (the loop's timers and posted work, message boxes answered by a person or by a
// script), the virtual keys of key presses, and the model's hooks that the desktop host follows.
#include "idefixture.h"
#include "keys.h"
#include "qtplatform.h"

#include <gtest/gtest.h>

#include <QApplication>
#include <QKeyEvent>
#include <QMessageBox>
#include <QPushButton>
#include <QTimer>

namespace desktop {
namespace {

using test::settle;
using test::waitFor;

TEST(QtLoop, TimersFireUntilKilledEvenFromTheirOwnCallback) {
  QtEventLoop loop;
  int ticks = 0;
  int id = 0;
  id = loop.SetTimer(5, [&] {
    if (++ticks == 3) loop.KillTimer(id);
  });
  ASSERT_NE(id, 0);
  EXPECT_EQ(loop.activeTimers(), 1);
  ASSERT_TRUE(waitFor([&] { return ticks == 3; }));
  EXPECT_EQ(loop.activeTimers(), 0);
  test::waitFor([] { return false; }, 60);
  EXPECT_EQ(ticks, 3);
  EXPECT_FALSE(loop.KillTimer(id));
}

TEST(QtLoop, PostedWorkRunsLaterInOrder) {
  QtEventLoop loop;
  QStringList order;
  loop.post([&] { order << u"one"_qs; });
  loop.post([&] { order << u"two"_qs; });
  EXPECT_TRUE(order.isEmpty());
  loop.DoEvents();
  EXPECT_EQ(order, (QStringList{u"one"_qs, u"two"_qs}));
}

TEST(QtLoop, AThrowingCallbackDoesNotStopTheLoop) {
  QtEventLoop loop;
  bool after = false;
  loop.post([] { throw ide::Error(5, u"boom"_qs); });
  loop.post([&] { after = true; });
  settle();
  EXPECT_TRUE(after);
}

TEST(QtUi, AQueuedAnswerIsGivenWithoutShowingTheBox) {
  QtUserInterface ui;
  QStringList seen;
  ui.setMessageObserver([&](const QString& title, const QString& text) { seen << title + u'|' + text; });
  ui.queueAnswer(ide::mb::No);
  EXPECT_EQ(ui.MsgBox(u"Salvar?"_qs, ide::mb::YesNo, u"Quimbel"_qs), ide::mb::No);
  EXPECT_EQ(seen, QStringList{u"Quimbel|Salvar?"_qs});
  EXPECT_EQ(QApplication::activeModalWidget(), nullptr);
}

TEST(QtUi, AShownBoxReturnsTheButtonClicked) {
  QtUserInterface ui;
  QWidget parent;
  ui.setDialogParent(&parent);
  EXPECT_EQ(ui.dialogParent(), &parent);
  QString shownText;
  QTimer::singleShot(0, [&] {
    ASSERT_TRUE(waitFor([] { return QApplication::activeModalWidget() != nullptr; }));
    auto* box = qobject_cast<QMessageBox*>(QApplication::activeModalWidget());
    ASSERT_NE(box, nullptr);
    shownText = box->text();
    EXPECT_EQ(box->parentWidget(), &parent);
    box->button(QMessageBox::Retry)->click();
  });
  EXPECT_EQ(ui.MsgBox(u"Tentar de novo?"_qs, ide::mb::RetryCancel | ide::mb::Critical, {}), ide::mb::Retry);
  EXPECT_EQ(shownText, u"Tentar de novo?"_qs);
}

TEST(QtUi, TheCursorReturnsTheOneItReplaced) {
  QtUserInterface ui;
  EXPECT_EQ(ui.setCursor(ide::Cursor::Hourglass), ide::Cursor::Default);
  EXPECT_EQ(ui.setCursor(ide::Cursor::ArrowHourglass), ide::Cursor::Hourglass);
  EXPECT_EQ(ui.setCursor(ide::Cursor::Default), ide::Cursor::ArrowHourglass);
  EXPECT_EQ(QApplication::overrideCursor(), nullptr);
}

TEST(VirtualKeys, KeysMapToTheirWin32Codes) {
  const VirtualKey ctrlAltA = virtualKeyOf(Qt::Key_A, Qt::ControlModifier | Qt::AltModifier);
  EXPECT_EQ(ctrlAltA.modifiers, ide::mod::Control | ide::mod::Alt);
  EXPECT_EQ(ctrlAltA.key, 0x41u);
  EXPECT_EQ(virtualKeyOf(Qt::Key_7, Qt::ControlModifier).key, 0x37u);
  EXPECT_EQ(virtualKeyOf(Qt::Key_F5, {}).key, 0x74u);
  EXPECT_EQ(virtualKeyOf(Qt::Key_Comma, {}).key, 0xBCu);
  const VirtualKey shifted = virtualKeyOf(Qt::Key_ParenRight, Qt::ControlModifier | Qt::ShiftModifier);
  EXPECT_EQ(shifted.key, 0x30u) << "Shift+0 is typed as ')'";
  EXPECT_EQ(shifted.modifiers, ide::mod::Control | ide::mod::Shift);
  EXPECT_EQ(virtualKeyOf(Qt::Key_Shift, Qt::ShiftModifier).key, 0u);
}

TEST(VirtualKeys, TheDigitKeysAreToldByTheKeyWhateverTheLayoutTypesOnThem) {
  constexpr Qt::KeyboardModifiers kCtrlShift = Qt::ControlModifier | Qt::ShiftModifier;
  const struct {
    const char* what;
    int qtKey;
    Qt::KeyboardModifiers modifiers;
    quint32 scanCode;
    quint32 nativeKey;
    NativeKeyCodes codes;
    unsigned vk;
  } kCases[] = {
      {"US, Shift+1", Qt::Key_Exclam, kCtrlShift, 10, 0x21, NativeKeyCodes::Xkb, '1'},
      {"Brazilian, Shift+6 is a dead key", Qt::Key_Dead_Diaeresis, kCtrlShift, 15, 0xFE57,
       NativeKeyCodes::Xkb, '6'},
      {"German, Shift+3", Qt::Key_section, kCtrlShift, 12, 0xA7, NativeKeyCodes::Xkb, '3'},
      {"German, Shift+0", Qt::Key_Equal, kCtrlShift, 19, 0x3D, NativeKeyCodes::Xkb, '0'},
      {"German, '*' on the '+' key", Qt::Key_Asterisk, kCtrlShift, 35, 0x2A, NativeKeyCodes::Xkb, 0},
      {"French, the 1 key types '&'", Qt::Key_Ampersand, Qt::ControlModifier, 10, 0x26, NativeKeyCodes::Xkb,
       '1'},
      {"the keypad's 0", Qt::Key_0, Qt::ControlModifier | Qt::KeypadModifier, 90, 0xFFB0, NativeKeyCodes::Xkb,
       0},
      {"Windows, UK Shift+2", Qt::Key_QuoteDbl, kCtrlShift, 3, '2', NativeKeyCodes::Windows, '2'},
      {"no native codes", Qt::Key_Exclam, kCtrlShift, 0, 0, NativeKeyCodes::None, '1'},
  };
  for (const auto& c : kCases) {
    const QKeyEvent event(QEvent::KeyPress, c.qtKey, c.modifiers, c.scanCode, c.nativeKey, 0);
    const VirtualKey key = virtualKeyOf(event, c.codes);
    EXPECT_EQ(key.key, c.vk) << c.what;
    EXPECT_EQ(key.modifiers, virtualKeyOf(c.qtKey, c.modifiers).modifiers) << c.what;
  }
}

// The model's hooks for the desktop host, on the headless model.
TEST(ModelHooks, WindowsTellWhenTheyOpenAndAreActivated) {
  host::test::ExampleCopy copy;
  auto vbe = host::VbeImpl::create();
  vbe->open(copy.groupFile());
  QStringList log;
  auto opened =
      vbe->childWindowOpened.connect([&](host::WindowImpl* w) { log << u"opened "_qs + w->Caption(); });
  auto activated =
      vbe->windowActivated.connect([&](host::WindowImpl* w) { log << u"active "_qs + w->Caption(); });
  auto pane = vbe->project(u"Loja"_qs)->component(u"modPrincipal"_qs)->codeModule()->pane();
  pane->Show();
  pane->Show();
  EXPECT_EQ(log,
            (QStringList{u"opened Loja - modPrincipal (Code)"_qs, u"active Loja - modPrincipal (Code)"_qs,
                         u"active Loja - modPrincipal (Code)"_qs}));
}

TEST(ModelHooks, TheWindowSystemTellsWhichHotKeysAWindowHolds) {
  auto vbe = host::VbeImpl::create();
  auto& windows = vbe->windowSystem();
  const ide::HWnd main = vbe->mainWindow()->hWnd();
  ASSERT_TRUE(windows.RegisterHotKey(main, 7, ide::mod::Control | ide::mod::Shift, 'K'));
  EXPECT_TRUE(windows.hasHotKey(main, ide::mod::Control | ide::mod::Shift, 'K'));
  EXPECT_FALSE(windows.hasHotKey(main, ide::mod::Control, 'K'));
  EXPECT_FALSE(windows.hasHotKey(vbe->projectWindow()->hWnd(), ide::mod::Control | ide::mod::Shift, 'K'));
  windows.UnregisterHotKey(main, 7);
  EXPECT_FALSE(windows.hasHotKey(main, ide::mod::Control | ide::mod::Shift, 'K'));
}

}  // namespace
}  // namespace desktop

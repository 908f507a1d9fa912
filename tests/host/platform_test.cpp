// SPDX-License-Identifier: MIT
// The headless IDE's platform: its clock and loop, its window system and its message boxes.
#include "host/platform/headlessui.h"
#include "host/platform/manualloop.h"
#include "host/platform/windowsystem.h"

#include "printers.h"

#include <gtest/gtest.h>

#include <QStringList>

namespace host {
namespace {

TEST(ManualEventLoop, TimersFireAsOftenAsTheClockMovesWarrants) {
  ManualEventLoop loop;
  QStringList fired;
  const int fast = loop.SetTimer(100, [&] { fired << u"100@"_qs + QString::number(loop.tickCount()); });
  loop.SetTimer(250, [&] { fired << u"250@"_qs + QString::number(loop.tickCount()); });
  loop.advance(99);
  EXPECT_TRUE(fired.isEmpty());
  loop.advance(401);
  const QStringList expected = {
      u"100@100"_qs, u"100@200"_qs, u"250@250"_qs, u"100@300"_qs,
      u"100@400"_qs, u"100@500"_qs, u"250@500"_qs};  // timers due together fire in the order they were set
  EXPECT_EQ(fired, expected);
  EXPECT_TRUE(loop.KillTimer(fast));
  EXPECT_FALSE(loop.KillTimer(fast));
  EXPECT_EQ(loop.activeTimers(), 1);
  EXPECT_EQ(loop.SetTimer(0, [] {}), 0);
}

TEST(ManualEventLoop, PostedWorkRunsLaterAndATimerMayKillItself) {
  ManualEventLoop loop;
  QStringList order;
  int id = 0;
  id = loop.SetTimer(10, [&] {
    order << u"tick"_qs;
    loop.post([&] { order << u"posted by tick"_qs; });
    loop.KillTimer(id);
  });
  loop.post([&] { order << u"first"_qs; });
  order << u"before"_qs;
  loop.DoEvents();
  loop.advance(100);
  const QStringList expected = {u"before"_qs, u"first"_qs, u"tick"_qs, u"posted by tick"_qs};
  EXPECT_EQ(order, expected);
}

class WindowSystemTest : public ::testing::Test {
 protected:
  ManualEventLoop loop;
  WindowSystemImpl windows{loop};
  QStringList ownMessages;

  ide::HWnd makeWindow(const QString& className, const QString& caption, ide::HWnd parent = 0) {
    return windows.createWindow(
        className, [caption] { return caption; }, parent,
        [this, caption](ide::HWnd, unsigned message, quintptr, qintptr) -> qintptr {
          ownMessages << u"%1:%2"_qs.arg(caption).arg(message, 0, 16);
          return 7;
        });
  }
};

TEST_F(WindowSystemTest, ProceduresChainAndCanBeRestored) {
  const ide::HWnd w = makeWindow(u"VbaWindow"_qs, u"code"_qs);
  QStringList hooked;
  ide::WndProcRef old;
  const auto hook =
      std::make_shared<const ide::WndProc>([&](ide::HWnd h, unsigned m, quintptr wp, qintptr lp) -> qintptr {
        hooked << QString::number(m);
        if (m == 0x500) return 1;  // handled here
        return windows.CallWindowProc(old, h, m, wp, lp);
      });
  old = windows.SetWindowProc(w, hook);
  ASSERT_TRUE(old);
  EXPECT_EQ(windows.GetWindowProc(w), hook);
  EXPECT_EQ(windows.SendMessage(w, 0x500, 0, 0), 1);
  EXPECT_EQ(windows.SendMessage(w, 0x501, 0, 0), 7);
  EXPECT_EQ(hooked, (QStringList{u"1280"_qs, u"1281"_qs}));
  EXPECT_EQ(ownMessages, QStringList{u"code:501"_qs});
  EXPECT_EQ(windows.SetWindowProc(w, old), hook);
  windows.SendMessage(w, 0x502, 0, 0);
  EXPECT_EQ(hooked.size(), 2);
  EXPECT_FALSE(windows.SetWindowProc(0x1, old));
}

TEST_F(WindowSystemTest, HotKeysReachTheFocusedWindowsProcedures) {
  const ide::HWnd code = makeWindow(u"VbaWindow"_qs, u"code"_qs);
  const ide::HWnd other = makeWindow(u"PROJECT"_qs, u"project"_qs);
  ASSERT_TRUE(windows.RegisterHotKey(code, 42, ide::mod::Control | ide::mod::Alt, 'A'));
  EXPECT_FALSE(windows.RegisterHotKey(other, 43, ide::mod::Control | ide::mod::Alt, 'A'));  // taken
  QStringList seen;
  ide::WndProcRef old;
  old = windows.SetWindowProc(code, std::make_shared<const ide::WndProc>(
                                        [&](ide::HWnd h, unsigned m, quintptr wp, qintptr lp) -> qintptr {
                                          if (m == ide::msg::HotKey) {
                                            seen << u"%1 %2"_qs.arg(wp).arg(lp, 0, 16);
                                            if (wp == 42) return 0;
                                          }
                                          return windows.CallWindowProc(old, h, m, wp, lp);
                                        }));
  // Not focused: nothing arrives and the key is the editor's.
  EXPECT_FALSE(windows.deliverHotKey(code, ide::mod::Control | ide::mod::Alt, 'A'));
  windows.setFocus(code);
  EXPECT_TRUE(windows.deliverHotKey(code, ide::mod::Control | ide::mod::Alt, 'A'));
  EXPECT_EQ(seen, QStringList{u"42 410003"_qs});
  // A registered hotkey that the hook passes on reaches the window's own procedure: not taken.
  ASSERT_TRUE(windows.RegisterHotKey(code, 44, ide::mod::Control | ide::mod::Shift, 'C'));
  EXPECT_FALSE(windows.deliverHotKey(code, ide::mod::Control | ide::mod::Shift, 'C'));
  EXPECT_FALSE(windows.deliverHotKey(code, ide::mod::Control, 'Z'));  // nobody registered it
  EXPECT_EQ(windows.hotKeyCount(code), 2);
  EXPECT_TRUE(windows.UnregisterHotKey(code, 42));
  EXPECT_FALSE(windows.deliverHotKey(code, ide::mod::Control | ide::mod::Alt, 'A'));
  windows.destroyWindow(code);
  EXPECT_EQ(windows.hotKeyCount(code), 0);
  EXPECT_EQ(windows.GetFocus(), 0u);
}

TEST_F(WindowSystemTest, FocusMessagesPropertiesAndFinding) {
  const ide::HWnd main = makeWindow(u"Main"_qs, u"main"_qs);
  const ide::HWnd client = makeWindow(u"MDIClient"_qs, QString(), main);
  const ide::HWnd a = makeWindow(u"VbaWindow"_qs, u"P - A (Code)"_qs, client);
  const ide::HWnd b = makeWindow(u"VbaWindow"_qs, u"P - B (Code)"_qs, client);
  EXPECT_EQ(windows.FindWindowEx(main, 0, u"mdiclient"_qs, {}), client);
  EXPECT_EQ(windows.FindWindowEx(client, 0, u"VbaWindow"_qs, u"p - b (code)"_qs), b);
  EXPECT_EQ(windows.FindWindowEx(client, a, u"VbaWindow"_qs, {}), b);
  EXPECT_EQ(windows.FindWindowEx(0, 0, u"VbaWindow"_qs, {}), 0u);

  windows.setFocus(a);
  windows.setFocus(b);
  EXPECT_EQ(ownMessages, (QStringList{u"P - A (Code):7"_qs, u"P - A (Code):8"_qs, u"P - B (Code):7"_qs}));

  EXPECT_TRUE(windows.SetProp(a, u"OldWndProc"_qs, 5));
  EXPECT_EQ(std::any_cast<int>(windows.GetProp(a, u"oldwndproc"_qs)), 5);
  EXPECT_EQ(std::any_cast<int>(windows.RemoveProp(a, u"OldWndProc"_qs)), 5);
  EXPECT_FALSE(windows.GetProp(a, u"OldWndProc"_qs).has_value());

  const unsigned idle = windows.RegisterWindowMessage(u"QM_ONIDLE_MSG"_qs);
  EXPECT_GE(idle, 0xC000u);
  EXPECT_EQ(windows.RegisterWindowMessage(u"qm_onidle_msg"_qs), idle);
  ownMessages.clear();
  EXPECT_TRUE(windows.PostMessage(a, idle, 1, 0));
  EXPECT_TRUE(ownMessages.isEmpty());
  loop.DoEvents();
  EXPECT_EQ(ownMessages, QStringList{u"P - A (Code):%1"_qs.arg(idle, 0, 16)});

  // Destroying a parent destroys its children first, each told so.
  ownMessages.clear();
  windows.destroyWindow(main);
  EXPECT_EQ(ownMessages, (QStringList{u"P - A (Code):2"_qs, u"P - B (Code):2"_qs, u":2"_qs, u"main:2"_qs}));
  EXPECT_FALSE(windows.IsWindow(a));
}

TEST_F(WindowSystemTest, AtomsAndLocking) {
  const quint16 atom = windows.GlobalAddAtom(u"QMHotKey1"_qs);
  EXPECT_GE(atom, 0xC000);
  EXPECT_EQ(windows.GlobalAddAtom(u"qmhotkey1"_qs), atom);
  EXPECT_EQ(windows.GlobalDeleteAtom(atom), 0);
  EXPECT_EQ(windows.GlobalDeleteAtom(atom), 0);
  EXPECT_EQ(windows.GlobalDeleteAtom(atom), atom);  // gone
  const ide::HWnd a = makeWindow(u"X"_qs, u"a"_qs);
  const ide::HWnd b = makeWindow(u"X"_qs, u"b"_qs);
  EXPECT_TRUE(windows.LockWindowUpdate(a));
  EXPECT_FALSE(windows.LockWindowUpdate(b));
  EXPECT_TRUE(windows.LockWindowUpdate(0));
  EXPECT_TRUE(windows.LockWindowUpdate(b));
  EXPECT_EQ(windows.lockedWindow(), b);
}

TEST(HeadlessUi, AnswersFromTheQueueOrWithTheDefaultButton) {
  HeadlessUi ui;
  ui.queueAnswer(ide::mb::No);
  EXPECT_EQ(ui.MsgBox(u"a"_qs, ide::mb::YesNo, u"t"_qs), ide::mb::No);
  EXPECT_EQ(ui.MsgBox(u"b"_qs, ide::mb::YesNo | ide::mb::Question, u"t"_qs), ide::mb::Yes);
  EXPECT_EQ(ui.MsgBox(u"c"_qs, ide::mb::YesNoCancel | ide::mb::DefaultButton2, u"t"_qs), ide::mb::No);
  EXPECT_EQ(ui.MsgBox(u"d"_qs, ide::mb::Exclamation, u"t"_qs), ide::mb::OK);
  ASSERT_EQ(ui.messageBoxes().size(), 4u);
  EXPECT_EQ(ui.messageBoxes()[3].style, ide::mb::Exclamation);
  EXPECT_FALSE(ui.openDocument(u"/x.html"_qs));
  ui.setCanOpenDocuments(true);
  EXPECT_TRUE(ui.openDocument(u"/x.html"_qs));
}

}  // namespace
}  // namespace host

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
  const int fast =
      loop.SetTimer(100, [&] { fired << QStringLiteral("100@") + QString::number(loop.tickCount()); });
  loop.SetTimer(250, [&] { fired << QStringLiteral("250@") + QString::number(loop.tickCount()); });
  loop.advance(99);
  EXPECT_TRUE(fired.isEmpty());
  loop.advance(401);
  const QStringList expected = {
      QStringLiteral("100@100"), QStringLiteral("100@200"), QStringLiteral("250@250"),
      QStringLiteral("100@300"), QStringLiteral("100@400"), QStringLiteral("100@500"),
      QStringLiteral("250@500")};  // timers due together fire in the order they were set
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
    order << QStringLiteral("tick");
    loop.post([&] { order << QStringLiteral("posted by tick"); });
    loop.KillTimer(id);
  });
  loop.post([&] { order << QStringLiteral("first"); });
  order << QStringLiteral("before");
  loop.DoEvents();
  loop.advance(100);
  const QStringList expected = {QStringLiteral("before"), QStringLiteral("first"), QStringLiteral("tick"),
                                QStringLiteral("posted by tick")};
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
          ownMessages << QStringLiteral("%1:%2").arg(caption).arg(message, 0, 16);
          return 7;
        });
  }
};

TEST_F(WindowSystemTest, ProceduresChainAndCanBeRestored) {
  const ide::HWnd w = makeWindow(QStringLiteral("VbaWindow"), QStringLiteral("code"));
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
  EXPECT_EQ(hooked, (QStringList{QStringLiteral("1280"), QStringLiteral("1281")}));
  EXPECT_EQ(ownMessages, QStringList{QStringLiteral("code:501")});
  EXPECT_EQ(windows.SetWindowProc(w, old), hook);
  windows.SendMessage(w, 0x502, 0, 0);
  EXPECT_EQ(hooked.size(), 2);
  EXPECT_FALSE(windows.SetWindowProc(0x1, old));
}

TEST_F(WindowSystemTest, HotKeysReachTheFocusedWindowsProcedures) {
  const ide::HWnd code = makeWindow(QStringLiteral("VbaWindow"), QStringLiteral("code"));
  const ide::HWnd other = makeWindow(QStringLiteral("PROJECT"), QStringLiteral("project"));
  ASSERT_TRUE(windows.RegisterHotKey(code, 42, ide::mod::Control | ide::mod::Alt, 'A'));
  EXPECT_FALSE(windows.RegisterHotKey(other, 43, ide::mod::Control | ide::mod::Alt, 'A'));  // taken
  QStringList seen;
  ide::WndProcRef old;
  old = windows.SetWindowProc(code, std::make_shared<const ide::WndProc>(
                                        [&](ide::HWnd h, unsigned m, quintptr wp, qintptr lp) -> qintptr {
                                          if (m == ide::msg::HotKey) {
                                            seen << QStringLiteral("%1 %2").arg(wp).arg(lp, 0, 16);
                                            if (wp == 42) return 0;
                                          }
                                          return windows.CallWindowProc(old, h, m, wp, lp);
                                        }));
  // Not focused: nothing arrives and the key is the editor's.
  EXPECT_FALSE(windows.deliverHotKey(code, ide::mod::Control | ide::mod::Alt, 'A'));
  windows.setFocus(code);
  EXPECT_TRUE(windows.deliverHotKey(code, ide::mod::Control | ide::mod::Alt, 'A'));
  EXPECT_EQ(seen, QStringList{QStringLiteral("42 410003")});
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
  const ide::HWnd main = makeWindow(QStringLiteral("Main"), QStringLiteral("main"));
  const ide::HWnd client = makeWindow(QStringLiteral("MDIClient"), QString(), main);
  const ide::HWnd a = makeWindow(QStringLiteral("VbaWindow"), QStringLiteral("P - A (Code)"), client);
  const ide::HWnd b = makeWindow(QStringLiteral("VbaWindow"), QStringLiteral("P - B (Code)"), client);
  EXPECT_EQ(windows.FindWindowEx(main, 0, QStringLiteral("mdiclient"), {}), client);
  EXPECT_EQ(windows.FindWindowEx(client, 0, QStringLiteral("VbaWindow"), QStringLiteral("p - b (code)")), b);
  EXPECT_EQ(windows.FindWindowEx(client, a, QStringLiteral("VbaWindow"), {}), b);
  EXPECT_EQ(windows.FindWindowEx(0, 0, QStringLiteral("VbaWindow"), {}), 0u);

  windows.setFocus(a);
  windows.setFocus(b);
  EXPECT_EQ(ownMessages, (QStringList{QStringLiteral("P - A (Code):7"), QStringLiteral("P - A (Code):8"),
                                      QStringLiteral("P - B (Code):7")}));

  EXPECT_TRUE(windows.SetProp(a, QStringLiteral("OldWndProc"), 5));
  EXPECT_EQ(std::any_cast<int>(windows.GetProp(a, QStringLiteral("oldwndproc"))), 5);
  EXPECT_EQ(std::any_cast<int>(windows.RemoveProp(a, QStringLiteral("OldWndProc"))), 5);
  EXPECT_FALSE(windows.GetProp(a, QStringLiteral("OldWndProc")).has_value());

  const unsigned idle = windows.RegisterWindowMessage(QStringLiteral("QM_ONIDLE_MSG"));
  EXPECT_GE(idle, 0xC000u);
  EXPECT_EQ(windows.RegisterWindowMessage(QStringLiteral("qm_onidle_msg")), idle);
  ownMessages.clear();
  EXPECT_TRUE(windows.PostMessage(a, idle, 1, 0));
  EXPECT_TRUE(ownMessages.isEmpty());
  loop.DoEvents();
  EXPECT_EQ(ownMessages, QStringList{QStringLiteral("P - A (Code):%1").arg(idle, 0, 16)});

  // Destroying a parent destroys its children first, each told so.
  ownMessages.clear();
  windows.destroyWindow(main);
  EXPECT_EQ(ownMessages, (QStringList{QStringLiteral("P - A (Code):2"), QStringLiteral("P - B (Code):2"),
                                      QStringLiteral(":2"), QStringLiteral("main:2")}));
  EXPECT_FALSE(windows.IsWindow(a));
}

TEST_F(WindowSystemTest, AtomsAndLocking) {
  const quint16 atom = windows.GlobalAddAtom(QStringLiteral("QMHotKey1"));
  EXPECT_GE(atom, 0xC000);
  EXPECT_EQ(windows.GlobalAddAtom(QStringLiteral("qmhotkey1")), atom);
  EXPECT_EQ(windows.GlobalDeleteAtom(atom), 0);
  EXPECT_EQ(windows.GlobalDeleteAtom(atom), 0);
  EXPECT_EQ(windows.GlobalDeleteAtom(atom), atom);  // gone
  const ide::HWnd a = makeWindow(QStringLiteral("X"), QStringLiteral("a"));
  const ide::HWnd b = makeWindow(QStringLiteral("X"), QStringLiteral("b"));
  EXPECT_TRUE(windows.LockWindowUpdate(a));
  EXPECT_FALSE(windows.LockWindowUpdate(b));
  EXPECT_TRUE(windows.LockWindowUpdate(0));
  EXPECT_TRUE(windows.LockWindowUpdate(b));
  EXPECT_EQ(windows.lockedWindow(), b);
}

TEST(HeadlessUi, AnswersFromTheQueueOrWithTheDefaultButton) {
  HeadlessUi ui;
  ui.queueAnswer(ide::mb::No);
  EXPECT_EQ(ui.MsgBox(QStringLiteral("a"), ide::mb::YesNo, QStringLiteral("t")), ide::mb::No);
  EXPECT_EQ(ui.MsgBox(QStringLiteral("b"), ide::mb::YesNo | ide::mb::Question, QStringLiteral("t")),
            ide::mb::Yes);
  EXPECT_EQ(
      ui.MsgBox(QStringLiteral("c"), ide::mb::YesNoCancel | ide::mb::DefaultButton2, QStringLiteral("t")),
      ide::mb::No);
  EXPECT_EQ(ui.MsgBox(QStringLiteral("d"), ide::mb::Exclamation, QStringLiteral("t")), ide::mb::OK);
  ASSERT_EQ(ui.messageBoxes().size(), 4u);
  EXPECT_EQ(ui.messageBoxes()[3].style, ide::mb::Exclamation);
  EXPECT_FALSE(ui.openDocument(QStringLiteral("/x.html")));
  ui.setCanOpenDocuments(true);
  EXPECT_TRUE(ui.openDocument(QStringLiteral("/x.html")));
}

}  // namespace
}  // namespace host

// SPDX-License-Identifier: MIT
// Small scoped helpers over the IDE's user interface: the hourglass cursors, the frozen redrawing of one
// window and the splash window. Each restores what it changed when it goes out of scope, whatever the
// outcome of the work it brackets.
#pragma once

#include "ide/platform.h"

#include <QString>

namespace common {

/// Shows the hourglass while it lives and then puts the previous cursor back.
class CHourGlass {
 public:
  explicit CHourGlass(ide::UserInterface& ui) : CHourGlass(ui, ide::Cursor::Hourglass) {}
  ~CHourGlass() { m_ui.setCursor(m_previous); }
  CHourGlass(const CHourGlass&) = delete;
  CHourGlass& operator=(const CHourGlass&) = delete;

 protected:
  CHourGlass(ide::UserInterface& ui, ide::Cursor cursor) : m_ui(ui), m_previous(ui.setCursor(cursor)) {}

 private:
  ide::UserInterface& m_ui;
  ide::Cursor m_previous;
};

/// The arrow-and-hourglass cursor: work goes on, but the user may still click.
class CArrowHourglass : public CHourGlass {
 public:
  explicit CArrowHourglass(ide::UserInterface& ui) : CHourGlass(ui, ide::Cursor::ArrowHourglass) {}
};

/// Freezes the redrawing of one window while a long edit runs. Only one window can be frozen at a time.
class CLockWindowUpdate {
 public:
  explicit CLockWindowUpdate(ide::WindowSystem& windows) : m_windows(windows) {}
  ~CLockWindowUpdate() { UnLockWindow(); }
  CLockWindowUpdate(const CLockWindowUpdate&) = delete;
  CLockWindowUpdate& operator=(const CLockWindowUpdate&) = delete;

  bool LockWindow(ide::HWnd window) {
    UnLockWindow();
    m_locked = window != 0 && m_windows.LockWindowUpdate(window);
    return m_locked;
  }
  void UnLockWindow() {
    if (m_locked) m_windows.LockWindowUpdate(0);
    m_locked = false;
  }
  bool locked() const { return m_locked; }

 private:
  ide::WindowSystem& m_windows;
  bool m_locked = false;
};

/// The splash window shown while the add-in starts; closed on close() or when it goes out of scope.
class SplashWindow {
 public:
  /// Shows `text` without waiting and lets the pending messages run once, so that it is drawn.
  SplashWindow(ide::UserInterface& ui, ide::EventLoop& loop, const QString& text) : m_ui(ui) {
    m_ui.showSplash(text);
    m_open = true;
    loop.DoEvents();
  }
  ~SplashWindow() { close(); }
  SplashWindow(const SplashWindow&) = delete;
  SplashWindow& operator=(const SplashWindow&) = delete;

  void close() {
    if (!m_open) return;
    m_open = false;
    m_ui.showSplash(QString());
  }

 private:
  ide::UserInterface& m_ui;
  bool m_open = false;
};

}  // namespace common

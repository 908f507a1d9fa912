// SPDX-License-Identifier: MIT
// The headless IDE's message loop. Time stands still until advanced: tests and scripts move the clock and
// see timers fire exactly as often as the time they moved warrants, in order, with no wall-clock waits.
#pragma once

#include "ide/platform.h"

#include <deque>
#include <functional>
#include <map>

namespace host {

class ManualEventLoop final : public ide::EventLoop {
 public:
  int SetTimer(int intervalMs, std::function<void()> callback) override;
  bool KillTimer(int timerId) override;
  void post(std::function<void()> work) override;
  /// Runs the posted work (including work posted meanwhile) and the timers due at the current time.
  void DoEvents() override;
  qint64 tickCount() override { return m_now; }

  /// Moves the clock forward by `ms`, firing every timer at each due time on the way and running the
  /// posted work after each firing.
  void advance(qint64 ms);
  int activeTimers() const { return static_cast<int>(m_timers.size()); }
  bool hasPostedWork() const { return !m_posted.empty(); }

 private:
  struct Timer {
    int interval;
    qint64 due;
    std::function<void()> callback;
  };
  void runPosted();
  void fireDue();

  qint64 m_now = 0;
  int m_nextId = 1;
  std::map<int, Timer> m_timers;
  std::deque<std::function<void()>> m_posted;
  int m_depth = 0;  // DoEvents may be called from work it runs
};

}  // namespace host

// SPDX-License-Identifier: MIT
// The walks' progress bar on standard error, drawn only on a terminal and only once a run has taken long
// enough for the user to wonder.
#pragma once

#include "walk/progress.h"

#include <chrono>

namespace cli {

class TerminalProgress final : public walk::ProgressSink {
 public:
  TerminalProgress();
  /// Clears the bar from the terminal.
  ~TerminalProgress() override;
  TerminalProgress(const TerminalProgress&) = delete;
  TerminalProgress& operator=(const TerminalProgress&) = delete;

  int minimum() const override { return m_minimum; }
  void setMinimum(int minimum) override { m_minimum = minimum; }
  int maximum() const override { return m_maximum; }
  void setMaximum(int maximum) override { m_maximum = maximum; }
  int value() const override { return m_value; }
  void setValue(int value) override;
  bool isVisible() const override { return m_visible; }
  void setVisible(bool visible) override;

 private:
  using Clock = std::chrono::steady_clock;
  void draw();
  void clear();

  bool m_terminal;
  std::chrono::milliseconds m_showAfter;
  Clock::time_point m_started = Clock::now();
  Clock::time_point m_drawn{};
  int m_minimum = 0;
  int m_maximum = 1;
  int m_value = 0;
  int m_shownPercent = -1;
  bool m_visible = false;
  bool m_onScreen = false;
};

}  // namespace cli

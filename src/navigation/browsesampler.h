// SPDX-License-Identifier: MIT
// The part of the add-in's 100 ms timer that records code places: every tick counts the time spent in the
// current procedure, every sixth tick samples the active code pane, and leaving a procedure after more
// than two seconds in it records the place that is left. Time is counted in nominal ticks, not measured.
#pragma once

#include "navigation/histories.h"

namespace navigation {

class BrowseSampler {
 public:
  static constexpr int kTickMs = 100;
  /// A sample is taken on the tick after SampleTime has reached this (so every sixth tick).
  static constexpr int kSampleEveryMs = 500;
  /// A place counts as visited after more than this long in it.
  static constexpr int kVisitedAfterMs = 2000;

  explicit BrowseSampler(CHistories& histories) : m_histories(histories) {}

  /// One timer tick. `activeWindow` is the IDE's active window (may be empty); `hotKeyProcInstalled` tells
  /// whether the add-in's hotkey procedure has been installed on a code window. IDE failures are raised.
  void tick(ide::VBE& vbe, const ide::Ref<ide::Window>& activeWindow, bool hotKeyProcInstalled);

  int DwellTime() const { return m_dwellTime; }
  int SampleTime() const { return m_sampleTime; }

 private:
  void sample(const ide::Ref<ide::CodePane>& pane);

  CHistories& m_histories;
  int m_dwellTime = 0;
  int m_sampleTime = 0;
};

}  // namespace navigation

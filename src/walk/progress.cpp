// SPDX-License-Identifier: MIT
// Progress scaling for long walks.
#include "walk/progress.h"

#include <algorithm>
#include <cmath>

namespace walk {

void ProgressScale::SetProgressRange(qint32 units) {
  m_totalUnits = units;
  m_sink.setMinimum(0);
  if (units > kMaxSteps) {
    m_scale = double(units) / kMaxSteps;
    m_sink.setMaximum(kMaxSteps);
  } else {
    m_scale = 1.0;
    m_sink.setMaximum(std::max(units, 1));
  }
  m_sink.setValue(0);
}

void ProgressScale::AdvanceProgress(qint32 units) {
  const int maximum = m_sink.maximum();
  const int value = m_sink.value();
  if (units == 0 || value == maximum) return;
  // Halves round away from zero, so that a run of exactly twice the bar's steps still moves it.
  const qint64 step = std::llround(units / m_scale);
  m_sink.setValue(int(std::clamp<qint64>(value + step, m_sink.minimum(), maximum)));
}

}  // namespace walk
